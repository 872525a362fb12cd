#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "platform/foundation/Boxed.h"

namespace nimbo {

class Error;
using ErrorRef = std::shared_ptr<const Error>;

/// User-info key of a text for developers.
inline constexpr std::string_view kErrorDebugDescriptionKey = "DebugDescription";

/// User-info key of one sentence for the user: what failed, where, and what to do about it.
inline constexpr std::string_view kErrorReasonKey = "Reason";

/// User-info key of what failed, as text of no language: a path, an address, a name. Hosts that tell of an error in the
/// user's language do so by its domain and code, and put this in.
inline constexpr std::string_view kErrorSubjectKey = "Subject";

/// User-info key of the name of the feed that it happened to.
inline constexpr std::string_view kErrorFeedKey = "Feed";

/// A runtime failure as a value: a domain, a code within it, and details by key. Equal when all three are.
class Error final : public Object {
 public:
  Error(std::string domain, std::int64_t code, BoxedDictionary::Entries userInfo = {});

  static ErrorRef errorWithDomain_code_userInfo(std::string domain, std::int64_t code,
                                                BoxedDictionary::Entries userInfo);
  /// An error whose details are its reason for the user and its subject, if any.
  static ErrorRef errorWithDomain_code_reason(std::string domain, std::int64_t code, std::string reason,
                                              std::string subject = {});

  const std::string& domain() const { return _domain; }
  std::int64_t code() const { return _code; }
  /// Never null; empty when there are no details.
  const std::shared_ptr<const BoxedDictionary>& userInfo() const { return _userInfo; }

  /// The reason for the user, else the text for developers, else domain and code.
  std::string reason() const;
  /// Empty when there is none.
  std::string subject() const;
  /// Empty when it is no feed's.
  std::string feed() const;
  /// The same error, as one of that feed.
  ErrorRef ofFeed(std::string name) const;

  std::string_view className() const override { return "Error"; }
  bool isEqual(const Object* other) const override;
  std::uint64_t hash() const override;
  std::string description() const override;

 private:
  std::string _domain;
  std::int64_t _code;
  std::shared_ptr<const BoxedDictionary> _userInfo;
};

}  // namespace nimbo
