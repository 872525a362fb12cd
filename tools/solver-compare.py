#!/usr/bin/python3
"""Compares the layout solver with kiwisolver on random constraint systems.

usage: tools/solver-compare.py DRIVER [--systems N] [--seed S]

DRIVER is the program nimbo_solver_driver of a build with tests (tests/platform/ui). Each system is built step by step in
our solver: constraints are added, changed and taken away again; kiwisolver gets what then stands, from scratch. They
agree when

- both take in the same required constraints, and those that our solver names as contradicting do contradict;
- all required constraints hold;
- what the constraints of each priority miss in sum is the same, from the highest priority on (solutions that are not
  unique may differ, but none may be better);
- the values are the same where only one solution exists.

Prints what differs, and how many systems kiwisolver itself gave up on. Exits 1 when anything differs. Needs the Debian
package python3-kiwisolver.
"""
import argparse
import os
import random
import subprocess
import sys

import kiwisolver

# Priorities and the strengths in which kiwisolver is given them: far enough apart that none is traded for another.
STRENGTHS = {1000: kiwisolver.strength.required, 750: kiwisolver.strength.strong,
             500: kiwisolver.strength.medium, 250: kiwisolver.strength.weak}
TOLERANCE = 1e-5


class Driver:
    def __init__(self, path):
        self.process = subprocess.Popen([path], stdin=subprocess.PIPE, stdout=subprocess.PIPE, text=True)

    def tell(self, *words):
        self.process.stdin.write(" ".join(str(word) for word in words) + "\n")

    def ask(self, *words):
        self.tell(*words)
        self.process.stdin.flush()
        return self.process.stdout.readline().split()


class Constraint:
    """constant + sum of factor * variable, relation (-1, 0, 1), 0."""

    def __init__(self, terms, constant, relation, priority):
        self.terms, self.constant, self.relation, self.priority = terms, constant, relation, priority

    def missed(self, values):
        value = self.constant + sum(factor * values[variable] for variable, factor in self.terms)
        return max(0, value) if self.relation < 0 else max(0, -value) if self.relation > 0 else abs(value)

    def words(self):
        return [self.relation, self.priority, repr(self.constant), len(self.terms)] + \
            [word for variable, factor in self.terms for word in (variable, repr(factor))]

    def kiwi(self, variables):
        expression = self.constant + sum((factor * variables[variable] for variable, factor in self.terms),
                                         kiwisolver.Expression([]))
        operator = {-1: "<=", 0: "==", 1: ">="}[self.relation]
        return kiwisolver.Constraint(expression, operator, STRENGTHS[self.priority])


def kiwi_solver(count, non_negative, constraints):
    """The solver and its variables; raises kiwisolver.UnsatisfiableConstraint."""
    variables = [kiwisolver.Variable(str(i)) for i in range(count)]
    solver = kiwisolver.Solver()
    for variable in variables[:non_negative]:
        solver.addConstraint(kiwisolver.Constraint(kiwisolver.Expression([kiwisolver.Term(variable)]), ">="))
    for constraint in constraints:
        solver.addConstraint(constraint.kiwi(variables))
    solver.updateVariables()
    return [variable.value() for variable in variables]


def contradicts(count, non_negative, constraints):
    try:
        kiwi_solver(count, non_negative, constraints)
        return False
    except kiwisolver.UnsatisfiableConstraint:
        return True


