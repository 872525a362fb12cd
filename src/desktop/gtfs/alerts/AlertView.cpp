#include "desktop/gtfs/alerts/AlertView.h"

#include <algorithm>

#include "desktop/gtfs/ContentHash.h"
#include "desktop/gtfs/alerts/RealtimeFields.h"

namespace nimbo {

namespace {

std::int32_t causeOf(std::uint64_t number) {
  return number >= kLeastCause && number <= kGreatestCause ? static_cast<std::int32_t>(number) : kUnknownCause;
}

std::int32_t severityOf(std::uint64_t number) {
  return number > kUnknownSeverity && number <= kSeveritySevere ? static_cast<std::int32_t>(number) : kUnknownSeverity;
}

AlertEffect effectOf(std::uint64_t number) {
  constexpr auto kLeast = static_cast<std::uint64_t>(AlertEffect::noService);
  constexpr auto kGreatest = static_cast<std::uint64_t>(AlertEffect::accessibilityIssue);
  return number >= kLeast && number <= kGreatest ? static_cast<AlertEffect>(number) : AlertEffect::unknownEffect;
}

/// Reads the next field; false at the end.
bool readField(protozero::pbf_message<AlertField>& message, std::string_view alert, AlertView& view,
               const std::function<void(const EntitySelector&)>& onSelector) {
  const auto take = [&](std::string_view& text, std::string_view part) { text = text.empty() ? part : alert; };
  if (!message.next()) return false;
  switch (message.tag()) {
    case AlertField::informedEntity: {
      const std::string_view body = takeRequiredView(message);
      EntitySelector selector;
      try {
        selector = readEntitySelector(body);
      } catch (const protozero::exception&) {
        view.isDamaged = true;
        break;
      }
      ++view.selectors;
      onSelector(selector);
      break;
    }
    case AlertField::cause:
      view.content.cause = causeOf(takeNumber(message));
      break;
    case AlertField::effect:
      view.content.effect = effectOf(takeNumber(message));
      break;
    case AlertField::url:
      take(view.content.url, takeView(message));
      break;
    case AlertField::headerText:
      take(view.content.header, takeView(message));
      break;
    case AlertField::descriptionText:
      take(view.content.description, takeView(message));
      break;
    case AlertField::effectDetail:
      take(view.content.effectDetail, takeView(message));
      break;
    case AlertField::severityLevel:
      view.severity = severityOf(takeNumber(message));
      break;
    case AlertField::image:
    case AlertField::imageAlternativeText:
      view.hasImage = true;
      message.skip();
      break;
    default:
      message.skip();
  }
  return true;
}

template <class Hash>
std::size_t hashBy(const AlertContent& content, const Hash& ofText) {
  std::size_t hash = static_cast<std::size_t>(content.cause) * 16 + static_cast<std::size_t>(content.effect);
  for (const std::string_view text : {content.header, content.description, content.url, content.effectDetail})
    hash = hash * 131 + ofText(text);
  return hash;
}

}  // namespace

std::size_t AlertContent::quickHash() const {
  return hashBy(*this, [](std::string_view text) {
    constexpr std::size_t kTelling = 16;  // a number, and the language behind it
    return text.size() + contentHash(text.substr(text.size() - std::min(text.size(), kTelling)));
  });
}

std::size_t AlertContent::hash() const { return hashBy(*this, contentHash); }

AlertView readAlertView(std::string_view alert, const std::function<void(const EntitySelector&)>& onSelector) {
  AlertView view;
  auto message = messageIn<AlertField>(alert);
  try {
    do view.body = alert.substr(0, alert.size() - message.length());
    while (readField(message, alert, view, onSelector));
  } catch (const protozero::exception&) {
    view.isDamaged = true;
  }
  return view;
}

}  // namespace nimbo
