#!/usr/bin/env bash
# Installs what `make rpm` and the package test use: Debian's rpm (rpmbuild,
# rpm) and patchelf; a no-op when present.
exec "$(dirname "$0")/install-packages.sh" rpm patchelf
