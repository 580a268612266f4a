#!/usr/bin/env bash
# SPDX-License-Identifier: BSL-1.0
# Writes an SPDX 2.3 document (tag-value) that lists a package's files with checksums and licences.
#   spdx.sh PACKAGE >PACKAGE.spdx
set -euo pipefail
here=$(cd "$(dirname "${BASH_SOURCE[0]}")" && pwd)
# shellcheck source=packaging/contents.sh
source "$here/contents.sh"
export LC_ALL=C.UTF-8

# license FILE: prints the licences of its content. Binaries contain third-party code; see
# `copyright`.
license() {
  local startup=
  case $1 in
  *.dll | *.exe) startup=' AND ZPL-2.1' ;;
  esac
  case $1 in
  */libstdc++-6.dll | */libgcc_s_seh-1.dll) echo 'GPL-3.0-or-later WITH GCC-exception-3.1' ;;
  */libwinpthread-1.dll) echo 'MIT AND BSD-3-Clause' ;;
  */\$PLUGINSDIR/* | */Uninstall.exe) echo 'Zlib' ;;
  */GPL-3.txt | */copyright) echo NOASSERTION ;;
  *.dll.a | *.so | *.so.0) echo 'BSL-1.0' ;;
  */libMZcomponentTools.* | */mzcomponents-probe*) echo "BSL-1.0 AND MIT AND Unlicense$startup" ;;
  */bin/mzcomponents | */bin/mzcomponents.exe) echo "BSL-1.0 AND BSD-3-Clause AND MIT$startup" ;;
  *.debug) echo 'BSL-1.0 AND BSD-3-Clause AND MIT AND Unlicense' ;;
  *) echo "BSL-1.0$startup" ;;
  esac
}

package=$(realpath "$1")
name=${package##*/}
version=$(sed -n 's/^#define MZ_VERSION_[A-Z]* \([0-9]*\)$/\1/p' \
  "$here/../components/componentManager/version.h" | paste -sd.)
folder=$(mktemp -d)
trap 'rm -rf "$folder"' EXIT
unpack "$package" "$folder/content"
cd "$folder/content"
find . -type f | sort >"$folder/files"

sum() { "$1sum" -- "$2" | cut -d' ' -f1; }
while IFS= read -r file; do sum sha1 "$file"; done <"$folder/files" | sort | tr -d '\n' \
  >"$folder/sums"

cat <<EOF
SPDXVersion: SPDX-2.3
DataLicense: CC0-1.0
SPDXID: SPDXRef-DOCUMENT
DocumentName: $name
DocumentNamespace: https://mzcomponentmanager.invalid/spdx/$name-$(sum sha256 "$package")
Creator: Organization: libMZcomponentManager authors
Created: $(date -u -d "@$SOURCE_DATE_EPOCH" +%Y-%m-%dT%H:%M:%SZ)
Relationship: SPDXRef-DOCUMENT DESCRIBES SPDXRef-Package

PackageName: ${name%%[-_][0-9]*}
SPDXID: SPDXRef-Package
PackageVersion: $version
PackageFileName: $name
PackageSupplier: Organization: libMZcomponentManager authors
PackageDownloadLocation: NOASSERTION
FilesAnalyzed: true
PackageVerificationCode: $(sum sha1 "$folder/sums")
PackageChecksum: SHA256: $(sum sha256 "$package")
PackageLicenseConcluded: $(while IFS= read -r file; do license "$file"; done <"$folder/files" |
  grep -v NOASSERTION | sed 's/ AND /\n/g' | sort -u | paste -sd'&' | sed 's/&/ AND /g')
PackageLicenseInfoFromFiles: NOASSERTION
PackageLicenseDeclared: BSL-1.0
PackageCopyrightText: NOASSERTION
EOF
number=0
while IFS= read -r file; do
  number=$((number + 1))
  cat <<EOF

FileName: $file
SPDXID: SPDXRef-File$number
FileChecksum: SHA1: $(sum sha1 "$file")
FileChecksum: SHA256: $(sum sha256 "$file")
LicenseConcluded: $(license "$file")
LicenseInfoInFile: NOASSERTION
FileCopyrightText: NOASSERTION
EOF
done <"$folder/files"
