#!/usr/bin/env bash
# Runs one libFuzzer target for a bounded time (arguments: the target and its
# libFuzzer arguments) and keeps the CI log short: its final figures when it
# passes, the end of its output when it finds something.
set -u
log="$(mktemp)"
trap 'rm -f "$log"' EXIT
"$@" >"$log" 2>&1
status=$?
if [ $status -eq 0 ]; then
  grep -E '^#[0-9]+[[:space:]]+DONE|^stat::(number_of_executed_units|average_exec_per_sec|new_units_added|peak_rss_mb)' "$log"
else
  tail -n 80 "$log"
fi
exit $status
