#!/usr/bin/env bash
# Runs the provider inside cimhost against the default simulated adapters.
set -euo pipefail
BUILD=${1:-build}
exec "$BUILD/bin/cimhost-demo"
