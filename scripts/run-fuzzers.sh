#!/usr/bin/env bash
# Runs the libFuzzer targets of the fuzz preset for a bounded time each, one
# after another, one process each. Every target starts from a scratch copy of
# its seed corpus (fuzz/corpus/<target>/), so what a run discovers never
# lands in the repository. Any finding (crash, sanitizer report, failed
# round-trip check, leak, timeout, memory limit) fails the script; the inputs
# that caused them are kept under build/fuzz/findings/.
#
#   scripts/run-fuzzers.sh                 # 20 s per target (CI)
#   scripts/run-fuzzers.sh 3600            # an hour per target
#   scripts/run-fuzzers.sh --runs=10000000 kv_tol_set_fuzz   # a number of executions
#   scripts/run-fuzzers.sh --runs=10000000 1800   # whichever ends first
#
# KVDATA_FUZZ_CORPUS_DIR=<dir> keeps the working corpora there between runs
# (seeded from fuzz/corpus on first use) instead of in a scratch directory;
# KVDATA_FUZZ_BIN_DIR=<dir> runs targets copied elsewhere (so that a long run
# is not disturbed by a rebuild).
#
# The targets must be built first:
#   cmake --preset fuzz && cmake --build --preset fuzz
set -euo pipefail
cd "$(dirname "$0")/.."

seconds=""
runs=""
targets=()
for arg in "$@"; do
  case "$arg" in
    --runs=*) runs="${arg#--runs=}" ;;
    -h|--help) awk 'NR > 1 && /^#/ { sub(/^# ?/, ""); print; next } NR > 1 { exit }' "$0"; exit 0 ;;
    *[!0-9]*) targets+=("$arg") ;;
    *) seconds="$arg" ;;
  esac
done

bin_dir="${KVDATA_FUZZ_BIN_DIR:-build/fuzz/fuzz}"
findings=build/fuzz/findings
if [ "${#targets[@]}" -eq 0 ]; then
  for bin in "$bin_dir"/*_fuzz; do
    [ -x "$bin" ] && targets+=("$(basename "$bin")")
  done
fi
if [ "${#targets[@]}" -eq 0 ]; then
  echo "no fuzz targets in $bin_dir: build the fuzz preset first" >&2
  exit 2
fi

scratch="$(mktemp -d "${TMPDIR:-/tmp}/kvdata-fuzz.XXXXXX")"
trap 'rm -rf "$scratch"' EXIT
mkdir -p "$findings"

# Findings are reported by the sanitizers' own exit codes; leaks are checked.
# AddressSanitizer keeps freed memory in quarantine to catch late uses; its
# default of 256 MB alone would exceed the 256 MB RSS limit once a target has
# freed enough blocks (an out-of-memory report that no input causes), so the
# quarantine is kept at 16 MB, ample for the few-kilobyte inputs fuzzed here.
export ASAN_OPTIONS="${ASAN_OPTIONS:-detect_leaks=1:abort_on_error=0:quarantine_size_mb=16}"
export UBSAN_OPTIONS="${UBSAN_OPTIONS:-print_stacktrace=1:halt_on_error=1}"

limits=(-rss_limit_mb=256 -malloc_limit_mb=64 -timeout=10 -print_final_stats=1)
# A number of executions, a time, or both (whichever ends first); 20 s when
# neither is given.
budget=()
[ -n "$runs" ] && budget+=(-runs="$runs")
[ -n "$seconds" ] && budget+=(-max_total_time="$seconds")
[ "${#budget[@]}" -eq 0 ] && budget+=(-max_total_time=20)

failed=()
printf '%-28s %12s %8s %8s %8s  %s\n' target executions cov ft corpus result
for target in "${targets[@]}"; do
  bin="$bin_dir/$target"
  if [ ! -x "$bin" ]; then
    echo "$target: not built" >&2
    failed+=("$target")
    continue
  fi
  corpus="${KVDATA_FUZZ_CORPUS_DIR:-$scratch}/$target"
  mkdir -p "$corpus"
  if [ -d "fuzz/corpus/$target" ]; then
    cp -R "fuzz/corpus/$target/." "$corpus/"
  fi
  log="$scratch/$target.log"
  mkdir -p "$findings"
  rc=0
  "$bin" "${limits[@]}" "${budget[@]}" -artifact_prefix="$findings/$target-" "$corpus" \
    >"$log" 2>&1 || rc=$?

  execs="$(sed -n 's/^stat::number_of_executed_units: *//p' "$log" | tail -1)"
  last="$(grep -E '^#[0-9]+' "$log" | tail -1 || true)"
  cov="$(sed -n 's/.* cov: \([0-9]*\).*/\1/p' <<<"$last")"
  ft="$(sed -n 's/.* ft: \([0-9]*\).*/\1/p' <<<"$last")"
  corp="$(sed -n 's/.* corp: \([0-9]*\)\/.*/\1/p' <<<"$last")"
  result=ok
  if [ "$rc" -ne 0 ]; then
    result="FINDING (exit $rc)"
    failed+=("$target")
  fi
  printf '%-28s %12s %8s %8s %8s  %s\n' "$target" "${execs:-?}" "${cov:-?}" "${ft:-?}" \
    "${corp:-?}" "$result"
  if [ "$rc" -ne 0 ]; then
    cp "$log" "$findings/$target.log" || true
    grep -E 'ERROR|fuzz check failed|SUMMARY|Test unit written' "$log" | head -20 | sed 's/^/    /'
  fi
done

if [ "${#failed[@]}" -gt 0 ]; then
  echo >&2
  echo "findings in: ${failed[*]} (inputs and logs under $findings/)" >&2
  exit 1
fi
echo "no findings"
