# shellcheck shell=sh
# Shared by the install tests; to be sourced. In the environment, from tests/install/CMakeLists.txt:
# CMAKE SOURCE BUILD CC CXX TOOLCHAIN LDFLAGS PNG_FOLDER. Without BUILD, the packages that the system has
# are looked at (debian/tests).

set -eu
: "${BUILD:=}" "${TOOLCHAIN:=}" "${LDFLAGS:=}" "${PNG_FOLDER:=}"
here=$SOURCE/tests/install
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT

# Installs the build into $work/prefix. What is empty afterwards is found by itself.
installHere() {
  packages= libraries=
  [ -n "$BUILD" ] || return 0
  "$CMAKE" --install "$BUILD" --prefix "$work/prefix" >"$work/log" || { cat "$work/log"; exit 1; }
  packages=$(dirname "$(find "$work/prefix" -name raster.pc)")
  libraries=$(dirname "$packages")
}

# Runs a program, which finds the installed libraries by itself; libpng of the other word size is in a
# private folder.
run() {
  LD_LIBRARY_PATH="$PNG_FOLDER" "$@" || { echo "failed: $*"; exit 1; }
}

# Configures and builds a CMake project: configure FOLDER [ARGUMENT...]
buildProject() {
  folder=$1
  shift
  "$CMAKE" -G Ninja -S "$folder" -B "$work/build" ${TOOLCHAIN:+-DCMAKE_TOOLCHAIN_FILE="$TOOLCHAIN"} "$@" \
    >"$work/log" 2>&1 && "$CMAKE" --build "$work/build" >>"$work/log" 2>&1 ||
    { cat "$work/log"; exit 1; }
}
