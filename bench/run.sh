#!/usr/bin/env bash
# Builds the benchmarks (Release, in build-bench), runs the Google benchmarks,
# then times `ravel-dump --summary` end to end against two references: the bare
# loop that only reads the file and counts packets per PID (the limit), and the
# same job written on libdvbpsi. Three captures: two made by repeating the
# shared ones (a realistic audio/video service and an SI-heavy one, whose
# sections mostly come again unchanged), and one whose sections all differ,
# made from the SI-heavy one by make-distinct-capture (each section with its own
# version and table id extension, its CRC_32 made anew). Prints one table and
# the ratios that matter:
#   ravel-dump / bare loop on the realistic capture,             target >= 0.8
#   ravel-dump / bare loop on the SI-heavy capture,              target >= 0.3
#   ravel-dump / libdvbpsi on the capture whose sections differ  (no target)
# and ravel-dump's peak memory on captures of changing EIT content and of
# carousels that never complete, at 1x and 16x their length (target: the
# 16x peak within 25 % of the 1x one).
#
# Environment: RAVEL_BENCH_MB   size of each repeated capture in MB (default 300)
#              RAVEL_BENCH_DISTINCT_MB size of the capture whose sections differ (default 100)
#              RAVEL_BENCH_RUNS timed runs of each program, best kept (default 10)
#              RAVEL_CAPTURES   folder of the shared captures (default ../shared/captures)
#              RAVEL_BENCH_FILTER  regex of the Google benchmarks to run (default all)
#              RAVEL_BENCH_MIN_TIME  --benchmark_min_time of each (default 0.5)
set -euo pipefail

root="$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)"
build="$root/build-bench"
captures="${RAVEL_CAPTURES:-$root/../shared/captures}"
size_mb="${RAVEL_BENCH_MB:-300}"
distinct_mb="${RAVEL_BENCH_DISTINCT_MB:-100}"
runs="${RAVEL_BENCH_RUNS:-10}"
filter="${RAVEL_BENCH_FILTER:-.}"
min_time="${RAVEL_BENCH_MIN_TIME:-0.5}"

RAVEL_WITH_BENCH=1 "$root/scripts/setup.sh"

work="$(mktemp -d "${TMPDIR:-/tmp}/ravel-bench.XXXXXX")"
trap 'rm -rf "$work"' EXIT

echo "Building in $build (Release) ..." >&2
if ! { cmake -S "$root" -B "$build" -DCMAKE_BUILD_TYPE=Release -DRAVEL_BUILD_BENCHMARKS=ON \
         -DRAVEL_BUILD_TESTS=ON -DRAVEL_BUILD_TOOLS=ON &&
       cmake --build "$build" -j2; } >"$work/build.log" 2>&1; then
  cat "$work/build.log" >&2
  echo "build failed" >&2
  exit 1
fi

bench="$build/bench/ravel_bench"
bare="$build/bench/dvbpsi-harness/ts-bare-loop"
dvbpsi="$build/bench/dvbpsi-harness/dvbpsi-harness"
dump="$build/tools/ravel-dump/ravel-dump"
make_distinct="$build/bench/distinct-capture/make-distinct-capture"

rows="$work/rows"  # measure|value|unit|detail, one line each
: >"$rows"
row() { printf '%s|%s|%s|%s\n' "$1" "$2" "$3" "$4" >>"$rows"; }

# --- Google benchmarks ------------------------------------------------------
echo "Running the Google benchmarks ..." >&2
# The library's error-level traces (real sections do carry errors) go to the
# default sink, standard error: kept out of the way in a log.
"$bench" --benchmark_filter="$filter" --benchmark_min_time="$min_time" \
  --benchmark_out="$work/bench.json" --benchmark_out_format=json >"$work/bench.txt" 2>"$work/bench.err" || {
  tail -n 20 "$work/bench.err" >&2
  echo "the Google benchmarks failed" >&2
  exit 1
}

# Google Benchmark's JSON writes one "key": value per line; each benchmark is
# an object of the "benchmarks" array.
awk -v out="$rows" '
  /"benchmarks": \[/ { inside = 1; next }
  !inside { next }
  /^ *\{/ { delete f; next }
  /^ *"[^"]+": / {
    line = $0
    sub(/^ *"/, "", line); key = line; sub(/": .*/, "", key)
    value = line; sub(/^[^"]*": /, "", value); sub(/,$/, "", value); gsub(/^"|"$/, "", value)
    f[key] = value
    next
  }
  /^ *\}/ {
    if (!("name" in f)) next
    name = f["name"]
    if (f["error_occurred"] == "true") {
      printf "%s|skipped||%s\n", name, f["error_message"] >> out
      delete f
      next
    }
    items = f["items_per_second"] + 0; bytes = f["bytes_per_second"] + 0
    if (name ~ /^BM_SectionCRC32/) {
      printf "%s|%.0f|MB/s|%.1f M sections/s\n", name, bytes / 1e6, items / 1e6 >> out
    } else if (name ~ /^BM_Assembler/) {
      printf "%s|%.2f|M packets/s|%.2f M sections/s out\n", name, items / 1e6, f["sections/s"] / 1e6 >> out
    } else if (name ~ /^BM_Trace/) {
      ns = f["real_time"] + 0
      if (f["time_unit"] == "us") ns *= 1e3; else if (f["time_unit"] == "ms") ns *= 1e6
      printf "%s|%.0f|ns/pass|%d trace calls, %s\n", name, ns, f["trace calls/pass"] + 0, f["label"] >> out
    } else {
      printf "%s|%.0f|k sections/s|%.0f MB/s over %d sections\n", name, items / 1e3, bytes / 1e6, f["sections"] + 0 >> out
    }
    delete f
  }' "$work/bench.json"

