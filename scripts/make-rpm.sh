#!/usr/bin/env bash
# Builds the RPM of the provider from a configured and built build tree with
# rpmbuild and the build file packaging/vexlan-cna-provider.rpmbuild: everything
# `make install` lays down, under /usr, the adapter library found beside the
# provider through its run path $ORIGIN.
#
#   scripts/make-rpm.sh BUILD OUTDIR       writes OUTDIR/vexlan-cna-provider-<version>-1.<arch>.rpm
#                                          and prints its path
#   VERSION=V scripts/make-rpm.sh ...      another package version than the project's
set -euo pipefail
build=$(cd "${1:?build directory}" && pwd)
out=$(mkdir -p "${2:?output directory}" && cd "$2" && pwd)
src=$(cd "$(dirname "$0")/.." && pwd)

for tool in rpmbuild patchelf; do
  command -v "$tool" > /dev/null || { echo "make-rpm: $tool is missing (scripts/install-rpm-tools.sh installs it)" >&2; exit 1; }
done
version=${VERSION:-$(sed -n 's/^project(VexlanCNAProvider VERSION \([0-9.]*\).*/\1/p' "$src/CMakeLists.txt")}
work=$(mktemp -d /tmp/vexlan-rpm.XXXXXX)
trap 'rm -rf "$work"' EXIT
VERSION=$version "$src/scripts/stage-package.sh" "$build" "$work/root" origin

if ! rpmbuild -bb --quiet --define "_topdir $work/top" --define "_rpmdir $work/rpms" \
       --define "pkgversion $version" --define "stagedir $work/root" \
       "$src/packaging/vexlan-cna-provider.rpmbuild" > "$work/rpmbuild.log" 2>&1; then
  cat "$work/rpmbuild.log" >&2; exit 1
fi
rpm=$(find "$work/rpms" -name "vexlan-cna-provider-$version-1.*.rpm" | head -1)
[ -n "$rpm" ] || { cat "$work/rpmbuild.log" >&2; echo "make-rpm: rpmbuild wrote no package" >&2; exit 1; }
cp "$rpm" "$out/"
echo "$out/$(basename "$rpm")"
