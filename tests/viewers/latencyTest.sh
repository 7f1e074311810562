#!/bin/sh
# What changes while the screen is otherwise still arrives soon, not with the next look at what no display
# tells (four times a second). On a busy machine the median says more than the longest.
. "$(dirname "$0")/common.sh"

for depth in 24 8; do
  startScreen 640x480x$depth
  startServing --listen 127.0.0.1:0
  "$VIEWERS/rfbLatency" "$address" "$DISPLAY" raw 15 >out 2>&1 || fail "depth $depth: $(cat out)"
  note "depth $depth: $(cat out)"
  [ "$(cut -d. -f1 out)" -lt 150 ] || fail "depth $depth: the median of all delays is $(cat out) ms"
  stopServing
done
finish
