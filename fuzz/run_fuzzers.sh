#!/bin/sh
# Builds the fuzz targets (preset "fuzz", clang-14) and runs each one for a
# bounded time on a scratch copy of its seed corpus. Fails on any crash, leak,
# timeout or sanitizer report.
#
#   fuzz/run_fuzzers.sh [SECONDS_PER_TARGET]      (default 20)
set -eu
seconds=${1:-20}
root=$(cd "$(dirname "$0")/.." && pwd)
cd "$root"
cmake --preset fuzz >/dev/null
cmake --build --preset fuzz -j2 --target fuzz_xml_load fuzz_scrambled_load fuzz_csv_load fuzz_list_token
bin="$root/build/fuzz/bin"
scratch=$(mktemp -d)
trap 'rm -rf "$scratch"' EXIT

status=0
for pair in fuzz_xml_load:xml fuzz_scrambled_load:scrambled fuzz_csv_load:csv fuzz_list_token:list_token; do
  target=${pair%%:*}
  seeds="$root/fuzz/corpus/${pair#*:}"
  mkdir -p "$scratch/$target"
  echo "== $target (${seconds}s)"
  if ! "$bin/$target" -max_total_time="$seconds" -max_len=40000 -timeout=10 -rss_limit_mb=2048 \
        -print_final_stats=1 -artifact_prefix="$scratch/$target-" "$scratch/$target" "$seeds" \
        >"$scratch/$target.log" 2>&1; then
    echo "FAILED: $target"; tail -n 60 "$scratch/$target.log"
    for artifact in "$scratch/$target"-*; do
      [ -e "$artifact" ] && cp "$artifact" "$root/build/fuzz/" && echo "artifact kept: build/fuzz/$(basename "$artifact")"
    done
    status=1
  else
    grep -E '^stat::number_of_executed_units|^stat::peak_rss_mb' "$scratch/$target.log" || true
  fi
done
exit $status
