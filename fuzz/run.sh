#!/usr/bin/env bash
# Builds the fuzz targets (clang, libFuzzer, ASan, UBSan) into build-fuzz and runs
# each for the given time, one after the other.
#
#   fuzz/run.sh [SECONDS] [TARGET...]     default: 60 seconds, every target
#
# Seeds are made from the shared captures (RAVEL_CAPTURES, default
# ../shared/captures) into build-fuzz/seeds; each run starts from its seeds and
# whatever build-fuzz/corpus/<target> holds from earlier runs (FRESH=1 empties
# it first). Findings go to build-fuzz/artifacts/<target>/; the figures of each
# run are appended to build-fuzz/fuzz-summary.txt. Exits non-zero on a finding.
set -euo pipefail
cd "$(dirname "$0")/.."
seconds="${1:-60}"
shift || true

RAVEL_WITH_SANITIZERS=1 scripts/setup.sh
CC=clang CXX=clang++ cmake -S . -B build-fuzz -DCMAKE_BUILD_TYPE=RelWithDebInfo -DRAVEL_SANITIZE=ON \
  -DRAVEL_BUILD_FUZZERS=ON -DRAVEL_BUILD_TESTS=OFF -DRAVEL_BUILD_TOOLS=OFF >/dev/null
cmake --build build-fuzz -j"${RAVEL_JOBS:-2}"

captures="${RAVEL_CAPTURES:-../shared/captures}"
if [ ! -d build-fuzz/seeds ]; then
  if [ -d "$captures" ]; then
    python3 fuzz/make-seeds.py "$captures" build-fuzz/seeds
  else
    echo "No captures at $captures: the targets start from an empty corpus." >&2
  fi
fi

if [ $# -gt 0 ]; then
  targets=("$@")
else
  targets=()
  for t in build-fuzz/fuzz/fuzz_*; do
    case "$t" in *_replay | *_soak) continue ;; esac  # programs that run without libFuzzer
    [ -x "$t" ] && targets+=("$(basename "$t")")
  done
fi

export ASAN_OPTIONS="detect_leaks=1${ASAN_OPTIONS:+:$ASAN_OPTIONS}"
export UBSAN_OPTIONS="halt_on_error=1:print_stacktrace=1${UBSAN_OPTIONS:+:$UBSAN_OPTIONS}"
summary=build-fuzz/fuzz-summary.txt
failed=0
for target in "${targets[@]}"; do
  corpus=build-fuzz/corpus/$target
  artifacts=build-fuzz/artifacts/$target
  log=build-fuzz/logs/$target.log
  [ "${FRESH:-0}" = 1 ] && rm -rf "$corpus"
  mkdir -p "$corpus" "$artifacts" build-fuzz/logs build-fuzz/seeds/"$target"
  echo "== $target: ${seconds}s" >&2
  rc=0
  build-fuzz/fuzz/"$target" -max_total_time="$seconds" -print_final_stats=1 -timeout=25 -rss_limit_mb=4096 \
    -artifact_prefix="$artifacts/" "$corpus" build-fuzz/seeds/"$target" >"$log" 2>&1 || rc=$?
  execs=$(sed -n 's/^stat::number_of_executed_units: *//p' "$log" | tail -1)
  cov=$(grep -o 'cov: [0-9]*' "$log" | tail -1 | cut -d' ' -f2)
  ft=$(grep -o 'ft: [0-9]*' "$log" | tail -1 | cut -d' ' -f2)
  units=$(ls "$corpus" | wc -l)
  seeds=$(ls build-fuzz/seeds/"$target" | wc -l)
  result=ok
  if [ "$rc" -ne 0 ]; then
    result="FINDING (exit $rc, see $log and $artifacts)"
    failed=1
  fi
  line=$(printf '%s %-26s %6ss execs=%s cov=%s ft=%s seeds=%s corpus=%s %s' "$(date -u +%FT%TZ)" "$target" \
    "$seconds" "${execs:-?}" "${cov:-?}" "${ft:-?}" "$seeds" "$units" "$result")
  echo "$line" | tee -a "$summary"
done
exit $failed
