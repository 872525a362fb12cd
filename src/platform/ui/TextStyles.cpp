#include "platform/ui/TextStyles.h"

#include <array>
#include <cstddef>

namespace nimbo {

double pointSizeForTextStyle(TextStyle style, ContentSizeCategory category) {
  static constexpr std::array<double, 12> kBody = {14, 15, 16, 17, 19, 21, 23, 28, 33, 40, 47, 53};
  static constexpr std::array<double, 12> kSubheadline = {12, 13, 14, 15, 17, 19, 21, 25, 30, 36, 42, 49};
  const auto& sizes = style == TextStyle::subheadline ? kSubheadline : kBody;
  return sizes.at(static_cast<std::size_t>(category));
}

double textScaleForCategory(ContentSizeCategory category) {
  return pointSizeForTextStyle(TextStyle::headline, category) /
         pointSizeForTextStyle(TextStyle::headline, ContentSizeCategory::large);
}

}  // namespace nimbo
