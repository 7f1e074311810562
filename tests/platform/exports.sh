#!/bin/sh
# The dynamic symbols that a library defines are exactly the names of its version script, all under one
# version, or without any.
# usage: exports.sh LIBRARY MAP [VERSION]
set -eu
library=$1
map=$2
version=${3:-}
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT

sed -n '/global:/,/local:/s/^ *\([A-Za-z_][A-Za-z0-9_]*\);.*/\1/p' "$map" |
  sed "s/\$/${version:+@@$version}/" | LC_ALL=C sort >"$work/named"
# A version itself is an absolute symbol.
nm -D --defined-only "$library" | awk -v version="$version" '$3 != version {print $3}' |
  LC_ALL=C sort >"$work/defined"
[ -s "$work/named" ] || { echo "no names found in $map"; exit 1; }

diff "$work/named" "$work/defined" >"$work/difference" && exit 0
echo "$library does not export what $map names (< missing, > not named):"
cat "$work/difference"
exit 1
