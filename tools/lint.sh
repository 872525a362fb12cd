#!/usr/bin/env bash
# Form and lint of every C++ file: tools/lint.sh [BUILD_FOLDER]    (build/dev; its compile commands are used)
# NIMBO_LINT_FAST=1 checks the form alone.
set -euo pipefail
cd "$(dirname "$0")/.."
build=${1:-build/dev}

mapfile -t files < <(git ls-files -co --exclude-standard -- 'src/*.h' 'src/*.cpp' 'tests/*.h' 'tests/*.cpp' 'tools/*.cpp')
clang-format --dry-run --Werror "${files[@]}"
echo "lint: the form of ${#files[@]} files is right"
[ -z "${NIMBO_LINT_FAST:-}" ] || exit 0

# What this build compiles, generated sources apart: a machine without the window's toolkit has no commands for it.
mapfile -t sources < <(sed -n 's/^  "file": "\(.*\)",\{0,1\}$/\1/p' "$build/compile_commands.json" | grep -F "$PWD/src/" | sort -u)
printf '%s\n' "${sources[@]}" |
  xargs -P "$(nproc)" -n 4 clang-tidy -p "$build" --quiet --extra-arg=-Wno-unknown-warning-option --warnings-as-errors='*' 2>/dev/null
echo "lint: clang-tidy has nothing to say of ${#sources[@]} files"
