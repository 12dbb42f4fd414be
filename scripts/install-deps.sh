#!/usr/bin/env bash
# Installs the Debian packages that building and testing pxfx needs, skipping
# those already present, and the packages named as arguments. With --tool
# first, only what the library and the pxfx tool need (no test framework, no
# benchmark libraries). Runs as root (or through sudo when available).
set -euo pipefail
# Highway (libhwy-dev) carries the vector kernels; the picture libraries serve
# the pxfx tool; libopencv-dev and libopencv-contrib-dev serve only the
# comparison benchmarks.
packages=(cmake ninja-build g++ make pkg-config libhwy-dev
          libpng-dev libjpeg-dev libwebp-dev libheif-dev libexif-dev liblcms2-dev libstb-dev)
if [ "${1:-}" = --tool ]; then
  shift
else
  packages+=(libgtest-dev libbenchmark-dev libopencv-dev libopencv-contrib-dev)
fi
missing=()
native=$(dpkg --print-architecture)
for p in "${packages[@]}" "$@"; do
  # A package installed for several architectures needs its own one named.
  dpkg -s "$p" >/dev/null 2>&1 || dpkg -s "$p:$native" >/dev/null 2>&1 || missing+=("$p")
done
if [ ${#missing[@]} -gt 0 ]; then
  SUDO=""
  [ "$(id -u)" -eq 0 ] || SUDO="sudo"
  # An index update can fail while a mirror syncs one architecture's lists:
  # retry it, then let the install (which fails on what it cannot find) judge.
  for attempt in 1 2 3; do
    $SUDO apt-get update -qq && break
    echo "apt-get update failed (attempt $attempt)" >&2
    sleep 15
  done
  DEBIAN_FRONTEND=noninteractive $SUDO apt-get install -y -qq --no-install-recommends "${missing[@]}"
fi
