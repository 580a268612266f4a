# SPDX-License-Identifier: BSL-1.0
# shellcheck shell=bash disable=SC2154
# `./run package`: makes the packages twice, compares them, lists their content, and uses them. run
# sources this script, which uses its functions.

packages=$build/package
again=$build/package-again
checks=$build/package-check

need_packaging() {
  need git cmake ninja-build g++ g++-mingw-w64-x86-64-posix wine wine64 libcli11-dev \
    nlohmann-json3-dev librang-dev libseccomp-dev debhelper dpkg-dev lintian nsis zip unzip p7zip-full debootstrap
  if [ "$(id -u)" != 0 ] && ! command -v sudo >/dev/null; then
    echo "failed: the packages are tried on a fresh system, which only root can make; run this as" \
      "root, or install sudo" >&2
    exit 1
  fi
}

# Copies the sources, including changes that are not committed.
copy_sources() {
  mkdir -p "$1"
  (cd "$top" && git ls-files -z --cached --others --exclude-standard |
    xargs -0 tar --ignore-failed-read -cf - | tar -C "$1" -xf -)
}

# Builds everything again in a folder of another name and depth.
build_again() {
  rm -rf "$again"
  copy_sources "$again/in-another-folder"
  "$again/in-another-folder/packaging/buildPackages.sh" "$again/out"
}

same_packages() {
  diff <(ls "$packages") <(ls "$again/out") || return
  local package
  for package in "$packages"/*; do
    case $package in
    *.exe) same_content "$package" "$again/out/${package##*/}" || return ;;
    *) cmp "$package" "$again/out/${package##*/}" || return ;;
    esac
  done
}

# The order of the files in the installer depends on the file system, so compare their content.
same_content() {
  unpack "$1" "$again/first" && unpack "$2" "$again/second" &&
    diff -r "$again/first" "$again/second"
}

describe_packages() {
  local package
  for package in "$packages"/*.{deb,tar.gz,zip,exe}; do
    "$top/packaging/spdx.sh" "$package" >"$package.spdx" || return
  done
  (cd "$packages" && sha256sum -- * >"$build/SHA256SUMS" && mv "$build/SHA256SUMS" .)
}

check_debian() {
  local input=$checks/debian
  rm -rf "$input" && mkdir -p "$input/packages" && cp "$packages"/*.deb "$input/packages" &&
    cp "$top/packaging/checkDebian.sh" "$input" &&
    as_root "$top/packaging/fresh-root.sh" "$build/fresh-root" "$input" checkDebian.sh
}

# As root, lintian must be allowed explicitly to run.
check_lintian() { lintian --allow-root --fail-on error "$packages"/*.deb; }

make_packages() {
  # shellcheck source=packaging/contents.sh
  source "$top/packaging/contents.sh"
  need_packaging
  SOURCE_DATE_EPOCH=$(git -C "$top" log -1 --format=%ct)
  export SOURCE_DATE_EPOCH
  step "building the packages" "$top/packaging/buildPackages.sh" "$packages"
  step "building them again, in another folder" build_again
  step "comparing: the same bytes, and for the installer the same content" same_packages
  rm -rf "$again"
  step "writing what is inside, and checksums" describe_packages
  step "looking for errors in the Debian packages (lintian)" check_lintian
  step "installing, using and removing them on a fresh system" check_debian
  start_wine
  step "using the archives, and the installer under Wine" \
    "$top/packaging/checkArchives.sh" "$packages" "$checks/archives"
  say "made, the same twice, and used; in ${packages#"$PWD"/}:"
  (cd "$packages" && du -h --apparent-size -- *.deb *.tar.gz *.zip *.exe)
  finish "package: made twice alike, and tried; each with an SPDX list, all in SHA256SUMS"
}
