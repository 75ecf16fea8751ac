#!/usr/bin/env bash
# Writes cmake/hot-functions.txt: the code sections of the library functions
# that reading OFX files runs, which the build places side by side (see
# "Code layout" in CMakeLists.txt). Run it after changes to the parse path:
#
#   scripts/hot-functions.sh BUILD_DIR FILE...
#
# with a built tree and a few response files (a bank statement, a brokerage
# statement with its security list, ...). Each file is read by the tool's
# statement and dump commands under callgrind (package valgrind). A stale
# list does no harm: functions it no longer names are placed as usual.
set -euo pipefail
build=${1:?usage: $0 BUILD_DIR FILE...}
shift
[ $# -gt 0 ] || { echo "usage: $0 BUILD_DIR FILE..." >&2; exit 2; }
tool="$build/tools/ofxkit"
out="$(cd "$(dirname "$0")/.." && pwd)/cmake/hot-functions.txt"
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
n=0
for file in "$@"; do
  for command in statement dump; do
    n=$((n + 1))
    valgrind --tool=callgrind --demangle=no --callgrind-out-file="$work/run.$n" \
      "$tool" "$command" "$file" >/dev/null 2>&1 || true
  done
done
for run in "$work"/run.*; do
  callgrind_annotate --threshold=100 "$run" 2>/dev/null | grep 'libofxkit\.so' || true
done | sed -E 's/.*:([^ ]+) \[.*/\1/' | grep -v '^0x' | sort -u | python3 -c '
import re, sys
# A complete-object constructor or destructor (C1, D1) is an alias of the
# base-object one (C2, D2), whose section is the one that holds the code.
seen = []
for name in (line.strip() for line in sys.stdin):
    for variant in (name, re.sub(r"C1E", "C2E", name, count=1), re.sub(r"D1E", "D2E", name, count=1)):
        if variant not in seen:
            seen.append(variant)
print("\n".join(".text." + name for name in seen))
' > "$out"
echo "$out: $(wc -l < "$out") sections"
