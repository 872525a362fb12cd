#pragma once

#include <algorithm>
#include <array>
#include <optional>
#include <string_view>

#include "platform/foundation/Presentation.h"
#include "protocol/Feeds.h"
#include "protocol/Lines.h"
#include "protocol/Snapshot.h"

namespace nimbo::protocol {

/// The names of an enumeration's values, in their order.
template <class Enumeration>
inline constexpr int kNames = 0;

template <>
inline constexpr std::array<std::string_view, 12> kNames<ContentSizeCategory>{"extraSmall",
                                                                              "small",
                                                                              "medium",
                                                                              "large",
                                                                              "extraLarge",
                                                                              "extraExtraLarge",
                                                                              "extraExtraExtraLarge",
                                                                              "accessibilityMedium",
                                                                              "accessibilityLarge",
                                                                              "accessibilityExtraLarge",
                                                                              "accessibilityExtraExtraLarge",
                                                                              "accessibilityExtraExtraExtraLarge"};
template <>
inline constexpr std::array<std::string_view, 2> kNames<Appearance>{"light", "dark"};
template <>
inline constexpr std::array<std::string_view, 2> kNames<WidgetDisplayMode>{"compact", "expanded"};
template <>
inline constexpr std::array<std::string_view, 3> kNames<WidgetUpdateResult>{"newData", "noData", "failed"};
template <>
inline constexpr std::array<std::string_view, 2> kNames<FetchResult>{"success", "error"};
template <>
inline constexpr std::array<std::string_view, 2> kNames<FeedPart>{"static", "alerts"};
template <>
inline constexpr std::array<std::string_view, 3> kNames<LineState>{"good", "affected", "unknown"};
template <>
inline constexpr std::array<std::string_view, 4> kNames<Severity>{"unknown_severity", "info", "warning", "severe"};

template <>
inline constexpr std::array<std::string_view, 7> kNames<Concern>{"none",   "additional_service", "other",     "detour",
                                                                 "delays", "reduced_service",    "no_service"};

template <class Enumeration>
constexpr std::string_view nameOf(Enumeration value) {
  return kNames<Enumeration>.at(static_cast<std::size_t>(value));
}

/// The value of a name; absent when none has it.
template <class Enumeration>
constexpr std::optional<Enumeration> named(std::string_view name) {
  const auto found = std::find(kNames<Enumeration>.begin(), kNames<Enumeration>.end(), name);
  if (found == kNames<Enumeration>.end()) return std::nullopt;
  return static_cast<Enumeration>(found - kNames<Enumeration>.begin());
}

}  // namespace nimbo::protocol
