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

# A few bytes may promise any number of pixels: 3.6 GB are refused by their header; 720 MB since so few
# bytes cannot hold them, before there is memory for them.
printf '\211PNG\015\012\032\012\000\000\000\015IHDR\000\000\234@\000\000u0\010\002\000\000\000CtwW\000\000\000\010IDATx\234\003\000\000\000\000\001H\006\211\322\000\000\000\000IEND\256B\140\202' >huge.png
refused 1 "'huge.png' is too large: 40000x30000 pixels" convert huge.png no.png
printf '\211PNG\015\012\032\012\000\000\000\015IHDR\000\000N\040\000\000.\340\010\002\000\000\000\366L\203?\000\000\000\010IDATx\234\003\000\000\000\000\001H\006\211\322\000\000\000\000IEND\256B\140\202' >large.png
refused 1 "cannot read the picture 'large.png' (the data ends too early)" convert large.png no.png
{ words 20000 10000 80000 32 3; words 1 1 199999998; } >large.rblk
if (ulimit -v 400000 && "$TOOL" --version >/dev/null 2>&1); then
  (ulimit -v 400000
    refused 1 'the data ends too early' convert large.png no.png
    refused 1 '20000x10000 pixels is too large' unpack large.rblk no.png
    finish) || failures=$((failures + 1))
else
  note 'not checked: a small address space, which this program cannot do with'
fi
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

# By default the signal of that limit ends a program; here it is an error like any other.
(
  ulimit -f 1
  "$TOOL" convert a.png kept.png --compression 0 >out 2>err
  echo $? >status
)
[ "$(cat status)" = 1 ] || fail "a limit on the size of files: exit status $(cat status)"
cmp -s a.png kept.png || fail 'a limit on the size of files changed the file that was there'
absent

# The mode of a file stays, a new one follows the umask.
for mode in 600 640 755 400; do
  cp a.png old.png
  chmod "$mode" old.png
  ok rop a.png old.png --op invert --color 000000
  [ "$(stat -c %a old.png)" = "$mode" ] || fail "mode $mode became $(stat -c %a old.png)"
  cmp -s a.png old.png && fail 'the old file is still there'
  rm -f old.png
done
for mask in 022 027 077 000; do
  (umask "$mask" && ok convert a.png new.png && finish) || failures=$((failures + 1))
  wanted=$(printf '%o' $((0666 & ~0$mask)))
  [ "$(stat -c %a new.png)" = "$wanted" ] || fail "umask $mask gives mode $(stat -c %a new.png)"
  rm -f new.png
done

# Nobody else's file goes: not even one that is named like a temporary file of this process.
# shellcheck disable=SC2016
sh -c 'echo foreign >"new.png.part$$"; exec "$0" convert a.png new.png' "$TOOL" ||
  fail 'a file beside the new one is in the way'
[ "$(cat new.png.part*)" = foreign ] || fail "somebody else's file has gone"
rm -f new.png.part* new.png

# The longest name that a folder takes.
long=$(printf '%0251d' 0).png
ok convert a.png "$long"
ok convert a.png "$long"
ok compare a.png "$long"
rm -f "$long"

# A link stays a link, also one that leads to nothing yet.
mkdir folder
ln -s later.png folder/second.png
ln -s folder/second.png first.png
ok convert a.png first.png
if [ ! -L first.png ] || [ ! -L folder/second.png ]; then fail 'a dangling link became a file'; fi
ok compare a.png folder/later.png
ln -s circle.png circle.png
refused 1 "cannot write 'circle.png'" convert a.png circle.png
[ -L circle.png ] || fail 'a link to itself became a file'
rm -rf folder first.png circle.png
[ "$(find . -name '.?*' | wc -l)" = 0 ] || fail "left behind: $(find . -name '.?*')"

# A link stays a link; a device is written to and stays a device.
ln -s a.png link.png
ok rop a.png link.png --op invert --color 000000
[ -L link.png ] || fail 'the link became a file'
ok compare link.png a.png
ok convert a.png /dev/null --format png
[ -c /dev/null ] || fail '/dev/null is no device any more'
finish
