#!/usr/bin/env bash
# Installs what a fresh Debian 12 machine lacks to build and test ofxkit.
set -euo pipefail
packages=(cmake make g++ clang libclang-rt-14-dev pkg-config libgtest-dev libgmock-dev libbenchmark-dev nlohmann-json3-dev python3 libssl-dev libcurl4-openssl-dev hyperfine)
missing=()
for p in "${packages[@]}"; do
  dpkg-query -W -f='${Status}' "$p" 2>/dev/null | grep -q 'install ok installed' || missing+=("$p")
done
if [ ${#missing[@]} -gt 0 ]; then
  echo "installing: ${missing[*]}"
  SUDO=""
  [ "$(id -u)" -eq 0 ] || SUDO=sudo
  $SUDO apt-get update -q
  DEBIAN_FRONTEND=noninteractive $SUDO apt-get install -y -q --no-install-recommends "${missing[@]}"
fi
