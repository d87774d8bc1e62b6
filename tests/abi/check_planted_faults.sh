#!/usr/bin/env bash
# The check of the engine's tables is only worth something if it fails: this
# runs it on tables known to be wrong and expects it to name each difference.
#
# usage: check_planted_faults.sh COMPILER SOURCE_DIR DUMP_FILE
set -euo pipefail

if [ $# -ne 3 ]; then
    echo "usage: $0 COMPILER SOURCE_DIR DUMP_FILE" >&2
    exit 2
fi
here="$(cd "$(dirname "$0")" && pwd)"
tables="$here/planted_faults_tables.txt"

status=0
output=$("$here/check_engine_tables.sh" "$1" "$2" "$3" "$tables") || status=$?
if [ "$status" -ne 1 ]; then
    echo "expected the check to fail with status 1 on $tables, it ended with $status:"
    echo "$output"
    exit 1
fi

# The start of each message (the compiler's own text of a declaration follows in brackets).
expected=(
    "BaseImplementation slot 3: expected Shutdown, found Initialize ["
    "BaseImplementation slot 4: expected Initialize, found Shutdown ["
    "CloudImplementationSteam slot 9: expected nothing (the engine's table ends at slot 8), found DeleteFile ["
    "ExtensionModule slot 10: expected GetVersion, found nothing (the compiled table ends at slot 9)"
    "SteamScoreClient: the compiler printed no table for it"
    "5 difference(s) from $tables"
)
missing=0
for message in "${expected[@]}"; do
    if ! grep -qF -- "$message" <<<"$output"; then
        echo "the check did not say: $message"
        missing=1
    fi
done
if [ "$missing" -ne 0 ]; then
    echo "it said:"
    echo "$output"
    exit 1
fi
echo "every planted difference named (${#expected[@]} messages)"
