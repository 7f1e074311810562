#!/bin/sh
# Many viewers at once of a screen on which a lot goes on: when it stands still again, each of them shows
# every pixel of it.
. "$(dirname "$0")/common.sh"
have xterm || { note 'skipped: no xterm here'; exit 77; }

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

startScreen
startServing --listen 127.0.0.1:0
beginFollowing
turn=0
for format in 32 red-lowest-32 big-endian-32 24 16 big-endian-16 15 8 6 1-1-1; do
  turn=$((turn % 3 + 1))
  follow "$format" --compare "$DISPLAY" --format "$format" \
    --encoding "$(echo raw copyrect,zrle tightpng | cut -d' ' -f$turn)"
done
follow changing --compare "$DISPLAY" --format 32,8,16,big-endian-32,6,15,red-lowest-32 --encoding zrle
follow changing-raw --compare "$DISPLAY" --format 16,32,1-1-1,24 --encoding copyrect,raw
follow cursor --compare "$DISPLAY" --encoding copyrect,zrle --cursor alpha
untilAllFollow
load 8<&- 9>&-
endFollowing
equal --encoding raw
equal --encoding zrle
stopServing
note "$(cat serve.out)"
[ ! -s serve.err ] || fail "serve said: $(cat serve.err)"
finish
