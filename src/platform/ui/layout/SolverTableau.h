#pragma once

#include <array>
#include <cstddef>
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

/// The simplex tableau of a LayoutSolver: rows that express basic symbols by the others, whose value is 0, and the sums
/// of errors to be made small, one for each priority. Every operation leaves it feasible and optimal unless it says
/// otherwise. Not thread-safe.
class SolverTableau {
 public:
  enum class Kind : std::uint8_t {
    unused,
    freeVariable,        ///< of any sign; in a row of a restricted symbol it never stays
    restrictedVariable,  ///< not negative
    slack,               ///< not negative: what an inequality has to spare
    error,               ///< not negative: what a constraint misses
    dummy,               ///< always 0: marks a required equation
    artificial,          ///< not negative: lives while a row is taken in
  };
  static constexpr std::uint32_t kNoOwner = 0xffffffff;

  /// `owner`: the constraint that the symbol belongs to.
  SolverSymbol makeSymbol(Kind kind, std::uint32_t owner);
  /// Takes a symbol that is not basic out of every row; its number is used again.
  void dropSymbol(SolverSymbol symbol);
  double value(SolverSymbol symbol) const;
  std::uint32_t owner(SolverSymbol symbol) const { return _symbols[symbol].owner; }
  Kind kind(SolverSymbol symbol) const { return _symbols[symbol].kind; }

  /// Adds a multiple of a symbol, or of what it is expressed by, to a row.
  void addTo(SolverRow& row, SolverSymbol symbol, double coefficient) const;

  /// Takes in `0 = row`, which is made by `addTo`. `own`: the symbols that are in no other row. False when the equation
  /// contradicts the others: nothing is changed, and `conflict` says with whom. Call `optimise` afterwards.
  bool insert(SolverRow row, const std::array<SolverSymbol, 2>& own);
  /// Takes out the equation that the symbol belongs to, and leaves the symbol in no row. Call `optimise` afterwards.
  void removeEquation(SolverSymbol marker);

  /// Adds (1) or takes away (-1) the cost of a symbol. Call `optimise` afterwards.
  void addCost(double priority, SolverSymbol symbol, int factor);
  void optimise();

  /// Replaces a symbol by itself less `amount` in every row. False when the equations then contradict each other:
  /// nothing is changed, and `conflict` says which ones.
  bool shift(SolverSymbol symbol, double amount);

  /// The owners in the equation that could not hold, each once, in ascending order.
  const std::vector<std::uint32_t>& conflict() const { return _conflict; }

  struct BasicRow {
    SolverSymbol basic;
    SolverRow row;
  };
  struct Level {
    double priority;
    int uses;
    SolverRow row;
  };
  const std::vector<BasicRow>& rows() const { return _rows; }
  /// From the highest priority on.
  const std::vector<Level>& levels() const { return _levels; }

 private:
  static constexpr std::uint32_t kNoRow = 0xffffffff;
  struct Symbol {
    Kind kind = Kind::unused;
    std::uint32_t row = kNoRow;  // where it is basic
    std::uint32_t owner = kNoOwner;
  };

  bool isRestricted(SolverSymbol symbol) const;
  bool canEnter(SolverSymbol symbol) const;
  SolverSymbol subjectFor(const SolverRow& row, const std::array<SolverSymbol, 2>& own) const;
  bool insertWithArtificial(const SolverRow& row);
  void addBasicRow(SolverSymbol basic, SolverRow row);
  SolverRow takeBasicRow(std::uint32_t index);
  void substituteEverywhere(SolverSymbol symbol, const SolverRow& row);
  void pivot(std::uint32_t leavingRow, SolverSymbol entering);
  void optimiseLevel(std::size_t level);
  SolverSymbol symbolToEnter(std::size_t level) const;
  std::uint32_t rowToLeave(SolverSymbol entering) const;
  std::uint32_t rowToLeaveWith(SolverSymbol marker) const;
  void shiftConstants(SolverSymbol symbol, double amount);
  bool restoreFeasibility();
  std::uint32_t infeasibleRow() const;
  SolverSymbol symbolToRepair(const SolverRow& row, double direction) const;
  int compareRatios(SolverSymbol a, double aCoefficient, SolverSymbol b, double bCoefficient) const;
  void recordConflict(const SolverRow& row, SolverSymbol basic);

  std::vector<Symbol> _symbols;
  std::vector<SolverSymbol> _unused;
  std::vector<BasicRow> _rows;
  std::vector<Level> _levels;
  std::vector<std::uint32_t> _conflict;
};

}  // namespace nimbo
