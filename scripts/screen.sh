# Shared by demo and pictures: an X screen with something on it. To be sourced after common.sh.
# Whatever is started here is stopped when the script ends.

started=()

# A number that the system has given to somebody else since then is nobody's child here.
isChild() { grep -qx "PPid:[[:space:]]*$$" "/proc/$1/status" 2>/dev/null; }

stopStarted() {
  local process
  for ((process = ${#started[@]} - 1; process >= 0; --process)); do
    isChild "${started[process]}" || continue
    kill "${started[process]}" 2>/dev/null || continue
    wait "${started[process]}" 2>/dev/null || true
  done
}
trap stopStarted EXIT
trap 'exit 1' HUP INT TERM

# startClient PROGRAM [ARGUMENT...]
startClient() {
  "$@" >/dev/null 2>&1 9>&- &
  started+=($!)
}

# Starts an X server of the given size and depth (WxHxDEPTH) and sets DISPLAY.
startServer() {
  local number
  number=$(mktemp)
  Xvfb -displayfd 3 -screen 0 "$1" -nolisten tcp -noreset 3>"$number" >/dev/null 2>&1 &
  started+=($!)
  for _ in $(seq 100); do
    [ -s "$number" ] && break
    sleep 0.1
  done
  [ -s "$number" ] || die "Xvfb does not start"
  DISPLAY=:$(cat "$number")
  export DISPLAY
  rm -f "$number"
}

# Three clients whose windows stand still; the terminal runs $1 (a rastertool). The pointer is in the
# middle of the screen.
startClients() {
  xsetroot -solid '#2f4f6f' -cursor_name left_ptr
  startClient xlogo -geometry 220x220+40+40 -bg '#f4ead0' -fg '#a03020'
  startClient xclock -analog -update 86400 -geometry 220x220+40+300 -bg '#e0e8f0' -hd '#204080'
  startClient xterm -geometry 80x24+300+60 -bg '#101418' -fg '#d0e0d0' +bc -e \
    sh -c '"$0" --help; exec sleep 86400' "$1"
  xsetroot -cursor_name left_ptr
}

# Waits until the screen has looked the same for a while, with $1 (a rastertool).
waitForStillScreen() {
  local quiet=0
  for _ in $(seq 60); do
    if "$1" watch --interval 0.3 | grep -q 'no change'; then quiet=$((quiet + 1)); else quiet=0; fi
    [ "$quiet" -ge 4 ] && return
  done
  say "the screen does not stand still; the pictures may differ"
}
