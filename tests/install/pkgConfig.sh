#!/bin/sh
# The installed tree serves a C and a C++ program through pkg-config, wherever it was installed to.
. "$(dirname "$0")/common.sh"
command -v pkg-config >/dev/null || { echo "skipped: no pkg-config here"; exit 77; }
installHere
flags() { PKG_CONFIG_PATH=$packages pkg-config "$1" "${2:-raster}"; }

# Only what pkg-config says, the word size, and where libpng of that word size is.
$CC -std=c11 "$here/consumer.c" $(flags --cflags) $(flags --libs) $LDFLAGS -o "$work/consumerC"
$CXX -std=c++17 "$here/consumer.cpp" $(flags --cflags) $(flags --libs) $LDFLAGS -o "$work/consumerCpp"
$CC -std=c11 "$here/consumerChecked.c" $(flags --cflags raster-checked) $(flags --libs raster-checked) \
  $LDFLAGS -o "$work/consumerChecked"
LD_LIBRARY_PATH="$libraries:$PNG_FOLDER" "$work/consumerChecked"
LD_LIBRARY_PATH="$libraries:$PNG_FOLDER" "$work/consumerC"
LD_LIBRARY_PATH="$libraries:$PNG_FOLDER" "$work/consumerCpp"

[ "$(flags --modversion)" = "$(PKG_CONFIG_PATH=$packages pkg-config --modversion tarnlibs)" ]
PKG_CONFIG_PATH=$packages pkg-config --validate raster raster-checked tarnlibs

# Installed in /usr, the package says nothing that the compiler knows already.
if [ -n "$BUILD" ]; then
  "$CMAKE" -G Ninja -S "$SOURCE" -B "$work/usr" ${TOOLCHAIN:+-DCMAKE_TOOLCHAIN_FILE="$TOOLCHAIN"} \
    -DCMAKE_INSTALL_PREFIX=/usr -DRASTER_BUILD_TOOLS=OFF -DRASTER_BUILD_TESTS=OFF >"$work/log" 2>&1 ||
    { cat "$work/log"; exit 1; }
  packages=$work/usr
fi
inUsr=$(flags --cflags)
[ "$(echo $inUsr)" = -I/usr/include/raster ] || { echo "in /usr: $inUsr"; exit 1; }
# Where its libraries are, pkg-config knows for the machine's own word size.
[ -n "$TOOLCHAIN" ] || [ "$(echo $(flags --libs))" = '-lraster -ltarnlibs' ] ||
  { echo "in /usr: $(flags --libs)"; exit 1; }
