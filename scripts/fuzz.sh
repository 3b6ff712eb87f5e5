#!/usr/bin/env bash
# Runs the fuzz targets of a fuzz build, each starting from the seed corpus in
# fuzz/corpus. Fails on the first finding and keeps its input in fuzz-findings/.
# Usage: scripts/fuzz.sh [--budget] BUILD_DIR SECONDS [NAME_GLOB]
#   SECONDS    time per target; with --budget, the time of all targets together,
#              shared evenly (at least 3 s each).
#   NAME_GLOB  picks targets by name without the _fuzzer suffix ('logcode_*').
set -euo pipefail
cd "$(dirname "$0")/.."
shared=0
if [ "${1:-}" = "--budget" ]; then shared=1; shift; fi
if [ "${1:-}" = "--help" ] || [ $# -lt 1 ]; then
  sed -n '2,7p' "$0" | sed 's/^# \{0,1\}//'
  exit $([ "${1:-}" = "--help" ] && echo 0 || echo 2)
fi
build=$1
seconds=${2:-60}
only=${3:-*}
targets=("$build"/fuzz/${only}_fuzzer)
[ -x "${targets[0]}" ] || { echo "no fuzz targets in $build/fuzz" >&2; exit 2; }
if [ "$shared" = 1 ]; then
  seconds=$((seconds / ${#targets[@]}))
  [ "$seconds" -ge 3 ] || seconds=3
fi
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
for target in "${targets[@]}"; do
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
