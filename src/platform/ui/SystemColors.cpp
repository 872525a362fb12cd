#include "platform/ui/SystemColors.h"

namespace nimbo {

namespace {

constexpr Color rgb(int red, int green, int blue) { return {red / 255.0, green / 255.0, blue / 255.0, 1}; }

}  // namespace

Color colorOf(SystemColor color, Appearance appearance) {
  const bool dark = appearance == Appearance::dark;
  switch (color) {
    case SystemColor::background:
      return dark ? rgb(30, 30, 32) : rgb(246, 246, 248);
    case SystemColor::label:
      return dark ? rgb(255, 255, 255) : rgb(0, 0, 0);
    case SystemColor::systemGrey:
      return dark ? rgb(166, 166, 172) : rgb(96, 96, 102);
    case SystemColor::rowHighlight:
      return dark ? rgb(52, 52, 56) : rgb(226, 226, 230);
  }
  return {};
}

}  // namespace nimbo
