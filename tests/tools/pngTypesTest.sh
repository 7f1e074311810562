#!/bin/sh
# PNG files of every type, bit depth and way of transparency, straight and interlaced: the tool sees in
# them what netpbm and ImageMagick see.
. "$(dirname "$0")/common.sh"
have pnmtopng && have pngtopnm && have pamgradient || { note 'skipped: no netpbm here'; exit 77; }

# Pictures of 16 bits a sample, and what is made of them.
pamgradient -maxval 65535 black red blue yellow 37 23 | pamtopnm >rgb16.ppm
ppmtopgm rgb16.ppm >grey16.pgm
pamdepth 255 rgb16.ppm >rgb8.ppm
pamdepth 255 grey16.pgm >grey8.pgm
pamdepth 15 grey16.pgm >grey4.pgm
pamdepth 3 grey16.pgm >grey2.pgm
pgmtopbm -threshold grey16.pgm >grey1.pbm 2>/dev/null
for colours in 2 4 16 200; do
  pnmquant "$colours" rgb8.ppm >"palette$colours.ppm" 2>/dev/null
done
pamgradient -maxval 65535 black white white black 37 23 | pamtopnm | ppmtopgm >alpha16.pgm
pamdepth 255 alpha16.pgm >alpha8.pgm
pamdepth 3 alpha16.pgm | pamdepth 255 >alphaSteps.pgm

# make NAME PICTURE [OPTION...]: NAME.png, and NAMEi.png interlaced.
made=
make() {
  name=$1 picture=$2
  shift 2
  pnmtopng "$@" "$picture" >"$name.png" 2>/dev/null || fail "pnmtopng does not make $name"
  pnmtopng "$@" -interlace "$picture" >"${name}i.png" 2>/dev/null || fail "pnmtopng does not make ${name}i"
  made="$made $name ${name}i"
}
make g1 grey1.pbm
make g2 grey2.pgm
make g4 grey4.pgm
make g8 grey8.pgm -force
make g16 grey16.pgm -force
make rgb8 rgb8.ppm -force
make rgb16 rgb16.ppm -force
for colours in 2 4 16 200; do make "p$colours" "palette$colours.ppm"; done
make ga8 grey8.pgm -force -alpha alpha8.pgm
make ga16 grey16.pgm -force -alpha alpha16.pgm
make rgba8 rgb8.ppm -force -alpha alpha8.pgm
make rgba16 rgb16.ppm -force -alpha alpha16.pgm
make pa palette16.ppm -alpha alphaSteps.pgm
make gt8 grey8.pgm -force -transparent =black
make gt16 grey16.pgm -force -transparent =black
make rgbt8 rgb8.ppm -force -transparent =red
make rgbt16 rgb16.ppm -force -transparent =red
make pt palette16.ppm -transparent black
# What is said about the meaning of the samples changes none of them.
make ggamma grey16.pgm -force -gamma 0.3
make rgbgamma rgb8.ppm -force -gamma 0.3
make rgbtgamma rgb8.ppm -force -transparent =red -gamma 1.0

# kind NAME TEXT: what info says, so that every type is there indeed.
kind() {
  ok info "$1.png"
  says "$1.png: PNG, 37x23 pixels, $2"
}
kind g1 'grey, 1 bit per sample'
kind g2 'grey, 2 bits per sample'
kind g4 'grey, 4 bits per sample'
kind g8 'grey, 8 bits per sample'
kind g16i 'grey, 16 bits per sample, interlaced'
kind rgb8i 'RGB, 8 bits per sample, interlaced'
kind rgb16 'RGB, 16 bits per sample'
kind p2 'palette, 1 bit per sample'
kind p4 'palette, 2 bits per sample'
kind p16 'palette, 4 bits per sample'
kind p200i 'palette, 8 bits per sample, interlaced'
kind ga8 'grey with alpha, 8 bits per sample'
kind ga16 'grey with alpha, 16 bits per sample'
kind rgba8 'RGB with alpha, 8 bits per sample'
kind rgba16 'RGB with alpha, 16 bits per sample'
kind gt8 'grey, 8 bits per sample, transparency'
kind rgbt16i 'RGB, 16 bits per sample, transparency, interlaced'
kind rgbt8 'RGB, 8 bits per sample, transparency'
ok info pa.png
grep -q 'palette, . bits\? per sample, transparency' out || fail "no palette with transparency: $(cat out)"

# sees PNG: its colours at 8 bits in ./colours.pnm, its alpha in ./alpha.pgm.
sees() {
  pngtopnm "$1" 2>/dev/null | pamdepth 255 2>/dev/null >colours.pnm
  pngtopnm -alpha "$1" 2>/dev/null | pamdepth 255 2>/dev/null | pamtopnm >alpha.pgm
}
for name in $made; do
  sees "$name.png"
  mv colours.pnm theirs.pnm
  mv alpha.pgm theirs.pgm
  ok convert "$name.png" ours.png
  sees ours.png
  most=$(pamarith -difference theirs.pnm colours.pnm | pamsumm -max -brief)
  [ "$most" = 0 ] || fail "the colours of $name differ by $most from what netpbm sees"
  most=$(pamarith -difference theirs.pgm alpha.pgm | pamsumm -max -brief)
  [ "$most" = 0 ] || fail "the alpha of $name differs by $most from what netpbm sees"

  # Without alpha the colours stay what they are.
  ok convert "$name.png" opaque.png --no-alpha
  sees opaque.png
  most=$(pamarith -difference theirs.pnm colours.pnm | pamsumm -max -brief)
  [ "$most" = 0 ] || fail "the colours of $name differ by $most without alpha"
  [ "$(pamsumm -min -brief alpha.pgm)" = 255 ] || fail "$name has alpha after --no-alpha"
  if have compare && have identify; then
    case $name in *gamma*) continue ;; esac
    # It cuts 16 bits to 8, or rounds them, as it was built.
    differ=$(compare -fuzz 0.5% -metric AE "$name.png" ours.png null: 2>&1)
    [ "$differ" = 0 ] || fail "ImageMagick sees $differ pixels differ in $name"
  fi
done
finish
