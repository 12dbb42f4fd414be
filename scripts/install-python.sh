#!/usr/bin/env bash
# Installs the pxfx Python package into a virtual environment (default .venv)
# that uses Debian's python3, its numpy, and Pillow and Dask for batches:
# builds libpxfx.so and libpxfx_operations.so (in build/, or PXFX_BUILD_DIR)
# and bundles them.
set -euo pipefail
cd "$(dirname "$0")/.."
venv=${1:-.venv}
bash scripts/install-deps.sh --tool python3-numpy python3-setuptools python3-wheel python3-pip python3-venv \
  python3-pil python3-dask python3-distributed
/usr/bin/python3 -m venv --system-site-packages "$venv"
"$venv/bin/pip" install --quiet --no-build-isolation --no-index ./python
