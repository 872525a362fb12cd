#pragma once

#include <map>

#include "platform/Localization.h"

namespace nimbo {

/// Texts that name their keys: a key's text is the key, filled it is "key(argument, argument)".
class StringTablesDouble final : public StringTables {
 public:
  std::optional<std::string> stringForKey(std::string_view key) const override {
    const auto found = texts.find(key);
    return found == texts.end() ? std::optional(std::string(key)) : found->second;
  }

  std::string format(const std::string& pattern, std::span<const FormatArgument> arguments) const override {
    std::vector<std::string> filled;
    for (const FormatArgument& argument : arguments) {
      const auto* text = std::get_if<std::string>(&argument);
      filled.push_back(text ? *text : std::to_string(std::get<std::uint64_t>(argument)));
    }
    return pattern + "(" + commaDelimitedList(filled) + ")";
  }

  std::string commaDelimitedList(const std::vector<std::string>& list) const override {
    std::string joined;
    for (const std::string& text : list) joined += (&text == list.data() ? "" : ", ") + text;
    return joined;
  }

  bool isRightToLeft() const override { return rightToLeft; }

  std::map<std::string, std::optional<std::string>, std::less<>> texts;  ///< instead of the key; nullopt: not found
  bool rightToLeft = false;
};

}  // namespace nimbo
