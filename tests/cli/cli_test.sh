#!/usr/bin/env bash
# The ofxkit tool as a user drives it: every command's help, a request made
# with a piped password, its answer, the statement as CSV, and the exit
# statuses for clean, repaired, failed and unreadable input.
set -u
ofxkit="$1"
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
failures=0
checks=0
check() {  # check DESCRIPTION EXPECTED ACTUAL
  checks=$((checks + 1))
  if [ "$2" = "$3" ]; then echo "ok   $1"; else echo "FAIL $1: expected '$2', got '$3'"; failures=$((failures + 1)); fi
}

for cmd in dump statement respond "request statement" exchange serve; do
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

# A statement download over HTTPS from `ofxkit serve`, trusting its authority.
$ofxkit serve --cert-out "$work/ca.der" > /dev/null 2>&1
check "--cert-out needs --https" 64 $?
echo "pa55word" | $ofxkit serve --https --cert-out "$work/ca.der" --ready-file "$work/url" --max-requests 2 \
  --max-seconds 60 --user alice --password-stdin --transactions 4 > "$work/serve.out" 2> "$work/serve.log" &
server=$!
for _ in $(seq 100); do [ -s "$work/url" ] && break; sleep 0.1; done
url=$(cat "$work/url" 2> /dev/null)
check "server announces its URL" "listening on $url" "$(cat "$work/serve.out")"
$ofxkit exchange "$work/rq.ofx" "$url" -o "$work/untrusted.ofx" > /dev/null 2> "$work/untrusted.err"
check "unknown authority refused" "4 1670" "$? $(grep -o 'gateway error [0-9]*' "$work/untrusted.err" | cut -d' ' -f3)"
$ofxkit exchange "$work/rq.ofx" "$url" --trust "$work/ca.der" -o "$work/net.ofx" > "$work/net.txt" 2> /dev/null
check "download over HTTPS" 0 $?
check "reply saved privately" 600 "$(stat -c %a "$work/net.ofx")"
check "downloaded statement has its transactions" 4 "$(grep -c '^<STMTTRN>' "$work/net.ofx")"
sed 's/^<USERPASS>.*/<USERPASS>wrong/' "$work/rq.ofx" > "$work/badpass.ofx"
$ofxkit exchange "$work/badpass.ofx" "$url" --trust "$work/ca.der" -o "$work/denied-net.ofx" > /dev/null 2>&1
check "bad credentials over HTTPS get 15500" 1 "$(grep -c '<CODE>15500' "$work/denied-net.ofx")"
wait "$server"
check "server ends after its requests" 0 $?
check "server logs each request" 2 "$(grep -c '^POST / 200 [0-9]* bytes$' "$work/serve.log")"
check "no password in the server's output" 0 "$(cat "$work/serve.out" "$work/serve.log" | grep -c pa55word)"

# The same server over plain HTTP: what it refuses, what its log keeps out,
# and a clean stop on SIGTERM.
status_of() {  # status_of URL [BODY-FILE]: the HTTP status of a GET, or of a POST of the file
  python3 - "$@" <<'PY'
import sys, urllib.request, urllib.error
data = open(sys.argv[2], "rb").read() if len(sys.argv) > 2 else None
try:
    opener = urllib.request.build_opener(urllib.request.ProxyHandler({}))  # loopback: never a proxy
    print(opener.open(urllib.request.Request(sys.argv[1], data=data), timeout=20).status)
except urllib.error.HTTPError as e:
    print(e.code)
PY
}
$ofxkit serve --ready-file "$work/url2" --max-seconds 60 > /dev/null 2> "$work/serve2.log" &
server=$!
for _ in $(seq 100); do [ -s "$work/url2" ] && break; sleep 0.1; done
url=$(cat "$work/url2" 2> /dev/null)
$ofxkit exchange "$work/rq.ofx" "$url" -o "$work/plain.ofx" > /dev/null 2>&1
check "download over HTTP" 0 $?
check "GET refused" 405 "$(status_of "$url")"
echo "hello" > "$work/hello.txt"
check "not OFX refused" 400 "$(status_of "${url}ofx?password=pa55word" "$work/hello.txt")"
check "response file refused" 400 "$(status_of "$url" "$work/plain.ofx")"
head -c 4100000 /dev/zero | tr '\0' x > "$work/big"
check "body larger than a buffer refused" 413 "$(status_of "$url" "$work/big")"
kill -TERM "$server"; wait "$server"
check "SIGTERM: clean exit" 0 $?
check "ready file removed" no "$([ -e "$work/url2" ] && echo yes || echo no)"
check "query strings not logged" "POST /ofx?... 400" "$(grep -o '^POST /ofx?\.\.\. 400' "$work/serve2.log")"
check "no password in the request log" 0 "$(grep -c pa55word "$work/serve2.log")"
$ofxkit serve --port 70000 > /dev/null 2>&1; check "bad port" 64 $?
$ofxkit serve --transactions 25001 > /dev/null 2>&1; check "too many transactions" 64 $?
$ofxkit serve --user alice --password-stdin < /dev/null > /dev/null 2>&1; check "no password given" 64 $?

