#!/usr/bin/env bash
# Runs every fuzz target of a fuzz build for the given number of seconds,
# starting from the seed corpus in fuzz/corpus. Fails on the first finding.
# Usage: scripts/fuzz.sh BUILD_DIR SECONDS [NAME_GLOB]
# NAME_GLOB picks targets by name without the _fuzzer suffix ('lte_*': the LTE sections).
set -euo pipefail
cd "$(dirname "$0")/.."
build=${1:?build directory}
seconds=${2:-60}
only=${3:-*}
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
for target in "$build"/fuzz/${only}_fuzzer; do
  name=$(basename "$target")
  mkdir -p "$work/$name"
  cp fuzz/corpus/*/* "$work/$name/" 2>/dev/null || true
  echo "fuzzing $name for $seconds s"
  if ! "$target" -max_total_time="$seconds" -max_len=4096 -artifact_prefix="$work/" "$work/$name" \
      >"$work/$name.log" 2>&1; then
    tail -n 60 "$work/$name.log"
    mkdir -p fuzz-findings && cp "$work"/crash-* "$work"/leak-* "$work"/timeout-* fuzz-findings/ 2>/dev/null || true
    echo "$name found a problem; inputs kept in fuzz-findings/" >&2
    exit 1
  fi
  grep -E '^Done [0-9]+ runs' "$work/$name.log" || true
done
