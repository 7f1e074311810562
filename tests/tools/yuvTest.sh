#!/bin/sh
# yuv: known frames in the three layouts.
. "$(dirname "$0")/common.sh"

# bytes NUMBER...
bytes() {
  for byte in "$@"; do
    # shellcheck disable=SC2059
    printf "$(printf '\\%03o' "$byte")"
  done
}

# Luma 128 and 128 with much blue difference and little red difference, or the other way round. Names
# are those of other programs; in the library's order the packed formats begin with the red difference.
bluish='0x00B2FF 0x00B2FF'
reddish='0xFF5300 0xFF5300'
# is COLOURS FORMAT [OPTION]: what ./frame.yuv shows.
is() {
  colours=$1
  shift
  ok yuv frame.yuv out.png --size 2x1 --format "$@"
  # shellcheck disable=SC2086
  samePixels out.png $colours
}
bytes 128 240 128 16 >frame.yuv
for name in YUY2 yuy2 YUYV yuyv422; do is "$bluish" "$name"; done
for name in YVYU yvyu; do is "$reddish" "$name"; done
is "$reddish" YUY2 --library-order
bytes 240 128 16 128 >frame.yuv
for name in UYVY uyvy uyvy422; do is "$bluish" "$name"; done
is "$reddish" VYUY
is "$reddish" UYVY --library-order
bytes 128 128 240 16 >frame.yuv
for name in I420 i420 IYUV yuv420p; do is "$bluish" "$name"; done
is "$reddish" YV12
bytes 128 128 128 128 240 16 >frame.yuv
is "$bluish" YV12 --library-order
refused 2 "the library's own order has no format 'I420'" \
  yuv frame.yuv no.png --size 2x1 --format I420 --library-order

# Sides of odd numbers: 3x3 pixels, each with a luma of its own, and chroma that is grey.
bytes 16 50 90 130 170 210 235 80 60 128 128 128 128 128 128 128 128 >frame.yuv
ok yuv frame.yuv out.png --format I420 --size 3x3
samePixels out.png 0x000000 0x282828 0x565656 0x858585 0xB3B3B3 0xE2E2E2 0xFFFFFF 0x4B4B4B 0x333333
bytes 16 128 50 128 90 128 0 128 130 128 170 128 210 128 0 128 >frame.yuv
ok yuv frame.yuv out.png --format YUY2 --size 3x2
samePixels out.png 0x000000 0x282828 0x565656 0x858585 0xB3B3B3 0xE2E2E2

bytes 16 235 128 128 128 128 >frame.yuv
ok yuv frame.yuv out.png --format YV12 --size 2x2
samePixels out.png 0x000000 0xFFFFFF 0x828282 0x828282

# Through the other pixel formats the picture is the same but for the bits they lack.
for depth in 15 16 24 32; do
  ok yuv frame.yuv "d$depth.png" --format YV12 --size 2x2 --depth "$depth"
done
ok compare d24.png d32.png
samePixels d15.png 0x000000 0xFFFFFF 0x848484 0x848484
samePixels d16.png 0x000000 0xFFFFFF 0x848284 0x848284

# Several frames.
bytes 16 128 16 128 235 128 235 128 >frames.yuv
ok yuv frames.yuv out.png --format YUY2 --size 2x1 --frame 1
samePixels out.png 0xFFFFFF 0xFFFFFF
ok yuv frames.yuv all.png --format YUY2 --size 2x1 --all
samePixels all-0000.png 0x000000 0x000000
samePixels all-0001.png 0xFFFFFF 0xFFFFFF
absent all.png all-0002.png
refused 1 "'frames.yuv' holds 2 whole frames of 4 bytes" yuv frames.yuv no.png --format YUY2 --size 2x1 --frame 2
{ cat frames.yuv; bytes 1 2; } >more.yuv
for what in --all '--frame 0'; do
  # shellcheck disable=SC2086
  refused 1 'holds 2 whole frames of 4 bytes and 2 bytes more' yuv more.yuv no.png --format YUY2 --size 2x1 $what
