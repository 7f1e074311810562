#!/bin/sh
# Static libraries, installed: they serve the same programs, through find_package and through pkg-config.
. "$(dirname "$0")/common.sh"
buildProject "$SOURCE" -DBUILD_SHARED_LIBS=OFF -DCMAKE_BUILD_TYPE=Debug -DRASTER_BUILD_TOOLS=OFF \
  -DRASTER_BUILD_TESTS=OFF -DRASTER_BUILD_DOCS=OFF \
  -DCMAKE_CXX_FLAGS="-DHWY_COMPILE_ONLY_SCALAR${TOOLCHAIN:+ -m32}"
BUILD=$work/build
installHere
[ -z "$(find "$work/prefix" -name '*.so*')" ] || { echo 'shared libraries were installed'; exit 1; }

# stands PROGRAM: it runs, and needs none of the libraries where it runs.
stands() {
  run "$1"
  ! readelf -d "$1" | grep 'NEEDED.*\(raster\|tarnlibs\)' || { echo "$1 is not linked statically"; exit 1; }
}

rm -r "$work/build"
buildProject "$here/package" -Draster_DIR="$libraries/cmake/raster"
for program in consumerC consumerCpp consumerChecked; do stands "$work/build/$program"; done

command -v pkg-config >/dev/null || exit 0
flags() { PKG_CONFIG_PATH=$packages pkg-config --static "$@" raster-checked; }
$CC -std=c11 "$here/consumerChecked.c" $(flags --cflags) $(flags --libs) $LDFLAGS ${PNG_FOLDER:+-L"$PNG_FOLDER"} -o "$work/consumer"
stands "$work/consumer"
