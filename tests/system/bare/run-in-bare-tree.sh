#!/usr/bin/env bash
# SPDX-License-Identifier: Apache-2.0
#
# Runs a command as root in a bare Debian 12: a tree with only the packages that Debian calls required, apt, git and
# ca-certificates. Every run begins with the same tree, and nothing of a run remains, except the files in --share.
#
#   run-in-bare-tree.sh [--clone CHECKOUT] [--share DIR] COMMAND [ARGUMENT]...
#
#   --clone CHECKOUT  makes /src/zepcore, a fresh clone of the checkout's HEAD, and starts the command there; otherwise the
#                     command starts in /root
#   --share DIR       shows the directory DIR as /share
#
# Exit status: that of the command; 125 if the tree cannot be made or entered.
#
# The tree is made once (under a minute) in $ZEP_TESTBED_CACHE, by default zep-testbeds in the temporary directory, from the
# mirror in this machine's configuration of apt. The downloaded packages are kept there, too. The compiler cache (ccache) is the
# caller's; the tree sets no limit to its size, so that it removes no objects of the caller. Needs root, debootstrap, git, and
# the right to mount.
set -euo pipefail
fail() { echo "run-in-bare-tree.sh: $*" >&2; exit 125; }

clone='' share=''
while [[ ${1:-} == --* ]]; do
  case $1 in
    --clone) clone=$(realpath "$2") ;;
    --share) share=$(realpath "$2") ;;
    *) fail "unknown option $1" ;;
  esac
  shift 2
done
[[ $# -gt 0 ]] || fail "a command is missing"
[[ $(id -u) == 0 ]] || fail "only root can mount the tree"
cache=${ZEP_TESTBED_CACHE:-${TMPDIR:-/tmp}/zep-testbeds}/bare
base=$cache/bookworm
archives=$cache/archives
compiler_cache=${CCACHE_DIR:-$HOME/.cache/ccache}

mirror_of_this_machine() {
  local file
  for file in /etc/apt/sources.list.d/*.sources /etc/apt/sources.list; do
    [[ ! -e $file ]] || sed -nE 's/^URIs: *([^ ]+).*/\1/p; s/^deb +(\[[^]]*\] +)?([^ ]+).*/\2/p' "$file"
  done | sed -n 1p
}

# apt in the tree uses the sources and the settings of this machine, without what they do after an installation, and keeps the
# packages. dpkg does not wait for the disk.
configure_apt() {
  rm -rf "$1"/etc/apt/sources.list "$1"/etc/apt/sources.list.d
  cp -a /etc/apt/sources.list.d "$1/etc/apt/"
  [[ ! -e /etc/apt/sources.list ]] || cp /etc/apt/sources.list "$1/etc/apt/"
  cp -a /etc/apt/apt.conf.d/. "$1/etc/apt/apt.conf.d/"
  cp -a /usr/share/keyrings/. "$1/usr/share/keyrings/"
  cat >"$1/etc/apt/apt.conf.d/zz-bare-tree" <<'END'
#clear DPkg::Pre-Invoke;
#clear DPkg::Post-Invoke;
#clear DPkg::Pre-Install-Pkgs;
#clear APT::Update::Pre-Invoke;
#clear APT::Update::Post-Invoke;
#clear APT::Update::Post-Invoke-Success;
APT::Keep-Downloaded-Packages "true";
APT::Sandbox::User "root";
END
  echo force-unsafe-io >"$1/etc/dpkg/dpkg.cfg.d/bare-tree"
}

make_base() {
  local mirror
  mirror=$(mirror_of_this_machine)
  [[ -n $mirror ]] || fail "apt of this machine has no source of packages"
  command -v debootstrap >/dev/null || fail "the package debootstrap is missing"
  rm -rf "$base.new"
  mkdir -p "$base.new" "$archives/partial"
  debootstrap --variant=minbase --include=ca-certificates,git bookworm "$base.new" "$mirror" >"$cache/debootstrap.log" 2>&1 ||
    fail "debootstrap failed: $(tail -n 3 "$cache/debootstrap.log")"
  configure_apt "$base.new"
  mv "$base.new" "$base"
}

mkdir -p "$cache" "$compiler_cache"
exec {lock}>"$cache/lock"
flock "$lock"
[[ -e $base ]] || make_base
exec {lock}>&-

run=$(mktemp -d "$cache/run.XXXXXX")
trap 'rm -rf "$run"' EXIT
mkdir "$run/upper" "$run/work" "$run/root"

# Runs in mount and process namespaces of its own. When this script ends, the kernel kills everything that the command started.
enter() {
  set -e
  mount --make-rprivate /
  mount -t overlay overlay -o "lowerdir=$base,upperdir=$run/upper,workdir=$run/work" "$run/root"
  mount -t proc proc "$run/root/proc"
  mount -t sysfs -o ro sysfs "$run/root/sys"
  mount --rbind /dev "$run/root/dev"
  mkdir -p "$run/root/root/.cache/ccache" "$run/root/share" "$run/root/src"
  mount --bind "$compiler_cache" "$run/root/root/.cache/ccache"
  mount --bind "$archives" "$run/root/var/cache/apt/archives"
  [[ -z $share ]] || mount --bind "$share" "$run/root/share"
  cp /etc/hosts /etc/resolv.conf "$run/root/etc/"
  [[ -z $clone ]] || git -c safe.directory='*' clone --quiet "$clone" "$run/root/src/zepcore"
  touch "$run/entered"
  exec env -i PATH=/usr/local/sbin:/usr/local/bin:/usr/sbin:/usr/bin:/sbin:/bin HOME=/root TERM=dumb LANG=C.UTF-8 \
    DEBIAN_FRONTEND=noninteractive CCACHE_BASEDIR=/src/zepcore CCACHE_MAXSIZE=0 \
    chroot "$run/root" bash -c 'cd "$0" && exec "$@"' "$([[ -n $clone ]] && echo /src/zepcore || echo /root)" "$@"
}
export -f enter
export base archives compiler_cache run share clone
status=0
setpriv --pdeathsig KILL unshare --mount --pid --fork --kill-child bash -c 'enter "$@"' enter "$@" || status=$?
[[ -e $run/entered ]] || fail "the tree cannot be entered; mounting needs a machine or a privileged container"
exit "$status"
