# SPDX-License-Identifier: BSL-1.0
# shellcheck shell=bash
# Functions for scripts that read packages. To be sourced.

# unpack PACKAGE FOLDER: unpacks any of the packages to a new folder.
unpack() {
  rm -rf "$2"
  mkdir -p "$2"
  case $1 in
  *.deb) dpkg-deb -x "$1" "$2" ;;
  *.tar.gz) tar -C "$2" -xf "$1" ;;
  *.zip) unzip -q "$1" -d "$2" ;;
  *.exe) 7z x -y -o"$2" "$1" >/dev/null ;;
  *)
    echo "not a package: $1" >&2
    return 1
    ;;
  esac
}
