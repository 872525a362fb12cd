// The constraint solver under random edits: it must stand where solving everything anew leads.

#include <array>
#include <cmath>
#include <map>

#include "Fuzz.h"
#include "platform/ui/layout/LayoutSolver.h"

namespace nimbo {

namespace {

using Constraint = LayoutSolver::Constraint;
constexpr unsigned kVariables = 6;

struct System {
  LayoutSolver solver;
  std::vector<LayoutSolver::Variable> variables;
  System() {
    for (unsigned i = 0; i < kVariables; ++i)
      variables.push_back(solver.addVariable(i % 2 ? LayoutSolver::Sign::notNegative : LayoutSolver::Sign::any));
  }
};

/// What the constraints of each priority miss in sum.
std::map<double, double> missed(const LayoutSolver& solver, const std::vector<Constraint>& constraints) {
  std::map<double, double> sums;
  for (const Constraint& constraint : constraints) {
    double value = constraint.constant;
    for (const auto& term : constraint.terms) value += term.coefficient * solver.value(term.variable);
    if (constraint.relation == LayoutRelation::lessThanOrEqual) value = std::max(value, 0.0);
    if (constraint.relation == LayoutRelation::greaterThanOrEqual) value = std::min(value, 0.0);
    sums[constraint.priority] += std::abs(value);
  }
  return sums;
}

Constraint constraintFrom(Choices& choices, const System& system) {
  static constexpr std::array kPriorities{1000.0, 750.0, 749.0, 250.0, 1.0};
  static constexpr std::array kCoefficients{0.0, 0.0, 0.0, 1.0, -1.0, 1.0, -1.0, 0.5, 2.0, -3.0};
  Constraint constraint{{},
                        static_cast<double>(choices.upTo(201)) - 100,
                        static_cast<LayoutRelation>(static_cast<int>(choices.upTo(3)) - 1),
                        kPriorities[choices.upTo(kPriorities.size())]};
  for (const auto variable : system.variables)
    if (const double coefficient = kCoefficients[choices.upTo(kCoefficients.size())]; coefficient != 0)
      constraint.terms.push_back({variable, coefficient});
  return constraint;
}

void requireSameAsAnew(const System& system, const std::vector<Constraint>& constraints) {
  System anew;
  for (const Constraint& constraint : constraints)
    require(anew.solver.addConstraint(constraint).accepted, "what was accepted once is accepted again");
  const auto sums = missed(system.solver, constraints), sumsAnew = missed(anew.solver, constraints);
  for (const auto& [priority, sum] : sums) {
    require(priority < LayoutSolver::kRequired || sum < 1e-5, "what is required holds");
    require(std::abs(sum - sumsAnew.at(priority)) < 1e-5, "changes lead where solving anew leads");
  }
  for (unsigned i = 1; i < kVariables; i += 2)
    require(system.solver.value(system.variables[i]) > -1e-6, "a variable that may not be negative is not");
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  Choices choices({data, std::min<std::size_t>(size, 400)});
  System system;
  std::vector<Constraint> constraints;
  std::vector<LayoutSolver::ConstraintId> ids;
  unsigned edits = 0;
  while (!choices.isEmpty()) {
    const unsigned edit = choices.upTo(4);
    if (edit < 2 || ids.empty()) {
      const Constraint constraint = constraintFrom(choices, system);
      if (constraint.terms.empty()) continue;
      const auto added = system.solver.addConstraint(constraint);
      if (added.accepted) {
        constraints.push_back(constraint);
        ids.push_back(added.id);
      } else {
        require(constraint.priority >= LayoutSolver::kRequired, "what is not required is never refused");
        System conflict;  // those named are enough to refuse it
        bool accepted = true;
        for (std::size_t i = 0; i < ids.size(); ++i)
          if (std::count(added.conflict.begin(), added.conflict.end(), ids[i]))
            accepted = conflict.solver.addConstraint(constraints[i]).accepted && accepted;
        require(accepted && !conflict.solver.addConstraint(constraint).accepted, "a conflict names its culprits");
      }
    } else {
      const unsigned index = choices.upTo(static_cast<unsigned>(std::min<std::size_t>(ids.size(), 255)));
      if (edit == 2) {
        const double constant = static_cast<double>(choices.upTo(201)) - 100;
        if (system.solver.setConstant(ids[index], constant).empty()) constraints[index].constant = constant;
      } else {
        system.solver.removeConstraint(ids[index]);
        ids.erase(ids.begin() + index);
        constraints.erase(constraints.begin() + index);
      }
    }
    if (++edits % 8 == 0) requireSameAsAnew(system, constraints);
  }
  requireSameAsAnew(system, constraints);
  return 0;
}

}  // namespace nimbo
