#!/usr/bin/env bash
# Installs what is needed, builds, and runs every test: the release build, the whole suite again
# under the address and undefined-behaviour sanitizers, and each fuzz target for a bounded time.
set -euo pipefail
cd "$(dirname "$0")/.."
scripts/install-deps.sh
export QT_QPA_PLATFORM=offscreen
logs=$(mktemp -d)
trap 'rm -rf "$logs"' EXIT

scripts/build.sh release
ctest --test-dir build --output-on-failure -j "$(nproc)" | tee "$logs/release.txt"

scripts/build.sh sanitize
ASAN_OPTIONS=detect_leaks=1 UBSAN_OPTIONS=print_stacktrace=1 \
  ctest --test-dir build-sanitize --output-on-failure -j "$(nproc)" | tee "$logs/sanitize.txt"

scripts/build.sh fuzz
scripts/run-fuzzers.sh "${FUZZ_SECONDS:-20}"

# One closing line over both suites (ctest stops this script above on any failure).
total=0
for log in "$logs"/*.txt; do
  n=$(sed -n 's/.*tests passed, 0 tests failed out of \([0-9]*\).*/\1/p' "$log" | tail -n 1)
  total=$((total + ${n:-0}))
done
echo "tests: $total passed, 0 failed"
