#!/bin/sh
# Help everywhere; usage errors end with 2, failures with 1, each with one clear line.
. "$(dirname "$0")/common.sh"

ok --help
ok --version
for command in screenshot watch info convert combine rop blend cursor scale crop compare yuv pack unpack; do
  ok "$command" --help
  grep -q -- "$command" out || fail "$command --help does not name it"
  refused 2 '' "$command" --no-such-option
done

refused 2 'subcommand' </dev/null
refused 2 'subcommand' no-such-command
refused 2 'required' convert only-one.png

makePicture a.png 2 1 0xFF112233 0xFF445566
refused 2 'ends neither in .png nor in .bmp' convert a.png b.jpg
refused 2 'depth' convert a.png b.png --depth 7
refused 2 'compression' convert a.png b.png --compression 10
refused 2 'neither alpha nor compression' convert a.png b.bmp --keep-alpha
refused 2 "'bogus' is not of the form WxH+X+Y" crop a.png b.png bogus
refused 2 "'1x1+0' is not of the form WxH+X+Y" crop a.png b.png 1x1+0
refused 2 "'0x5' is not of the form WxH" scale a.png b.png 0x5
refused 2 'neither of the form WxH nor a factor' scale a.png b.png -3
refused 2 'FILE@X,Y' combine b.png a.png
refused 2 "no operation 'mix'" rop a.png b.png --op mix --color 000000
refused 2 'Exactly 1' rop a.png b.png --op xor
refused 2 'RRGGBB' rop a.png b.png --op xor --color red
refused 2 "no operation '14'" blend a.png a.png b.png --op 14
refused 2 'divides' blend a.png a.png b.png --op saturate --dst-alpha 0
for number in nan -nan NAN inf -inf 1e999 0x1 1x '' ' 1' +1 0.09 16.1 -1; do
  refused 2 'scale' cursor a.png b.png --image a.png "--scale=$number"
  refused 2 'cursor-scale' screenshot b.png --cursor "--cursor-scale=$number"
done
for number in nan inf 86401 -1; do
  refused 2 'interval' watch "--interval=$number"
done
for number in nan 1.5 -1 0x10 010 1x '' 256 99999999999999999999; do
  refused 2 'src-alpha' blend a.png a.png b.png "--src-alpha=$number"
done
for number in -1 18446744073709551616 1.5; do
  refused 2 'count' watch "--count=$number"
  refused 2 'frame' yuv a.png b.png --format YUY2 --size 2x2 "--frame=$number"
done
refused 2 'max-diffs' compare a.png a.png --max-diffs -1

refused 1 "cannot read 'none.png'" convert none.png b.png
refused 1 "cannot read '.'" info .
echo text >text.png
refused 1 "'text.png' is not a PNG picture" info text.png
refused 1 "cannot write 'none/b.png'" convert a.png none/b.png
refused 1 'does not lie within the picture' crop a.png b.png 2x2+0+0
refused 1 'no side of a scaled picture' scale a.png b.png 40000x1
refused 2 "cannot read 'none.png'" compare a.png none.png
absent b.png b.bmp b.jpg

# No progress line and no colours where standard error is no terminal: checked by ok above.
finish