done
refused 1 'holds 0 whole frames' yuv frames.yuv no.png --format YUY2 --size 100x100 --all
refused 2 "there is no video format 'NV12'" yuv frames.yuv no.png --format NV12 --size 2x1
refused 2 'WxH' yuv frames.yuv no.png --format YUY2 --size 2
refused 2 'needs both' yuv frames.yuv no.png --format YUY2
refused 2 'needs both' yuv frames.yuv no.png --size 2x1
refused 1 'is no YUV4MPEG2 video' yuv frames.yuv no.png
refused 2 'excludes' yuv frames.yuv no.png --format YUY2 --size 2x1 --all --frame 1
absent no.png no-0000.png

# Out of a pipe a frame is taken when it comes; what is missing shows at the end.
yuv() { "$TOOL" yuv - "$@" --format YUY2 --size 2x1 2>err; }
cat frames.yuv | yuv out.png --frame 1 || fail "a frame out of a pipe: $(cat err)"
samePixels out.png 0xFFFFFF 0xFFFFFF
cat frames.yuv | yuv pipe.png --all || fail "frames out of a pipe: $(cat err)"
samePixels pipe-0000.png 0x000000 0x000000
samePixels pipe-0001.png 0xFFFFFF 0xFFFFFF
cat more.yuv | yuv part.png --all && fail 'half a frame out of a pipe is nothing wrong'
grep -q 'standard input ends within frame 2' err || fail "half a frame: $(cat err)"
samePixels part-0001.png 0xFFFFFF 0xFFFFFF
cat frames.yuv | yuv no.png --frame 2 && fail 'a frame that is not there'
grep -q 'standard input holds 2 whole frames' err || fail "no such frame: $(cat err)"

# A file says by itself what it is.
{ printf 'YUV4MPEG2 W2 H2 F25:1 Ip A1:1 C420jpeg\nFRAME\n'; bytes 16 16 16 16 128 128
  printf 'FRAME Ixyz\n'; bytes 128 128 128 128 240 16; } >v.y4m
ok yuv v.y4m out.png
samePixels out.png 0x000000 0x000000 0x000000 0x000000
ok yuv v.y4m out.png --frame 1
samePixels out.png 0x00B2FF 0x00B2FF 0x00B2FF 0x00B2FF
"$TOOL" yuv - v.png --all <v.y4m || fail 'a .y4m out of a pipe'
samePixels v-0001.png 0x00B2FF 0x00B2FF 0x00B2FF 0x00B2FF
refused 1 'holds 2 whole frames' yuv v.y4m no.png --frame 2
refused 2 'says its format and size itself' yuv v.y4m no.png --format I420 --size 2x2
head -c 60 v.y4m >bad.y4m
expect 1 yuv bad.y4m no.png --all
grep -q "ends within frame\|has no frame where" err || fail "a .y4m that is cut off: $(cat err)"
printf 'YUV4MPEG2 W2 H2 C444\nFRAME\n' >bad.y4m
refused 1 'frames of the kind 444' yuv bad.y4m no.png
printf 'YUV4MPEG2 W0 H2\nFRAME\n' >bad.y4m
refused 1 'no sound size' yuv bad.y4m no.png

# 40 GB give their last frame; only that is read.
if truncate -s $((40 * 1000 * 1000 * 1000 - 4)) big.yuv 2>/dev/null; then
  bytes 235 128 235 128 >>big.yuv
  (
    # Not for a program under a sanitizer, which needs a larger address space.
    (ulimit -v 4000000 && "$TOOL" --version >/dev/null 2>&1) && ulimit -v 4000000
    "$TOOL" yuv big.yuv out.png --format YUY2 --size 2x1 --frame 9999999999 2>err
  ) || fail "the last frame of a large file: $(cat err)"
  samePixels out.png 0xFFFFFF 0xFFFFFF
  rm -f big.yuv
else
  note 'not checked: no files of 40 GB here'
fi
finish
