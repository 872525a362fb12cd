#include <gmock/gmock.h>

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

TEST(LayoutSolver, NamesWhatContradictsAndStaysAsItWas) {
  LayoutSolver solver;
  const auto x = solver.addVariable(), y = solver.addVariable(),
             width = solver.addVariable(LayoutSolver::Sign::notNegative);
  const auto apart = solver.addConstraint({{{y, 1}, {x, -1}}, -10, greaterThanOrEqual});
  const auto left = solver.addConstraint(bound(x, equal, 5));
  solver.addConstraint(bound(width, equal, 40));
  const auto right = solver.addConstraint(bound(y, lessThanOrEqual, 20));

  const auto refused = solver.addConstraint(bound(y, lessThanOrEqual, 12));
  EXPECT_FALSE(refused.accepted);
  EXPECT_THAT(refused.conflict, testing::UnorderedElementsAre(apart.id, left.id));
  EXPECT_THAT(solver.setConstant(right.id, -14), testing::UnorderedElementsAre(apart.id, left.id, right.id));
  EXPECT_DOUBLE_EQ(solver.value(x), 5);
  EXPECT_GE(solver.value(y), 15);
  EXPECT_LE(solver.value(y), 20);
  EXPECT_EQ(solver.constraintCount(), 4u);

  // Nobody else's fault.
  const auto negative = solver.addConstraint(bound(solver.addVariable(LayoutSolver::Sign::notNegative), equal, -1));
  EXPECT_FALSE(negative.accepted);
  EXPECT_TRUE(negative.conflict.empty());

  solver.removeConstraint(left.id);
  EXPECT_TRUE(solver.setConstant(right.id, -14).empty());
  EXPECT_LE(solver.value(y), 14);
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

}  // namespace
}  // namespace nimbo
