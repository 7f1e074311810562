#!/bin/sh
# The screen in viewers that people use: their pictures and windows, pixel for pixel.
. "$(dirname "$0")/common.sh"

differences=$VIEWERS/screenDifferences

# sees NAME COMMAND...: the command finds no difference before long.
sees() {
  what=$1
  shift
  for _ in $(seq 100); do
    "$@" >out 2>&1 && break
    sleep 0.2
  done
  case $(tail -n 1 out) in
    '0 of '*) note "$what: $(cat out)" ;;
    *) fail "$what: $(cat out)" ;;
  esac
}

# window NAME OPTIONS COMMAND...: a viewer in a window on the other screen; OPTIONS are for the comparison.
window() {
  name=$1
  options=$2
  shift 2
  DISPLAY=$other start "$@"
  # shellcheck disable=SC2086
  sees "$name" "$differences" "$DISPLAY" "$other" --at 20,30 $options
  change
  # shellcheck disable=SC2086
  sees "$name, after a change" "$differences" "$DISPLAY" "$other" --at 20,30 $options
  if have xterm; then
    scrolling=$started
    scrollSlowly
    # shellcheck disable=SC2086
    sees "$name, after scrolling" "$differences" "$DISPLAY" "$other" --at 20,30 $options
    stop "$started"
    started=$scrolling
  fi
  stop "$started"
}

startScreen 800x600x24
startServing --listen 127.0.0.1:0
port=${address##*:}

if have gvnccapture; then
  # Its displays are counted from port 5900; GTK wants a screen, though it shows nothing.
  captured() {
    gvnccapture -q "127.0.0.1:$((port - 5900))" capture.png && "$differences" "$DISPLAY" capture.png --pointer
  }
  sees gvnccapture captured
else
  note 'left out: no gvnccapture here'
fi

# A second X server, on which the viewers have their windows.
screen=$DISPLAY
background="$xserver $background"
xserver=
startServer 1000x800x24
other=$DISPLAY
DISPLAY=$screen

if have xtigervncviewer; then
  for encoding in Raw ZRLE; do
    window "xtigervncviewer, $encoding" '' xtigervncviewer -geometry +20+30 -AutoSelect=0 \
      -FullColor=1 -PreferredEncoding $encoding -RemoteResize=0 "127.0.0.1::$port"
  done
  for level in '0 1-1-1' '1 6' '2 3-3-2'; do
    window "xtigervncviewer, colour level $level" "--format ${level#* }" xtigervncviewer \
      -geometry +20+30 -AutoSelect=0 -FullColor=0 "-LowColorLevel=${level% *}" -PreferredEncoding ZRLE \
      -RemoteResize=0 "127.0.0.1::$port"
  done
else
  note 'left out: no xtigervncviewer here'
fi

if have xtightvncviewer; then
  window 'xtightvncviewer' --pointer xtightvncviewer -geometry +20+30 -encodings raw \
    -nocursorshape "127.0.0.1::$port"
  window 'xtightvncviewer, eight bits' '--pointer --format 8' xtightvncviewer -geometry +20+30 -bgr233 \
    -encodings raw -nocursorshape "127.0.0.1::$port"
else
  note 'left out: no xtightvncviewer here'
fi
stopServing
note "$(grep '^moved' serve.out)"
if have xterm && have xtigervncviewer; then
  grep -q '^moved [1-9]' serve.out || fail "nothing was moved: $(cat serve.out)"
fi
[ ! -s serve.err ] || fail "serve said: $(cat serve.err)"
finish
