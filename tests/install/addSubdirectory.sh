#!/bin/sh
# The project works inside another one, which gets two libraries and nothing else.
. "$(dirname "$0")/common.sh"
libraries=$PNG_FOLDER
buildProject "$here/subproject" -DRASTER_SOURCE="$SOURCE" -G Ninja
run "$work/build/consumerC"
