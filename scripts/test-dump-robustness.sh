#!/usr/bin/env bash
# ravel-dump over damaged input, under AddressSanitizer, UndefinedBehaviorSanitizer
# and LeakSanitizer (the build of scripts/test-sanitizers.sh): every shared
# capture and the sample cut at random points, captures with random bytes
# written over them, captures with bytes of their sections damaged and each
# damaged section's CRC_32 recomputed (so that the damage reaches the parse
# operations), and files of random bytes. Each run must end cleanly: status 0,
# or 1 with ravel-dump's own message; no sanitizer report, no hang. A run must
# also keep the output of the part of its input that is intact:
#   - a transport stream cut at any point prints exactly what its whole packets
#     before the cut print, with the same status;
#   - a capture with damaged sections that keep their CRC_32 is read to its end
#     (status 0) while any section is left undamaged.
#
#   scripts/test-dump-robustness.sh [CUTS_PER_FILE]      default 30
#
# RAVEL_SEED repeats a run (the seed is printed); inputs that fail are kept in
# build-asan/dump-robustness/failures.
set -euo pipefail
cd "$(dirname "$0")/.."
cuts="${1:-30}"
dump="${RAVEL_DUMP:-build-asan/tools/ravel-dump/ravel-dump}"
if [ ! -x "$dump" ]; then
  echo "$dump is missing: run scripts/test-sanitizers.sh first" >&2
  exit 2
fi
captures="${RAVEL_CAPTURES:-../shared/captures}"
seed="${RAVEL_SEED:-$(date +%s)}"
RANDOM=$((seed % 32768))
work=build-asan/dump-robustness
rm -rf "$work"
mkdir -p "$work/failures" "$work/modules" "$work/files"

# Distinct exit statuses for the sanitizers, which otherwise exit with 1 like a
# refused input.
export ASAN_OPTIONS="detect_leaks=1:exitcode=86${ASAN_OPTIONS:+:$ASAN_OPTIONS}"
export UBSAN_OPTIONS="halt_on_error=1:print_stacktrace=1:exitcode=87${UBSAN_OPTIONS:+:$UBSAN_OPTIONS}"

runs=0
failures=0
modes=("" "--summary" "--json" "--epg" "--xmltv $work/guide.xml" "--extract-modules $work/modules"
  "--extract-files $work/files" "--standard japan"
  "--trace all")

# A random number below $1 (up to 2^30).
below() { echo $(((RANDOM * 32768 + RANDOM) % $1)); }

# Runs ravel-dump on $1 with the options that follow; $label names the case.
# When $expect_out names a file, stdout must equal it and the status must be
# $expect_rc; when $expect_rc alone is set, the status must be it. Leaves the
# status in $last_rc and stdout in $work/out.
expect_out=""
expect_rc=""
# Whether two outputs say the same; a JSON document's report (which names the
# damage) is left out of the comparison.
same_output() {
  cmp -s "$1" "$2" && return 0
  python3 - "$1" "$2" <<'PY'
import json, sys
def load(path):
    try:
        with open(path) as f:
            doc = json.load(f)
    except ValueError:
        sys.exit(1)
    if isinstance(doc, dict):
        doc.pop("report", None)
    return doc
sys.exit(0 if load(sys.argv[1]) == load(sys.argv[2]) else 1)
PY
}
check() {
  local input=$1
  shift
  local rc=0
  runs=$((runs + 1))
  # shellcheck disable=SC2068
  timeout 120 "$dump" --no-progress $@ "$input" >"$work/out" 2>"$work/err" || rc=$?
  last_rc=$rc
  local why=""
  if grep -qE "Sanitizer|runtime error:" "$work/err"; then
    why="sanitizer report"
  elif [ "$rc" -eq 1 ] && ! grep -q "^ravel-dump: " "$work/err"; then
    why="status 1 without a message"
  elif [ "$rc" -ne 0 ] && [ "$rc" -ne 1 ]; then
    why="status $rc"
  elif [ -n "$expect_rc" ] && [ "$rc" -ne "$expect_rc" ]; then
    why="status $rc where the intact part gives $expect_rc"
  elif [ -n "$expect_out" ] && ! same_output "$work/out" "$expect_out"; then
    why="the output of the intact part is lost or changed"
  fi
  if [ -n "$why" ]; then
    failures=$((failures + 1))
    local kept="$work/failures/$failures-$(basename "$input")"
    cp "$input" "$kept"
    echo "FAILED ($why): ravel-dump $* $kept [$label]" >&2
    head -n 30 "$work/err" >&2
  fi
}

