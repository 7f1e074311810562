#!/bin/sh
# The X screen changes its size: viewers that know of such things follow, and the others see what there
# is left of it.
. "$(dirname "$0")/common.sh"
have xrandr || { note 'skipped: no xrandr here'; exit 77; }

startScreen
xrandr --newmode small 0 801 0 0 0 599 0 0 0 2>err && xrandr --addmode screen small 2>>err &&
  xrandr --output screen --mode small 2>>err ||
  { note "skipped: this X server does not change its size: $(cat err)"; exit 77; }
xrandr --output screen --mode 1024x768

# toSize MODE: the screen changes while viewers are connected, who then show the whole new screen.
toSize() {
  beginFollowing
  follow raw --compare "$DISPLAY"
  follow zrle --compare "$DISPLAY" --encoding zrle --format 16
  follow tightpng --compare "$DISPLAY" --encoding tightpng
  follow cursor --compare "$DISPLAY" --encoding copyrect,zrle --cursor alpha
  follow changing --compare "$DISPLAY" --format 32,8,big-endian-16,32
  untilAllFollow
  xrandr --output screen --mode "$1"
  endFollowing
  for file in *.viewer; do
    grep -q " 0 of $2 pixels differ" "$file" || fail "in $1 $file says: $(cat "$file")"
  done
}

startServing --listen 127.0.0.1:0
for turn in 1 2; do
  toSize small 479799
  toSize 1024x768 786432
done
equal
stopServing
[ ! -s serve.err ] || fail "serve said: $(cat serve.err)"

# Viewers that cannot be told of the new size are let go, with one line; the others stay.
startServing --listen 127.0.0.1:0
beginFollowing
follow aware --compare "$DISPLAY"
untilAllFollow
"$viewer" "$address" --no-resize --until-end-of-input <&8 8<&- 9>&- >unaware 2>&1 &
unaware=$!
background="$unaware $background"
waitFor grep -q following unaware
xrandr --output screen --mode small
wait $unaware
grep -q 'closed the connection' unaware || fail "a viewer that does not know of sizes: $(cat unaware)"
endFollowing
stopServing
[ "$(wc -l <serve.err)" = 1 ] || fail "serve said: $(cat serve.err)"
note "$(cat serve.err)"
finish
