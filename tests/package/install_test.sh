#!/usr/bin/env bash
# The amd64 packages of this build, installed into a scratch root and served there
# by lighttpd: the console's page and one command's answer come back.
#   install_test.sh BUILD_DIR
set -euo pipefail
repo=$(cd "$(dirname "${BASH_SOURCE[0]}")/../.." && pwd)
build=$1
scratch=$(mktemp -d "${TMPDIR:-/tmp}/nas-package.XXXXXX")
server=
cleanup() { [ -n "$server" ] && kill "$server" 2>/dev/null; rm -rf "$scratch"; }
trap cleanup EXIT

root=$scratch/root
for deb in $("$repo/scripts/make-deb" amd64 "$build" "$scratch"); do
  dpkg-deb -x "$deb" "$root"
  # Every dependency is installed on this machine, in a version that satisfies it.
  dpkg-deb -f "$deb" Depends | tr ',' '\n' | while read -r name op version; do
    [ -n "$name" ] || continue
    [ "$name" = libnas-platform0 ] && continue
    installed=$(dpkg-query -W -f='${Version}' "$name:amd64")
    version=${version%)}
    dpkg --compare-versions "$installed" "${op#(}" "$version" || { echo "$name $installed does not satisfy $op $version" >&2; exit 1; }
  done
done

port=$(python3 -c 'import socket; s = socket.socket(); s.bind(("127.0.0.1", 0)); print(s.getsockname()[1])')
# As Debian's lighttpd serves it: the cgi module's alias, and the package's own snippet.
sed "s|/usr/share/|$root/usr/share/|" "$root/etc/lighttpd/conf-available/50-nas-accounts.conf" > "$scratch/nas-accounts.conf"
mkdir "$scratch/html"
cat > "$scratch/lighttpd.conf" <<CONF
server.modules = ("mod_alias", "mod_cgi", "mod_setenv")
server.document-root = "$scratch/html"
server.bind = "127.0.0.1"
server.port = $port
server.errorlog = "$scratch/error.log"
index-file.names = ("index.html")
mimetype.assign = (".html" => "text/html")
\$HTTP["url"] =~ "^/cgi-bin/" {
  cgi.assign = ("" => "")
  alias.url += ("/cgi-bin/" => "$root/usr/lib/cgi-bin/")
}
include "$scratch/nas-accounts.conf"
setenv.add-environment = ("LD_LIBRARY_PATH" => "$root/usr/lib/x86_64-linux-gnu")
CONF
lighttpd -D -f "$scratch/lighttpd.conf" &
server=$!
for _ in $(seq 100); do
  curl -s -o /dev/null "http://127.0.0.1:$port/nas-accounts/" && break
  sleep 0.1
done

page=$(curl -sf "http://127.0.0.1:$port/nas-accounts/")
grep -q "<html" <<<"$page" || { echo "no console page: $page" >&2; exit 1; }
answer=$(curl -sf "http://127.0.0.1:$port/cgi-bin/nas-accounts.cgi?cmd=cgi_get_service_info")
grep -q "<cloud_access>0</cloud_access>" <<<"$answer" || { echo "no answer: $answer" >&2; cat "$scratch/error.log" >&2; exit 1; }
echo "ok: the installed program answered on port $port"
