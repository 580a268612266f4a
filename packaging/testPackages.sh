#!/usr/bin/env bash
# SPDX-License-Identifier: BSL-1.0
# Runs all tests of a build with the libraries and programs of a package instead of those of the
# build:
#   testPackages.sh PACKAGE BUILD [CTEST-ARGUMENTS…]
# PACKAGE is an archive, or a folder with its content. Tests of classes that the libraries hide use
# the build's own second form of libMZcomponentManager; all else is as shipped. Afterwards the build
# is as it was. For Windows, Wine must be started.
set -euo pipefail
top=$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)
# shellcheck source=packaging/contents.sh
source "$top/packaging/contents.sh"
package=$1 build=$2
shift 2
aside=$build/replaced

restore() {
  local file
  [ -d "$aside" ] || return 0
  for file in "$aside"/*/*; do mv "$file" "$build/${file#"$aside"/}"; done
  rm -rf "$aside" "$build/package"
}
restore # after a run that was killed
trap restore EXIT

# replace FILE NEW: one of the build's files by that of the package. The time stays, so that the next
# build does not take it for changed.
replace() {
  mkdir -p "$aside/$(dirname "$1")"
  mv "$build/$1" "$aside/$1"
  cp "$2" "$build/$1"
  touch -r "$aside/$1" "$build/$1"
}

if [ -d "$package" ]; then
  content=$package
else
  unpack "$package" "$build/package"
  content=$(echo "$build/package"/*)
fi

# What the package has and the build makes: in the same folders, except where Debian has its own.
replaced=()
for file in lib/mzcomponents-probe bin/mzcomponents bin/mzcomponents.exe bin/mzcomponents-probe.exe \
  "$build"/lib/libMZ*.so.*.*.* "$build"/bin/libMZ*.dll; do
  file=${file#"$build"/}
  if [ ! -f "$build/$file" ] || [ -L "$build/$file" ]; then continue; fi
  new=$(find "$content" -type f -name "${file##*/}" ! -path '*/debug/*' ! -path '*/share/*')
  if [ "$(wc -l <<<"$new")" != 1 ] || [ -z "$new" ]; then
    echo "the package has not one ${file##*/}: $new" >&2
    exit 1
  fi
  replace "$file" "$new"
  replaced+=("${file##*/}")
done
if [ ${#replaced[@]} != 6 ]; then
  echo "replaced ${replaced[*]}, but there are four libraries and two programs" >&2
  exit 1
fi
echo "testing with the package's ${replaced[*]}"
# More than processors, as in ./run test: most tests wait for processes to begin and end.
ctest --test-dir "$build" --output-on-failure -j "$((3 * $(nproc)))" "$@"
