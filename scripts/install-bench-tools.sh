#!/usr/bin/env bash
# Installs the Debian packages that `make bench` uses; a no-op when present.
# valgrind (callgrind) counts the instructions, gnuplot draws the plot.
set -euo pipefail
pkgs=(valgrind gnuplot-nox python3)
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
