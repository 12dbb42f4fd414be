#!/usr/bin/env bash
# Builds the libFuzzer targets with clang and runs each for a bounded time.
#   scripts/run-fuzzers.sh [SECONDS_PER_TARGET] [TARGET...]   (default 60 s each)
#   scripts/run-fuzzers.sh --total SECONDS [TARGET...]        (SECONDS split over the targets)
# TARGET names a target without its prefix (core, color, effects, deform,
# toolkit, retouch, lines, operations, picture); all of them by default.
# Every target runs even when an earlier one fails; the script exits 1 when
# any target reported a crash, sanitizer error, leak or timeout. Reproducers
# are written to fuzz/findings/; the corpus grows in build-fuzz/corpus/, seeded
# from fuzz/corpus/<target>/. Inputs may take any length up to 32 KiB from the
# start (no length control), so pictures filled from the input's own bytes
# reach their full size; each target prints the largest picture it built.
set -euo pipefail
cd "$(dirname "$0")/.."

total=""
per_target=60
if [ "${1:-}" = "--total" ]; then
  total=${2:?--total needs a number of seconds}
  shift 2
elif [ -n "${1:-}" ] && [ -z "${1//[0-9]/}" ]; then
  per_target=$1
  shift
fi
targets=("$@")
[ ${#targets[@]} -gt 0 ] || targets=(core color effects deform toolkit retouch lines operations picture)
if [ -n "$total" ]; then
  per_target=$((total / ${#targets[@]}))
  [ "$per_target" -ge 1 ] || per_target=1
fi

bash scripts/install-deps.sh clang-14 libclang-rt-14-dev
cmake -S . -B build-fuzz -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo \
  -DCMAKE_C_COMPILER=clang-14 -DCMAKE_CXX_COMPILER=clang++-14 \
  -DPXFX_BUILD_FUZZERS=ON -DPXFX_BUILD_TESTS=OFF -DPXFX_BUILD_BENCH=OFF -DPXFX_WERROR=ON -DPXFX_SKIP_TARGETS="${PXFX_SKIP_TARGETS:-}"
cmake --build build-fuzz -j "$(nproc)" --target "${targets[@]/#/pxfx_fuzz_}"

mkdir -p fuzz/findings
failed=()
for name in "${targets[@]}"; do
  corpus="build-fuzz/corpus/$name"
  mkdir -p "$corpus"
  seeds=()
  [ -d "fuzz/corpus/$name" ] && seeds=("fuzz/corpus/$name")
  echo "== $name for $per_target s"
  log="build-fuzz/fuzz-$name.log"
  status=0
  ASAN_OPTIONS=detect_leaks=1 "build-fuzz/fuzz/pxfx_fuzz_$name" -max_total_time="$per_target" \
    -max_len=32768 -len_control=0 -timeout=20 -rss_limit_mb=2048 -artifact_prefix="fuzz/findings/$name-" \
    -print_final_stats=1 "$corpus" "${seeds[@]}" >"$log" 2>&1 || status=$?
  grep -E '^#[0-9]+[[:space:]]+DONE' "$log" | tail -n 1 || true
  grep -E '^largest picture:' "$log" | tail -n 1 || true
  if [ "$status" -ne 0 ]; then
    echo "!! $name failed (exit $status); log $log:"
    grep -E 'ERROR|SUMMARY|runtime error|Test unit written' "$log" | head -n 20 || tail -n 20 "$log"
    failed+=("$name")
  fi
done

if [ ${#failed[@]} -gt 0 ]; then
  echo "Fuzzing found problems in: ${failed[*]} (reproducers in fuzz/findings/)"
  exit 1
fi
echo "Fuzzing found nothing in ${#targets[@]} targets."
