#!/usr/bin/env bash
# kvdata on hostile input: each case must end with exit code 1, a message
# that names the file and stays short, and a peak resident memory under
# 256 MB (measured with /usr/bin/time). The inputs are made here: a JSON
# document nested 100,000 deep, "kind" values of 100 MB and 500 KB, a CSV
# file with one 200 MB line (100 million cells), one 50 MB cell, a header of
# 100,000 cells, a CGATS file past the size read whole and one of 15 million
# sets just under it, a 2 GiB sparse file named as a user stream, a user
# stream followed by 2 GB of zeros (read no further than the user's own
# bytes), and a 60 MB CSV file read whole with too little memory to hold it
# (the message must name the file).
#
#   scripts/hostile-input.sh [KVDATA]     # default build/dev/bin/kvdata; exit 1 on a breach
set -euo pipefail
cd "$(dirname "$0")/.."
kvdata=$(realpath "${1:-build/dev/bin/kvdata}")
examples=$PWD/examples
limit_kb=$((256 * 1024))
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
cd "$work"

/usr/bin/python3 - <<'EOF'
with open("deep.json", "w") as f:
    f.write('{"kind": "user", "v1User": ' + "[" * 100000 + "]" * 100000 + "}")
with open("kind.json", "w") as f:
    f.write('{"kind": "' + "k" * 100_000_000 + '"}')
with open("kind-500k.json", "w") as f:
    f.write('{"kind": "' + "k" * 500_000 + '"}')
with open("many.csv", "w") as f:
    f.write("SAMPLE_NAME,360\n" + "a,1\n" * 15_000_000)
with open("line.csv", "w") as f:
    f.write("SAMPLE_NAME,360\n" + "1," * 100_000_000 + "\n")
with open("bytes.csv", "w") as f:
    f.write("SAMPLE_NAME,360\n" + "9" * 50_000_000 + "\n")
with open("sets.cgats", "w") as f:
    f.write("CGATS.17\nNUMBER_OF_FIELDS 2\nBEGIN_DATA_FORMAT\nSAMPLE_NAME SPECTRAL_NM360\n")
    f.write("END_DATA_FORMAT\nNUMBER_OF_SETS 15000000\nBEGIN_DATA\n" + "a 1\n" * 15_000_000 + "END_DATA\n")
with open("cells.csv", "w") as f:
    f.write("SAMPLE_NAME," + ",".join(str(300 + i % 800) for i in range(100_000)) + "\n")
with open("big.cgats", "w") as f:
    f.write("CGATS.17\nBEGIN_DATA_FORMAT\nSAMPLE_NAME SPECTRAL_NM360\nEND_DATA_FORMAT\n")
    f.write("BEGIN_DATA\n" + "a 1\n" * 20_000_000 + "END_DATA\n")
EOF
truncate -s 2G sparse.kvs
cp "$examples/streams/user.kvs" user-2g.kvs
truncate -s 2000M user-2g.kvs

status=0
# case NAME EXPECTED-MESSAGE-PART COMMAND...
case_() {
  local name=$1 expect=$2
  shift 2
  local code=0
  /usr/bin/time -f '%M' -o time "$@" >/dev/null 2>err || code=$?
  local peak_kb verdict=ok message
  peak_kb=$(tail -1 time)
  message=$(head -c 400 err | tr '\n' ' ')
  if ((code != 1)) || ((peak_kb > limit_kb)) || ! grep -q -- "$expect" err || (($(wc -c <err) > 400)); then
    verdict=FAIL
    status=1
  fi
  printf '%-28s exit %d  peak %7d KB  %s  %s\n' "$name" "$code" "$peak_kb" "$verdict" "$message"
}
case_ "nested 100,000 deep" "deep.json: v1User\[0\]\[0\].*nested deeper than 64" "$kvdata" encode deep.json -o out.kvs
case_ "100 MB kind value" "kind.json: byte 1048587: a text longer than 1048576 bytes" "$kvdata" encode kind.json -o out.kvs
case_ "500 KB kind value" "kind-500k.json: kind: \"k\{80\}\"... (500000 bytes) is not a kind" "$kvdata" encode kind-500k.json -o out.kvs
case_ "one 200 MB line" "line.csv line 2: more than" "$kvdata" colour line.csv
case_ "one 50 MB cell" "bytes.csv line 2: more than 1048576 bytes" "$kvdata" colour bytes.csv
case_ "100,000 cells in a header" "cells.csv line 1: more than 2048 cells" "$kvdata" colour cells.csv
case_ "same, read whole (spread)" "cells.csv line 1: more than 2048 cells" "$kvdata" spread cells.csv cells.csv
case_ "CGATS past 64 MB" "big.cgats: is longer than" "$kvdata" colour big.cgats
case_ "CGATS of 15 million sets" "sets.cgats line 6: NUMBER_OF_SETS is 15000000; .* at most 32766 sets" "$kvdata" colour sets.cgats
case_ "2 GiB sparse user stream" "sparse.kvs: is 2147483648 bytes, longer than any stream" "$kvdata" explain user sparse.kvs
case_ "user stream + 2 GB (explain)" "user-2g.kvs: Stops at offset 849, .*2097151151 more bytes follow" \
  "$kvdata" explain user user-2g.kvs
case_ "user stream + 2 GB (decode)" "not a user stream as a whole (2097152000 bytes)" \
  "$kvdata" decode user user-2g.kvs
case_ "out of memory names the file" "many.csv: reading the .*: out of memory" \
  bash -c "ulimit -v 100000 && exec \"$kvdata\" spread many.csv many.csv"
exit $status
