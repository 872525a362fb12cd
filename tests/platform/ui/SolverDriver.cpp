// Runs constraint systems from standard input through the layout solver; tools/solver-compare.py talks to it.
//
//   system N        starts a system of N variables; the first NONNEGATIVE of them are not negative
//     (line: system N NONNEGATIVE)
//   add R P C N (V K)...  adds "C + K1 V1 + ... R 0" of priority P; R is -1 (<=), 0 or 1 (>=). Answers "yes ID", or
//                   "no" and the ids of the constraints in its way
//   set ID C        changes a constant. Answers "yes", or "no" and the ids of the constraints in its way
//   remove ID
//   values          answers the variables' values

#include <cstdio>
#include <iostream>

#include "platform/ui/layout/LayoutSolver.h"

using nimbo::LayoutSolver;

namespace {

void answer(bool isAccepted, const std::vector<LayoutSolver::ConstraintId>& ids) {
  std::printf(isAccepted ? "yes" : "no");
  for (const auto id : ids) std::printf(" %u", static_cast<unsigned>(id));
  std::printf("\n");
}

}  // namespace

int main() {
  LayoutSolver solver;
  std::vector<LayoutSolver::Variable> variables;
  std::string word;
  while (std::cin >> word) {
    if (word == "system") {
      std::size_t count = 0, nonNegative = 0;
      std::cin >> count >> nonNegative;
      solver = LayoutSolver();
      variables.clear();
      for (std::size_t i = 0; i < count; ++i)
        variables.push_back(
            solver.addVariable(i < nonNegative ? LayoutSolver::Sign::notNegative : LayoutSolver::Sign::any));
    } else if (word == "add") {
      int relation = 0;
      std::size_t terms = 0;
      LayoutSolver::Constraint constraint;
      std::cin >> relation >> constraint.priority >> constraint.constant >> terms;
      constraint.relation = static_cast<nimbo::LayoutRelation>(relation);
      for (std::size_t i = 0; i < terms; ++i) {
        std::size_t variable = 0;
        double coefficient = 0;
        std::cin >> variable >> coefficient;
        constraint.terms.push_back({variables.at(variable), coefficient});
      }
      const auto added = solver.addConstraint(constraint);
      answer(added.accepted, added.accepted ? std::vector{added.id} : added.conflict);
    } else if (word == "set") {
      unsigned id = 0;
      double constant = 0;
      std::cin >> id >> constant;
      const auto conflict = solver.setConstant(LayoutSolver::ConstraintId{id}, constant);
      answer(conflict.empty(), conflict);
    } else if (word == "remove") {
      unsigned id = 0;
      std::cin >> id;
      solver.removeConstraint(LayoutSolver::ConstraintId{id});
    } else if (word == "values") {
      for (const auto variable : variables) std::printf("%.17g ", solver.value(variable));
      std::printf("\n");
    } else {
      std::fprintf(stderr, "nimbo_solver_driver: unknown word \"%s\"\n", word.c_str());
      return 2;
    }
    std::fflush(stdout);
  }
}
