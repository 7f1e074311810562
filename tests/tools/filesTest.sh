#!/bin/sh
# Damaged pictures are refused with one line; what stands under the final name is always whole.
. "$(dirname "$0")/common.sh"

gradient a.png 120 90
size=$(wc -c <a.png)

for length in 0 7 8 20 28 33 40 60 $((size / 2)) $((size - 13)) $((size - 1)); do
  head -c "$length" a.png >bad.png
  expect 1 convert bad.png no.png
  [ "$(wc -l <err)" = 1 ] || fail "cut to $length bytes: $(cat err)"
  absent no.png
done

# A flipped bit in the pixel data.
{ head -c $((size / 2)) a.png; printf 'X'; tail -c +$((size / 2 + 2)) a.png; } >bad.png
refused 1 "cannot read the picture 'bad.png' (" convert bad.png no.png

# Kinds that are not read.
if have pngtopnm && have pnmtopng; then
  pngtopnm a.png | ppmtopgm | pnmtopng >grey.png 2>/dev/null
  refused 1 'is a grey picture' convert grey.png no.png
else
  note 'not checked: no netpbm here'
fi
{ head -c 24 a.png; printf '\020'; tail -c +26 a.png; } >deep.png
refused 1 '16 bits per sample' convert deep.png no.png
absent no.png

# A failed command leaves the old file alone.
cp a.png kept.png
expect 1 convert bad.png kept.png
cmp -s a.png kept.png || fail 'a failed command changed the file that was there'

# So does a disk that is full: here, a limit on the size of files.
(
  trap '' XFSZ
  ulimit -f 1
  "$TOOL" convert a.png kept.png --compression 0 >out 2>err
  echo $? >status
)
[ "$(cat status)" = 1 ] || fail "a full disk: exit status $(cat status)"
grep -q "cannot write 'kept.png'" err || fail "a full disk: $(cat err)"
cmp -s a.png kept.png || fail 'a full disk changed the file that was there'
absent

# A link stays a link; a device is written to and stays a device.
ln -s a.png link.png
ok rop a.png link.png --op invert --color 000000
[ -L link.png ] || fail 'the link became a file'
ok compare link.png a.png
ok convert a.png /dev/null --format png
[ -c /dev/null ] || fail '/dev/null is no device any more'
finish
