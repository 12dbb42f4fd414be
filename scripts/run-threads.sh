#!/usr/bin/env bash
# Builds the library and the registry tests with ThreadSanitizer and runs the
# concurrency test (Threads.*: several threads calling every registry
# operation at once, compared with a one-thread run) on every code path.
set -euo pipefail
cd "$(dirname "$0")/.."
bash scripts/install-deps.sh
SAN="-fsanitize=thread -fno-omit-frame-pointer -g"
cmake -S . -B build-tsan -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo \
  -DCMAKE_C_COMPILER=gcc -DCMAKE_CXX_COMPILER=g++ \
  -DCMAKE_C_FLAGS="$SAN" -DCMAKE_CXX_FLAGS="$SAN" \
  -DCMAKE_EXE_LINKER_FLAGS="-fsanitize=thread" -DCMAKE_SHARED_LINKER_FLAGS="-fsanitize=thread" \
  -DPXFX_BUILD_BENCH=OFF -DPXFX_WERROR=ON -DPXFX_SKIP_TARGETS="${PXFX_SKIP_TARGETS:-}"
cmake --build build-tsan -j "$(nproc)" --target pxfx_tests_registry
for path in scalar 128 best; do
  echo "== Threads on path $path"
  if [ "$path" = best ]; then cpu=(env -u PXFX_CPU); else cpu=(env PXFX_CPU="$path"); fi
  "${cpu[@]}" TSAN_OPTIONS=halt_on_error=1:second_deadlock_stack=1 \
    build-tsan/tests/pxfx_tests_registry --gtest_filter='Threads.*'
done
