#!/usr/bin/env bash
# Runs the checks of .clang-tidy over every C++ source of ours in the default
# build's compile commands; fails on any finding. Needs a configured default build.
set -euo pipefail
cd "$(dirname "$0")/.."
tidy=run-clang-tidy-14
command -v "$tidy" >/dev/null || tidy=run-clang-tidy
[ -f build/default/compile_commands.json ] || cmake --preset default >/dev/null
# Our own folders only: generated sources under build/ are not ours to keep clean.
"$tidy" -quiet -p build/default -j "${JOBS:-2}" \
  "$PWD/(src|simclient|simengine|tools|tests|bench|fuzz)/.*\\.cpp\$" 2>&1 |
  sed 's/\x1b\[[0-9;]*m//g' > /tmp/steamext-tidy.$$ || status=$?
if [ "${status:-0}" -ne 0 ] || grep -q ': \(warning\|error\): ' /tmp/steamext-tidy.$$; then
  grep -E ': (warning|error): ' /tmp/steamext-tidy.$$ | sort -u
  rm -f /tmp/steamext-tidy.$$
  echo "tidy check failed" >&2
  exit 1
fi
rm -f /tmp/steamext-tidy.$$
echo "tidy check: clean"
