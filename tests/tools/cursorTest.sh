#!/bin/sh
# cursor: both kinds, clipped and scaled.
. "$(dirname "$0")/common.sh"

makePicture grey.png 3 1 0xFF808080 0xFF808080 0xFF808080
makePicture and.png 3 1 0xFFFFFFFF 0xFF000000 0xFFFFFFFF
makePicture xor.png 3 1 0xFF000000 0xFFFFFFFF 0xFFFFFFFF

# Kept, white, inverted.
ok cursor grey.png out.png --planes and.png xor.png
samePixels out.png 0x808080 0xFFFFFF 0x7F7F7F
ok cursor grey.png out.png --planes and.png xor.png --at 1,0 --hot 1,0
samePixels out.png 0x808080 0xFFFFFF 0x7F7F7F
ok cursor grey.png out.png --planes and.png xor.png --at 0,0 --hot 1,0
samePixels out.png 0xFFFFFF 0x7F7F7F 0x808080

# Multiplied by its alpha, then blended over.
makePicture red.png 1 1 0x80FF0000
ok cursor grey.png out.png --image red.png --at 2,0
samePixels out.png 0x808080 0x808080 0xBF3F3F

# Scaled about its hot spot: a mask keeps its values, one pixel becomes a square of them.
ok scale grey.png large.png 12x12 --nearest
makePicture black.png 1 1 0xFF000000
makePicture white.png 1 1 0xFFFFFFFF
ok cursor large.png out.png --planes black.png white.png --at 6,6 --scale 2
expect 1 compare large.png out.png
says '4 of 144 pixels differ, by up to 127, within 2x2+6+6'
ok crop out.png middle.png 1x1+7+7
samePixels middle.png 0xFFFFFF

rm -f out.png
refused 1 'at 100,100 nothing of the cursor lies on the destination' \
  cursor grey.png out.png --planes and.png xor.png --at 100,100
refused 1 'not of one size' cursor grey.png out.png --planes and.png white.png
refused 2 'Exactly 1' cursor grey.png out.png
refused 2 'Exactly 1' cursor grey.png out.png --image red.png --planes and.png xor.png
refused 2 'scale' cursor grey.png out.png --image red.png --scale 0
ok scale white.png huge.png 2000x1
refused 1 'too large for a cursor' cursor grey.png out.png --image huge.png
absent out.png
finish
