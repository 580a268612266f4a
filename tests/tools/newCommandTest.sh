#!/usr/bin/env bash
# SPDX-License-Identifier: BSL-1.0
# Tests what the commands `new` and `uid` say when they fail, and that a failure half-way leaves
# nothing.
#   newCommandTest.sh PROGRAM...
set -uo pipefail
program=("$@")
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
cd "$work" || exit 1
status=0

complain() {
    echo "$*" >&2
    status=1
}

expect() { # expect STATUS TEXT ARGUMENTS...: tests its status and its standard error
    local wanted=$1 text=$2 said got
    shift 2
    said=$("${program[@]}" "$@" 2>&1 >/dev/null)
    got=$?
    said=${said//$'\r'/}
    if [ "$got" != "$wanted" ] || ! grep -qF -- "$text" <<<"$said"; then
        complain "mzcomponents $*: ended with $got, not $wanted, or without \"$text\": $said"
    fi
}

expect 2 'COUNT: "0" is not a number from 1 to 10000' uid 0
expect 2 'COUNT: "many" is not a number from 1 to 10000' uid many
expect 2 'NAME: "2d" is not an identifier of C++: use letters, digits and _, and begin with a letter' \
    new component 2d
expect 2 'NAME: "class" is a keyword of C++' new component class
expect 2 'NAME: "a__b" is reserved' new host a__b
expect 2 '--extension: ".gau" has a dot or a wildcard: write the letters after the dot' \
    new importer gauge --extension .gau
expect 2 '--extension: "GAU" has capitals: write "gau"' new importer gauge --extension GAU
expect 2 '--extension: "g/u" is not an extension' new importer gauge --extension g/u
expect 2 '--extension: "g"u" is not an extension' new importer gauge --extension 'g"u'
expect 2 '--extension: "gau" is given twice' new importer gauge --extension gau --extension gau
expect 2 'a;b: the name contains a semicolon' new host gauge --directory 'a;b'
mkdir full && touch full/something
expect 1 'full: this folder is not empty' new component gauge --directory full
expect 1 'something: this is a file, not a folder' new component gauge --directory full/something
expect 1 'something: this is a file, not a folder' new component gauge --directory full/something/gauge
[ "$(find . | wc -l)" = 3 ] || complain "refused, but left $(find .)"

# With a limit on the size of files some are written, and then one fails. Wine writes by other means.
if [[ ${program[0]} != */wine-run ]]; then
    ln -s nowhere dangling
    expect 1 'dangling: this is a file, not a folder' new component gauge --directory dangling
    mkdir empty
    for directory in new a/b/c empty; do
        before=$(find . | sort)
        said=$(
            trap '' XFSZ # so that the write fails instead of the program
            ulimit -f 1
            "${program[@]}" new importer gauge --extension gau --directory "$directory" 2>&1
        )
        got=$?
        [ $got = 1 ] || complain "$directory: ended with $got"
        grep -qE "$directory/[A-Za-z.]+: " <<<"$said" || complain "$directory: names no file: $said"
        [ "$before" = "$(find . | sort)" ] || complain "$directory: left $(find . | sort)"
    done
fi
exit $status
