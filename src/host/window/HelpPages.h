#pragma once

#include "host/window/Page.h"

namespace nimbo {

/// What the program is, and where what it knows comes from.
class AboutPage final : public Page {
 public:
  AboutPage();
};

/// What the keys do.
class ShortcutsPage final : public Page {
 public:
  ShortcutsPage();
};

}  // namespace nimbo
