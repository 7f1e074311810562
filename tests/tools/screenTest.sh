#!/bin/sh
# screenshot and watch on a real X server, in every depth that it offers.
. "$(dirname "$0")/common.sh"
have Xvfb || { note 'skipped: no Xvfb here'; exit 77; }

refused 1 "cannot connect to the display ':987'" screenshot no.png --display :987
DISPLAY='' refused 1 'no display' screenshot no.png
absent no.png

# paint: something to see, when there is a program for it.
paint() {
  if have xsetroot; then xsetroot -mod 7 11 -fg '#1050a0' -bg '#f0c040'; fi
}

# matchesServer FILE MOST: the same pixels as the X server's own dump. Programs widen fields of 5 and 6
# bits in different ways: no channel may differ by more than MOST.
matchesServer() {
  if have xwd && have xwdtopnm && have pngtopnm; then
    xwd -root -silent | xwdtopnm 2>/dev/null | pamdepth 255 2>/dev/null >dump.ppm
    most=$(pngtopnm "$1" | pamarith -difference - dump.ppm | pamsumm -max -brief)
    [ "$most" -le "$2" ] || fail "$1 is not what the X server shows: it differs by $most"
  else
    note 'not compared with xwd: it or netpbm is missing'
  fi
}

for depth in 8 15 16 24; do
  case $depth in 15 | 16) most=4 ;; *) most=0 ;; esac
  startServer "200x120x$depth"
  paint
  ok screenshot "shot$depth.png"
  grep -q "200x120+0+0 of a screen with .*, depth $depth in " out || fail "depth $depth: $(cat out)"
  matchesServer "shot$depth.png" $most
  ok screenshot "part$depth.png" --region 100x50+37+21
  ok crop "shot$depth.png" cut.png 100x50+37+21
  ok compare "part$depth.png" cut.png
  ok screenshot "cursor$depth.png" --cursor
done

refused 1 'does not lie within the screen' screenshot no.png --region 200x121+0+0
refused 2 'WxH+X+Y' screenshot no.png --region full
absent no.png
ok screenshot shot.bmp
if have pngtopnm && have bmptopnm; then
  pngtopnm shot24.png >png.ppm
  bmptopnm shot.bmp 2>/dev/null | cmp - png.ppm || fail 'the BMP and the PNG of the screen differ'
fi

# A screen that stands still, and one that changes.
ok watch --interval 0.1 --count 2
says '1: no change'
says '2: no change'
if have xsetroot; then
  (sleep 0.5; xsetroot -solid '#204060') &
  ok watch --interval 1.5
  wait $!
  says '1: changes within 200x120+0+0'
fi

# Captures as raw video: the first one, and one for every line of words, which go elsewhere then.
"$TOOL" watch --interval 0.05 --count 3 --raw - >frames.raw 2>words || fail "watch --raw -: $(cat words)"
[ "$(wc -c <frames.raw)" = $((4 * 200 * 120 * 4)) ] || fail "$(wc -c <frames.raw) bytes of 4 captures"
[ "$(wc -l <words)" -ge 3 ] || fail "words beside raw video: $(cat words)"
ok watch --interval 0.05 --count 1 --raw file.raw --region 50x40+3+5
says '1: no change'
[ "$(wc -c <file.raw)" = $((2 * 50 * 40 * 4)) ] || fail "$(wc -c <file.raw) bytes of 2 captures"
ok screenshot still.png
if have ffmpeg; then
  "$TOOL" watch --interval 0.05 --count 1 --raw - 2>words | ffmpeg -nostdin -loglevel error -f rawvideo \
    -pixel_format bgr0 -video_size 200x120 -i - -frames:v 1 -y ffmpeg.png || fail 'raw video to ffmpeg'
  ok compare still.png ffmpeg.png
else
  note 'not checked: no ffmpeg here'
fi
"$TOOL" screenshot - >piped.png 2>words || fail "a screenshot to standard output: $(cat words)"
grep -q 'of a screen with' words || fail "words beside a screenshot: $(cat words)"
ok compare still.png piped.png
"$TOOL" watch --interval 0.05 --count 0 >/dev/full 2>words
[ $? = 1 ] || fail 'watch >/dev/full does not end with 1'

# The cursor lies where the pointer is: in the middle of a server without a mouse.
if have xsetroot; then
  xsetroot -cursor_name left_ptr -solid '#204060'
  ok screenshot plain.png
  ok screenshot pointed.png --cursor
  expect 1 compare plain.png pointed.png
  grep -q 'within .*+\(9[0-9]\|10[0-9]\)+\(5[0-9]\|6[0-9]\)$' out || fail "the cursor lies at: $(cat out)"
  ok screenshot large.png --cursor --cursor-scale 3
  expect 1 compare pointed.png large.png
  ok screenshot off.png --cursor --region 20x20+0+0
  ok crop plain.png corner.png 20x20+0+0
  ok compare off.png corner.png
  refused 2 'cursor' screenshot no.png --cursor-scale 2
fi
finish
