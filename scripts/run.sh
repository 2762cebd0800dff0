#!/usr/bin/env bash
# Builds the library and tools, then prints the summary of the sample one-segment capture.
set -euo pipefail
cd "$(dirname "$0")/.."
scripts/setup.sh
echo "Building (log in build/build.log)..." >&2
cmake -S . -B build -DCMAKE_BUILD_TYPE=RelWithDebInfo >/dev/null
mkdir -p build
cmake --build build -j"$(nproc)" >build/build.log 2>&1 || { cat build/build.log >&2; exit 1; }
build/tools/ravel-dump/ravel-dump --summary samples/oneseg-brazil.ts
