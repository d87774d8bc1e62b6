#!/usr/bin/env bash
# The engine finds the module by one export; anything else exported could
# clash with the engine's own symbols. Also checks that the module links the
# platform runtime by its name, as it would the real one, and looks for it
# only beside itself.
set -euo pipefail
module="$1"

exported=$(nm -D --defined-only "$module" | awk '$2 ~ /^[TtWwiDdBbVvu]$/ {print $3}' | sort)
if [ "$exported" != "OB_GetExtensionModuleInterface" ]; then
  echo "expected exactly one export, OB_GetExtensionModuleInterface; the module exports:"
  echo "$exported"
  exit 1
fi
if ! readelf -d "$module" | grep -q 'NEEDED.*\[libsteam_api.so\]'; then
  echo "the module does not link libsteam_api.so by name:"
  readelf -d "$module" | grep NEEDED
  exit 1
fi
# Only $ORIGIN may be searched: an absolute path would let a copy of the module
# placed elsewhere load the platform library from the build tree instead.
runpath=$(readelf -d "$module" | sed -n 's/.*(R\(UN\)\{0,1\}PATH).*\[\(.*\)\]/\2/p')
if [ -n "$runpath" ] && [ "$runpath" != '$ORIGIN' ]; then
  echo "the module searches for libraries outside its own folder: $runpath"
  exit 1
fi
echo "exports: $exported; search path: ${runpath:-none}"
