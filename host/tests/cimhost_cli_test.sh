#!/usr/bin/env bash
# Drives the cimhost command through every verb against the sample provider,
# as a user would from a shell, and checks exit codes and output. Also checks
# that bad input gives one error line and an exit code, never a crash.
# Usage: cimhost_cli_test.sh CIMHOST PROVIDER_LIB MOF
set -u
CIMHOST=$1 LIB=$2 MOF=$3
NS=root/sample
failures=0
run() {   # run EXPECTED_CODE PATTERN ARGS... : PATTERN in stdout (or stderr when EXPECTED_CODE != 0)
  local want=$1 pattern=$2
  shift 2
  local out err code
  out=$("$CIMHOST" -p "$LIB" -m "$MOF" -N "$NS" --strict "$@" 2>/tmp/cimhost_cli_err.$$)
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

W1='Sample_Widget.Name="w1"'
SVC='Sample_Service.Name="svc"'

run 0 'Port = 8080;'                          ei Sample_Widget
run 0 'root/sample:Sample_Gadget.Id="g3"'     ein Sample_Gadget
run 0 'Level = 3;'                            gi -P Level "$W1"
run 0 'root/sample:Sample_Widget.Name="w9"'   ci 'Sample_Widget.Name="w9"' Port=9
run 0 ''                                      mi "$W1" Port=7
run 0 ''                                      di 'Sample_Widget.Name="w2"'
run 0 'Name = "w1";'                          ai 'Sample_Gadget.Id="g1"'
run 0 'Sample_Gadget.Id="g2"'                 ain --role Owner "$W1"
run 0 'instance of Sample_WidgetGadget'       ri 'Sample_Gadget.Id="g3"'
run 0 'Sample_WidgetGadget.'                  rin "$W1"
run 0 'Result = 20;'                          cm "$SVC" Scale Value=4 'Factors={2,3}' Label=x "Target=root/sample:$W1"
run 0 'instance of Sample_Alert'              listen Sample_Alert 1
run 0 '"rc": 0'                               --json gi "$W1"
run 0 '"paths"'                               --json ein Sample_Widget
run 0 '"returnValue"'                         --json cm "$SVC" Scale Value=1 Label=y "Target=root/sample:$W1"
run 0 'instance of Sample_Alert'              -f sfcb listen Sample_Alert 1

# Errors: one line with the status name, an exit code below 128.
run 1 'CMPI_RC_ERR_NOT_FOUND: nope'           gi 'Sample_Widget.Name="nope"'
run 1 'CMPI_RC_ERR_INVALID_PARAMETER: Fail was asked for' cm "$SVC" Fail
run 2 'CMPI_RC_ERR_INVALID_PARAMETER: bad object path' gi 'Sample_Widget.Name="open'
run 2 "CMPI_RC_ERR_INVALID_PARAMETER: unknown verb 'zap'" zap "$W1"
run 2 'CMPI_RC_ERR_INVALID_PARAMETER: Port:' ci 'Sample_Widget.Name="w8"' Port=seventy
run 1 'CMPI_RC_ERR_FAILED: MOF: /nonexistent.mof' -m /nonexistent.mof ei Sample_Widget
run 1 'CMPI_RC_ERR_FAILED: cannot load /nonexistent/libX.so' -p /nonexistent/libX.so ei Sample_Widget
run 1 'exports no Wrong_Create_' -n Wrong ei Sample_Widget
run 1 'CMPI_RC_ERR_FAILED: cannot open batch file' batch /nonexistent/batch.txt

# A batch from standard input: one load, a reload, errors that do not stop it.
out=$(printf '%s\n' '# widgets' 'di Sample_Widget.Name=\"w2\"' 'ein Sample_Widget' 'gi Sample_Widget.Name=\"w2\"' \
        'reload' 'ein Sample_Widget' |
      "$CIMHOST" -p "$LIB" -m "$MOF" -N "$NS" --strict batch - 2>/tmp/cimhost_cli_err.$$)
code=$?
if [ "$code" -ne 1 ] || [ "$(grep -c 'Sample_Widget.Name="w2"' <<<"$out")" -ne 1 ] ||
   ! grep -q '^CMPI_RC_ERR_NOT_FOUND: w2$' /tmp/cimhost_cli_err.$$; then
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
