#include "platform/UserSession.h"

#include <cstdio>
#include <optional>

#include "platform/Platform.h"
#include "platform/SystemServices.h"

namespace nimbo {

URL MapURLBuilder::build() const {
  std::string text = std::string(kHostApplicationURLScheme) + "://?favorites=" + std::to_string(_favoritesType);
  if (_mapType == kMapTypeTransit) text += "&t=r";
  return URL(std::move(text));
}

namespace {

/// The identifier of this process's session, read or made once.
struct SessionIdentifier {
  std::optional<std::string> value;
};

SessionIdentifier& session() {
  return *Platform::current().singleton<SessionIdentifier>([] { return std::make_shared<SessionIdentifier>(); });
}

std::string newIdentifier() {
  RandomSource& random = Platform::current().random();
  char text[33];
  const auto a = random.next(), b = random.next(), c = random.next(), d = random.next();
  std::snprintf(text, sizeof text, "%08x%08x%08x%08x", a, b, c, d);
  return text;
}

}  // namespace

void UserSession::prepareSharedSession(bool shareWithHost, bool reset) {
  SessionIdentifier& identifier = session();
  if (identifier.value && !reset) return;
  const auto settings = Platform::current().sharedSettings().groupStore();
  if (!reset) identifier.value = settings->stringForKey(kUserSessionIdentifierKey);
  if (identifier.value && !reset) return;
  identifier.value = newIdentifier();
  if (!shareWithHost) return;
  if (const ErrorRef error = settings->setValue_forKey(*identifier.value, kUserSessionIdentifierKey))
    writeLog({kDefaultLogSubsystem, "UserSession"}, LogLevel::error, "Unable to share the session identifier: %@",
             {error});
}

std::shared_ptr<const BoxedDictionary> UserSession::sharedSessionUserInfoForPunchoutUserInfo(
    const std::shared_ptr<const BoxedDictionary>& userInfo) {
  const auto& identifier = session().value;
  if (!identifier) return userInfo;
  BoxedDictionary::Entries entries = userInfo ? userInfo->entries() : BoxedDictionary::Entries{};
  entries.insert_or_assign(std::string(kUserSessionTag), box(*identifier));
  return std::make_shared<const BoxedDictionary>(std::move(entries));
}

URL UserSession::sharedSessionURLForPunchoutURL(const std::string& absoluteString) {
  const auto& identifier = session().value;
  const URL url(absoluteString);
  return identifier ? url.settingQueryParameter(kUserSessionTag, *identifier) : url;
}

}  // namespace nimbo
