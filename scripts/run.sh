#!/usr/bin/env bash
# Builds the library and ravel-dump only (scripts/test.sh builds the tests and
# the other tools), then prints the summary of the sample one-segment capture.
set -euo pipefail
cd "$(dirname "$0")/.."
step() { echo "run.sh: $*" >&2; }

step "checking the packages the build needs"
scripts/setup.sh
mkdir -p build
step "configuring build/"
cmake -S . -B build -DCMAKE_BUILD_TYPE=RelWithDebInfo >build/configure.log 2>&1 || {
  cat build/configure.log >&2
  exit 1
}
step "building the library and ravel-dump on $(nproc) cores (a minute or two the first time; log in build/build.log)"
cmake --build build -j"$(nproc)" --target ravel-dump >build/build.log 2>&1 || {
  cat build/build.log >&2
  exit 1
}
step "ravel-dump --summary samples/oneseg-brazil.ts"
build/tools/ravel-dump/ravel-dump --summary samples/oneseg-brazil.ts
