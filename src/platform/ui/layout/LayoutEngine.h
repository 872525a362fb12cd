#pragma once

#include <array>
#include <memory>
#include <optional>
#include <string>
#include <unordered_map>
#include <utility>
#include <vector>

#include "platform/foundation/Geometry.h"
#include "platform/foundation/Log.h"
#include "platform/ui/layout/ConstraintInstaller.h"

namespace nimbo {

/// Where views and constraints report what they could not lay out.
inline constexpr LogFacility kLayoutLogFacility{kDefaultLogSubsystem, "Layout"};

class LayoutItem;
class View;

/// Finds the frames of everything inside one layout root from the constraints there. Positions are solved from the
/// root's leading top corner, and mirrored where leading is on the right. Main thread only.
class LayoutEngine {
 public:
  /// The root owns the engine.
  explicit LayoutEngine(View& root) : _root(root) {}

  /// Constraints, or what they depend on, changed.
  void setNeedsUpdate() { _needsUpdate = true; }
  /// The root's size when each of the wanted ones counts as much as its priority.
  Size fittingSize(Size wanted, LayoutPriority horizontalPriority, LayoutPriority verticalPriority);
  /// Sets all frames for the root's present size.
  void layOut();

  /// The solver's tableau with the names of views and constraints, for a bug report.
  std::string dump() const;

 private:
  using Form = ConstraintInstaller::Form;
  using Variable = ConstraintInstaller::Variable;
  struct Variables {
    std::optional<Variable> x, y;  // none for the root, which is at 0
    Variable width, height;
  };
  struct Target {
    Size size;
    LayoutPriority horizontal, vertical;
    bool operator==(const Target&) const = default;
  };
  struct Screen {
    double scale;
    bool rightToLeft;
  };
  /// What a view's content asks for.
  struct ContentConstraints {
    LayoutConstraintRef minimumWidth, maximumWidth, minimumHeight, maximumHeight, firstLine;
  };

  void solveFor(const Target& target);
  void settle();
  void collectViews(View& view);
  void collectConstraints();
  void collectContentConstraints(View& view);
  void collectAutomaticConstraints(View& view);
  bool adaptContents();
  std::optional<Form> formOf(const LayoutConstraint& constraint);
  bool addAnchor(Form& form, const LayoutAnchor& anchor, double sign);
  Variables variablesOf(LayoutItem& item);
  Size solvedRootSize() const;
  void applyFrames();
  Rect solvedRect(const Variables& variables, const Screen& screen) const;
  Rect frameOf(const Variables& variables, View& around, const Screen& screen);

  View& _root;
  ConstraintInstaller _installer;
  std::vector<View*> _views;                      // the root and all inside it
  std::vector<const LayoutConstraint*> _current;  // all in force
  std::unordered_map<LayoutItem*, Variables> _variables;
  std::unordered_map<View*, ContentConstraints> _contents;
  std::unordered_map<View*, std::array<LayoutConstraintRef, 4>> _automatic;
  LayoutConstraintRef _rootWidth, _rootHeight;
  std::optional<Target> _solved;
  std::optional<std::pair<Target, Size>> _fitting;  // the last answer of `fittingSize`
  std::optional<Size> _applied;                     // the root's size for which the frames are set
  bool _needsUpdate = true;
};

}  // namespace nimbo
