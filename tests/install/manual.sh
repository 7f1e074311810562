#!/bin/sh
# Every exported name has a manual page, which is its family's; the tool has one, and each of its commands.
. "$(dirname "$0")/common.sh"
[ -e "$BUILD/docs/made" ] || { echo "skipped: no reference was made here"; exit 77; }
installHere
manual=$work/prefix/share/man
[ -s "$manual/man7/raster.7" ]

names=$(grep -ohE '\<[A-Za-z]\w+\>;' "$SOURCE/lib/raster/raster.map" "$SOURCE/lib/tarnlibs/tarnlibs.map" \
  "$SOURCE/lib/checked/rasterChecked.map" |
  tr -d ';')
[ "$(echo "$names" | wc -l)" -gt 90 ]
for name in $names; do
  page=$manual/man3/$name.3raster
  [ -e "$page" ] || { echo "no page: $name"; exit 1; }
  family=$(sed -n 's/^\.so //p' "$page")
  case $family in *.h.3raster) echo "$name is of no family"; exit 1 ;; esac
  grep -q "$name" "$manual/$family" || { echo "$family says nothing of $name"; exit 1; }
done
if ls "$manual/man3" | grep -vE '^([A-Z]|raster|rect|image|tarnlibs|[a-zA-Z0-9]+\.h\.)'; then
  echo "these are no names of the library's"
  exit 1
fi

tool=$BUILD/bin/rastertool
if [ -e "$BUILD/docs/madeTool" ]; then
  for command in $("$tool" help | sed -n '/^Commands:/,/^$/s/^  \([a-z]*\) .*/\1/p'); do
    page=$manual/man1/rastertool-$command.1
    grep -q "^rastertool-$command .- [A-Z]" "$page" || { echo "$command is not named"; exit 1; }
    grep -A 2 '^.SH SYNOPSIS' "$page" | grep -q ",$command\>" || { echo "$command is not shown"; exit 1; }
    grep -A 9 '^.SH EXAMPLES' "$page" | grep -q "rastertool $command" || { echo "$command has no example"; exit 1; }
    grep -q "rastertool-$command (1)" "$manual/man1/rastertool.1" || { echo "$command is not found"; exit 1; }
  done
  grep -q 'Exit status: 0' "$manual/man1/rastertool.1"
fi

command -v man >/dev/null || exit 0
MANWIDTH=100 man -M "$manual" Raster_Scale >"$work/page"
grep -q '^ *raster_scaling - Scaling' "$work/page"
grep -q 'Only the near sides are bounded below' "$work/page"
MANWIDTH=100 man -M "$manual" --warnings 7 raster 2>&1 >"$work/page" | tee "$work/warnings"
[ ! -s "$work/warnings" ]
grep -q 'Fatal errors' "$work/page"
find "$manual/man1" "$manual/man3" -type f | while read -r page; do
  ! head -n 1 "$page" | grep -q '^\.so ' || continue
  MANWIDTH=100 man -M "$manual" --warnings "$page" 2>&1 >"$work/page" | tee "$work/warnings"
  [ ! -s "$work/warnings" ]
done
