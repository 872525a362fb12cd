#include "platform/foundation/Error.h"

#include "platform/foundation/Hash.h"

namespace nimbo {

Error::Error(std::string domain, std::int64_t code, BoxedDictionary::Entries userInfo)
    : _domain(std::move(domain)),
      _code(code),
      _userInfo(std::make_shared<const BoxedDictionary>(std::move(userInfo))) {}

ErrorRef Error::errorWithDomain_code_userInfo(std::string domain, std::int64_t code,
                                              BoxedDictionary::Entries userInfo) {
  return std::make_shared<const Error>(std::move(domain), code, std::move(userInfo));
}

ErrorRef Error::errorWithDomain_code_reason(std::string domain, std::int64_t code, std::string reason,
                                            std::string subject) {
  BoxedDictionary::Entries userInfo{{std::string(kErrorReasonKey), box(std::move(reason))}};
  if (!subject.empty()) userInfo.emplace(kErrorSubjectKey, box(std::move(subject)));
  return errorWithDomain_code_userInfo(std::move(domain), code, std::move(userInfo));
}

std::string Error::reason() const {
  for (std::string_view key : {kErrorReasonKey, kErrorDebugDescriptionKey})
    if (const ObjectRef text = _userInfo->objectForKey(key)) return text->description();
  return _domain + " " + std::to_string(_code);
}

std::string Error::subject() const {
  const ObjectRef text = _userInfo->objectForKey(kErrorSubjectKey);
  return text ? text->description() : std::string();
}

std::string Error::feed() const {
  const ObjectRef text = _userInfo->objectForKey(kErrorFeedKey);
  return text ? text->description() : std::string();
}

ErrorRef Error::ofFeed(std::string name) const {
  auto details = _userInfo->entries();
  details.insert_or_assign(std::string(kErrorFeedKey), box(std::move(name)));
  return errorWithDomain_code_userInfo(_domain, _code, std::move(details));
}

bool Error::isEqual(const Object* other) const {
  if (this == other) return true;
  const auto* error = instanceOf<Error>(other);
  return error && error->_domain == _domain && error->_code == _code && error->_userInfo->isEqual(_userInfo.get());
}

std::uint64_t Error::hash() const { return hashOfBytes(_domain) ^ static_cast<std::uint64_t>(_code); }

std::string Error::description() const {
  return "Error Domain=" + _domain + " Code=" + std::to_string(_code) + " UserInfo=" + _userInfo->description();
}

}  // namespace nimbo
