#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "platform/ui/layout/LayoutItem.h"
#include "platform/ui/layout/SolverTableau.h"

namespace nimbo {

/// Finds values of variables under linear constraints, and keeps them right while constraints come, go and change their
/// constants. Of constraints that cannot all hold, those of the highest priority win: the sum of what they miss is the
/// least possible, and then, without touching that, the sum for the next priority.
///
/// An incremental simplex after Badros, Borning, Stuckey: "The Cassowary Linear Arithmetic Constraint Solving
/// Algorithm" (ACM TOCHI 8, 2001). The objective has one row a priority, compared from the highest on, in place of one
/// row of very different weights. Bland's rule keeps it from going round in circles.
///
/// Not thread-safe. Numbers that are not finite throw std::invalid_argument.
class LayoutSolver {
 public:
  enum class Variable : std::uint32_t {};
  enum class ConstraintId : std::uint32_t {};
  /// Priorities from here on are required.
  static constexpr double kRequired = 1000;

  /// A factor of a variable of this solver.
  struct Term {
    Variable variable;
    double coefficient;
  };
  /// The sum of the terms and the constant is equal to 0, not greater or not less.
  struct Constraint {
    std::vector<Term> terms;
    double constant = 0;
    LayoutRelation relation = LayoutRelation::equal;
    double priority = kRequired;
  };
  /// A constraint that was not accepted has changed nothing; `conflict` holds the required ones that it contradicts, of
  /// which one has to go before it can be added (none when it contradicts itself or the sign of a variable).
  struct Added {
    bool accepted;
    ConstraintId id;
    std::vector<ConstraintId> conflict;
  };

  enum class Sign { any, notNegative };
  Variable addVariable(Sign sign = Sign::any);
  /// 0 for a variable that nothing determines.
  double value(Variable variable) const { return _tableau.value(static_cast<SolverSymbol>(variable)); }

  Added addConstraint(const Constraint& constraint);
  /// The constraint is in the solver.
  void removeConstraint(ConstraintId id);
  /// Changes the constant of a constraint in the solver. Answers nothing when done; else the required constraints that
  /// contradict each other with the new constant, this one among them, and the old constant stays.
  std::vector<ConstraintId> setConstant(ConstraintId id, double constant);

  /// How variables and constraints are called in `dump`; empty functions give "v0" and "c0".
  struct Names {
    std::function<std::string(Variable)> variable;
    std::function<std::string(ConstraintId)> constraint;
  };
  /// The tableau for a bug report: the sum of errors of each priority, then what each basic symbol is made of.
  std::string dump(const Names& names = {}) const;

 private:
  static constexpr SolverSymbol kNoSymbol = 0xffffffff;
  /// Its expression, "less or equal" negated to "greater or equal", equals marker less other.
  struct Installed {
    double constant = 0;
    double priority = kRequired;
    LayoutRelation relation = LayoutRelation::equal;
    SolverSymbol marker = kNoSymbol;
    SolverSymbol other = kNoSymbol;  // none for a required constraint

    double sign() const { return relation == LayoutRelation::lessThanOrEqual ? -1 : 1; }
    bool markerCosts() const { return relation == LayoutRelation::equal && priority < kRequired; }
  };
  void makeSymbols(Installed& installed, std::uint32_t index);
  void addCosts(const Installed& installed, int factor);
  void forget(std::uint32_t index);
  std::vector<ConstraintId> conflictWithout(ConstraintId id) const;

  SolverTableau _tableau;
  std::vector<Installed> _constraints;
  std::vector<std::uint32_t> _unused;
};

}  // namespace nimbo
