#!/usr/bin/env bash
# Installs the Debian packages the project builds with, only those that are missing.
set -euo pipefail

packages=(
  build-essential cmake ninja-build pkg-config ccache
  libfftw3-dev nlohmann-json3-dev libmsgsl-dev libcli11-dev
  libgtest-dev libgmock-dev libbenchmark-dev
  python3 python3-numpy python3-matplotlib
  clang libclang-rt-dev
)

missing=()
for p in "${packages[@]}"; do
  dpkg-query -W -f='${Status}' "$p" 2>/dev/null | grep -q 'install ok installed' || missing+=("$p")
done
[ ${#missing[@]} -eq 0 ] && exit 0

sudo_cmd=()
[ "$(id -u)" -ne 0 ] && sudo_cmd=(sudo)
echo "deps: installing ${missing[*]}"
export DEBIAN_FRONTEND=noninteractive
"${sudo_cmd[@]}" apt-get update -qq
"${sudo_cmd[@]}" apt-get install -y -qq --no-install-recommends "${missing[@]}" >/dev/null
