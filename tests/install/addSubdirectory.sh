#!/bin/sh
# The project works inside another one, which gets three libraries and nothing else.
. "$(dirname "$0")/common.sh"
# Portable code without optimisation is enough to see that, and compiles in seconds.
for shared in ON OFF; do
  buildProject "$here/subproject" -DRASTER_SOURCE="$SOURCE" -DBUILD_SHARED_LIBS=$shared -DCMAKE_BUILD_TYPE=Debug \
    -DCMAKE_CXX_FLAGS="-DHWY_COMPILE_ONLY_SCALAR${TOOLCHAIN:+ -m32}"
  run "$work/build/consumerC"
  run "$work/build/consumerChecked"
  kind=$(readelf -d "$work/build/consumerC" | grep -c 'NEEDED.*libraster' || true)
  case $shared$kind in ON1 | OFF0) ;; *) echo "BUILD_SHARED_LIBS=$shared is not heeded"; exit 1 ;; esac
  rm -r "$work/build"
done
