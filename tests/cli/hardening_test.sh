#!/usr/bin/env bash
# The tool with secrets and hostile peers: output files that nobody else can
# read, transfers stopped by signals without leftovers, no core dumps while a
# password is held, a server that survives clients hanging up or trickling,
# and a sign-on that decides the whole answer. Servers bind 127.0.0.1 only
# and are bounded in time.
set -u
ofxkit="$1"
work=$(mktemp -d)
helpers=()
cleanup() {
  for p in "${helpers[@]}"; do kill "$p" 2> /dev/null; done
  rm -rf "$work"
}
trap cleanup EXIT
failures=0
checks=0
check() {  # check DESCRIPTION EXPECTED ACTUAL
  checks=$((checks + 1))
  if [ "$2" = "$3" ]; then echo "ok   $1"; else echo "FAIL $1: expected '$2', got '$3'"; failures=$((failures + 1)); fi
}
exists() { [ -e "$1" ] || [ -L "$1" ] && echo yes || echo no; }
wait_for() {  # wait_for FILE: up to 10 s for it to be non-empty
  for _ in $(seq 100); do [ -s "$1" ] && return 0; sleep 0.1; done
  return 1
}
request() {  # request FILE [PASSWORD]
  echo "${2:-pa55word}" | $ofxkit request statement --org "Demo Bank" --fid 1234 --user alice --password-stdin \
    --bank-id 121000248 --account 1001 -o "$1" 2> "$work/request.err"
}

# ---- -o FILE: always a new private file, never through a link ----------------
request "$work/rq.ofx"
check "request written" 0 $?
echo "old contents" > "$work/existing.ofx"
chmod 644 "$work/existing.ofx"
request "$work/existing.ofx"
check "an existing 0644 file is replaced by a private one" "0 600" "$? $(stat -c %a "$work/existing.ofx")"
check "holding the request" 1 "$(grep -c '^<USERPASS>pa55word' "$work/existing.ofx")"
ln -s "$work/victim.ofx" "$work/link.ofx"
request "$work/link.ofx"
check "a symbolic link is refused" 3 $?
check "and not followed" no "$(exists "$work/victim.ofx")"
check "the refusal says why" 1 "$(grep -c 'symbolic link' "$work/request.err")"
request /dev/null
check "a device is written into" 0 $?
check "no temporary file left beside the outputs" 0 "$(find "$work" -maxdepth 1 -name '.*.ofx.*' | wc -l)"

# ---- the sign-on decides, wherever it stands ---------------------------------
signon_last() {  # signon_last IN OUT: the sign-on message set moved after the bank one
  python3 - "$1" "$2" << 'PY'
import re, sys
text = open(sys.argv[1]).read()
signon = re.search(r"<SIGNONMSGSRQV1>.*?</SIGNONMSGSRQV1>\s*", text, re.S).group(0)
text = text.replace(signon, "")
text = text.replace("</BANKMSGSRQV1>", "</BANKMSGSRQV1>\n" + signon.strip(), 1)
open(sys.argv[2], "w").write(text)
PY
}
request "$work/wrong.ofx" wrongpass
signon_last "$work/wrong.ofx" "$work/wrong-late.ofx"
signon_last "$work/rq.ofx" "$work/right-late.ofx"
check "sign-on moved last" 1 "$(grep -A1 '</BANKMSGSRQV1>' "$work/wrong-late.ofx" | grep -c SIGNONMSGSRQV1)"
echo "pa55word" | $ofxkit respond --user alice --password-stdin "$work/wrong-late.ofx" -o "$work/denied.ofx"
check "late wrong sign-on: 15500" 1 "$(grep -c '<CODE>15500' "$work/denied.ofx")"
check "late wrong sign-on: no statement" 0 "$(grep -c '<STMTRS>' "$work/denied.ofx")"
echo "pa55word" | $ofxkit respond --user alice --password-stdin "$work/right-late.ofx" -o "$work/granted.ofx"
check "late right sign-on: the statement" 1 "$(grep -c '<STMTRS>' "$work/granted.ofx")"
python3 -c 'import re,sys; t=open(sys.argv[1]).read(); open(sys.argv[2],"w").write(re.sub(r"<SIGNONMSGSRQV1>.*?</SIGNONMSGSRQV1>","",t,flags=re.S))' \
  "$work/rq.ofx" "$work/nosignon.ofx"
echo "pa55word" | $ofxkit respond --user alice --password-stdin "$work/nosignon.ofx" -o "$work/nosignon-rs.ofx" 2> /dev/null
check "no sign-on at all: no statement" 0 "$(cat "$work/nosignon-rs.ofx" 2> /dev/null | grep -c '<STMTRS>')"

