#!/bin/sh
# What the file of a shared library promises to its hosts: its soname, no text relocations, read-only
# relocations bound at load time, a stack that is not executable, no C++ run-time library, and no
# instructions that a compiler puts where it takes a path for impossible (those that follow a call of
# Panic, should it return, are meant).
# usage: sharedObject.sh LIBRARY SONAME sanitized|plain
set -eu
library=$1
soname=$2
build=$3
failures=0

fail() {
  echo "$library: $*"
  failures=$((failures + 1))
}

dynamic=$(readelf -dW "$library")
segments=$(readelf -lW "$library")
has() { printf '%s\n' "$1" | grep -Eq "$2"; }

has "$dynamic" "SONAME.*\[$soname\]" || fail "the soname is not $soname"
! has "$dynamic" 'TEXTREL' || fail "it has text relocations"
has "$dynamic" 'BIND_NOW|FLAGS.*NOW' || fail "symbols are not bound at load time"
has "$segments" 'GNU_RELRO' || fail "no read-only relocations"
has "$segments" 'GNU_STACK.* RW ' || fail "the stack is executable, or nothing says that it is not"
! has "$segments" 'LOAD.* RWE ' || fail "a segment is writable and executable"
if [ "$build" = plain ]; then
  ! has "$dynamic" 'NEEDED.*(libstdc\+\+|libgcc_s|libc\+\+)' || fail "it needs a C++ run-time library"
  ! objdump -d --no-show-raw-insn "$library" |
    awk '/^[0-9a-f]+ </ { name = $2 } /call.*<Panic@plt>/ { panicked = NR }
      $2 == "ud2" && NR > panicked + 2 { print name, $0 }' |
    grep . || fail "it ends in illegal instructions"
fi
[ "$failures" = 0 ]
