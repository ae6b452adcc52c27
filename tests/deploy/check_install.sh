#!/usr/bin/env bash
# What `make install` lays down, checked from a fresh install of the build
# tree into a temporary directory.
#
#   check_install.sh tree BUILD SOURCE BINDIR LIBDIR DATADIR MANDIR
#       DESTDIR install under prefix /usr/local: the exact file list, the
#       library links, the installed library's exports and run path, and the
#       installed class and registration files against the class table.
#   check_install.sh load BUILD SOURCE BINDIR LIBDIR DATADIR MANDIR
#       install into a prefix and run the installed cimhost on the installed
#       provider (through its unversioned link, as a CIM server loads it) with
#       the installed class files and sfcb registration, in both server
#       flavours: every registered class answers, and the default adapter
#       description beside the installed adapter library is the one read.
#       Run it under tests/isolate.sh (the provider writes under /opt).
#   check_install.sh packages BUILD SOURCE BINDIR LIBDIR DATADIR MANDIR SBINDIR
#       build the Debian package and the RPM from the build tree
#       (scripts/make-deb.sh, scripts/make-rpm.sh) without installing them:
#       the deb's file list and control fields, the RPM's file list the same
#       as the deb's, no path of the build or source tree in either, the
#       unpacked package's cimhost finding the unpacked provider with no
#       options (under tests/isolate.sh), and each package's scripts run
#       with the arguments that dpkg and rpm give them (install, upgrade,
#       removal) against a stand-in registration command.
set -euo pipefail
mode=$1 build=$2 src=$3 bindir=$4 libdir=$5 datadir=$6 mandir=$7 sbindir=${8:-sbin}
tmp=$(mktemp -d /tmp/vexlan-deploy.XXXXXX)
trap 'rm -rf "$tmp"' EXIT
failures=0
fail() { echo "FAIL: $*"; failures=$((failures + 1)); }

install_to() {   # install_to DESTDIR PREFIX
  if ! DESTDIR=$1 "${CMAKE:-cmake}" --install "$build" --prefix "$2" > "$tmp/install.log" 2>&1; then
    cat "$tmp/install.log"; echo "FAIL: cmake --install"; exit 1
  fi
}

# The registered classes of the table ("class<TAB>types<TAB>namespaces").
registered_rows() {
  awk -F'\t' '!/^#/ && NF == 6 && $4 != "-" { print $1 "\t" $4 "\t" $2 }' "$1"
}