# --- End to end ---------------------------------------------------------------
# Each program reads the whole file once untimed (which also fills the page
# cache), then the programs take turns for `runs` rounds so that the load of a
# shared machine falls on all of them alike; the best wall time of each is
# kept and given as MB/s (1 MB = 10^6 bytes) of the file.
# A program may end with a nonzero status to report what it found in the
# capture; one killed by a signal has not done the job.
run_once() {  # file program args...
  local file="$1" status=0; shift
  "$@" "$file" >/dev/null 2>"$work/last.err" || status=$?
  if [ "$status" -ge 128 ]; then
    tail -n 5 "$work/last.err" >&2
    echo "$1 died (status $status) on $file" >&2
    exit 1
  fi
}

make_capture() {  # source name -> path of a file of about size_mb MB
  local source="$1" target="$work/$2" source_bytes copies
  source_bytes=$(stat -c %s "$source")
  copies=$(( (size_mb * 1000000 + source_bytes - 1) / source_bytes ))
  for ((i = 0; i < copies; i++)); do cat "$source"; done >"$target"
  echo "$target"
}

dump_args=()
have_dump=0
if [ -x "$dump" ]; then
  have_dump=1
  dump_help="$("$dump" --help 2>&1 || true)"
  dump_args=(--summary)
  case "$dump_help" in *--no-progress*) dump_args+=(--no-progress) ;; esac
  case "$dump_help" in *--quiet*) dump_args+=(--quiet) ;; esac
else
  row "ravel-dump --summary" "skipped" "" "ravel-dump is not built on this branch yet"
fi

# The programs timed, by name: the command line before the file.
declare -A command
command[bare]="$bare"
command[dvbpsi]="$dvbpsi"
order=(bare dvbpsi)
if [ "$have_dump" = 1 ]; then
  command[dump]="$dump ${dump_args[*]}"
  order+=(dump)
fi

ratio() { awk -v a="$1" -v b="$2" 'BEGIN { printf "%.2f", a / b }'; }
ratio_live="n/a"
ratio_epg="n/a"
ratio_distinct="n/a"
for kind in live epg distinct; do
  source_name="dvb-$kind.ts"
  [ "$kind" = distinct ] && source_name="dvb-epg.ts"
  source="$captures/$source_name"
  if [ ! -r "$source" ]; then
    row "$kind: end to end" "skipped" "" "$source absent"
    continue
  fi
  if [ "$kind" = distinct ]; then
    echo "Making a ${distinct_mb} MB capture of distinct sections from $source_name and timing (best of $runs) ..." >&2
    big="$work/big-distinct.ts"
    # The source's damaged sections are left out (the library traces them).
    sections=$("$make_distinct" "$source" "$big" "$distinct_mb" 2>"$work/distinct.err")
    bytes=$(stat -c %s "$big")
    what="sections of $source_name, each distinct: ${sections% sections} sections ($(awk -v b="$bytes" 'BEGIN { printf "%.0f", b / 1e6 }') MB)"
  else
    echo "Making a ${size_mb} MB capture from $source_name and timing (best of $runs) ..." >&2
    big="$(make_capture "$source" "big-$kind.ts")"
    bytes=$(stat -c %s "$big")
    what="$source_name x$((bytes / $(stat -c %s "$source"))) ($(awk -v b="$bytes" 'BEGIN { printf "%.0f", b / 1e6 }') MB)"
  fi
  declare -A best=()
  for name in "${order[@]}"; do
    # shellcheck disable=SC2086  # the command line is split on purpose
    run_once "$big" ${command[$name]}
    best[$name]=0
  done
  for ((i = 0; i < runs; i++)); do
    for name in "${order[@]}"; do
      start=$(date +%s%N)
      # shellcheck disable=SC2086
      run_once "$big" ${command[$name]}
      end=$(date +%s%N)
      ns=$((end - start))
      if [ "${best[$name]}" -eq 0 ] || [ "$ns" -lt "${best[$name]}" ]; then best[$name]=$ns; fi
    done
  done
  declare -A rate=()
  for name in "${order[@]}"; do
    rate[$name]=$(awk -v b="$bytes" -v ns="${best[$name]}" 'BEGIN { printf "%.0f", b / 1e6 / (ns / 1e9) }')
  done
  row "$kind: bare loop (read, count per PID)" "${rate[bare]}" "MB/s" "$what"
  row "$kind: libdvbpsi harness" "${rate[dvbpsi]}" "MB/s" "$what"
  if [ "$have_dump" = 1 ]; then
    row "$kind: ravel-dump ${dump_args[*]}" "${rate[dump]}" "MB/s" "$what"
    case "$kind" in
      live) ratio_live=$(ratio "${rate[dump]}" "${rate[bare]}") ;;
      epg) ratio_epg=$(ratio "${rate[dump]}" "${rate[bare]}") ;;
      distinct) ratio_distinct=$(ratio "${rate[dump]}" "${rate[dvbpsi]}") ;;
    esac
  fi
  rm -f "$big"
