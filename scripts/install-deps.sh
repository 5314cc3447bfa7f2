#!/usr/bin/env bash
# Installs every Debian package Velmora needs to build, test and benchmark. Idempotent and quick
# when everything is present; non-interactive.
set -euo pipefail

packages=(
  build-essential cmake ninja-build pkg-config ccache git
  clang libclang-rt-14-dev
  qt6-base-dev libgl-dev
  libpugixml-dev libxlsxwriter-dev zlib1g-dev
  libgtest-dev libgmock-dev libbenchmark-dev
  libexpat1-dev libzip-dev
  xvfb xauth fonts-dejavu-core
  python3 python3-xlwt python3-xlrd python3-openpyxl python3-xlsxwriter
)

missing=()
for p in "${packages[@]}"; do
  if ! dpkg-query -W -f='${Status}' "$p" 2>/dev/null | grep -q "install ok installed"; then
    missing+=("$p")
  fi
done

if [ ${#missing[@]} -eq 0 ]; then
  echo "install-deps: all ${#packages[@]} packages present"
  exit 0
fi

echo "install-deps: installing ${missing[*]}"
SUDO=""
if [ "$(id -u)" -ne 0 ]; then SUDO="sudo"; fi
export DEBIAN_FRONTEND=noninteractive
$SUDO apt-get update -qq
$SUDO apt-get install -y -qq --no-install-recommends "${missing[@]}"
