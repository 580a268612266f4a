#!/usr/bin/env bash
# SPDX-License-Identifier: BSL-1.0
# Makes the site: buildSite.sh OUTPUT. Fails on any warning: a public name without a comment, a
# link that leads nowhere.
set -euo pipefail
top=$(cd "$(dirname "${BASH_SOURCE[0]}")/../.." && pwd)
output=$1
cd "$top"
rm -rf "$output"
mkdir -p "$output"
# The headers that are installed. What stands in rooms is private.
inputs=(docs/README.md README.md SECURITY.md)
# The site shows the guides in the order in which the index names them.
while IFS= read -r guide; do inputs+=("docs/$guide"); done \
  < <(grep -o '](\w[^)/#]*\.md)' docs/README.md | tr -d ']()' | awk '!seen[$0]++')
for guide in docs/*.md; do
  if [[ " ${inputs[*]} " != *" $guide "* ]]; then
    echo "docs/README.md does not name $guide" >&2
    exit 1
  fi
done
inputs+=(examples/README.md examples/*/README.md)
for header in components/*/*.h; do
  case $header in
  components/platform/* | components/objectIO/object[RT]*.h) ;;
  *) inputs+=("$header") ;;
  esac
done
version=$(sed -n 's/^#define MZ_VERSION_[A-Z]* \([0-9]*\)$/\1/p' \
  components/componentManager/version.h | paste -sd.)
{
  cat docs/site/Doxyfile
  printf 'OUTPUT_DIRECTORY = "%s"\nPROJECT_NUMBER = %s\nWARN_LOGFILE = "%s"\n' \
    "$output" "$version" "$output/warnings.txt"
  printf 'INPUT = %s\n' "${inputs[*]}"
} | doxygen -
# What needs no comment of its own: what overrides a documented function, copies, the constructors
# of exceptions, the constants by which casts know an interface, and the macros of exports.
undocumented='is not documented\.$'
plain=' override \(function\)| override=|Member (Self|uid|CastChainLink) |Member (~?\w+|operator=)\((const (\w+(<.*>)? |char \*file)[^)]*)?\)'
plain="$plain|Member MZ_\w+_API|Member MZ_IMPORT"
if grep -vE "($plain).*$undocumented" "$output/warnings.txt" >&2; then exit 1; fi
rm "$output/warnings.txt"
for page in page_streams classMz_1_1QrStream; do
  if ! grep -q '<code>%I64d</code>' "$output/$page.html"; then
    echo "$page.html shows formats without their percent signs" >&2
    exit 1
  fi
done
if grep -l '@section' "$output"/*.html >&2; then
  echo "these pages show a heading as a command" >&2
  exit 1
fi
