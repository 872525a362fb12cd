#!/usr/bin/env bash
# Form and lint of every C++ file: tools/lint.sh
# NIMBO_LINT_FAST=1 checks the form and the arrows between folders alone.
set -euo pipefail
cd "$(dirname "$0")/.."

mapfile -t files < <(git ls-files -co --exclude-standard -- 'src/*.h' 'src/*.cpp' 'tests/*.h' 'tests/*.cpp' 'fuzz/*.h' 'fuzz/*.cpp' \
  'bench/*.h' 'bench/*.cpp' 'tools/*.cpp')
clang-format --dry-run --Werror "${files[@]}"
echo "lint: the form of ${#files[@]} files is right"
tools/arrows.py
[ -z "${NIMBO_LINT_FAST:-}" ] || exit 0

# As a unity build has them, so that what many files include is read a few times; the window's own files too.
cmake --preset lint >/dev/null
# The sources and headers that the build makes.
ninja -C build/lint -t targets rule CUSTOM_COMMAND | grep -E '[.](cc|cpp|h)$' | xargs ninja -C build/lint >/dev/null
mapfile -t sources < <(python3 -c 'import json; print(*[e["file"] for e in json.load(open("build/lint/compile_commands.json"))], sep="\n")')
printf '%s\n' "${sources[@]}" |
  xargs -P "$(nproc)" -n 1 clang-tidy -p build/lint --quiet --extra-arg=-Wno-unknown-warning-option --warnings-as-errors='*' 2>/dev/null
echo "lint: clang-tidy has nothing to say of what makes up ${#sources[@]} files"
