#!/usr/bin/env bash
# First contact with the tool alone, over HTTPS against `ofxkit serve` on the
# loopback interface: the profile, the accounts, then a statement of each
# account; and the profile and accounts commands on files of other shapes.
set -u
ofxkit="$1"
corpus="$2"
work=$(mktemp -d)
server=
cleanup() {
  [ -n "$server" ] && kill "$server" 2> /dev/null && wait "$server" 2> /dev/null
  rm -rf "$work"
}
trap cleanup EXIT
failures=0
check() {  # check DESCRIPTION EXPECTED ACTUAL
  if [ "$2" = "$3" ]; then echo "ok   $1"; else echo "FAIL $1: expected '$2', got '$3'"; failures=$((failures + 1)); fi
}

for cmd in profile accounts "request profile" "request accounts" "request transfer" "request payment"; do
  $ofxkit $cmd --help | grep -q usage; check "help of $cmd" 0 $?
done
echo pw | $ofxkit request accounts --org X --user a --password-stdin --since 2026-01-01 > /dev/null 2>&1
check "a bad --since is refused" 64 $?

echo "s3cret" | $ofxkit serve --https --cert-out "$work/ca.der" --ready-file "$work/url" --user alice \
  --password-stdin --transactions 5 --max-requests 10 --max-seconds 60 > /dev/null 2> "$work/server.log" &
server=$!
for _ in $(seq 300); do [ -s "$work/url" ] && break; sleep 0.1; done
url=$(cat "$work/url")
post() {  # post NAME: exchange NAME-rq.ofx into NAME-rs.ofx
  $ofxkit exchange "$work/$1-rq.ofx" "$url" --trust "$work/ca.der" --quiet -o "$work/$1-rs.ofx" > /dev/null 2>&1
}
signon=(--org Demo --fid 1 --user alice --password-stdin)
echo "s3cret" | $ofxkit request profile "${signon[@]}" -o "$work/profile-rq.ofx" 2> /dev/null
post profile; check "profile exchanged" 0 $?
$ofxkit profile "$work/profile-rs.ofx" > "$work/profile.txt"; check "profile read" 0 $?
check "every served message set listed" 8 "$(grep -c 'MSGSETV1 *version 1' "$work/profile.txt")"
check "the realm's rules" 1 "$(grep -c 'DEMO: password of 6 to 32 characters' "$work/profile.txt")"
echo "s3cret" | $ofxkit request accounts "${signon[@]}" -o "$work/accounts-rq.ofx" 2> /dev/null
post accounts; check "accounts exchanged" 0 $?
$ofxkit accounts "$work/accounts-rs.ofx" > "$work/accounts.csv"; check "accounts read" 0 $?
check "four accounts of three kinds" "BANK BANK CARD INVESTMENT " "$(tail -n +2 "$work/accounts.csv" | cut -d, -f1 | tr '\n' ' ')"
statements=0
while IFS=, read -r kind bankid acctid type _; do
  case "$kind" in
    BANK) options=(--bank-id "$bankid" --type "$type") ;;
    CARD) options=(--type CARD) ;;
    INVESTMENT) options=(--type INVESTMENT --broker-id "$bankid") ;;
  esac
  echo "s3cret" | $ofxkit request statement "${signon[@]}" --account "$acctid" "${options[@]}" \
    -o "$work/$acctid-rq.ofx" 2> /dev/null
  post "$acctid" && [ "$($ofxkit statement "$work/$acctid-rs.ofx" | wc -l)" -eq 6 ] && statements=$((statements + 1))
done < <(tail -n +2 "$work/accounts.csv")
check "a statement of five transactions for each account" 4 "$statements"
# Moving money against the same server: a transfer and a bill payment come
# back with status 0, a processing status and a server transaction id.
echo "s3cret" | $ofxkit request transfer "${signon[@]}" --bank-id 121000248 --account 1001 --to-account 1002 \
  --amount 250.00 --due 20261201 -o "$work/xfer-rq.ofx" 2> /dev/null
