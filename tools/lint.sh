#!/usr/bin/env bash
# Form and lint of every C++ file: tools/lint.sh [BUILD_FOLDER]    (build/dev; its compile commands are used)
# NIMBO_LINT_FAST=1 checks the form and the arrows between folders alone.
set -euo pipefail
cd "$(dirname "$0")/.."
build=${1:-build/dev}

mapfile -t files < <(git ls-files -co --exclude-standard -- 'src/*.h' 'src/*.cpp' 'tests/*.h' 'tests/*.cpp' 'fuzz/*.h' 'fuzz/*.cpp' \
  'tools/*.cpp')
clang-format --dry-run --Werror "${files[@]}"
echo "lint: the form of ${#files[@]} files is right"
tools/arrows.py
[ -z "${NIMBO_LINT_FAST:-}" ] || exit 0

# All but the window, which takes minutes more for its toolkit's headers and is built only where that is installed.
mapfile -t sources < <(git ls-files -co --exclude-standard -- 'src/*.cpp' | grep -v '^src/host/window/')
printf '%s\n' "${sources[@]}" |
  xargs -P "$(nproc)" -n 4 clang-tidy -p "$build" --quiet --extra-arg=-Wno-unknown-warning-option --warnings-as-errors='*' 2>/dev/null
echo "lint: clang-tidy has nothing to say of ${#sources[@]} files"
