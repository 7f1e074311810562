#!/bin/sh
# Sources that are compiled without an aligned stack (lib/CMakeLists.txt) call other parts of the
# library, the C library's memory functions and the compiler's arithmetic, and nobody else.
# usage: callsOut.sh SOURCES OBJECTS   (lists, with semicolons)
set -eu
sources=$1
objects=$2
allowed='_ZN6raster.*|_ZN3hwy.*|RasterComputeVideoAttributes|rasterops_mmx'
allowed="$allowed|mem(cpy|move|set|cmp)|__[a-z]+di[23]|_GLOBAL_OFFSET_TABLE_"
checked=0
failures=0

oldIfs=$IFS
IFS=';'
for source in $sources; do
  for object in $objects; do
    case $object in
      */"$source".o)
        checked=$((checked + 1))
        if nm -u "$object" | awk '{print $2}' | grep -Evx "$allowed"; then
          echo "  is called by $source"
          failures=$((failures + 1))
        fi
        ;;
    esac
  done
done
IFS=$oldIfs
[ "$checked" -gt 10 ] || { echo "only $checked objects"; exit 1; }
[ "$failures" = 0 ]
