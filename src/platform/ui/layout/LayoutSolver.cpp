#include "platform/ui/layout/LayoutSolver.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <stdexcept>

namespace nimbo {

namespace {

void requireFinite(double number) {
  if (!std::isfinite(number)) throw std::invalid_argument("a number of a constraint is not finite");
}

std::string numberText(double number) {
  char text[32];
  std::snprintf(text, sizeof text, "%.6g", number);
  return text;
}

/// Writes the parts of a tableau.
class Dump {
 public:
  Dump(const SolverTableau& tableau, const LayoutSolver::Names& names) : _tableau(tableau), _names(names) {}

  std::string row(const SolverRow& row) const {
    std::string text = numberText(row.constant());
    for (const auto& cell : row.cells()) {
      text += cell.coefficient < 0 ? " - " : " + ";
      if (std::abs(cell.coefficient) != 1) text += numberText(std::abs(cell.coefficient)) + " ";
      text += symbol(cell.symbol);
    }
    return text;
  }

  std::string symbol(SolverSymbol symbol) const {
    switch (_tableau.kind(symbol)) {
      case SolverTableau::Kind::slack:
        return "slack(" + owner(symbol) + ")";
      case SolverTableau::Kind::error:
        return "error(" + owner(symbol) + ")";
      case SolverTableau::Kind::dummy:
        return "dummy(" + owner(symbol) + ")";
      default:
        return _names.variable ? _names.variable(LayoutSolver::Variable{symbol}) : "v" + std::to_string(symbol);
    }
  }

 private:
  std::string owner(SolverSymbol symbol) const {
    const std::uint32_t index = _tableau.owner(symbol);
    return _names.constraint ? _names.constraint(LayoutSolver::ConstraintId{index}) : "c" + std::to_string(index);
  }

  const SolverTableau& _tableau;
  const LayoutSolver::Names& _names;
};

}  // namespace

LayoutSolver::Variable LayoutSolver::addVariable(Sign sign) {
  const auto kind = sign == Sign::any ? SolverTableau::Kind::freeVariable : SolverTableau::Kind::restrictedVariable;
  return Variable{_tableau.makeSymbol(kind, SolverTableau::kNoOwner)};
}

LayoutSolver::Added LayoutSolver::addConstraint(const Constraint& constraint) {
  requireFinite(constraint.constant);
  requireFinite(constraint.priority);
  for (const Term& term : constraint.terms) requireFinite(term.coefficient);

  std::uint32_t index = static_cast<std::uint32_t>(_constraints.size());
  if (_unused.empty()) {
    _constraints.emplace_back();
  } else {
    index = _unused.back();
    _unused.pop_back();
  }
  Installed& installed = _constraints[index];
  installed = {.constant = constraint.constant, .priority = constraint.priority, .relation = constraint.relation};
  makeSymbols(installed, index);

  SolverRow row(installed.sign() * constraint.constant);
  for (const Term& term : constraint.terms)
    _tableau.addTo(row, static_cast<SolverSymbol>(term.variable), installed.sign() * term.coefficient);
  row.addSymbol(installed.marker, -1);
  if (installed.other != kNoSymbol) row.addSymbol(installed.other, 1);
  const bool feasible = _tableau.insert(
      std::move(row), {installed.marker, installed.other == kNoSymbol ? installed.marker : installed.other});
  Added added{feasible, ConstraintId{index}, {}};
  if (feasible) {
    addCosts(installed, 1);
  } else {
    added.conflict = conflictWithout(added.id);
    forget(index);
  }
  _tableau.optimise();
  return added;
}

void LayoutSolver::makeSymbols(Installed& installed, std::uint32_t index) {
  using Kind = SolverTableau::Kind;
  const bool required = installed.priority >= kRequired;
  Kind markerKind = Kind::slack;
  if (installed.relation == LayoutRelation::equal) markerKind = required ? Kind::dummy : Kind::error;
  installed.marker = _tableau.makeSymbol(markerKind, index);
  if (!required) installed.other = _tableau.makeSymbol(Kind::error, index);
}

void LayoutSolver::addCosts(const Installed& installed, int factor) {
  if (installed.markerCosts()) _tableau.addCost(installed.priority, installed.marker, factor);
  if (installed.other != kNoSymbol) _tableau.addCost(installed.priority, installed.other, factor);
}

void LayoutSolver::removeConstraint(ConstraintId id) {
  const std::uint32_t index = static_cast<std::uint32_t>(id);
  const Installed& installed = _constraints.at(index);
  addCosts(installed, -1);
  _tableau.removeEquation(installed.marker);
  forget(index);
  _tableau.optimise();
}

void LayoutSolver::forget(std::uint32_t index) {
  Installed& installed = _constraints[index];
  _tableau.dropSymbol(installed.marker);
  if (installed.other != kNoSymbol) _tableau.dropSymbol(installed.other);
  installed = {};
  _unused.push_back(index);
}

std::vector<LayoutSolver::ConstraintId> LayoutSolver::setConstant(ConstraintId id, double constant) {
  requireFinite(constant);
  Installed& installed = _constraints.at(static_cast<std::uint32_t>(id));
  if (constant == installed.constant) return {};
  if (!_tableau.shift(installed.marker, installed.sign() * (constant - installed.constant))) {
    auto conflict = conflictWithout(id);
    conflict.push_back(id);
    return conflict;
  }
  installed.constant = constant;
  return {};
}

std::vector<LayoutSolver::ConstraintId> LayoutSolver::conflictWithout(ConstraintId id) const {
  std::vector<ConstraintId> conflict;
  for (const std::uint32_t owner : _tableau.conflict())
    if (ConstraintId{owner} != id) conflict.push_back(ConstraintId{owner});
  return conflict;
}

std::string LayoutSolver::dump(const Names& names) const {
  const Dump dump(_tableau, names);
  std::string text;
  for (const auto& level : _tableau.levels())
    text += "errors at " + numberText(level.priority) + ": " + dump.row(level.row) + "\n";
  for (const auto& [basic, row] : _tableau.rows()) text += dump.symbol(basic) + " = " + dump.row(row) + "\n";
  return text;
}

}  // namespace nimbo
