#!/usr/bin/env bash
# Installs the Debian packages that building and testing pxfx needs, skipping
# those already present, and the packages named as arguments. With --tool
# first, only what the library and the pxfx tool need (no test framework, no
# benchmark libraries). Runs as root (or through sudo when available).
set -euo pipefail
# The picture libraries serve the pxfx tool; libopencv-dev and
# libopencv-contrib-dev serve only the comparison benchmarks.
packages=(cmake ninja-build g++ make pkg-config
          libpng-dev libjpeg-dev libwebp-dev libheif-dev libexif-dev liblcms2-dev libstb-dev)
if [ "${1:-}" = --tool ]; then
  shift
else
  packages+=(libgtest-dev libbenchmark-dev libopencv-dev libopencv-contrib-dev)
fi
missing=()
for p in "${packages[@]}" "$@"; do
  dpkg -s "$p" >/dev/null 2>&1 || missing+=("$p")
done
if [ ${#missing[@]} -gt 0 ]; then
  SUDO=""
  [ "$(id -u)" -eq 0 ] || SUDO="sudo"
  # A mirror in the middle of a sync fails some lists; the others still serve.
  $SUDO apt-get update -qq || echo "install-deps: apt-get update reported errors, installing with the lists it has" >&2
  DEBIAN_FRONTEND=noninteractive $SUDO apt-get install -y -qq --no-install-recommends "${missing[@]}"
fi
