#!/usr/bin/env bash
# The ofxkit tool on text in the file's own character set (converted to UTF-8
# for JSON, CSV and text, bytes that do not convert reported), on files far
# beyond 4 MB, on a list longer than a dynamic array can count, and its error
# messages (each once, with its line end).
# usage: text_and_size_test.sh OFXKIT [STATEMENT-GENERATOR]
set -u
ofxkit="$1"
gen="${2:-}"
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
failures=0
check() {  # check DESCRIPTION EXPECTED ACTUAL
  if [ "$2" = "$3" ]; then echo "ok   $1"; else echo "FAIL $1: expected '$2', got '$3'"; failures=$((failures + 1)); fi
}

# A statement response with two payees; $1 = header lines, $2 and $3 = the
# names as raw bytes (printf escapes).
statement() {
  printf 'OFXHEADER:100\nDATA:OFXSGML\nVERSION:102\nSECURITY:NONE\n%b\nCOMPRESSION:NONE\nOLDFILEUID:NONE\nNEWFILEUID:NONE\n\n' "$1"
  printf '<OFX><SIGNONMSGSRSV1><SONRS><STATUS><CODE>0<SEVERITY>INFO</STATUS><DTSERVER>20261122<LANGUAGE>FRA'
  printf '</SONRS></SIGNONMSGSRSV1><BANKMSGSRSV1><STMTTRNRS><TRNUID>1<STATUS><CODE>0<SEVERITY>INFO</STATUS>'
  printf '<STMTRS><CURDEF>EUR<BANKACCTFROM><BANKID>1<ACCTID>2<ACCTTYPE>CHECKING</BANKACCTFROM><BANKTRANLIST>'
  printf '<DTSTART>20261101<DTEND>20261122'
  printf '<STMTTRN><TRNTYPE>POS<DTPOSTED>20261102<TRNAMT>-4.50<FITID>1<NAME>%b<MEMO>caf\xe9 cr\xe8me</STMTTRN>' "$2"
  printf '<STMTTRN><TRNTYPE>POS<DTPOSTED>20261103<TRNAMT>-12.00<FITID>2<NAME>%b</STMTTRN>' "$3"
  printf '</BANKTRANLIST><LEDGERBAL><BALAMT>100<DTASOF>20261122</LEDGERBAL></STMTRS></STMTTRNRS>'
  printf '</BANKMSGSRSV1></OFX>\n'
}

# Windows-1252: É is C9, ü is FC, the euro sign 80.
statement 'ENCODING:USASCII\nCHARSET:1252' 'CAF\xc9' 'M\xfcller \x80 5' > "$work/cp1252.ofx"
$ofxkit dump --json "$work/cp1252.ofx" > "$work/cp1252.json" 2> "$work/cp1252.err"
check "1252: dump --json reads cleanly" "0" "$?"
check "1252: CAFÉ in JSON" 1 "$(grep -c '"NAME":"CAFÉ"' "$work/cp1252.json")"
check "1252: Müller and the euro sign in JSON" 1 "$(grep -c '"NAME":"Müller € 5"' "$work/cp1252.json")"
check "1252: JSON is valid" ok "$(python3 -c 'import json,sys; json.load(open(sys.argv[1], encoding="utf-8")); print("ok")' "$work/cp1252.json" 2>&1)"
check "1252: nothing to report" "" "$(cat "$work/cp1252.err")"
$ofxkit statement "$work/cp1252.ofx" > "$work/cp1252.csv" 2> /dev/null
check "1252: CAFÉ in CSV" "2026-11-02,-4.50,POS,1,CAFÉ,café crème," "$(sed -n 2p "$work/cp1252.csv")"
$ofxkit dump "$work/cp1252.ofx" > "$work/cp1252.txt" 2> /dev/null
check "1252: CAFÉ in text" 1 "$(grep -c '^ *NAME = CAFÉ$' "$work/cp1252.txt")"
check "1252: CSV is UTF-8" ok "$(iconv -f UTF-8 -t UTF-8 "$work/cp1252.csv" > /dev/null && echo ok)"

# ISO-8859-1 (spelt as OFX files spell it): É is C9, ß DF; 80 is a control
# character there, not the euro.
statement 'ENCODING:USASCII\nCHARSET:ISO-8859-1' 'CAF\xc9' 'Stra\xdfe' > "$work/latin1.ofx"
$ofxkit statement "$work/latin1.ofx" > "$work/latin1.csv" 2> "$work/latin1.err"
check "ISO-8859-1: CAFÉ in CSV" 1 "$(grep -c ',CAFÉ,café crème,' "$work/latin1.csv")"
check "ISO-8859-1: Straße in CSV" 1 "$(grep -c ',Straße,' "$work/latin1.csv")"
check "ISO-8859-1: nothing to report" "" "$(cat "$work/latin1.err")"

