#pragma once

namespace nimbo {

class View;

/// Rounds a length in points to whole device pixels of the screen that the view is on; of the main screen for no view.
double roundToViewScale(double length, const View* view);

}  // namespace nimbo
