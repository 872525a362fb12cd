#include <gtest/gtest.h>

#include <cmath>
#include <cstdlib>
#include <limits>
#include <stdexcept>

#include "platform/ui/layout/LayoutSolver.h"

namespace nimbo {
namespace {

using Constraint = LayoutSolver::Constraint;
using enum LayoutRelation;

/// "coefficient * variable + constant (relation) 0", of one variable.
Constraint bound(LayoutSolver::Variable variable, LayoutRelation relation, double value, double priority = 1000) {
  return {{{variable, 1}}, -value, relation, priority};
}

TEST(LayoutSolver, NeverTradesAPriorityForLowerOnes) {
  LayoutSolver solver;
  const auto x = solver.addVariable();
  for (int i = 0; i < 200; ++i) solver.addConstraint(bound(x, equal, 1000 + i, 499.5));
  solver.addConstraint(bound(x, equal, 3, 500));
  EXPECT_DOUBLE_EQ(solver.value(x), 3);
  const auto required = solver.addConstraint(bound(x, greaterThanOrEqual, 7));
  EXPECT_DOUBLE_EQ(solver.value(x), 7);
  solver.removeConstraint(required.id);
  EXPECT_DOUBLE_EQ(solver.value(x), 3);
}

TEST(LayoutSolver, RefusesNumbersThatAreNone) {
  LayoutSolver solver;
  const auto x = solver.addVariable();
  const auto good = solver.addConstraint(bound(x, equal, 1));
  for (const double bad : {std::nan(""), std::numeric_limits<double>::infinity()}) {
    EXPECT_THROW(solver.setConstant(good.id, bad), std::invalid_argument);
    EXPECT_THROW(solver.addConstraint(bound(x, equal, bad)), std::invalid_argument);
    EXPECT_THROW(solver.addConstraint(bound(x, equal, 1, bad)), std::invalid_argument);
    EXPECT_THROW(solver.addConstraint({{{x, bad}}, 0, equal, 1000}), std::invalid_argument);
  }
}

TEST(LayoutSolver, EndsWhenEveryStepIsADeadHeat) {
  // Every bound meets in one corner: each pivot moves nothing.
  LayoutSolver solver;
  std::vector<LayoutSolver::Variable> variables;
  for (int i = 0; i < 12; ++i) variables.push_back(solver.addVariable(LayoutSolver::Sign::notNegative));
  for (std::size_t i = 0; i < variables.size(); ++i)
    for (std::size_t j = 0; j < variables.size(); ++j)
      if (i != j)
        solver.addConstraint({{{variables[i], 1}, {variables[j], -1}}, 0, i < j ? lessThanOrEqual : equal, 600});
  for (const auto variable : variables) solver.addConstraint(bound(variable, equal, 9, 100));
  for (const auto variable : variables) EXPECT_NEAR(solver.value(variable), 9, 1e-9);
}

#ifdef SOLVER_COMPARISON
TEST(LayoutSolver, AgreesWithKiwisolver) { EXPECT_EQ(std::system(SOLVER_COMPARISON " --systems 400 --seed 1"), 0); }
#endif

}  // namespace
}  // namespace nimbo
