# SPDX-License-Identifier: MIT
#
# Completion of rastertool's command lines in bash: commands, options and their values as the
# program's own help tells them, and names of files.

# Names in the first column of help that begin with $1.
_rastertool_names() {
  sed -n "s/^  \($1[a-zA-Z, -]*[a-z]\).*/\1/p" | sed 's/  .*//' | tr -s ', ' '\n' | grep "^$1"
}

# What the option $1 takes, when help lists it: a|b|c, or the operations at its end.
_rastertool_values() {
  if [ "$1" = --op ]; then
    sed -n '/^Operat/,/^$/p' | tr '\n' ' ' | sed 's/^[^:]*://; s/\. *$//' | tr -s ', ' '\n'
  else
    sed -n "s/^  .*$1 \([a-z0-9]*|[a-z0-9|]*\).*/\1/p" | tr '|' '\n'
  fi
}

_rastertool() {
  local tool=$1 word=$2 before=$3 command='' words='' i
  for ((i = 1; i < COMP_CWORD; ++i)); do
    [[ ${COMP_WORDS[i]} == -* ]] && continue
    command=${COMP_WORDS[i]}
    break
  done
  if [[ $word == -* ]]; then
    words=$("$tool" help ${command:+"$command"} 2>/dev/null | _rastertool_names -)
  elif [[ -z $command || $command == help ]]; then
    words=$("$tool" help 2>/dev/null | sed -n '/^Commands:/,/^$/p' | _rastertool_names '[a-z]')
  elif [[ $before == --* ]]; then
    words=$("$tool" help "$command" 2>/dev/null | _rastertool_values "$before")
  fi
  # shellcheck disable=SC2207
  COMPREPLY=($(compgen -W "$words" -- "$word"))
}

complete -o bashdefault -o default -F _rastertool rastertool
