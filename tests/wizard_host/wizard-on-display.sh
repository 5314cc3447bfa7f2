#!/usr/bin/env bash
# Starts `velmora wizard` on a display and shows that its first page appears: under xvfb-run (a
# real X server) a screenshot of the screen is taken once the wizard shows; on the offscreen
# platform the wizard is only seen to stay up. The wizard is then ended from outside, which must
# leave the document untouched.
#   wizard-on-display.sh BIN_DIR SCREEN_SHOT_TOOL PICTURE [x|offscreen]
set -euo pipefail
bin=$1 shooter=$2 picture=$3 platform=${4:-x}
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
doc="$work/setup.wpx"
printf 'untouched' >"$doc.before"

start_wizard() {
  "$bin/velmora" wizard "$doc" >"$work/wizard.out" 2>&1 &
  echo $!
}

if [ "$platform" = x ]; then
  unset QT_QPA_PLATFORM
  pid=$(start_wizard)
  "$shooter" "$picture" 60
else
  export QT_QPA_PLATFORM=offscreen
  pid=$(start_wizard)
  sleep 3
fi
if ! kill -0 "$pid" 2>/dev/null; then
  echo "the wizard is not running:" >&2
  cat "$work/wizard.out" >&2
  exit 1
fi
kill "$pid"
wait "$pid" 2>/dev/null || true
if [ -e "$doc" ]; then
  echo "the wizard wrote $doc though nobody finished it" >&2
  exit 1
fi
echo "wizard-on-display: the wizard ran on $platform and left the document alone"
