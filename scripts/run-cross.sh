#!/usr/bin/env bash
# Cross-compiles pxfx and its tests for a phone architecture and runs every
# test under qemu user-mode emulation.
#   scripts/run-cross.sh aarch64-linux-gnu | arm-linux-gnueabihf
set -euo pipefail
cd "$(dirname "$0")/.."
triple=${1:?usage: run-cross.sh aarch64-linux-gnu|arm-linux-gnueabihf}
bash scripts/install-deps.sh "g++-$triple" qemu-user-static googletest
cmake -S . -B "build-$triple" -G Ninja -DCMAKE_BUILD_TYPE=Release \
  -DCMAKE_TOOLCHAIN_FILE="$PWD/cmake/toolchains/$triple.cmake" \
  -DPXFX_BUILD_BENCH=OFF
cmake --build "build-$triple" -j "$(nproc)"
ctest --test-dir "build-$triple" --output-on-failure -j "$(nproc)"
