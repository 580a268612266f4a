#!/usr/bin/env bash
# SPDX-License-Identifier: BSL-1.0
# Uses the archives and the installer as a user does who downloads them.
#   checkArchives.sh PACKAGES WORK
# Builds a host and a component with each archive, and runs them and the archive's mzcomponents. The
# installer must install what the archive contains, and remove it. Wine must be running.
set -euo pipefail
top=$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)
# shellcheck source=packaging/contents.sh
source "$top/packaging/contents.sh"
packages=$1 work=$2

fail() {
  echo "failed: $*" >&2
  exit 1
}

# Runs a program directly, or under Wine if it is a Windows program.
run_program() {
  case $1 in
  *.exe) "$top/cmake/wine-run" "$@" | tr -d '\r' ;;
  *) "$@" ;;
  esac
}

# shows PATTERN COMMAND…: fails unless a line of the command's output matches.
shows() {
  local pattern=$1 said
  shift
  said=$(run_program "$@") || fail "$* ended with $?"
  grep -Eq "$pattern" <<<"$said" || fail "$* said: $said"
}

# use PREFIX WORK SUFFIX MODULE OPTIONS…: builds and runs a host and a component.
use() {
  local prefix=$1 folder=$2 suffix=$3 module=$4
  shift 4
  cmake -S "$top/tests/package/outside" -B "$folder" -G Ninja -D CMAKE_PREFIX_PATH="$prefix" \
    -D WANTED=REQUIRED "$@"
  cmake --build "$folder"
  shows '^Hello, world!$' "$folder/helloHost$suffix" "$folder/components"
  use_tool "$prefix" "$folder" "$suffix" "$module"
}

use_tool() {
  local prefix=$1 folder=$2 suffix=$3 module=$4
  rm -f "$folder/list"
  shows "^component .*helloComponent$module\$" \
    "$prefix/bin/mzcomponents$suffix" list --path "$folder/components"
  shows "^works .*helloComponent$module\$" \
    "$prefix/bin/mzcomponents$suffix" scan --path "$folder/components" --cache "$folder/list"
}

rm -rf "$work"
for package in "$packages"/*.tar.gz "$packages"/*.zip; do
  unpack "$package" "$work/${package##*.}"
done
unset LD_LIBRARY_PATH WINEPATH

echo "== the archive for Linux"
use "$(echo "$work"/gz/*)" "$work/linux" '' .so

echo "== the archive for Windows"
archive=$(echo "$work"/zip/*)
use "$archive" "$work/windows" .exe .dll --toolchain "$top/cmake/mingw-w64.cmake"

echo "== the installer for Windows"
installed=$work/installed
"$top/cmake/wine-run" "$packages"/*.exe /S "/D=Z:${installed//\//\\}"
diff -r --exclude=Uninstall.exe "$archive" "$installed" || fail "installed is not what is in the archive"
use_tool "$installed" "$work/windows" .exe .dll
# It cannot remove itself, because it runs from its own folder.
"$top/cmake/wine-run" "$installed/Uninstall.exe" /S "_?=Z:${installed//\//\\}"
left=$(find "$installed" -type f ! -name Uninstall.exe)
[ -z "$left" ] || fail "the installer's removal leaves $left"
echo "== all used"
