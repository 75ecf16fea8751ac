#!/usr/bin/env bash
# The tool on brokerage data: an investment request with everything asked
# for, its generated answer, transactions in trade-date order with securities
# named from the security list, positions, balances, and a real-world-shaped
# file with kinds the generator does not make.
set -u
ofxkit="$1"
seeds="$2"
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
failures=0
check() {  # check DESCRIPTION EXPECTED ACTUAL
  if [ "$2" = "$3" ]; then echo "ok   $1"; else echo "FAIL $1: expected '$2', got '$3'"; failures=$((failures + 1)); fi
}

$ofxkit positions --help | grep -q usage; check "help of positions" 0 $?
echo "pa55word" | $ofxkit request statement --org Broker --user alice --password-stdin --type INVESTMENT \
  --broker-id broker.example --account X1 --positions --open-orders --balance --securities AAPL,CUSIP:594918104 \
  -o "$work/rq.ofx" 2> /dev/null
check "investment request written" 0 $?
check "asks for positions, open orders and balances" 3 "$(grep -c '^<INCOO>Y\|^<INCBAL>Y\|^<INCLUDE>Y' "$work/rq.ofx" | awk '{print $1-1}')"
check "security list request with two securities" 2 "$(grep -c '^<SECRQ>' "$work/rq.ofx")"
echo "pa55word" | $ofxkit request statement --org Broker --user alice --password-stdin --type INVESTMENT \
  --account X1 > /dev/null 2>&1
check "brokerage account without broker id refused" 64 $?

$ofxkit respond --transactions 24 "$work/rq.ofx" -o "$work/rs.ofx"
check "investment answer written" 0 $?
check "answer carries the security list" 1 "$(grep -c '^<SECLIST>' "$work/rs.ofx")"
$ofxkit statement "$work/rs.ofx" > "$work/rs.csv"
check "statement of a brokerage file" 0 $?
check "header and 24 rows" 25 "$(wc -l < "$work/rs.csv")"
check "investment CSV header" "date,kind,security,name,units,unitprice,commission,total,subacctsec,subacctfund,subacctfrom,subacctto,fitid,memo" \
  "$(head -1 "$work/rs.csv")"
check "rows in trade-date order" "$(tail -n +2 "$work/rs.csv" | cut -d, -f1 | sort | tr '\n' ' ')" \
  "$(tail -n +2 "$work/rs.csv" | cut -d, -f1 | tr '\n' ' ')"
check "tickers resolved through the security list" 0 "$(tail -n +2 "$work/rs.csv" | grep -c ',CUSIP:')"
check "journal rows name both sub-accounts" 1 "$(grep -m1 ',JRNLFUND,' "$work/rs.csv" | grep -c ',CASH,MARGIN,')"
$ofxkit positions "$work/rs.ofx" > "$work/pos.csv"
check "positions" 0 $?
check "positions header" "security,name,kind,units,unitprice,mktval,priceasof,postype,heldinacct" "$(head -1 "$work/pos.csv")"
check "six positions" 7 "$(wc -l < "$work/pos.csv")"
$ofxkit positions --balances --account "$work/rs.ofx" > "$work/bal.csv"
check "balances with the account" "broker.example:X1,AVAILCASH,12500.75,DOLLAR,," "$(sed -n 2p "$work/bal.csv")"
check "balance list" 1 "$(grep -c 'Margin rate,7.85,PERCENT' "$work/bal.csv")"
$ofxkit dump --json "$work/rs.ofx" | python3 -c '
import json, sys
d = json.load(sys.stdin)
def walk(n):
    yield n
    for c in n.get("children", []):
        yield from walk(c)
types = [n["type"] for n in walk(d["tree"])]
print(types.count("INVTRAN"), "SECLIST" in types)' > "$work/json"
check "JSON dump shows every INVTRAN and the security list" "21 True" "$(cat "$work/json")"

$ofxkit statement "$seeds/invest-kinds.sgml" > "$work/kinds.csv" 2> /dev/null
check "every kind of transaction is a row" 9 "$(wc -l < "$work/kinds.csv")"
check "bond named from the security list" 1 "$(grep -c ',SELLDEBT,CUSIP:9,Bond,' "$work/kinds.csv")"
$ofxkit positions "$seeds/invest-kinds.sgml" 2> /dev/null | grep -c 'POSOPT\|POSDEBT' > "$work/n"
check "option and debt positions" 2 "$(cat "$work/n")"

echo "$failures failure(s)"
[ "$failures" -eq 0 ]
