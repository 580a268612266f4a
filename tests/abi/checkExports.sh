#!/usr/bin/env bash
# SPDX-License-Identifier: BSL-1.0
# Compares the names that a built library exports with the list in this folder.
#   checkExports.sh LIBRARY LIST SYMBOL_TOOL DEMANGLER [--write]
# LIST ends in .linux.txt or .windows.txt; SYMBOL_TOOL is nm for the first and objdump for the
# second. --write writes the list. Review the difference before you commit it.
set -euo pipefail
library=$1 list=$2 tool=$3 demangler=$4

# Inline functions (W) are not part of the ABI: every library has its own copy, depending on the
# optimiser. All other names of this project are.
exported() {
    case $list in
    *.linux.txt) "$tool" -D --defined-only "$library" | awk '$2 ~ /^[TDBRV]$/ {print $3}' ;;
    *.windows.txt) "$tool" -p "$library" |
        awk '/\[Ordinal\/Name Pointer\] Table/ {on=1; next} !NF {on=0}
             on && match($0, /\] */) {print $NF}' ;;
    esac | "$demangler" | grep -E '^(Qr|Mz[A-Z]|(.* (for|to) )?Mz::)' | LC_ALL=C sort -u
}

names=$(exported)
if [ -z "$names" ]; then
    echo "no exported names were found in $library" >&2
    exit 1
fi
if [ "${5:-}" = --write ]; then
    printf '%s\n' "$names" >"$list"
    exit
fi
if ! diff -u --label "kept: $(basename "$list")" --label "built: $(basename "$library")" \
    "$list" <(printf '%s\n' "$names"); then
    echo "The exported names have changed. If that is wanted: $0 ${*:1:4} --write" >&2
    exit 1
fi
