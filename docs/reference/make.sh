#!/bin/sh
# Runs Doxygen and mends its manual pages: every function, type and named constant has a page that shows
# its family's; fields of records have none. usage: make.sh DOXYGEN FOLDER    (FOLDER has a Doxyfile)
set -eu
doxygen=$1 folder=$2
rm -rf "$folder/html" "$folder/man/man3"
"$doxygen" "$folder/Doxyfile"
cd "$folder/man/man3"

for page in *; do
  case $page in
    rasterops_mmx.* | [A-Z]*) continue ;;
    @*) rm "$page" ;;
    *) ! head -n 1 "$page" | grep -q '^\.so ' || rm "$page" ;;
  esac
done

# No date, so that the same headers give the same pages; no second brief text after the name; a way on; no
# text for a command because of the apostrophe that it begins with.
find . -type f | while read -r page; do
  sed -i -e '1s/^\(\.TH "[^"]*" 3raster\) "[^"]*" "Version \([^"]*\)".*/\1 "" "raster \2" "raster"/' \
    -e '/^ \\- /d' -e "s/^'/\\\\\&'/" -e 's/^\.SH "Author"/.SH "SEE ALSO"/' \
    -e 's/^Generated automatically by Doxygen.*/.BR raster (7)/' "$page"
done
