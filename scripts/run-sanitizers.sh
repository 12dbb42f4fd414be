#!/usr/bin/env bash
# Builds pxfx and its tests with AddressSanitizer and UndefinedBehaviorSanitizer
# (leak detection on, stop at the first report) and runs every test, with the
# allocation-failure hook compiled in so the failure paths are exercised too.
set -euo pipefail
cd "$(dirname "$0")/.."
bash scripts/install-deps.sh
SAN="-fsanitize=address,undefined -fsanitize=float-cast-overflow -fno-sanitize-recover=all -fno-omit-frame-pointer -g"
cmake -S . -B build-asan -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo \
  -DCMAKE_C_COMPILER=gcc -DCMAKE_CXX_COMPILER=g++ \
  -DCMAKE_C_FLAGS="$SAN" -DCMAKE_CXX_FLAGS="$SAN" \
  -DCMAKE_EXE_LINKER_FLAGS="-fsanitize=address,undefined" \
  -DCMAKE_SHARED_LINKER_FLAGS="-fsanitize=address,undefined" \
  -DPXFX_BUILD_BENCH=OFF -DPXFX_ALLOCATION_HOOK=ON -DPXFX_WERROR=ON -DPXFX_SKIP_TARGETS="${PXFX_SKIP_TARGETS:-}"
cmake --build build-asan -j "$(nproc)"
ASAN_OPTIONS=detect_leaks=1:detect_stack_use_after_return=1:strict_string_checks=1:halt_on_error=1 \
UBSAN_OPTIONS=halt_on_error=1:print_stacktrace=1 \
  ctest --test-dir build-asan --output-on-failure -j "$(nproc)"
