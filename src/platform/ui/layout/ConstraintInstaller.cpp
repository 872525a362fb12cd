#include "platform/ui/layout/ConstraintInstaller.h"

#include <algorithm>

#include "platform/ui/layout/LayoutEngine.h"

namespace nimbo {

void ConstraintInstaller::Form::add(Variable variable, double coefficient) {
  for (std::size_t index = 0; index < count; ++index) {
    if (terms[index].variable != variable) continue;
    terms[index].coefficient += coefficient;
    return;
  }
  terms.at(count++) = {variable, coefficient};
}

bool ConstraintInstaller::Form::hasTermsOf(const Form& other) const {
  const auto isSame = [](const LayoutSolver::Term& a, const LayoutSolver::Term& b) {
    return a.variable == b.variable && a.coefficient == b.coefficient;
  };
  return count == other.count && relation == other.relation && priority == other.priority &&
         std::equal(terms.begin(), terms.begin() + static_cast<std::ptrdiff_t>(count), other.terms.begin(), isSame);
}

void ConstraintInstaller::update(const Forms& forms, std::string_view place) {
  ++_update;
  std::vector<const LayoutConstraint*> toInstall;
  std::vector<std::pair<Entry*, double>> toChange;
  for (const auto& [constraint, form] : forms) {
    Entry& entry = _entries[constraint];
    entry.seen = _update;
    if (entry.id && form.hasTermsOf(entry.form)) {
      if (form.constant != entry.form.constant) toChange.emplace_back(&entry, form.constant);
      continue;
    }
    uninstall(entry);
    entry.form = form;
    toInstall.push_back(constraint);
  }
  for (auto keyed = _entries.begin(); keyed != _entries.end();) {
    if (keyed->second.seen == _update) {
      ++keyed;
      continue;
    }
    uninstall(keyed->second);
    keyed = _entries.erase(keyed);
  }
  for (const auto& [entry, constant] : toChange) {
    entry->form.constant = constant;
    if (_solver.setConstant(*entry->id, constant).empty()) continue;
    // It may fit in once the others have changed too.
    toInstall.push_back(_installed.at(*entry->id));
    uninstall(*entry);
  }
  for (const LayoutConstraint* constraint : toInstall) install(*constraint, place);
}

void ConstraintInstaller::install(const LayoutConstraint& constraint, std::string_view place) {
  Entry& entry = _entries.at(&constraint);
  const auto terms = entry.form.terms.begin();
  const LayoutSolver::Constraint asked{{terms, terms + static_cast<std::ptrdiff_t>(entry.form.count)},
                                       entry.form.constant,
                                       entry.form.relation,
                                       entry.form.priority};
  for (;;) {
    const LayoutSolver::Added added = _solver.addConstraint(asked);
    if (added.accepted) {
      entry.id = added.id;
      entry.reported = false;
      _installed[added.id] = &constraint;
      return;
    }
    const LayoutConstraint& leftOut = constraintToLeaveOut(constraint, added.conflict);
    report(leftOut, constraint, added.conflict, place);
    if (&leftOut == &constraint) return;
    uninstall(_entries.at(&leftOut));
  }
}

void ConstraintInstaller::uninstall(Entry& entry) {
  if (!entry.id) return;
  _solver.removeConstraint(*entry.id);
  _installed.erase(*entry.id);
  entry.id.reset();
}

/// All of them are required: a bound is left out before an equation, and of several the one activated last.
const LayoutConstraint& ConstraintInstaller::constraintToLeaveOut(const LayoutConstraint& added,
                                                                  const std::vector<ConstraintId>& conflict) const {
  const auto weight = [](const LayoutConstraint& constraint) {
    return std::pair(constraint.relation() != LayoutRelation::equal, constraint.order());
  };
  const LayoutConstraint* leftOut = &added;
  for (const auto id : conflict) {
    const LayoutConstraint* other = _installed.at(id);
    if (weight(*other) > weight(*leftOut)) leftOut = other;
  }
  return *leftOut;
}

void ConstraintInstaller::report(const LayoutConstraint& leftOut, const LayoutConstraint& added,
                                 const std::vector<ConstraintId>& conflict, std::string_view place) {
  if (std::exchange(_entries.at(&leftOut).reported, true)) return;
  std::string texts = added.description();
  for (const auto id : conflict) texts += "; " + _installed.at(id)->description();
  writeLog(kLayoutLogFacility, LogLevel::error,
           "Constraints in %@ contradict each other. \"%@\" is left out as long as they do: %@",
           {place, leftOut.description(), texts});
}

std::string ConstraintInstaller::dump(const std::function<std::string(Variable)>& nameOfVariable) const {
  std::string text =
      _solver.dump({nameOfVariable, [this](ConstraintId id) { return _installed.at(id)->description(); }});
  for (const auto& [constraint, entry] : _entries)
    if (!entry.id) text += "left out: " + constraint->description() + "\n";
  return text;
}

}  // namespace nimbo