# 81 has no character in Windows-1252: shown as U+FFFD and reported.
statement 'ENCODING:USASCII\nCHARSET:1252' 'BAD\x81BYTE' 'OK' > "$work/undefined.ofx"
$ofxkit dump --json "$work/undefined.ofx" > "$work/undefined.json" 2> "$work/undefined.err"
check "undefined byte: still read" 0 "$?"
check "undefined byte: replacement shown" 1 "$(grep -c '"NAME":"BAD�BYTE"' "$work/undefined.json")"
check "undefined byte: reported once" 1 "$(grep -c '^ofxkit dump: 1 byte(s) of the file do not convert from CP1252 to UTF-8 and are shown as U+FFFD (the first in NAME)$' "$work/undefined.err")"

# UTF-8 text stands as it is; a byte that is not UTF-8 is reported. (The
# library's header check takes only ENCODING:USASCII, so the set is named by
# CHARSET here; it warns about the value but reads on.)
statement 'ENCODING:USASCII\nCHARSET:UTF-8' 'CAF\xc3\x89' 'BROKEN \xc3' > "$work/utf8.ofx"
$ofxkit statement "$work/utf8.ofx" > "$work/utf8.csv" 2> "$work/utf8.err"
check "UTF-8: CAFÉ as it is" 1 "$(grep -c ',CAFÉ,' "$work/utf8.csv")"
check "UTF-8: bytes that are not UTF-8 are reported" 1 \
  "$(grep -c '^ofxkit statement: 3 byte(s) of the file are not valid UTF-8 and are shown as U+FFFD (the first in MEMO)$' "$work/utf8.err")"

# Error messages: once each, with a line end.
$ofxkit dump "$work/missing.ofx" > /dev/null 2> "$work/missing.err"
check "missing file: status 3" 3 "$?"
check "missing file: one line" "1 1" "$(wc -l < "$work/missing.err") $(grep -c 'missing.ofx: No such file' "$work/missing.err")"
check "missing file: ends with a line end" "0a" "$(tail -c 1 "$work/missing.err" | od -An -tx1 | tr -d ' ')"

# A directory is named as one; a pipe is read to its end.
$ofxkit dump "$work" > /dev/null 2> "$work/dir.err"
check "directory: status 3 and its reason" "3 1" "$? $(grep -c ': Is a directory$' "$work/dir.err")"
cat "$work/cp1252.ofx" | $ofxkit statement /dev/stdin > "$work/piped.csv" 2> /dev/null
check "a pipe read as a file" "0 3" "${PIPESTATUS[1]} $(wc -l < "$work/piped.csv")"

# exchange's progress when standard error is not a terminal: whole lines,
# one per direction, no carriage returns running them together.
echo "pa55word" | $ofxkit request statement --org "Demo Bank" --fid 1234 --user alice --password-stdin \
  --bank-id 121000248 --account 1001 -o "$work/rq.ofx" 2> /dev/null
$ofxkit serve --max-requests 1 --max-seconds 30 --transactions 2000 --ready-file "$work/ready" \
  > /dev/null 2>&1 &
server=$!
for _ in $(seq 100); do [ -s "$work/ready" ] && break; sleep 0.1; done
$ofxkit exchange "$work/rq.ofx" "$(cat "$work/ready")" -o "$work/reply.ofx" > /dev/null 2> "$work/progress"
check "exchange over HTTP" 0 "$?"
wait "$server"
check "progress: no carriage return" 0 "$(tr -cd '\r' < "$work/progress" | wc -c)"
check "progress: a whole line sent, a whole line received" "sent received" \
  "$(awk '{print $1}' "$work/progress" | tr '\n' ' ' | sed 's/ $//')"
check "progress: ends with a line end" "0a" "$(tail -c 1 "$work/progress" | od -An -tx1 | tr -d ' ')"

if [ -n "$gen" ] && [ -f "$gen" ]; then
  # Over 11 MB: read completely (65,000 transactions, CR LF line ends).
  python3 "$gen" 65000 --crlf > "$work/big.ofx"
  size=$(stat -c %s "$work/big.ofx")
  check "big file is over 11 MB" yes "$([ "$size" -gt 11000000 ] && echo yes)"
  $ofxkit statement "$work/big.ofx" > "$work/big.csv" 2> "$work/big.err"
  check "big file: clean parse" 0 "$?"
  check "big file: every transaction" 65001 "$(wc -l < "$work/big.csv")"
  check "big file: nothing on standard error" "" "$(cat "$work/big.err")"

  # One transaction more than a list can count: the parse stops with a
  # status and says why; the 65,535 read are all there, none wrapped.
  python3 "$gen" 65536 > "$work/over.ofx"
  $ofxkit dump "$work/over.ofx" > "$work/over.txt" 2> /dev/null
  check "list overflow: parse stopped (status 2)" 2 "$?"
  check "list overflow: warning names the list" 1 "$(grep -c 'OEPW_OUTOFRANGE tag=STMTTRN value="65536"' "$work/over.txt")"
  $ofxkit statement "$work/over.ofx" > "$work/over.csv" 2> "$work/over.err"
  check "list overflow: statement status 2" 2 "$?"
  check "list overflow: 65,535 rows" 65536 "$(wc -l < "$work/over.csv")"
  check "list overflow: the last row read is the 65,535th" 1 "$(tail -1 "$work/over.csv" | grep -c ',000001065534,')"
fi

echo "$failures failure(s)"
[ "$failures" -eq 0 ]
