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

# Luma 128 and 128 with the first chroma byte 240 and the second 16.
bytes 128 240 128 16 >frame.yuv
ok yuv frame.yuv out.png --format YUY2 --size 2x1
samePixels out.png 0xFF5300 0xFF5300
bytes 240 128 16 128 >frame.yuv
ok yuv frame.yuv out.png --format UYVY --size 2x1
samePixels out.png 0xFF5300 0xFF5300
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
bytes 16 128 16 128 235 128 235 128 16 128 >frames.yuv
ok yuv frames.yuv out.png --format YUY2 --size 2x1 --frame 1
samePixels out.png 0xFFFFFF 0xFFFFFF
ok yuv frames.yuv all.png --format YUY2 --size 2x1 --all
samePixels all-0000.png 0x000000 0x000000
samePixels all-0001.png 0xFFFFFF 0xFFFFFF
absent all.png all-0002.png
refused 1 'holds 2 whole frames of 4 bytes, not one of number 2' yuv frames.yuv no.png --format YUY2 --size 2x1 --frame 2
refused 1 'holds 0 whole frames' yuv frames.yuv no.png --format YUY2 --size 100x100 --all
refused 2 'format' yuv frames.yuv no.png --format NV12 --size 2x1
refused 2 'WxH' yuv frames.yuv no.png --format YUY2 --size 2
refused 2 'excludes' yuv frames.yuv no.png --format YUY2 --size 2x1 --all --frame 1
absent no.png no-0000.png
finish
