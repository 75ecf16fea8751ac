#!/usr/bin/env bash
# Whole-process timings of the ofxkit tool with hyperfine, side by side with
# a bare C++ hello-world program and, when they are installed, the tools a
# user would otherwise reach for: ofxdump (Debian package ofx) and a Python
# script over ofxparse (python3-ofxparse). Prints medians and the ratios.
#
# usage: bench/process_bench.sh [OFXKIT] [TRANSACTIONS]
#   OFXKIT        the tool (default: build/tools/ofxkit)
#   TRANSACTIONS  size of the generated statement (default 17000, about 2.8 MB)
set -euo pipefail
here=$(cd "$(dirname "$0")/.." && pwd)
ofxkit=$(realpath "${1:-$here/build/tools/ofxkit}")
count=${2:-17000}
gen="$here/../shared/tools/gen_statement.py"
runs=${RUNS:-20}

command -v hyperfine > /dev/null || { echo "hyperfine is not installed (apt install hyperfine)" >&2; exit 1; }
[ -x "$ofxkit" ] || { echo "no tool at $ofxkit" >&2; exit 1; }
[ -f "$gen" ] || { echo "no statement generator at $gen" >&2; exit 1; }

work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
python3 "$gen" 3 > "$work/small.ofx"
python3 "$gen" "$count" > "$work/large.ofx"
printf '#include <iostream>\nint main() { std::cout << "hello, world" << std::endl; }\n' > "$work/hello.cpp"
c++ -O2 -o "$work/hello" "$work/hello.cpp"
cat > "$work/ofxparse_dump.py" <<'PY'
import sys
from ofxparse import OfxParser
with open(sys.argv[1], "rb") as f:
    ofx = OfxParser.parse(f)
for account in ofx.accounts:
    for tx in account.statement.transactions:
        print(tx.date, tx.amount, tx.type, tx.id, tx.payee, tx.memo, sep=",")
PY
echo "files: small $(stat -c %s "$work/small.ofx") bytes, large $(stat -c %s "$work/large.ofx") bytes ($count transactions)"

names=(hello help dump_small dump statement)
cmds=("$work/hello" "$ofxkit --help" "$ofxkit dump $work/small.ofx" "$ofxkit dump $work/large.ofx"
      "$ofxkit statement $work/large.ofx")
if command -v ofxdump > /dev/null; then
  names+=(ofxdump)
  cmds+=("ofxdump $work/large.ofx")
fi
# Debian's python3-ofxparse is for the system's Python, whatever python3 is first on PATH.
for py in /usr/bin/python3 python3; do
  if "$py" -c 'import ofxparse' 2> /dev/null; then
    names+=(ofxparse)
    cmds+=("$py $work/ofxparse_dump.py $work/large.ofx")
    break
  fi
done
args=()
for i in "${!cmds[@]}"; do
  args+=(-n "${names[$i]}" "${cmds[$i]}")
done
# Without a shell between (-N); exit statuses are not ours to judge here
# (ofxdump answers 1 on a clean file).
hyperfine -N -i --warmup 2 --min-runs 3 --max-runs "$runs" --style none --output=pipe \
  --export-json "$work/times.json" "${args[@]}" > /dev/null

# Peak memory (maximum resident set) of the tool, above its own baseline.
peak() { /usr/bin/time -f %M "$@" 2>&1 > /dev/null | tail -1; }
mem_base=$(peak "$ofxkit" --help)
mem_dump=$(peak "$ofxkit" dump "$work/large.ofx")
mem_stmt=$(peak "$ofxkit" statement "$work/large.ofx")

python3 - "$work/times.json" "$(stat -c %s "$work/large.ofx")" "$mem_base" "$mem_dump" "$mem_stmt" <<'PY'
import json, sys
results = {r["command"]: r for r in json.load(open(sys.argv[1]))["results"]}
size, base, dump, stmt = int(sys.argv[2]), int(sys.argv[3]), int(sys.argv[4]), int(sys.argv[5])
med = {name: r["median"] * 1000 for name, r in results.items()}
print("%-12s %10s" % ("command", "median ms"))
for name, ms in med.items():
    print("%-12s %10.1f" % (name, ms))
print()
if "hello" in med:
    print("%-52s %8.2fx" % ("dump of a small file / hello world", med["dump_small"] / med["hello"]))
    print("%-52s %8.2fx" % ("--help / hello world", med["help"] / med["hello"]))
for tool in ("ofxdump", "ofxparse"):
    if tool in med:
        print("%-52s %8.1fx" % ("%s / ofxkit statement (times faster)" % tool, med[tool] / med["statement"]))
        print("%-52s %8.1fx" % ("%s / ofxkit dump (times faster)" % tool, med[tool] / med["dump"]))
print()
print("peak memory above baseline (%d KiB): dump %.1f MiB (%.2fx the file), statement %.1f MiB (%.2fx)" % (
    base, (dump - base) / 1024, (dump - base) * 1024 / size, (stmt - base) / 1024, (stmt - base) * 1024 / size))
PY
