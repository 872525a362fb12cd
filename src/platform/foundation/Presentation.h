#pragma once

namespace nimbo {

/// The user's preferred text size. `large` is the size at which lengths are given.
enum class ContentSizeCategory {
  extraSmall,
  small,
  medium,
  large,
  extraLarge,
  extraExtraLarge,
  extraExtraExtraLarge,
  accessibilityMedium,
  accessibilityLarge,
  accessibilityExtraLarge,
  accessibilityExtraExtraLarge,
  accessibilityExtraExtraExtraLarge,
};

enum class Appearance { light, dark };

/// How much of itself the widget shows: one row, or as many as it has and its host gives room for.
enum class WidgetDisplayMode { Compact = 0, Expanded = 1 };

/// How an update ended.
enum class WidgetUpdateResult { NewData = 0, NoData = 1, Failed = 2 };

}  // namespace nimbo
