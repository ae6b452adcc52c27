#!/usr/bin/env bash
# Runs a command in a private mount namespace where /opt and /var/tmp are empty
# tmpfs mounts, so that a test may create /opt/Vexlan_Corporation/... and
# /var/tmp/vxln_cna_provider.config without touching the machine's real files.
# The working directory is a fresh temporary directory unless ISOLATE_KEEP_CWD=1.
# Usage: isolate.sh COMMAND [ARGS...]
set -euo pipefail
if [ "$(id -u)" -ne 0 ] || ! unshare -m --propagation private true 2>/dev/null; then
  echo "isolate.sh: needs root and unshare -m to isolate /opt and /var/tmp" >&2
  exit 77   # ctest SKIP_RETURN_CODE
fi
exec unshare -m --propagation private -- bash -c '
  set -e
  mount -t tmpfs vexlan-opt /opt
  mount -t tmpfs vexlan-vartmp /var/tmp
  if [ "${ISOLATE_KEEP_CWD:-0}" != 1 ]; then cd "$(mktemp -d /var/tmp/cwd.XXXXXX)"; fi
  exec "$@"
' isolate "$@"
