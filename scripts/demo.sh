#!/usr/bin/env bash
# Installs the dependencies, builds the library and the ofxkit tool, then runs
# a statement download on paper: build a request file, answer it with a
# response file the library writes, and print that statement as CSV.
set -euo pipefail
cd "$(dirname "$0")/.."
scripts/install-deps.sh
cmake -S . -B build -DCMAKE_BUILD_TYPE=RelWithDebInfo
cmake --build build -j2 --target ofxkit_cli ofxkit_values_demo
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
ofxkit=build/tools/ofxkit
echo "== request: sign-on + bank statement request (password read without echo, here from a pipe)"
echo "demo-password" | "$ofxkit" request statement --org "Demo Bank" --fid 1234 --user alice --password-stdin \
  --bank-id 121000248 --account 1001 --type CHECKING --start 20261101 --end 20261123 -o "$work/request.ofx"
echo "== response: a bank's answer, written by the library"
echo "demo-password" | "$ofxkit" respond --user alice --password-stdin --transactions 8 "$work/request.ofx" \
  -o "$work/response.ofx"
"$ofxkit" dump "$work/response.ofx" > "$work/dump.txt"
head -40 "$work/dump.txt"
echo "== the statement as CSV"
"$ofxkit" statement "$work/response.ofx"
