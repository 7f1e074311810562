#!/bin/sh
# What the compiler was asked for is in the objects of the libraries: control-flow enforcement in every
# one, stack protection and fortified calls where they have something to protect. (The libraries themselves
# are marked for enforcement only where the C library's own start files are.)
# usage: hardened.sh OBJECT...
set -eu
failures=0

fail() {
  echo "$*"
  failures=$((failures + 1))
}

for object in "$@"; do
  readelf -nW "$object" | grep -q 'x86 feature: IBT, SHSTK' || fail "$object: no control-flow enforcement"
done
undefined=$(nm -u "$@")
for name in __stack_chk_fail '__[a-z]*_chk'; do
  printf '%s\n' "$undefined" | grep -q "U $name\$" || fail "nothing calls $name"
done
[ "$failures" = 0 ]
