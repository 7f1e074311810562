#!/bin/sh
# pack and unpack: round trips, and damaged blocks that are refused.
. "$(dirname "$0")/common.sh"

gradient a.png 64 48
ok rop a.png flat.png --op copy --color 336699
for picture in a flat; do
  for depth in 24 32; do
    ok pack "$picture.png" block.rblk --depth "$depth"
    ok unpack block.rblk back.png
    ok compare "$picture.png" back.png
  done
  for depth in 8 16; do
    ok pack "$picture.png" block.rblk --depth "$depth"
    ok unpack block.rblk back.png
    ok convert "$picture.png" through.png --depth "$depth"
    ok compare through.png back.png
  done
done
ok pack flat.png flat.rblk
[ "$(wc -c <flat.rblk)" = 32 ] || fail "one colour is not three words of code"
ok pack a.png a.rblk
[ "$(wc -c <a.rblk)" = $((20 + 64 * 48 * 4)) ] || fail 'pixels without repetitions are not stored'

# A code by hand: two equal pixels and a count, twice, a count of 0 among them.
{ words 3 2 12 32 7; words 0xFF112233 0xFF112233 1 0xFF445566 0xFF445566 0 0xFF778899; } >hand.rblk
ok unpack hand.rblk hand.png
samePixels hand.png 0x112233 0x112233 0x112233 0x445566 0x445566 0x778899

# Row padding, in stored and in coded blocks.
{ words 1 2 8 32 0; words 0xFF010203 0 0xFF040506 0; } >padded.rblk
ok unpack padded.rblk padded.png
samePixels padded.png 0x010203 0x040506
{ words 1 2 16 32 6; words 0xFF010203 0 0 1 0xFF010203 0; } >padded.rblk
refused 1 'does not make the pixels' unpack padded.rblk no.png

# damaged TEXT: ./bad.rblk is refused.
damaged() {
  refused 1 "$1" unpack bad.rblk no.png
  absent no.png
}
head -c 19 flat.rblk >bad.rblk && damaged 'shorter than its header'
: >bad.rblk && damaged 'shorter than its header'
head -c 31 flat.rblk >bad.rblk && damaged 'not as long as its header says'
{ cat flat.rblk; words 0; } >bad.rblk && damaged 'not as long as its header says'
head -c 100 a.rblk >bad.rblk && damaged 'not as many as its header says'
{ cat a.rblk; words 0; } >bad.rblk && damaged 'not as many as its header says'
{ words 2 2 8 32 3; words 1 1 3; } >bad.rblk && damaged 'does not make the pixels'
{ words 2 2 8 32 3; words 1 1 0xFFFFFFFF; } >bad.rblk && damaged 'does not make the pixels'
{ words 2 2 8 32 2; words 1 1; } >bad.rblk && damaged 'where a count should be'
{ words 2 2 8 32 0xFFFFFFFF; words 1 1 2; } >bad.rblk && damaged 'not as long as its header says'
{ words 2 2 8 12 0; words 1 1 2; } >bad.rblk && damaged '12 bits per pixel'
{ words 2 2 8 0 0; words 1 1 2; } >bad.rblk && damaged '0 bits per pixel'
{ words 2 2 8 16 3; words 1 1 2; } >bad.rblk && damaged 'only pixels of 32 bits'
{ words 3 2 8 32 3; words 1 1 2; } >bad.rblk && damaged 'longer than its pitch'
{ words 2 2 10 32 0; head -c 20 a.rblk; } >bad.rblk && damaged 'do not begin at whole pixels'
{ words 1 2 4 24 0; words 0x030201; printf '\006\005'; } >bad.rblk && damaged 'cut off'
{ words 0 2 8 32 3; words 1 1 2; } >bad.rblk && damaged '0x2 pixels'
{ words 2 0xFFFFFFFF 8 32 3; words 1 1 2; } >bad.rblk && damaged '2x4294967295 pixels'
{ words 2 1000000 0xFFFFFFFC 32 3; words 1 1 2; } >bad.rblk && damaged 'too large'

# Every single bit of the header and the code flipped: an error or a picture, never a crash.
size=$(wc -c <hand.rblk)
for at in $(seq 0 $((size - 1))); do
  byte=$(od -An -tu1 -j"$at" -N1 hand.rblk | tr -d ' ')
  for bit in 1 2 4 8 16 32 64 128; do
    # shellcheck disable=SC2059
    { head -c "$at" hand.rblk; printf "$(printf '\\%03o' $((byte ^ bit)))"
      tail -c +$((at + 2)) hand.rblk; } >bad.rblk
    "$TOOL" unpack bad.rblk maybe.png >out 2>err
    status=$?
    [ "$status" -le 1 ] || fail "byte $at with bit $bit flipped: exit status $status"
  done
done
finish
