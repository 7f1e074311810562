#!/bin/sh
# Every command that reads and writes files, while single calls of the system fail or memory is short: one
# line and the exit status of a failure, or the same result as ever; an old file as it was or whole.
# In the environment: FAULT_SHIM, the library that makes calls fail.
here=$(cd "$(dirname "$0")" && pwd)
. "$here/../tools/common.sh"
. "$here/eachCall.sh"

makePicture small.png 2 2 0xFF112233 0xFF445566 0xFF778899 0xFFAABBCC
makePicture alpha.png 2 2 0x80112233 0xFF445566 0x00000000 0xFFAABBCC
makePicture other.png 1 1 0xFF000000
cp "$here/../data/clients.png" large.png
rm -f picture.rblk out err
ok pack small.png small.rblk
printf '\020\200\360\200' >frame.yuv

# What is run, with the file that it writes, if any, as "made.png".
set -- 'pack ../small.png made.png' 'unpack ../small.rblk made.png' 'convert ../small.png made.png' \
  'scale ../small.png made.png 5x5' 'crop ../small.png made.png 1x1+0+0' \
  'combine made.png ../small.png@0,0 ../small.png@2,0' 'blend ../small.png ../alpha.png made.png' \
  'rop ../small.png made.png --op xor --color 00FF00' 'cursor ../small.png made.png --image ../alpha.png' \
  'compare ../small.png ../small.png' 'yuv ../frame.yuv made.png --format YUY2 --size 2x1' \
  'info ../small.png' 'info ../small.rblk'

# run COMMAND [SETTING...]: in the folder, which has an old file.
run() {
  command=$1
  shift
  rm -rf folder seen
  mkdir folder
  cp other.png folder/made.png
  # shellcheck disable=SC2086  # words
  (cd folder && env "$@" "$TOOL" $command >../out 2>../err)
  status=$?
}

# A command that ended as it did must have left this.
judge() {
  case $status in
    0) cmp -s folder/made.png wanted || fail "$1: success without the file"
       cmp -s out wantedOut || fail "$1: success without its output: $(cat out)" ;;
    *) [ "$status" -le 2 ] || fail "$1: exit status $status"
       [ "$(wc -l <err)" = 1 ] || fail "$1: standard error: $(cat err)"
       cmp -s folder/made.png other.png || fail "$1: the old file has changed" ;;
  esac
  [ "$(find folder -mindepth 1 ! -name made.png | wc -l)" = 0 ] || fail "$1: left $(ls -A folder)"
}

# once CALL WHAT NUMBER: false when there is no such call.
once() {
  run "$command" LD_PRELOAD="$FAULT_SHIM" FAULT="$1:$3:$2" FAULT_SEEN=../seen
  [ -e seen ] || return 1
  judge "$command, $1:$3:$2"
}

for command in "$@"; do
  run "$command" LD_PRELOAD="$FAULT_SHIM" FAULT=none:1:5
  [ "$status" = 0 ] || { fail "$command: $(cat err)"; continue; }
  cp folder/made.png wanted
  cp out wantedOut
  for call in open read write close; do
    for what in 5 28; do
      eachCall once "$call" "$what"
    done
  done
done

# The address space in steps, from where the program starts.
starts() { (ulimit -v "$1" && "$TOOL" --version >/dev/null 2>&1); }
least=8000
while [ "$least" -lt 100000 ] && ! starts "$least"; do least=$((least + 100)); done
starts "$least" || note 'not checked: a small address space, which this program cannot do with'
for command in 'convert ../large.png made.png' 'pack ../large.png made.png' \
  'scale ../large.png made.png 700x500' 'blend ../large.png ../large.png made.png'; do
  run "$command" A=1
  cp folder/made.png wanted
  cp out wantedOut
  for more in $(seq 0 250 6000); do
    starts $((least + more)) || continue
    (ulimit -v $((least + more)) && run "$command" A=1 && judge "$command, $((least + more)) KB" &&
      echo "$status" >>statuses && finish) || failures=$((failures + 1))
    tried=$((tried + 1))
  done
done
! starts "$least" || grep -q 1 statuses || fail 'there was always enough memory'
[ "$tried" -gt 100 ] || fail "only $tried faults"
note "$tried faults"
finish