class System:
    def __init__(self, rng, driver, unique):
        self.rng, self.driver, self.unique = rng, driver, unique
        self.count = rng.randint(1, 12)
        self.non_negative = rng.randint(0, self.count) if not unique and rng.random() < 0.5 else 0
        self.standing = {}  # id -> Constraint
        self.problems = []
        driver.tell("system", self.count, self.non_negative)

    def contradicts(self, constraints):
        return contradicts(self.count, self.non_negative, constraints)

    def random_constraint(self):
        rng = self.rng
        variables = rng.sample(range(self.count), min(self.count, rng.randint(1, 4)))
        terms = [(variable, rng.choice([1, 1, 1, -1, -1, 2, -0.5])) for variable in variables]
        priority = rng.choice([1000, 750, 750, 500, 250])
        return Constraint(terms, float(rng.randint(-50, 50)), rng.choice([-1, 0, 0, 1]), priority)

    def add(self, constraint):
        answer = self.driver.ask("add", *constraint.words())
        if answer[0] == "yes":
            self.standing[int(answer[1])] = constraint
            if constraint.priority == 1000 and self.contradicts(self.required()):
                self.problems.append("took in a required constraint that contradicts the others")
        else:
            culprits = [self.standing[int(word)] for word in answer[1:]]
            if any(culprit.priority < 1000 for culprit in culprits) or not self.contradicts(culprits + [constraint]):
                self.problems.append("named constraints that do not contradict")

    def required(self):
        return [constraint for constraint in self.standing.values() if constraint.priority == 1000]

    def change(self):
        identifier = self.rng.choice(list(self.standing))
        constraint = self.standing[identifier]
        old, constraint.constant = constraint.constant, float(self.rng.randint(-50, 50))
        answer = self.driver.ask("set", identifier, repr(constraint.constant))
        if answer[0] == "yes":
            if self.contradicts(self.required()):
                self.problems.append("took in a constant that contradicts the others")
        else:
            if not self.contradicts([self.standing[int(word)] for word in answer[1:]]):
                self.problems.append("named constraints that do not contradict for a constant")
            constraint.constant = old

    def remove(self):
        identifier = self.rng.choice(list(self.standing))
        self.driver.tell("remove", identifier)
        del self.standing[identifier]

    def compare(self):
        constraints = list(self.standing.values())
        ours = [float(word) for word in self.driver.ask("values")]
        theirs = kiwi_solver(self.count, self.non_negative, constraints)
        if any(value < -TOLERANCE for value in ours[:self.non_negative]):
            self.problems.append("a variable is negative")
        for priority in STRENGTHS:
            our_sum, their_sum = (sum(constraint.missed(values) for constraint in constraints
                                      if constraint.priority == priority) for values in (ours, theirs))
            if abs(our_sum - their_sum) > TOLERANCE * (1 + abs(their_sum)):
                self.problems.append(f"at priority {priority}, ours miss {our_sum:.9g} and theirs {their_sum:.9g}")
                break
        if self.unique and any(abs(a - b) > TOLERANCE * (1 + abs(b)) for a, b in zip(ours, theirs)):
            self.problems.append(f"the one solution differs: {ours} and {theirs}")

    def run(self):
        if self.unique:
            # Each variable by an equation with those before it, of a priority of its own kind: one solution only.
            for variable in range(self.count):
                terms = [(variable, 1.0)] + [(earlier, self.rng.choice([1, -1, 0.5]))
                                             for earlier in range(variable) if self.rng.random() < 0.3]
                self.add(Constraint(terms, float(self.rng.randint(-50, 50)), 0, self.rng.choice([1000, 750])))
            for _ in range(self.rng.randint(0, 8)):
                constraint = self.random_constraint()
                constraint.priority = 500
                self.add(constraint)
        for _ in range(0 if self.unique else self.rng.randint(1, 25)):
            self.add(self.random_constraint())
        self.compare()
        for _ in range(self.rng.randint(0, 12)):
            step = self.rng.random()
            if step < 0.5 and self.standing:
                self.change()
            elif not self.unique and step < 0.75 and self.standing:
                self.remove()
            elif not self.unique:
                self.add(self.random_constraint())
            self.compare()
        return self.problems


def judge(number, seed, driver):
    """The first problem of a system, "" when there is none; None when kiwisolver could not solve it."""
    # In a process of its own: a system that kiwisolver believes to be unbounded makes it abort.
    reader, writer = os.pipe()
    child = os.fork()
    if child == 0:
        sys.stderr = None
        os.close(2)
        try:
            problems = System(random.Random(f"{seed}/{number}"), driver, unique=number % 3 == 0).run()
            os.write(writer, (problems[0] if problems else "").encode())
        except Exception as error:
            os.write(writer, repr(error).encode())
        os._exit(0)
    os.close(writer)
    with os.fdopen(reader) as pipe:
        problem = pipe.read()
    _, status = os.waitpid(child, 0)
    return None if os.WIFSIGNALED(status) else problem


def main():
    parser = argparse.ArgumentParser(description=__doc__, formatter_class=argparse.RawDescriptionHelpFormatter)
    parser.add_argument("driver")
    parser.add_argument("--systems", type=int, default=5000)
    parser.add_argument("--seed", type=int, default=1)
    arguments = parser.parse_args()
    driver = Driver(arguments.driver)
    agreed, unjudged = 0, 0
    for number in range(arguments.systems):
        problem = judge(number, arguments.seed, driver)
        if problem:
            print(f"system {number} of seed {arguments.seed}: {problem}")
        agreed += problem == ""
        unjudged += problem is None
    print(f"{agreed} of {arguments.systems} systems agree with kiwisolver {kiwisolver.__version__}; "
          f"{unjudged} made kiwisolver abort")
    sys.exit(0 if agreed + unjudged == arguments.systems and agreed > 0.99 * arguments.systems else 1)


main()
