#!/usr/bin/env bash
# Installs the dependencies, builds the library and the ofxkit tool, then runs
# a whole first contact with a bank over HTTPS with no network: `ofxkit serve`
# answers on the loopback interface with a certificate authority it makes;
# the tool asks for the institution's profile, then for the accounts the user
# holds there, then for a statement of each account (bank, card and
# brokerage), each posted with `ofxkit exchange` trusting only that authority.
set -euo pipefail
cd "$(dirname "$0")/.."
[ "${OFXKIT_DEMO_NO_SETUP:-}" = 1 ] || scripts/install-deps.sh
[ "${OFXKIT_DEMO_NO_SETUP:-}" = 1 ] || cmake -S . -B build -DCMAKE_BUILD_TYPE=RelWithDebInfo
cmake --build build -j2 --target ofxkit_cli ofxkit_values_demo
work=$(mktemp -d)
server=
cleanup() {
  [ -n "$server" ] && kill "$server" 2> /dev/null && wait "$server" 2> /dev/null
  rm -rf "$work"
}
trap cleanup EXIT
ofxkit=build/tools/ofxkit
password=demo-password
echo "== server: a bank on https://127.0.0.1 (its password comes from a pipe, never echoed)"
echo "$password" | "$ofxkit" serve --https --cert-out "$work/authority.der" --ready-file "$work/url" \
  --user alice --password-stdin --transactions 12 --max-requests 10 --max-seconds 120 2> "$work/server.log" &
server=$!
for _ in $(seq 300); do [ -s "$work/url" ] && break; sleep 0.1; done
url=$(cat "$work/url")
signon=(--org "Demo Bank" --fid 1234 --user alice --password-stdin)

# Posts a request file and keeps the reply; the dump goes to a file.
exchange() {  # exchange NAME
  "$ofxkit" exchange "$work/$1-rq.ofx" "$url" --trust "$work/authority.der" --quiet -o "$work/$1-rs.ofx" \
    > "$work/$1-dump.txt"
}

echo "== 1. profile: what the institution supports"
echo "$password" | "$ofxkit" request profile "${signon[@]}" -o "$work/profile-rq.ofx" 2> /dev/null
exchange profile
"$ofxkit" profile "$work/profile-rs.ofx"

echo "== 2. accounts: which accounts alice holds there"
echo "$password" | "$ofxkit" request accounts "${signon[@]}" -o "$work/accounts-rq.ofx" 2> /dev/null
exchange accounts
"$ofxkit" accounts "$work/accounts-rs.ofx" | tee "$work/accounts.csv"

echo "== 3. a statement of each account"
tail -n +2 "$work/accounts.csv" | while IFS=, read -r kind bankid acctid type _; do
  case "$kind" in
    BANK) options=(--bank-id "$bankid" --type "$type") ;;
    CARD) options=(--type CARD) ;;
    INVESTMENT) options=(--type INVESTMENT --broker-id "$bankid" --positions --balance) ;;
    *) continue ;;
  esac
  echo "-- $kind $acctid"
  echo "$password" | "$ofxkit" request statement "${signon[@]}" --account "$acctid" "${options[@]}" \
    --start 20261101 --end 20261123 -o "$work/$acctid-rq.ofx" 2> /dev/null
  exchange "$acctid"
  "$ofxkit" statement "$work/$acctid-rs.ofx" | head -6
  if [ "$kind" = INVESTMENT ]; then "$ofxkit" positions "$work/$acctid-rs.ofx"; fi
done

kill "$server" 2> /dev/null && wait "$server" 2> /dev/null || true
server=
echo "== the server's log"
cat "$work/server.log"
