#!/bin/sh
# Help everywhere; usage errors end with 2, failures with 1, each with one clear line.
. "$(dirname "$0")/common.sh"

ok --help
cp out help
ok help
cmp -s out help || fail 'help and --help differ'
ok --version
cp out version
ok -V
cmp -s out version || fail '-V and --version differ'
grep -qx 'rastertool [0-9]*\.[0-9]*\.[0-9]*' version || fail "the version is: $(cat version)"
RASTER_CPU_LEVEL=scalar "$TOOL" -V | grep -qx 'instruction-set level: scalar' || fail 'no level in -V'

# Every command is listed, and its help fits a terminal and names the exit statuses.
commands=$(sed -n '/^Commands:/,/^$/s/^  \([a-z]*\) .*/\1/p' help)
for command in screenshot watch info convert combine rop blend cursor scale crop compare yuv pack unpack help; do
  echo "$commands" | grep -qx "$command" || fail "--help does not list $command"
done
awk 'length > 80 {exit 1}' help || fail "wider than 80 columns: $(cat help)"
for command in $commands; do
  ok help "$command"
  cp out help
  ok "$command" --help
  cmp -s out help || fail "help $command and $command --help differ"
  awk 'length > 80 {exit 1}' help || fail "$command --help is wider than 80 columns: $(cat help)"
  grep -q 'Exit status: 0' help || fail "$command --help does not tell the exit statuses"
  grep -q -- "$command" out || fail "$command --help does not name it"
  refused 2 '' "$command" --no-such-option
done

refused 2 'subcommand' </dev/null
refused 2 "there is no subcommand 'no-such-command'" no-such-command
refused 2 "there is no subcommand 'convrt'; did you mean 'convert'?" convrt a.png b.png
refused 2 "there is no subcommand 'Scale'; did you mean 'scale'?" Scale
refused 2 "there is no option '--dept'; did you mean '--depth'?" convert a.png b.png --dept 8
refused 2 "there is no option '--tiel'; did you mean '--tile'?" rop a.png b.png --tiel=x
refused 2 "there is no subcommand 'scael'; did you mean 'scale'?" help scael
refused 2 'required' convert only-one.png

makePicture a.png 2 1 0xFF112233 0xFF445566
refused 2 'ends neither in .png nor in .bmp' convert a.png b.jpg
refused 2 'depth' convert a.png b.png --depth 7
refused 2 'compression' convert a.png b.png --compression 10
refused 2 'neither alpha nor compression' convert a.png b.bmp --keep-alpha
refused 2 "'bogus' is not of the form WxH+X+Y" crop a.png b.png bogus
refused 2 "'1x1+0' is not of the form WxH+X+Y" crop a.png b.png 1x1+0
refused 2 "'0x5' is not of the form WxH" scale a.png b.png 0x5
refused 2 'neither of the form WxH' scale a.png b.png -3
for size in x 0% 5%% %; do refused 2 'of the form WxH' scale a.png b.png "$size"; done
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
refused 1 "cannot write 'none/b.png': there is no folder 'none'" convert a.png none/b.png
refused 1 "there is no folder 'text.png'" convert a.png text.png/b.png
refused 1 'does not lie within the picture' crop a.png b.png 2x2+0+0
refused 1 'no side of a scaled picture' scale a.png b.png 40000x1
refused 2 "cannot read 'none.png'" compare a.png none.png
absent b.png b.bmp b.jpg

# What does not get to standard output is a failure.
if [ -e /dev/full ]; then
  for arguments in 'info a.png' --help --version 'help scale' 'rop --help' 'convert a.png -'; do
    # shellcheck disable=SC2086
    "$TOOL" $arguments >/dev/full 2>err
    status=$?
    [ "$status" = 1 ] || fail "$arguments >/dev/full: exit status $status"
    [ "$(grep -c 'cannot write standard output' err)" = 1 ] || fail "$arguments: $(cat err)"
  done
  "$TOOL" compare a.png a.png >/dev/full 2>err
  [ $? = 2 ] || fail 'compare >/dev/full: not 2'
fi

# No progress line and no colours where standard error is no terminal: checked by ok above.
finish
