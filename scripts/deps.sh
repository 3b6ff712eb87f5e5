#!/usr/bin/env bash
# Installs what Corvane needs to build, test and run on Debian 12, with apt-get.
# Does nothing when everything is already there.
set -euo pipefail

packages=(
  build-essential cmake ninja-build pkg-config git ccache
  clang libclang-rt-14-dev
  qt6-base-dev libplist-dev nlohmann-json3-dev libcrcutil-dev
  libgtest-dev libgmock-dev libbenchmark-dev
  libqt6svg6 fonts-dejavu-core libplist-utils xvfb xauth dbus-daemon
  libncurses-dev tmux
  libglib2.0-dev libmm-glib-dev python3-dbusmock
)

missing=()
for p in "${packages[@]}"; do
  dpkg-query -W -f='${Status}' "$p" 2>/dev/null | grep -q "install ok installed" || missing+=("$p")
done
[ ${#missing[@]} -eq 0 ] && exit 0

echo "Installing: ${missing[*]}"
sudo=""
if [ "$(id -u)" -ne 0 ]; then
  command -v sudo >/dev/null || { echo "Run as root, or install sudo, to install: ${missing[*]}" >&2; exit 1; }
  sudo="sudo"
fi
export DEBIAN_FRONTEND=noninteractive
$sudo apt-get update -qq
$sudo apt-get install -y -qq --no-install-recommends "${missing[@]}" </dev/null
