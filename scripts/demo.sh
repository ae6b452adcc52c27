#!/usr/bin/env bash
# A short tour of the provider: cimhost loads build/lib/libVexlan_CNA_Provider.so.1
# against the default simulated adapters, shows the host's computer system and
# the object paths of every class that answers, then the tail of the provider's
# log. It runs with private /opt and /var/tmp (tests/isolate.sh), so it leaves no
# files behind; where that is not possible it runs in a temporary working
# directory with the provider's log off and creates nothing under the real /opt.
# With DEMO_SOURCE=sysfs (make demo-real) the adapter library reads this
# machine's real adapters from /sys instead: what it finds comes first.
set -euo pipefail
ROOT=$(cd "$(dirname "$0")/.." && pwd)
if [ "${1:-}" = --inside ]; then BUILD=$2; else BUILD=$(cd "${1:-$ROOT/build}" && pwd); fi
LOG=/opt/Vexlan_Corporation/CNAProviders/log/Vexlan_CNA_Provider.log

# The classes of the tour: every class registered as an instance class, in the
# order of the class table, associations left out.
tour_classes() {
  awk -F'\t' '!/^#/ && NF >= 6 && $4 ~ /instance/ && $4 !~ /association/ {print $1}' \
    "$BUILD/share/vexlan-cna/classes.tsv"
}

# The adapters the tour shows: the simulated ones, or with DEMO_SOURCE=sysfs
# this machine's, through an adapter description that chooses the sysfs source.
SOURCE_TEXT="the default simulated adapters"
choose_source() {
  [ "${DEMO_SOURCE:-}" = sysfs ] || return 0
  SOURCE_TEXT="this machine's real adapters (/sys)"
  printf '{"source": "sysfs"}\n' > real-host.json
  export ZORAP_SIM_ADAPTERS="$PWD/real-host.json"
  echo "== what the adapter library reads from /sys (PCI functions with an FC host or a network interface)"
  "$BUILD/bin/zorap_sim_dump" real-host.json || true
  echo
}

run_tour() {
  local batch=tour.batch
  choose_source
  {
    echo "# The host that carries the adapters"
    echo "ei root/vexlan_cmpi:Vexlan_Adapter_ComputerSystem"
    for cls in $(tour_classes); do
      [ "$cls" = Vexlan_Adapter_ComputerSystem ] && continue
      echo "ein root/vexlan_cmpi:$cls"
    done
  } > "$batch"
  echo "== cimhost: the provider against $SOURCE_TEXT"
  "$BUILD/bin/cimhost" --strict -p "$BUILD/lib/libVexlan_CNA_Provider.so.1" -n Vexlan_CNA_Provider \
    -m "$BUILD/share/vexlan-cna/mof" -N root/vexlan_cmpi batch "$batch" > tour.out 2> tour.err || true
  # The host in full, then one line per class that answers: its instance
  # count and the first object path.
  sed -n '/^instance of Vexlan_Adapter_ComputerSystem/,/^};/p' tour.out
  echo
  echo "== object paths per class"
  awk -F'[:.]' '/^root\/vexlan_cmpi:/ { n[$2]++; if (!($2 in first)) { first[$2] = $0; order[++k] = $2 } }
       END { for (i = 1; i <= k; i++) printf "%3d  %s\n     e.g. %s\n", n[order[i]], order[i], first[order[i]] }' tour.out
  grep -v '^Vexlan_NIC_Properties::reload' tour.err || true
  nic_tour
}

# The NIC side in full: the ports, their controller and endpoints, the NIC
# profile that answers to "6", and the object manager with its namespaces.
nic_tour() {
  local batch=nic.batch
  {
    for cls in Vexlan_NIC_EthernetPort2 Vexlan_NIC_NetworkPort Vexlan_NIC_PortController \
               Vexlan_NIC_LANEndpoint Vexlan_NIC_IPProtocolEndpoint Vexlan_NIC_IPProtocolEndpointCapabilities; do
      echo "ei root/vexlan_cmpi:$cls"
    done
    echo 'gi root/vexlan_cmpi:Vexlan_NIC_RegisteredProfile.InstanceID="6"'
    echo "ei root/vexlan_cmpi:Vexlan_FCHBA_ObjectManager"
    echo "ein root/vexlan_cmpi:Vexlan_FCHBA_Namespace"
  } > "$batch"
  echo
  echo "== the NIC side: ports, controller, endpoints, a profile, the object manager"
  "$BUILD/bin/cimhost" --strict -p "$BUILD/lib/libVexlan_CNA_Provider.so.1" -n Vexlan_CNA_Provider \
    -m "$BUILD/share/vexlan-cna/mof" -N root/vexlan_cmpi batch "$batch" 2> nic.err | grep -v '^//' || true
  grep -v '^Vexlan_NIC_Properties::reload' nic.err || true
}

if [ "${1:-}" = --inside ]; then
  # Private /opt: settings that switch both logs on, a poll every 2 seconds.
  mkdir -p "$(dirname "$LOG")"
  printf 'DebugLog=1\nErrorLog=1\n' > /opt/Vexlan_Corporation/CNAProviders/vexlancna.properties
  printf 'LinkStatusPollIntervalSeconds=0\n' > vexlancna.properties
  run_tour
  echo
  echo "== the provider's log ($LOG), last lines"
  tail -n 25 "$LOG" 2>/dev/null || echo "(no log)"
  exit 0
fi

if [ ! -x "$BUILD/bin/cimhost" ] || [ ! -e "$BUILD/lib/libVexlan_CNA_Provider.so.1" ]; then
  echo "demo: build first (make build); $BUILD has no cimhost or provider library" >&2
  exit 1
fi

rc=0
"$ROOT/tests/isolate.sh" bash "$ROOT/scripts/demo.sh" --inside "$BUILD" || rc=$?
if [ "$rc" -eq 77 ]; then
  echo "demo: private /opt not available; running in a temporary directory with the provider's log off"
  work=$(mktemp -d)
  trap 'rm -rf "$work"' EXIT
  cd "$work"
  printf 'LinkStatusPollIntervalSeconds=0\n' > vexlancna.properties
  run_tour
  exit 0
fi
exit "$rc"
