#pragma once

#include <string>
#include <string_view>

namespace nimbo {

/// An absolute URL as text (RFC 3986). Equal when the texts are.
class URL {
 public:
  explicit URL(std::string absoluteString) : _absoluteString(std::move(absoluteString)) {}
  const std::string& absoluteString() const { return _absoluteString; }

  /// The same URL with a query parameter set: added, or replaced where one of this name stands. The value is
  /// percent-encoded.
  URL settingQueryParameter(std::string_view name, std::string_view value) const;

  bool operator==(const URL&) const = default;

 private:
  std::string _absoluteString;
};

}  // namespace nimbo
