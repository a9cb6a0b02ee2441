#!/usr/bin/env bash
# SPDX-License-Identifier: Apache-2.0
#
# Makes packages debug/NAME-dbgsym_*.deb, as Debian has them, of those that CPack made as NAME-dbgsym_*.ddeb: with checksums of the
# paths in the package, plain files, and the documents of the package NAME.
#
#   debug-packages.sh DIRECTORY
set -euo pipefail
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT

rm -rf "$1/debug"
mkdir "$1/debug"
for file in "$1"/*.ddeb; do
  tree=$work/$(basename "$file" .ddeb)
  name=$(dpkg-deb --field "$file" Package)
  dpkg-deb --raw-extract "$file" "$tree"
  mkdir -p "$tree/usr/share/doc"
  ln -s "${name%-dbgsym}" "$tree/usr/share/doc/$name"
  find "$tree" -type f -exec chmod 644 {} +
  (cd "$tree" && find usr -type f -print0 | sort -z | xargs -0 md5sum >DEBIAN/md5sums)
  dpkg-deb --root-owner-group -Zgzip -z6 --build "$tree" "$1/debug/$(basename "$file" .ddeb).deb" >/dev/null
  rm "$file"
done
