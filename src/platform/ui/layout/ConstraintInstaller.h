#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <utility>
#include <vector>

#include "platform/ui/layout/LayoutConstraint.h"
#include "platform/ui/layout/LayoutSolver.h"

namespace nimbo {

/// Keeps a solver in step with the constraints in force, changing as little as possible. Of required constraints that
/// contradict each other one is left out, logged, and tried again whenever anything changes.
class ConstraintInstaller {
 public:
  using Variable = LayoutSolver::Variable;

  /// A constraint as the solver gets it.
  struct Form {
    std::array<LayoutSolver::Term, 4> terms;
    std::size_t count = 0;
    double constant = 0;
    LayoutRelation relation = LayoutRelation::equal;
    double priority = 0;

    void add(Variable variable, double coefficient);
    /// Whether they are the same but for the constant.
    bool hasTermsOf(const Form& other) const;
  };
  using Forms = std::vector<std::pair<const LayoutConstraint*, Form>>;

  Variable addVariable(LayoutSolver::Sign sign) { return _solver.addVariable(sign); }
  double value(Variable variable) const { return _solver.value(variable); }

  /// These constraints are in force from now on, and no others; they live until the next update. `place` is where the
  /// log says that they are.
  void update(const Forms& forms, std::string_view place);

  /// The solver's tableau with the names of the constraints, and the constraints left out.
  std::string dump(const std::function<std::string(Variable)>& nameOfVariable) const;

 private:
  using ConstraintId = LayoutSolver::ConstraintId;
  struct Entry {
    Form form;                       // as it is in the solver, or should be
    std::optional<ConstraintId> id;  // none while it is left out
    bool reported = false;
    std::uint64_t seen = 0;  // the update in which it was in force
  };
  void install(const LayoutConstraint& constraint, std::string_view place);
  void uninstall(Entry& entry);
  const LayoutConstraint& constraintToLeaveOut(const LayoutConstraint& added,
                                               const std::vector<ConstraintId>& conflict) const;
  void report(const LayoutConstraint& leftOut, const LayoutConstraint& added, const std::vector<ConstraintId>& conflict,
              std::string_view place);

  LayoutSolver _solver;
  std::unordered_map<const LayoutConstraint*, Entry> _entries;
  std::unordered_map<ConstraintId, const LayoutConstraint*> _installed;
  std::uint64_t _update = 0;
};

}  // namespace nimbo
