#!/usr/bin/env bash
# How kvdata treats the files it writes and reads, one case per line of the
# table below: regular files keep their permissions, links are followed,
# FIFOs and device nodes are written in place, an output that is also an
# input is refused, "-" is standard input and output, and a signal removes
# the temporary file. Device nodes are made here with mknod; where that is
# not permitted those cases are skipped with a message.
#
#   tests/cli/file_rules.sh build/dev/bin/kvdata examples
set -uo pipefail
kvdata=$(realpath "$1")
examples=$(realpath "$2")
work=$(mktemp -d)
trap 'kill $(cat "$work/reader" 2>/dev/null) 2>/dev/null; rm -rf "$work"' EXIT
cd "$work" || exit 1
umask 027
failures=0
can_mknod=1
mknod null c 1 3 2>/dev/null && mknod full c 1 7 2>/dev/null || can_mknod=0
rm -f null full

# The first failed check of a case ends it with its name and what was seen.
check() {
  if ! eval "$1"; then
    echo "FAIL $name: $1 (exit $code; stderr: $(head -c 300 err))"
    failures=$((failures + 1))
    return 1
  fi
}
# Runs kvdata with the given words (evaluated, so redirections work).
run() {
  eval "\"$kvdata\" $* >out 2>err"
  code=$?
}
mode() { stat -c %a "$1"; }
type_of() { stat -c %F "$1"; }
no_temporary() { ! ls -A | grep -q '^\.kvdata-'; }

cp "$examples/streams/user.kvs" user.kvs
cp "$examples/json/user.json" user.json
cp "$examples/spectra/tiles.csv" self.csv

# The FIFO's reader has seen the end of what was written (waits up to 20 s,
# as a loaded machine may need).
reader_done() {
  for _ in $(seq 400); do kill -0 "$(cat reader)" 2>/dev/null || return 0; sleep 0.05; done
  return 1
}

# Each case: a name, its set-up, the command's words, then the checks.
cases() {
  c "new file: 0666 under the umask" '' \
    'decode user.kvs -o new.json' '[ $code = 0 ] && [ "$(mode new.json)" = 640 ] && cmp -s new.json "$examples/json/user.json"'
  c "replaced file keeps mode 600" 'echo old >secret.json; chmod 600 secret.json' \
    'decode user.kvs -o secret.json' '[ $code = 0 ] && [ "$(mode secret.json)" = 600 ] && cmp -s secret.json "$examples/json/user.json"'
  c "link followed, link stays" 'echo old >real.json; chmod 604 real.json; ln -s real.json link.json' \
    'encode user.json -o link.json' '[ $code = 0 ] && [ -L link.json ] && cmp -s real.json user.kvs && [ "$(mode real.json)" = 604 ]'
  c "dangling link makes its target" 'ln -s made.kvs dangling.kvs' \
    'encode user.json -o dangling.kvs' '[ $code = 0 ] && [ -L dangling.kvs ] && cmp -s made.kvs user.kvs'
  c "FIFO written in place" 'mkfifo fifo; (cat fifo >from-fifo & echo $! >reader)' \
    'decode user.kvs -o fifo' '[ $code = 0 ] && [ "$(type_of fifo)" = fifo ] && reader_done && cmp -s from-fifo "$examples/json/user.json"'
  c "device node written in place" 'mknod null c 1 3' \
    'decode user.kvs -o null' '[ $code = 0 ] && [ "$(type_of null)" = "character special file" ]'
  c "full device: exit 1, node kept" 'mknod full c 1 7' \
    'decode user.kvs -o full' '[ $code = 1 ] && grep -q "full: write failed: No space left" err && [ "$(type_of full)" = "character special file" ]'
  c "output is the input: exit 2, input kept" 'cp self.csv before.csv' \
    'colour self.csv -o self.csv --format csv' '[ $code = 2 ] && grep -q "is also the input" err && cmp -s self.csv before.csv'
  c "output is the input through a link" 'ln -s user.kvs again.kvs' \
    'explain user.kvs -o again.kvs' '[ $code = 2 ] && cmp -s user.kvs "$examples/streams/user.kvs"'
  c "output is standard input" 'cp user.json in.json' \
    'encode - -o in.json <in.json' '[ $code = 2 ] && cmp -s in.json user.json'
  c "standard input named twice" '' \
    'spread - - <self.csv' '[ $code = 2 ]'
  c "/dev/stdout into a pipe" '' \
    'decode user user.kvs -o /dev/stdout | cat' '[ $code = 0 ] && cmp -s out "$examples/json/user.json"'
  c "directory refused" 'mkdir dir' \
    'decode user.kvs -o dir' '[ $code = 1 ] && [ -d dir ] && no_temporary'
  c "- reads standard input" '' \
    'decode - <user.kvs' '[ $code = 0 ] && cmp -s out "$examples/json/user.json"'
  c "-o - writes standard output (encode)" '' \
    'encode - -o - <user.json' '[ $code = 0 ] && cmp -s out user.kvs && [ ! -e - ]'
  c "-o - writes standard output (plot)" '' \
    'plot "$examples/streams/tileset.kvs" -o -' '[ $code = 0 ] && grep -q "<svg" out && [ ! -e - ]'
  c "--svg - writes standard output (spread)" '' \
    'spread "$examples/spectra/white.csv" "$examples/spectra/blue.cgats" --svg - -o spread.txt' '[ $code = 0 ] && grep -q "<svg" out && [ ! -e - ]'
  c "CGATS from standard input" '' \
    'colour - --format csv <"$examples/spectra/tiles.cgats"' '[ $code = 0 ] && [ "$(wc -l <out)" = 14 ]'
  c "name of 250 characters" '' \
    'encode user.json -o $(printf "n%.0s" {1..250})' '[ $code = 0 ] && cmp -s $(printf "n%.0s" {1..250}) user.kvs && no_temporary'
}

c() {
  name=$1
  if [[ $2 == *mknod* && $can_mknod = 0 ]]; then
    echo "skip $name: mknod is not permitted here"
    return
  fi
  eval "$2"
  run "$3"
  check "$4"
  check no_temporary
}
cases

# A signal while the output is being written: the command waits on a FIFO
# for more rows after its first block and its temporary file, is sent the
# signal, and must leave nothing behind and exit with 128 + its number.
set -m  # background jobs keep the default SIGINT, as a terminal's would
mkfifo rows
for signal in INT TERM HUP; do
  name="signal $signal"
  "$kvdata" colour rows --format csv -o signalled.csv 2>err &
  pid=$!
  exec 3>rows
  { head -1 self.csv; yes "$(sed -n 2p self.csv)" | head -5000; } >&3  # past the first block
  for _ in $(seq 400); do ls -A | grep -q '^\.kvdata-' && break; sleep 0.05; done
  check '! no_temporary' || { exec 3>&-; wait $pid; continue; }
  kill -s "$signal" $pid
  wait $pid
  code=$?
  exec 3>&-
  check '[ $code = $((128 + $(kill -l $signal))) ] && [ ! -e signalled.csv ] && no_temporary'
done

[ $failures = 0 ] && echo "all file rules hold"
exit $((failures > 0))
