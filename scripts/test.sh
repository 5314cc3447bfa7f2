#!/usr/bin/env bash
# Installs what is needed, builds, and runs every test: the release build, the whole suite again
# under the address and undefined-behaviour sanitizers, and each fuzz target for a bounded time.
set -euo pipefail
cd "$(dirname "$0")/.."
scripts/install-deps.sh
export QT_QPA_PLATFORM=offscreen

scripts/build.sh release
ctest --test-dir build --output-on-failure -j "$(nproc)"

scripts/build.sh sanitize
ASAN_OPTIONS=detect_leaks=1 UBSAN_OPTIONS=print_stacktrace=1 \
  ctest --test-dir build-sanitize --output-on-failure -j "$(nproc)"

scripts/build.sh fuzz
scripts/run-fuzzers.sh "${FUZZ_SECONDS:-20}"
