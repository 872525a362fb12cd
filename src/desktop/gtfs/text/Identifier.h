#pragma once

#include <string>
#include <string_view>

namespace nimbo {

/// An identifier as it is compared: without blanks and byte order marks around it, in valid UTF-8. What one half of a
/// feed gets, the other gets too.
class Identifier {
 public:
  /// `published` outlives this.
  explicit Identifier(std::string_view published) {
    if (!published.empty()) clean(published);
  }
  Identifier(const Identifier&) = delete;
  Identifier& operator=(const Identifier&) = delete;

  std::string_view text() const { return _text; }

 private:
  void clean(std::string_view published);

  std::string _mended;  // unused for an identifier that is valid
  std::string_view _text;
};

}  // namespace nimbo
