#!/usr/bin/env bash
# Installs the dependencies, builds the library and runs the example program.
set -euo pipefail
cd "$(dirname "$0")/.."
scripts/install-deps.sh
cmake -S . -B build -DCMAKE_BUILD_TYPE=RelWithDebInfo
cmake --build build -j2 --target ofxkit_values_demo
build/examples/ofxkit_values_demo
