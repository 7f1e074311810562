#!/bin/sh
# Pictures, frames and blocks through pipes: - and /dev/stdin, /dev/stdout, named pipes, <(...).
. "$(dirname "$0")/common.sh"

gradient a.png 60 40
ok pack a.png a.rblk

# Every command that reads a picture reads it from a pipe as well, and writes one to a pipe.
# through ARGUMENT...: the tool with a.png on standard input and out.png on standard output.
through() {
  cat a.png | "$TOOL" "$@" >out.png 2>err || fail "rastertool $*: $(cat err)"
  [ ! -s err ] || fail "rastertool $*: standard error: $(cat err)"
}
through convert - -
ok compare a.png out.png
through convert /dev/stdin /dev/stdout
ok compare a.png out.png
through convert - - --format bmp
[ "$(head -c 2 out.png)" = BM ] || fail '--format bmp on standard output is no BMP'
through scale - - 60x
ok compare a.png out.png
through crop - - 60x40
ok compare a.png out.png
through combine - -@0,0
ok compare a.png out.png
through rop - - --op noop --source a.png
ok compare a.png out.png
through rop a.png - --op noop --source -
ok compare a.png out.png
through blend - a.png - --op destination
ok compare a.png out.png
through cursor - - --image a.png --at 0,0
ok compare a.png out.png
cat a.png | "$TOOL" pack - - | cmp - a.rblk || fail 'a block through pipes differs'
cat a.rblk | "$TOOL" unpack - out.png || fail 'a block out of a pipe'
ok compare a.png out.png

# Words about a picture from standard input.
cat a.png | "$TOOL" info - >out || fail 'info of standard input'
says 'standard input: PNG, 60x40 pixels, RGB, 8 bits per sample'
cat a.png | "$TOOL" compare - a.png >out || fail 'compare with standard input'
says '0 of 2400 pixels differ'
"$TOOL" info - <a.rblk >out || fail 'info of a block on standard input'

# What stands behind a redirection is read from where it is.
{ head -c 5 >/dev/null; "$TOOL" info - >out 2>err; } <a.png && fail 'a PNG without its first bytes'
grep -q 'standard input is not a PNG' err || fail "a PNG without its first bytes: $(cat err)"

# What is no picture is refused at its first bytes, not read to its end.
refused 1 'is not a PNG picture' convert /dev/zero no.png
refused 1 'cannot read' convert . no.png
: | "$TOOL" convert - no.png 2>err && fail 'nothing is a picture'
grep -q 'standard input is not a PNG picture' err || fail "nothing at all: $(cat err)"
head -c 400 a.png | "$TOOL" convert - no.png 2>err && fail 'half a picture is a picture'
grep -q 'cut off' err || fail "half a picture: $(cat err)"
absent no.png

# Pipes with names: one whose writer comes late, one that nobody writes to, one that is written to.
if have mkfifo; then
  mkfifo pipe
  { sleep 1; cat a.png >pipe; } &
  ok info pipe
  wait $!
  { exec 3>pipe; sleep 4; cat a.png >&3; } &
  ok info pipe
  wait $!
  refused 1 'nobody writes to this pipe' info pipe
  cat pipe >out.png &
  ok convert a.png pipe --format png
  wait $!
  ok compare a.png out.png
fi
if have bash; then
  # shellcheck disable=SC2016
  bash -c '"$TOOL" info <(cat a.png)' >out 2>err || fail "<(...): $(cat err)"
  grep -q 'PNG, 60x40 pixels' out || fail "<(...): $(cat out)"
fi

# Writing to somebody who has heard enough is no crash.
"$TOOL" convert a.png - --compression 0 2>err | head -c 10 >/dev/null
[ ! -s err ] || fail "a reader that goes: $(cat err)"
"$TOOL" convert a.png - 2>err >&- && fail 'no standard output is nothing wrong'
grep -q 'cannot write standard output' err || fail "no standard output: $(cat err)"

# Other programs at the other end.
if have pngtopnm && have pnmtopng; then
  pngtopnm a.png | pnmtopng 2>/dev/null | "$TOOL" convert - - | pngtopnm >piped.ppm
  pngtopnm a.png | cmp - piped.ppm || fail 'netpbm on both sides sees another picture'
else
  note 'not checked: no netpbm here'
fi
if have ffmpeg; then
  ffmpeg() { command ffmpeg -nostdin -loglevel error "$@"; }
  # close FILE FILE: video arithmetic differs by little.
  close() {
    "$TOOL" compare "$1" "$2" >out
    by=$(sed -n 's/.* by up to \([0-9]*\),.*/\1/p' out)
    [ "${by:-0}" -le 3 ] || fail "$1 and $2: $(cat out)"
  }
  video() { ffmpeg -f lavfi -i testsrc=size=64x48:rate=5:duration=1 "$@"; }
  for pair in yuv420p:I420 yuyv422:YUY2 yvyu422:YVYU uyvy422:UYVY; do
    pixels=${pair%:*}
    video -pix_fmt "$pixels" -f rawvideo - | "$TOOL" yuv - "ours-${pair#*:}.png" \
      --format "${pair#*:}" --size 64x48 --all || fail "frames of $pixels from ffmpeg"
    video -pix_fmt "$pixels" -f rawvideo - | ffmpeg -f rawvideo -pixel_format "$pixels" \
      -video_size 64x48 -i - -sws_flags neighbor+accurate_rnd+full_chroma_int -start_number 0 -y \
      "theirs-%04d.png"
    close "ours-${pair#*:}-0000.png" theirs-0000.png
    close "ours-${pair#*:}-0004.png" theirs-0004.png
  done
  video -pix_fmt yuv420p -f yuv4mpegpipe - | "$TOOL" yuv - y4m.png --frame 4 || fail '.y4m from ffmpeg'
  ok compare y4m.png ours-I420-0004.png
  video -pix_fmt yuv420p -f rawvideo - | "$TOOL" yuv - - --format I420 --size 64x48 --all |
    ffmpeg -f image2pipe -c:v png -i - -pix_fmt bgr0 -f rawvideo back.raw || fail 'pictures to ffmpeg'
  [ "$(wc -c <back.raw)" = $((5 * 64 * 48 * 4)) ] || fail "ffmpeg took $(wc -c <back.raw) bytes of pictures"
else
  note 'not checked: no ffmpeg here'
fi
finish
