#include "desktop/drawing/CairoImageResources.h"

#include "desktop/drawing/DrawnImage.h"
#include "desktop/drawing/VectorImage.h"
#include "platform/ui/SystemColors.h"

namespace nimbo {

ImageRef CairoImageResources::image(std::string_view name, double screenScale, bool nightMode) {
  // The widget has four images; more than this many are other scales and names that do not exist.
  constexpr std::size_t kMaximumKept = 32;
  if (_images.size() > kMaximumKept) _images.clear();
  const auto [entry, isNew] = _images.try_emplace({std::string(name), screenScale, nightMode});
  if (!isNew) return entry->second;
  if (const VectorImage* drawing = vectorImageNamed(name)) {
    const Size size = drawing->size;
    entry->second = drawImage(size, screenScale, [&](cairo_t* context) {
      drawing->draw(context, {0, 0, size.width, size.height},
                    colorOf(SystemColor::label, nightMode ? Appearance::dark : Appearance::light));
    });
  }
  return entry->second;
}

}  // namespace nimbo
