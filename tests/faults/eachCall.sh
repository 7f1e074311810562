# shellcheck shell=sh
# Shared by the tests that make calls of the system fail; to be sourced after the tool's common.sh.

tried=0

# eachCall COMMAND...: runs it with the number of a call behind it, 1 and so on, as long as there is such
# a call, which its status tells. Counts them in "tried".
eachCall() {
  number=1
  while "$@" "$number"; do
    number=$((number + 1))
    tried=$((tried + 1))
  done
}
