#!/usr/bin/env bash
# Corvane's main job: builds the application and the telephony service and runs
# the demo: the service with its built-in simulator, and the application
# connected to it, until the application quits (or Ctrl-C). Extra arguments go
# to corvane-demo (e.g. --seed 7, or --replay FILE to play a capture instead).
# Without a display, on a terminal (a machine reached over SSH), it runs the
# demo in the terminal with corvane-tui; --headless prints text dumps instead.
#
#   bash scripts/run.sh --headless [SERVICE-OPTIONS] [ARGS]
#                                           the service (simulating IFX, or as
#                                           SERVICE-OPTIONS say: --replay FILE,
#                                           --diag DEVICE, --modem MODEM,
#                                           --technology NAME, --speed X,
#                                           --loop) and
#                                           corvane-monitor for three display
#                                           updates, as text (ARGS go to
#                                           corvane-monitor)
set -euo pipefail
# A capture named relative to where this was started, before moving to the repository.
args=()
while [ $# -gt 0 ]; do
  case "$1" in
    --replay|--diag) args+=("$1"); shift; [ $# -gt 0 ] && { args+=("$(realpath -m -s -- "$1")"); shift; } ;;
    --replay=*) args+=("--replay=$(realpath -m -s -- "${1#--replay=}")"); shift ;;
    --diag=*) args+=("--diag=$(realpath -m -s -- "${1#--diag=}")"); shift ;;
    *) args+=("$1"); shift ;;
  esac
done
set -- ${args[@]+"${args[@]}"}
cd "$(dirname "$0")/.."
bash scripts/deps.sh
cmake -S . -B build/release -G Ninja -DCMAKE_BUILD_TYPE=Release -DCORVANE_TESTS=OFF -DCORVANE_BENCH=OFF >/dev/null

if [ "${1:-}" = "--headless" ]; then
  shift
  cmake --build build/release -j "$(nproc)" --target corvane-telephonyd corvane-monitor corvane-decode \
    corvane-fake-baseband >/dev/null
  # A private runtime directory, so that this run never meets another service.
  export CORVANE_RUNTIME_DIR
  CORVANE_RUNTIME_DIR=$(mktemp -d /tmp/corvane-run-XXXXXX)
  service_args=()
  while [ $# -gt 0 ]; do
    case "$1" in
      --replay|--diag|--modem|--technology|--speed) [ $# -ge 2 ] || break; service_args+=("$1" "$2"); shift 2 ;;
      --replay=*|--diag=*|--modem=*|--technology=*|--speed=*|--loop) service_args+=("$1"); shift ;;
      *) break ;;
    esac
  done
  [ ${#service_args[@]} -gt 0 ] || service_args=(--technology IFX)
  build/release/telephonyd/corvane-telephonyd "${service_args[@]}" &
  service=$!
  trap 'kill "$service" 2>/dev/null; wait "$service" 2>/dev/null; rm -rf "$CORVANE_RUNTIME_DIR"' EXIT
  [ $# -gt 0 ] || set -- --updates 3
  build/release/tools/corvane-monitor "$@"
  exit
fi

cmake --build build/release -j "$(nproc)" --target corvane corvane-demo corvane-tui corvane-telephonyd \
  corvane-monitor corvane-decode corvane-fake-baseband >/dev/null
if [ -z "${DISPLAY:-}" ] && [ -z "${WAYLAND_DISPLAY:-}" ] && [ -t 0 ] && [ -t 1 ]; then
  exec build/release/app/corvane-demo --tui "$@"
fi
exec build/release/app/corvane-demo "$@"
