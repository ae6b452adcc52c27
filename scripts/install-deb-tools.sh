#!/usr/bin/env bash
# Installs Debian's packaging tools that `make deb` uses; a no-op when present.
# patchelf is needed; dpkg-dev (dpkg-shlibdeps) and fakeroot make a better
# package (computed dependencies, files owned by root) and are taken when there.
set -euo pipefail
pkgs=(patchelf dpkg-dev fakeroot)
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