check_tree() {
  local stage=$tmp/stage prefix=/usr/local
  install_to "$stage" "$prefix"
  local root=$stage$prefix share=$stage$prefix/$datadir/vexlan-cna

  # Nothing lands outside the prefix.
  local outside
  outside=$(cd "$stage" && find . -mindepth 1 \( -type f -o -type l \) | grep -v "^\.$prefix/" || true)
  [ -z "$outside" ] || fail "installed outside $prefix: $outside"

  # The exact file list; the class files are checked against the table below.
  local want=(
    "$bindir/cimhost"
    "$sbindir/vexlan-cna-register"
    "$libdir/libVexlan_CNA_Provider.so"
    "$libdir/libVexlan_CNA_Provider.so.1"
    "$libdir/libzorap_cna_provider.so"
    "$libdir/libzorap_cna_provider.so.1"
    "$libdir/libzorap_cna_provider.so.1.0.0"
    "$libdir/zorap_sim_adapters.json"
    "$datadir/vexlan-cna/classes.tsv"
    "$datadir/vexlan-cna/Vexlan_CNA_Provider.mof"
    "$datadir/vexlan-cna/Vexlan_CNA_Provider_Interop.mof"
    "$datadir/vexlan-cna/Vexlan_CNA_Provider_Registration.mof"
    "$datadir/vexlan-cna/Vexlan_CNA_Provider.reg"
    "$datadir/vexlan-cna/registration.tsv"
    "$datadir/doc/vexlan-cna/deploy.md"
    "$mandir/man8/vexlan-cna.8"
    "$mandir/man8/vexlan-cna-register.8")
  local got extra missing
  got=$(cd "$root" && find . -mindepth 1 \( -type f -o -type l \) | sed 's|^\./||' |
        grep -v "^$datadir/vexlan-cna/mof/" | sort)
  missing=$(comm -13 <(echo "$got") <(printf '%s\n' "${want[@]}" | sort))
  extra=$(comm -23 <(echo "$got") <(printf '%s\n' "${want[@]}" | sort))
  [ -z "$missing" ] || fail "not installed: $missing"
  [ -z "$extra" ] || fail "installed but not expected: $extra"

  # Servers load lib<Location>.so: the unversioned names are links to the
  # versioned libraries, and the provider needs the adapter library's soname.
  [ "$(readlink "$root/$libdir/libVexlan_CNA_Provider.so")" = libVexlan_CNA_Provider.so.1 ] ||
    fail "libVexlan_CNA_Provider.so is not a link to libVexlan_CNA_Provider.so.1"
  [ -f "$root/$libdir/libVexlan_CNA_Provider.so.1" ] && [ ! -L "$root/$libdir/libVexlan_CNA_Provider.so.1" ] ||
    fail "libVexlan_CNA_Provider.so.1 is not a file"
  [ -e "$root/$libdir/libzorap_cna_provider.so.1" ] || fail "libzorap_cna_provider.so.1 does not resolve"
  [ -x "$root/$bindir/cimhost" ] || fail "cimhost is not executable"

  # The installed library exports the four factories and nothing else.
  "$src/tests/provider/check_exports.sh" "$root/$libdir/libVexlan_CNA_Provider.so.1" ||
    fail "exports of the installed library"

  # The build tree's run path is gone; the installed one looks beside the
  # library first, then in the installed library directory.
  local runpath
  runpath=$(readelf -d "$root/$libdir/libVexlan_CNA_Provider.so.1" | sed -n 's/.*(RUNPATH).*\[\(.*\)\]/\1/p')
  case "$runpath" in
    "\$ORIGIN:"*) ;;
    *) fail "run path of the installed provider is '$runpath', expected \$ORIGIN first" ;;
  esac
  case "$runpath" in *"$build"*) fail "run path names the build tree: $runpath" ;; esac

  # The installed class and registration files follow the table, and every
  # class file that the table names is installed.
  python3 "$src/mof/check_mof.py" "$src/mof" --generated "$share" || fail "installed class and registration files"
  cmp -s "$src/mof/classes.tsv" "$share/classes.tsv" || fail "installed classes.tsv differs from the source table"
  local f
  for f in $(awk -F'\t' '!/^#/ && NF == 6 { print $6 }' "$src/mof/classes.tsv") "$src"/mof/dmtf/*.mof; do
    [ -f "$share/mof/$(basename "$f")" ] || fail "class file $(basename "$f") is not installed"
  done

  # One registration per registered class in each server's file, none else.
  local n_table n_reg n_pg
  n_table=$(registered_rows "$src/mof/classes.tsv" | wc -l)
  n_reg=$(grep -c '^\[' "$share/Vexlan_CNA_Provider.reg")
  n_pg=$(grep -c '^instance of PG_ProviderCapabilities' "$share/Vexlan_CNA_Provider_Registration.mof")
  [ "$n_reg" = "$n_table" ] || fail "sfcb registration has $n_reg sections, the table registers $n_table classes"
  [ "$n_pg" = "$n_table" ] || fail "OpenPegasus registration has $n_pg capabilities, the table registers $n_table classes"

  # The man page is well-formed and names the commands of both servers.
  if command -v man > /dev/null 2>&1; then
    MANWIDTH=80 man -l "$root/$mandir/man8/vexlan-cna.8" > "$tmp/man.txt" 2> "$tmp/man.err" ||
      fail "man page does not format: $(cat "$tmp/man.err")"
    [ ! -s "$tmp/man.err" ] || fail "man page warnings: $(cat "$tmp/man.err")"
  else
    cp "$root/$mandir/man8/vexlan-cna.8" "$tmp/man.txt"
  fi
  local word
  for word in vexlan-cna-register cimmof sfcbstage sfcbrepos cimcli wbemcli cimhost root/PG_InterOp root/vexlan_cmpi; do
    grep -q -- "$word" "$tmp/man.txt" || fail "man page does not mention $word"
  done
  MANWIDTH=80 man -l "$root/$mandir/man8/vexlan-cna-register.8" 2>&1 | grep -q -- '-t pegasus' ||
    fail "the man page of vexlan-cna-register does not format or does not describe -t"
  # Every file of the registration table is installed beside it.
  local row
  while IFS=$'\t' read -r _ _ row; do
    [ -f "$share/$row" ] || fail "registration.tsv names $row, which is not installed"
  done < <(grep -v '^#' "$share/registration.tsv")
}

check_load() {
  local prefix=$tmp/prefix
  install_to "" "$prefix"
  local share=$prefix/$datadir/vexlan-cna batch=$tmp/all.batch
  unset ZORAP_SIM_ADAPTERS
  # Every registered class in every namespace of its row, by the class of its
  # provider type: instance classes enumerate, indication classes are only
  # registered.
  {
    echo "ei root/vexlan_cmpi:Vexlan_Adapter_ComputerSystem"
    registered_rows "$src/mof/classes.tsv" | while IFS=$'\t' read -r cls types nss; do
      case " $types " in *" instance "*) ;; *) continue ;; esac
      for ns in $nss; do
        [ "$ns" = interop ] && ns=root/PG_InterOp
        echo "ein $ns:$cls"
      done
    done
  } > "$batch"
  local flavour out err
  for flavour in pegasus sfcb; do
    out=$tmp/$flavour.out err=$tmp/$flavour.err
    if ! "$prefix/$bindir/cimhost" -f "$flavour" --strict --reg "$share/Vexlan_CNA_Provider.reg" -m "$share/mof" \
         -p "$prefix/$libdir/libVexlan_CNA_Provider.so" -n Vexlan_CNA_Provider batch "$batch" > "$out" 2> "$err"; then
      fail "$flavour: cimhost failed"; cat "$err"
    fi
    if grep -q '^CMPI_RC_' "$err"; then
      fail "$flavour: a registered class failed:"; grep '^CMPI_RC_' "$err"
    fi
    grep -q '^instance of Vexlan_Adapter_ComputerSystem' "$out" || fail "$flavour: no computer system"
    # The default description installed beside the adapter library: its FC
    # HBA and its CNA's NIC functions.
    grep -q 'Vexlan_FCHBA_FCPort\..*DeviceID="VXA1631K0042_' "$out" ||
      fail "$flavour: the FC ports of the default adapter description are missing"
    grep -q 'Vexlan_NIC_EthernetPort2\.' "$out" || fail "$flavour: the NIC ports of the default adapter description are missing"
  done
  # Both flavours see the same objects.
  cmp -s "$tmp/pegasus.out" "$tmp/sfcb.out" || fail "the two flavours answer differently"
  # Captured first: grep -q stops reading at the match, and a help text longer
  # than one write would then end cimhost with SIGPIPE, which pipefail reports.
  help=$("$prefix/$bindir/cimhost" --help)
  grep -q -- '--reg FILE' <<<"$help" || fail "cimhost --help does not describe --reg"
  # With no options the installed cimhost finds the installed provider, its
  # class files and namespace; an empty key in a batch line is the empty text.
  out=$tmp/plain.out err=$tmp/plain.err
  if ! "$prefix/$bindir/cimhost" ein Vexlan_FCHBA_FCPort > "$out" 2> "$err"; then
    fail "cimhost without options failed"; cat "$err"
  fi
  grep -q '^root/vexlan_cmpi:Vexlan_FCHBA_FCPort\..*DeviceID="VXA1631K0042_' "$out" ||
    fail "cimhost without options does not show the installed provider's FC ports"
  printf 'gi Vexlan_FCHBA_FCPort.SystemCreationClassName="Vexlan_Adapter_ComputerSystem",SystemName="x",CreationClassName="Vexlan_FCHBA_FCPort",DeviceID=""\n' |
    "$prefix/$bindir/cimhost" --installed -f sfcb batch - > "$out" 2> "$err" || true
  grep -q '^CMPI_RC_ERR_NOT_FOUND' "$err" || { fail "an empty key in a batch line is not looked up"; cat "$err"; }
}

check_packages() {
  local tool
  for tool in patchelf rpmbuild rpm2archive; do
    command -v $tool > /dev/null || { echo "SKIP: $tool is missing (scripts/install-deps.sh)"; exit 77; }
  done
  local deb
  deb=$(CMAKE=${CMAKE:-cmake} "$src/scripts/make-deb.sh" "$build" "$tmp/out") || { fail "make-deb.sh failed"; return; }
  [ -f "$deb" ] || { fail "no package written"; return; }
  dpkg-deb -c "$deb" > "$tmp/list"
  # Paths only, links without their targets.
  awk '{ print $6 }' "$tmp/list" | sed 's|^\./||; s|/$||' | grep -v '^$' | sort > "$tmp/paths"
  if grep -q -e "$build" -e "$src" -e '/tmp/' "$tmp/list"; then
    fail "the package names a build path:"; grep -e "$build" -e "$src" -e '/tmp/' "$tmp/list"
  fi
  grep -qv '^usr' "$tmp/paths" && fail "files outside /usr: $(grep -v '^usr' "$tmp/paths")"
  local want
  for want in usr/bin/cimhost usr/lib/libVexlan_CNA_Provider.so usr/lib/libVexlan_CNA_Provider.so.1 \
              usr/lib/libzorap_cna_provider.so.1 usr/lib/zorap_sim_adapters.json \
              usr/share/vexlan-cna/Vexlan_CNA_Provider.mof usr/share/vexlan-cna/Vexlan_CNA_Provider_Interop.mof \
              usr/share/vexlan-cna/Vexlan_CNA_Provider_Registration.mof usr/share/vexlan-cna/Vexlan_CNA_Provider.reg \
              usr/share/vexlan-cna/mof/Vexlan_FCHBA_FCPort.mof usr/share/man/man8/vexlan-cna.8.gz \
              usr/sbin/vexlan-cna-register usr/share/man/man8/vexlan-cna-register.8.gz usr/share/vexlan-cna/registration.tsv \
              usr/share/doc/vexlan-cna-provider/deploy.md usr/share/doc/vexlan-cna-provider/copyright; do
    grep -qx "$want" "$tmp/paths" || fail "the package lacks $want"
  done
  grep -q 'libVexlan_CNA_Provider.so -> libVexlan_CNA_Provider.so.1' "$tmp/list" ||
    fail "the unversioned link of the provider is missing"
  local field text
  for field in Package Version Architecture Depends Description; do
    text=$(dpkg-deb -f "$deb" "$field")
    [ -n "$text" ] || fail "control field $field is empty"
  done
  [[ "$text" == *sfcbstage* ]] || fail "the description does not tell how to register with sfcb"
  [[ "$text" == *cimmof* ]] || fail "the description does not tell how to register with OpenPegasus"

  # Unpacked, the package's cimhost finds the package's provider.
  local root=$tmp/root
  dpkg-deb -x "$deb" "$root"
  [ -z "$(readelf -d "$root/usr/lib/libVexlan_CNA_Provider.so.1" | grep -E 'RPATH|RUNPATH')" ] ||
    fail "the packaged provider keeps a run path"
  if ! LD_LIBRARY_PATH=$root/usr/lib "$root/usr/bin/cimhost" --installed ein Vexlan_FCHBA_FCPort > "$tmp/deb.out" 2> "$tmp/deb.err"; then
    fail "the packaged cimhost failed"; cat "$tmp/deb.err"
  fi
  grep -q '^root/vexlan_cmpi:Vexlan_FCHBA_FCPort\.' "$tmp/deb.out" || fail "the packaged cimhost shows no FC port"

  # The RPM: the same files, no build path, the adapter library found
  # beside the provider.
  local rpm
  rpm=$(CMAKE=${CMAKE:-cmake} "$src/scripts/make-rpm.sh" "$build" "$tmp/out") || { fail "make-rpm.sh failed"; return; }
  [ -f "$rpm" ] || { fail "no RPM written"; return; }
  rpm -qp --qf '[%{FILEMODES:perms} %{FILENAMES}\n]' "$rpm" 2> /dev/null | awk '$1 !~ /^d/ { sub(/^\//, "", $2); print $2 }' |
    sort > "$tmp/rpm.paths"
  find "$root" -mindepth 1 ! -type d | sed "s|^$root/||" | sort > "$tmp/deb.files"
  [ -s "$tmp/rpm.paths" ] && cmp -s "$tmp/deb.files" "$tmp/rpm.paths" ||
    fail "the RPM's files differ from the deb's: $(diff "$tmp/deb.files" "$tmp/rpm.paths" | head)"
  if rpm -qlp "$rpm" 2> /dev/null | grep -e "$build" -e "$src" -e '/tmp/'; then fail "the RPM names a build path"; fi
  [ "$(rpm -qp --qf '%{NAME} %{VERSION}' "$rpm" 2> /dev/null)" = "$(dpkg-deb -f "$deb" Package) $(dpkg-deb -f "$deb" Version)" ] ||
    fail "the RPM's name and version differ from the deb's"
  mkdir "$tmp/rpmroot"
  (cd "$tmp/out" && rpm2archive "$rpm") && tar -xzf "$rpm.tgz" -C "$tmp/rpmroot"
  [ "$(readelf -d "$tmp/rpmroot/usr/lib/libVexlan_CNA_Provider.so.1" | sed -n 's/.*(RUNPATH).*\[\(.*\)\]/\1/p')" = '$ORIGIN' ] ||
    fail "the RPM's provider does not look for the adapter library beside itself"

  # The scripts of both packages, run as dpkg and rpm run them, with a
  # stand-in registration command and ldconfig that record their calls.
  local scripts=$tmp/scripts stub=$tmp/stub calls=$tmp/calls
  mkdir -p "$scripts/deb" "$scripts/rpm" "$stub"
  printf '#!/bin/sh\necho "register${*:+ $*}" >> %s\n' "$calls" > "$stub/vexlan-cna-register"
  printf '#!/bin/sh\necho ldconfig >> %s\n' "$calls" > "$stub/ldconfig"
  chmod +x "$stub"/*
  dpkg-deb -e "$deb" "$tmp/control"
  local f
  for f in postinst prerm postrm; do
    [ -x "$tmp/control/$f" ] || fail "the deb has no executable $f"
    cp "$tmp/control/$f" "$scripts/deb/$f"
  done
  [ ! -e "$tmp/control/preinst" ] || cp "$tmp/control/preinst" "$scripts/deb/preinst"
  rpm -qp --scripts "$rpm" 2> /dev/null | awk -v dir="$scripts/rpm" '
    /^[a-z]+ (scriptlet \(using \/bin\/sh\)|program): ?/ {
      name = $1; out = dir "/" name
      if ($2 == "program:") { print $3 > out; close(out); out = "" }
      next }
    out != "" { print > out }'
  for f in preinstall postinstall preuninstall postuninstall; do
    [ -s "$scripts/rpm/$f" ] || fail "the RPM has no $f scriptlet"
  done
  # package script arguments => calls, in order ("-" none)
  local cases="
    deb postinst configure|                 ldconfig,register
    deb postinst abort-upgrade|1.5.6        ldconfig,register
    deb prerm remove|                       register -d
    deb prerm upgrade|1.5.7                 register -d
    deb prerm failed-upgrade|1.5.7          -
    deb postrm remove|                      ldconfig
    deb postrm upgrade|1.5.7                -
    rpm preinstall 1|                       -
    rpm preinstall 2|                       register -d
    rpm postinstall 1|                      ldconfig,register
    rpm postinstall 2|                      ldconfig,register
    rpm preuninstall 0|                     register -d
    rpm preuninstall 1|                     -
    rpm postuninstall 0|                    ldconfig
  "
  local kind script args want got
  while read -r kind script args want; do
    [ -n "$kind" ] || continue
    [ -f "$scripts/$kind/$script" ] || { [ "$want" = - ] || fail "$kind: no $script"; continue; }
    sed -e "s|/usr/sbin/vexlan-cna-register|$stub/vexlan-cna-register|g" -e "s|/sbin/ldconfig|$stub/ldconfig|g" \
        -e "s|^\\( *\\)ldconfig\$|\\1$stub/ldconfig|" "$scripts/$kind/$script" > "$tmp/run.sh"
    : > "$calls"
    sh "$tmp/run.sh" ${args//|/ } > "$tmp/run.out" 2>&1 || fail "$kind $script ${args//|/ } exits with an error: $(cat "$tmp/run.out")"
    got=$(paste -sd, "$calls"); [ -n "$got" ] || got=-
    [ "$got" = "$want" ] || fail "$kind $script ${args//|/ }: calls '$got', expected '$want'"
  done <<< "$cases"
}

case "$mode" in
  tree) check_tree ;;
  load) check_load ;;
  packages) check_packages ;;
  *) echo "usage: $0 tree|load|packages BUILD SOURCE BINDIR LIBDIR DATADIR MANDIR [SBINDIR]" >&2; exit 2 ;;
esac
if [ "$failures" -gt 0 ]; then
  echo "$failures check(s) failed"
  exit 1
fi
echo "deploy $mode: ok"
