# shellcheck shell=sh
# Shared by the tests of rastertool; to be sourced. In the environment: TOOL, the program.

set -u
work=$(mktemp -d)
xserver=
cd "$work" || exit 1
failures=0

cleanUp() {
  [ -z "$xserver" ] || kill "$xserver" 2>/dev/null
  rm -rf "$work"
}
trap cleanUp EXIT
trap 'exit 1' HUP INT TERM

have() { command -v "$1" >/dev/null 2>&1; }
note() { echo "$*" >&2; }
fail() {
  note "FAILED: $*"
  failures=$((failures + 1))
}
finish() { [ "$failures" = 0 ] && exit 0 || exit 1; }

# expect STATUS ARGUMENT...: runs the tool, its output in ./out and ./err.
expect() {
  wanted=$1
  shift
  "$TOOL" "$@" >out 2>err
  status=$?
  [ "$status" = "$wanted" ] || fail "rastertool $*: exit status $status, not $wanted: $(cat out err)"
}

# ok ARGUMENT...: succeeds and prints nothing on standard error.
ok() {
  expect 0 "$@"
  [ ! -s err ] || fail "rastertool $*: standard error: $(cat err)"
}

# refused STATUS TEXT ARGUMENT...: ends with the status and one line with the text, no output.
refused() {
  wanted=$1
  text=$2
  shift 2
  expect "$wanted" "$@"
  lines=$(grep -vc '^Run with --help' err)
  [ "$lines" = 1 ] || fail "rastertool $*: $lines lines on standard error: $(cat err)"
  grep -qF -- "$text" err || fail "rastertool $*: no '$text' in: $(cat err)"
  [ ! -s out ] || fail "rastertool $*: standard output: $(cat out)"
}

# What a refused command must not leave behind.
absent() {
  for file in "$@"; do
    [ ! -e "$file" ] || fail "$file was left behind"
  done
  for file in *.part*; do
    [ ! -e "$file" ] || fail "the temporary file $file was left behind"
  done
}

says() { grep -qxF -- "$1" out || fail "no line '$1' in: $(cat out)"; }

# words NUMBER...: 32-bit words, low byte first, on standard output.
words() {
  for word in "$@"; do
    # shellcheck disable=SC2059
    printf "$(printf '\\%03o\\%03o\\%03o\\%03o' $((word & 255)) $((word >> 8 & 255)) \
      $((word >> 16 & 255)) $((word >> 24 & 255)))"
  done
}

# makePicture FILE WIDTH HEIGHT 0xAARRGGBB...: a PNG of these pixels, with their alpha.
makePicture() {
  file=$1 width=$2 height=$3
  shift 3
  { words "$width" "$height" $((4 * width)) 32 0; words "$@"; } >picture.rblk
  ok unpack picture.rblk "$file" --keep-alpha
}

# samePixels FILE 0xRRGGBB...: a picture (24 bits) has these pixels, row by row.
samePixels() {
  file=$1
  shift
  "$TOOL" pack "$file" picture.rblk --depth 24 || fail "cannot pack $file"
  width=$(od -An -tu4 -N4 picture.rblk | tr -d ' ')
  pitch=$(od -An -tu4 -j8 -N4 picture.rblk | tr -d ' ')
  got=$(od -An -v -tu1 -j20 -w"$pitch" picture.rblk |
    awk -v width="$width" '{for (i = 0; i < width; ++i) printf "0x%02X%02X%02X ", $(3*i+3), $(3*i+2), $(3*i+1)}')
  [ "$got" = "$* " ] || fail "$file has the pixels $got, not $*"
}

# gradient FILE WIDTH HEIGHT: a picture in which no two neighbours are equal.
gradient() {
  awk -v w="$2" -v h="$3" 'BEGIN {
    for (y = 0; y < h; ++y) for (x = 0; x < w; ++x)
      print (x * 255 / w) % 256 * 65536 + (y * 255 / h) % 256 * 256 + (x * 7 + y * 13) % 256
  }' | awk '{printf "\\%03o\\%03o\\%03o\\377", int($1) % 256, int($1 / 256) % 256, int($1 / 65536) % 256}' >octal
  # shellcheck disable=SC2059
  { words "$2" "$3" $((4 * $2)) 32 0; printf "$(cat octal)"; } >picture.rblk
  ok unpack picture.rblk "$1"
}

# startServer SCREEN-ARGUMENTS: starts Xvfb with WxHxDEPTH and sets DISPLAY; stops an earlier one.
startServer() {
  stopServer
  rm -f display
  Xvfb -displayfd 3 -screen 0 "$1" -nolisten tcp -noreset 3>display >server.log 2>&1 &
  xserver=$!
  for _ in $(seq 100); do
    [ -s display ] && break
    kill -0 "$xserver" 2>/dev/null || break
    sleep 0.1
  done
  [ -s display ] || {
    note "skipped: Xvfb does not start: $(cat server.log)"
    xserver=
    exit 77
  }
  DISPLAY=:$(cat display)
  export DISPLAY
}

stopServer() {
  [ -n "$xserver" ] || return 0
  kill "$xserver"
  wait "$xserver" 2>/dev/null
  xserver=
}
