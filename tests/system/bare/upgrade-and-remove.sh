#!/usr/bin/env bash
# SPDX-License-Identifier: Apache-2.0
#
# Upgrades the installed packages of zepcore to a next version, in which a setting and the plug-ins of the user must still work, and
# then purges them: nothing may remain but what the user made. Runs as root in a bare tree (run-in-bare-tree.sh) in which the
# packages, which are in the current directory, and a plug-in Clock of the user are installed.
#
#   upgrade-and-remove.sh PLUG_IN    another plug-in of the user
#
# The next version has the same files under a higher version number.
set -euo pipefail
export LC_ALL=C
plug_in=$1
fail() { echo "upgrade-and-remove.sh: $*" >&2; exit 1; }

mapfile -t ours < <(for file in ./*.deb; do dpkg-deb --field "$file" Package; done | sort)
mapfile -t installed < <(dpkg-query -W -f '${db:Status-Status} ${Package}\n' "${ours[@]}" 2>/dev/null | sed -n 's/^installed //p')
libraries=$(dirname "$(dpkg --listfiles libzepcore1 | grep '/libzepcore\.so\.1$')")
version=$(dpkg-query -W -f '${Version}' libzepcore1)
next=$version.1

# Makes the next version of an installed package in next/.
make_next() {  # make_next NAME
  local tree=next/$1
  dpkg-deb --raw-extract ./"$1"_*.deb "$tree"
  sed -i "s/^Version: $version$/Version: $next/; s/(= $version)/(= $next)/g" "$tree/DEBIAN/control"
  find "$tree" -name "libzepcore.so.$version" -execdir mv '{}' "libzepcore.so.$next" \;
  find "$tree" -name libzepcore.so.1 -type l -execdir ln -sf "libzepcore.so.$next" '{}' \;
  rm "$tree/DEBIAN/md5sums"
  dpkg-deb --root-owner-group -Zgzip -z1 --build "$tree" next/ >/dev/null
  rm -r "$tree"
}

# The user's plug-ins: one copied to the directory of the library, and one elsewhere to which a link leads. And a setting.
make_things_of_the_user() {
  mkdir -p /usr/local/lib/zepcore /root/things
  cp "$plug_in" /usr/local/lib/zepcore/libLinked.nsp.so
  ln -s /usr/local/lib/zepcore/libLinked.nsp.so "$libraries/libLinked.nsp.so"
  echo 'finding-disk-used-percent=77' >/root/things/zep.cfg
}

check_things_of_the_user() {
  (cd /root/things && zep config >shown && grep -q 'finding-disk-used-percent.*77' shown) || fail "the setting is lost $1"
  zep plugins >/root/things/shown || true  # plug-ins of this tree may fail
  for name in Clock Linked Host; do
    grep -q "^lib$name\.nsp\.so .* filled " /root/things/shown || { cat /root/things/shown; fail "the plug-in $name is lost $1"; }
  done
  zep classes --plugin "$libraries/libClock.nsp.so" >/root/things/shown || true
  grep -q '^X_Clock ' /root/things/shown || fail "the plug-in Clock does not work $1"
}

upgrade() {
  mkdir next
  for name in "${installed[@]}"; do make_next "$name"; done
  apt-get install -y -qq ./next/*.deb >apt.log 2>&1 || { cat apt.log; fail "the upgrade fails"; }
  [[ $(dpkg-query -W -f '${Version}' libzepcore1) == "$next" ]] || fail "libzepcore1 is not upgraded"
  [[ ! -e $libraries/libzepcore.so.$version ]] || fail "the library of the earlier version remains"
}

purge() {
  dpkg --listfiles "${installed[@]}" | grep / | sort -u >listed
  apt-get purge -y -qq "${installed[@]}" >apt.log 2>&1 || { cat apt.log; fail "the packages are not purged"; }
  local file
  while read -r file; do
    [[ ! -f $file && ! -L $file ]] || fail "$file remains"
  done <listed
}

check_that_only_things_of_the_user_remain() {
  find / -xdev \( -path /root -o -path /share -o -path /proc -o -path /sys -o -path /src -o -path /dev -o -path /var/cache/apt \) \
    -prune -o \( -name '*zepcore*' -o -name 'zep[.-]*' -o -name zep -o -name _zep \) -print | sort >remaining
  diff - remaining <<<"$(printf '%s\n' "$libraries" /usr/local/lib/zepcore | sort)" || fail "these remain, too"
  diff - <(ls "$libraries") <<<$'libClock.nsp.so\nlibLinked.nsp.so' || fail "the directory of the plug-ins is wrong"
  grep -qx 'finding-disk-used-percent=77' /root/things/zep.cfg || fail "the file of the settings is lost"
}

make_things_of_the_user
check_things_of_the_user "before the upgrade"
upgrade
check_things_of_the_user "after the upgrade"
purge
check_that_only_things_of_the_user_remain
echo "Upgrade of ${#installed[@]} packages from $version to $next and removal: the things of the user remain, and nothing else."
