#include "platform/ui/layout/SolverRow.h"

#include <algorithm>
#include <cmath>

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

}  // namespace nimbo
