#!/usr/bin/env bash
# SPDX-License-Identifier: BSL-1.0
# Installs, uses and removes the Debian packages. Must run on a fresh system, in a folder that
# contains packages/. What it builds is the example in the development package.
set -euo pipefail
install() { apt-get install -y -qq --no-install-recommends "$@"; }

fail() {
  echo "failed: $*" >&2
  exit 1
}

# says EXPECTED COMMAND…: fails unless the command prints exactly that.
says() {
  local expected=$1 said
  shift
  said=$("$@") || fail "$* ended with $?"
  [ "$said" = "$expected" ] || fail "$* said: $said"
}

# Lists all files of the system, except mounted folders, /tmp, and the records of apt and dpkg.
list_files() {
  find / -xdev \( -path /proc -o -path /sys -o -path /dev -o -path /input -o -path /tmp \
    -o -path /var/lib/apt -o -path /var/lib/dpkg -o -path /var/cache -o -path /var/log \) -prune -o \
    -type d -printf '%p %y %m %U %G\n' -o \
    ! -path /etc/ld.so.cache -printf '%p %y %m %U %G %s %l\n' | sort
}

apt-get update -qq
echo "== the command line alone, on a minimal system"
list_files >/tmp/minimal
install ./packages/mzcomponents_*.deb ./packages/libmzcomponentmanager0_*.deb
mzcomponents --version
says "notALibrary" bash -c 'mzcomponents explain /etc/passwd | sed -n "s/^[^ ]*: //p"; true'
apt-get purge -y -qq --autoremove mzcomponents libmzcomponentmanager0
list_files | diff /tmp/minimal - || fail "removal leaves the files above"

echo "== everything, where there is a compiler"
install cmake g++ make pkg-config
list_files >/tmp/before
install ./packages/*.deb

hello=/usr/share/doc/libmzcomponentmanager-dev/examples/hello
cmake -S $hello -B /tmp/hello
cmake --build /tmp/hello
says "Hello, world!" /tmp/hello/helloHost /tmp/hello/components

mkdir -p /tmp/byHand/components
read -ra flags <<<"$(pkg-config --cflags --libs MZcomponentManager)"
g++ -std=c++20 $hello/helloHost.cpp -o /tmp/byHand/helloHost "${flags[@]}"
read -ra component_flags <<<"$(pkg-config --variable=component_flags MZcomponentManager)"
g++ -std=c++20 "${component_flags[@]}" $hello/helloComponent.cpp \
  -o /tmp/byHand/components/hello.so "${flags[@]}"
says "Hello, world!" /tmp/byHand/helloHost /tmp/byHand/components

# A scan works only if the probe is found: it loads the component in a separate process.
mzcomponents list --path /tmp/byHand/components | grep -Eq '^component +/tmp/byHand/components/hello\.so$' ||
  fail "mzcomponents list does not show the component"
mzcomponents scan --path /tmp/byHand/components --cache /tmp/byHand/list |
  grep -Eq '^works +/tmp/byHand/components/hello\.so$' || fail "mzcomponents scan does not load it"

# Debuggers find the symbols by the build ID of each binary.
for file in /usr/bin/mzcomponents /usr/lib/*/libMZ*.so.0 /usr/lib/*/mzcomponents-probe; do
  id=$(readelf -n "$file" | sed -n 's/.*Build ID: //p')
  [ -s "/usr/lib/debug/.build-id/${id:0:2}/${id:2}.debug" ] || fail "no debug symbols for $file"
done

apt-get purge -y -qq '?name(mzcomponent)' >/dev/null
list_files | diff /tmp/before - || fail "removal leaves the files above"
echo "== installed, used and removed"
