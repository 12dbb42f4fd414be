#!/usr/bin/env bash
# Builds the library and its tests with gcov instrumentation, runs every test
# and measures which library lines and branches they execute: the plain loops
# and the vector copies of the targets the tests run on an AVX2 machine (its
# 128 and best paths); the tool, tests, benchmarks and fuzz targets are not
# counted. Fails below 97 % of lines or 90 % of branches; the HTML report is
# build-coverage/html/index.html.
set -euo pipefail
cd "$(dirname "$0")/.."
bash scripts/install-deps.sh gcovr
# The tests run the 128 path (SSE4) and the best one: only those copies are
# built, with SSE4 as the baseline so that no emulated copy is compiled.
flags=""
[ "$(uname -m)" = x86_64 ] && flags="-msse4.2 -mpclmul -maes"
if grep -qw avx512vbmi /proc/cpuinfo; then
  skip="HWY_SSSE3|HWY_AVX2|HWY_AVX3"
elif grep -qw avx512f /proc/cpuinfo; then
  skip="HWY_SSSE3|HWY_AVX2|HWY_AVX3_DL"
else
  skip="HWY_SSSE3|HWY_AVX3|HWY_AVX3_DL"
fi
cmake -S . -B build-coverage -G Ninja -DCMAKE_BUILD_TYPE=Debug \
  -DCMAKE_C_COMPILER=gcc -DCMAKE_CXX_COMPILER=g++ -DCMAKE_C_FLAGS="$flags" -DCMAKE_CXX_FLAGS="$flags" \
  -DPXFX_COVERAGE=ON -DPXFX_SKIP_TARGETS="$skip" -DPXFX_BUILD_BENCH=OFF -DPXFX_ALLOCATION_HOOK=ON -DPXFX_WERROR=ON
cmake --build build-coverage -j "$(nproc)"
find build-coverage -name '*.gcda' -delete
ctest --test-dir build-coverage --output-on-failure -j "$(nproc)"
mkdir -p build-coverage/html
filters=()
for dir in core color effects deform toolkit retouch lines; do
  filters+=(--filter "$dir/")
done
gcovr --root . --object-directory build-coverage "${filters[@]}" \
  --exclude-unreachable-branches \
  --html-details build-coverage/html/index.html --txt build-coverage/summary.txt --print-summary \
  --fail-under-line 97 --fail-under-branch 90
