#!/usr/bin/env bash
# SPDX-License-Identifier: BSL-1.0
# Tests what the program writes to standard error, and what it does when its output cannot be
# written.
#   streamsTest.sh COMPONENTS PROGRAM...
set -uo pipefail
components=$1
shift
program=("$@")
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
cd "$work" || exit 1
status=0

copy() { # copy COMPONENT FOLDER
    mkdir -p "$2"
    cp "$components/$1/$1".* "$2/"
}

expect() { # expect STATUS PATTERN ARGUMENTS...: tests its status and its standard error
    local wanted=$1 pattern=$2 said got
    shift 2
    said=$("${program[@]}" "$@" 2>&1 >/dev/null)
    got=$?
    if [ "$got" != "$wanted" ] || ! grep -q -- "$pattern" <<<"$said"; then
        echo "mzcomponents $*: ended with $got, not $wanted, or without \"$pattern\": $said" >&2
        status=1
    fi
}

lost() { # lost ARGUMENTS...: it reports that its output cannot be written
    local said got
    said=$("${program[@]}" "$@" 2>&1 >/dev/full)
    got=$?
    if [ "$got" != 1 ] || ! grep -q 'could not be written' <<<"$said"; then
        echo "mzcomponents $* >/dev/full: ended with $got: $said" >&2
        status=1
    fi
}

copy notes good
copy talkativeImporter good
copy exitsInImport exits
copy crashesInEntryPoint bad
lost --version
lost --help
lost list --path good
lost types --path good
lost graph --path good
lost scan --path good --cache list

expect 1 'missing: there is no such file' types --path missing
expect 1 'missing: there is no such file' graph --path 'good;missing'
expect 1 'crashesInEntryPoint.*: it crashes in its entry point' types --path bad
expect 0 'this is no result' types --path good
expect 2 'names no folder' types --path ''

# If a component ends the program, the message names the call.
printf E >file.exit
ended='a component ended the program while "exits"'
expect 1 "$ended imported file.exit" import --path exits file.exit
expect 1 "$ended made an object" graph --path exits

# The message names a file that cannot be written only once.
expect 1 '^error: no/list: Error opening output stream: ' scan --path good --cache no/list
said=$("${program[@]}" scan --path good --cache no/list 2>&1 >/dev/null)
[ "$(grep -o 'no/list' <<<"$said" | wc -l)" = 1 ] || { echo "named twice: $said" >&2; status=1; }

touch empty
expect 1 'empty: the file is empty' show empty
# Nothing is compared with a host that describes no interface.
expect 0 'empty: it describes no interface by MZ_INTERFACE' list --path good --host empty
expect 2 '--host: File does not exist: missing' list --path good --host missing
head -c 60 list >cut
expect 1 'cut: neither a recorded list (byte [1-9]' show cut
echo 'some text of somebody' >text
expect 0 'text: this is no recorded list' types --path good --cache text
[ "$(cat text.rejected)" = 'some text of somebody' ] || { echo "the text is lost" >&2; status=1; }

# The program was started with SIGCHLD ignored.
said=$(trap '' CHLD; "${program[@]}" explain --load bad/*)
grep -q ': crashed' <<<"$said" || { echo "with SIGCHLD ignored: $said" >&2; status=1; }
exit $status
