#pragma once

#include <cstdint>
#include <vector>

namespace nimbo {

/// A column of the solver's tableau.
using SolverSymbol = std::uint32_t;

/// Coefficients this near to 0 are 0: they come from rounding.
inline constexpr double kSolverEpsilon = 1e-8;

/// A linear expression: a constant and a few symbols with their coefficients, in the order of the symbols.
class SolverRow {
 public:
  struct Cell {
    SolverSymbol symbol;
    double coefficient;
  };

  explicit SolverRow(double constant = 0) : _constant(constant) {}

  double constant() const { return _constant; }
  void addConstant(double amount) { _constant += amount; }
  const std::vector<Cell>& cells() const { return _cells; }

  /// 0 for a symbol that the row does not hold.
  double coefficientFor(SolverSymbol symbol) const;
  void addSymbol(SolverSymbol symbol, double coefficient);
  void removeSymbol(SolverSymbol symbol);
  void addRow(const SolverRow& row, double factor);
  void negate();

  /// Turns `0 = row` into `subject = row`. The row holds the subject.
  void solveFor(SolverSymbol subject);
  /// Turns `basic = row` into `entering = row`. The row holds `entering`.
  void exchange(SolverSymbol basic, SolverSymbol entering);
  /// Puts `row` in the place of the symbol; answers whether the symbol was held.
  bool substitute(SolverSymbol symbol, const SolverRow& row);

 private:
  std::vector<Cell>::iterator find(SolverSymbol symbol);
  void scale(double factor);

  double _constant;
  std::vector<Cell> _cells;
};

}  // namespace nimbo