# ---- exchange: signals, core dumps, the default bound --------------------------
check "exchange has a default timeout" 1 "$($ofxkit exchange --help | grep -c 'default 300')"
check "the help says what --no-verify skips" 1 "$($ofxkit exchange --help | grep -c 'skip only the validity dates and the host name')"
# A server that reads requests and never answers.
python3 - "$work/silent.port" << 'PY' &
import socket, sys, time, threading
s = socket.socket()
s.bind(("127.0.0.1", 0))
s.listen(8)
open(sys.argv[1], "w").write(str(s.getsockname()[1]))
s.settimeout(1)
held = []
end = time.time() + 60
while time.time() < end:
    try:
        c, _ = s.accept()
        held.append(c)
    except socket.timeout:
        pass
PY
helpers+=($!)
wait_for "$work/silent.port"
silent="http://127.0.0.1:$(cat "$work/silent.port")/"
mkdir "$work/tmp"
for sig in INT TERM; do
  TMPDIR="$work/tmp" $ofxkit exchange "$work/rq.ofx" "$silent" --quiet -o "$work/sig.ofx" > /dev/null 2>&1 &
  pid=$!
  for _ in $(seq 100); do [ -n "$(ls -A "$work/tmp")" ] && break; sleep 0.1; done
  check "SIG$sig: the transfer had its reply file" 1 "$(ls "$work/tmp" | grep -c '^ofxkit-reply-')"
  check "SIG$sig: no core dump while the password is held" 0 \
    "$(awk '/^Max core file size/ {print $5}' "/proc/$pid/limits" 2> /dev/null)"
  kill -"$sig" "$pid"
  wait "$pid"
  rc=$?
  [ "$sig" = INT ] && want=130 || want=143
  check "SIG$sig: exit status" "$want" "$rc"
  check "SIG$sig: transfer files removed" 0 "$(ls -A "$work/tmp" | wc -l)"
  check "SIG$sig: nothing saved" no "$(exists "$work/sig.ofx")"
done
start=$(date +%s)
$ofxkit exchange "$work/rq.ofx" "$silent" --quiet --timeout 1 -o "$work/t.ofx" > /dev/null 2>&1
check "a silent server times out" 4 $?
check "promptly" yes "$([ $(($(date +%s) - start)) -lt 10 ] && echo yes || echo no)"

# ---- serve: stays up, bounds each request, a private ready file -------------------
touch "$work/planted"
ln -s "$work/planted" "$work/url.tmp"
$ofxkit serve --https --cert-out "$work/ca.der" --ready-file "$work/url" --max-seconds 60 --request-seconds 1 \
  > /dev/null 2> "$work/serve.log" &
server=$!
helpers+=($server)
wait_for "$work/url"
url=$(cat "$work/url" 2> /dev/null)
check "the ready file names the server" "https://127.0.0.1:" "${url:0:18}"
check "a file planted at PATH.tmp is left alone" 0 "$(stat -c %s "$work/planted")"
python3 - "$url" << 'PY'
import socket, ssl, sys, urllib.parse
u = urllib.parse.urlsplit(sys.argv[1])
ctx = ssl.SSLContext(ssl.PROTOCOL_TLS_CLIENT)
ctx.check_hostname = False
ctx.verify_mode = ssl.CERT_NONE
for _ in range(5):  # shake hands, then hang up
    s = ctx.wrap_socket(socket.create_connection((u.hostname, u.port)))
    s.close()
PY
sleep 0.3
check "clients hanging up after the handshake: server still up" yes "$(kill -0 $server 2> /dev/null && echo yes || echo no)"
trickled=$(python3 - "$url" << 'PY'
import socket, ssl, sys, time, urllib.parse
u = urllib.parse.urlsplit(sys.argv[1])
ctx = ssl.SSLContext(ssl.PROTOCOL_TLS_CLIENT)
ctx.check_hostname = False
ctx.verify_mode = ssl.CERT_NONE
s = ctx.wrap_socket(socket.create_connection((u.hostname, u.port)))
start = time.time()
s.settimeout(0.3)
try:
    for c in b"POST / HTTP/1.1\r\nContent-Length: 100\r\nX-Padding: " + b"a" * 100:
        s.send(bytes([c]))
        try:
            if not s.recv(1):
                break
        except socket.timeout:
            pass
except (OSError, ssl.SSLError):
    pass
print("cut" if time.time() - start < 4 else "held")
PY
)
check "a trickling client is cut off at the request deadline" cut "$trickled"
$ofxkit exchange "$work/rq.ofx" "$url" --trust "$work/ca.der" --quiet -o "$work/net.ofx" > /dev/null 2>&1
check "and the statement still comes back" "0 1" "$? $(grep -c '<STMTRS>' "$work/net.ofx")"
kill -TERM $server
wait $server
check "server: clean exit" 0 $?
check "ready file removed" no "$(exists "$work/url")"

echo "$((checks - failures)) passed, $failures failed"
[ "$failures" -eq 0 ]
