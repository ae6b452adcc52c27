#!/bin/sh
# Generates, from the class table (classes.tsv), everything that lists the
# provider's classes for a CIM server:
#
#   Vexlan_CNA_Provider.mof               class MOF for root/vexlan_cmpi
#   Vexlan_CNA_Provider_Interop.mof       class MOF for sfcb's interop namespace (the profiles)
#   Vexlan_CNA_Provider_Registration.mof  OpenPegasus registration (load into root/PG_InterOp):
#                                         the module, the provider, its classes in root/vexlan_cmpi
#                                         and the profiles it implements (PG_ProviderProfileCapabilities)
#   Vexlan_CNA_Provider.reg               sfcb registration (sfcbstage -r)
#
# Where the profiles are advertised: sfcb lets providers serve profile classes
# in its interop namespace, so the table's "interop" classes are registered
# there. OpenPegasus's own interop provider serves every CIM_RegisteredProfile
# and CIM_ElementConformsToProfile request in root/PG_InterOp and refuses
# profile classes it does not know; it advertises a provider's profiles from
# PG_ProviderProfileCapabilities instead, so the OpenPegasus registration
# registers no class in the interop namespace and lists the profiles below.
#
# Usage: gen-registration.sh [options] TABLE OUTDIR
#   --version V           PG_ProviderModule.Version (default 1.5.6)
#   --pegasus-interop NS  accepted for older callers: OpenPegasus registers no class in its
#                         interop namespace (see below)
#   --sfcb-interop NS     interop namespace of sfcb (default root/interop)
#
# Class files are read relative to the directory of TABLE. The class MOF
# files keep the table's order, which is load order.
# A row whose class file lies under dmtf/ is a class of the CIM schema: it
# is registered like the others but left out of the class MOF.
set -eu

version=1.5.6
pg_interop=root/PG_InterOp
sfcb_interop=root/interop
main_ns=root/vexlan_cmpi

usage() {
    echo "usage: $0 [--version V] [--pegasus-interop NS] [--sfcb-interop NS] TABLE OUTDIR" >&2
    exit 2
}

while [ $# -gt 0 ]; do
    case "$1" in
        --version) [ $# -ge 2 ] || usage; version=$2; shift 2 ;;
        --pegasus-interop) [ $# -ge 2 ] || usage; pg_interop=$2; shift 2 ;;
        --sfcb-interop) [ $# -ge 2 ] || usage; sfcb_interop=$2; shift 2 ;;
        --) shift; break ;;
        -*) usage ;;
        *) break ;;
    esac
