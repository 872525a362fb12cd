#pragma once

#include <algorithm>
#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace nimbo {

/// What was skipped while something was read, and why.
class SkipReport {
 public:
  struct Entry {
    std::string reason;
    std::size_t count = 0;
    std::string example;  ///< which one was the first; may be empty
  };

  void add(std::string_view reason, std::string_view example) {
    const auto found =
        std::find_if(_entries.begin(), _entries.end(), [&](const Entry& e) { return e.reason == reason; });
    if (found != _entries.end())
      ++found->count;
    else
      _entries.push_back({std::string(reason), 1, std::string(example.substr(0, kLongestExample))});
  }

  /// What another report counts, after what this one does.
  void add(const SkipReport& other) { _entries.insert(_entries.end(), other._entries.begin(), other._entries.end()); }

  /// By reason, in the order of their first occurrence.
  const std::vector<Entry>& entries() const { return _entries; }

 private:
  static constexpr std::size_t kLongestExample = 80;
  std::vector<Entry> _entries;
};

}  // namespace nimbo
