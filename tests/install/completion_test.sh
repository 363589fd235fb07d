#!/usr/bin/env bash
# The completion knows every command and every option that the help has.
#
#   completion_test.sh SOURCE TOOL
set -euo pipefail
source "$(dirname "$0")/common.sh"

source "$1/testbed/cli/completion/plexor-testbed"
scratch=$(mktemp -d)
trap 'rm -rf "$scratch"' EXIT
ln -s "$2" "$scratch/plexor-testbed"
ln -s "$2" "$scratch/check_plexor"

# WORD...: what is offered in the place of the last one.
offered() {
    COMP_WORDS=("$@")
    COMP_CWORD=$(($# - 1))
    COMPREPLY=()
    _plexor_testbed 2>/dev/null
    printf '%s\n' "${COMPREPLY[@]}" | sort -u
}

# HELP: its options.
options_in() {
    sed -n '/^Options:/,/^[A-Z][a-z]*:$/p' <<<"$1" | grep -oE '^  -[^ ]*' | tr -d ' ' | tr , '\n' |
        sort -u
}

# TEXT OFFERED WANTED
expect_same() {
    local difference
    difference=$(diff <(echo "$2") <(echo "$3")) || fail "$1: $difference"
}

help=$("$scratch/plexor-testbed" --help)
commands=$(sed -n '/^Subcommands:/,$s/^  \([a-z]*\) .*/\1/p' <<<"$help" | sort)
[ "$(wc -w <<<"$commands")" -ge 5 ] || fail "no commands in: $help"
expect_same commands "$(offered plexor-testbed '' | grep -v '^-')" "$commands"
for command in $commands; do
    wanted=$(options_in "$("$scratch/plexor-testbed" "$command" --help)")
    [ "$(wc -w <<<"$wanted")" -ge 4 ] || fail "no options of $command"
    expect_same "$command" "$(offered plexor-testbed "$command" -)" "$wanted"
done
expect_same check_plexor "$(offered check_plexor -)" \
    "$(options_in "$("$scratch/check_plexor" --help)")"

expect_same colours "$(offered plexor-testbed ask --colour a)" $'always\nauto'
expect_same classes "$(offered plexor-testbed show --class Tovexa_PlexorB)" Tovexa_PlexorBattery
expect_same files "$(offered plexor-testbed show --scenario "$scratch/check")" \
    "$scratch/check_plexor"
expect_same counts "$(offered check_plexor --expect x)" ''

finish completion
