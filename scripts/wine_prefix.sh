#!/usr/bin/env bash
# Makes Wine's prefix (its Windows folder tree) once, before anything runs Windows
# programs side by side: two first runs at once would both try to create it.
set -euo pipefail
export WINEDEBUG=-all WINEDLLOVERRIDES="mscoree,mshtml="
prefix="${WINEPREFIX:-$HOME/.wine}"
if [ ! -f "$prefix/system.reg" ]; then
  echo "Creating the Wine prefix in $prefix"
  wineboot --init
  wineserver --wait
fi
