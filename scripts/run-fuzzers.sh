#!/usr/bin/env bash
# Runs every fuzz target of build-fuzz for the given number of seconds each, from its seed corpus.
# The random seed is fixed (FUZZ_SEED, default 1) so that a test run judges the same inputs every
# time; long bug-hunting runs set FUZZ_SEED=0, which lets libFuzzer pick a fresh seed per run.
set -euo pipefail
cd "$(dirname "$0")/.."
seconds="${1:-20}"
seed="${FUZZ_SEED:-1}"
status=0
# Crashing inputs are kept here for inspection, outside the source tree.
artifacts=build-fuzz/artifacts
mkdir -p "$artifacts"
for target in build-fuzz/bin/*_fuzz build-fuzz/fuzz/*_fuzz; do
  [ -x "$target" ] || continue
  name=$(basename "$target")
  corpus="fuzz/corpus/${name%_fuzz}"
  work=$(mktemp -d)
  [ -d "$corpus" ] && cp -r "$corpus"/. "$work"/ 2>/dev/null || true
  echo "fuzz: $name for ${seconds}s"
  if ! "$target" -seed="$seed" -max_total_time="$seconds" -max_len=65536 -rss_limit_mb=2048 -timeout=10 -artifact_prefix="$artifacts/$name-" "$work" >"$work.log" 2>&1; then
    echo "fuzz: $name FAILED"; tail -n 40 "$work.log"; status=1
  else
    tail -n 1 "$work.log"
  fi
  rm -rf "$work" "$work.log"
done
exit $status
