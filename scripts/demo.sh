#!/usr/bin/env bash
# Installs the dependencies, builds the library and the ofxkit tool, then runs
# a statement download over HTTPS with no network: `ofxkit serve` answers on
# the loopback interface with a certificate authority it makes, `ofxkit
# exchange` posts a sign-on + bank statement request trusting only that
# authority, and the statement is printed as CSV.
set -euo pipefail
cd "$(dirname "$0")/.."
scripts/install-deps.sh
cmake -S . -B build -DCMAKE_BUILD_TYPE=RelWithDebInfo
cmake --build build -j2 --target ofxkit_cli ofxkit_values_demo
work=$(mktemp -d)
server=
cleanup() {
  [ -n "$server" ] && kill "$server" 2> /dev/null && wait "$server" 2> /dev/null
  rm -rf "$work"
}
trap cleanup EXIT
ofxkit=build/tools/ofxkit
echo "== server: a bank on https://127.0.0.1 (its password comes from a pipe, never echoed)"
echo "demo-password" | "$ofxkit" serve --https --cert-out "$work/authority.der" --ready-file "$work/url" \
  --user alice --password-stdin --transactions 12 --max-requests 1 --max-seconds 120 2> "$work/server.log" &
server=$!
for _ in $(seq 300); do [ -s "$work/url" ] && break; sleep 0.1; done
url=$(cat "$work/url")
echo "== request: sign-on + bank statement request"
echo "demo-password" | "$ofxkit" request statement --org "Demo Bank" --fid 1234 --user alice --password-stdin \
  --bank-id 121000248 --account 1001 --type CHECKING --start 20261101 --end 20261123 -o "$work/request.ofx"
echo "== exchange: POST over HTTPS, trusting only the server's authority"
"$ofxkit" exchange "$work/request.ofx" "$url" --trust "$work/authority.der" -o "$work/response.ofx" \
  > "$work/dump.txt"
wait "$server"
server=
echo "== the server's log"
cat "$work/server.log"
head -30 "$work/dump.txt"
echo "== the statement as CSV"
"$ofxkit" statement "$work/response.ofx"
