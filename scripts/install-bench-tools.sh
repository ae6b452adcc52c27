#!/usr/bin/env bash
# Installs the Debian packages that `make bench` uses; a no-op when present.
# valgrind (callgrind) counts the instructions, gnuplot draws the plot.
exec "$(dirname "$0")/install-packages.sh" valgrind gnuplot-nox python3
