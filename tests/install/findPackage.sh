#!/bin/sh
# The installed tree serves a C and a C++ program through find_package(raster).
. "$(dirname "$0")/common.sh"
installHere
buildProject "$here/package" ${libraries:+-Draster_DIR="$libraries/cmake/raster"}
run "$work/build/consumerC"
run "$work/build/consumerCpp"
run "$work/build/consumerChecked"
