#!/bin/sh
# rop and blend: known pixels under known operations.
. "$(dirname "$0")/common.sh"

makePicture dst.png 2 2 0xFF0F0F0F 0xFF112233 0xFFFFFFFF 0xFF000000
makePicture src.png 1 1 0xFF3355AA

# Every operation, on one pixel: the source lands on the second one.
rop() {
  ok rop dst.png out.png --op "$1" --source src.png --at 1,0
  samePixels out.png 0x0F0F0F "$2" 0xFFFFFF 0x000000
  ok rop dst.png out.png --op "$3" --source src.png --at 1,0
  samePixels out.png 0x0F0F0F "$2" 0xFFFFFF 0x000000
}
rop clear 0x000000 0
rop and 0x110022 1
rop andReverse 0x225588 2
rop copy 0x3355AA 3
rop andInverted 0x002211 4
rop noop 0x112233 5
rop xor 0x227799 6
rop or 0x3377BB 7
rop nor 0xCC8844 8
rop equiv 0xDD8866 9
rop invert 0xEEDDCC 10
rop orReverse 0xFFDDEE 11
rop copyInverted 0xCCAA55 12
rop orInverted 0xDDAA77 13
rop nand 0xEEFFDD 14
rop set 0xFFFFFF 15

ok rop dst.png out.png --op xor --color FFFFFF
samePixels out.png 0xF0F0F0 0xEEDDCC 0x000000 0xFFFFFF
ok rop dst.png out.png --op copy --tile src.png --depth 32
samePixels out.png 0x3355AA 0x3355AA 0x3355AA 0x3355AA
ok rop src.png out.png --op copy --tile dst.png --phase 3,0
samePixels out.png 0x112233
ok rop dst.png out.png --op copy --color F80000 --depth 16
samePixels out.png 0xFF0000 0xFF0000 0xFF0000 0xFF0000

# A source that sticks out is clipped, one that lies outside is an error.
ok rop src.png out.png --op copy --source dst.png --at -1,0
samePixels out.png 0x112233

# Other names, in any case; colours in other forms.
for name in copy COPY GXcopy SRCCOPY src Copy 3; do
  ok rop dst.png out.png --op "$name" --color '#35a'
  samePixels out.png 0x3355AA 0x3355AA 0x3355AA 0x3355AA
done
for colour in 3355AA 3355aa '#3355aa' 0x3355aa '#35A'; do
  ok rop dst.png out.png --op and-inverted --colour "$colour"
  samePixels out.png 0x0C0A05 0x002211 0xCCAA55 0x000000
done
for colour in '#' 35a '#3355aaf' 0x35a '0x-3355a' '+3355aa' '#3355ag' red; do
  refused 2 'RRGGBB' rop dst.png no.png --op copy "--colour=$colour"
done
refused 2 'at requires' rop dst.png no.png --op copy --tile src.png --at 1,1
refused 2 'at requires' rop dst.png no.png --op copy --colour 000000 --at 1,1
refused 2 'phase requires' rop dst.png no.png --op copy --source src.png --phase 1,1
absent no.png

rm -f out.png
refused 1 'nothing of the source lies on the destination' rop src.png out.png --op copy --source dst.png --at 5,5
absent out.png

# The source is multiplied by its alpha first: 0x80 of 0xFF over 0x33.
makePicture half.png 1 1 0x80FF0000
ok blend dst.png half.png out.png --at 1,0
samePixels out.png 0x0F0F0F 0x881019 0xFFFFFF 0x000000
ok blend dst.png half.png staged.png --at 1,0 --staged
ok compare out.png staged.png
ok blend dst.png half.png out.png --at 1,0 --op clear
samePixels out.png 0x0F0F0F 0x000000 0xFFFFFF 0x000000
ok blend dst.png half.png out.png --at 1,0 --op 1
samePixels out.png 0x0F0F0F 0x800000 0xFFFFFF 0x000000
ok blend dst.png half.png out.png --at 1,0 --op add
samePixels out.png 0x0F0F0F 0x912233 0xFFFFFF 0x000000
ok blend dst.png half.png out.png --at 1,0 --op destination --dst-alpha 0
samePixels out.png 0x0F0F0F 0x000000 0xFFFFFF 0x000000
ok blend dst.png half.png out.png --at 1,0 --op over --src-alpha 0
ok compare dst.png out.png
ok blend dst.png half.png out.png --at 1,0
for name in SRCOVER source-over OVER 3; do
  ok blend dst.png half.png named.png --at 1,0 --op "$name"
  ok compare out.png named.png
done
for depth in 6 8 15 16 24 32; do
  ok blend dst.png half.png out.png --depth "$depth" --op source --at 0,1
done
finish
