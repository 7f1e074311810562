#!/bin/sh
# How the live screen begins and ends, and what it does while nobody looks.
. "$(dirname "$0")/common.sh"

startScreen

# A UNIX socket is only its owner's, and is removed.
startServing --socket "$work/screen"
[ "$address" = "$work/screen" ] || fail "it listens on $address"
[ "$(stat -c %a screen)" = 600 ] || fail "the socket has the mode $(stat -c %a screen)"
equal --encoding zrle
stopServing
[ ! -e screen ] || fail 'the socket was left behind'
startServing --socket "$work/screen"
kill -INT "$serving"
wait "$serving"
[ $? = 0 ] || fail 'SIGINT: not 0'
[ ! -e screen ] || fail 'SIGINT: the socket was left behind'
# A file that is no socket stays as it is; so does a socket on which somebody listens.
echo precious >file
refused 1 file serve --display "$DISPLAY" --socket file
[ "$(cat file)" = precious ] || fail 'a file was overwritten'
startServing --socket "$work/screen"
refused 1 screen serve --display "$DISPLAY" --socket screen
equal
# The socket that a killed server left behind does not keep the next one away.
kill -9 "$serving"
wait "$serving" 2>/dev/null
[ -S screen ] || fail 'there is no socket to be replaced'
startServing --socket "$work/screen"
equal
stopServing

# Only where nobody else is.
refused 2 --anyone serve --display "$DISPLAY" --listen 0.0.0.0:0
refused 2 "'127.0.0.1'" serve --display "$DISPLAY" --listen 127.0.0.1
startServing --listen 0.0.0.0:0 --anyone
stopServing
refused 1 ':987' serve --display :987 --listen 127.0.0.1:0

# Without viewers nothing wakes it, however much happens on the screen.
wakes() { awk '/ctxt_switches/ {sum += $2} END {print sum}' "/proc/$serving/status"; }
busy() {
  for i in 1 2 3 4 5 6 7 8 9; do
    xsetroot -mod $((i + 2)) $((i + 5)) -fg '#1050a0' -bg '#f0c040'
    xsetroot -solid "#${i}04060"
  done
}
startServing --listen 127.0.0.1:0
for visit in before after; do
  sleep 0.5
  before=$(wakes)
  busy
  after=$(wakes)
  [ $((after - before)) -le 5 ] ||
    fail "without viewers it woke $((after - before)) times $visit somebody looked"
  equal
done
sleep 0.5

# An X server that is gone: one line, and 1; the viewers are let go.
"$viewer" "$address" --until-end-of-input </dev/zero >viewer.out 2>&1 &
watching=$!
sleep 0.5
stopServer
wait "$serving"
[ $? = 1 ] || fail "without X server: not 1"
[ "$(wc -l <serve.err)" = 1 ] || fail "without X server: $(cat serve.err)"
note "$(cat serve.err)"
wait $watching
grep -q 'closed the connection' viewer.out || fail "the viewer said: $(cat viewer.out)"
startScreen
startServing --socket "$work/screen"
stopServer
wait "$serving"
[ $? = 1 ] || fail "without X server and viewers: not 1"
[ ! -e screen ] || fail 'the socket was left behind without X server'
finish
