#include "platform/ui/layout/SolverTableau.h"

#include <algorithm>
#include <cmath>
#include <limits>
#include <utility>

namespace nimbo {

std::vector<SolverRow::Cell>::iterator SolverRow::find(SolverSymbol symbol) {
  return std::ranges::lower_bound(_cells, symbol, {}, &Cell::symbol);
}

double SolverRow::coefficientFor(SolverSymbol symbol) const {
  const auto cell = std::ranges::lower_bound(_cells, symbol, {}, &Cell::symbol);
  return cell != _cells.end() && cell->symbol == symbol ? cell->coefficient : 0;
}

void SolverRow::addSymbol(SolverSymbol symbol, double coefficient) {
  const auto cell = find(symbol);
  if (cell == _cells.end() || cell->symbol != symbol) {
    if (std::abs(coefficient) > kSolverEpsilon) _cells.insert(cell, {symbol, coefficient});
    return;
  }
  cell->coefficient += coefficient;
  if (std::abs(cell->coefficient) <= kSolverEpsilon) _cells.erase(cell);
}

void SolverRow::removeSymbol(SolverSymbol symbol) {
  const auto cell = find(symbol);
  if (cell != _cells.end() && cell->symbol == symbol) _cells.erase(cell);
}

void SolverRow::addRow(const SolverRow& row, double factor) {
  static thread_local std::vector<Cell> merged;
  merged.clear();
  auto mine = _cells.begin();
  auto theirs = row._cells.begin();
  while (theirs != row._cells.end()) {
    if (mine != _cells.end() && mine->symbol < theirs->symbol) {
      merged.push_back(*mine++);
      continue;
    }
    double coefficient = theirs->coefficient * factor;
    if (mine != _cells.end() && mine->symbol == theirs->symbol) coefficient += (mine++)->coefficient;
    if (std::abs(coefficient) > kSolverEpsilon) merged.push_back({theirs->symbol, coefficient});
    ++theirs;
  }
  merged.insert(merged.end(), mine, _cells.end());
  _cells.assign(merged.begin(), merged.end());
  _constant += row._constant * factor;
}

void SolverRow::negate() { scale(-1); }

void SolverRow::scale(double factor) {
  _constant *= factor;
  for (Cell& cell : _cells) cell.coefficient *= factor;
}

void SolverRow::solveFor(SolverSymbol subject) {
  const auto cell = find(subject);
  const double factor = -1 / cell->coefficient;
  _cells.erase(cell);
  scale(factor);
}

void SolverRow::exchange(SolverSymbol basic, SolverSymbol entering) {
  addSymbol(basic, -1);
  solveFor(entering);
}

bool SolverRow::substitute(SolverSymbol symbol, const SolverRow& row) {
  const auto cell = find(symbol);
  if (cell == _cells.end() || cell->symbol != symbol) return false;
  const double coefficient = cell->coefficient;
  _cells.erase(cell);
  addRow(row, coefficient);
  return true;
}

namespace {

constexpr SolverSymbol kNoSymbol = 0xffffffff;
constexpr double kInfinity = std::numeric_limits<double>::infinity();

// Bland's rule ends by itself; rounding could defeat it. What is reached by then is feasible and near enough.
constexpr int kMaxPivots = 10'000;

bool isZero(double number) { return std::abs(number) <= kSolverEpsilon; }

}  // namespace

SolverSymbol SolverTableau::makeSymbol(Kind kind, std::uint32_t owner) {
  SolverSymbol symbol;
  if (_unused.empty()) {
    symbol = static_cast<SolverSymbol>(_symbols.size());
    _symbols.emplace_back();
  } else {
    symbol = _unused.back();
    _unused.pop_back();
  }
  _symbols[symbol] = {kind, kNoRow, owner};
  return symbol;
}

void SolverTableau::dropSymbol(SolverSymbol symbol) {
  // No row should hold it any more; what rounding left of it must not come back as part of another symbol.
  for (BasicRow& basicRow : _rows) basicRow.row.removeSymbol(symbol);
  for (Level& level : _levels) level.row.removeSymbol(symbol);
  _symbols[symbol] = {};
  _unused.push_back(symbol);
}

double SolverTableau::value(SolverSymbol symbol) const {
  const std::uint32_t row = _symbols[symbol].row;
  return row == kNoRow ? 0 : _rows[row].row.constant();
}

void SolverTableau::addTo(SolverRow& row, SolverSymbol symbol, double coefficient) const {
  const std::uint32_t index = _symbols[symbol].row;
  if (index == kNoRow)
    row.addSymbol(symbol, coefficient);
  else
    row.addRow(_rows[index].row, coefficient);
}

bool SolverTableau::isRestricted(SolverSymbol symbol) const { return _symbols[symbol].kind != Kind::freeVariable; }

bool SolverTableau::canEnter(SolverSymbol symbol) const {
  const Kind kind = _symbols[symbol].kind;
  return kind == Kind::slack || kind == Kind::error || kind == Kind::restrictedVariable;
}

bool SolverTableau::insert(SolverRow row, const std::array<SolverSymbol, 2>& own) {
  if (row.constant() < 0) row.negate();
  const SolverSymbol subject = subjectFor(row, own);
  if (subject == kNoSymbol) {
    if (std::ranges::any_of(row.cells(), [this](const auto& cell) { return canEnter(cell.symbol); }))
      return insertWithArtificial(row);
    recordConflict(row, kNoSymbol);
    return false;
  }
  row.solveFor(subject);
  substituteEverywhere(subject, row);
  addBasicRow(subject, std::move(row));
  return true;
}

/// A symbol that can be expressed by the row without making anything infeasible; the constant is not negative.
SolverSymbol SolverTableau::subjectFor(const SolverRow& row, const std::array<SolverSymbol, 2>& own) const {
  // Free variables are only in rows of free variables: expressing one disturbs nobody.
  for (const auto& cell : row.cells())
    if (_symbols[cell.symbol].kind == Kind::freeVariable) return cell.symbol;
  for (const SolverSymbol symbol : own)
    if (canEnter(symbol) && row.coefficientFor(symbol) < 0) return symbol;
  if (!isZero(row.constant())) return kNoSymbol;
  // Nothing changes its value where the subject is 0, and stays so.
  for (const auto& cell : row.cells())
    if (canEnter(cell.symbol)) return cell.symbol;
  return own[0];  // the equation says nothing new; its dummy holds its place
}

bool SolverTableau::insertWithArtificial(const SolverRow& row) {
  const SolverSymbol artificial = makeSymbol(Kind::artificial, kNoOwner);
  addBasicRow(artificial, row);
  _levels.insert(_levels.begin(), Level{kInfinity, 1, row});
  optimiseLevel(0);
  _levels.erase(_levels.begin());

  const std::uint32_t index = _symbols[artificial].row;
  bool feasible = true;
  if (index != kNoRow) {
    feasible = isZero(_rows[index].row.constant());
    if (!feasible) {
      // No other row holds the symbols of the equation: it goes with this row.
      recordConflict(_rows[index].row, kNoSymbol);
      takeBasicRow(index);
    } else {
      const auto& cells = _rows[index].row.cells();
      const auto cell = std::ranges::find_if(cells, [this](const auto& c) { return canEnter(c.symbol); });
      if (cell != cells.end())
        pivot(index, cell->symbol);
      else if (!cells.empty())
        pivot(index, cells.front().symbol);
      else
        takeBasicRow(index);
    }
  }
  dropSymbol(artificial);
  return feasible;
}

void SolverTableau::removeEquation(SolverSymbol marker) {
  std::uint32_t index = _symbols[marker].row;
  if (index == kNoRow) {
    index = rowToLeaveWith(marker);
    if (index == kNoRow) return;
    pivot(index, marker);
  }
  takeBasicRow(_symbols[marker].row);
}

/// The row in which the marker can become basic while all else stays feasible. The sign of the marker itself does not
/// matter any more: its row goes.
std::uint32_t SolverTableau::rowToLeaveWith(SolverSymbol marker) const {
  std::uint32_t growing = kNoRow, shrinking = kNoRow, free = kNoRow;
  double growingRatio = kInfinity, shrinkingRatio = kInfinity;
  for (std::uint32_t index = 0; index < _rows.size(); ++index) {
    const double coefficient = _rows[index].row.coefficientFor(marker);
    if (coefficient == 0) continue;
    if (!isRestricted(_rows[index].basic)) {
      free = index;
    } else {
      const double ratio = _rows[index].row.constant() / std::abs(coefficient);
      double& best = coefficient < 0 ? growingRatio : shrinkingRatio;
      if (ratio < best) {
        best = ratio;
        (coefficient < 0 ? growing : shrinking) = index;
      }
    }
  }
  if (growing != kNoRow && (shrinking == kNoRow || growingRatio <= shrinkingRatio)) return growing;
  return shrinking != kNoRow ? shrinking : free;
}

void SolverTableau::addCost(double priority, SolverSymbol symbol, int factor) {
  auto level = std::ranges::lower_bound(_levels, priority, std::greater<>(), &Level::priority);
  if (level == _levels.end() || level->priority != priority)
    level = _levels.insert(level, Level{priority, 0, SolverRow()});
  addTo(level->row, symbol, factor);
  level->uses += factor;
  if (level->uses == 0) _levels.erase(level);
}

void SolverTableau::optimise() {
  for (std::size_t level = 0; level < _levels.size(); ++level) optimiseLevel(level);
}

void SolverTableau::optimiseLevel(std::size_t level) {
  for (int pivots = 0; pivots < kMaxPivots; ++pivots) {
    const SolverSymbol entering = symbolToEnter(level);
    if (entering == kNoSymbol) return;
    const std::uint32_t leaving = rowToLeave(entering);
    if (leaving == kNoRow) return;  // a sum of errors cannot fall for ever: the coefficient is rounding
    pivot(leaving, entering);
  }
}

/// Bland's rule: the first symbol that makes the sum smaller and leaves those of the higher levels alone.
SolverSymbol SolverTableau::symbolToEnter(std::size_t level) const {
  for (const auto& cell : _levels[level].row.cells()) {
    if (cell.coefficient >= 0 || !canEnter(cell.symbol)) continue;
    const bool costsAbove = std::any_of(_levels.begin(), _levels.begin() + static_cast<std::ptrdiff_t>(level),
                                        [&](const Level& l) { return l.row.coefficientFor(cell.symbol) != 0; });
    if (!costsAbove) return cell.symbol;
  }
  return kNoSymbol;
}

/// The row whose basic symbol is the first to reach 0 while the entering one grows; of several, the first symbol.
std::uint32_t SolverTableau::rowToLeave(SolverSymbol entering) const {
  std::uint32_t best = kNoRow;
  double bestRatio = kInfinity;
  for (std::uint32_t index = 0; index < _rows.size(); ++index) {
    if (!isRestricted(_rows[index].basic)) continue;
    const double coefficient = _rows[index].row.coefficientFor(entering);
    // A dummy stays 0: it leaves in either direction.
    if (coefficient == 0 || (coefficient > 0 && _symbols[_rows[index].basic].kind != Kind::dummy)) continue;
    const double ratio = std::abs(_rows[index].row.constant() / coefficient);
    if (ratio < bestRatio || (ratio == bestRatio && _rows[index].basic < _rows[best].basic)) {
      bestRatio = ratio;
      best = index;
    }
  }
  return best;
}

void SolverTableau::addBasicRow(SolverSymbol basic, SolverRow row) {
  _symbols[basic].row = static_cast<std::uint32_t>(_rows.size());
  _rows.push_back({basic, std::move(row)});
}

SolverRow SolverTableau::takeBasicRow(std::uint32_t index) {
  _symbols[_rows[index].basic].row = kNoRow;
  SolverRow row = std::move(_rows[index].row);
  if (index + 1 != _rows.size()) {
    _rows[index] = std::move(_rows.back());
    _symbols[_rows[index].basic].row = index;
  }
  _rows.pop_back();
  return row;
}

void SolverTableau::substituteEverywhere(SolverSymbol symbol, const SolverRow& row) {
  for (BasicRow& basicRow : _rows) basicRow.row.substitute(symbol, row);
  for (Level& level : _levels) level.row.substitute(symbol, row);
}

void SolverTableau::pivot(std::uint32_t leavingRow, SolverSymbol entering) {
  const SolverSymbol leaving = _rows[leavingRow].basic;
  SolverRow row = takeBasicRow(leavingRow);
  row.exchange(leaving, entering);
  substituteEverywhere(entering, row);
  addBasicRow(entering, std::move(row));
}

bool SolverTableau::shift(SolverSymbol symbol, double amount) {
  shiftConstants(symbol, amount);
  if (restoreFeasibility()) return true;
  // The costs are as good as before: going back is as simple as going on.
  const std::vector<std::uint32_t> conflict = _conflict;
  shiftConstants(symbol, -amount);
  restoreFeasibility();
  _conflict = conflict;
  return false;
}

void SolverTableau::shiftConstants(SolverSymbol symbol, double amount) {
  if (const std::uint32_t index = _symbols[symbol].row; index != kNoRow) {
    _rows[index].row.addConstant(amount);
    return;
  }
  for (BasicRow& basicRow : _rows) basicRow.row.addConstant(-amount * basicRow.row.coefficientFor(symbol));
  for (Level& level : _levels) level.row.addConstant(-amount * level.row.coefficientFor(symbol));
}

/// The dual simplex: no symbol makes any sum smaller by growing, but some basic ones are negative.
bool SolverTableau::restoreFeasibility() {
  for (int pivots = 0; pivots < kMaxPivots; ++pivots) {
    const std::uint32_t leaving = infeasibleRow();
    if (leaving == kNoRow) return true;
    const SolverRow& row = _rows[leaving].row;
    const SolverSymbol entering = symbolToRepair(row, row.constant() < 0 ? 1 : -1);
    if (entering == kNoSymbol) {
      recordConflict(row, _rows[leaving].basic);
      return false;
    }
    pivot(leaving, entering);
  }
  if (const std::uint32_t row = infeasibleRow(); row != kNoRow) {
    recordConflict(_rows[row].row, _rows[row].basic);
    return false;
  }
  return true;
}

std::uint32_t SolverTableau::infeasibleRow() const {
  std::uint32_t best = kNoRow;
  for (std::uint32_t index = 0; index < _rows.size(); ++index) {
    const auto& [basic, row] = _rows[index];
    if (!isRestricted(basic) || isZero(row.constant())) continue;
    if (row.constant() > 0 && _symbols[basic].kind != Kind::dummy) continue;
    if (best == kNoRow || basic < _rows[best].basic) best = index;
  }
  return best;
}

/// The symbol that brings the row's constant to 0 and costs least for it.
SolverSymbol SolverTableau::symbolToRepair(const SolverRow& row, double direction) const {
  SolverSymbol best = kNoSymbol;
  double bestCoefficient = 0;
  for (const auto& cell : row.cells()) {
    const double coefficient = cell.coefficient * direction;
    if (coefficient <= 0 || !canEnter(cell.symbol)) continue;
    if (best != kNoSymbol && compareRatios(cell.symbol, coefficient, best, bestCoefficient) >= 0) continue;
    best = cell.symbol;
    bestCoefficient = coefficient;
  }
  return best;
}

/// Compares the costs of two symbols for one unit of a row, from the highest level on.
int SolverTableau::compareRatios(SolverSymbol a, double aCoefficient, SolverSymbol b, double bCoefficient) const {
  for (const Level& level : _levels) {
    const double difference = level.row.coefficientFor(a) / aCoefficient - level.row.coefficientFor(b) / bCoefficient;
    if (!isZero(difference)) return difference < 0 ? -1 : 1;
  }
  return 0;
}

void SolverTableau::recordConflict(const SolverRow& row, SolverSymbol basic) {
  _conflict.clear();
  const auto add = [this](SolverSymbol symbol) {
    if (_symbols[symbol].owner != kNoOwner) _conflict.push_back(_symbols[symbol].owner);
  };
  if (basic != kNoSymbol) add(basic);
  for (const auto& cell : row.cells()) add(cell.symbol);
  std::ranges::sort(_conflict);
  _conflict.erase(std::unique(_conflict.begin(), _conflict.end()), _conflict.end());
}

}  // namespace nimbo
