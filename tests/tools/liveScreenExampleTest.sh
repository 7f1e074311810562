#!/bin/sh
# What the example of a live screen says of a screen of its own. In the environment: LIVE_SCREEN, the program.
. "$(dirname "$0")/common.sh"
for program in Xvfb xsetroot xlogo; do
  have $program || { note "skipped: no $program here"; exit 77; }
done

# watch UPDATES: starts the program and waits for its first update.
watch() {
  rm -f out # of an earlier one
  "$LIVE_SCREEN" "$1" >out 2>err &
  watching=$!
  for _ in $(seq 300); do
    grep -qs "^update:" out && return
    sleep 0.1
  done
  fail "no update: $(cat out err)"
}

# ended STATUS LINE...: what it ended with, and all that it said.
ended() {
  wanted=$1
  shift
  wait "$watching"
  status=$?
  [ "$status" = "$wanted" ] || fail "it ended with $status, not $wanted: $(cat out err)"
  printf '%s\n' "$@" | cmp -s - out || fail "it said: $(cat out)"
}

startServer 640x480x24
xsetroot -solid '#204060'

# Of what is drawn as it was, nothing goes over.
watch 2
xsetroot -solid '#204060'
ended 0 update: '  640x480 at 0,0' update:

# Of a window, the window.
watch 2
xlogo -geometry 64x32+32+64 -borderwidth 0 -fg '#c0a040' -bg '#c0a040' &
logo=$!
ended 0 update: '  640x480 at 0,0' update: '  64x32 at 32,64'
kill $logo
wait $logo 2>/dev/null
xsetroot -solid '#204060' # when it has been served, the window is gone

watch 1000000
stopServer
ended 1 update: '  640x480 at 0,0'
finish
