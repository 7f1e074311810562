#!/usr/bin/env bash
# Makes three screenshots of X clients on a virtual screen and prints how well and how fast they are
# compressed. usage: bench/screenshots.sh BUILD_FOLDER [OUTPUT_FOLDER]
#
# Needs Xvfb, xterm, xclock, xlogo, xeyes, xsetroot and ImageMagick (convert, display, import).
. "$(dirname "$0")/../scripts/common.sh"
. "$root/scripts/screen.sh"
build=$(cd "$1" && pwd)
out=$(mkdir -p "${2:-$build/screenshots}" && cd "${2:-$build/screenshots}" && pwd)

# Shows a file or a command's output in a terminal: terminal GEOMETRY COMMAND [OPTION...]
terminal() {
  startClient xterm -geometry "$1" "${@:3}" -e sh -c "cd '$root'; $2; sleep 60"
}

# All that is shown goes away afterwards; the server, which was started first, stays.
shoot() {
  sleep 3
  import -window root "$out/$1.png"
  kill "${started[@]:1}" 2>/dev/null || true
  started=("${started[0]}")
  sleep 1
}

startServer 1280x800x24
xsetroot -solid '#336699'
terminal 100x50+20+20 'head -60 lib/raster/rasterops.cpp'
terminal 90x40+500+150 'ls -l /usr/bin | head -80' -fa Monospace -fs 10 -bg black -fg grey90
shoot terminals

terminal 80x24+40+60 'ls --color=always /usr/share/doc | head -200'
startClient xclock -geometry 300x300+700+50
startClient xlogo -geometry 250x250+200+480
startClient xeyes -geometry 300x200+820+420
shoot clients

convert -seed 7 -size 800x600 plasma:steelblue-tan -blur 0x1 -attenuate 0.3 +noise Gaussian \
  "$out/picture.png"
startClient display -geometry +60+60 "$out/picture.png"
terminal 60x20+850+500 'head -20 lib/raster/rasterops.cpp'
shoot picture-viewer

RASTER_SCREENSHOTS="$out/terminals.png $out/clients.png $out/picture-viewer.png" \
  "$build/bin/rasterCompressBench"
