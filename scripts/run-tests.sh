#!/usr/bin/env bash
# Builds pxfx (Release) and runs every test, the Python package's included,
# and checks that an install under another prefix serves pkg-config and CMake.
set -euo pipefail
cd "$(dirname "$0")/.."
bash scripts/install-deps.sh chromium
cmake -S . -B build -G Ninja -DCMAKE_BUILD_TYPE=Release -DPXFX_BUILD_TESTS=ON -DPXFX_BUILD_BENCH=ON -DPXFX_WERROR=ON
cmake --build build -j "$(nproc)"
ctest --test-dir build --output-on-failure -j "$(nproc)"
bash scripts/check-install.sh
bash scripts/run-python-tests.sh
