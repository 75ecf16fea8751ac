#!/usr/bin/env bash
# The ofxkit tool as a user drives it: every command's help, a request made
# with a piped password, its answer, the statement as CSV, and the exit
# statuses for clean, repaired, failed and unreadable input.
set -u
ofxkit="$1"
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
failures=0
check() {  # check DESCRIPTION EXPECTED ACTUAL
  if [ "$2" = "$3" ]; then echo "ok   $1"; else echo "FAIL $1: expected '$2', got '$3'"; failures=$((failures + 1)); fi
}

for cmd in dump statement respond "request statement"; do
  $ofxkit $cmd --help > "$work/help" 2>&1
  check "help of $cmd" "0 yes" "$? $(grep -q usage "$work/help" && echo yes)"
done
$ofxkit > /dev/null 2>&1; check "no command" 64 $?
$ofxkit frobnicate > /dev/null 2>&1; check "unknown command" 64 $?
$ofxkit dump --bogus x > /dev/null 2>&1; check "unknown option" 64 $?

echo "pa55word" | $ofxkit request statement --org "Demo Bank" --fid 1234 --user alice --password-stdin \
  --bank-id 121000248 --account 1001 --start 20261101 --end 20261123 -o "$work/rq.ofx" 2> /dev/null
check "request written" 0 $?
check "request file is private" 600 "$(stat -c %a "$work/rq.ofx")"
check "request holds its TRNUID" 1 "$(grep -c '^<TRNUID>[0-9A-F-]\{36\}$' "$work/rq.ofx")"
$ofxkit dump "$work/rq.ofx" > "$work/rq.txt"
check "request dumps cleanly" 0 $?
check "dump never shows the password" 0 "$(grep -c pa55word "$work/rq.txt")"
echo "pa55word" | $ofxkit request statement --org X --user alice --password-stdin --account 1 > /dev/null 2>&1
check "bank account without routing number refused" 64 $?

echo "pa55word" | $ofxkit respond --user alice --password-stdin --transactions 4 "$work/rq.ofx" -o "$work/rs.ofx"
check "response written" 0 $?
$ofxkit statement "$work/rs.ofx" > "$work/rs.csv"
check "statement read" 0 $?
check "CSV header and four rows" 5 "$(wc -l < "$work/rs.csv")"
check "CSV header" "date,amount,type,fitid,name,memo,checknum" "$(head -1 "$work/rs.csv")"
check "CSV quotes what needs it" 1 "$(grep -c '"Rent & utilities"\|Rent & utilities' "$work/rs.csv" | head -1 | awk '{print ($1>0)}')"
$ofxkit dump --json "$work/rs.ofx" | python3 -c 'import json,sys; d=json.load(sys.stdin); print(d["status"])' > "$work/st"
check "JSON dump is valid JSON" 0 "$(cat "$work/st")"

echo "wrong" | $ofxkit respond --user alice --password-stdin "$work/rq.ofx" -o "$work/denied.ofx"
check "bad credentials still answered" 0 $?
check "bad credentials get 15500" 1 "$(grep -c '<CODE>15500' "$work/denied.ofx")"
check "and no statement" 0 "$(grep -c '<STMTRS>' "$work/denied.ofx")"

sed 's/<TRNAMT>\(.*\)/<TRNAMT>\1x/' "$work/rs.ofx" > "$work/warn.ofx"
$ofxkit dump "$work/warn.ofx" > "$work/warn.txt"
check "bad amounts: parsed with warnings" 1 $?
check "warnings listed" 4 "$(grep -c 'OEPW_BADFORMAT tag=TRNAMT' "$work/warn.txt")"
head -c 900 "$work/rs.ofx" > "$work/cut.ofx"
$ofxkit dump "$work/cut.ofx" > /dev/null
check "truncated file: parse failed" 2 $?
$ofxkit dump "$work/missing.ofx" > /dev/null 2>&1
check "missing file" 3 $?
echo "plain text" > "$work/text.txt"
$ofxkit statement "$work/text.txt" > /dev/null 2>&1
check "not OFX" 3 $?

echo "$((28 - failures)) passed, $failures failed"
[ "$failures" -eq 0 ]
