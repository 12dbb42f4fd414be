#!/usr/bin/env bash
# Builds pxfx and applies the pencil-sketch effect to the bundled portrait.
set -euo pipefail
cd "$(dirname "$0")/.."
bash scripts/install-deps.sh
cmake -S . -B build -G Ninja -DCMAKE_BUILD_TYPE=Release
cmake --build build -j "$(nproc)" --target pxfx-sketch
mkdir -p out
./build/tools/pxfx-sketch samples/astronaut.png out/astronaut-sketch.png
