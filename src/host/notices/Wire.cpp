#include "host/notices/Wire.h"

#include <algorithm>
#include <array>
#include <utility>

namespace nimbo {

namespace {

constexpr std::string_view kErrorPrefix = "org.nimbo.Transit.Notices.Error.";
constexpr std::array<std::pair<NoticeError, std::string_view>, 5> kErrorNames{{{NoticeError::noBus, "NoBus"},
                                                                               {NoticeError::noService, "NoService"},
                                                                               {NoticeError::noAnswer, "NoAnswer"},
                                                                               {NoticeError::refused, "Refused"},
                                                                               {NoticeError::unfit, "Unfit"}}};
constexpr const char* kNotice = "sssybs";

}  // namespace

void appendNotices(sd_bus_message* message, const std::vector<Notice>& notices) {
  busResult(sd_bus_message_open_container(message, 'a', "(sssybs)"));
  for (const Notice& notice : notices)
    busResult(sd_bus_message_append(message, "(sssybs)", notice.key.c_str(), notice.title.c_str(), notice.body.c_str(),
                                    static_cast<std::uint8_t>(notice.urgency), static_cast<int>(notice.silent),
                                    notice.opens.c_str()));
  busResult(sd_bus_message_close_container(message));
}

std::optional<std::vector<Notice>> readNotices(sd_bus_message* message, std::size_t most) {
  std::vector<Notice> notices;
  if (sd_bus_message_enter_container(message, 'a', "(sssybs)") < 0) return std::nullopt;
  while (sd_bus_message_enter_container(message, 'r', kNotice) > 0) {
    const char *key = nullptr, *title = nullptr, *body = nullptr, *opens = nullptr;
    std::uint8_t urgency = 0;
    int silent = 0;
    if (notices.size() == most ||
        sd_bus_message_read(message, kNotice, &key, &title, &body, &urgency, &silent, &opens) < 0 ||
        urgency > static_cast<std::uint8_t>(Notice::Urgency::critical) || sd_bus_message_exit_container(message) < 0)
      return std::nullopt;
    notices.push_back({key, title, body, static_cast<Notice::Urgency>(urgency), silent != 0, opens});
  }
  return notices;
}

void appendKeys(sd_bus_message* message, const std::vector<std::string>& keys) {
  busResult(sd_bus_message_open_container(message, 'a', "s"));
  for (const std::string& key : keys) busResult(sd_bus_message_append(message, "s", key.c_str()));
  busResult(sd_bus_message_close_container(message));
}

std::optional<std::vector<std::string>> readKeys(sd_bus_message* message, std::size_t most) {
  std::vector<std::string> keys;
  if (sd_bus_message_enter_container(message, 'a', "s") < 0) return std::nullopt;
  for (const char* key = nullptr; sd_bus_message_read(message, "s", &key) > 0;) {
    if (keys.size() == most) return std::nullopt;
    keys.emplace_back(key);
  }
  return keys;
}

std::string busNameOfError(const Error& error) {
  const auto named = std::ranges::find(kErrorNames, static_cast<NoticeError>(error.code()),
                                       &std::pair<NoticeError, std::string_view>::first);
  return std::string(kErrorPrefix) + std::string(named == kErrorNames.end() ? "Refused" : named->second);
}

std::optional<NoticeError> codeOfBusName(std::string_view name) {
  for (const auto& [code, text] : kErrorNames)
    if (name.starts_with(kErrorPrefix) && name.substr(kErrorPrefix.size()) == text) return code;
  return std::nullopt;
}

}  // namespace nimbo
