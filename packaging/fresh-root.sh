#!/usr/bin/env bash
# SPDX-License-Identifier: BSL-1.0
# Runs a script in a fresh minimal Debian system and removes the system afterwards.
#   fresh-root.sh CACHE FOLDER SCRIPT [ARGUMENTS…]
# FOLDER is copied to /input there, which is the working folder. Needs root for chroot, and for
# debootstrap, which makes the system once in the folder CACHE. CACHE also keeps what apt downloads.
set -euo pipefail
cache=$1 input=$2
shift 2
if [ "$(id -u)" != 0 ]; then
  echo "fresh-root.sh must be run by root, for debootstrap and chroot" >&2
  exit 1
fi
suite=bookworm

# Prints the mirror that this machine uses.
mirror() {
  # shellcheck disable=SC2016 # apt replaces these
  apt-get indextargets --format '$(REPO_URI) $(RELEASE)' 'Created-By: Packages' |
    awk -v suite=$suite '$2 == suite && $1 ~ /\/debian\/*$/ { print $1; exit }'
}

if [ ! -e "$cache/made" ]; then
  rm -rf --one-file-system "$cache"
  mkdir -p "$cache/archives"
  debootstrap --variant=minbase --include=ca-certificates $suite "$cache/base" "$(mirror)"
  touch "$cache/made"
fi

root=$(mktemp -d "$cache/root.XXXXXX")
finish() {
  local folder
  for folder in var/cache/apt/archives proc dev/shm dev/pts dev; do
    if mountpoint -q "$root/$folder"; then umount -l "$root/$folder"; fi
  done
  rm -rf --one-file-system "$root"
}
trap finish EXIT
cp -a "$cache/base/." "$root"
mount --bind "$cache/archives" "$root/var/cache/apt/archives"
mount -t proc proc "$root/proc"
mount --bind /dev "$root/dev"
mount --bind /dev/pts "$root/dev/pts"
mount -t tmpfs shm "$root/dev/shm"

# Copy the network and proxy settings of this machine.
cp /etc/resolv.conf /etc/hosts "$root/etc"
apt-config dump | grep -E '^Acquire::(https?|Check)' >"$root/etc/apt/apt.conf.d/90host" || true

cp -R "$input" "$root/input"
env -i HOME=/root LANG=C.UTF-8 DEBIAN_FRONTEND=noninteractive \
  PATH=/usr/local/sbin:/usr/local/bin:/usr/sbin:/usr/bin:/sbin:/bin \
  chroot "$root" /bin/bash -c 'cd /input && exec /bin/bash "$@"' fresh-root "$@"