post xfer; check "transfer exchanged" 0 $?
check "transfer answered: status, processing status, server id" "1 1 1" \
  "$(grep -c '^<CODE>0' "$work/xfer-rs.ofx" | awk '{print ($1>=2)}') $(grep -c '^<XFERPRCCODE>WILLPROCESSON' "$work/xfer-rs.ofx") $(grep -c '^<SRVRTID>.' "$work/xfer-rs.ofx")"
echo "s3cret" | $ofxkit request payment "${signon[@]}" --bank-id 121000248 --account 1001 --amount 80.15 \
  --payee-name "City Power & Light" --payee-addr1 "1 Grid Rd" --payee-city Springfield --payee-state IL \
  --payee-postal 62701 --payee-phone 555-0142 --pay-account 55-1234 -o "$work/pmt-rq.ofx" 2> /dev/null
post pmt; check "payment exchanged" 0 $?
check "payment answered: processing status, server id, payee kept" "1 1 1" \
  "$(grep -c '^<PMTPRCCODE>WILLPROCESSON' "$work/pmt-rs.ofx") $(grep -c '^<SRVRTID>.' "$work/pmt-rs.ofx") $(grep -c '^<NAME>City Power &amp; Light' "$work/pmt-rs.ofx")"
echo "s3cret" | $ofxkit request payment "${signon[@]}" --bank-id 121000248 --account 1001 --amount 1 \
  --payee-id 77 --payee-name X --pay-account 1 > /dev/null 2>&1
check "a payee both by id and by name is refused" 64 $?
# Requests declare CHARSET:1252: a payee's name and memo given as UTF-8 are
# written in Windows-1252, and a character that set lacks is refused.
echo "s3cret" | $ofxkit request payment "${signon[@]}" --bank-id 121000248 --account 1001 --amount 12 \
  --payee-name "Café Müller" --payee-addr1 "1 Grid Rd" --payee-city Springfield --payee-state IL \
  --payee-postal 62701 --payee-phone 555-0142 --pay-account 55-1234 --memo "Crème" -o "$work/cafe-rq.ofx" 2> /dev/null
check "a payee's name and memo written in Windows-1252" "1 1" \
  "$(grep -c "^<NAME>Caf$(printf '\xe9') M$(printf '\xfc')ller" "$work/cafe-rq.ofx") $(grep -c "^<MEMO>Cr$(printf '\xe8')me" "$work/cafe-rq.ofx")"
echo "s3cret" | $ofxkit request payment "${signon[@]}" --bank-id 121000248 --account 1001 --amount 12 \
  --payee-id 77 --pay-account 1 --memo "Ω" > /dev/null 2> "$work/omega.err"
check "a memo Windows-1252 cannot write is refused" "64 1" "$? $(grep -c 'memo is not UTF-8 text' "$work/omega.err")"

echo "wrong" | $ofxkit request accounts --org Demo --user alice --password-stdin -o "$work/denied-rq.ofx" 2> /dev/null
post denied
check "a wrong password gets 15500 and no accounts" "1 0" \
  "$(grep -c '<CODE>15500' "$work/denied-rs.ofx") $(grep -c '<ACCTINFORS>' "$work/denied-rs.ofx")"

if [ -f "$corpus/acctinfo-response.ofx" ]; then
  $ofxkit accounts "$corpus/acctinfo-response.ofx" > "$work/sample.csv" 2> /dev/null
  check "sample account list" "BANK,1234567789,12345,CHECKING,Power Checking,ACTIVE,download xfersrc xferdest" \
    "$(sed -n 2p "$work/sample.csv")"
fi
$ofxkit profile "$work/accounts-rs.ofx" > /dev/null 2> "$work/none"
check "no profile in an account list is said" 1 "$(grep -c 'no profile response' "$work/none")"

echo "$failures failure(s)"
[ "$failures" -eq 0 ]
