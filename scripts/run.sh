#!/usr/bin/env bash
# Corvane's main job: decodes the bundled IFX sample packet offline and prints
# its display tree.
set -euo pipefail
cd "$(dirname "$0")/.."
bash scripts/deps.sh
cmake -S . -B build/release -G Ninja -DCMAKE_BUILD_TYPE=Release -DCORVANE_TESTS=OFF -DCORVANE_BENCH=OFF >/dev/null
cmake --build build/release -j "$(nproc)" --target corvane-decode >/dev/null
exec build/release/tools/corvane-decode --technology IFX tools/samples/ifx-gsm-serving-cell.plist
