# SPDX-License-Identifier: Apache-2.0

# Functions that the scripts share: installing packages, and building. Sourcing this file changes to the root directory.

cd "$(dirname "${BASH_SOURCE[0]}")/.."
install=yes

# Removes --no-install from the arguments and stores the others in `arguments`.
parse_common_arguments() {
  arguments=()
  for argument in "$@"; do
    if [[ $argument == --no-install ]]; then install=no; else arguments+=("$argument"); fi
  done
}

# Installs the missing packages of the given jobs and prints their names. With --no-install it only prints them.
need_packages() {
  local job package missing=()
  for job in "$@"; do
    for package in $(sed -n "s/^$job: //p" scripts/packages); do
      dpkg-query -W -f '${Status}' "$package" 2>/dev/null | grep -q 'ok installed' || missing+=("$package")
    done
  done
  [[ ${#missing[@]} -gt 0 ]] || return 0
  if [[ $install == no ]]; then
    echo "Missing packages, not installed because of --no-install: ${missing[*]}" >&2
    return 0
  fi
  local as_root=()
  [[ $(id -u) == 0 ]] || as_root=(sudo)
  if [[ ${#as_root[@]} -gt 0 ]] && ! command -v sudo >/dev/null; then
    echo "Packages are missing, and sudo is not installed. Run as root: apt-get install ${missing[*]}" >&2
    return 1
  fi
  echo "Installing missing packages: ${missing[*]}"
  "${as_root[@]}" apt-get update -qq
  "${as_root[@]}" env DEBIAN_FRONTEND=noninteractive apt-get install -y -qq --no-install-recommends "${missing[@]}" >/dev/null
}

# Configures a preset: configure PRESET. The output goes to build/PRESET/configure.log, and is printed when that fails. When
# `with_tests` is OFF, the tests are not built, which needs fewer packages.
with_tests=ON
configure() {
  local log=build/$1/configure.log
  mkdir -p "$(dirname "$log")"
  cmake --preset "$1" -DZEP_BUILD_TESTS="$with_tests" >"$log" 2>&1 || { cat "$log"; return 1; }
}

# Configures and builds a preset: build PRESET [TARGET...].
build() {
  local preset=$1
  shift
  configure "$preset" || return
  cmake --build --preset "$preset" ${1:+--target "$@"}
}
