#pragma once

#include <functional>
#include <memory>
#include <vector>

#include "platform/foundation/Presentation.h"

namespace nimbo {

/// The screen and the user's preferences as views see them. One for each platform in force; main thread only.
class Environment {
 public:
  static Environment& current();

  ContentSizeCategory contentSizeCategory() const { return _contentSizeCategory; }
  /// Announces the change to the observers, in the order in which they came; nothing happens when it is the same.
  void setContentSizeCategory(ContentSizeCategory category);

  /// Device pixels for each point of the main screen. 1 until set; greater than 0.
  double screenScale() const { return _screenScale; }
  void setScreenScale(double scale);

  Appearance appearance() const { return _appearance; }
  void setAppearance(Appearance appearance) { _appearance = appearance; }

  /// Whether the script of the user's language runs from right to left.
  bool isRightToLeft() const;

  /// Calls `operation` after each change of the text size, for as long as `observer` lives and is not removed.
  void observeContentSizeCategory(const std::shared_ptr<const void>& observer, std::function<void()> operation);
  /// Ends every observation of the observer.
  void removeObserver(const void* observer);

 private:
  struct Observation {
    std::weak_ptr<const void> observer;
    const void* identity;
    std::function<void()> operation;
  };
  ContentSizeCategory _contentSizeCategory = ContentSizeCategory::large;
  double _screenScale = 1;
  Appearance _appearance = Appearance::light;
  std::vector<std::shared_ptr<Observation>> _observations;
};

}  // namespace nimbo
