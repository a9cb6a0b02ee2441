#!/usr/bin/env bash
# SPDX-License-Identifier: Apache-2.0
#
# Builds the Debian packages of the source tree in a build directory of their own. Their objects are those of an optimised build,
# in the compiler cache; only the linking is new.
#
#   build-packages.sh SOURCE_DIR BUILD_DIR
set -euo pipefail
cd "$1"
log=$2/packages.log
mkdir -p "$2"
rm -f "$2"/*.deb
run() { "$@" >"$log" 2>&1 || { cat "$log" >&2; exit 1; }; }
run cmake --preset package -B "$2"
run cmake --build "$2" --target package
ls "$2"/*.deb
