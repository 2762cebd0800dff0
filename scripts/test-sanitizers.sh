#!/usr/bin/env bash
# Builds everything with AddressSanitizer, UndefinedBehaviorSanitizer and (with
# ASan on Linux) LeakSanitizer into build-asan, then runs the whole test suite.
# Any report fails the run: leaks end the process with an error, undefined
# behaviour halts at the first finding.
set -euo pipefail
cd "$(dirname "$0")/.."
RAVEL_WITH_SANITIZERS=1 scripts/setup.sh

jobs="${RAVEL_JOBS:-$(nproc)}"
cmake -S . -B build-asan -DCMAKE_BUILD_TYPE=Debug -DRAVEL_SANITIZE=ON >/dev/null
cmake --build build-asan -j"$jobs"

export ASAN_OPTIONS="detect_leaks=1:strict_string_checks=1:detect_stack_use_after_return=1:check_initialization_order=1${ASAN_OPTIONS:+:$ASAN_OPTIONS}"
export UBSAN_OPTIONS="halt_on_error=1:print_stacktrace=1${UBSAN_OPTIONS:+:$UBSAN_OPTIONS}"
ctest --test-dir build-asan --output-on-failure -j"$jobs"
