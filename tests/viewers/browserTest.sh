#!/bin/sh
# The screen in a real browser: noVNC in Chromium without a window, its canvas read back.
. "$(dirname "$0")/common.sh"
[ -n "${RASTER_TEST_FULL:-}" ] || { note 'skipped: only with RASTER_TEST_FULL'; exit 77; }
for program in chromium chromedriver websockify; do
  have $program || { note "skipped: no $program here"; exit 77; }
done
[ -d /usr/share/novnc ] || { note 'skipped: no noVNC here'; exit 77; }
/usr/bin/python3 -c 'import selenium' 2>/dev/null || { note 'skipped: no selenium for Python here'; exit 77; }

startScreen
startServing --socket "$work/screen"
/usr/bin/python3 "$here/browser/webGate.py" "$address" >url &
background="$! $background"
waitFor [ -s url ]

# Once as it is, and once more for every change that follows.
mkfifo changes
/usr/bin/python3 "$here/browser/canvas.py" "$(cat url)" canvas.png \
  "$VIEWERS/screenDifferences" "$DISPLAY" canvas.png <changes >seen 2>browser.log &
looking=$!
background="$looking $background"
exec 9>changes
for count in 1 2 3; do
  waitFor eval "[ \$(wc -l <seen) -ge $count ] || ! kill -0 $looking 2>/dev/null"
  xsetroot -mod $((count + 2)) 7 -fg '#1050a0' -bg '#f0c040'
  echo once more >&9
done
exec 9>&-
wait $looking || fail "the browser's canvas: $(cat seen browser.log)"
note "$(cat seen)"
[ "$(grep -c '^0 of 786432 pixels differ$' seen)" = 4 ] || fail "not four times equal: $(cat seen)"
stopServing
grep -qE 'sent [1-9]' serve.out || fail "nothing was sent: $(cat serve.out)"
finish
