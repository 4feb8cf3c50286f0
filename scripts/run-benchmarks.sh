#!/usr/bin/env bash
# Builds the release preset, runs the benchmark suite and the end-to-end
# measurement of `kvdata colour`, and writes bench/RESULTS.md: every figure
# with the machine it ran on, and every ratio to its limit or peer, all from
# this one run. The command runs on KVDATA_BENCH_SPECTRA spectra and on a
# tenth of that (peak memory must not grow), and its CPU time is split into
# reading, colour work and writing with the suite's command/csv/* phases.
# The Python module's batch colour is set against the C++ batch entry point
# on a million spectra, the two run in turns. bench/NOTES.md (the profiles
# behind the figures) is appended.
#
#   ./scripts/run-benchmarks.sh                      # 5 repetitions, 1 000 000 spectra
#   KVDATA_BENCH_REPETITIONS=9 ./scripts/run-benchmarks.sh
#   KVDATA_BENCH_FILTER='^codec/' KVDATA_BENCH_REPETITIONS=1 ./scripts/run-benchmarks.sh   # a quick look
#
# Figures are medians over the repetitions, which run interleaved in random
# order so that a change in the machine's load hits every benchmark alike.
# Rates are per CPU second of the benchmark thread (one core); the load
# average before and after the run is recorded beside them.
set -euo pipefail
cd "$(dirname "$0")/.."

repetitions="${KVDATA_BENCH_REPETITIONS:-5}"
filter="${KVDATA_BENCH_FILTER:-.}"          # a regular expression of benchmark names
min_time="${KVDATA_BENCH_MIN_TIME:-0.5}"    # seconds per benchmark and repetition
spectra="${KVDATA_BENCH_SPECTRA:-1000000}"
peer_spectra="${KVDATA_BENCH_PEER_SPECTRA:-200000}"   # kvdata colour against spec2cie
small_spectra=$((spectra / 10))
results=bench/RESULTS.md
work="$(mktemp -d)"
trap 'rm -rf "$work"' EXIT

./scripts/install-deps.sh
# ArgyllCMS is a peer of `kvdata colour` in this benchmark only: its spec2cie
# runs on the same spectra. Nothing of it is linked or used elsewhere.
if ! command -v spec2cie >/dev/null; then
  (apt-get install -y argyll || (apt-get update && apt-get install -y argyll)) >&2 ||
    echo "run-benchmarks: argyll could not be installed; the peer figures are left out" >&2
fi
# The release build also makes the Python module, for its benchmark.
cmake --preset release -DKVDATA_BUILD_PYTHON=ON >/dev/null
cmake --build --preset release -j2

bench_bin=build/release/bench/kvdata_bench
kvdata_bin=build/release/bin/kvdata

load_before="$(cut -d' ' -f1-3 /proc/loadavg)"
echo "== benchmark suite ($repetitions repetitions, load average $load_before)" >&2
"$bench_bin" \
  --benchmark_filter="$filter" --benchmark_min_time="$min_time" \
  --benchmark_repetitions="$repetitions" \
  --benchmark_enable_random_interleaving=true \
  --benchmark_report_aggregates_only=true \
  --benchmark_out="$work/suite.json" --benchmark_out_format=json >&2

