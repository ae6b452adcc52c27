#!/usr/bin/env bash
# Builds the Debian package of the provider from a configured and built build
# tree, with Debian's own tools (dpkg-deb, dpkg-shlibdeps, patchelf, fakeroot
# when present): everything `make install` lays down, under /usr, with the
# maintainer scripts of packaging/debian.
#
#   scripts/make-deb.sh BUILD OUTDIR       writes OUTDIR/vexlan-cna-provider_<version>_<arch>.deb
#                                          and prints its path
#   VERSION=V scripts/make-deb.sh ...      another package version than the project's
set -euo pipefail
build=$(cd "${1:?build directory}" && pwd)
out=$(mkdir -p "${2:?output directory}" && cd "$2" && pwd)
src=$(cd "$(dirname "$0")/.." && pwd)
pkg=vexlan-cna-provider

for tool in dpkg-deb patchelf; do
  command -v "$tool" > /dev/null || { echo "make-deb: $tool is missing (scripts/install-deb-tools.sh installs it)" >&2; exit 1; }
done

version=${VERSION:-$(sed -n 's/^project(VexlanCNAProvider VERSION \([0-9.]*\).*/\1/p' "$src/CMakeLists.txt")}
arch=$(dpkg --print-architecture)
work=$(mktemp -d /tmp/vexlan-deb.XXXXXX)
trap 'rm -rf "$work"' EXIT
root=$work/debian/$pkg

# The installed tree under /usr; both libraries lie in a directory of the
# loader's default path, so the provider needs no run path.
VERSION=$version "$src/scripts/stage-package.sh" "$build" "$root" none

# Dependencies of the shipped programs and libraries on the system's own.
depends="libc6 (>= 2.34), libcrypt1, libgcc-s1, libstdc++6 (>= 11)"
if command -v dpkg-shlibdeps > /dev/null; then
  mkdir -p "$work/debian"
  printf 'Source: %s\n\nPackage: %s\nArchitecture: any\n' "$pkg" "$pkg" > "$work/debian/control"
  mapfile -t elves < <(find "$root" -type f \( -name '*.so*' -o -path '*/bin/*' \) -exec sh -c 'head -c4 "$1" | grep -q ELF' _ {} \; -print)
  found=$(cd "$work" && dpkg-shlibdeps -O --ignore-missing-info -l"$(dirname "${elves[0]}")" "${elves[@]}" 2> /dev/null |
          sed -n 's/^shlibs:Depends=//p')
  [ -n "$found" ] && depends=$found
fi

size=$(du -sk "$root" | cut -f1)
install -d "$root/DEBIAN"
cat > "$root/DEBIAN/control" <<EOF
Package: $pkg
Version: $version
Architecture: $arch
Maintainer: Vexlan Corporation <support@vexlan.invalid>
Installed-Size: $size
Depends: $depends
Section: admin
Priority: optional
Description: CIM instrumentation for converged network adapters and FC HBAs
 libVexlan_CNA_Provider.so.1 is a CMPI 2.0 provider that a CIM server
 (OpenPegasus or SBLIM sfcb) loads to publish the host's converged network
 adapters and Fibre Channel HBAs in the namespace root/vexlan_cmpi: FC ports,
 controllers, statistics, SCSI endpoints and LUNs, physical packages, Ethernet
 and IP endpoints, software identities, flash update services and alerts.
 .
 Installing the package registers the provider with the CIM server of
 the machine, and removing it deregisters it, with vexlan-cna-register(8):
 OpenPegasus gets the class MOF and the registration through cimmof, sfcb
 gets them staged with sfcbstage and its repository rebuilt with sfcbrepos.
 .
 The whole guide: man 8 vexlan-cna. Without a server: cimhost ei
 Vexlan_FCHBA_FCPort.
EOF
# Registration with the CIM server at installation, deregistration before
# an upgrade or a removal (vexlan-cna-register).
install -m 0755 "$src"/packaging/debian/postinst "$src"/packaging/debian/prerm \
        "$src"/packaging/debian/postrm "$root/DEBIAN/"

deb=$out/${pkg}_${version}_${arch}.deb
if command -v fakeroot > /dev/null; then
  fakeroot dpkg-deb --build -Zxz "$root" "$deb" > /dev/null
else
  dpkg-deb --root-owner-group --build -Zxz "$root" "$deb" > /dev/null
fi
echo "$deb"
