#!/usr/bin/env bash
# Configures and builds one flavour of Velmora: build.sh [release|sanitize|fuzz] (default release).
set -euo pipefail
cd "$(dirname "$0")/.."
flavour="${1:-release}"
launcher=()
if command -v ccache >/dev/null; then
  launcher=(-DCMAKE_CXX_COMPILER_LAUNCHER=ccache -DCMAKE_C_COMPILER_LAUNCHER=ccache)
  # Paths below the checkout are hashed relative to it, so another checkout (CI's) reuses the objects.
  export CCACHE_BASEDIR="${CCACHE_BASEDIR:-$PWD}" CCACHE_NOHASHDIR=1
fi
case "$flavour" in
  release)  dir=build;          opts=(-DCMAKE_BUILD_TYPE=RelWithDebInfo -DVELMORA_WERROR=ON) ;;
  sanitize) dir=build-sanitize; opts=(-DCMAKE_BUILD_TYPE=Debug -DVELMORA_WERROR=ON -DVELMORA_SANITIZE=ON -DVELMORA_BENCH=OFF) ;;
  fuzz)     dir=build-fuzz;     opts=(-DCMAKE_BUILD_TYPE=RelWithDebInfo -DCMAKE_C_COMPILER=clang -DCMAKE_CXX_COMPILER=clang++
                                      -DVELMORA_FUZZ=ON -DVELMORA_SANITIZE=ON -DVELMORA_BENCH=OFF) ;;
  *) echo "usage: build.sh [release|sanitize|fuzz]" >&2; exit 2 ;;
esac
cmake -S . -B "$dir" -G Ninja "${launcher[@]}" "${opts[@]}" >/dev/null
cmake --build "$dir" -j "$(nproc)"
