#!/usr/bin/env bash
# Builds everything (what scripts/run.sh built, and the tests and other tools)
# and runs the whole test suite.
set -euo pipefail
cd "$(dirname "$0")/.."
scripts/setup.sh
cmake -S . -B build -DCMAKE_BUILD_TYPE=RelWithDebInfo >/dev/null
echo "test.sh: building the library, the tools and the tests" >&2
cmake --build build -j"$(nproc)"
echo "test.sh: running the test suite" >&2
ctest --test-dir build --output-on-failure -j"$(nproc)"
