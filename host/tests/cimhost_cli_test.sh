#!/usr/bin/env bash
# Drives the cimhost command through every verb against the tiny provider,
# as a user would from a shell, and checks exit codes and output. Also checks
# that bad input gives one error line and an exit code, never a crash.
# Usage: cimhost_cli_test.sh CIMHOST PROVIDER_LIB MOF
set -u
CIMHOST=$1 LIB=$2 MOF=$3
NS=root/tiny
NAME=Tiny
failures=0
run() {   # run EXPECTED_CODE PATTERN ARGS... : PATTERN in stdout (or stderr when EXPECTED_CODE != 0)
  local want=$1 pattern=$2
  shift 2
  local out err code
  out=$("$CIMHOST" -p "$LIB" -n "$NAME" -m "$MOF" -N "$NS" --strict "$@" 2>/tmp/cimhost_cli_err.$$)
  code=$?
  err=$(cat /tmp/cimhost_cli_err.$$)
  local where=$out
  [ "$want" -ne 0 ] && where=$err
  if [ "$code" -ne "$want" ] || ! grep -qF -- "$pattern" <<<"$where"; then
    echo "FAIL: cimhost $* -> exit $code (want $want), looking for: $pattern"
    echo "stdout: $out"
    echo "stderr: $err"
    failures=$((failures + 1))
  fi
  if [ "$want" -ne 0 ] && [ "$(wc -l <<<"$err")" -ne 1 ]; then
    echo "FAIL: cimhost $* -> error is not one line: $err"
    failures=$((failures + 1))
  fi
}

W1='Tiny_Thing.Name="alpha",Id=1'

run 0 'Big = 18446744073709551615;'           ei Tiny_Thing
run 0 'Tags = {"x", "y\"q"};'                  ei Tiny_Thing
run 0 'When = "00000001020304.000005:000";'   ei Tiny_Thing
run 0 'root/tiny:Tiny_Thing.Name="beta",Id=2' ein Tiny_Thing
run 0 'Count = 10;'                           gi -P Count "$W1"
run 0 'root/tiny:Tiny_Thing.Name="n",Id=5'    ci 'Tiny_Thing.Name="n",Id=5' Count=7
run 0 ''                                      mi "$W1" Count=8
run 0 ''                                      di "$W1"
run 0 'Name = "beta";'                        ai "$W1"
run 0 'Tiny_Thing.Name="beta",Id=2'           ain --role Left "$W1"
run 0 'instance of Tiny_Link'                 ri "$W1"
run 0 'Tiny_Link.'                            rin "$W1"
run 0 'ReturnValue = 6;'                      cm "$W1" Echo Text=ab Times=3
run 0 'instance of Tiny_Event'                listen Tiny_Event 1
run 0 '"rc": 0'                               --json gi "$W1"
run 0 '"paths"'                               --json ein Tiny_Thing
run 0 '"returnValue"'                         --json cm "$W1" Echo Text=q
run 0 'instance of Tiny_Event'                -f sfcb listen Tiny_Event 1

# Errors: one line with the status name, an exit code below 128.
run 1 'CMPI_RC_ERR_NOT_FOUND: no such Tiny_Thing' gi 'Tiny_Thing.Name="nope",Id=1'
run 1 'CMPI_RC_ERR_FAILED: Fail was asked to fail' cm "$W1" Fail
run 2 'CMPI_RC_ERR_INVALID_PARAMETER: bad object path' gi 'Tiny_Thing.Name="open'
run 2 "CMPI_RC_ERR_INVALID_PARAMETER: unknown verb 'zap'" zap "$W1"
run 2 'CMPI_RC_ERR_INVALID_PARAMETER: Count:' ci 'Tiny_Thing.Name="n",Id=8' Count=seventy
run 1 'CMPI_RC_ERR_FAILED: MOF: /nonexistent.mof' -m /nonexistent.mof ei Tiny_Thing
run 1 'CMPI_RC_ERR_FAILED: cannot load /nonexistent/libX.so' -p /nonexistent/libX.so ei Tiny_Thing
run 1 'exports no Wrong_Create_' -n Wrong ei Tiny_Thing
run 1 'CMPI_RC_ERR_FAILED: cannot open batch file' batch /nonexistent/batch.txt

# A batch from standard input: one load, a reload (a fresh library: its
# generation counts from 1 again), errors that do not stop it.
out=$(printf '%s\n' '# generations' 'cm Tiny_Thing.Name=\"alpha\",Id=1 Generation' 'gi Tiny_Thing.Name=\"nope\",Id=1' \
        'reload' 'cm Tiny_Thing.Name=\"alpha\",Id=1 Generation' |
      "$CIMHOST" -p "$LIB" -n "$NAME" -m "$MOF" -N "$NS" --strict batch - 2>/tmp/cimhost_cli_err.$$)
code=$?
if [ "$code" -ne 1 ] || [ "$(grep -c '^ReturnValue = 1;$' <<<"$out")" -ne 2 ] ||
   ! grep -q '^CMPI_RC_ERR_NOT_FOUND: no such Tiny_Thing$' /tmp/cimhost_cli_err.$$; then
  echo "FAIL: batch from stdin -> exit $code"
  echo "stdout: $out"
  echo "stderr: $(cat /tmp/cimhost_cli_err.$$)"
  failures=$((failures + 1))
fi

# --help names every verb.
help=$("$CIMHOST" --help)
for verb in ei ein gi ci mi di ai ain ri rin cm listen batch; do
  grep -qE "^  $verb " <<<"$help" || { echo "FAIL: --help lacks $verb"; failures=$((failures + 1)); }
done

rm -f /tmp/cimhost_cli_err.$$
[ "$failures" -eq 0 ] && echo "all cimhost command line checks passed"
exit $((failures > 0))
