#!/usr/bin/env bash
# The Windows module: the engine finds it by one export, and a game ships it with
# nothing but the platform runtime beside it. So it exports exactly one name and
# imports only from the system, the C runtime and steam_api64.dll (the C++ runtime
# is linked in).
set -euo pipefail
objdump="$1"
module="$2"

headers=$("$objdump" -p "$module")
exported=$(printf '%s\n' "$headers" | sed -n '/^\[Ordinal\/Name Pointer\] Table/,/^$/p' |
  sed -n 's/^[[:space:]]*\[ *[0-9]*\] \(.*\)$/\1/p' | sort)
if [ "$exported" != "OB_GetExtensionModuleInterface" ]; then
  echo "expected exactly one export, OB_GetExtensionModuleInterface; the module exports:"
  echo "$exported"
  exit 1
fi

imported=$(printf '%s\n' "$headers" | sed -n 's/^[[:space:]]*DLL Name: \(.*\)$/\1/p')
if ! printf '%s\n' "$imported" | grep -qx 'steam_api64.dll'; then
  echo "the module does not import steam_api64.dll by name; it imports:"
  echo "$imported"
  exit 1
fi
unexpected=$(printf '%s\n' "$imported" | tr 'A-Z' 'a-z' |
  grep -vx -e 'steam_api64.dll' -e 'kernel32.dll' -e 'msvcrt.dll' -e 'ucrtbase.dll' \
           -e 'api-ms-win-crt-[a-z0-9-]*.dll' -e 'vcruntime140.dll' -e 'ntdll.dll' -e 'user32.dll' \
           -e 'advapi32.dll' || true)
if [ -n "$unexpected" ]; then
  echo "the module needs libraries a game does not ship with it:"
  echo "$unexpected"
  exit 1
fi
echo "exports: $exported; imports: $(echo $imported)"
