#!/bin/sh
# The tool, its live screen and the examples call none of the functions that trust bytes which may come
# from outside: pictures, blocks and video go through the checked library.
# usage: trustingCalls.sh TREE

set -u
cd "$1" || exit 1
calls='ImageUtil_ReadPNG ImageUtil_ReadPNGBuffer Raster_Decompress Raster_YUVtoRGB'
# Its frame is its own, and what it shows is the message.
own='^examples/host\.c:.*Raster_YUVtoRGB(pixels, pixels + 32,'

callsIn() {
  # shellcheck disable=SC2086  # a pattern for each
  grep -rnE "\\b($(echo $calls | tr ' ' '|')) *\(" --include='*.c' --include='*.cpp' --include='*.h' \
    --include='*.hpp' --include='*.py' "$@"
}

for call in $calls; do
  grep -qw "$call" lib/raster/raster.h lib/image/imageUtil.h || { echo "no function $call"; exit 1; }
done
callsIn lib/checked | grep -q Raster_Decompress || { echo 'calls are not found where they are'; exit 1; }
found=$(callsIn tools examples | grep -v "$own")
[ -z "$found" ] && exit 0
echo "functions that trust their bytes:"
echo "$found"
exit 1
