#!/usr/bin/env bash
# Installs the dependencies, then builds and runs the whole test suite twice:
# an ordinary build (with benchmarks compiled) and an AddressSanitizer +
# UndefinedBehaviorSanitizer build.
set -euo pipefail
cd "$(dirname "$0")/.."
scripts/install-deps.sh

cmake -S . -B build -DCMAKE_BUILD_TYPE=RelWithDebInfo
cmake --build build -j2
ctest --test-dir build --output-on-failure -j2

cmake -S . -B build-asan -DCMAKE_BUILD_TYPE=Debug -DOFXKIT_SANITIZE=ON -DOFXKIT_BUILD_BENCH=OFF
cmake --build build-asan -j2
ASAN_OPTIONS=detect_leaks=1 UBSAN_OPTIONS=print_stacktrace=1 ctest --test-dir build-asan --output-on-failure -j2

# The parser fuzz target (libFuzzer, clang): a short, time-bounded run.
CXX=clang++ cmake -S . -B build-fuzz -DCMAKE_BUILD_TYPE=RelWithDebInfo -DOFXKIT_BUILD_FUZZ=ON \
  -DOFXKIT_BUILD_TESTS=OFF -DOFXKIT_BUILD_BENCH=OFF
cmake --build build-fuzz -j2 --target ofxkit_fuzz_parse
ctest --test-dir build-fuzz --output-on-failure
