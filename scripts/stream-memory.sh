#!/usr/bin/env bash
# Peak resident memory of `kvdata decode` and `kvdata explain` on the largest
# test run a stream carries (two series of 32767 tiles, about 42 MB): explain
# as a table and as JSON, to standard output and through -o, with and without
# KIND. Each must stay within three times the stream's size plus 32 MB.
# Builds the release preset first. (scripts/run-benchmarks.sh records the
# same figures in bench/RESULTS.md.)
#
#   scripts/stream-memory.sh            # prints one line per case, exit 1 on a breach
set -euo pipefail
cd "$(dirname "$0")/.."
cmake --preset release >/dev/null
nice -n 10 cmake --build --preset release --target kvdata_cli make_test_run >/dev/null

work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
build/release/bench/make_test_run "$work/large.kvs"
size=$(stat -c %s "$work/large.kvs")
limit_kb=$(((3 * size + 32 * 1024 * 1024) / 1024))

status=0
measure() {
  local name=$1
  shift
  /usr/bin/time -f '%M %e' -o "$work/time" "$@" >/dev/null
  read -r peak_kb seconds <"$work/time"
  local verdict=ok
  if ((peak_kb > limit_kb)); then verdict=OVER; status=1; fi
  printf '%-22s peak %7d KB (limit %d KB)  %6.2f s  %s\n' "$name" "$peak_kb" "$limit_kb" "$seconds" "$verdict"
}
measure "decode" build/release/bin/kvdata decode testrun "$work/large.kvs"
measure "decode -o, no KIND" build/release/bin/kvdata decode "$work/large.kvs" -o "$work/out.json"
measure "table" build/release/bin/kvdata explain testrun "$work/large.kvs"
measure "json" build/release/bin/kvdata explain --json testrun "$work/large.kvs"
measure "table -o" build/release/bin/kvdata explain testrun "$work/large.kvs" -o "$work/out.txt"
measure "json -o, no KIND" build/release/bin/kvdata explain --json "$work/large.kvs" -o "$work/out.json"
echo "stream: $size bytes"
exit $status
