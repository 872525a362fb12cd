#pragma once

#include <vector>

#include "platform/ui/layout/LayoutItem.h"

namespace nimbo {

/// The sum of the terms and the constant is equal to 0, not greater or not less.
struct CellConstraint {
  struct Term {
    std::size_t variable;
    double coefficient;
  };
  std::vector<Term> terms;
  double constant;
  LayoutRelation relation;
  double priority;  ///< 1000: required
};

/// A row of a fixed height 327 points wide, with a title, a second text on two lines and a shield: what
/// NBTransitItemFixedHeightCell, its stack view and its contents ask for.
struct CellConstraints {
  CellConstraints();

  std::size_t variableCount;
  std::vector<CellConstraint> constraints;
  std::size_t rowHeight = 0;  ///< index of the constraint on the row's height
};

}  // namespace nimbo