# Hostile and modern files: no crash, no silent loss, tolerant by default.
$ofxkit respond --transactions 25000 "$work/rq.ofx" -o "$work/max.ofx"
check "the largest --transactions is answered" "0 25000" "$? $(grep -c '<STMTTRN>' "$work/max.ofx")"
python3 - "$work/rq.ofx" "$work/many.ofx" <<'PY'
import sys
s = open(sys.argv[1]).read()
a = s.index('<STMTTRNRQ>'); b = s.index('</STMTTRNRQ>') + len('</STMTTRNRQ>')
open(sys.argv[2], 'w').write(s[:a] + s[a:b] * 2000 + s[b:])
PY
$ofxkit respond "$work/many.ofx" -o "$work/many-rs.ofx"
check "2000 statement requests: 64 answered, the rest refused" "0 64 936" \
  "$? $(grep -c '<STMTRS>' "$work/many-rs.ofx") $(grep -c '<CODE>2000' "$work/many-rs.ofx")"
sed 's/^CHARSET:.*/CHARSET:\xff/' "$work/rs.ofx" > "$work/charset.ofx"
$ofxkit dump --json "$work/charset.ofx" | python3 -c 'import json,sys; print(json.load(sys.stdin)["tree"]["headers"]["CHARSET"] == "\ufffd")' > "$work/cs"
check "JSON dump of a non-UTF-8 header" "True" "$(cat "$work/cs")"
sed 's/<OFX>/<OFX >/' "$work/rs.ofx" > "$work/space.ofx"
$ofxkit statement "$work/space.ofx" > /dev/null; check "<OFX > is OFX" 0 $?
sed '0,/<NAME>/s/<NAME>[^<]*/<NAME>=HYPERLINK("x")/' "$work/rs.ofx" > "$work/formula.ofx"
check "formula made harmless" 1 "$($ofxkit statement "$work/formula.ofx" | grep -c "'=HYPERLINK")"
check "unless --raw" 1 "$($ofxkit statement --raw "$work/formula.ofx" | grep -c ',"=HYPERLINK')"
python3 - "$work/rs.ofx" "$work/lost.ofx" "$work/modern.ofx" <<'PY'
import sys
s = open(sys.argv[1], newline='').read()
i = s.index('<STMTTRN>'); j = s.index('</STMTTRN>', s.index('</STMTTRN>', i) + 1) + len('</STMTTRN>')
open(sys.argv[2], 'w', newline='').write(s[:i] + '<XTRA>' + s[i:j] + '<MEMO>x</XTRA>' + s[j:])
m = s.replace('ENCODING:USASCII', 'ENCODING:UTF-8').replace('VERSION:102', 'VERSION:160')
k = m.index('<NAME>'); m = m[:k] + '<MEMO>\n' + m[k:]
open(sys.argv[3], 'w', newline='').write('\n' * 12 + m)
PY
$ofxkit statement "$work/lost.ofx" > "$work/lost.csv" 2> "$work/lost.err"
check "swallowed transactions: exit 1" 1 $?
check "and named" 1 "$(grep -c 'STMTTRN in the file were not read' "$work/lost.err")"
$ofxkit check "$work/lost.ofx" > "$work/check.txt"
check "check lists the loss" "1 1" "$? $(grep -c '^  LOSS missing: 2 of 4 STMTTRN' "$work/check.txt")"
$ofxkit statement "$work/modern.ofx" > "$work/modern.csv" 2> /dev/null
check "modern file read by default" "1 5" "$? $(wc -l < "$work/modern.csv")"
$ofxkit statement --strict "$work/modern.ofx" > /dev/null 2>&1
check "and refused with --strict" 2 $?

echo "$((checks - failures)) passed, $failures failed"
[ "$failures" -eq 0 ]
