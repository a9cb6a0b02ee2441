#!/bin/bash
# SPDX-License-Identifier: Apache-2.0
#
# Runs a command in a network namespace whose Ethernet interface, eth0, reaches a real DHCP server that knows option 252.
# Needs root. Everything is torn down at the end.
#
#   run-in-netns.sh COMMAND [ARG...]        exit status: that of COMMAND
#
# Inside: eth0 10.77.0.2/16 and fd77::2/64, default route over 10.77.0.1; the DHCP server (for 10.77.0.0/24) and a web
# server that serves wpad.dat are at 10.77.0.1, which the names wpad.test and wpad resolve to. COMMAND also gets a process
# namespace of its own ("ps -e" shows only its own processes, and it cannot end a DHCP client of the host) and a /dev of
# its own (a file written there, such as /dev/nul, vanishes with it).
#
# Environment:
#   WPAD_SERVER    isc (default): ISC dhcpd, answers a DHCPINFORM to port 68 of ciaddr
#                  dnsmasq: answers to the port that the request came from, so a client that sends from a free port and
#                  listens on 68 never hears it
#                  bytes: answers to port 68 with the bytes of WPAD_REPLY, whatever they are
#                  none: no DHCP server (every attempt runs into its time-out)
#   WPAD_URL       value of option 252 (default http://wpad.test/wpad.dat); "-" leaves the option out
#   WPAD_REPLY     file of hexadecimal text, for the server "bytes"
#   WPAD_SKIP      how many messages the server "bytes" leaves unanswered first (default 0)
#   WPAD_ADDRESS   address of the interface (default 10.77.0.2); ISC dhcpd is silent for one outside 10.77.0.0/24
#   WPAD_NAME      name of the interface (default eth0)
#   WPAD_FIRST     up or down: there is another eth0 in that state, made before, with the address 10.99.0.2/24 and no
#                  server; needs another WPAD_NAME
#   WPAD_ROUTE     default (default route), none (255.255.255.255 is then unreachable)
#   WPAD_IFCONFIG  net-tools (default: whatever is installed) or busybox: which ifconfig comes first on the PATH; only
#                  busybox prints "inet6 addr: "
#   WPAD_DHCLIENT  1: a sleeping process named "dhclient" runs beside COMMAND
# Set for COMMAND: ZEP_WPAD_INSIDE=1, ZEP_WPAD_URL, ZEP_WPAD_LOG (the DHCP server's log so far; that of the server "bytes"
# has every message as a line of hexadecimal text).
set -eu
fail() { echo "run-in-netns.sh: $*" >&2; exit 1; }
[ $# -ge 1 ] || { sed -n '2,/^set -eu/s/^# \{0,1\}//p' "$0" >&2; exit 2; }
[ "$(id -u)" = 0 ] || fail "needs root"
kind=${WPAD_SERVER:-isc}; url=${WPAD_URL:-http://wpad.test/wpad.dat}
for t in ip unshare python3; do command -v $t >/dev/null || fail "no $t"; done
case $kind in
  isc) command -v dhcpd >/dev/null || fail "no dhcpd (package isc-dhcp-server)" ;;
  dnsmasq) command -v dnsmasq >/dev/null || fail "no dnsmasq (package dnsmasq-base)" ;;
  bytes) [ -e "${WPAD_REPLY:-}" ] || fail "no WPAD_REPLY" ;;
  none) ;;
  *) fail "WPAD_SERVER: isc, dnsmasq, bytes or none" ;;
esac
[ "${WPAD_IFCONFIG:-}" != busybox ] || command -v busybox >/dev/null || fail "no busybox"

here=$(cd "$(dirname "$0")" && pwd); name=${WPAD_NAME:-eth0}; tmp=$(mktemp -d); dhcp=; web=; child=; s=zepwpad-s-$$; c=zepwpad-c-$$
cleanup() {
  trap - EXIT INT TERM
  for p in $child $dhcp $web; do kill "$p" 2>/dev/null || true; wait "$p" 2>/dev/null || true; done
  ip netns del "$c" 2>/dev/null || true
  ip netns del "$s" 2>/dev/null || true
  rm -rf "$tmp"
}
trap cleanup EXIT; trap 'exit 130' INT; trap 'exit 143' TERM

ip netns add "$s"; ip netns add "$c"
if [ -n "${WPAD_FIRST:-}" ]; then
  ip -n "$c" link add eth0 type veth peer name far0 || fail "no veth pair"
  ip -n "$c" addr add 10.99.0.2/24 dev eth0
  ip -n "$c" link set far0 up; ip -n "$c" link set eth0 "$WPAD_FIRST"
fi
ip -n "$s" link add srv0 type veth peer name "$name" netns "$c" || fail "no veth pair"
ip -n "$s" addr add 10.77.0.1/16 dev srv0
ip -n "$s" addr add fd77::1/64 dev srv0 nodad
ip -n "$c" addr add "${WPAD_ADDRESS:-10.77.0.2}/16" broadcast 10.77.255.255 dev "$name"
ip -n "$c" addr add fd77::2/64 dev "$name" nodad
for n in "$s" "$c"; do ip -n "$n" link set lo up; done
ip -n "$s" link set srv0 up; ip -n "$c" link set "$name" up
for _ in $(seq 400); do   # carrier comes a moment after "up"; other namespaces that come and go are complained of
  ip -n "$c" -o link show "$name" 2>/dev/null | grep -q 'state UP' && break
  sleep 0.02
