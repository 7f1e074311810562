#!/bin/sh
# A library reaches none of the functions that it exports through the dynamic linker, so that no host
# can put itself in their place. The utility library's functions are there for just that.
# usage: ownCalls.sh LIBRARY
set -eu
library=$1
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT

nm -D --defined-only "$library" | awk '$2 == "T" { print $3 }' | LC_ALL=C sort >"$work/own"
readelf -rW "$library" | awk 'NF >= 5 { print $5 }' | sed 's/@.*//' | LC_ALL=C sort -u >"$work/linked"
[ -s "$work/own" ] || { echo "$library exports nothing"; exit 1; }
grep -qx Panic "$work/linked" || { echo "$library does not call the utility library"; exit 1; }

LC_ALL=C comm -12 "$work/own" "$work/linked" >"$work/both"
[ -s "$work/both" ] || exit 0
echo "$library reaches its own functions through the dynamic linker:"
cat "$work/both"
exit 1
