#!/usr/bin/env bash
# ofxkit dump of a payroll update response: payroll trees are shown, fields
# cleared at the service are shown empty (never as the marker text), and
# dollar and percent amounts keep their form.
set -u
ofxkit="$1"
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
failures=0
check() {  # check DESCRIPTION EXPECTED ACTUAL
  if [ "$2" = "$3" ]; then echo "ok   $1"; else echo "FAIL $1: expected '$2', got '$3'"; failures=$((failures + 1)); fi
}

printf 'OFXHEADER:100\r\nDATA:OFXSGML\r\nVERSION:102\r\nSECURITY:NONE\r\nENCODING:USASCII\r\nCHARSET:1252\r\nCOMPRESSION:NONE\r\nOLDFILEUID:NONE\r\nNEWFILEUID:NONE\r\n\r\n' > "$work/pay.ofx"
cat >> "$work/pay.ofx" <<'OFX'
<OFX><SIGNONMSGSRSV1><SONRS><STATUS><CODE>0<SEVERITY>INFO</STATUS><DTSERVER>20240415120000<LANGUAGE>ENG</SONRS></SIGNONMSGSRSV1>
<V.PAYROLLMSGSRSV1><V.PAYROLLUPDATERS><TOKEN>118
<V.PAYCHKNEXTID>PC-78<V.PAYROLLTXNEXTID>TX-10<V.EMPNEXTID>E-1002<V.PITEMNEXTID>42
<V.PAYROLLUPDATEDATA>
<V.PAYCHKMOD><V.PAYCHKID>PC-70<V.AMT>$12.50<V.DTPAYPDEND>__OFX_EMPTY_STRING__<V.MEMO>__OFX_EMPTY_STRING__</V.PAYCHKMOD>
<V.EMPMOD><V.PAYROLL><V.ADJ><V.PITEMID>21<V.RATE>7.5%<V.LIMIT>__OFX_EMPTY_STRING__</V.ADJ></V.PAYROLL><V.EMPID>E-0990</V.EMPMOD>
</V.PAYROLLUPDATEDATA></V.PAYROLLUPDATERS></V.PAYROLLMSGSRSV1></OFX>
OFX

$ofxkit dump "$work/pay.ofx" > "$work/dump.txt"
check "payroll response dumps cleanly" 0 $?
check "the marker is never shown" 0 "$(grep -c __OFX_EMPTY_STRING__ "$work/dump.txt")"
check "emptied memo shown empty" 1 "$(grep -c '^ *V.MEMO = $' "$work/dump.txt")"
check "dollar amount" 1 "$(grep -c '^ *V.AMT = \$12.50$' "$work/dump.txt")"
check "percent rate" 1 "$(grep -c '^ *V.RATE = 7.5%$' "$work/dump.txt")"

$ofxkit dump --json "$work/pay.ofx" > "$work/dump.json"
check "JSON dump" 0 $?
python3 -c '
import json, sys
d = json.load(open(sys.argv[1]))
def walk(n):
    yield n
    for c in n.get("children", []):
        yield from walk(c)
nodes = {n["type"]: n for n in walk(d["tree"])}
print(nodes["V.PAYCHKMOD"]["elements"]["V.MEMO"] == "", nodes["V.PAYCHKMOD"]["elements"]["V.DTPAYPDEND"] == "",
      nodes["V.ADJ"]["elements"]["V.LIMIT"] == "", nodes["V.PAYROLLUPDATERS"]["elements"]["V.EMPNEXTID"])' \
  "$work/dump.json" > "$work/json"
check "JSON shows emptied values empty" "True True True E-1002" "$(cat "$work/json")"

echo "$failures failure(s)"
[ "$failures" -eq 0 ]
