#!/bin/sh
# info, convert, combine, crop, scale: the right pixels in sound files.
. "$(dirname "$0")/common.sh"

makePicture small.png 3 2 0xFFFF0000 0xFF00FF00 0xFF0000FF 0xFF102030 0x80405060 0xFFFFFFFF
samePixels small.png 0xFF0000 0x00FF00 0x0000FF 0x102030 0x405060 0xFFFFFF

ok info small.png
says 'small.png: PNG, 3x2 pixels, RGB with alpha, 8 bits per sample'
says 'in memory: depth 24, 32 bits per pixel, 12 bytes per line'

# Through other pixel formats: narrowing truncates, widening repeats the top bits.
ok convert small.png d16.png --depth 16 --no-alpha
samePixels d16.png 0xFF0000 0x00FF00 0x0000FF 0x102031 0x425163 0xFFFFFF
ok convert small.png d15.png --depth 15 --no-alpha
samePixels d15.png 0xFF0000 0x00FF00 0x0000FF 0x102131 0x425263 0xFFFFFF
ok convert small.png d8.png --depth 8 --no-alpha
samePixels d8.png 0xFF0000 0x00FF00 0x0000FF 0x002400 0x494955 0xFFFFFF
ok info d8.png
says 'in memory: depth 8, 8 bits per pixel, 4 bytes per line, 256 colours'
ok convert d8.png back.png --depth 24
samePixels back.png 0xFF0000 0x00FF00 0x0000FF 0x002400 0x494955 0xFFFFFF
for depth in 24 32; do
  ok convert small.png same.png --depth "$depth" --no-alpha
  ok compare small.png same.png
done

# Alpha is kept by every command that makes pictures of pictures, unless it is not wanted.
# alphas FILE NUMBER...: a picture's fourth bytes.
alphas() {
  file=$1
  shift
  ok pack "$file" alpha.rblk --keep-alpha
  { words 0 0 0 0 0; tail -c +21 alpha.rblk; } >alpha.words
  got=$(od -An -v -tu1 -w4 -j20 alpha.words | awk '{printf "%s ", $4}')
  [ "$got" = "$* " ] || fail "$file has the alphas $got, not $*"
}
ok convert small.png alpha.png
ok info alpha.png
says 'alpha.png: PNG, 3x2 pixels, RGB with alpha, 8 bits per sample'
alphas alpha.png 255 255 255 255 128 255
ok convert small.png noalpha.png --no-alpha
ok info noalpha.png
says 'noalpha.png: PNG, 3x2 pixels, RGB, 8 bits per sample'
ok crop small.png cut.png 2x1+0+1
alphas cut.png 255 128
ok crop small.png cut.png 2x1+0+1 --no-alpha
alphas cut.png 255 255
ok scale small.png four.png 200% --nearest
ok crop four.png cut.png 2x1+2+3
alphas cut.png 128 128
ok combine both.png small.png@0,0 noalpha.png@3,0
alphas both.png 255 255 255 255 255 255 255 128 255 255 255 255
ok combine both.png small.png@0,0 noalpha.png@3,0 --no-alpha
ok info both.png
says 'both.png: PNG, 6x2 pixels, RGB, 8 bits per sample'

# The colour of what cannot be seen stays out of what is smoothed.
makePicture edge.png 2 1 0xFF00FF00 0x00FF0000
ok scale edge.png wide.png 8x1
ok pack wide.png alpha.rblk --keep-alpha
od -An -v -tu1 -w4 -j20 alpha.rblk | awk '$4 > 0 && $3 > 0 {print; bad = 1} END {exit bad}' ||
  fail 'red of a transparent pixel is seen beside green'

