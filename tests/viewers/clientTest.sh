#!/bin/sh
# The small client itself, with a server that was not made for it: x11vnc. It rounds where pixels become
# narrow and reads the screen again and again, so only formats of 24 bits on a screen that stands still.
. "$(dirname "$0")/common.sh"
for program in x11vnc xwdtopnm; do
  have $program || { note "skipped: no $program here"; exit 77; }
done

startScreen
start x11vnc -display "$DISPLAY" -quiet -forever -shared -nopw -rfbport 0 -unixsock "$work/screen" \
  -nocursor -noxdamage
waitFor [ -S screen ]
address=$work/screen

sees() {
  "$viewer" "$address" --format "$1" --encoding "$2" --save picture.ppm >out 2>&1 || return
  xwd -root -silent | xwdtopnm 2>/dev/null >screen.ppm
  cmp screen.ppm picture.ppm >out 2>&1
}
# Its ZRLE takes colours in the upper three bytes for colours in the lower three.
for format in 32 red-lowest-32 big-endian-32; do
  for encoding in raw zrle; do waitFor sees $format $encoding; done
done
waitFor sees high-32 raw
for version in 3.3 3.7; do
  "$viewer" "$address" --version $version >out 2>&1 || fail "version $version: $(cat out)"
done

# What compares finds what differs.
xsetroot -solid '#000000'
"$VIEWERS/screenDifferences" "$DISPLAY" "$DISPLAY" >out || fail "a screen and itself: $(cat out)"
grep -q '^0 of 786432 pixels differ$' out || fail "a screen and itself: $(cat out)"
"$viewer" "$address" --compare "$DISPLAY" --patience 1 >out 2>&1 &&
  fail "no pointer in the picture and no difference: $(cat out)"
finish
