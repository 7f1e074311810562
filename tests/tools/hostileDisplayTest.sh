#!/bin/sh
# screenshot of displays that say what is not so: one line, no output, no memory that is not theirs.
# In the environment: FAKE_DISPLAY, the program that plays the display.
. "$(dirname "$0")/common.sh"

tool=$TOOL
TOOL=$FAKE_DISPLAY # expect, ok and refused run the tool through it

# A sound display, so that what follows fails for the reason that it names.
ok -- "$tool" screenshot shot.png
says 'shot.png: 16x8+0+0 of a screen with TrueColor, depth 24 in 32 bits per pixel'
ok -- "$tool" screenshot shot.png --cursor
ok depth=8 bpp=8 -- "$tool" screenshot shot.png --cursor
ok depth=8 bpp=8 colours=3 coloursSent=3 -- "$tool" screenshot shot.png
ok cursorWidth=0 cursorHeight=0 cursorSent=0 -- "$tool" screenshot shot.png --cursor
ok hotX=65535 hotY=65535 -- "$tool" screenshot shot.png --cursor --cursor-scale 16
rm -f shot.png

# lies TEXT "NAME=VALUE..."...: displays that a screenshot with its cursor is refused of.
lies() {
  text=$1
  shift
  for display in "$@"; do
    # shellcheck disable=SC2086  # words
    refused 1 "$text" $display -- "$tool" screenshot no.png --cursor --cursor-scale 16
    absent no.png
  done
}

# More colours than an index has values, and fewer than the reply says.
lies 'colours' 'depth=8 bpp=8 colours=257 coloursSent=257' 'depth=8 bpp=8 colours=65535 coloursSent=65535' \
  'depth=8 bpp=8 colours=256 coloursSent=0' 'depth=8 bpp=8 colours=3 coloursSent=2'

# Fewer pixels than were asked for, and rows that are padded to nothing.
lies 'fewer pixels' imageCut=4 imageCut=100000
lies 'not supported' pad=0 pad=1 pad=33 pad=255
lies 'has no pixels' width=0 height=0

# A cursor that is larger than its reply, or than any cursor.
lies 'cursor' cursorSent=15 cursorSent=0 'cursorWidth=1000 cursorHeight=1000' \
  'cursorWidth=65535 cursorHeight=65535' 'cursorWidth=65535 cursorHeight=100 cursorSent=6553500'

# A greeting whose counts lead beyond its end.
lies 'its screens' 'roots=255 depths=255' formats=255 depths=255 visuals=65535 vendor=65535 setupCut=4 \
  setupCut=80
lies 'cannot connect' roots=0
finish
