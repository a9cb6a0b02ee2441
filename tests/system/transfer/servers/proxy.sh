#!/bin/bash
# SPDX-License-Identifier: Apache-2.0
#
# A private HTTP proxy (tinyproxy, with a password) and a tiny web server behind it,
# both on loopback.
#
#   proxy.sh PROXYPORT WEBPORT [COMMAND [ARG...]]
#
# A port of 0 picks a free one. The proxy wants the user "zep" with the password
# "secret" (PROXY_AUTH=none: no password) and hands every plain http:// request, whatever
# its host name, to the web server: no name is resolved, nothing leaves the machine.
#
# With COMMAND: runs it with ZEP_PROXY_HOST, ZEP_PROXY_PORT, ZEP_PROXY_USERPWD,
# ZEP_WEB_PORT and ZEP_WEB_LOG (one line per request that reached the web server) set,
# stops both and returns the command's exit status. Without: prints "pid=... webpid=...
# port=... webport=..." and serves until it gets SIGTERM or SIGINT.
#
# Environment: WEB_PAGE (the file served; default a one-line page), WEB_LOG, PROXY_LOG,
# PROXY_DIRECT=1 (no parent: the proxy resolves and connects by itself, so that only
# http://127.0.0.1:WEBPORT/ works and an unknown host name gives its error page).
set -eu
fail() { echo "proxy.sh: $*" >&2; exit 1; }
[ $# -ge 2 ] || { sed -n '2,20s/^# \{0,1\}//p' "$0" >&2; exit 2; }
port=$1; webport=$2; shift 2
case $port$webport in *[!0-9]*|"") fail "not a port: $port $webport" ;; esac
here=$(cd "$(dirname "$0")" && pwd)
for t in tinyproxy ss python3; do command -v $t >/dev/null || fail "no $t"; done
free_port() { python3 -c 'import socket
s = socket.socket(); s.bind(("127.0.0.1", 0)); print(s.getsockname()[1])'; }
[ "$port" != 0 ] || port=$(free_port)
[ "$webport" != 0 ] || webport=$(free_port)
listening() { [ -n "$(ss -Hlnt "sport = :$1")" ]; }
! listening "$port" || fail "port $port is taken"
! listening "$webport" || fail "port $webport is taken"

tmp=$(mktemp -d); proxy=; web=; child=
cleanup() {
  trap - EXIT INT TERM
  [ -z "$child" ] || kill "$child" 2>/dev/null || true
  for p in $proxy $web; do kill "$p" 2>/dev/null || true; wait "$p" 2>/dev/null || true; done
  rm -rf "$tmp"
}
trap cleanup EXIT; trap 'exit 130' INT; trap 'exit 143' TERM
page=${WEB_PAGE:-$tmp/page.html}
[ -n "${WEB_PAGE:-}" ] || echo '<html><body>zep test page</body></html>' > "$page"
weblog=${WEB_LOG:-$tmp/web.log}; : > "$weblog"
log=${PROXY_LOG:-$tmp/proxy.log}; : > "$log"

cat > "$tmp/tinyproxy.conf" <<END
Listen 127.0.0.1
Port $port
Allow 127.0.0.1
Timeout 60
LogFile "$log"
LogLevel Connect
MaxClients 20
ViaProxyName "zep-test"
END
[ "${PROXY_AUTH:-}" = none ] || echo 'BasicAuth zep secret' >> "$tmp/tinyproxy.conf"
[ -n "${PROXY_DIRECT:-}" ] || echo "Upstream http 127.0.0.1:$webport" >> "$tmp/tinyproxy.conf"

python3 "$here/web.py" "$webport" "$page" "$weblog" & web=$!
tinyproxy -d -c "$tmp/tinyproxy.conf" > "$tmp/out" 2>&1 & proxy=$!
for _ in $(seq 400); do
  listening "$port" && listening "$webport" && break
  kill -0 "$proxy" 2>/dev/null || { cat "$tmp/out" "$log" >&2; fail "tinyproxy did not start"; }
  kill -0 "$web" 2>/dev/null || fail "the web server did not start"
  sleep 0.05
done
listening "$port" && listening "$webport" || fail "not listening"

if [ $# -gt 0 ]; then
  export ZEP_PROXY_HOST=127.0.0.1 ZEP_PROXY_PORT=$port ZEP_PROXY_USERPWD=zep:secret \
         ZEP_WEB_PORT=$webport ZEP_WEB_LOG=$weblog
  "$@" <&0 &
  child=$!; status=0; wait "$child" || status=$?; child=
  exit "$status"
fi
echo "pid=$proxy webpid=$web port=$port webport=$webport"
wait "$proxy"
