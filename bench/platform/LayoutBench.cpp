// The constraints of one row, beside python3-kiwisolver's C++ solver on the same ones.

#include <benchmark/benchmark.h>

#include <cmath>

#include "peers/KiwiSolver.h"
#include "platform/CellConstraints.h"
#include "platform/ui/layout/LayoutSolver.h"

namespace nimbo {
namespace {

/// A solver with the constraints of a cell. Lengths are not negative by themselves, as in the layout engine; the peer
/// is spared constraints for that.
class CellSolver {
 public:
  explicit CellSolver(const CellConstraints& cell) {
    for (std::size_t i = 0; i < cell.variableCount; ++i) {
      const bool isLength = i < 2 || (i - 2) % 4 >= 2;
      _variables.push_back(_solver.addVariable(isLength ? LayoutSolver::Sign::notNegative : LayoutSolver::Sign::any));
    }
    for (const CellConstraint& constraint : cell.constraints) {
      LayoutSolver::Constraint asked{{}, constraint.constant, constraint.relation, constraint.priority};
      for (const auto& term : constraint.terms) asked.terms.push_back({_variables[term.variable], term.coefficient});
      _constraints.push_back(asked);
    }
  }

  std::vector<LayoutSolver::ConstraintId> solve(LayoutSolver& solver) const {
    std::vector<LayoutSolver::ConstraintId> ids;
    for (const auto& constraint : _constraints) ids.push_back(solver.addConstraint(constraint).id);
    return ids;
  }
  /// With the variables and no constraint.
  const LayoutSolver& empty() const { return _solver; }
  double sum(const LayoutSolver& solver) const {
    double sum = 0;
    for (const auto variable : _variables) sum += solver.value(variable);
    return sum;
  }

 private:
  LayoutSolver _solver;
  std::vector<LayoutSolver::Variable> _variables;
  std::vector<LayoutSolver::Constraint> _constraints;
};

double peerSum(const KiwiSolver& kiwi, const CellConstraints& cell) {
  double sum = 0;
  for (std::size_t i = 0; i < cell.variableCount; ++i) sum += kiwi.value(i);
  return sum;
}

void solveCell(benchmark::State& state) {
  const CellConstraints cell;
  const CellSolver asked(cell);
  double sum = 0;
  for (auto _ : state) {
    LayoutSolver solver = asked.empty();
    asked.solve(solver);
    benchmark::DoNotOptimize(sum = asked.sum(solver));
  }
  KiwiSolver kiwi(cell);
  kiwi.solveAnew();
  state.counters["constraints"] = static_cast<double>(cell.constraints.size());
  state.counters["differsBy"] = std::abs(sum - peerSum(kiwi, cell));
}
BENCHMARK(solveCell)->Unit(benchmark::kMicrosecond);

void solveCellPeer(benchmark::State& state) {
  KiwiSolver kiwi{CellConstraints()};
  for (auto _ : state) kiwi.solveAnew();
}
BENCHMARK(solveCellPeer)->Unit(benchmark::kMicrosecond);

void changeConstant(benchmark::State& state) {
  const CellConstraints cell;
  const CellSolver asked(cell);
  LayoutSolver solver = asked.empty();
  const auto id = asked.solve(solver)[cell.rowHeight];
  double height = 110, sum = 0;
  for (auto _ : state) {
    height = height == 110 ? 100 : 110;
    if (!solver.setConstant(id, -height).empty()) state.SkipWithError("the height is refused");
    benchmark::DoNotOptimize(sum = asked.sum(solver));
  }
  KiwiSolver kiwi(cell);
  kiwi.solveForEditing();
  kiwi.suggestRowHeight(height);
  state.counters["differsBy"] = std::abs(sum - peerSum(kiwi, cell));
}
BENCHMARK(changeConstant);

void changeConstantPeer(benchmark::State& state) {
  KiwiSolver kiwi{CellConstraints()};
  kiwi.solveForEditing();
  double height = 110;
  for (auto _ : state) {
    height = height == 110 ? 100 : 110;
    kiwi.suggestRowHeight(height);
  }
}
BENCHMARK(changeConstantPeer);

}  // namespace
}  // namespace nimbo
