#!/usr/bin/env bash
# Builds pxfx_bench (Release), runs it once with JSON output and writes
# docs/performance.md from the run. Extra arguments go to the benchmark binary
# (for example --benchmark_filter=Resize). The run is kept in
# build-bench/last-run.json for scripts/bench_compare.py; PXFX_BENCH_BASELINE=run.json
# adds each family's change since that earlier run to the report.
set -euo pipefail
cd "$(dirname "$0")/.."
build=${PXFX_BENCH_BUILD:-build-bench}
min_time=${PXFX_BENCH_MIN_TIME:-0.1}
cmake -S . -B "$build" -G Ninja -DCMAKE_BUILD_TYPE=Release >/dev/null
cmake --build "$build" -j2 --target pxfx_bench
"$build/bench/pxfx_bench" --benchmark_min_time="$min_time" \
  --benchmark_out="$build/last-run.json" --benchmark_out_format=json "$@"
mkdir -p docs
python3 scripts/perf_report.py "$build/last-run.json" -o docs/performance.md \
  ${PXFX_BENCH_BASELINE:+--baseline "$PXFX_BENCH_BASELINE"}
echo "wrote docs/performance.md from $build/last-run.json"
