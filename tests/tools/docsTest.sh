#!/bin/sh
# The examples of docs/tool.md do what they say they do: none fails, and what they name is there.
. "$(dirname "$0")/common.sh"
page=$(cd "$(dirname "$0")/../../docs" && pwd)/tool.md
have Xvfb || { note 'skipped: no Xvfb here'; exit 77; }
have bash || { note 'skipped: no bash here'; exit 77; }

mkdir bin examples
ln -s "$TOOL" bin/rastertool
PATH=$work/bin:$PATH
export PATH

# Every command has an example.
for command in $("$TOOL" help | sed -n '/^Commands:/,/^$/s/^  \([a-z]*\) .*/\1/p'); do
  sed -n '/^```sh/,/^```/p' "$page" | grep -q "rastertool $command " || fail "no example of $command"
done

# One file for every block of commands.
awk '/^```sh/ {file = sprintf("examples/%02d.sh", ++n); next} /^```/ {file = ""} file {print > file}' "$page"
startServer 640x480x24
mkdir files
cd files || exit 1
for example in ../examples/*.sh; do
  if grep -q ffmpeg "$example" && ! have ffmpeg; then
    note "not checked: no ffmpeg here for $(cat "$example")"
    continue
  fi
  bash -eo pipefail "$example" </dev/null >../out 2>../err || fail "$(cat "$example"): $(cat ../out ../err)"
done

for file in $(grep -o '[a-z][a-z-]*\.\(png\|bmp\|rblk\|gz\|avi\|txt\)' ../examples/*.sh | sed 's/.*://' | sort -u); do
  [ "$file" = frames.png ] && file=frames-0001.png
  case $file in from-ffmpeg.png | pictures.avi | film.avi | changes.txt) have ffmpeg || continue ;; esac
  [ -s "$file" ] || fail "the examples do not make $file"
done
finish
