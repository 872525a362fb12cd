#include "platform/ui/Font.h"

#include "platform/foundation/Hash.h"

namespace nimbo {

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
