#!/usr/bin/env bash
# The main job on the shipped example: install what is needed, build, show the stored setup, convert
# the river-gauge text file to rbx0 through the plug-in and the engine program, and preview the result.
set -euo pipefail
cd "$(dirname "$0")/.."
scripts/install-deps.sh
scripts/build.sh release >/dev/null
bin=build/bin

echo "== The stored setup (examples/ascii-to-rbx0.wpx)"
"$bin/velmora" summary examples/ascii-to-rbx0.wpx | tr -d '\r'

echo "== Converting through the plug-in and the engine program"
"$bin/velmora" run examples/ascii-to-rbx0.wpx

echo "== The converted file, as the rbx0 preview reads it"
"$bin/velmora" preview examples/river_gauge.converted.rbx0 --format rbx0 | head -n 12
