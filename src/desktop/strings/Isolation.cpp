#include "desktop/strings/Isolation.h"

#include <algorithm>
#include <utility>

namespace nimbo {

namespace {

constexpr std::string_view kFirstStrongIsolate = "\u2068";
constexpr std::string_view kPopDirectionalIsolate = "\u2069";

/// Blocks of scripts that run from right to left, each to the first character behind it. UTF-8 has the order of the
/// characters. Source: https://www.unicode.org/Public/UCD/latest/ucd/extracted/DerivedBidiClass.txt
constexpr std::pair<std::string_view, std::string_view> kRightToLeft[] = {
    {"\u0590", "\u061C"}, {"\u061D", "\u0900"},         {"\uFB1D", "\uFE00"},
    {"\uFE70", "\uFEFF"}, {"\U00010800", "\U00011000"}, {"\U0001E800", "\U0001F000"}};

constexpr unsigned char kLeastLeadByte = 0xD6;

}  // namespace

bool hasRightToLeftLetters(std::string_view text) {
  int depth = 0;
  for (std::size_t i = 0; i < text.size(); ++i) {
    if (static_cast<unsigned char>(text[i]) < kLeastLeadByte) continue;
    const std::string_view rest = text.substr(i);
    if (rest.starts_with(kFirstStrongIsolate))
      ++depth;
    else if (rest.starts_with(kPopDirectionalIsolate))
      --depth;
    else if (depth <= 0 && std::any_of(std::begin(kRightToLeft), std::end(kRightToLeft), [rest](const auto& block) {
               return rest >= block.first && rest < block.second;
             }))
      return true;
  }
  return false;
}

std::string isolated(std::string_view text) {
  return std::string(kFirstStrongIsolate).append(text).append(kPopDirectionalIsolate);
}

}  // namespace nimbo
