#include <gmock/gmock.h>

#include <cmath>
#include <limits>
#include <random>

#include "platform/ui/layout/LayoutSolver.h"

namespace nimbo {
namespace {

using testing::DoubleNear;
using testing::ElementsAre;
using testing::HasSubstr;
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

/// What the constraints of each priority miss in sum, from the highest on.
std::vector<double> missed(const LayoutSolver& solver, const std::vector<Constraint>& constraints) {
  std::map<double, double, std::greater<>> sums;
  for (const auto& constraint : constraints) {
    double value = constraint.constant;
    for (const auto& term : constraint.terms) value += term.coefficient * solver.value(term.variable);
    if (constraint.relation == lessThanOrEqual) value = std::max(value, 0.0);
    if (constraint.relation == greaterThanOrEqual) value = std::min(value, 0.0);
    sums[constraint.priority] += std::abs(value);
  }
  std::vector<double> result;
  for (const auto& [priority, sum] : sums) result.push_back(std::round(sum * 1e5) / 1e5 + 0.0);
  return result;
}

TEST(LayoutSolver, ChangesLeadWhereBuildingAnewLeads) {
  std::mt19937 random(20);
  const auto upTo = [&](int n) { return static_cast<int>(random() % static_cast<unsigned>(n)); };
  for (int system = 0; system < 60; ++system) {
    LayoutSolver solver;
    std::vector<LayoutSolver::Variable> variables;
    for (int i = 0; i < 6; ++i)
      variables.push_back(solver.addVariable(i % 2 ? LayoutSolver::Sign::notNegative : LayoutSolver::Sign::any));
    std::vector<Constraint> constraints;
    std::vector<LayoutSolver::ConstraintId> ids;
    for (int step = 0; step < 40; ++step) {
      if (ids.size() < 8 || upTo(3) == 0) {
        Constraint constraint{{},
                              static_cast<double>(upTo(81) - 40),
                              static_cast<LayoutRelation>(upTo(3) - 1),
                              std::array{1000.0, 750.0, 250.0}[static_cast<std::size_t>(upTo(3))]};
        for (const auto variable : variables)
          if (upTo(3) == 0) constraint.terms.push_back({variable, upTo(2) ? 1.0 : -1.0});
        if (constraint.terms.empty()) continue;
        const auto added = solver.addConstraint(constraint);
        if (!added.accepted) continue;
        constraints.push_back(constraint);
        ids.push_back(added.id);
      } else {
        const auto index = static_cast<std::size_t>(upTo(static_cast<int>(ids.size())));
        if (upTo(2)) {
          const double constant = upTo(81) - 40;
          if (solver.setConstant(ids[index], constant).empty()) constraints[index].constant = constant;
        } else {
          solver.removeConstraint(ids[index]);
          ids.erase(ids.begin() + static_cast<std::ptrdiff_t>(index));
          constraints.erase(constraints.begin() + static_cast<std::ptrdiff_t>(index));
        }
      }
      LayoutSolver anew;
      for (std::size_t i = 0; i < variables.size(); ++i)
        anew.addVariable(i % 2 ? LayoutSolver::Sign::notNegative : LayoutSolver::Sign::any);
      for (const auto& constraint : constraints) ASSERT_TRUE(anew.addConstraint(constraint).accepted);
      ASSERT_EQ(missed(solver, constraints), missed(anew, constraints)) << system << "/" << step;
    }
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

TEST(LayoutSolver, RefusesNumbersThatAreNotFinite) {
  LayoutSolver solver;
  const auto x = solver.addVariable();
  const auto added = solver.addConstraint(bound(x, equal, 4, 10));
  for (const double bad : {std::nan(""), std::numeric_limits<double>::infinity()}) {
    EXPECT_THROW(solver.addConstraint(bound(x, equal, bad)), std::invalid_argument);
    EXPECT_THROW(solver.addConstraint({{{x, bad}}, 0, equal}), std::invalid_argument);
    EXPECT_THROW(solver.setConstant(added.id, bad), std::invalid_argument);
  }
  EXPECT_DOUBLE_EQ(solver.value(x), 4);
}

TEST(LayoutSolver, PrintsItsTableau) {
  LayoutSolver solver;
  const auto x = solver.addVariable();
  solver.addConstraint(bound(x, equal, 4));
  solver.addConstraint(bound(x, greaterThanOrEqual, 6, 500));
  const std::string text = solver.dump({[](auto) { return "label.left"; }, [](auto) { return "edge"; }});
  EXPECT_THAT(text, HasSubstr("errors at 500: 2"));
  EXPECT_THAT(text, HasSubstr("label.left = 4 + dummy(edge)"));
  EXPECT_THAT(solver.dump(), HasSubstr("v0 = 4 + dummy(c0)"));
}

}  // namespace
}  // namespace nimbo
