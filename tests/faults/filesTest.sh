#!/bin/sh
# Reading and writing of files while single calls of the system fail: one line and exit status 1, the
# old file as it was, and nothing new in the folder; or, where the call can be done without, success.
# In the environment: FAULT_SHIM, the library that makes them fail.
here=$(cd "$(dirname "$0")" && pwd)
. "$here/../tools/common.sh"
. "$here/eachCall.sh"

makePicture small.png 2 2 0xFF112233 0xFF445566 0xFF778899 0xFFAABBCC
makePicture other.png 1 1 0xFF000000
rm -f picture.rblk
ok convert small.png wanted.png
mkdir folder
cat "$TOOL" >/dev/null

shimmed() {
  # The errors of the shell and of the sanitizers' own loading are not of interest.
  env LD_PRELOAD="$FAULT_SHIM" FAULT="$1" FAULT_SEEN=../seen $2 "$TOOL" convert ../small.png out.png \
    >../out 2>../err
}
(cd folder && shimmed none:1:5 A=1) || { note "skipped: nothing can be preloaded: $(cat err)"; exit 77; }

# once CALL WHAT OLD SETTING NUMBER: false when there is no such call.
once() {
  rm -rf seen folder
  mkdir folder
  [ "$3" = none ] || cp other.png folder/out.png
  (cd folder && shimmed "$1:$5:$2" "$4" 2>/dev/null)
  status=$?
  [ -e seen ] || return 1
  shown="$1:$5:$2, old file: $3, $4"
  [ "$(find folder -mindepth 1 ! -name out.png | wc -l)" = 0 ] || fail "$shown: left $(ls -A folder)"
  if [ "$status" = 0 ]; then
    cmp -s folder/out.png wanted.png || fail "$shown: success without the file"
    [ ! -s err ] || fail "$shown: $(cat err)"
    return 0
  fi
  case $2 in
    -*)
      [ "$status" -gt 128 ] || fail "$shown: exit status $status"
      cmp -s folder/out.png wanted.png && return 0 # it came when the file was there
      ;;
    *)
      [ "$status" = 1 ] || fail "$shown: exit status $status"
      [ "$(wc -l <err)" = 1 ] || fail "$shown: $(cat err)"
      ;;
  esac
  if [ "$3" = none ]; then
    [ ! -e folder/out.png ] || fail "$shown: a file in spite of the failure"
  else
    cmp -s folder/out.png other.png || fail "$shown: the old file has changed"
  fi
}

# EINTR, EIO, EACCES, ENOSPC, half the work; HUP, INT, TERM.
for setting in A=1 NO_TMPFILE=1; do
  for old in none some; do
    for call in open read write close fsync fchmod linkat rename; do
      for what in 4 5 13 28 short -1 -2 -15; do
        [ "$call:$what" != rename:4 ] && [ "$call:$what" != linkat:4 ] || continue # never interrupted
        eachCall once "$call" "$what" "$old" "$setting"
      done
    done
  done
done
[ "$tried" -gt 100 ] || fail "only $tried faults"
note "$tried faults"
finish
