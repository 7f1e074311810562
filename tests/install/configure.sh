#!/bin/sh
# What the project makes of where it is and of what is asked for, before anything is compiled.
. "$(dirname "$0")/common.sh"

# configured FOLDER ARGUMENT...: configures it anew; what was said is in ./log.
configured() {
  folder=$1
  shift
  rm -rf "$work/build"
  "$CMAKE" -G Ninja -S "$folder" -B "$work/build" ${TOOLCHAIN:+-DCMAKE_TOOLCHAIN_FILE="$TOOLCHAIN"} \
    -DCMAKE_EXPORT_COMPILE_COMMANDS=ON "$@" >"$work/log" 2>&1 || { cat "$work/log"; exit 1; }
}
# optimised yes|no: the last optimisation that the library's vector code is compiled with.
optimised() {
  command=$(grep '"command".*/rasterops\.cpp' "$work/build/compile_commands.json")
  case $(echo "$command" | grep -o -e ' -O[0-9s]' | tail -n 1) in ' -O3') is=yes ;; *) is=no ;; esac
  [ "$is" = "$1" ] || { echo "optimised: $is, not $1: $command"; exit 1; }
}

# Whatever a parent or a distribution calls its configuration, and where it has no name.
for type in '' None Release MinSizeRel; do
  configured "$here/subproject" -DRASTER_SOURCE="$SOURCE" -DCMAKE_BUILD_TYPE=$type
  optimised yes
done
configured "$here/subproject" -DRASTER_SOURCE="$SOURCE" -DCMAKE_BUILD_TYPE=Debug
optimised no

# A parent's installation has nothing of this project, unless it asks for that.
installs() { grep -rl 'raster\.h' "$work/build" --include=cmake_install.cmake; }
! installs || { echo 'a parent installs it without having asked'; exit 1; }
configured "$here/subproject" -DRASTER_SOURCE="$SOURCE" -DRASTER_INSTALL=ON
installs >/dev/null || { echo 'a parent that asks for it does not install it'; exit 1; }

# Parts whose needs are missing are left out with a line that names the package.
says() { grep -qxF -- "-- $1" "$work/log" || { cat "$work/log"; echo "it does not say: $1"; exit 1; }; }
configured "$SOURCE" -DRASTER_HAS_CLI_CLI_hpp= -DRASTER_HAS_xcb_damage_h= -DRASTER_HAS_gtest_gtest_h=
says 'Without rastertool: not found here: libcli11-dev, libxcb-damage0-dev'
says 'Without the tests and the examples: not found here: libgtest-dev'
if grep -q 'CMakeFiles/rastertool.dir' "$work/build/build.ninja"; then echo 'rastertool is built'; exit 1; fi
configured "$SOURCE" -DBUILD_SHARED_LIBS=OFF
says 'Without the tests and the examples: they are about shared libraries'
