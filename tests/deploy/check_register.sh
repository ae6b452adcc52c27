#!/usr/bin/env bash
# The installed registration command, vexlan-cna-register, against stand-ins
# for each server's programs that keep the server's state in files:
#
#   sfcb      sfcbstage/sfcbunstage copy into and remove from a staging
#             directory as sfcb's own do; sfcbrepos is recorded
#   pegasus   cimmof adds the classes of a file to a namespace (and creates
#             it from CIM_Schema.mof), and the module of a registration file;
#             cimprovider lists and removes modules; cimcli gc/dc/ns see and
#             delete classes and list namespaces
#
# For each server: registering loads every file of registration.tsv where it
# says, and links the provider into the first existing provider directory;
# a second run leaves the same state; deregistering empties it again, deletes
# classes in the reverse of their load order, and leaves a link that is
# not its own. Without
# -t the command takes the one installed server and refuses to choose
# between two.
#
#   check_register.sh BUILD SOURCE BINDIR LIBDIR DATADIR MANDIR
set -euo pipefail
build=$1 libdir=$4 datadir=$5
tmp=$(mktemp -d /tmp/vexlan-register.XXXXXX)
trap 'rm -rf "$tmp"' EXIT
failures=0
fail() { echo "FAIL: $*"; failures=$((failures + 1)); }

prefix=$tmp/prefix
DESTDIR='' "${CMAKE:-cmake}" --install "$build" --prefix "$prefix" > "$tmp/install.log" 2>&1 ||
  { cat "$tmp/install.log"; echo "FAIL: cmake --install"; exit 1; }
reg=$prefix/sbin/vexlan-cna-register
share=$prefix/$datadir/vexlan-cna
[ -x "$reg" ] || { echo "FAIL: $reg is not installed"; exit 1; }
export VEXLAN_CNA_REGISTER_CONF=$tmp/none.conf
export LOG=$tmp/calls.log
: > "$LOG"

# ---- stand-ins --------------------------------------------------------------
S=$tmp/sfcb
mkdir -p "$S/bin" "$S/sbin" "$S/etc/sfcb" "$S/lib/sfcb" "$S/stage"
echo "providerDirs: $S/lib/cmpi $S/lib/sfcb $S/lib" > "$S/etc/sfcb/sfcb.cfg"
cat > "$S/bin/sfcbstage" <<EOF
#!/bin/bash
echo "sfcbstage \$*" >> "\$LOG"
ns=root/cimv2 reg=
while getopts n:r: o; do case \$o in n) ns=\$OPTARG;; r) reg=\$OPTARG;; esac; done
shift \$((OPTIND - 1))
sfcbmofpp "\$@" || exit 1     # sfcb's own runs its preprocessor by name
[ -z "\$reg" ] || { mkdir -p $S/stage/regs && cp "\$reg" $S/stage/regs/; }
[ \$# -eq 0 ] || { mkdir -p "$S/stage/mofs/\$ns" && cp "\$@" "$S/stage/mofs/\$ns/"; }
EOF
cat > "$S/bin/sfcbunstage" <<EOF
#!/bin/bash
echo "sfcbunstage \$*" >> "\$LOG"
ns=root/cimv2 reg=
while getopts n:r: o; do case \$o in n) ns=\$OPTARG;; r) reg=\$OPTARG;; esac; done
shift \$((OPTIND - 1))
[ -z "\$reg" ] || rm -f "$S/stage/regs/\$reg"
for f in "\$@"; do rm -f "$S/stage/mofs/\$ns/\$f"; done
EOF
printf '#!/bin/sh\necho "sfcbrepos $*" >> "$LOG"\n' > "$S/bin/sfcbrepos"
printf '#!/bin/sh\nexit 0\n' > "$S/bin/sfcbmofpp"
printf '#!/bin/sh\nexit 1\n' > "$S/sbin/sfcbd"
chmod +x "$S"/bin/* "$S"/sbin/*

P=$tmp/pegasus
mkdir -p "$P/bin" "$P/providers" "$P/state" "$P/schema"
touch "$P/state/classes" "$P/state/modules"
printf 'root/PG_InterOp\nroot/cimv2\n' > "$P/state/namespaces"
echo 'class CIM_ManagedElement { };' > "$P/schema/CIM_Schema.mof"
cat > "$P/bin/cimconfig" <<EOF
#!/bin/sh
echo "Current value: $P/providers"
EOF
cat > "$P/bin/cimmof" <<EOF
#!/bin/bash
echo "cimmof \$*" >> "\$LOG"
ns=root/cimv2
while getopts n:I: o; do case \$o in n) ns=\$OPTARG;; esac; done
shift \$((OPTIND - 1))
case "\$1" in */CIM_Schema.mof) echo "\$ns" >> $P/state/namespaces; exit 0;; esac
grep -qx "\$ns" $P/state/namespaces || { echo "invalid namespace \$ns"; exit 1; }
sed -n "s|^class \\([A-Za-z0-9_]*\\).*|\$ns \\1|p" "\$1" >> $P/state/classes
grep -A3 'instance of PG_ProviderModule' "\$1" | sed -n 's/.*Name = "\\(.*\\)";/\\1/p' >> $P/state/modules
EOF
cat > "$P/bin/cimprovider" <<EOF
#!/bin/bash
echo "cimprovider \$*" >> "\$LOG"
case "\$*" in
  "-l") cat $P/state/modules ;;
  "-l -s") echo "MODULE STATUS"; sed 's/\$/ OK/' $P/state/modules ;;
  "-r -m "*) grep -vx "\$3" $P/state/modules > $P/state/m.new; mv $P/state/m.new $P/state/modules ;;
