#pragma once

#include <memory>
#include <optional>
#include <vector>

#include "platform/foundation/Geometry.h"
#include "platform/ui/layout/LayoutConstraint.h"
#include "platform/ui/layout/LayoutItem.h"

namespace nimbo {

class LayoutEngine;
class Painter;
struct DrawingContext;

/// A rectangle on the screen with other views in it. Its frame is set by whoever owns it, or found from constraints.
/// Held by shared pointer; main thread only.
class View : public LayoutItem {
 public:
  View();
  ~View() override;

  /// Points, in the superview's coordinates.
  const Rect& frame() const { return _frame; }
  /// Numbers that are not finite are refused and logged; negative sizes become 0.
  void setFrame(const Rect& frame);
  /// The frame's size at the origin.
  Rect bounds() const { return {0, 0, _frame.width, _frame.height}; }

  /// Distances from the edges that `layoutMarginsFrame` keeps, in points. None until set.
  void setLayoutMargins(const Insets& margins);
  /// The bounds inside the layout margins, never of negative size.
  Rect layoutMarginsFrame() const;

  /// Puts a view on top of the others, out of the superview it had. Throws std::invalid_argument for null, for this
  /// view and for one that this view is in.
  void addSubview(std::shared_ptr<View> view);
  /// Constraints between what is inside the view and what is outside become inactive.
  void removeFromSuperview();
  /// Null for the root. Valid as long as this view stays in it.
  View* superview() const { return _superview; }
  /// From back to front.
  const std::vector<std::shared_ptr<View>>& subviews() const { return _subviews; }
  /// Whether this view is `ancestor` or inside it.
  bool isDescendantOf(const View& ancestor) const;
  View* asView() override { return this; }
  View* owningView() override { return this; }

  bool isHidden() const { return _hidden; }
  void setHidden(bool hidden);

  /// Device pixels for each point of the screen that the view is on.
  virtual double screenScale() const;
  /// Whether leading is on the right: as the locale's script.
  bool isRightToLeft() const;

  /// Asks for `layoutSubviews` at the next `layoutIfNeeded`.
  void setNeedsLayout();
  /// Lays out this view and all inside it that asked; stops after a fixed number of rounds.
  void layoutIfNeeded();
  /// Sets the frames of subviews that have no constraints of their own. Overrides call the base.
  virtual void layoutSubviews();

  /// The size that the constraints inside give the view when `size` is wanted as much as the priorities say. For a view
  /// of which `isLayoutRoot` is true.
  virtual Size systemLayoutSizeFittingSize_withHorizontalFittingPriority_verticalFittingPriority(
      Size size, LayoutPriority horizontalFittingPriority, LayoutPriority verticalFittingPriority);

  /// Whether the frame, as it was set, acts as constraints on what is around. True until switched off, which a view
  /// needs whose frame is to be found from constraints.
  bool usesAutomaticConstraints() const { return _usesAutomaticConstraints; }
  void setUsesAutomaticConstraints(bool uses);
  void addLayoutGuide(const std::shared_ptr<LayoutGuide>& guide);
  const std::vector<std::shared_ptr<LayoutConstraint>>& constraints() const { return _constraints; }
  /// The constraints inside, or what they depend on, changed.
  void setNeedsUpdateConstraints();
  /// How the frames around the view were found, by the names of views and constraints, for a bug report.
  std::string layoutDump();

  /// The view whose first or last line of text is this one's; null when it is this view.
  virtual View* viewForFirstBaselineLayout() { return nullptr; }
  virtual View* viewForLastBaselineLayout() { return nullptr; }
  /// The view at the end of that chain.
  View& firstBaselineView();
  View& lastBaselineView();

  /// Nothing is to be seen of the view: hidden, or without a text. A stack closes the gap.
  virtual bool isBlank() const { return _hidden; }

  /// Of two views whose contents do not both have room, the one of the lower rank gets it. 0 until set.
  void setCompressionRank(int rank) { _compressionRank = rank; }

  /// Draws the view and all inside it, its origin where the painter's is. Lay it out before.
  void draw(Painter& painter);

  std::string_view className() const override { return "View"; }

 protected:
  friend class LayoutEngine;
  friend class LayoutConstraint;
  friend class StackView;

  /// Whether the constraints inside are solved apart from those around: the view's frame is set by its superview.
  virtual bool isLayoutRoot() const { return _superview == nullptr; }
  /// Adds the constraints that the view makes by itself, which it keeps alive until the next call.
  virtual void appendGeneratedConstraints(std::vector<const LayoutConstraint*>& /*constraints*/) {}
  /// Has the views solved from constraints even if none is active: some are generated.
  void requireConstraintLayout();

  /// The view keeps to these sizes as much as content does: a little less than constraints of the same priority.
  virtual ContentSize contentSize() { return {}; }
  /// Starts a layout: whatever `contentSize` took over from a size found before is forgotten.
  virtual void forgetAdaptedSize() {}
  /// A layout found a size; answers whether `contentSize` is another one because of it.
  virtual bool adaptToSize(Size /*size*/) { return false; }
  /// Distances of the baselines from the top and from the bottom; absent in views without text.
  virtual std::optional<double> firstBaselineFromTop() { return std::nullopt; }
  virtual std::optional<double> lastBaselineFromBottom() { return std::nullopt; }
  /// How far what is drawn reaches above the first baseline and below the last, in points. A line of text reaches up to
  /// its capitals.
  virtual double reachAboveBaseline() { return 0; }
  virtual double reachBelowBaseline() { return 0; }
  /// The subview is always as large as this view.
  void addFillingSubview(std::shared_ptr<View> view);

  virtual void drawContent(Painter& /*painter*/, const DrawingContext& /*context*/) {}
  virtual DrawingContext contextForSubviews(const DrawingContext& context) const;
  virtual bool clipsToBounds() const { return false; }

 private:
  View& layoutRoot();
  void setNeedsLayoutInside();
  bool layoutOnce();
  void holdConstraint(std::shared_ptr<LayoutConstraint> constraint);
  void dropConstraint(const LayoutConstraint& constraint);
  void drawTree(Painter& painter, const DrawingContext& context);

  Rect _frame;
  Insets _layoutMargins;
  View* _superview = nullptr;
  std::vector<std::shared_ptr<View>> _subviews;
  std::vector<std::shared_ptr<LayoutGuide>> _guides;
  std::vector<std::shared_ptr<LayoutConstraint>> _constraints;
  std::unique_ptr<LayoutEngine> _engine;  // of a layout root with constraints inside
  double _laidOutScale = 0;               // of the screen, when the root of all views was last laid out
  int _compressionRank = 0;
  bool _hidden = false;
  bool _usesAutomaticConstraints = true;
  bool _fillsSuperview = false;
  bool _needsLayout = true;
  bool _subtreeNeedsLayout = true;  // this view or one inside it needs layout
};

class View;

/// Rounds a length in points to whole device pixels of the screen that the view is on; of the main screen for no view.
double roundToViewScale(double length, const View* view);

}  // namespace nimbo