done
[ "${WPAD_ROUTE:-default}" = none ] || ip -n "$c" route add default via 10.77.0.1

log=$tmp/dhcp.log; : > "$log"
case $kind in
  isc)
    {
      echo 'authoritative;'   # without it a DHCPINFORM gets no answer
      echo 'option wpad-url code 252 = text;'
      [ "$url" = - ] || echo "option wpad-url \"$url\";"
      echo "${WPAD_EXTRA:-}"
      echo 'subnet 10.77.0.0 netmask 255.255.255.0 { range 10.77.0.100 10.77.0.150; }'
    } > "$tmp/dhcpd.conf"
    : > "$tmp/leases"
    ip netns exec "$s" dhcpd -4 -f -d --no-pid -cf "$tmp/dhcpd.conf" -lf "$tmp/leases" srv0 >> "$log" 2>&1 &
    dhcp=$!; ready='Server starting service' ;;
  dnsmasq)
    {
      printf '%s\n' port=0 interface=srv0 bind-interfaces dhcp-authoritative log-dhcp log-facility=- \
        keep-in-foreground user=root "dhcp-leasefile=$tmp/leases" dhcp-range=10.77.0.100,10.77.0.150,255.255.255.0,1h
      [ "$url" = - ] || echo "dhcp-option=252,\"$url\""
      echo "${WPAD_EXTRA:-}"
    } > "$tmp/dnsmasq.conf"
    ip netns exec "$s" dnsmasq -C "$tmp/dnsmasq.conf" >> "$log" 2>&1 &
    dhcp=$!; ready='sockets bound exclusively' ;;
  bytes)
    ip netns exec "$s" python3 "$here/answer.py" "$WPAD_REPLY" "${WPAD_SKIP:-0}" >> "$log" 2>&1 &
    dhcp=$!; ready='listening' ;;
esac
if [ -n "$dhcp" ]; then
  for _ in $(seq 400); do
    grep -q "$ready" "$log" && break
    kill -0 "$dhcp" 2>/dev/null || { cat "$log" >&2; fail "the DHCP server did not start"; }
    sleep 0.05
  done
  grep -q "$ready" "$log" || { cat "$log" >&2; fail "the DHCP server is not ready"; }
fi
mkdir "$tmp/www" "$tmp/bin" "$tmp/dev"
echo 'function FindProxyForURL(url, host) { return "PROXY 10.77.0.1:3128"; }' > "$tmp/www/wpad.dat"
ip netns exec "$s" python3 -m http.server --bind 10.77.0.1 --directory "$tmp/www" 80 > "$tmp/web.log" 2>&1 & web=$!
for _ in $(seq 400); do [ -n "$(ip netns exec "$s" ss -Hlnt 'sport = :80')" ] && break; sleep 0.05; done
[ -n "$(ip netns exec "$s" ss -Hlnt 'sport = :80')" ] || fail "no web server"

printf '127.0.0.1 localhost\n10.77.0.1 wpad.test wpad\n' > "$tmp/hosts"
printf 'nameserver 10.77.0.1\noptions timeout:1 attempts:1\n' > "$tmp/resolv.conf"
[ "${WPAD_IFCONFIG:-}" != busybox ] || ln -s "$(command -v busybox)" "$tmp/bin/ifconfig"
cp "$(command -v sleep)" "$tmp/bin/dhclient"
cat > "$tmp/inside" <<'END'
tmp=$1; shift
mount --make-rprivate /
mount -t tmpfs -o mode=755 tmpfs "$tmp/dev"
for n in null zero full random urandom tty; do : > "$tmp/dev/$n"; mount --bind "/dev/$n" "$tmp/dev/$n"; done
mkdir "$tmp/dev/pts" "$tmp/dev/shm"
mount --bind /dev/pts "$tmp/dev/pts" 2>/dev/null || true
mount -t tmpfs tmpfs "$tmp/dev/shm"
ln -s pts/ptmx "$tmp/dev/ptmx"; ln -s /proc/self/fd "$tmp/dev/fd"
for n in 0:stdin 1:stdout 2:stderr; do ln -s "/proc/self/fd/${n%:*}" "$tmp/dev/${n#*:}"; done
mount --move "$tmp/dev" /dev
for f in hosts resolv.conf; do [ ! -e "/etc/$f" ] || mount --bind "$tmp/$f" "/etc/$f"; done
[ -z "${WPAD_DHCLIENT:-}" ] || "$tmp/bin/dhclient" 86400 < /dev/null > /dev/null 2>&1 &
PATH=$tmp/bin:$PATH
status=0; "$@" || status=$?   # no exec: this shell, process 1 here, also reaps orphans
exit "$status"
END
export ZEP_WPAD_INSIDE=1 ZEP_WPAD_URL=$url ZEP_WPAD_LOG=$log
ip netns exec "$c" unshare --mount --pid --fork --mount-proc --kill-child \
  bash -e "$tmp/inside" "$tmp" "$@" <&0 &
child=$!; status=0; wait "$child" || status=$?; child=
exit "$status"
