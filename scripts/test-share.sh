#!/bin/bash
# The tests' share of the code: non-blank, non-comment lines of C and C++ under
# tests/ against all other C and C++ lines of the repository (build folders and
# the .git folder left out). Prints both counts and the share.
set -euo pipefail
cd "$(dirname "$0")/.."

code_lines() {
  # A line is counted unless it is blank, a // comment or part of a /* */ block.
  xargs -0 cat | sed -e 's://.*$::' | grep -v '^\s*$' | grep -cv '^\s*/\?\*'
}
sources() {
  find . \( -path './.git' -o -path './build*' -o -path '*/build' \) -prune -o \
    -type f \( -name '*.cpp' -o -name '*.cc' -o -name '*.c' -o -name '*.h' -o -name '*.hpp' \) "$@" -print0
}

tests=$(sources -path './tests/*' | code_lines)
others=$(sources -not -path './tests/*' | code_lines)
awk -v t="$tests" -v o="$others" 'BEGIN {
  printf "tests %d lines, other code %d lines: tests are %.1f %% of all C and C++ lines\n", t, o, 100 * t / (t + o) }'
