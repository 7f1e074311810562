# shellcheck shell=sh
# Shared by the tests of the live screen; to be sourced. In the environment: TOOL (rastertool) and VIEWERS,
# the folder of the small client and its relatives.

here=$(cd "$(dirname "$0")" && pwd)
. "$here/../tools/common.sh"

for program in Xvfb xwd xsetroot; do
  have "$program" || { note "skipped: no $program here"; exit 77; }
done

viewer=$VIEWERS/rfbViewer
background=

# start COMMAND...: in the background, output in ./log; its process in $started.
start() {
  "$@" >>log 2>&1 &
  started=$!
  background="$started $background"
}

# isRunning PROCESS: one that has ended and was not waited for yet does not run.
isRunning() { kill -0 "$1" 2>/dev/null && ! grep -qs '^State:.Z' "/proc/$1/status"; }

# stop PROCESS...: ends and waits; what it ended with in $status. Who does not hear is killed after ten
# seconds.
stop() {
  for process in "$@"; do
    kill "$process" 2>/dev/null
    for _ in $(seq 200); do
      isRunning "$process" || break
      sleep 0.05
    done
    kill -9 "$process" 2>/dev/null
    wait "$process" 2>/dev/null
    status=$?
    forget "$process"
  done
}

# forget PROCESS: it has ended, and its number may be somebody else's.
forget() { background=$(echo " $background " | sed "s/ $1 / /"); }

trap 'stop $background; cleanUp' EXIT

# waitFor COMMAND...: until it succeeds, a minute at most.
waitFor() {
  for _ in $(seq 600); do
    "$@" && return
    sleep 0.1
  done
  fail "waited in vain: $*"
}

# startScreen [WxHxDEPTH]: an X server with something on its screen that stands still.
startScreen() {
  startServer "${1:-1024x768x24}"
  xsetroot -mod 7 11 -fg '#1050a0' -bg '#f0c040' -cursor_name left_ptr
  if have xlogo; then start xlogo -geometry 220x220+40+40 -bg '#f4ead0' -fg '#a03020'; fi
  if have xclock; then start xclock -update 86400 -geometry 220x220+40+300 -bg '#e0e8f0' -hd '#204080'; fi
  if have xterm; then
    start xterm -geometry 80x20+300+60 -bg '#101418' -fg '#d0e0d0' +bc -e \
      sh -c 'ls -l /usr/bin | head -60; exec sleep 86400'
  fi
}

# change: something on the whole screen becomes different.
changes=0
change() {
  changes=$((changes + 1))
  xsetroot -mod $((3 + changes % 9)) $((5 + changes % 7)) -fg '#1050a0' -bg '#f0c040'
}

# scrollSlowly: a terminal that prints line by line, and then stands still.
scrollSlowly() {
  rm -f scrolled
  start xterm +j -geometry 90x30+80+40 -bg '#101418' -fg '#d0e0d0' -e sh -c 'ls -l /usr/bin | head -90 |
    while read -r line; do echo "$line"; sleep 0.04; done; echo done >scrolled; exec sleep 86400'
  waitFor [ -s scrolled ]
}

# startServing OPTION...: the live screen of $DISPLAY; $address is where, $serving its process.
startServing() {
  rm -f serve.out serve.err
  "$TOOL" serve --display "$DISPLAY" --stats "$@" >serve.out 2>>serve.err &
  serving=$!
  background="$serving $background"
  for _ in $(seq 300); do
    [ -s serve.out ] && break
    kill -0 "$serving" 2>/dev/null || break
    sleep 0.1
  done
  address=$(sed -n '1s/^listening on //p' serve.out)
  [ -n "$address" ] || { fail "serve $*: $(cat serve.out serve.err)"; finish; }
}

# stopServing: a server that is asked to end does so with 0, and its counters.
stopServing() {
  stop "$serving"
  [ "$status" = 0 ] || fail "serve ended with $status: $(cat serve.err)"
  for line in 'damaged [0-9]* rectangles, [0-9]* pixels' 'compared [0-9]* tiles, [0-9]* equal' \
    'sent [0-9]* pixels, [0-9]* bytes, to [0-9]* viewers'; do
    grep -qx "$line" serve.out || fail "no line '$line' in: $(cat serve.out)"
  done
}

# equal OPTION...: a viewer gets to see exactly what the X server shows.
equal() {
  "$viewer" "$address" --compare "$DISPLAY" "$@" >out 2>&1 || fail "rfbViewer $*: $(cat out)"
  note "$(cat out)"
}

# beginFollowing: from here on viewers follow the screen, until endFollowing closes their pipe. They get
# an end of it that is open already: a viewer that is late must not wait for somebody at the other end.
beginFollowing() {
  mkfifo pipe
  exec 9<>pipe 8<pipe
  rm pipe
  followers=
}

# follow NAME OPTION...: a viewer that has its first picture; output in NAME.viewer.
follow() {
  name=$1
  shift
  "$viewer" "$address" --until-end-of-input "$@" <&8 8<&- 9>&- >"$name.viewer" 2>&1 &
  followers="$followers $!:$name"
  background="$! $background"
}

# A viewer that ends early is told of at the end.
isFollowing() { grep -qs following "$2.viewer" || ! isRunning "$1"; }

# untilAllFollow: waits until every viewer has its first picture.
untilAllFollow() {
  for follower in $followers; do waitFor isFollowing "${follower%%:*}" "${follower#*:}"; done
}

# endFollowing: the viewers compare, if they were told to, and end.
endFollowing() {
  exec 9>&- 8<&-
  for follower in $followers; do
    wait "${follower%%:*}" || fail "the viewer ${follower#*:} ended with $?"
    forget "${follower%%:*}"
    note "$(sed 1d "${follower#*:}.viewer")"
  done
}
