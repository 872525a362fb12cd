#pragma once

#include <memory>
#include <utility>
#include <vector>

#include "platform/ui/View.h"

namespace nimbo {

/// Views one under the other, each as wide as the stack; their heights fill it. A blank view takes no room, nor does
/// one whose text is blank (see `viewForFirstBaselineLayout`). Where there is too little room, the last view is made
/// smaller first.
class StackView : public View {
 public:
  /// Puts a view at the bottom of the stack.
  void addArrangedSubview(std::shared_ptr<View> view);

  /// Points from a view's bottom to the next one's top, or from its last baseline to the next one's first when arranged
  /// on baselines: then more where the next one would otherwise be drawn over it. 0 until set.
  double spacing() const { return _spacing; }
  void setSpacing(double spacing);
  void setBaselineRelativeArrangement(bool onBaselines);

  /// The first and the last view that take room.
  View* viewForFirstBaselineLayout() override;
  View* viewForLastBaselineLayout() override;

  std::string_view className() const override { return "StackView"; }

 protected:
  void appendGeneratedConstraints(std::vector<const LayoutConstraint*>& constraints) override;

 private:
  /// A constraint whose constant is the spacing, and what it keeps apart.
  struct Gap {
    std::shared_ptr<LayoutConstraint> constraint;
    View *above, *below;
  };
  static bool takesRoom(View& view);
  void makeConstraints();
  double distanceAcross(const Gap& gap) const;

  std::vector<std::shared_ptr<View>> _arranged;
  double _spacing = 0;
  bool _onBaselines = false;
  std::vector<bool> _takingRoom;  // what the constraints were made for
  std::vector<std::shared_ptr<LayoutConstraint>> _generated;
  std::vector<Gap> _gaps;
};

}  // namespace nimbo
