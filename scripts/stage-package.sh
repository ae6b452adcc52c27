#!/usr/bin/env bash
# Lays down the installed tree of a built build tree under /usr in ROOT, as
# the RPM and Debian packages ship it (scripts/make-rpm.sh, scripts/make-deb.sh):
# the provider's run path as RPATH says, programs and libraries without debug
# information (which names the build tree), manual pages compressed, the
# documentation in /usr/share/doc/vexlan-cna-provider with a copyright file.
#
#   scripts/stage-package.sh BUILD ROOT RPATH
#       RPATH  none     no run path: both libraries lie where the loader looks
#              origin   $ORIGIN: the adapter library is found beside the provider
set -euo pipefail
build=$(cd "${1:?build directory}" && pwd)
root=${2:?staging root}
rpath=${3:?none or origin}
pkg=vexlan-cna-provider
version=${VERSION:-$(sed -n 's/^project(VexlanCNAProvider VERSION \([0-9.]*\).*/\1/p' "$(dirname "$0")/../CMakeLists.txt")}

command -v patchelf > /dev/null || { echo "stage-package: patchelf is missing (scripts/install-deb-tools.sh installs it)" >&2; exit 1; }
log=$(mktemp)
trap 'rm -f "$log"' EXIT
DESTDIR=$root "${CMAKE:-cmake}" --install "$build" --prefix /usr > "$log" 2>&1 || { cat "$log" >&2; exit 1; }

# The build tree's run path names a /usr/local or build directory, which must
# not reach an installed system.
for lib in "$root"/usr/lib*/libVexlan_CNA_Provider.so.1 "$root"/usr/lib*/*/libVexlan_CNA_Provider.so.1; do
  [ -f "$lib" ] || continue
  case "$rpath" in
    none) patchelf --remove-rpath "$lib" ;;
    origin) patchelf --set-rpath '$ORIGIN' "$lib" ;;
    *) echo "stage-package: RPATH is none or origin" >&2; exit 2 ;;
  esac
done

find "$root" -type f \( -name '*.so*' -o -path '*/bin/*' \) -exec sh -c 'head -c4 "$1" | grep -q ELF' _ {} \; \
     -exec strip --strip-unneeded --remove-section=.comment {} +
find "$root/usr/share/man" -type f -name '*.[0-9]' -exec gzip -9n {} +
install -d "$root/usr/share/doc/$pkg"
if [ -d "$root/usr/share/doc/vexlan-cna" ]; then
  mv "$root/usr/share/doc/vexlan-cna/"* "$root/usr/share/doc/$pkg/"
  rmdir "$root/usr/share/doc/vexlan-cna"
fi
cat > "$root/usr/share/doc/$pkg/copyright" <<COPYRIGHT
Vexlan CNA provider $version
Copyright Vexlan Corporation. All rights reserved.
COPYRIGHT
find "$root" -type d -exec chmod 0755 {} +
