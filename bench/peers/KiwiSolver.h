#pragma once

#include <memory>
#include <string>

#include "platform/CellConstraints.h"

namespace nimbo {

/// The C++ solver inside python3-kiwisolver, of which Debian packages no headers: called through the interpreter's C
/// interface, with every object made beforehand.
class KiwiSolver {
 public:
  /// Throws std::runtime_error with what the interpreter says.
  explicit KiwiSolver(const CellConstraints& cell);
  ~KiwiSolver();

  /// A new solver with all the constraints, and the values of the variables.
  void solveAnew();
  /// The same with the row's height as an edit variable, the quickest way that this solver has to change a constant.
  void solveForEditing();
  /// Suggests another height to the solver of `solveForEditing`, and brings the variables up to date.
  void suggestRowHeight(double height);
  /// As of the last solution.
  double value(std::size_t variable) const;

 private:
  struct Objects;
  std::unique_ptr<Objects> _objects;
};

}  // namespace nimbo
