#!/usr/bin/env bash
# Installs the Debian packages the build and the tests need (rpm: the package
# test reads the RPM's file list and scriptlets), and the further
# packages named as arguments (`make fuzz`: clang and its libFuzzer runtime);
# a no-op when all are present.
exec "$(dirname "$0")/install-packages.sh" cmake ninja-build g++ make libgtest-dev libgmock-dev nlohmann-json3-dev \
  libcrypt-dev ccache util-linux binutils python3 patchelf rpm "$@"