# The medians (or, with one repetition, the single runs), with the cv of the
# CPU time beside each.
jq '
  [.benchmarks[] | select(.run_type == "aggregate")] as $a
  | ([$a[] | select(.aggregate_name == "cv") | {key: .run_name, value: .cpu_time}] | from_entries) as $cv
  | [$a[] | select(.aggregate_name == "median")] as $m
  | (if ($m | length) > 0 then $m else [.benchmarks[] | select(.run_type == "iteration")] end)
  | map(. + {cv: ($cv[.run_name] // 0)})' "$work/suite.json" >"$work/medians.json"

# name <TAB> cpu ns <TAB> real ns <TAB> bytes/s <TAB> items/s <TAB> cv of cpu time
jq -r '.[] | [.run_name, .cpu_time, .real_time, (.bytes_per_second // 0), (.items_per_second // 0),
  .cv] | @tsv' "$work/medians.json" >"$work/medians.tsv"

# field NAME COLUMN: one median figure (2 cpu ns, 3 real ns, 4 bytes/s, 5 items/s, 6 cv).
field() {
  awk -F'\t' -v n="$1" -v c="$2" '$1 == n { print $c; found = 1 } END { if (!found) print "" }' \
    "$work/medians.tsv"
}
has() { [ -n "$(field "$1" 2)" ]; }
# ratio A B: cpu time of A over cpu time of B, two decimals.
ratio() {
  awk -v a="$(field "$1" 2)" -v b="$(field "$2" 2)" \
    'BEGIN { if (a == "" || b == "" || b == 0) print "n/a"; else printf "%.2f", a / b }'
}
gbps() { awk -v v="$(field "$1" 4)" 'BEGIN { printf "%.2f", v / 1e9 }'; }
mps() { awk -v v="$(field "$1" 5)" 'BEGIN { printf "%.2f", v / 1e6 }'; }
usec() { awk -v v="$(field "$1" 2)" 'BEGIN { printf "%.1f", v / 1e3 }'; }
cv() { awk -v v="$(field "$1" 6)" 'BEGIN { printf "%.0f %%", v * 100 }'; }
# verdict VALUE LIMIT [le|ge]: "met" or "missed".
verdict() {
  awk -v v="$1" -v l="$2" -v how="${3:-le}" \
    'BEGIN { ok = (how == "le") ? (v <= l) : (v >= l); print ok ? "met" : "**missed**" }'
}

# --- the command end to end ---------------------------------------------------
e2e_rows=""
peer_rows=""
e2e_note=""
colour_share=""
if [ -x "$kvdata_bin" ] && "$kvdata_bin" colour --help >/dev/null 2>&1; then
  echo "== kvdata colour end to end" >&2
  make_csv() {  # make_csv COUNT FILE [SEED]: COUNT spectra in percent, 40 bands 360..750 nm
    awk -v n="$1" -v seed="${3:-7}" 'BEGIN {
      srand(seed); printf "SAMPLE_NAME";
      for (w = 360; w <= 750; w += 10) printf ",%d", w; printf "\n";
      for (i = 1; i <= n; i++) {
        printf "S%d", i; level = 5 + 90 * rand(); scale = 0.05 + 0.95 * rand();
        for (b = 0; b < 40; b++) {
          level += 8 * rand() - 4; if (level < 0) level = 0; if (level > 100) level = 100;
          printf ",%.3f", level * scale }
        printf "\n" } }' >"$2"
  }
  timed() {  # timed LABEL COMMAND...: wall s, cpu s and peak kB of one process
    local log="$work/time.$1"
    if [ -x /usr/bin/time ]; then
      /usr/bin/time -v "${@:2}" >/dev/null 2>"$log"
      awk -F': ' '
        /Elapsed \(wall clock\)/ { n = split($2, p, ":"); s = 0; for (i = 1; i <= n; i++) s = s * 60 + p[i]; wall = s }
        /User time/ { cpu += $2 } /System time/ { cpu += $2 }
        /Maximum resident set size/ { rss = $2 }
        END { printf "%.2f\t%.2f\t%d\n", wall, cpu, rss }' "$log"
    else
      local start end
      start=$(date +%s.%N)
      "${@:2}" >/dev/null
      end=$(date +%s.%N)
      awk -v a="$start" -v b="$end" 'BEGIN { printf "%.2f\t\t\n", b - a }'
    fi
  }
  for n in "$small_spectra" "$spectra"; do
    make_csv "$n" "$work/spectra_$n.csv"
    bytes=$(stat -c %s "$work/spectra_$n.csv")
    read_figures=$(timed "cat_$n" cat "$work/spectra_$n.csv")
    colour_figures=$(timed "colour_$n" "$kvdata_bin" colour "$work/spectra_$n.csv" --format csv \
      -o "$work/out_$n.csv")
    IFS=$'\t' read -r wall cpu rss <<<"$colour_figures"
    IFS=$'\t' read -r cat_wall cat_cpu cat_rss <<<"$read_figures"
    rate=$(awk -v n="$n" -v w="$wall" 'BEGIN { printf "%.2f", n / w / 1e6 }')
    cpu_rate=$(awk -v n="$n" -v c="$cpu" 'BEGIN { printf "%.2f", (c > 0) ? n / c / 1e6 : 0 }')
    e2e_rows+="| $n | $((bytes / 1000000)) MB | $wall s | $cpu s | $rate | $cpu_rate | $((rss / 1024)) MB | $cat_wall s |"$'\n'
    eval "rss_$n=$rss"
    eval "cpu_$n=$cpu"
  done
  # The peer: ArgyllCMS's spec2cie on the same spectra (written as a .ti3
  # file), the floor of reading the file (wc -l), and the command with every
  # difference against a second file of as many references. Each figure is
  # the median of three runs (spec2cie runs once: it takes seconds).
  if command -v spec2cie >/dev/null; then
    echo "== kvdata colour against spec2cie ($peer_spectra spectra)" >&2
    peer_csv="$work/peer.csv"
    make_csv "$peer_spectra" "$peer_csv"
    make_csv "$peer_spectra" "$work/peer-reference.csv" 11
    make_csv $((peer_spectra / 10)) "$work/peer-small.csv"
    awk -f - "$peer_csv" >"$work/peer.ti3" <<'AWK'
BEGIN { FS = "," }
NR == 1 { bands = NF - 1; next }
{ row[++n] = $0 }
END {
  print "CTI3\n"
  print "DESCRIPTOR \"spectra of the kvdata colour benchmark\""
  print "ORIGINATOR \"kvdata run-benchmarks.sh\""
  print "DEVICE_CLASS \"OUTPUT\""
  print "COLOR_REP \"RGB_XYZ\""
  print "SPECTRAL_BANDS \"" bands "\""
  print "SPECTRAL_START_NM \"360.000000\""
  print "SPECTRAL_END_NM \"750.000000\""
  print "SPECTRAL_NORM \"100.000000\"\n"
  printf "NUMBER_OF_FIELDS %d\nBEGIN_DATA_FORMAT\nSAMPLE_ID RGB_R RGB_G RGB_B", bands + 4
  for (w = 360; w <= 750; w += 10) printf " SPEC_%d", w
  printf "\nEND_DATA_FORMAT\n\nNUMBER_OF_SETS %d\nBEGIN_DATA\n", n
  for (i = 1; i <= n; i++) {
    split(row[i], c, ","); printf "%d 0 0 0", i
    for (b = 2; b <= bands + 1; b++) printf " %s", c[b]
    printf "\n"
  }
  print "END_DATA"
}
AWK
    median_of_3() {  # median_of_3 LABEL COMMAND...: the run with the median wall time
      for k in 1 2 3; do timed "$1" "${@:2}"; done | sort -n | sed -n 2p
    }
    peer_row() {  # peer_row TEXT FIGURES: one table row
      local wall cpu rss
      IFS=$'\t' read -r wall cpu rss <<<"$2"
      peer_rows+="| $1 | $wall s | $cpu s | $((rss / 1024)) MB |"$'\n'
    }
    wc_figures=$(median_of_3 wc wc -l "$peer_csv")
    colour_figures=$(median_of_3 colour "$kvdata_bin" colour "$peer_csv" --format csv -o "$work/peer-out.csv")
    small_figures=$(median_of_3 colour_small "$kvdata_bin" colour "$work/peer-small.csv" --format csv \
      -o "$work/peer-small-out.csv")
    against_figures=$(median_of_3 against "$kvdata_bin" colour "$peer_csv" --against \
      "$work/peer-reference.csv" --de ab,94,cmc,2000 --format csv -o "$work/peer-against.csv")
    spec2cie_figures=$(timed spec2cie spec2cie -i D65 -o 1964_10 -n "$work/peer.ti3" "$work/peer-out.ti3")
    peer_row "\`wc -l FILE.csv\` (the floor: reading the file)" "$wc_figures"
    peer_row "\`kvdata colour FILE.csv --format csv -o OUT\`" "$colour_figures"
    peer_row "the same on a tenth of the spectra" "$small_figures"
    peer_row "\`kvdata colour FILE.csv --against REF.csv --de ab,94,cmc,2000 --format csv -o OUT\`" "$against_figures"
    peer_row "\`spec2cie -i D65 -o 1964_10 -n FILE.ti3 OUT.ti3\`" "$spec2cie_figures"
    wall_of() { cut -f1 <<<"$1"; }
    peer_ratio() {  # peer_ratio A B: wall of A over wall of B
      awk -v a="$(wall_of "$1")" -v b="$(wall_of "$2")" \
        'BEGIN { if (b > 0) printf "%.1f", a / b; else print "n/a" }'
    }
    cpu_of() { cut -f2 <<<"$1"; }
    peer_cpu_ratio() {  # peer_cpu_ratio A B: CPU time of A over CPU time of B
      awk -v a="$(cpu_of "$1")" -v b="$(cpu_of "$2")" \
        'BEGIN { if (b > 0) printf "%.1f", a / b; else print "n/a" }'
    }
    peer_cpu_speedup=$(peer_cpu_ratio "$spec2cie_figures" "$colour_figures")
    peer_cpu_against=$(peer_cpu_ratio "$spec2cie_figures" "$against_figures")
    peer_speedup=$(peer_ratio "$spec2cie_figures" "$colour_figures")
    peer_against_speedup=$(peer_ratio "$spec2cie_figures" "$against_figures")
    peer_floor=$(peer_ratio "$colour_figures" "$wc_figures")
    peer_rss_growth=$(awk -v a="$(cut -f3 <<<"$small_figures")" -v b="$(cut -f3 <<<"$colour_figures")" \
      'BEGIN { printf "%.1f", (a > 0) ? b / a : 0 }')
  fi
  rss_small=$(eval echo "\$rss_$small_spectra")
  rss_large=$(eval echo "\$rss_$spectra")
  cpu_large=$(eval echo "\$cpu_$spectra")
  rss_growth=$(awk -v a="$rss_small" -v b="$rss_large" 'BEGIN { printf "%.1f", b / a }')
  # Where the command's CPU time goes: each phase's CPU per spectrum from the
  # suite (measured on 100 000 spectra in this run) against the whole
  # process's CPU per spectrum at the larger size.
  phase_rows=""
  phase_sum=0
  command_ns=$(awk -v n="$spectra" -v c="$cpu_large" 'BEGIN { printf "%.0f", 1e9 * c / n }')
  phase() {  # phase BENCHMARK TEXT [counted]: one row; counted phases add up to the sum
    local per share
    has "$1" || return 0
    per=$(awk -v r="$(field "$1" 5)" 'BEGIN { printf "%.0f", (r > 0) ? 1e9 / r : 0 }')
    share=$(awk -v p="$per" -v c="$command_ns" 'BEGIN { printf "%.1f", (c > 0) ? 100 * p / c : 0 }')
    phase_rows+="| $2 | \`$1\` | $per | $share % |"$'\n'
    if [ "${3:-}" = counted ]; then phase_sum=$((phase_sum + per)); fi
    eval "share_${1//[^a-z]/_}=$share"
  }
  phase command/csv/read_bytes "reading the file's bytes (part of the next line)"
  phase command/csv/read_spectra "reading: the bytes, the CSV records, the numbers onto the bands" counted
  phase colour/spectra/batch "colour work: XYZ and CIELAB with the batch entry point" counted
  phase command/csv/write_results "writing: the results as CSV text" counted
  if [ -n "$phase_rows" ]; then
    rest=$((command_ns - phase_sum))
    rest_share=$(awk -v p="$rest" -v c="$command_ns" 'BEGIN { printf "%.1f", (c > 0) ? 100 * p / c : 0 }')
    phase_rows+="| the rest: writing to the file and flushing it, start-up, page faults | | $rest | $rest_share % |"$'\n'
    phase_rows+="| the whole process (CPU time at $spectra spectra / $spectra) | | $command_ns | 100 % |"$'\n'
  fi
  if has colour/spectra/batch; then
    colour_share=$(awk -v n="$spectra" -v r="$(field colour/spectra/batch 5)" -v c="$cpu_large" \
      'BEGIN { printf "%.1f", 100 * (n / r) / c }')
  fi
else
  e2e_note="The \`kvdata colour\` command was not built in this tree, so the end-to-end figures are missing."
fi

# --- decode and explain of a large test run: peak memory --------------------------
# Two series of 32 767 tiles, about 42 MB; each command writes to standard
# output (here /dev/null), and its peak memory is held to three times the
# input's size plus 32 MB.
stream_rows=""
make_test_run=build/release/bench/make_test_run
if [ -x "$kvdata_bin" ] && [ -x "$make_test_run" ] && declare -f timed >/dev/null; then
  echo "== kvdata decode and explain of a large test run" >&2
  "$make_test_run" "$work/testrun.kvs"
  stream_bytes=$(stat -c %s "$work/testrun.kvs")
  stream_bound_kb=$(((3 * stream_bytes + 32 * 1024 * 1024) / 1024))
  for args in "decode testrun" "explain testrun" "explain --json testrun"; do
    # shellcheck disable=SC2086 # the words of $args are the command's arguments
    IFS=$'\t' read -r wall cpu rss <<<"$(timed stream "$kvdata_bin" $args "$work/testrun.kvs")"
    stream_rows+="| \`kvdata $args\` | $wall s | $cpu s | $((rss / 1024)) MB | $(verdict "$rss" "$stream_bound_kb") |"$'\n'
  done
fi
# --- the Python module's batch colour against the C++ entry point -----------------
# In turns, once per repetition: the C++ benchmark on a million spectra, then
# the Python function on as many of the same kind, so that a change in the
# machine's load hits both alike. Medians of spectra per CPU second.
python_rate=""
python_package=build/release/python/kvdata
if [ -d "$python_package" ] && [[ "colour/spectra_1M/batch" =~ $filter ]]; then
  echo "== Python batch colour against the C++ batch entry point" >&2
  for _ in $(seq "$repetitions"); do
    "$bench_bin" --benchmark_filter='^colour/spectra_1M/batch$' --benchmark_min_time="$min_time" \
      --benchmark_format=json | jq -r '.benchmarks[0].items_per_second' >>"$work/cpp_1m"
    PYTHONPATH=build/release/python /usr/bin/python3 bench/python_colour.py 1000000 "$min_time" |
      jq -r '.items_per_second' >>"$work/python_1m"
  done
  median() { sort -g "$1" | awk '{ v[NR] = $1 } END { print (NR % 2) ? v[(NR + 1) / 2] : (v[NR / 2] + v[NR / 2 + 1]) / 2 }'; }
  cpp_rate=$(median "$work/cpp_1m")
  python_rate=$(median "$work/python_1m")
  python_share=$(awk -v p="$python_rate" -v c="$cpp_rate" 'BEGIN { printf "%.2f", p / c }')
fi
load_after="$(cut -d' ' -f1-3 /proc/loadavg)"

# --- RESULTS.md -------------------------------------------------------------------
cpu_model="$(grep -m1 'model name' /proc/cpuinfo | cut -d: -f2- | sed 's/^ *//')"
cpu_mhz="$(grep -m1 'cpu MHz' /proc/cpuinfo | cut -d: -f2- | sed 's/^ *//')"
cores="$(nproc)"
mem_kb="$(awk '/MemTotal/ { print $2 }' /proc/meminfo)"
compiler="$(g++ --version | head -1)"
host_wall_ratio="$(jq -r 'map(.real_time / .cpu_time) | add / length' "$work/medians.json")"

{
  echo "# Benchmark results"
  echo
  echo "Written by \`scripts/run-benchmarks.sh\` on $(date -u '+%Y-%m-%d %H:%M UTC'); every figure and"
  echo "ratio below comes from this one run. Do not edit by hand: run the script again."
  echo
  echo "## Machine"
  echo
  echo "| | |"
  echo "|---|---|"
  echo "| CPU | $cpu_model, ${cpu_mhz} MHz |"
  echo "| cores | $cores |"
  echo "| memory | $((mem_kb / 1024)) MB |"
  echo "| kernel | $(uname -r) |"
  echo "| compiler | $compiler, release preset (-O3) |"
  echo "| load average (1, 5, 15 min) | before $load_before; after $load_after |"
  echo "| wall time / CPU time, median over the suite | $(printf '%.2f' "$host_wall_ratio") |"
  echo
  echo "Each figure is the median of $repetitions repetitions run interleaved in random order; rates"
  echo "are per CPU second of the one benchmark thread (one core), so other work on the machine"
  echo "shows in the wall/CPU ratio above rather than in the rates. \"cv\" is the coefficient of"
  echo "variation of the CPU time over the repetitions. A ratio is CPU time of the library over CPU"
  echo "time of its limit or peer for the same work."
  echo
  echo "## Field codec: runs of one type"
  echo
  echo "One million values (200 000 strings of 0 to 31 characters) written one by one into an"
  echo "array that starts empty (\`unsized\`), into a new array made at the final size"
  echo "(\`presized\`), into one array sized once and reused (\`reused\`), and read back; \`memcpy\`"
  echo "copies the same bytes between two existing buffers. GB/s of stream."
  echo
  echo "| type | unsized | presized | reused | read | memcpy | unsized / presized (target <= 2) | unsized / reused | reused write / memcpy | read / memcpy |"
  echo "|---|---|---|---|---|---|---|---|---|---|"
  for t in Integer Long Single Date Boolean String; do
    b="codec/$t"
    has "$b/memcpy" || continue
    r=$(ratio "$b/write_unsized" "$b/write_presized")
    echo "| $t | $(gbps "$b/write_unsized") | $(gbps "$b/write_presized") | $(gbps "$b/write_reused") | $(gbps "$b/read") | $(gbps "$b/memcpy") | $r ($(verdict "$r" 2)) | $(ratio "$b/write_unsized" "$b/write_reused") | $(ratio "$b/write_reused" "$b/memcpy") | $(ratio "$b/read" "$b/memcpy") |"
  done
  echo
  echo "## Object streams"
  echo
  echo "\`StreamOut\` at Position 0 into an array left at the stream's length by the previous call;"
  echo "\`StreamIn\` of that stream into one object; \`memcpy\` of the same number of bytes. The"
  echo "target (within 4 times memcpy) applies to the large test run."
  echo
  echo "| object | bytes | StreamOut µs | StreamIn µs | memcpy µs | StreamOut / memcpy | StreamIn / memcpy | cv (out, in) |"
  echo "|---|---|---|---|---|---|---|---|"
  awk -F'\t' '$1 ~ /^objects\/.*\/memcpy$/ { sub(/^objects\//, "", $1); sub(/\/memcpy$/, "", $1); print $1 }' \
    "$work/medians.tsv" | while read -r o; do
    b="objects/$o"
    bytes=$(jq -r --arg n "$b/StreamOut" '[.[] | select(.run_name == $n) | .stream_bytes][0]' "$work/medians.json")
    out_r=$(ratio "$b/StreamOut" "$b/memcpy")
    in_r=$(ratio "$b/StreamIn" "$b/memcpy")
    if [[ "$o" == *1000* ]]; then
      out_r="$out_r ($(verdict "$out_r" 4))"
      in_r="$in_r ($(verdict "$in_r" 4))"
    fi
    echo "| $o | $bytes | $(usec "$b/StreamOut") | $(usec "$b/StreamIn") | $(usec "$b/memcpy") | $out_r | $in_r | $(cv "$b/StreamOut"), $(cv "$b/StreamIn") |"
  done
  echo
  if has colour/spectra/batch; then
    batch=$(mps colour/spectra/batch)
    echo "## Colorimetry"
    echo
    echo "100 000 spectra of percent reflectance (a twentieth of them dark enough for the linear"
    echo "branch). Millions of spectra (conversions, differences) per CPU second, one core."
    echo
    echo "| benchmark | M/s | cv |"
    echo "|---|---|---|"
    for b in colour/spectra/Reflectance colour/spectra/calcXYZ_calcLAB colour/spectra/batch \
      colour/xyz_to_lab/calcLAB colour/xyz_to_lab/lcms_cmsXYZ2Lab colour/delta_e/Deltas \
      colour/delta_e/lcms_cmsDeltaE; do
      has "$b" && echo "| \`${b#colour/}\` | $(mps "$b") | $(cv "$b") |"
    done
    echo
    echo "| comparison | figure |"
    echo "|---|---|"
    echo "| batch, spectra per second per core (target >= 10 M, bit-identical to calcXYZ + calcLAB) | $batch M ($(verdict "$batch" 10 ge)); values differing from calcXYZ + calcLAB: $(jq -r '[.[] | select(.run_name == "colour/spectra/batch") | .differing_values][0] // "n/a"' "$work/medians.json") |"
    echo "| batch / one spectrum at a time (calcXYZ + calcLAB), speed-up | $(ratio colour/spectra/calcXYZ_calcLAB colour/spectra/batch) |"
    echo "| calcLAB / cmsXYZ2Lab, time per conversion | $(ratio colour/xyz_to_lab/calcLAB colour/xyz_to_lab/lcms_cmsXYZ2Lab) |"
    echo "| batch (spectrum to XYZ and CIELAB) / cmsXYZ2Lab (XYZ to CIELAB only), time per spectrum | $(ratio colour/spectra/batch colour/xyz_to_lab/lcms_cmsXYZ2Lab) |"
    echo "| Deltas / cmsDeltaE, time per difference | $(ratio colour/delta_e/Deltas colour/delta_e/lcms_cmsDeltaE) |"
    echo
  fi
  if [ -n "$python_rate" ]; then
    echo "## Python: \`kvdata.calc_xyz_lab_d6510\` against the C++ entry point"
    echo
    echo "A million spectra of percent reflectance (random walks as above) each way; the two run in"
    echo "turns, $repetitions times, and each figure is the median. The C++ entry point writes into"
    echo "output it reuses; the Python function takes a C-contiguous float32 NumPy array (no copy)"
    echo "and fills the two N x 3 outputs it is given (\`xyz=\`, \`lab=\`), the same on every call."
    echo "Millions of spectra per CPU second, one core."
    echo
    echo "| | M spectra/s |"
    echo "|---|---|"
    echo "| C++ \`calc_xyz_lab_d6510\` (\`colour/spectra_1M/batch\`) | $(awk -v r="$cpp_rate" 'BEGIN { printf "%.2f", r / 1e6 }') |"
    echo "| Python \`kvdata.calc_xyz_lab_d6510\` (\`bench/python_colour.py\`) | $(awk -v r="$python_rate" 'BEGIN { printf "%.2f", r / 1e6 }') |"
    echo "| Python / C++ (target >= 0.90) | $python_share ($(verdict "$python_share" 0.90 ge)) |"
    echo
  fi
  if has stats/spread_1000x40/calculate; then
    echo "## Spread test"
    echo
    echo "1000 samples of 40 points for each of the two tiles; samples per CPU second. The plain"
    echo "loop computes the same mean, lowest, highest and spread from one flat array."
    echo
    echo "| benchmark | M samples/s | µs per test | cv |"
    echo "|---|---|---|---|"
    for b in add_and_calculate calculate plain_loop; do
      echo "| \`$b\` | $(mps "stats/spread_1000x40/$b") | $(usec "stats/spread_1000x40/$b") | $(cv "stats/spread_1000x40/$b") |"
    done
    echo
    echo "calculate / plain loop: $(ratio stats/spread_1000x40/calculate stats/spread_1000x40/plain_loop)"
    echo
  fi
  echo "## \`kvdata colour\` end to end"
  echo
  if [ -n "$e2e_note" ]; then
    echo "$e2e_note"
  else
    echo "A CSV of spectra (sample name and 40 bands with three decimals) converted with"
    echo "\`--format csv -o FILE\`; one process each, measured by GNU time. \`cat\` is reading the"
    echo "same file to /dev/null."
    echo
    echo "| spectra | file | wall | CPU (user + sys) | M spectra/s (wall) | M spectra/s (CPU) | peak memory | cat wall |"
    echo "|---|---|---|---|---|---|---|---|"
    printf '%s' "$e2e_rows"
    echo
    echo "- Peak memory at $spectra spectra is $rss_growth times that at $small_spectra (target: it does"
    echo "  not grow with the number of spectra; $(verdict "$rss_growth" 1.5))."
    if [ -n "$phase_rows" ]; then
      echo
      echo "Where the CPU time goes, per spectrum: each phase on its own in the suite (100 000"
      echo "spectra, median of the run), as a share of the whole process's CPU per spectrum at"
      echo "$spectra spectra."
      echo
      echo "| phase | benchmark | ns per spectrum | share of the command |"
      echo "|---|---|---|---|"
      printf '%s' "$phase_rows"
      echo
      read_share="${share_command_csv_read_spectra:-0}"
      colour_part="${share_colour_spectra_batch:-0}"
      echo "- Reading is $read_share % of the command's CPU time, the colour work $colour_part % (target: the"
      echo "  command is dominated by reading the file, not by the colour work; $(verdict "$colour_part" "$read_share")). Reading"
      echo "  over colour work: $(awk -v a="$read_share" -v b="$colour_part" 'BEGIN { if (b > 0) printf "%.1f", a / b; else printf "n/a" }') times."
    elif [ -n "$colour_share" ]; then
      echo "- The colour work (the batch rate above applied to $spectra spectra) is $colour_share % of"
      echo "  the command's CPU time; the rest is reading, parsing and writing."
    fi
  fi
  if [ -n "$peer_rows" ]; then
    echo
    echo "### Against ArgyllCMS's spec2cie and the floor of reading the file"
    echo
    echo "$peer_spectra spectra in the CSV above and as a .ti3 file (the same numbers), D65 and the"
    echo "10-degree observer; REF.csv holds as many other spectra, one reference per sample. One"
    echo "process each, measured by GNU time, median wall time of three runs (spec2cie: one run)."
    echo "\`kvdata\` reads, computes and formats on both cores."
    echo
    echo "| command | wall | CPU (user + sys) | peak memory |"
    echo "|---|---|---|---|"
    printf '%s' "$peer_rows"
    echo
    echo "- spec2cie / \`kvdata colour\`, wall: $peer_speedup times (target >= 100; $(verdict "$peer_speedup" 100 ge))."
    echo "- spec2cie / \`kvdata colour --against\` with all four differences, wall: $peer_against_speedup times"
    echo "  (target >= 50; $(verdict "$peer_against_speedup" 50 ge))."
    echo "- In CPU time (user + sys) spec2cie takes $peer_cpu_speedup times \`kvdata colour\` and"
    echo "  $peer_cpu_against times \`kvdata colour --against\`: on a loaded machine (see the load"
    echo "  average above) the short two-thread process waits for the cores longer than the"
    echo "  long single-thread one, so its wall time grows more."
    echo "- \`kvdata colour\` / \`wc -l\`, wall: $peer_floor times (the floor of reading the file)."
    echo "- Peak memory at $peer_spectra spectra is $peer_rss_growth times that at a tenth of them (target:"
    echo "  it does not grow with the file; $(verdict "$peer_rss_growth" 1.5))."
  fi
  if [ -n "$stream_rows" ]; then
    echo
    echo "## \`kvdata decode\` and \`explain\` of a large test run"
    echo
    echo "A test-run stream of two series of 32 767 tiles ($((stream_bytes / 1000000)) MB, made by"
    echo "\`make_test_run\`), written to standard output; one process each, measured by GNU time."
    echo "Target: peak memory at most three times the input plus 32 MB ($((stream_bound_kb / 1024)) MB)."
    echo
    echo "| command | wall | CPU (user + sys) | peak memory | within the bound |"
    echo "|---|---|---|---|---|"
    printf '%s' "$stream_rows"
  fi
  if [ -f bench/NOTES.md ]; then
    echo
    cat bench/NOTES.md
  fi
} >"$results"

echo "== wrote $results" >&2
