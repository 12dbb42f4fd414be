#!/usr/bin/env bash
# Installs the Debian packages that building and testing pxfx needs, skipping
# those already present. Runs as root (or through sudo when available).
set -euo pipefail
# The picture libraries serve the pxfx tool; libopencv-dev and
# libopencv-contrib-dev serve only the comparison benchmarks.
packages=(cmake ninja-build g++ make pkg-config libgtest-dev libbenchmark-dev
          libpng-dev libjpeg-dev libwebp-dev libheif-dev libexif-dev liblcms2-dev libstb-dev
          libopencv-dev libopencv-contrib-dev)
missing=()
for p in "${packages[@]}" "$@"; do
  dpkg -s "$p" >/dev/null 2>&1 || missing+=("$p")
done
if [ ${#missing[@]} -gt 0 ]; then
  SUDO=""
  [ "$(id -u)" -eq 0 ] || SUDO="sudo"
  $SUDO apt-get update -qq
  DEBIAN_FRONTEND=noninteractive $SUDO apt-get install -y -qq --no-install-recommends "${missing[@]}"
fi
