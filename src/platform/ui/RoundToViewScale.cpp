#include "platform/ui/RoundToViewScale.h"

#include <cmath>

#include "platform/ui/Environment.h"
#include "platform/ui/View.h"

namespace nimbo {

double roundToViewScale(double length, const View* view) {
  const double scale = view ? view->screenScale() : Environment::current().screenScale();
  return std::round(length * scale) / scale;
}

}  // namespace nimbo
