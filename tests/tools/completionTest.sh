#!/bin/sh
# What bash completes: every command, every option that help has, and the values that it lists.
. "$(dirname "$0")/common.sh"
have bash || { note 'skipped: no bash here'; exit 77; }
completion=$(cd "$(dirname "$0")/../../tools" && pwd)/rastertool.bash
[ -e "$completion" ] || fail 'there is no completion'

# completed WORD...: what the last word may become, sorted, in ./words.
completed() {
  # shellcheck disable=SC2016
  COMPLETION=$completion bash --norc -c '
    . "$COMPLETION"
    COMP_WORDS=(rastertool "$@")
    COMP_CWORD=$#
    _rastertool "$TOOL" "${COMP_WORDS[$#]}" "${COMP_WORDS[$# - 1]}"
    printf "%s\n" "${COMPREPLY[@]}"' bash "$@" | sort -u >words
}
# gives EXPECTED WORD...
gives() {
  wanted=$1
  shift
  completed "$@"
  got=$(tr '\n' ' ' <words)
  [ "$got" = "$wanted " ] || fail "after rastertool $*: $got, not $wanted"
}
cd / || exit 1
gives 'scale screenshot serve' s
cd "$work" || exit 1
gives 'combine compare convert' co
gives 'pack' pa
gives 'compare' help compa
gives '--help --version' --
gives '--compression' convert --comp
gives '--color --colour' rop --col
gives 'bmp png' convert a.png b.png --format ''
gives '16 24 32' rop --depth ''
gives 'nand noop nor' rop --op n
gives 'over overReverse' blend --op over
gives '' convert a.pn

# Nothing is left out: every option in the first column of every help.
for command in $("$TOOL" help | sed -n '/^Commands:/,/^$/s/^  \([a-z]*\) .*/\1/p'); do
  "$TOOL" help "$command" | grep -o -e '^  -[^ ]*,* *\(--[a-z-]*,* *\)*' | grep -o -e '--*[a-zA-Z-]*' |
    sort -u >options
  completed "$command" -
  cmp -s options words || fail "$command: $(diff options words)"
done
finish
