#!/usr/bin/env bash
# The manual pages render without a warning and know every command and option.
#
#   manuals_test.sh SOURCE TOOL
set -euo pipefail
source "$(dirname "$0")/common.sh"

manuals=$1/docs/man register=$1/scripts/plexor-register tool=$2

for page in "$manuals"/*.[1578]; do
    warnings=$(LC_ALL=C.UTF-8 MANWIDTH=80 man -l --warnings=w "$page" 2>&1 >/dev/null) || true
    [ -z "$warnings" ] || fail "$page: $warnings"
    text=$(LC_ALL=C.UTF-8 MANWIDTH=80 man -l "$page" 2>/dev/null)
    grep -q '^NAME$' <<<"$text" || fail "$page does not render"
    lexgrog "$page" >/dev/null || fail "$page: apropos does not understand NAME"
done

# PAGE HELP...: every long option of the help is in the page.
expect_options() {
    local page=$1 text option
    text=$(sed 's/\\-/-/g' "$manuals/$page")
    for option in $(grep -ohE -- '(^|[ ,[])--[a-z][a-z-]*' <<<"$2" | tr -d ' ,[' | sort -u); do
        grep -qE -- "$option([^a-z-]|\$)" <<<"$text" || fail "$page: no $option"
    done
}

help=$("$tool" --help)
commands=$(sed -n '/^Subcommands:/,$s/^  \([a-z]*\) .*/\1/p' <<<"$help")
[ "$(wc -w <<<"$commands")" -ge 3 ] || fail "no commands in: $help"
for command in $commands; do
    grep -qE "^\.B (plexor-testbed |plexor\\\\-testbed )?$command\$" "$manuals/plexor-testbed.1" ||
        fail "plexor-testbed.1: no command $command"
    expect_options plexor-testbed.1 "$("$tool" "$command" --help)"
done
expect_options plexor-register.8 "$("$register" --help)"

finish "manuals"
