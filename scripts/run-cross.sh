#!/usr/bin/env bash
# Cross-compiles pxfx and its tests for a phone architecture and runs every
# test under qemu user-mode emulation.
#   scripts/run-cross.sh aarch64-linux-gnu | arm-linux-gnueabihf [plain]
# 32-bit ARM builds for NEON (-mfpu=neon-vfpv4, as Android's armeabi-v7a), so
# that the vector kernels run under qemu; "plain" builds for Debian's default
# armhf processor (no NEON in the baseline) instead.
set -euo pipefail
cd "$(dirname "$0")/.."
triple=${1:?usage: run-cross.sh aarch64-linux-gnu|arm-linux-gnueabihf [plain]}
variant=${2:-}
case "$triple" in
  aarch64-linux-gnu) arch=arm64 ;;
  arm-linux-gnueabihf) arch=armhf ;;
  *) echo "unknown triple $triple" >&2; exit 2 ;;
esac
bash scripts/install-deps.sh "g++-$triple" qemu-user-static googletest
# Highway for the target comes from Debian's multiarch packages; what counts
# is that the package got installed (install-deps.sh retries index updates).
if ! dpkg -s "libhwy-dev:$arch" >/dev/null 2>&1; then
  SUDO=""
  [ "$(id -u)" -eq 0 ] || SUDO="sudo"
  $SUDO dpkg --add-architecture "$arch"
  bash scripts/install-deps.sh "libhwy-dev:$arch" || true
  dpkg -s "libhwy-dev:$arch" >/dev/null 2>&1 || { echo "libhwy-dev:$arch is not installed" >&2; exit 1; }
fi
flags=()
dir="build-$triple"
if [ "$arch" = armhf ]; then
  if [ "$variant" = plain ]; then
    dir="build-$triple-plain"
  else
    flags=(-DCMAKE_C_FLAGS=-mfpu=neon-vfpv4 -DCMAKE_CXX_FLAGS=-mfpu=neon-vfpv4)
  fi
fi
cmake -S . -B "$dir" -G Ninja -DCMAKE_BUILD_TYPE=Release \
  -DCMAKE_TOOLCHAIN_FILE="$PWD/cmake/toolchains/$triple.cmake" \
  -DPXFX_BUILD_BENCH=OFF -DPXFX_WERROR=ON "${flags[@]}"
cmake --build "$dir" -j "$(nproc)"
# A test that hangs under emulation fails after 15 minutes instead of stalling the run.
ctest --test-dir "$dir" --output-on-failure --timeout 900 -j "$(nproc)"