# What a format cannot keep is said, or refused where it was asked for.
expect 0 convert small.png small.bmp
grep -q 'a BMP file keeps no alpha' err || fail "not said: $(cat err)"
expect 0 convert small.png narrow.png --depth 16
grep -q 'pixels of --depth 16 keep no alpha' err || fail "not said: $(cat err)"
refused 2 'no alpha to keep' convert small.png no.png --keep-alpha --depth 8
refused 2 'no alpha to keep' pack small.png no.rblk --keep-alpha --depth 24
refused 2 'neither alpha nor compression' convert small.png no.bmp --keep-alpha
refused 2 'excludes' convert small.png no.png --keep-alpha --no-alpha
absent no.png no.bmp no.rblk
ok convert small.png small.bmp --no-alpha
ok convert noalpha.png opaque.bmp

gradient big.png 300 200
ok convert big.png big0.png --compression 0
ok convert big.png big9.png --compression 9
ok compare big0.png big9.png
[ "$(wc -c <big0.png)" -gt "$(wc -c <big9.png)" ] || fail 'compression 9 is not smaller than 0'

# The file's kind comes from the name, or from the option.
ok convert big.png big.bmp
ok convert big.png big.picture --format bmp
cmp big.bmp big.picture || fail '--format bmp is not what .bmp gives'
[ "$(head -c 2 big.bmp)" = BM ] || fail 'no BMP signature'

# Laid out: gaps are transparent, without gaps there is no alpha; later ones cover.
ok combine wide.png big.png@0,0 big.png@300,0
ok info wide.png
says 'wide.png: PNG, 600x200 pixels, RGB, 8 bits per sample'
ok combine gap.png small.png@-1,0 small.png@3,1
ok info gap.png
says 'gap.png: PNG, 7x3 pixels, RGB with alpha, 8 bits per sample'
ok crop gap.png part.png 3x2+4+1
ok compare small.png part.png
refused 1 'too large' combine huge.png small.png@0,0 small.png@1000000000,1000000000
absent huge.png

# Cut out and scaled.
ok crop big.png part.png 100x50+200+150
ok crop part.png again.png 100x50+0+0
ok compare part.png again.png
ok crop big.png half.png 100x50+0+0 --scale 50x25
ok crop big.png corner.png 10x10
ok crop big.png same.png 10x10+0+0
ok compare corner.png same.png
ok crop big.png quarter.png 100x50+0+0 --scale 25%
ok info half.png
says 'half.png: PNG, 50x25 pixels, RGB, 8 bits per sample'
ok scale small.png twice.png 2 --nearest
samePixels twice.png 0xFF0000 0xFF0000 0x00FF00 0x00FF00 0x0000FF 0x0000FF \
  0xFF0000 0xFF0000 0x00FF00 0x00FF00 0x0000FF 0x0000FF \
  0x102030 0x102030 0x405060 0x405060 0xFFFFFF 0xFFFFFF \
  0x102030 0x102030 0x405060 0x405060 0xFFFFFF 0xFFFFFF
ok scale big.png smooth.png 450x300
ok info smooth.png
says 'smooth.png: PNG, 450x300 pixels, RGB, 8 bits per sample'
# sizes ARGUMENT WxH: what a picture of 300x200 is scaled to.
sizes() {
  ok scale big.png sized.png "$1"
  ok info sized.png
  says "sized.png: PNG, $2 pixels, RGB, 8 bits per sample"
}
sizes 50% 150x100
sizes 29% 87x58
sizes 0.5 150x100
sizes 150x 150x100
sizes x50 75x50
sizes 1x 1x1
sizes 10x20 10x20

# Other programs read what was written, and see the same pixels.
if have pngcheck; then
  for file in *.png; do pngcheck -q "$file" || fail "pngcheck refuses $file"; done
else
  note 'not checked: no pngcheck here'
fi
if have pngtopnm && have bmptopnm; then
  pngtopnm big.png >png.ppm
  bmptopnm big.bmp 2>/dev/null | cmp - png.ppm || fail 'the BMP and the PNG differ in netpbm'
else
  note 'not checked: no netpbm here'
fi
finish