done

# --- Peak memory --------------------------------------------------------------
# ravel-dump over captures whose tables change on every repetition (made by
# make_changing_capture.py), at 1x and 16x their length: its peak resident
# memory (the maximum resident set GNU time reports) must not grow with the input.
# Targets: the 16x peak within 25 % of the 1x one, for each kind.
declare -A growth=()
peak_kb() {  # file -> peak resident KB of ravel-dump --summary on it (GNU time's %M)
  /usr/bin/time -f %M -o "$work/peak" "$dump" --summary --no-progress --quiet "$1" >/dev/null
  cat "$work/peak"
}
if [ "$have_dump" = 1 ]; then
  for kind in eit carousel; do
    case "$kind" in eit) reps=20000 ;; carousel) reps=200 ;; esac
    echo "Measuring peak memory on changing $kind captures (1x, 16x) ..." >&2
    python3 "$root/bench/make_changing_capture.py" "$kind" "$reps" "$work/changing-1x.ts"
    python3 "$root/bench/make_changing_capture.py" "$kind" $((reps * 16)) "$work/changing-16x.ts"
    one=$(peak_kb "$work/changing-1x.ts")
    sixteen=$(peak_kb "$work/changing-16x.ts")
    mb() { awk -v b="$(stat -c %s "$1")" 'BEGIN { printf "%.0f MB", b / 1e6 }'; }
    row "$kind changing: ravel-dump peak memory, 1x" "$one" "KB" "$(mb "$work/changing-1x.ts")"
    row "$kind changing: ravel-dump peak memory, 16x" "$sixteen" "KB" "$(mb "$work/changing-16x.ts")"
    growth[$kind]=$(awk -v a="$sixteen" -v b="$one" 'BEGIN { printf "%.1f", (a / b - 1) * 100 }')
    rm -f "$work/changing-1x.ts" "$work/changing-16x.ts"
  done
fi

# --- The table --------------------------------------------------------------
cores=$(nproc 2>/dev/null || echo "?")
cpu=$(awk -F': ' '/^model name/ { print $2; exit }' /proc/cpuinfo 2>/dev/null || true)
echo
echo "Results on $(uname -m), $cores cores${cpu:+ ($cpu)}, $(date -u +%Y-%m-%d):"
echo
awk -F'|' '
  { m[NR] = $1; v[NR] = $2; u[NR] = $3; d[NR] = $4
    if (length($1) > w1) w1 = length($1); if (length($2) > w2) w2 = length($2); if (length($3) > w3) w3 = length($3) }
  END {
    printf "| %-*s | %*s | %-*s | %s |\n", w1, "Measure", w2, "Value", w3, "Unit", "Detail"
    printf "|%s|%s|%s|%s|\n", dash(w1 + 2), dash(w2 + 1) ":", dash(w3 + 2), "---"
    for (i = 1; i <= NR; i++) printf "| %-*s | %*s | %-*s | %s |\n", w1, m[i], w2, v[i], w3, u[i], d[i]
  }
  function dash(n,   s) { s = ""; while (n-- > 0) s = s "-"; return s }' "$rows"
echo
verdict() { awk -v r="$1" -v t="$2" 'BEGIN { if (r == "n/a") print "not measured"; else if (r + 0 >= t) print "met"; else print "NOT met" }'; }
echo "ravel-dump / bare loop, realistic capture (dvb-live.ts): $ratio_live (target >= 0.8: $(verdict "$ratio_live" 0.8))"
echo "ravel-dump / bare loop, SI-heavy capture (dvb-epg.ts):   $ratio_epg (target >= 0.3: $(verdict "$ratio_epg" 0.3))"
echo "ravel-dump / libdvbpsi, capture of distinct sections:    $ratio_distinct"
below() { awk -v r="$1" -v t="$2" 'BEGIN { if (r == "") print "not measured"; else if (r + 0 < t) print "met"; else print "NOT met" }'; }
echo "ravel-dump peak memory, 16x / 1x, changing EIT:        +${growth[eit]:-?} % (target < 25 %: $(below "${growth[eit]:-}" 25))"
echo "ravel-dump peak memory, 16x / 1x, unfinished carousel: +${growth[carousel]:-?} % (target < 25 %: $(below "${growth[carousel]:-}" 25))"
