#!/usr/bin/env bash
# `ofxkit request mail`: a secure message, free-form or about a bank, card or
# brokerage account, in the right message set and wrapper; its body read from
# a file, kept exactly, and never shown in a message of the tool. `respond`
# answers each message with a reply.
set -u
ofxkit="$1"
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
failures=0
check() {  # check DESCRIPTION EXPECTED ACTUAL
  if [ "$2" = "$3" ]; then echo "ok   $1"; else echo "FAIL $1: expected '$2', got '$3'"; failures=$((failures + 1)); fi
}
# Nothing the tool printed on standard error holds the secret marker.
quiet_about_body() {  # quiet_about_body DESCRIPTION
  if grep -q "PRIVATE-7731" "$work/err"; then check "$1: the body stays out of messages" clean leaked; else
    check "$1: the body stays out of messages" clean clean; fi
}
# The body of the first message in a file, through the JSON dump.
body_of() {
  "$ofxkit" dump --json "$1" | python3 -c '
import json, sys
def walk(node):
    if node.get("type") == "MAIL":
        return node["elements"]["MSGBODY"]
    for child in node.get("children", []):
        found = walk(child)
        if found is not None:
            return found
sys.stdout.write(walk(json.load(sys.stdin)["tree"]))'
}
signon=(--org "Demo Bank" --fid 1 --user alice --password-stdin)

$ofxkit request --help | grep -q "ofxkit request mail"; check "help names request mail" 0 $?

# A body of several lines with the characters OFX escapes, and a marker.
printf 'PRIVATE-7731: my card was charged twice & the fee is < 5 > 3?\r\nPlease refund it.\n\n' > "$work/body.txt"
expected=$(printf 'PRIVATE-7731: my card was charged twice & the fee is < 5 > 3?\r\nPlease refund it.')

echo pw | $ofxkit request mail "${signon[@]}" --subject "Double charge" --body-file "$work/body.txt" \
  -o "$work/free.ofx" 2> "$work/err"
check "free-form mail written" 0 $?
quiet_about_body "free-form mail"
check "free-form mail is private" 600 "$(stat -c %a "$work/free.ofx")"
check "free-form mail in the e-mail set" 1 \
  "$(tr -d '\r\n' < "$work/free.ofx" | grep -c '<EMAILMSGSRQV1><MAILTRNRQ><TRNUID>[^<]*<MAILRQ><MAIL><USERID>alice')"
check "the body has its end tag" 1 "$(grep -c '^</MSGBODY>' "$work/free.ofx")"
check "from the user to the institution" 2 "$(grep -c '^<FROM>alice\|^<TO>Demo Bank' "$work/free.ofx")"
check "the body read back exactly" "$expected" "$(body_of "$work/free.ofx")"
$ofxkit check "$work/free.ofx" > "$work/check.txt"; check "the request reads cleanly" 0 $?

echo pw | $ofxkit request mail "${signon[@]}" --subject "Fee" --body-file "$work/body.txt" --bank-id 121000248 \
  --account 1001 --type savings --to "Branch 12" --from "Alice A." -o "$work/bank.ofx" 2> "$work/err"
check "bank mail written" 0 $?
quiet_about_body "bank mail"
check "bank mail in the bank set with its account" 1 \
  "$(tr -d '\r\n' < "$work/bank.ofx" | grep -c '<BANKMSGSRQV1><BANKMAILTRNRQ><TRNUID>[^<]*<BANKMAILRQ><BANKACCTFROM><BANKID>121000248<ACCTID>1001<ACCTTYPE>SAVINGS</BANKACCTFROM><MAIL>')"
check "--to and --from" 2 "$(grep -c '^<FROM>Alice A\.\|^<TO>Branch 12' "$work/bank.ofx")"

echo pw | $ofxkit request mail "${signon[@]}" --subject "Card" --body-file "$work/body.txt" --type CREDITCARD \
  --account 4111 -o "$work/card.ofx" 2> "$work/err"
check "card mail written" 0 $?
check "card mail names the card account" 1 \
  "$(tr -d '\r\n' < "$work/card.ofx" | grep -c '<BANKMAILRQ><CCACCTFROM><ACCTID>4111</CCACCTFROM><MAIL>')"

echo pw | $ofxkit request mail "${signon[@]}" --subject "Trade" --body-file "$work/body.txt" --broker-id broker.example \
  --account X1 -o "$work/invest.ofx" 2> "$work/err"
check "brokerage mail written" 0 $?
check "brokerage mail in the investment set" 1 \
  "$(tr -d '\r\n' < "$work/invest.ofx" | grep -c '<INVSTMTMSGSRQV1><INVMAILTRNRQ><TRNUID>[^<]*<INVMAILRQ><INVACCTFROM><BROKERID>broker.example<ACCTID>X1</INVACCTFROM><MAIL>')"

