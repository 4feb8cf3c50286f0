#!/usr/bin/env sh
# Makes every example stream, examples/streams/KIND.kvs, from its readable
# form examples/json/KIND.json with `kvdata encode`.
#
#   examples/make-streams.sh build/release/bin/kvdata
set -eu
kvdata=$(cd "$(dirname "${1:-build/release/bin/kvdata}")" && pwd)/$(basename "${1:-build/release/bin/kvdata}")
cd "$(dirname "$0")"
mkdir -p streams
for json in json/*.json; do
  kind=$(basename "$json" .json)
  "$kvdata" encode "$kind" "$json" -o "streams/$kind.kvs"
done
