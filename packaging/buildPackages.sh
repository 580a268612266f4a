#!/usr/bin/env bash
# SPDX-License-Identifier: BSL-1.0
# Builds the packages of the source tree that contains this script.
#   buildPackages.sh OUTPUT
# The packages depend only on the sources, the compilers and SOURCE_DATE_EPOCH: not on the folder,
# the user, the time or the order of files in a folder. This script and the package presets ensure
# that.
set -euo pipefail
top=$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)
output=$1
: "${SOURCE_DATE_EPOCH:?}"
umask 022
export TZ=UTC LC_ALL=C.UTF-8
# A compiler cache may write other paths into the debug symbols.
export CCACHE_DISABLE=1

version=$(sed -n 's/^#define MZ_VERSION_[A-Z]* \([0-9]*\)$/\1/p' \
  "$top/components/componentManager/version.h" | paste -sd.)
linux=$top/build/package-linux
windows=$top/build/package-windows

# compile PRESET: configures and builds.
compile() { (cd "$top" && cmake --preset "$1" && cmake --build --preset "$1"); }

# stage BUILD NAME [OPTION]: installs to BUILD/stage/NAME, the content of an archive.
stage() {
  local folder=$1/stage/$2
  rm -rf "$1/stage"
  cmake --install "$1" --prefix "$folder" "${@:3}"
  find "$folder" -exec touch --no-dereference --date="@$SOURCE_DATE_EPOCH" {} +
}

# The Debian packages and the archive share a build folder: their programs are linked differently,
# but the sources are compiled alike.
make_debian() {
  compile package-debian
  local folder=$linux/debian
  rm -rf "$folder" "$linux"/*.deb
  mkdir -p "$folder"
  cp -R "$top/packaging/debian" "$folder/debian"
  cp "$top/packaging/copyright" "$folder/debian/copyright"
  if [[ "$(head -n 1 "$folder/debian/changelog")" != "libmzcomponentmanager ($version-"* ]]; then
    echo "packaging/debian/changelog does not begin with version $version" >&2
    return 1
  fi
  (cd "$folder" && BUILD=$linux SOURCE=$top debian/rules binary)
  mv "$linux"/*.deb "$output"
}

make_linux_archive() {
  local name=libMZcomponentManager-$version-linux-x86_64
  compile package-linux
  stage "$linux" "$name" --strip
  tar --sort=name --owner=0 --group=0 --numeric-owner --format=gnu -C "$linux/stage" -cf - "$name" |
    gzip -9n >"$output/$name.tar.gz"
}

make_windows() {
  local name=libMZcomponentManager-$version-windows-x86_64
  compile package-windows
  # The linker has stripped the files already. strip would write the present time into each of them.
  stage "$windows" "$name"
  rm -f "$output/$name.zip"
  (cd "$windows/stage" && find "$name" | sort | zip -X -9 -q -@ "$output/$name.zip")
  (cd "$windows" && cpack -G NSIS)
  mv "$windows/$name.exe" "$output"
}

rm -rf "$output"
mkdir -p "$output"
make_debian
make_linux_archive
make_windows
