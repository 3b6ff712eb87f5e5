#!/usr/bin/env bash
# Builds Corvane and runs the whole test suite: once as a plain build, once
# under AddressSanitizer and UndefinedBehaviorSanitizer, then a short run of
# the fuzz targets, sharing one time budget. Every build treats warnings as
# errors; ccache keeps rebuilds short. Each stage prints how long it took.
# This is what CI runs.
set -euo pipefail
cd "$(dirname "$0")/.."
bash scripts/deps.sh

jobs=$(nproc)
# Seconds of fuzzing in all, shared by the targets.
fuzz_budget=${CORVANE_FUZZ_BUDGET:-90}
launcher=()
command -v ccache >/dev/null && launcher=(-DCMAKE_C_COMPILER_LAUNCHER=ccache -DCMAKE_CXX_COMPILER_LAUNCHER=ccache)

started=$SECONDS
stage_started=$SECONDS
stage_name=""
finish_stage() {
  [ -n "$stage_name" ] && printf '=== %s: %d s\n' "$stage_name" $((SECONDS - stage_started))
  return 0
}
step() {
  finish_stage
  stage_name=$*
  stage_started=$SECONDS
  printf '\n=== %s\n' "$*"
}

step "Plain build (warnings are errors)"
cmake -S . -B build/ci -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo -DCORVANE_WERROR=ON "${launcher[@]}" >/dev/null
cmake --build build/ci -j "$jobs"
(cd build/ci && ctest -j "$jobs" --output-on-failure --timeout 300)

step "AddressSanitizer + UndefinedBehaviorSanitizer build"
cmake -S . -B build/ci-sanitize -G Ninja -DCMAKE_BUILD_TYPE=Debug -DCORVANE_WERROR=ON -DCORVANE_SANITIZE=ON \
  -DCORVANE_BENCH=OFF "${launcher[@]}" >/dev/null
cmake --build build/ci-sanitize -j "$jobs"
(cd build/ci-sanitize && ASAN_OPTIONS=detect_leaks=1:abort_on_error=1 UBSAN_OPTIONS=print_stacktrace=1 \
  ctest -j "$jobs" --output-on-failure --timeout 600)

step "Fuzz build"
CC=clang CXX=clang++ cmake -S . -B build/ci-fuzz -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo -DCORVANE_WERROR=ON \
  -DCORVANE_FUZZ=ON -DCORVANE_TESTS=OFF -DCORVANE_BENCH=OFF "${launcher[@]}" >/dev/null
cmake --build build/ci-fuzz -j "$jobs"

step "Fuzz targets (${fuzz_budget} s in all)"
bash scripts/fuzz.sh --budget build/ci-fuzz "$fuzz_budget"

finish_stage
printf '\n=== All tests passed in %d s\n' $((SECONDS - started))
