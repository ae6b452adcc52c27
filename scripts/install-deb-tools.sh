#!/usr/bin/env bash
# Installs Debian's packaging tools that `make deb` uses; a no-op when present.
# patchelf is needed; dpkg-dev (dpkg-shlibdeps) and fakeroot make a better
# package (computed dependencies, files owned by root) and are taken when there.
exec "$(dirname "$0")/install-packages.sh" patchelf dpkg-dev fakeroot
