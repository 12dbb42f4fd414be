#!/usr/bin/env bash
# Builds the libFuzzer targets with clang and runs each for a bounded time.
#   scripts/run-fuzzers.sh [SECONDS_PER_TARGET]   (default 60; use e.g. 3600 for a long run)
# Findings are written to fuzz/findings/; the corpus grows in build-fuzz/corpus/.
set -euo pipefail
cd "$(dirname "$0")/.."
seconds=${1:-60}
bash scripts/install-deps.sh clang-14 libclang-rt-14-dev
cmake -S . -B build-fuzz -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo \
  -DCMAKE_C_COMPILER=clang-14 -DCMAKE_CXX_COMPILER=clang++-14 \
  -DPXFX_BUILD_FUZZERS=ON -DPXFX_BUILD_TESTS=OFF -DPXFX_BUILD_BENCH=OFF
cmake --build build-fuzz -j "$(nproc)" --target pxfx_fuzz_operations
mkdir -p fuzz/findings
for target in build-fuzz/fuzz/pxfx_fuzz_*; do
  name=$(basename "$target")
  corpus="build-fuzz/corpus/$name"
  mkdir -p "$corpus"
  seeds="fuzz/corpus/${name#pxfx_fuzz_}"
  [ -d "$seeds" ] || seeds=""
  echo "== $name for $seconds s"
  ASAN_OPTIONS=detect_leaks=1 "$target" -max_total_time="$seconds" -max_len=16384 -timeout=20 \
    -artifact_prefix=fuzz/findings/ -print_final_stats=1 "$corpus" $seeds
done
