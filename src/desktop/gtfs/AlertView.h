#pragma once

#include <cstdint>
#include <functional>
#include <string_view>

#include "desktop/gtfs/EntitySelector.h"
#include "desktop/gtfs/RealtimeFields.h"

namespace nimbo {

/// An alert's texts as published and what else makes it the incident that it is: equal for an alert that a feed repeats
/// under another identifier.
struct AlertContent {
  std::string_view header, description, url;  // TranslatedString messages
  std::int32_t cause = kUnknownCause;
  AlertEffect effect = AlertEffect::unknownEffect;

  bool operator==(const AlertContent&) const = default;

  /// Equal for equal contents, made without reading the texts.
  std::size_t sizeHash() const {
    return ((header.size() * 131 + description.size()) * 131 + url.size()) * 131 +
           static_cast<std::size_t>(cause) * 16 + static_cast<std::size_t>(effect);
  }
};

/// What one pass over an Alert message tells about it.
struct AlertView {
  AlertContent content;
  bool isSevere = false;

  /// Whether the alert changes nothing for most riders: it has no effect or is about accessibility, and is not severe.
  bool isMinor() const {
    return !isSevere && (content.effect == AlertEffect::noEffect || content.effect == AlertEffect::accessibilityIssue);
  }
};

/// Reads an Alert message and gives each of its selectors to `onSelector`. Causes and effects that are not known here
/// count as the unknown one. Throws protozero::exception for damaged bytes.
AlertView readAlertView(std::string_view alert, const std::function<void(const EntitySelector&)>& onSelector);

}  // namespace nimbo
