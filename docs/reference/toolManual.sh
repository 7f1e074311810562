#!/bin/sh
# Writes the manual pages of rastertool and of each of its commands: what --help says, and the examples of
# docs/tool.md. usage: toolManual.sh HELP2MAN TOOL VERSION EXAMPLES FOLDER
set -eu
help2man=$1 tool=$2 version=$3 examples=$4 folder=$5
rm -rf "$folder"
mkdir -p "$folder"
include=$folder/include
trap 'rm -f "$include"' EXIT

commands=$("$tool" help | sed -n '/^Commands:/,/^$/s/^  \([a-z]*\) .*/\1/p')

# The blocks of examples that call a command, as they stand there.
examplesOf() {
  awk -v command="rastertool $1( |\$)" '
    /^```sh/ { block = ""; inBlock = 1; next }
    /^```/ { if (inBlock && block ~ command) printf "%s", block; inBlock = 0 }
    inBlock { block = block $0 "\n" }' "$examples" |
    sed -e 's/\\/\\e/g' -e "s/'/\\\\(aq/g" -e 's/`/\\(ga/g' -e 's/-/\\-/g' -e 's/^/\\\&/'
}

# What a command does, in a few words: the first sentence of its help.
purposeOf() {
  "$tool" help "$@" | awk 'NR > 2 && /^$/ { exit } NR > 2' | tr '\n' ' ' | sed 's/\. .*//'
}

# page NAME PURPOSE [COMMAND]: no date, so that the same program gives the same page.
page() {
  "$help2man" --no-info --help-option="help ${3:-}" --name="$2" \
    --version-string="$1 $version" --include="$include" "$tool" |
    sed -e '/^\.TH/s/"1" "[^"]*"/"1" ""/' >"$folder/$1.1"
}

for command in $commands; do
  {
    printf "[EXAMPLES]\n.nf\n"
    examplesOf "$command"
    printf ".fi\n[SEE ALSO]\n.BR rastertool (1)\n"
  } >"$include"
  page "rastertool-$command" "$(purposeOf "$command")" "$command"
done
{
  printf '[SEE ALSO]\n'
  printf '.BR rastertool-%s (1),\n' $commands
  printf '.BR raster (7)\n'
} >"$include"
page rastertool "$(purposeOf)"
