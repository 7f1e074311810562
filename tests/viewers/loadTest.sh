#!/bin/sh
# Many viewers at once of a screen on which a lot goes on: when it stands still again, each of them shows
# every pixel of it.
. "$(dirname "$0")/common.sh"
[ -n "${RASTER_TEST_FULL:-}" ] || { note 'skipped: only with RASTER_TEST_FULL'; exit 77; }
have xterm || { note 'skipped: no xterm here'; exit 77; }

# follow NAME OPTION...: a viewer that follows the screen until the pipe ends.
followers=
follow() {
  name=$1
  shift
  "$viewer" "$address" --compare "$DISPLAY" --until-end-of-input "$@" <pipe >"$name.viewer" 2>&1 &
  followers="$followers $!"
  background="$! $background"
}

# load: a terminal that scrolls and moves about, windows that are filled, copied and inverted.
load() {
  xterm -geometry 100x40+200+30 -xrm 'XTerm*allowWindowOps: true' -e sh -c '
    for i in $(seq 60); do
      printf "\033[3;%d;%dt" $((i * 13 % 500)) $((i * 7 % 300))
      ls -l /usr/bin | head -40
    done'
  if have x11perf; then
    x11perf -display "$DISPLAY" -repeat 1 -reps 200 -rop GXxor GXcopy -rect100 -copywinwin500 -scroll500 \
      -ftext >/dev/null 2>&1
  fi
}

# following OPTIONS-OF-THE-SERVER: all viewers through one load.
following() {
  startServing "$@"
  rm -f pipe
  mkfifo pipe
  followers=
  turn=0
  for format in 32 red-lowest-32 big-endian-32 24 16 big-endian-16 15 8 6 1-1-1; do
    turn=$((turn % 3 + 1))
    follow "$format" --format "$format" --encoding "$(echo raw copyrect,zrle tightpng | cut -d' ' -f$turn)"
  done
  follow changing --format 32,8,16,big-endian-32,6,15,red-lowest-32 --encoding zrle
  follow changing-raw --format 16,32,1-1-1,24 --encoding copyrect,raw
  exec 9>pipe
  load
  exec 9>&-
  for follower in $followers; do
    wait "$follower" || fail "a viewer ended with $?"
  done
  for file in *.viewer; do note "$(cat "$file")"; done
  equal --encoding raw
  equal --encoding zrle
  stopServing
  note "$(cat serve.out)"
  [ ! -s serve.err ] || fail "serve said: $(cat serve.err)"
}

startScreen
following --listen 127.0.0.1:0
finish
