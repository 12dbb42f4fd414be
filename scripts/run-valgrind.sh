#!/usr/bin/env bash
# Builds the test programs without sanitizers and runs each under valgrind's
# memcheck: any invalid access, use of uninitialised memory or leak (definite,
# indirect or possible) fails the run. The build forces the plain table loops
# (PXFX_SIMD=OFF): memcheck does not run AVX-512, and so every test, the golden
# hashes among them, also passes once without vector lookups.
#   scripts/run-valgrind.sh [GTEST_FILTER]   (default: every test)
set -euo pipefail
cd "$(dirname "$0")/.."
filter=${1:-*}
bash scripts/install-deps.sh valgrind
cmake -S . -B build-valgrind -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo \
  -DPXFX_BUILD_BENCH=OFF -DPXFX_BUILD_TOOLS=ON -DPXFX_SIMD=OFF -DPXFX_WERROR=ON
cmake --build build-valgrind -j "$(nproc)"
failed=0
passed=0
for program in build-valgrind/tests/pxfx_tests_* build-valgrind/tests/pxfx_c_api; do
  [ -x "$program" ] || continue
  name=$(basename "$program")
  if valgrind --quiet --error-exitcode=99 --leak-check=full --show-leak-kinds=definite,indirect,possible \
      --errors-for-leak-kinds=definite,indirect,possible --track-origins=yes \
      "$program" --gtest_filter="$filter" --gtest_brief=1 >"build-valgrind/$name.log" 2>&1; then
    passed=$((passed + 1))
    echo "memcheck $name: clean"
  else
    failed=$((failed + 1))
    echo "memcheck $name: FAILED"
    tail -n 60 "build-valgrind/$name.log"
  fi
done
echo "memcheck: $passed passed, $failed failed"
[ "$failed" -eq 0 ]
