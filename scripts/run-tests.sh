#!/usr/bin/env bash
# Builds pxfx (Release) and runs every test, the Python package's included.
set -euo pipefail
cd "$(dirname "$0")/.."
bash scripts/install-deps.sh chromium
cmake -S . -B build -G Ninja -DCMAKE_BUILD_TYPE=Release
cmake --build build -j "$(nproc)"
ctest --test-dir build --output-on-failure -j "$(nproc)"
bash scripts/run-python-tests.sh