# The packet size of capture $1 (188, 192 or 204), from its sync bytes; 0 for none.
packet_size() {
  local size
  for size in 188 204 192; do
    local sync=$((size == 192 ? 4 : 0))
    if [ "$(od -An -tx1 -j$sync -N1 "$1" | tr -d ' ')" = 47 ] &&
      [ "$(od -An -tx1 -j$((sync + size)) -N1 "$1" | tr -d ' ')" = 47 ]; then
      echo "$size"
      return
    fi
  done
  echo 0
}

files=()
for f in "$captures"/*.ts "$captures"/*.sections samples/*.ts; do
  [ -f "$f" ] && files+=("$f")
done
if [ ${#files[@]} -eq 0 ]; then
  echo "no captures found in $captures" >&2
  exit 2
fi

for f in "${files[@]}"; do
  size=$(stat -c %s "$f")
  options=""
  case "$f" in *.sections) options="--sections" ;; esac
  # A capture whose packet size is not told is cut as if of 188-byte packets.
  stride=$(packet_size "$f")
  [ "$stride" -gt 0 ] || stride=188
  points=(0 1 3 187 188 189 $((size - 1)))
  for ((i = 0; i < cuts; i++)); do points+=("$(below "$size")"); done
  for point in "${points[@]}"; do
    [ "$point" -ge 0 ] || continue
    head -c "$point" "$f" >"$work/input"
    label="$(basename "$f") cut at $point"
    mode="$options ${modes[$((runs % ${#modes[@]}))]}"
    if [ -z "$options" ]; then
      # The whole packets before the cut, read alone, give the expected output.
      head -c $((point / stride * stride)) "$f" >"$work/intact"
      check "$work/intact" "$mode"
      cp "$work/out" "$work/intact-out"
      expect_out="$work/intact-out" expect_rc=$last_rc
    fi
    check "$work/input" "$mode"
    expect_out="" expect_rc=""
  done
  # Random bytes written over the capture, in 1 to 64 places.
  for ((i = 0; i < cuts / 3 + 1; i++)); do
    cp "$f" "$work/input"
    spots=$((1 + $(below 64)))
    for ((s = 0; s < spots; s++)); do
      head -c $((1 + $(below 16))) /dev/urandom |
        dd of="$work/input" bs=1 seek="$(below "$size")" conv=notrunc status=none
    done
    label="$(basename "$f") with $spots damaged spots"
    check "$work/input" "$options ${modes[$((runs % ${#modes[@]}))]}"
  done
  # Damaged sections that keep a valid CRC_32, in 1 to 64 of them.
  for ((i = 0; i < cuts / 3 + 1; i++)); do
    spots=$((1 + $(below 64)))
    read -r damaged left < <(python3 scripts/damage-keeping-crc.py $options "$f" "$work/input" "$(below 1000000)" "$spots")
    label="$(basename "$f") with $damaged sections damaged, CRC_32 kept"
    [ "$left" -gt 0 ] && expect_rc=0
    check "$work/input" "$options ${modes[$((runs % ${#modes[@]}))]}"
    expect_rc=""
  done
done

# Files of random bytes, read as a stream and as raw sections.
for ((i = 0; i < cuts; i++)); do
  if [ $((i % 3)) -eq 0 ]; then n=$(below 400); else n=$(below 262144); fi
  head -c "$n" /dev/urandom >"$work/input"
  label="$n random bytes"
  check "$work/input" "${modes[$((i % ${#modes[@]}))]}"
  check "$work/input" "--sections"
done

echo "ravel-dump robustness: $runs runs, $failures failed (RAVEL_SEED=$seed)"
[ "$failures" -eq 0 ]
