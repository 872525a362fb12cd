#include "platform/ui/Font.h"

#include <array>
#include <cstddef>

#include "platform/foundation/Hash.h"

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

std::shared_ptr<const Font> Font::preferredFont(TextStyle style, FontTraits traits) {
  const double size = pointSizeForTextStyle(style, Environment::current().contentSizeCategory());
  return std::make_shared<const Font>(FontDescriptor{.pointSize = size, .bold = traits == FontTraits::bold},
                                      size / pointSizeForTextStyle(style, ContentSizeCategory::large));
}

Font::Font(FontDescriptor descriptor, double scaling)
    : _descriptor(descriptor), _scaling(scaling), _metrics(TextSystem::current().metrics(descriptor)) {}

bool Font::isEqual(const Object* other) const {
  const auto* font = instanceOf<Font>(other);
  return font && font->_descriptor == _descriptor && font->_scaling == _scaling;
}

std::uint64_t Font::hash() const { return hashOfDouble(_descriptor.pointSize) ^ (_descriptor.bold ? 1u : 0u); }

}  // namespace nimbo
