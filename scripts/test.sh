#!/usr/bin/env bash
# Every test: the format check, the suite, clang-tidy's checks, the suite again under
# AddressSanitizer+UBSan, the threaded tests under ThreadSanitizer, the fuzz targets
# for a bounded time, and the suite cross-built for 64-bit Windows, run under Wine.
set -euo pipefail
cd "$(dirname "$0")/.."
scripts/setup.sh
jobs=2

echo "== format check"
scripts/check_format.sh

echo "== build and test (default)"
cmake --preset default >/dev/null
cmake --build --preset default -j$jobs
ctest --preset default -j$jobs

echo "== static checks (clang-tidy)"
scripts/check_tidy.sh

echo "== build and test (AddressSanitizer + UndefinedBehaviorSanitizer)"
export ASAN_OPTIONS=detect_leaks=1:abort_on_error=1
export UBSAN_OPTIONS=print_stacktrace=1:halt_on_error=1
cmake --preset asan >/dev/null
cmake --build --preset asan -j$jobs
ctest --preset asan -j$jobs

echo "== build and test threaded code (ThreadSanitizer)"
export TSAN_OPTIONS="halt_on_error=1 second_deadlock_stack=1"
cmake --preset tsan >/dev/null
cmake --build --preset tsan -j$jobs
ctest --preset tsan -j$jobs -L threads

if [ -x fuzz/run_fuzzers.sh ]; then
  echo "== fuzz targets (bounded)"
  fuzz/run_fuzzers.sh
fi

echo "== build and test for 64-bit Windows (mingw-w64, run under Wine)"
scripts/wine_prefix.sh
scripts/wine_server.sh start
trap 'scripts/wine_server.sh stop' EXIT
cmake --preset windows >/dev/null
cmake --build --preset windows -j$jobs
ctest --preset windows -j$jobs
echo "all test stages passed"
