#!/usr/bin/env bash
# SPDX-License-Identifier: BSL-1.0
# Tests that the completion offers every command and every option in the program's help.
#   completionTest.sh COMPLETION PROGRAM...
set -euo pipefail
source "$1"
shift
status=0

complete_for() { # complete_for WORDS...: prints the completions of the last word
    COMP_WORDS=("$@")
    COMP_CWORD=$(($# - 1))
    COMPREPLY=()
    _mzcomponents 2>/dev/null
    printf '%s\n' "${COMPREPLY[@]}"
}

expect() { # expect WORD CONTEXT: expects WORD as a line of standard input
    if ! grep -qxF -- "$1"; then
        echo "not offered: $2 $1" >&2
        status=1
    fi
}

commands=$("$@" --help | tr -d '\r' | sed -n '/^Subcommands:/,$s/^  \([a-z]*\) .*/\1/p')
[ "$(wc -w <<<"$commands")" = 15 ] || { echo "fifteen commands expected: $commands" >&2; exit 1; }
for command in $commands; do
    expect "$command" mzcomponents < <(complete_for mzcomponents '')
    for option in $("$@" "$command" --help | tr -d '\r' | grep -oE '^  (-h,)?--[a-z-]+' | grep -oE -- '--[a-z-]+'); do
        expect "$option" "mzcomponents $command" < <(complete_for mzcomponents "$command" --)
    done
done
for kind in component importer host; do
    expect "$kind" "mzcomponents new" < <(complete_for mzcomponents new '')
    for option in $("$@" new "$kind" --help | tr -d '\r' | grep -oE '^  (-h,)?--[a-z-]+' | grep -oE -- '--[a-z-]+'); do
        expect "$option" "mzcomponents new $kind" < <(complete_for mzcomponents new "$kind" --)
    done
done
exit $status
