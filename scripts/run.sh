#!/usr/bin/env bash
# Corvane's main job, until the screens exist: starts the telephony service with
# its built-in simulator and runs the headless monitor for three display
# updates, then stops both. Extra arguments go to corvane-monitor
# (e.g. --format json, --updates 10).
set -euo pipefail
cd "$(dirname "$0")/.."
bash scripts/deps.sh
cmake -S . -B build/release -G Ninja -DCMAKE_BUILD_TYPE=Release -DCORVANE_TESTS=OFF -DCORVANE_BENCH=OFF >/dev/null
cmake --build build/release -j "$(nproc)" --target corvane-telephonyd corvane-monitor corvane-decode >/dev/null

# A private runtime directory, so that this run never meets another service.
export CORVANE_RUNTIME_DIR
CORVANE_RUNTIME_DIR=$(mktemp -d /tmp/corvane-run-XXXXXX)
build/release/telephonyd/corvane-telephonyd --technology IFX &
service=$!
trap 'kill "$service" 2>/dev/null; wait "$service" 2>/dev/null; rm -rf "$CORVANE_RUNTIME_DIR"' EXIT
[ $# -gt 0 ] || set -- --updates 3
build/release/tools/corvane-monitor "$@"
