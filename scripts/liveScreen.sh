# Shared by demo and pictures: a live screen with clients that move, and viewers of it. To be sourced
# after screen.sh. Output of the viewers goes to the folder $live.

# Serves the screen with the tool of a preset. Its address is $address, its process $serving.
# usage: startServing PRESET NAME [OPTION...]
startServing() {
  local preset=$1 log=$live/$2
  shift 2
  "$root/build/$preset/bin/rastertool" serve --display "$DISPLAY" --stats "$@" >"$log" 2>&1 &
  serving=$!
  started+=("$serving")
  for _ in $(seq 100); do
    grep -q '^listening' "$log" && break
    kill -0 "$serving" 2>/dev/null || break
    sleep 0.1
  done
  address=$(sed -n 's/^listening on //p' "$log")
  [ -n "$address" ] || die "the live screen does not start: $(cat "$log")"
}

# Ends servers and waits for what they print at the end.
stopServing() {
  kill "$@"
  wait "$@" || true
}

# A viewer without a window that follows $address until endFollowing; its output goes to the file
# $live/NAME.viewer.
# usage: follow NAME [OPTION...]
followers=()
follow() {
  local name=$1
  shift
  "$root/build/x86_64/bin/rfbViewer" "$address" --until-end-of-input "$@" <&8 8<&- 9>&- \
    >"$live/$name.viewer" 2>&1 &
  followers+=($!)  # which end when the pipe does, and with their server
}

# Between these two the followers follow. Their end of the pipe is open from the start, since one that
# is late would wait for somebody at the other end.
beginFollowing() {
  followers=()
  mkfifo "$live/pipe"
  exec 9<>"$live/pipe" 8<"$live/pipe"
  rm "$live/pipe"
}
endFollowing() { exec 9>&- 8<&-; }

# Waits until every follower has its first picture; one that ends early is told of later.
untilAllFollow() {
  local file
  for file in "$live"/*.viewer; do
    for _ in $(seq 100); do
      grep -qs following "$file" && break
      sleep 0.1
    done
  done
}

# A clock that ticks and a terminal that scrolls; they are to be stopped with stopMoving.
moving=()
startMoving() {
  startClient xclock -update 1 -geometry 220x220+40+520 -bg '#e0e8f0' -hd '#204080'
  moving=("${started[-1]}")
  startClient xterm -geometry 84x20+420+430 -bg '#101418' -fg '#e0b060' +bc -e \
    sh -c 'while :; do ls -l /usr/bin | head -400 | while read -r line; do echo "$line"; sleep 0.01; done; done'
  moving+=("${started[-1]}")
}
stopMoving() {
  kill "${moving[@]}"
  wait "${moving[@]}" 2>/dev/null || true
}

# A few seconds of filling, copying and scrolling, which ends by itself.
drawMuch() {
  x11perf -display "$DISPLAY" -repeat 1 -reps 150 -rop GXxor GXcopy -rect100 -copywinwin100 -scroll500 \
    -ellipse100 -ftext >/dev/null 2>&1
}