# Refusals: each is a usage error whose message never shows the body.
refused() {  # refused DESCRIPTION ARGS...
  local what="$1"
  shift
  echo pw | $ofxkit request mail "${signon[@]}" "$@" -o "$work/refused.ofx" > /dev/null 2> "$work/err"
  check "$what is refused" 64 $?
  quiet_about_body "$what"
}
python3 -c 'import sys; sys.stdout.write("PRIVATE-7731 " + "x" * 3000)' > "$work/long.txt"
: > "$work/empty.txt"
printf ' \n\t\n' > "$work/blank.txt"
refused "a body past the OFX limit" --subject S --body-file "$work/long.txt"
refused "an empty body" --subject S --body-file "$work/empty.txt"
refused "a blank body" --subject S --body-file "$work/blank.txt"
refused "a missing body file" --subject S --body-file "$work/none.txt"
refused "no body file" --subject S
refused "no subject" --body-file "$work/body.txt"
refused "a subject of 61 characters" --subject "$(printf 'S%.0s' $(seq 61))" --body-file "$work/body.txt"
refused "a bank id without an account" --subject S --body-file "$work/body.txt" --bank-id 121000248
refused "an unknown account type" --subject S --body-file "$work/body.txt" --bank-id 1 --account 2 --type GOLD
check "nothing written for a refused request" 1 "$([ -e "$work/refused.ofx" ] && echo 0 || echo 1)"
echo pw | $ofxkit request mail "${signon[@]}" --subject S --body-file "$work/long.txt" 2>&1 > /dev/null |
  grep -q "3013 characters long"
check "a long body is reported by its length" 0 $?

# A body of 2000 characters with escaped characters survives exactly.
python3 -c 'import sys; sys.stdout.write(("a&b<c>d " * 250)[:1999] + "!")' > "$work/near.txt"
echo pw | $ofxkit request mail "${signon[@]}" --subject S --body-file "$work/near.txt" -o "$work/near.ofx" 2> /dev/null
check "a body at the limit is written" 0 $?
check "a body at the limit read back exactly" "$(cat "$work/near.txt")" "$(body_of "$work/near.ofx")"

# UTF-8 text is written in the file's Windows-1252 and read back as it was
# given; text that is not UTF-8, or that Windows-1252 cannot hold, is refused.
printf 'Caf\xc3\xa9 bill: \xe2\x82\xac5' > "$work/accent.txt"
echo pw | $ofxkit request mail "${signon[@]}" --subject $'R\xc3\xa9sum\xc3\xa9' --body-file "$work/accent.txt" \
  -o "$work/accent.ofx" 2> /dev/null
check "an accented body is written" 0 $?
check "in Windows-1252" 1 "$(grep -c "$(printf '^<MSGBODY>Caf\xe9 bill: \x805$')" "$work/accent.ofx")"
check "the subject too" 1 "$(grep -c "$(printf '^<SUBJECT>R\xe9sum\xe9$')" "$work/accent.ofx")"
check "and read back as given" "$(cat "$work/accent.txt")" "$(body_of "$work/accent.ofx")"
printf 'PRIVATE-7731 \xff\xfe' > "$work/binary.txt"
refused "a body that is not UTF-8" --subject S --body-file "$work/binary.txt"
printf 'PRIVATE-7731 \xe2\x9c\x93' > "$work/check.txt"
refused "a body with a character Windows-1252 lacks" --subject S --body-file "$work/check.txt"

# The demo institution replies to each message in its own set and wrapper.
for kind in free bank card invest; do
  $ofxkit respond "$work/$kind.ofx" -o "$work/$kind-rs.ofx" 2> /dev/null
  check "$kind mail answered" 0 $?
done
check "free-form reply" 1 "$(tr -d '\r\n' < "$work/free-rs.ofx" |
  grep -c '<EMAILMSGSRSV1><MAILTRNRS><TRNUID>[^<]*<STATUS><CODE>0<SEVERITY>INFO</STATUS><MAILRS><MAIL>')"
check "reply to the sender about the subject" 2 "$(grep -c '^<TO>alice\|^<SUBJECT>Re: Double charge' "$work/free-rs.ofx")"
check "bank reply keeps the account" 1 "$(tr -d '\r\n' < "$work/bank-rs.ofx" | grep -c '<BANKMAILRS><BANKACCTFROM><BANKID>121000248')"
check "card reply keeps the card" 1 "$(tr -d '\r\n' < "$work/card-rs.ofx" | grep -c '<BANKMAILRS><CCACCTFROM><ACCTID>4111')"
check "brokerage reply" 1 "$(tr -d '\r\n' < "$work/invest-rs.ofx" | grep -c '<INVMAILTRNRS>.*<INVMAILRS><INVACCTFROM>')"
check "the reply does not repeat the body" 0 "$(grep -c 'PRIVATE-7731' "$work/free-rs.ofx")"

if [ "$failures" -ne 0 ]; then
  echo "$failures check(s) failed"
  exit 1
fi
echo "all checks passed"
