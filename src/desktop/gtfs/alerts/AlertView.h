#pragma once

#include <cstdint>
#include <functional>
#include <string_view>

#include "desktop/gtfs/alerts/RealtimeFields.h"
#include "desktop/gtfs/alerts/SelectorMatcher.h"

namespace nimbo {

/// An alert's texts as published and what else makes it the incident that it is: equal for an alert that a feed repeats
/// under another identifier.
struct AlertContent {
  // TranslatedString messages; where one comes in pieces, the whole alert stands for it.
  std::string_view header, description, url, effectDetail;
  std::int32_t cause = kUnknownCause;
  AlertEffect effect = AlertEffect::unknownEffect;

  bool operator==(const AlertContent&) const = default;

  /// Equal for equal contents, made of the sizes and the ends of the texts: most alerts that are no repetition differ
  /// in it.
  std::size_t quickHash() const;
  std::size_t hash() const;
};

/// What one pass over an Alert message tells about it.
struct AlertView {
  std::string_view body;  ///< the message, up to where it breaks off
  AlertContent content;
  std::size_t selectors = 0;
  std::int32_t severity = kUnknownSeverity;  ///< one of those that are known
  bool hasImage = false;                     ///< or the text of one
  bool isDamaged = false;                    ///< it breaks off, or one of its selectors does

  /// Whether the alert changes nothing for most riders: it has no effect or is about accessibility, and is not severe,
  /// which is not known of one that breaks off.
  bool isMinor() const {
    return severity != kSeveritySevere && !isDamaged &&
           (content.effect == AlertEffect::noEffect || content.effect == AlertEffect::accessibilityIssue);
  }
};

/// Reads an Alert message and gives each of its selectors to `onSelector`. Causes and effects that are not known here
/// count as the unknown one. What is damaged is left out, and all behind it where the message breaks off.
AlertView readAlertView(std::string_view alert, const std::function<void(const EntitySelector&)>& onSelector);

}  // namespace nimbo
