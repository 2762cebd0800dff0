#!/usr/bin/env bash
# Builds the receivers' path soak in a Release build without sanitizers
# (build-soak) and runs it: streams mutated from the seeds of fuzz_receivers,
# every section's CRC_32 recomputed, straight into the library as a receiver
# hands them over, after a replay of the fuzz corpus (build-fuzz/corpus) in the
# same build. A crash writes the stream to build-soak/soak-crash-<n>.
#
#   fuzz/soak.sh [STREAMS] [RANDOM_SEED]     default: 10000000 streams, seed 1
#
# Seeds are made from the shared captures (RAVEL_CAPTURES, default
# ../shared/captures) into build-soak/seeds. The figures of each run are
# appended to build-soak/soak-summary.txt.
set -euo pipefail
cd "$(dirname "$0")/.."
streams="${1:-10000000}"
seed="${2:-1}"

cmake -S . -B build-soak -DCMAKE_BUILD_TYPE=Release -DRAVEL_BUILD_FUZZERS=ON -DRAVEL_BUILD_TESTS=OFF \
  -DRAVEL_BUILD_TOOLS=OFF >/dev/null
cmake --build build-soak -j"${RAVEL_JOBS:-2}" --target fuzz_receivers_soak fuzz_receivers_replay

captures="${RAVEL_CAPTURES:-../shared/captures}"
if [ ! -d build-soak/seeds/fuzz_receivers ]; then
  if [ ! -d "$captures" ]; then
    echo "No captures at $captures: the soak needs seeds." >&2
    exit 2
  fi
  python3 fuzz/make-seeds.py "$captures" build-soak/seeds >/dev/null
fi

# The corpus of the fuzz runs first, if there is one (fuzz/run.sh keeps it).
if [ -d build-fuzz/corpus/fuzz_receivers ]; then
  build-soak/fuzz/fuzz_receivers_replay build-fuzz/corpus/fuzz_receivers
fi

cd build-soak
result=$(fuzz/fuzz_receivers_soak seeds/fuzz_receivers "$streams" "$seed")
echo "$(date -u +%FT%TZ) $result" | tee -a soak-summary.txt
