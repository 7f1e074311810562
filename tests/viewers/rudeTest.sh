#!/bin/sh
# Viewers with bad manners are dropped with one line, delay nobody and cost little memory.
export ASAN_OPTIONS="quarantine_size_mb=4:${ASAN_OPTIONS:-}" # of what is freed; memory is looked at here
. "$(dirname "$0")/common.sh"

# memory: what the server has in memory, in KiB.
memory() { sed -n 's/^VmRSS:[[:space:]]*\([0-9]*\) kB/\1/p' "/proc/$serving/status"; }

rude() { "$VIEWERS/rfbRude" "$address" "$1" >out 2>&1 || fail "rfbRude $1: $(cat out)"; }

startScreen
startServing --listen 127.0.0.1:0
equal
usual=$(memory)

# They are told why, in one line each.
for deed in greeting-of-another-protocol greeting-without-numbers security-nobody-offered \
  unknown-message nothing-wanted outside reaches-outside seven-bits no-bits shift-beyond \
  field-beyond half-a-format half-a-request half-the-encodings half-a-text; do
  : >serve.err
  rude $deed
  waitFor [ -s serve.err ]
  [ "$(wc -l <serve.err)" = 1 ] || fail "$deed: more than a line: $(cat serve.err)"
  note "$deed: $(cat serve.err)"
done
equal
: >serve.err

rude unknown-encodings
rude long-cut-text
equal

# Those that do not read, and those that never finish, while others watch a screen that changes.
stalled=
for deed in stall stall endless-cut-text; do
  "$VIEWERS/rfbRude" "$address" $deed >$deed.out 2>&1 &
  stalled="$! $stalled"
  waitFor grep -q stalled $deed.out
done
background="$stalled $background"
for _ in 1 2 3; do
  for _ in 1 2 3 4 5 6 7 8 9 10; do change; done
  equal --encoding zrle
done
kill -0 $stalled || fail "a viewer that does not read was dropped: $(cat serve.err)"
stop $stalled

# Viewers that are killed at any moment, in the greeting, in an update, or in a change of format.
for round in $(seq 30); do
  "$viewer" "$address" --until-end-of-input --encoding zrle --format 32,8,16 </dev/zero >/dev/null 2>&1 &
  one=$!
  "$viewer" "$address" --until-end-of-input </dev/zero >/dev/null 2>&1 &
  other=$!
  change
  perl -e "select undef, undef, undef, $round / 300"
  kill -9 $one $other
  wait $one $other 2>/dev/null
done
equal
equal --encoding zrle --format 16

# Three screens a viewer, and the same again for what the allocator keeps.
most=$((usual + 8 * 3 * 1024 * 4))
[ "$(memory)" -le $most ] || fail "the server has $(memory) KiB in memory, after $usual"
note "memory: $usual KiB, afterwards $(memory) KiB"
stopServing
finish
