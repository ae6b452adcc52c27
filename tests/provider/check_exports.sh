#!/usr/bin/env bash
# The provider library exports its four factories and nothing else a server
# could take for an entry point.
set -euo pipefail
lib=$1
symbols=$(nm -D --defined-only "$lib" | awk '$2 ~ /^[TtWwDdBbVvIi]$/ {print $3}' | sort)
expected=$(printf '%s\n' Vexlan_CNA_Provider_Create_AssociationMI Vexlan_CNA_Provider_Create_IndicationMI \
                         Vexlan_CNA_Provider_Create_InstanceMI Vexlan_CNA_Provider_Create_MethodMI | sort)
if [ "$symbols" != "$expected" ]; then
  echo "exported symbols differ from the four factories:"; echo "$symbols"; exit 1
fi
if nm -D "$lib" | grep -q '_Generic_Create_'; then
  echo "a _Generic_Create_ symbol is present"; exit 1
fi
if ! readelf -d "$lib" | grep -q 'NEEDED.*libzorap_cna_provider\.so\.1'; then
  echo "not linked against libzorap_cna_provider.so.1 by name"; exit 1
fi
if ! readelf -d "$lib" | grep -q 'SONAME.*libVexlan_CNA_Provider\.so\.1'; then
  echo "soname is not libVexlan_CNA_Provider.so.1"; exit 1
fi
echo "exports: the four factories"
