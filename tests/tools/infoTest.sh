#!/bin/sh
# info: what it knows, and what it makes of files that are something else.
. "$(dirname "$0")/common.sh"

gradient a.png 60 40
ok info a.png
says 'a.png: PNG, 60x40 pixels, RGB, 8 bits per sample'
says 'in memory: depth 24, 24 bits per pixel, 180 bytes per line'

ok convert a.png a.bmp
ok info a.bmp
says 'a.bmp: BMP, 60x40 pixels, 24 bits per pixel'
cp a.bmp picture
ok info picture
says 'picture: BMP, 60x40 pixels, 24 bits per pixel'
ok convert a.png d8.png --depth 8
ok convert d8.png d8.bmp
ok info d8.bmp
says 'd8.bmp: BMP, 60x40 pixels, 8 bits per pixel, 256 colours'


# BMP files of other programs: OS/2's short header, one bit a pixel, run lengths, the top row first.
if have convert; then
  convert -size 5x3 xc:red BMP2:old.bmp
  ok info old.bmp
  grep -q '^old.bmp: BMP, 5x3 pixels, [0-9]* bits* per pixel' out || fail "of an OS/2 bitmap: $(cat out)"
  convert -size 5x3 xc:red -monochrome -type bilevel BMP3:one.bmp
  ok info one.bmp
  says 'one.bmp: BMP, 5x3 pixels, 1 bit per pixel, 2 colours'
  convert -size 64x48 xc:red -type palette -compress rle BMP3:rle.bmp
  ok info rle.bmp
  grep -q '^rle.bmp: BMP, 64x48 pixels, 8 bits per pixel, .*, compressed$' out || fail "of run lengths: $(cat out)"
fi
{ head -c 22 a.bmp; printf '\330\377\377\377'; tail -c +27 a.bmp; } >down.bmp
ok info down.bmp
says 'down.bmp: BMP, 60x40 pixels, 24 bits per pixel, top row first'

ok pack a.png a.rblk
ok info a.rblk
says 'a.rblk: raster block, 60x40 pixels, 32 bits per pixel, not compressed'
ok rop a.png flat.png --op copy --color 336699
ok pack flat.png flat.rblk
ok info flat.rblk
says 'flat.rblk: raster block, 60x40 pixels, 32 bits per pixel, 3 words of code for 9600 bytes of pixels'
ok pack a.png a16.rblk --depth 16
ok info a16.rblk
says 'a16.rblk: raster block, 60x40 pixels, 16 bits per pixel, not compressed'

# Recordings of the live screen, made by hand: a header, and updates with a time.
update() { words "$1" 0 "$2"; }
part() { words 0 0 "$1" "$2" "$3"; }
blockPart() { part 60 40 "$(wc -c <flat.rblk)"; cat flat.rblk; }
{ printf RASTLIVE; words 1 60 40; } >empty.rlive
ok info empty.rlive
says 'empty.rlive: recording, 60x40 pixels, 0 updates in 0.000 seconds'
{ cat empty.rlive; update 1000 1; blockPart; update 2500000 1; blockPart; } >session.rlive
ok info session.rlive
says 'session.rlive: recording, 60x40 pixels, 2 updates in 2.500 seconds'
{ cat session.rlive; update 3000000 1; part 800 600 0; } >grown.rlive
ok info grown.rlive
says 'grown.rlive: recording, 60x40 pixels, 3 updates in 3.000 seconds, at last 800x600 pixels'
ok info - <grown.rlive
says 'standard input: recording, 60x40 pixels, 3 updates in 3.000 seconds, at last 800x600 pixels'
head -c -1 session.rlive >broken.rlive
ok info broken.rlive
says 'broken.rlive: recording, 60x40 pixels, 1 update in 0.001 seconds, broken off within an update'
{ cat session.rlive; update 3000000 1; part 61 40 20; cat flat.rblk; } >damaged.rlive
refused 1 'it is damaged at byte' info damaged.rlive

# Nothing is described that is not sound, but for pictures too large to be read.
head -c 200 a.png >bad.png
refused 1 'cut off' info bad.png
head -c 100 a.rblk >bad.rblk
refused 1 'not a sound block' info bad.rblk
for file in /dev/null /dev/zero; do refused 1 'is not a PNG picture, a BMP picture' info "$file"; done
echo text >text
refused 1 "'text' is not a PNG picture, a BMP picture, a raster block or a recording" info text

{ head -c 16 a.png; printf '\000\001\000\000\000\001\000\000'; tail -c +25 a.png; } >huge.png
ok info huge.png
says 'in memory: too large to be read'
finish
