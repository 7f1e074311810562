#!/bin/sh
# The project works inside another one, which gets two libraries and nothing else.
. "$(dirname "$0")/common.sh"
libraries=$PNG_FOLDER
# Portable code without optimisation is enough to see that, and compiles in seconds.
buildProject "$here/subproject" -DRASTER_SOURCE="$SOURCE" -G Ninja \
  -DCMAKE_CXX_FLAGS="-DHWY_COMPILE_ONLY_SCALAR${TOOLCHAIN:+ -m32}"
run "$work/build/consumerC"
