#!/usr/bin/env bash
# Installs the Debian packages the build and the tests need, and the further
# packages named as arguments (`make fuzz`: clang and its libFuzzer runtime);
# a no-op when all are present.
set -euo pipefail
pkgs=(cmake ninja-build g++ make libgtest-dev libgmock-dev nlohmann-json3-dev libcrypt-dev ccache util-linux binutils python3 patchelf "$@")
missing=()
for p in "${pkgs[@]}"; do
  dpkg-query -W -f='${Status}' "$p" 2>/dev/null | grep -q 'install ok installed' || missing+=("$p")
done
[ ${#missing[@]} -eq 0 ] && exit 0
echo "installing: ${missing[*]}"
SUDO=""
[ "$(id -u)" -eq 0 ] || SUDO=sudo
export DEBIAN_FRONTEND=noninteractive
$SUDO apt-get update -qq
$SUDO apt-get install -y -qq --no-install-recommends "${missing[@]}"
