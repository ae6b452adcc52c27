#!/usr/bin/env bash
# Builds the Debian package of the provider from a configured and built build
# tree, with Debian's own tools (dpkg-deb, dpkg-shlibdeps, patchelf, fakeroot
# when present): everything `make install` lays down, under /usr.
#
#   scripts/make-deb.sh BUILD OUTDIR       writes OUTDIR/vexlan-cna-provider_<version>_<arch>.deb
#                                          and prints its path
set -euo pipefail
build=$(cd "${1:?build directory}" && pwd)
out=$(mkdir -p "${2:?output directory}" && cd "$2" && pwd)
src=$(cd "$(dirname "$0")/.." && pwd)
pkg=vexlan-cna-provider

for tool in dpkg-deb patchelf; do
  command -v "$tool" > /dev/null || { echo "make-deb: $tool is missing (scripts/install-deb-tools.sh installs it)" >&2; exit 1; }
done

version=$(sed -n 's/^project(VexlanCNAProvider VERSION \([0-9.]*\).*/\1/p' "$src/CMakeLists.txt")
arch=$(dpkg --print-architecture)
work=$(mktemp -d /tmp/vexlan-deb.XXXXXX)
trap 'rm -rf "$work"' EXIT
root=$work/debian/$pkg

# The installed tree, under /usr.
DESTDIR=$root "${CMAKE:-cmake}" --install "$build" --prefix /usr > "$work/install.log" 2>&1 ||
  { cat "$work/install.log" >&2; exit 1; }

# Both libraries lie in a directory of the loader's default path, so the
# provider needs no run path (the build tree's names a /usr/local or build
# directory, which must not reach an installed system).
for lib in "$root"/usr/lib*/libVexlan_CNA_Provider.so.1 "$root"/usr/lib*/*/libVexlan_CNA_Provider.so.1; do
  [ -f "$lib" ] && patchelf --remove-rpath "$lib"
done

# Shipped without debug information (which also names the build tree).
find "$root" -type f \( -name '*.so*' -o -path '*/bin/*' \) -exec sh -c 'head -c4 "$1" | grep -q ELF' _ {} \; \
     -exec strip --strip-unneeded --remove-section=.comment {} +

# Debian keeps manual pages compressed and documentation with a copyright file.
find "$root/usr/share/man" -type f -name '*.[0-9]' -exec gzip -9n {} +
install -d "$root/usr/share/doc/$pkg"
if [ -d "$root/usr/share/doc/vexlan-cna" ]; then
  mv "$root/usr/share/doc/vexlan-cna/"* "$root/usr/share/doc/$pkg/"
  rmdir "$root/usr/share/doc/vexlan-cna"
fi
cat > "$root/usr/share/doc/$pkg/copyright" <<EOF
Vexlan CNA provider $version
Copyright Vexlan Corporation. All rights reserved.
EOF

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
 Registering it with OpenPegasus: link /usr/lib/libVexlan_CNA_Provider.so
 into the server's provider directory, load
 /usr/share/vexlan-cna/Vexlan_CNA_Provider.mof into root/vexlan_cmpi,
 Vexlan_CNA_Provider_Interop.mof into root/PG_InterOp and
 Vexlan_CNA_Provider_Registration.mof into root/PG_InterOp with cimmof.
 .
 Registering it with sfcb: link the library into a directory of sfcb's
 providerDirs, stage both MOF files with sfcbstage -r Vexlan_CNA_Provider.reg
 (root/vexlan_cmpi and root/interop), run sfcbrepos and restart sfcbd.
 .
 The whole guide: man 8 vexlan-cna. Without a server: cimhost ei
 Vexlan_FCHBA_FCPort.
EOF
find "$root" -type d -exec chmod 0755 {} +

deb=$out/${pkg}_${version}_${arch}.deb
if command -v fakeroot > /dev/null; then
  fakeroot dpkg-deb --build -Zxz "$root" "$deb" > /dev/null
else
  dpkg-deb --root-owner-group --build -Zxz "$root" "$deb" > /dev/null
fi
echo "$deb"
