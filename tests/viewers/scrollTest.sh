#!/bin/sh
# A terminal that scrolls slowly: viewers that can move what they have are told to, and in the end each of
# them shows every pixel.
. "$(dirname "$0")/common.sh"
have xterm || { note 'skipped: no xterm here'; exit 77; }

# scrollBefore OPTION...: viewers of a screen that scrolls; those named "mover" know CopyRect.
scrollBefore() {
  startServing --listen 127.0.0.1:0 "$@"
  beginFollowing
  follow mover-raw --compare "$DISPLAY" --encoding copyrect,raw
  follow mover-zrle --compare "$DISPLAY" --encoding zrle,copyrect --cursor alpha
  follow mover-png --compare "$DISPLAY" --encoding copyrect,tightpng --cursor mask
  for format in big-endian-16 8 1-1-1; do
    follow "mover-$format" --compare "$DISPLAY" --encoding copyrect,zrle --format $format
  done
  follow mover-changing --compare "$DISPLAY" --encoding copyrect,raw --format 32,8,16,big-endian-32
  follow other --compare "$DISPLAY" --encoding zrle
  untilAllFollow
  scrollSlowly 8<&- 9>&-
  endFollowing
  stop "$started"
  stopServing
  note "$(cat serve.out)"
  [ ! -s serve.err ] || fail "serve said: $(cat serve.err)"
}

startScreen
scrollBefore
for file in mover-*.viewer; do
  grep -q ' 1:[1-9]' "$file" || fail "nothing was moved: $(cat "$file")"
done
grep -q '^moved [1-9]' serve.out || fail "nothing was moved: $(cat serve.out)"
! grep ' 1:' other.viewer || fail 'moved at a viewer that did not ask for it'

# What has just changed is tinted: it is not what it was.
scrollBefore --show-changes
! grep ' 1:' ./*.viewer || fail 'a tint was moved'
finish
