#!/usr/bin/env bash
# Builds pxfx_bench (Release), runs it once per code path with JSON output and
# writes docs/performance.md from the runs: first PXFX_CPU=128 (16-byte
# vectors, what phones run; the targets are judged there), then the best path
# the processor has. Each benchmark runs PXFX_BENCH_REPETITIONS times (3) and
# the report takes the fastest. Extra arguments go to the benchmark binary
# (for example --benchmark_filter=Resize). The runs are kept in build-bench/run-128.json and
# build-bench/run-best.json for scripts/bench_compare.py;
# PXFX_BENCH_BASELINE=DIR (a directory holding such runs of an earlier
# version) adds the speed-up of the slowest operations and each family's change.
set -euo pipefail
cd "$(dirname "$0")/.."
build=${PXFX_BENCH_BUILD:-build-bench}
min_time=${PXFX_BENCH_MIN_TIME:-0.1}
repetitions=${PXFX_BENCH_REPETITIONS:-3}
cmake -S . -B "$build" -G Ninja -DCMAKE_BUILD_TYPE=Release >/dev/null
cmake --build "$build" -j2 --target pxfx_bench
report_args=()
for path in 128 best; do
  if [ "$path" = best ]; then cpu=(env -u PXFX_CPU); else cpu=(env PXFX_CPU="$path"); fi
  "${cpu[@]}" "$build/bench/pxfx_bench" --benchmark_min_time="$min_time" --benchmark_repetitions="$repetitions" \
    --benchmark_out="$build/run-$path.json" --benchmark_out_format=json "$@"
  report_args+=(--run "$path=$build/run-$path.json")
  if [ -n "${PXFX_BENCH_BASELINE:-}" ] && [ -f "$PXFX_BENCH_BASELINE/run-$path.json" ]; then
    report_args+=(--baseline "$path=$PXFX_BENCH_BASELINE/run-$path.json")
  fi
done
mkdir -p docs
/usr/bin/python3 scripts/perf_report.py "${report_args[@]}" -o docs/performance.md
echo "wrote docs/performance.md from $build/run-128.json and $build/run-best.json"
