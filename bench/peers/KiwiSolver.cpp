#define PY_SSIZE_T_CLEAN
#include "peers/KiwiSolver.h"

#include <Python.h>

#include <stdexcept>

namespace nimbo {

namespace {

struct Release {
  void operator()(PyObject* object) const { Py_DECREF(object); }
};
using PythonRef = std::unique_ptr<PyObject, Release>;

[[noreturn]] void fail() {
  PyErr_Print();
  throw std::runtime_error("python3-kiwisolver does not do its part");
}

PythonRef owned(PyObject* object) {
  if (!object) fail();
  return PythonRef(object);
}

/// A method's name, made once so that a call looks nothing up but the method.
PythonRef nameOf(const char* text) { return owned(PyUnicode_InternFromString(text)); }

}  // namespace

struct KiwiSolver::Objects {
  PythonRef module = owned(PyImport_ImportModule("kiwisolver"));
  PythonRef solverType = owned(PyObject_GetAttrString(module.get(), "Solver"));
  PythonRef addConstraint = nameOf("addConstraint"), addEditVariable = nameOf("addEditVariable"),
            suggestValue = nameOf("suggestValue"), updateVariables = nameOf("updateVariables"), value = nameOf("value");
  PythonRef strong = owned(PyUnicode_FromString("strong"));
  std::vector<PythonRef> variables, constraints;
  std::size_t rowHeight = 0;
  PythonRef editing;

  void call(PyObject* object, PyObject* method, std::initializer_list<PyObject*> arguments = {}) {
    PyObject* all[4] = {object};
    std::copy(arguments.begin(), arguments.end(), all + 1);
    owned(PyObject_VectorcallMethod(method, all, 1 + arguments.size(), nullptr));
  }
};

KiwiSolver::KiwiSolver(const CellConstraints& cell) {
  if (!Py_IsInitialized()) Py_InitializeEx(0);
  _objects = std::make_unique<Objects>();
  Objects& objects = *_objects;
  objects.rowHeight = cell.rowHeight;
  const auto type = owned(PyObject_GetAttrString(objects.module.get(), "Variable"));
  const auto constraintType = owned(PyObject_GetAttrString(objects.module.get(), "Constraint"));
  for (std::size_t i = 0; i < cell.variableCount; ++i)
    objects.variables.push_back(owned(PyObject_CallNoArgs(type.get())));
  for (const CellConstraint& constraint : cell.constraints) {
    PythonRef expression = owned(PyFloat_FromDouble(constraint.constant));
    for (const auto& term : constraint.terms) {
      const auto coefficient = owned(PyFloat_FromDouble(term.coefficient));
      const auto product = owned(PyNumber_Multiply(objects.variables[term.variable].get(), coefficient.get()));
      expression = owned(PyNumber_Add(product.get(), expression.get()));
    }
    const char* relation = "==";
    if (constraint.relation != LayoutRelation::equal)
      relation = constraint.relation == LayoutRelation::lessThanOrEqual ? "<=" : ">=";
    const bool required = constraint.priority >= 1000;
    objects.constraints.push_back(owned(
        required
            ? PyObject_CallFunction(constraintType.get(), "Oss", expression.get(), relation, "required")
            : PyObject_CallFunction(constraintType.get(), "Osd", expression.get(), relation, constraint.priority)));
  }
}

KiwiSolver::~KiwiSolver() = default;

void KiwiSolver::solveAnew() {
  const auto solver = owned(PyObject_CallNoArgs(_objects->solverType.get()));
  for (const PythonRef& constraint : _objects->constraints)
    _objects->call(solver.get(), _objects->addConstraint.get(), {constraint.get()});
  _objects->call(solver.get(), _objects->updateVariables.get());
}

void KiwiSolver::solveForEditing() {
  _objects->editing = owned(PyObject_CallNoArgs(_objects->solverType.get()));
  for (std::size_t i = 0; i < _objects->constraints.size(); ++i)
    // The constraint before it is the other one on the height.
    if (i != _objects->rowHeight && i + 1 != _objects->rowHeight)
      _objects->call(_objects->editing.get(), _objects->addConstraint.get(), {_objects->constraints[i].get()});
  _objects->call(_objects->editing.get(), _objects->addEditVariable.get(),
                 {_objects->variables[1].get(), _objects->strong.get()});
}

void KiwiSolver::suggestRowHeight(double height) {
  const auto number = owned(PyFloat_FromDouble(height));
  _objects->call(_objects->editing.get(), _objects->suggestValue.get(), {_objects->variables[1].get(), number.get()});
  _objects->call(_objects->editing.get(), _objects->updateVariables.get());
}

double KiwiSolver::value(std::size_t variable) const {
  PyObject* object = _objects->variables[variable].get();
  return PyFloat_AsDouble(owned(PyObject_VectorcallMethod(_objects->value.get(), &object, 1, nullptr)).get());
}

}  // namespace nimbo
