#!/usr/bin/env bash
# Runs the libFuzzer programs of a fuzz build one after the other, each for
# SECONDS, under tests/isolate.sh (private /opt and /var/tmp):
#   tests/fuzz/run.sh BUILD SECONDS [TARGET...]      (default: every target)
# Each starts from its initial inputs (tests/fuzz/corpus/<t>) and regression
# inputs (tests/fuzz/regressions/<t>); the inputs it adds go to
# BUILD/fuzz/corpus/<t>, a crashing input to BUILD/fuzz/artifacts/<t>/, its
# output to BUILD/fuzz/logs/<t>.log. The executions of each run are added to
# BUILD/fuzz/summary.txt. Exit status 1 when a target found a crash.
set -euo pipefail
here=$(cd "$(dirname "$0")" && pwd)
build=$(cd "${1:?usage: run.sh BUILD SECONDS [TARGET...]}" && pwd)
seconds=${2:?usage: run.sh BUILD SECONDS [TARGET...]}
shift 2
targets=("$@")
[ ${#targets[@]} -gt 0 ] || targets=(description vpd settings jobfile path requests)

# Largest input of each target (libFuzzer's default is 4096 bytes).
max_len() {
  case $1 in
    description) echo 16384 ;;
    requests) echo 8192 ;;
    *) echo 4096 ;;
  esac
}

out=$build/fuzz
mkdir -p "$out/logs"
status=0
for t in "${targets[@]}"; do
  program=$build/bin/fuzz_$t
  [ -x "$program" ] || { echo "run.sh: no $program (build the target fuzzers)" >&2; exit 2; }
  mkdir -p "$out/corpus/$t" "$out/artifacts/$t"
  log=$out/logs/$t.log
  echo "fuzz_$t: ${seconds}s"
  set +e
  ISOLATE_KEEP_CWD=0 "$here/../isolate.sh" "$program" \
    -max_total_time="$seconds" -max_len="$(max_len "$t")" -timeout=30 -rss_limit_mb=4096 \
    -close_fd_mask=3 -print_final_stats=1 -artifact_prefix="$out/artifacts/$t/" \
    "$out/corpus/$t" "$here/corpus/$t" "$here/regressions/$t" > "$log" 2>&1
  rc=$?
  set -e
  runs=$(sed -n 's/^stat::number_of_executed_units: *//p' "$log" | tail -1)
  found=$(find "$out/artifacts/$t" -type f | wc -l)
  line="$(date -u +%FT%TZ) fuzz_$t seconds=$seconds executions=${runs:-0} exit=$rc artifacts=$found"
  echo "$line" | tee -a "$out/summary.txt"
  if [ "$rc" -ne 0 ] || [ "$found" -gt 0 ]; then
    status=1
    grep -m1 -E "ERROR: |runtime error|deadly signal" "$log" || true
  fi
done
exit $status
