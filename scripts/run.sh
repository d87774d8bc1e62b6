#!/usr/bin/env bash
# The main job: build, then play the built-in tour against the built module.
set -euo pipefail
cd "$(dirname "$0")/.."
scripts/setup.sh
cmake --preset default >/dev/null
cmake --build --preset default -j2 --target steamext steam_extension
exec build/default/bin/steamext run "$@"
