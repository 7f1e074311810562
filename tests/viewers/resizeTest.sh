#!/bin/sh
# The X screen changes its size: viewers that know of such things follow, and the others see what there
# is left of it.
. "$(dirname "$0")/common.sh"
[ -n "${RASTER_TEST_FULL:-}" ] || { note 'skipped: only with RASTER_TEST_FULL'; exit 77; }
have xrandr || { note 'skipped: no xrandr here'; exit 77; }

startScreen
xrandr --newmode small 0 801 0 0 0 599 0 0 0 2>err && xrandr --addmode screen small 2>>err &&
  xrandr --output screen --mode small 2>>err ||
  { note "skipped: this X server does not change its size: $(cat err)"; exit 77; }
xrandr --output screen --mode 1024x768

# toSize MODE: the screen changes while viewers are connected, who then show the whole new screen.
toSize() {
  rm -f pipe
  mkfifo pipe
  followers=
  for options in '--encoding raw' '--encoding zrle --format 16' '--encoding tightpng' \
    '--encoding copyrect,zrle --cursor alpha' '--format 32,8,big-endian-16,32'; do
    # shellcheck disable=SC2086
    "$viewer" "$address" --compare "$DISPLAY" --until-end-of-input $options <pipe >>viewers 2>&1 &
    followers="$followers $!"
  done
  background="$followers $background"
  exec 9>pipe
  sleep 0.5
  xrandr --output screen --mode "$1"
  exec 9>&-
  for follower in $followers; do
    wait "$follower" || fail "a viewer of the screen in $1 ended with $?: $(cat viewers)"
  done
  equal
}

startServing --listen 127.0.0.1:0
for mode in small 1024x768 small 1024x768; do toSize $mode; done
note "$(cat viewers)"
grep -q ' of 479799 pixels' viewers || fail "nobody saw the small screen: $(cat viewers)"

stopServing
[ ! -s serve.err ] || fail "serve said: $(cat serve.err)"

# Viewers that cannot be told of the new size are let go, with one line; the others stay.
startServing --listen 127.0.0.1:0
rm -f pipe
mkfifo pipe
"$viewer" "$address" --no-resize --until-end-of-input <pipe >unaware 2>&1 &
unaware=$!
"$viewer" "$address" --compare "$DISPLAY" --until-end-of-input <pipe >aware 2>&1 &
aware=$!
background="$aware $unaware $background"
exec 9>pipe
sleep 0.5
xrandr --output screen --mode small
wait $unaware
grep -q 'closed the connection' unaware || fail "a viewer that does not know of sizes: $(cat unaware)"
exec 9>&-
wait $aware || fail "a viewer that knows of sizes: $(cat aware)"
stopServing
[ "$(wc -l <serve.err)" = 1 ] || fail "serve said: $(cat serve.err)"
note "$(cat serve.err)"
finish
