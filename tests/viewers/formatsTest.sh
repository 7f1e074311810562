#!/bin/sh
# A screen that stands still, in every pixel format and encoding, and in every version of the protocol;
# then screens of other depths.
. "$(dirname "$0")/common.sh"

formats='32 red-lowest-32 big-endian-32 24 16 big-endian-16 15 8 6 1-1-1 high-32 3 3-3-2'

# everyFormat ENCODING FORMATS: a viewer for each of them, at once.
everyFormat() {
  beginFollowing
  for format in $2; do
    follow "$format" --compare "$DISPLAY" --encoding "$1" --format "$format"
  done
  endFollowing
}

startScreen
startServing --listen 127.0.0.1:0
for version in 3.3 3.7 3.8; do equal --version $version; done
for encoding in raw zrle tightpng copyrect,zrle; do everyFormat $encoding "$formats"; done
stopServing
[ ! -s serve.err ] || fail "serve said: $(cat serve.err)"

for depth in 8 15 16; do
  startScreen 201x123x$depth
  startServing --listen 127.0.0.1:0
  for encoding in raw zrle; do everyFormat $encoding '32 big-endian-32 16 15 8 6 1-1-1'; done
  xsetroot -solid '#2a7f62'  # with 8 bits, a colour that the palette has not had
  equal
  stopServing
done

# One that shows one picture and ends.
startServing --listen 127.0.0.1:0 --once
equal --encoding zrle
wait "$serving" || fail "--once ended with $?: $(cat serve.err)"
grep -q '^sent .* to 1 viewers$' serve.out || fail "--once: $(cat serve.out serve.err)"
finish
