#!/usr/bin/env bash
# Installs the Python package into build/python-venv and runs its tests
# (python/tests), which compare it with the pxfx tool of build/ (built here
# when missing).
set -euo pipefail
cd "$(dirname "$0")/.."
bash scripts/install-deps.sh python3-pytest
bash scripts/install-python.sh build/python-venv
cmake --build build --target pxfx_cli
cd build
python-venv/bin/python -m pytest -q -p no:cacheprovider ../python/tests
