#!/usr/bin/env bash
# Builds Corvane and runs the whole test suite: once as a plain build, once
# under AddressSanitizer and UndefinedBehaviorSanitizer, then a short run of
# every fuzz target. Every build treats warnings as errors. This is what CI runs.
set -euo pipefail
cd "$(dirname "$0")/.."
bash scripts/deps.sh

jobs=$(nproc)
fuzz_seconds=${CORVANE_FUZZ_SECONDS:-10}

step() { printf '\n=== %s\n' "$*"; }

step "Plain build (warnings are errors)"
cmake -S . -B build/ci -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo -DCORVANE_WERROR=ON >/dev/null
cmake --build build/ci -j "$jobs"
(cd build/ci && ctest -j "$jobs" --output-on-failure --timeout 300)

step "AddressSanitizer + UndefinedBehaviorSanitizer build"
cmake -S . -B build/ci-sanitize -G Ninja -DCMAKE_BUILD_TYPE=Debug -DCORVANE_WERROR=ON -DCORVANE_SANITIZE=ON \
  -DCORVANE_BENCH=OFF >/dev/null
cmake --build build/ci-sanitize -j "$jobs"
(cd build/ci-sanitize && ASAN_OPTIONS=detect_leaks=1:abort_on_error=1 UBSAN_OPTIONS=print_stacktrace=1 \
  ctest -j "$jobs" --output-on-failure --timeout 600)

step "Fuzz targets (${fuzz_seconds} s each)"
CC=clang CXX=clang++ cmake -S . -B build/ci-fuzz -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo -DCORVANE_WERROR=ON \
  -DCORVANE_FUZZ=ON -DCORVANE_TESTS=OFF -DCORVANE_BENCH=OFF >/dev/null
cmake --build build/ci-fuzz -j "$jobs"
bash scripts/fuzz.sh build/ci-fuzz "$fuzz_seconds"

step "All tests passed"
