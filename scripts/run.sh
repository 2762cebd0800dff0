#!/usr/bin/env bash
# Builds the library and tools, then runs the demonstration on a built capture.
set -euo pipefail
cd "$(dirname "$0")/.."
scripts/setup.sh
cmake -S . -B build -DCMAKE_BUILD_TYPE=RelWithDebInfo >/dev/null
cmake --build build -j"$(nproc)"
build/tools/ravel-demo/ravel-demo