done
[ $# -eq 2 ] || usage
table=$1
out=$2
[ -r "$table" ] || { echo "$0: cannot read $table" >&2; exit 1; }
mofdir=$(dirname "$table")
mkdir -p "$out"

# The rows without comments and blank lines; every row must have six fields.
rows=$(mktemp)
trap 'rm -f "$rows"' EXIT
awk -F '\t' '
    /^#/ || /^[ \t]*$/ { next }
    NF != 6 { printf "%s:%d: expected 6 tab-separated fields, found %d\n", FILENAME, FNR, NF > "/dev/stderr"; bad = 1; next }
    { print }
    END { exit bad }
' "$table" > "$rows"

# Class MOF per namespace, in table order. $1: namespace token, $2: file.
class_mof() {
    {
        echo "// Classes of the Vexlan CNA provider for the namespace \"$1\"."
        echo "// Generated from classes.tsv by gen-registration.sh."
        awk -F '\t' -v ns="$1" '$6 ~ /^dmtf\// { next } { n = split($2, a, " "); for (i = 1; i <= n; i++) if (a[i] == ns) { print $6; break } }' "$rows" |
        while IFS= read -r file; do
            [ -r "$mofdir/$file" ] || { echo "$0: missing class file $mofdir/$file" >&2; exit 1; }
            echo
            cat "$mofdir/$file"
        done
    } > "$2.tmp"
    mv "$2.tmp" "$2"
}
class_mof "$main_ns" "$out/Vexlan_CNA_Provider.mof"
class_mof interop "$out/Vexlan_CNA_Provider_Interop.mof"

# OpenPegasus: one module, one provider, one capability per registered class.
awk -F '\t' -v version="$version" '
    BEGIN {
        map["instance"] = 2; map["association"] = 3; map["indication"] = 4; map["method"] = 5
        print "// OpenPegasus registration of the Vexlan CNA provider; load into root/PG_InterOp."
        print "// Generated from classes.tsv by gen-registration.sh."
        print ""
        print "instance of PG_ProviderModule"
        print "{"
        print "    Name = \"Vexlan_CNA_ProviderModule\";"
        print "    Location = \"Vexlan_CNA_Provider\";"
        print "    Vendor = \"Vexlan Corporation\";"
        printf "    Version = \"%s\";\n", version
        print "    InterfaceType = \"CMPI\";"
        print "    InterfaceVersion = \"2.0.0\";"
        print "};"
        print ""
        print "instance of PG_Provider"
        print "{"
        print "    ProviderModuleName = \"Vexlan_CNA_ProviderModule\";"
        print "    Name = \"Vexlan_CNA_Provider\";"
        print "};"
    }
    $4 == "-" { next }
    {
        n = split($2, ns, " "); nslist = ""; k = 0
        for (i = 1; i <= n; i++) {
            if (ns[i] == "interop") continue
            nslist = nslist (k++ > 0 ? ", " : "") "\"" ns[i] "\""
        }
        n = split($4, ty, " "); tylist = ""
        for (i = 1; i <= n; i++) {
            if (!(ty[i] in map)) { printf "unknown provider type %s of %s\n", ty[i], $1 > "/dev/stderr"; exit 1 }
            tylist = tylist (i > 1 ? ", " : "") map[ty[i]]
        }
        print ""
        print "instance of PG_ProviderCapabilities"
        print "{"
        print "    ProviderModuleName = \"Vexlan_CNA_ProviderModule\";"
        print "    ProviderName = \"Vexlan_CNA_Provider\";"
        printf "    CapabilityID = \"%s\";\n", $1
        printf "    ClassName = \"%s\";\n", $1
        printf "    Namespaces = {%s};\n", nslist
        printf "    ProviderType = {%s};\n", tylist
        print "    SupportedProperties = NULL;"
        print "    SupportedMethods = NULL;"
        print "};"
    }
' "$rows" > "$out/Vexlan_CNA_Provider_Registration.mof.tmp"

# The profiles for OpenPegasus's interop provider: one PG_ProviderProfileCapabilities
# each, tab-separated: capability, RegisteredProfile (its value map: 6 SNIA:FC HBA,
# 0 Other), the name and organization of an "Other" profile, version, sub-profiles
# (1019 SNIA:FC Initiator Ports, 1024 SNIA:Indication; 3019 DMTF:Software Update,
# 3009 DMTF:Ethernet Port, 3026 DMTF:Host LAN Network Port, 3027 DMTF:IP Interface),
# and the classes whose every instance is a central instance. The interop
# provider wants at least one sub-profile (its MOF compiler takes no empty
# array), and its value map has the DMTF component profiles as sub-profiles
# only: each of them names itself, which the interop provider folds into the
# one profile. The HDR profile, which has no sub-profile, is not listed.
awk -F '\t' '
    {
        print ""
        print "instance of PG_ProviderProfileCapabilities"
        print "{"
        print "    ProviderModuleName = \"Vexlan_CNA_ProviderModule\";"
        print "    ProviderName = \"Vexlan_CNA_Provider\";"
        printf "    CapabilityID = \"%s\";\n", $1
        printf "    RegisteredProfile = %s;\n", $2
        if ($3 != "-") {
            printf "    OtherRegisteredProfile = \"%s\";\n", $3
            printf "    OtherProfileOrganization = \"%s\";\n", $4
        }
        printf "    ProfileVersion = \"%s\";\n", $5
        printf "    RegisteredSubProfiles = {%s};\n", $6
        n = split($7, c, " "); list = ""
        for (i = 1; i <= n; i++) list = list (i > 1 ? ", " : "") "\"" c[i] "\""
        printf "    ConformingElements = {%s};\n", list
        print "};"
    }
' >> "$out/Vexlan_CNA_Provider_Registration.mof.tmp" <<'PROFILES'
Vexlan_FCHBA_Profile	6	-	-	1.1.0	1019, 1024	Vexlan_Adapter_ComputerSystem
Vexlan_SoftwareUpdate_Profile	0	Software Update	DMTF	1.0.0	3019	Vexlan_FCHBA_SoftwareInstallationService Vexlan_NIC_SoftwareInstallationService
Vexlan_EthernetPort_Profile	0	Ethernet Port	DMTF	1.0.0	3009	Vexlan_NIC_EthernetPort2
Vexlan_HostLANNetworkPort_Profile	0	Host LAN Network Port	DMTF	1.0.0	3026	Vexlan_NIC_NetworkPort
Vexlan_IPInterface_Profile	0	IP Interface	DMTF	1.0.1	3027	Vexlan_NIC_IPProtocolEndpoint
PROFILES
mv "$out/Vexlan_CNA_Provider_Registration.mof.tmp" "$out/Vexlan_CNA_Provider_Registration.mof"

# sfcb: one section per registered class.
awk -F '\t' -v interop="$sfcb_interop" '
    BEGIN {
        print "# sfcb registration of the Vexlan CNA provider."
        print "# Generated from classes.tsv by gen-registration.sh."
    }
    $4 == "-" { next }
    {
        n = split($2, ns, " "); nslist = ""
        for (i = 1; i <= n; i++) nslist = nslist (i > 1 ? " " : "") ((ns[i] == "interop") ? interop : ns[i])
        print ""
        printf "[%s]\n", $1
        print "   provider: Vexlan_CNA_Provider"
        print "   location: Vexlan_CNA_Provider"
        printf "   type: %s\n", $4
        printf "   namespace: %s\n", nslist
    }
' "$rows" > "$out/Vexlan_CNA_Provider.reg.tmp"
mv "$out/Vexlan_CNA_Provider.reg.tmp" "$out/Vexlan_CNA_Provider.reg"
