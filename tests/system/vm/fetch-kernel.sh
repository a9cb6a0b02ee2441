#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
#
# Fetches a Debian kernel with its modules through apt and unpacks it (nothing
# is installed) into the cache that run-in-vm.sh reads.
#
#   fetch-kernel.sh [cloud|full]      default: full
#
# "cloud" (linux-image-cloud-amd64): enough for SMBIOS tests, no modules needed.
# "full"  (linux-image-amd64): also USB, SCSI, CD-ROM, IPMI and gadget drivers.
#
# Cache: $ZEP_TESTBED_CACHE, else ${TMPDIR:-/tmp}/zep-testbeds.
# Needs: apt-get, dpkg-deb, depmod (package kmod). Where apt has no lists of packages
# yet, root fetches them.
set -eu
kind=${1:-full}
case $kind in
  cloud) meta=linux-image-cloud-amd64 ;;
  full)  meta=linux-image-amd64 ;;
  *) echo "usage: $0 [cloud|full]" >&2; exit 2 ;;
esac
cache=${ZEP_TESTBED_CACHE:-${TMPDIR:-/tmp}/zep-testbeds}
dest=$cache/kernel-$kind
if [ -e "$dest/ok" ]; then echo "$dest"; exit 0; fi
for tool in apt-get apt-cache dpkg-deb depmod; do
  PATH=$PATH:/usr/sbin:/sbin command -v $tool >/dev/null ||
    { echo "$0: $tool is missing" >&2; exit 1; }
done
package() { apt-cache depends "$meta" 2>/dev/null | sed -n 's/^ *Depends: \(linux-image-[0-9].*\)$/\1/p' | head -n 1; }
pkg=$(package)
[ -n "$pkg" ] || [ "$(id -u)" != 0 ] || { apt-get -qq update && pkg=$(package); }
[ -n "$pkg" ] || { echo "$0: $meta is unknown; run apt-get update first" >&2; exit 1; }
mkdir -p "$(dirname "$dest")"
[ ! -e "$dest" ] || rm -rf "$dest"  # without its mark it is not whole
new=$(mktemp -d "$dest.XXXXXX")  # others may fetch it at the same time
cd "$new"
apt-get -qq -o APT::Sandbox::User=root download "$pkg"
dpkg-deb -x "$pkg"_*.deb .
rm -f "$pkg"_*.deb
release=$(cd lib/modules && echo *)
PATH=$PATH:/usr/sbin:/sbin depmod -b . "$release"
ln -s "boot/vmlinuz-$release" vmlinuz
echo "$release" > release
: > ok
if ! mv -T "$new" "$dest" 2>/dev/null; then
  [ -e "$dest/ok" ] || { echo "$0: $dest is in the way" >&2; exit 1; }
  rm -rf "$new"
fi
echo "$dest"
