#!/bin/sh
# The cursor in the picture, and apart from it: of other shapes, where it is moved to, and at the edges.
. "$(dirname "$0")/common.sh"

startScreen
startServing --listen 127.0.0.1:0 --input
followEveryWay() {
  beginFollowing
  for format in 32 big-endian-16; do
    follow "drawn-$format" --compare "$DISPLAY" --format $format
    follow "mask-$format" --compare "$DISPLAY" --format $format --encoding zrle --cursor mask
    follow "alpha-$format" --compare "$DISPLAY" --format $format --cursor alpha
  done
  untilAllFollow
}
followEveryWay
endFollowing

# Shapes of a theme, if there is one here, and of the font; the "watch" of a theme moves. The program that
# sets them leaves at once, and with it the number under which the X server gives them away.
for theme in theme font; do
  [ $theme = theme ] || export XCURSOR_PATH="$work"
  for shape in xterm sb_h_double_arrow 'watch left_ptr'; do
    followEveryWay
    for name in $shape; do
      xsetroot -cursor_name "$name"
      sleep 0.2
    done
    endFollowing
  done
done
equal --cursor alpha

# At the edges a part of it is outside.
for position in 0,0 1023,767 3,700; do
  equal --pointer $position
  equal --pointer $position --format 16 --encoding zrle
  equal --pointer $position --cursor alpha
done
stopServing

# A viewer's hand reaches the screen only where it is allowed to.
pointer() { "$viewer" "$address" --pointer "$1" --where "$DISPLAY"; }
startServing --listen 127.0.0.1:0 --input
[ "$(pointer 300,200)" = 300,200 ] || fail "the pointer did not move: $(pointer 300,200)"
stopServing
startServing --listen 127.0.0.1:0
[ "$(pointer 100,100)" = 300,200 ] || fail "the pointer moved without --input: $(pointer 100,100)"
stopServing

if have xterm; then
  # Until the window has the keys, ends of lines that are pressed go to nobody; those that came are skipped.
  start xterm -geometry 80x10+300+150 -e sh -c 'echo >ready; read line; echo >hears
    while [ -z "$line" ]; do read line; done; echo "$line" >typed; sleep 86400'
  startServing --listen 127.0.0.1:0 --input
  waitFor [ -s ready ]
  isHeard() { "$viewer" "$address" --pointer 350,200 --type '
'; [ -s hears ]; }
  waitFor isHeard
  "$viewer" "$address" --pointer 350,200 --type 'Hello, World (42)
'
  waitFor [ -s typed ]
  [ "$(head -1 typed)" = 'Hello, World (42)' ] || fail "what was typed: $(cat typed)"
  stopServing
fi
[ ! -s serve.err ] || fail "serve said: $(cat serve.err)"
finish
