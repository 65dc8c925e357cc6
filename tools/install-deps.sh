#!/usr/bin/env bash
# Installs the Debian packages the build, the tools and the tests need, when any is missing.
# Needs root (or sudo) only when something has to be installed.
set -euo pipefail
# libosmesa6-dev is optional: only the peer benchmark (zr_bench_peer) needs it, and the build
# leaves that benchmark out where it is missing.
packages=(g++ cmake ninja-build pkg-config libgtest-dev libgmock-dev libbenchmark-dev libosmesa6-dev
          libassimp-dev libopenimageio-dev libcli11-dev libopenexr-dev openimageio-tools assimp-testmodels
          libmurmurhash-dev)
missing=()
for p in "${packages[@]}"; do
  dpkg-query -W -f='${Status}' "$p" 2>/dev/null | grep -q "install ok installed" || missing+=("$p")
done
if ((${#missing[@]})); then
  echo "installing: ${missing[*]}"
  sudo_cmd=()
  [ "$(id -u)" -eq 0 ] || sudo_cmd=(sudo)
  export DEBIAN_FRONTEND=noninteractive
  "${sudo_cmd[@]}" apt-get update -q
  "${sudo_cmd[@]}" apt-get install -y -q --no-install-recommends "${missing[@]}"
fi
