#!/usr/bin/env bash
# Fails when a C++ file of ours differs from what clang-format makes of it.
# With --fix, rewrites the files in place instead.
set -euo pipefail
cd "$(dirname "$0")/.."
formatter=clang-format-14
command -v "$formatter" >/dev/null || formatter=clang-format
mapfile -t files < <(git ls-files '*.cpp' '*.h')
if [ "${1:-}" = "--fix" ]; then
  "$formatter" -i --style=file "${files[@]}"
  exit 0
fi
if ! "$formatter" --dry-run --Werror --style=file "${files[@]}" 2> /tmp/steamext-format.$$; then
  grep -E '^[^ ].*: (error|warning):' /tmp/steamext-format.$$ | sed 's/: error: .*/: not formatted/' | sort -u
  rm -f /tmp/steamext-format.$$
  echo "format check failed: run scripts/check_format.sh --fix" >&2
  exit 1
fi
rm -f /tmp/steamext-format.$$
echo "format check: ${#files[@]} files clean"
