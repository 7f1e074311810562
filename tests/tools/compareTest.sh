#!/bin/sh
# compare: 0 for equal, 1 for different, 2 for trouble, and where the differences are.
. "$(dirname "$0")/common.sh"

gradient a.png 100 80
makePicture dot.png 2 1 0xFFFFFFFF 0xFFFFFFFF
ok combine b.png a.png@0,0 dot.png@33,40 dot.png@70,71

ok compare a.png a.png
says '0 of 8000 pixels differ'
[ "$(wc -l <out)" = 1 ] || fail "more than a line about equal pictures: $(cat out)"
expect 1 compare a.png b.png
by=$(sed -n 's/^4 of 8000 pixels differ, by up to \([0-9]*\), within 39x32+33+40$/\1/p' out)
[ "$by" -ge 128 ] || fail "the difference is: $(cat out)"
says '  16x16+32+32'
says '  16x16+64+64'
[ "$(wc -l <out)" = 3 ] || fail "other rectangles: $(cat out)"
expect 1 compare a.png b.png --tile 8
says '  8x8+32+40'

# The picture of the differences is dark where there are none.
expect 1 compare a.png b.png --image diff.png
ok info diff.png
says 'diff.png: PNG, 100x80 pixels, RGB, 8 bits per sample'
ok crop diff.png edge.png 1x1+32+32
samePixels edge.png 0xFF0000

# Four pixels differ, in up to three bytes each.
ok compare a.png b.png --max-diffs 4
says "4 of 8000 pixels differ, by up to $by, within 39x32+33+40: equal within the tolerance"
expect 1 compare a.png b.png --max-diffs 1

# A mask that hides one of the two dots, and one that hides all.
ok rop a.png black.png --op clear --color 000000
ok rop a.png white.png --op set --color 000000
ok combine mask.png white.png@0,0 dot.png@0,0
ok rop mask.png mask.png --op clear --source dot.png --at 33,40
expect 1 compare a.png b.png --mask mask.png
grep -q '^2 of 7998 pixels differ, by up to [0-9]*, within 2x1+70+71$' out || fail "under a mask: $(cat out)"
ok compare a.png b.png --mask black.png
says '0 of 0 pixels differ'

# By how much: the largest difference of a channel.
makePicture p.png 2 1 0xFF102030 0xFF102030
makePicture q.png 2 1 0xFF102030 0xFF132530
expect 1 compare p.png q.png
says '1 of 2 pixels differ, by up to 5, within 1x1+1+0'

# Quiet: the status alone; the picture is still painted.
expect 1 compare a.png b.png --quiet --image quiet.png
[ ! -s out ] || fail "--quiet said: $(cat out)"
ok compare diff.png quiet.png -q
[ ! -s out ] || fail "-q said: $(cat out)"
"$TOOL" compare a.png b.png --image - >piped.png 2>words
grep -q '^4 of 8000' words || fail "beside a picture on standard output: $(cat words)"
ok compare diff.png piped.png

# Trouble.
ok crop a.png small.png 50x50+0+0
expect 1 compare a.png small.png
says 'different sizes: 100x80 and 50x50'
refused 2 "is not of the pictures' size" compare a.png b.png --mask small.png
echo text >text.png
refused 2 'is not a PNG picture' compare a.png text.png
refused 2 'required' compare a.png
expect 2 compare a.png a.png --image none/diff.png
grep -q "cannot write 'none/diff.png'" err || fail "an unwritable picture: $(cat err)"
finish