esac
EOF
cat > "$P/bin/cimcli" <<EOF
#!/bin/bash
case "\$1" in
  ns) cat $P/state/namespaces ;;
  gc) grep -qx "\$3 \$4" $P/state/classes ;;
  dc) echo "cimcli \$*" >> "\$LOG"; grep -vx "\$3 \$4" $P/state/classes > $P/state/c.new; mv $P/state/c.new $P/state/classes ;;
esac
EOF
printf '#!/bin/sh\necho "cimserver $*" >> "$LOG"\n' > "$P/bin/cimserver"
chmod +x "$P"/bin/*

# The rows of the table for a server: "namespace file".
rows() { awk -F'\t' -v s="$1" '!/^#/ && NF == 3 && ($1 == s || $1 == "both") { print $2 " " $3 }' "$share/registration.tsv"; }
state_sfcb() { (cd "$S/stage" && find . -type f | sort); ls -l "$S/lib/sfcb" "$S/lib" 2>/dev/null | awk '{ print $9, $10, $11 }'; }
state_pegasus() { sort "$P/state/classes"; sort "$P/state/modules"; ls -l "$P/providers" | awk '{ print $9, $10, $11 }'; }
run() { "$reg" "$@" > "$tmp/out" 2>&1; }

# ---- sfcb ---------------------------------------------------------------------
PATH_SFCB=$S/bin:$PATH
# As a package manager runs it: sfcb's programs only in the settings file.
printf 'type=sfcb\npath=%s\n' "$S/bin" > "$VEXLAN_CNA_REGISTER_CONF"
PATH=/usr/bin:/bin run || { fail "sfcb: register from the settings file failed"; cat "$tmp/out"; }
rm "$VEXLAN_CNA_REGISTER_CONF"
PATH=$PATH_SFCB run || { fail "sfcb: register failed"; cat "$tmp/out"; }
grep -q 'registering .* with sfcb' "$tmp/out" || fail "sfcb was not found without -t"
while read -r ns file; do
  case "$ns" in
    registration) [ -f "$S/stage/regs/$file" ] || fail "sfcb: $file is not staged as registration" ;;
    interop) [ -f "$S/stage/mofs/root/interop/$file" ] || fail "sfcb: $file is not staged in root/interop" ;;
    *) [ -f "$S/stage/mofs/$ns/$file" ] || fail "sfcb: $file is not staged in $ns" ;;
  esac
done < <(rows sfcb)
[ "$(readlink "$S/lib/sfcb/libVexlan_CNA_Provider.so")" = "$prefix/$libdir/libVexlan_CNA_Provider.so" ] ||
  fail "sfcb: no link in the first existing provider directory"
[ "$(tail -1 "$LOG")" = "sfcbrepos -f" ] || fail "sfcb: the repository is not rebuilt last"
grep -q 'next start of sfcbd' "$tmp/out" || fail "sfcb: the output does not say when the server reads the repository"
state_sfcb > "$tmp/sfcb.1"
PATH=$PATH_SFCB run -t sfcb || fail "sfcb: second register failed"
state_sfcb > "$tmp/sfcb.2"
cmp -s "$tmp/sfcb.1" "$tmp/sfcb.2" || fail "sfcb: a second register changes the state: $(diff "$tmp/sfcb.1" "$tmp/sfcb.2")"
: > "$LOG"
PATH=$PATH_SFCB run -n -d || fail "sfcb: -n -d failed"
[ ! -s "$LOG" ] || fail "sfcb: -n ran commands: $(cat "$LOG")"
cmp -s "$tmp/sfcb.1" <(state_sfcb) || fail "sfcb: -n changed the state"
PATH=$PATH_SFCB run -d || { fail "sfcb: deregister failed"; cat "$tmp/out"; }
[ -z "$(cd "$S/stage" && find . -type f)" ] || fail "sfcb: files left staged: $(cd "$S/stage" && find . -type f)"
[ ! -e "$S/lib/sfcb/libVexlan_CNA_Provider.so" ] || fail "sfcb: the link stays after deregistering"
# A provider directory that holds the library already gets no link, and a
# link that is not the command's own stays.
ln -s /elsewhere/libVexlan_CNA_Provider.so "$S/lib/sfcb/libVexlan_CNA_Provider.so"
PATH=$PATH_SFCB run -d || fail "sfcb: deregistering twice failed"
[ -L "$S/lib/sfcb/libVexlan_CNA_Provider.so" ] || fail "sfcb: a foreign link was removed"
rm "$S/lib/sfcb/libVexlan_CNA_Provider.so"
cp "$prefix/$libdir/libVexlan_CNA_Provider.so.1" "$S/lib/libVexlan_CNA_Provider.so"
PATH=$PATH_SFCB run -l "$S/lib" || fail "sfcb: register with -l failed"
[ ! -e "$S/lib/sfcb/libVexlan_CNA_Provider.so" ] || fail "sfcb: linked although a provider directory holds the library"
PATH=$PATH_SFCB run -d -l "$S/lib" > /dev/null
rm -f "$S/lib/libVexlan_CNA_Provider.so"

# ---- OpenPegasus --------------------------------------------------------------
: > "$LOG"
PATH=$P/bin:$PATH run -S "$P/schema" || { fail "pegasus: register failed"; cat "$tmp/out"; }
grep -q 'registering .* with pegasus' "$tmp/out" || fail "OpenPegasus was not found without -t"
grep -qx root/vexlan_cmpi "$P/state/namespaces" || fail "pegasus: root/vexlan_cmpi was not created with the schema"
grep -q "cimmof -n root/vexlan_cmpi -I $P/schema $P/schema/CIM_Schema.mof" "$LOG" ||
  fail "pegasus: the schema was not loaded into root/vexlan_cmpi"
# OpenPegasus gets no class in its interop namespace (its interop provider
# advertises the profiles from the registration); rows whose class file lies
# in dmtf/ are classes of the schema that the provider serves: registered,
# never loaded or deleted as the provider's.
want=$(awk -F'\t' '!/^#/ && NF == 6 && $6 !~ /^dmtf\// { n = split($2, a, " "); for (i = 1; i <= n; i++) if (a[i] != "interop") print a[i] " " $1 }' \
       "$share/classes.tsv" | sort)
[ "$want" = "$(sort "$P/state/classes")" ] ||
  fail "pegasus: classes loaded differ from the table: $(diff <(echo "$want") <(sort "$P/state/classes") | head)"
[ "$(cat "$P/state/modules")" = Vexlan_CNA_ProviderModule ] || fail "pegasus: the module is not registered once"
# The registration comes after every class file.
last_class=$(grep -n 'cimmof -n' "$LOG" | grep -v Registration | tail -1 | cut -d: -f1)
reg_line=$(grep -n 'cimmof -n root/PG_InterOp .*Registration' "$LOG" | cut -d: -f1)
[ -n "$reg_line" ] && [ "$reg_line" -gt "$last_class" ] || fail "pegasus: the registration is not loaded after the classes"
[ "$(readlink "$P/providers/libVexlan_CNA_Provider.so")" = "$prefix/$libdir/libVexlan_CNA_Provider.so" ] ||
  fail "pegasus: no link in the provider directory"
grep -q 'cimserver' "$LOG" && fail "pegasus: a running server was started"
state_pegasus > "$tmp/pg.1"
: > "$LOG"
PATH=$P/bin:$PATH run -t pegasus || fail "pegasus: second register failed"
grep -q 'cimprovider -r -m Vexlan_CNA_ProviderModule' "$LOG" || fail "pegasus: the earlier module is not removed first"
grep -q 'CIM_Schema' "$LOG" && fail "pegasus: the schema is loaded again into an existing namespace"
# A second load of the same classes leaves them once (cimmof warns and keeps them).
sort -u "$P/state/classes" -o "$P/state/classes"
cmp -s "$tmp/pg.1" <(state_pegasus) || fail "pegasus: a second register changes the state"
: > "$LOG"
PATH=$P/bin:$PATH run -d || { fail "pegasus: deregister failed"; cat "$tmp/out"; }
[ ! -s "$P/state/classes" ] || fail "pegasus: classes left: $(head -3 "$P/state/classes")"
[ ! -s "$P/state/modules" ] || fail "pegasus: the module stays registered"
[ ! -e "$P/providers/libVexlan_CNA_Provider.so" ] || fail "pegasus: the link stays"
# Classes go in the reverse of the table's load order (a class stands after
# every class it derives from or references), namespace by namespace.
for ns in root/vexlan_cmpi root/PG_InterOp; do
  want=$(awk -F'\t' -v ns="$ns" '!/^#/ && NF == 6 && $6 !~ /^dmtf\// { n = split($2, a, " "); for (i = 1; i <= n; i++)
           if (a[i] == ns) print $1 }' "$share/classes.tsv" | tac)
  [ "$want" = "$(awk -v ns="$ns" '/^cimcli dc/ && $4 == ns { print $5 }' "$LOG")" ] ||
    fail "pegasus: the classes of $ns are not deleted in the reverse of their load order"
done

# ---- finding the server ---------------------------------------------------------
PATH=$P/bin:$S/bin:$PATH run && fail "both servers installed: the command chose one"
grep -q 'name one with -t' "$tmp/out" || fail "both servers installed: the message does not ask for -t"
printf 'type=sfcb\n' > "$VEXLAN_CNA_REGISTER_CONF"
PATH=$P/bin:$S/bin:$PATH run -n || fail "type= of the settings file is not taken"
grep -q 'with sfcb' "$tmp/out" || fail "type=sfcb of the settings file is not taken"
rm "$VEXLAN_CNA_REGISTER_CONF"
PATH=/usr/bin:/bin "$reg" -p /nonexistent > "$tmp/out" 2>&1 && fail "no server installed: the command succeeded"
grep -q 'no CIM server found' "$tmp/out" || fail "no server installed: the message does not say so"
"$reg" -t other > /dev/null 2>&1 && fail "an unknown server was accepted"

if [ "$failures" -gt 0 ]; then
  echo "$failures check(s) failed"
  exit 1
fi
echo "deploy register: ok"
