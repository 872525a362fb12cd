#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "platform/foundation/Object.h"
#include "platform/ui/layout/LayoutItem.h"

namespace nimbo {

/// How much a constraint matters: from 1 to 1000. A higher one is never traded for any number of lower ones.
using LayoutPriority = float;

inline constexpr LayoutPriority kLayoutPriorityRequired = 1000;
/// How strongly a view resists to being smaller than its content, until set.
inline constexpr LayoutPriority kLayoutPriorityCompressionResistance = 750;
/// How strongly a view resists to being larger than its content, until set.
inline constexpr LayoutPriority kLayoutPriorityHugging = 250;
/// How strongly a view that is measured wants to be small.
inline constexpr LayoutPriority kLayoutPriorityFittingSize = 50;

class View;

/// A rule about one attribute of a view or guide, or about two. Made from anchors. While active it is held by the view
/// that all its items are in. Main thread only.
class LayoutConstraint final : public Object {
 public:
  LayoutConstraint(LayoutAnchor first, LayoutRelation relation, std::optional<LayoutAnchor> second, double constant);

  const LayoutAnchor& firstAnchor() const { return _first; }
  /// Absent where a length is compared with the constant.
  const std::optional<LayoutAnchor>& secondAnchor() const { return _second; }
  LayoutRelation relation() const { return _relation; }
  /// Null when the item is gone.
  std::shared_ptr<LayoutItem> firstItem() const { return _first.item().lock(); }

  /// Points.
  double constant() const { return _constant; }
  /// A number that is not finite is refused and logged.
  void setConstant(double constant);

  LayoutPriority priority() const { return _priority; }
  /// From 1 to 1000, which means that the constraint is required; std::invalid_argument for others.
  void setPriority(LayoutPriority priority);

  bool isActive() const { return _holder != nullptr; }
  /// Throws std::invalid_argument for a constraint whose items are gone or are not in one tree of views.
  void setActive(bool active);
  static void activateConstraints(const std::vector<std::shared_ptr<LayoutConstraint>>& constraints);

  /// What logs call the constraint; its rule until set.
  void setIdentifier(std::string identifier) { _identifier = std::move(identifier); }
  /// "IDENTIFIER: label.top >= cell.top + 8 @750".
  std::string description() const override;
  std::string_view className() const override { return "LayoutConstraint"; }

  /// Later activated constraints have greater numbers.
  std::uint64_t order() const { return _order; }

 private:
  friend class View;
  bool involvesDescendantOf(const View& view) const;
  void constraintDidChange();

  LayoutAnchor _first;
  LayoutRelation _relation;
  std::optional<LayoutAnchor> _second;
  double _constant;
  LayoutPriority _priority = kLayoutPriorityRequired;
  View* _holder = nullptr;  // clears this when it goes
  std::uint64_t _order = 0;
  std::string _identifier;
};

using LayoutConstraintRef = std::shared_ptr<LayoutConstraint>;

}  // namespace nimbo
