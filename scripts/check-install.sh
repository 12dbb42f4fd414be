#!/usr/bin/env bash
# Installs the library of BUILD_DIR (default build/) under a temporary prefix
# chosen only at install time, then builds and runs a small C program against
# it twice: through pkg-config and through CMake's find_package(pxfx).
set -euo pipefail
cd "$(dirname "$0")/.."
build=$(realpath "${1:-build}")
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
cmake --install "$build" --prefix "$work/prefix" >/dev/null
mkdir "$work/consumer"
cat >"$work/consumer/main.c" <<'C'
#include <pxfx/pxfx.h>
#include <stdio.h>

int main(void) {
    Image *img = malloc_Image(3, 2, 24);
    if (img == NULL || img->width != 3 || img->height != 2) return 1;
    free_Image(&img, 0);
    puts("pxfx consumer: ok");
    return 0;
}
C
cat >"$work/consumer/CMakeLists.txt" <<'CMAKE'
cmake_minimum_required(VERSION 3.16)
project(pxfx_consumer C)
find_package(pxfx REQUIRED)
add_executable(consumer main.c)
target_link_libraries(consumer PRIVATE pxfx::pxfx)
CMAKE
pc=$(dirname "$(find "$work/prefix" -name pxfx.pc)")
libdir=$(dirname "$pc")
echo "== pkg-config consumer"
flags=$(PKG_CONFIG_PATH="$pc" pkg-config --cflags --libs pxfx)
case "$flags" in
  "-I$work/prefix/"*) ;;
  *) echo "pxfx.pc points outside the prefix it was installed in: $flags" >&2; exit 1 ;;
esac
# shellcheck disable=SC2086
cc -o "$work/consumer/by-pkg-config" "$work/consumer/main.c" $flags
LD_LIBRARY_PATH="$libdir" "$work/consumer/by-pkg-config"
echo "== find_package consumer"
cmake -S "$work/consumer" -B "$work/consumer/build" -DCMAKE_PREFIX_PATH="$work/prefix" >/dev/null
cmake --build "$work/consumer/build" >/dev/null
"$work/consumer/build/consumer"
