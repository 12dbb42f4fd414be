#!/usr/bin/env bash
# Builds pxfx and its command-line tool (without the tests and benchmarks, and
# without installing what only they need), then writes the effects gallery of the
# bundled portrait to out/gallery/index.html (open it in a browser).
set -euo pipefail
cd "$(dirname "$0")/.."
bash scripts/install-deps.sh --tool
cmake -S . -B build -G Ninja -DCMAKE_BUILD_TYPE=Release -DPXFX_BUILD_TESTS=OFF -DPXFX_BUILD_BENCH=OFF
cmake --build build -j "$(nproc)" --target pxfx_cli
./build/tools/pxfx gallery samples/astronaut.png -o out/gallery
