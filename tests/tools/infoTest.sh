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

# Nothing is described that is not sound, but for pictures too large to be read.
head -c 200 a.png >bad.png
refused 1 'cut off' info bad.png
head -c 100 a.rblk >bad.rblk
refused 1 'not a sound block' info bad.rblk
for file in /dev/null /dev/zero; do refused 1 'is not a PNG picture, a BMP picture' info "$file"; done
echo text >text
refused 1 "'text' is not a PNG picture, a BMP picture or a raster block" info text

{ head -c 16 a.png; printf '\000\001\000\000\000\001\000\000'; tail -c +25 a.png; } >huge.png
ok info huge.png
says 'in memory: too large to be read'
finish
