#!/usr/bin/env bash
# Replays the fuzz corpora (build-fuzz/corpus and build-fuzz/seeds, made by
# fuzz/run.sh) under valgrind's memcheck, which the fuzzers' sanitizers do not
# replace: it reports decisions and output taken from bytes never written.
#
#   fuzz/valgrind-corpus.sh [TARGET...]      default: every target with a corpus
set -euo pipefail
cd "$(dirname "$0")/.."
command -v valgrind >/dev/null || { echo "valgrind is not installed" >&2; exit 2; }
cmake -S . -B build-replay -DCMAKE_BUILD_TYPE=RelWithDebInfo -DRAVEL_BUILD_FUZZERS=ON -DRAVEL_BUILD_TESTS=OFF \
  -DRAVEL_BUILD_TOOLS=OFF >/dev/null
cmake --build build-replay -j"${RAVEL_JOBS:-2}"

if [ $# -gt 0 ]; then
  targets=("$@")
else
  targets=()
  for d in build-fuzz/corpus/fuzz_*; do [ -d "$d" ] && targets+=("$(basename "$d")"); done
fi
failed=0
for target in "${targets[@]}"; do
  inputs=()
  for d in build-fuzz/corpus/"$target" build-fuzz/seeds/"$target"; do [ -d "$d" ] && inputs+=("$d"); done
  [ ${#inputs[@]} -gt 0 ] || continue
  log=build-replay/valgrind-$target.log
  rc=0
  valgrind -q --error-exitcode=99 --leak-check=full --errors-for-leak-kinds=definite,indirect \
    build-replay/fuzz/"$target"_replay "${inputs[@]}" >"$log" 2>&1 || rc=$?
  if [ "$rc" -eq 0 ]; then
    echo "$target: $(tail -n 1 "$log"), no memcheck error"
  else
    echo "$target: memcheck errors (exit $rc), see $log"
    failed=1
  fi
done
exit $failed
