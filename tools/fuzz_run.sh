#!/usr/bin/env bash
# A bounded libFuzzer run of every fuzz target built by the "fuzz" preset:
# each target starts from its seed corpus (fuzz/corpus/<name>, read only;
# new inputs go to build-fuzz/corpus/<name>) and runs for SECONDS seconds
# (default 60). Prints each target's executions and coverage; a crash,
# leak or sanitizer report fails the run and leaves the input in
# build-fuzz/artifacts/.
set -euo pipefail
cd "$(dirname "$0")/.."
seconds="${1:-60}"
mkdir -p build-fuzz/artifacts
status=0
for target in build-fuzz/fuzz/fuzz_*; do
  name="${target##*/fuzz_}"
  mkdir -p "build-fuzz/corpus/$name"
  seeds=()
  [ -d "fuzz/corpus/$name" ] && seeds=("fuzz/corpus/$name")
  log="build-fuzz/fuzz_$name.log"
  if "$target" -max_total_time="$seconds" -rss_limit_mb=4096 -print_final_stats=1 \
      -artifact_prefix=build-fuzz/artifacts/ "build-fuzz/corpus/$name" "${seeds[@]}" >"$log" 2>&1; then
    result=ok
  else
    result=FAILED
    status=1
  fi
  runs=$(grep -o 'stat::number_of_executed_units: [0-9]*' "$log" | awk '{print $2}' | tail -1)
  cov=$(grep -o 'cov: [0-9]*' "$log" | tail -1 | awk '{print $2}')
  echo "fuzz_$name: $result, ${runs:-?} executions, coverage ${cov:-?} edges in ${seconds}s"
  [ "$result" = ok ] || tail -40 "$log"
done
exit $status
