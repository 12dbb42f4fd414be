"""Measures the Python package: the overhead of pxfx.apply over a direct
ctypes call of the same C function (64 x 64 pictures, a cheap operation,
medians of many calls), and the throughput of `python -m pxfx batch` on a
local cluster of 2 workers against `pxfx apply ... -j 2` over the same files.

Usage (from the repository root, after scripts/run-python-tests.sh):
    build/python-venv/bin/python scripts/python_perf.py [FILES] [OPERATION]
"""

import ctypes
import shutil
import statistics
import subprocess
import sys
import tempfile
import time
from pathlib import Path

import numpy as np

import pxfx
from pxfx import _native

ROOT = Path(__file__).resolve().parent.parent
TOOL = ROOT / "build" / "tools" / "pxfx"


def median_ns(call, repeat=5000):
    times = []
    for _ in range(repeat):
        t = time.perf_counter_ns()
        call()
        times.append(time.perf_counter_ns() - t)
    return statistics.median(times)


def overhead():
    pixels = np.random.default_rng(1).integers(0, 256, (64, 64, 3), dtype=np.uint8)
    record = pxfx._core.malloc_Image(64, 64, 24)
    negative = pxfx.lib.PX_IMG_Negative
    negative.argtypes = [_native.ImagePtr, ctypes.POINTER(_native.ImagePtr)]
    negative.restype = ctypes.c_uint32
    free = pxfx._core.free_Image

    def direct():
        out = _native.ImagePtr()
        negative(record, ctypes.byref(out))
        free(ctypes.byref(out), 0)

    through_python = median_ns(lambda: pxfx.negative(pixels, order="bgr"))
    c_call = median_ns(direct)
    return through_python, c_call


def throughput(count, op):
    work = Path(tempfile.mkdtemp())
    try:
        samples = [ROOT / "samples" / "astronaut.png", ROOT / "samples" / "coffee.png"]
        inputs = []
        for i in range(count):
            inputs.append(work / f"in-{i}.png")
            shutil.copyfile(samples[i % 2], inputs[-1])
        t = time.perf_counter()
        subprocess.run([str(TOOL), "apply", op, *map(str, inputs), "-o", str(work / "tool"), "-j", "2"],
                       check=True, capture_output=True)
        tool = time.perf_counter() - t
        t = time.perf_counter()
        subprocess.run([sys.executable, "-m", "pxfx", "batch", op, *map(str, inputs), "-o", str(work / "dask")],
                       check=True, capture_output=True)
        dask = time.perf_counter() - t
        return tool, dask
    finally:
        shutil.rmtree(work)


def main():
    count = int(sys.argv[1]) if len(sys.argv) > 1 else 40
    op = sys.argv[2] if len(sys.argv) > 2 else "sketch"
    py, c = overhead()
    tool, dask = throughput(count, op)
    print(f"pxfx.negative on 64 x 64 x 3: {py / 1000:.1f} us median, the C call through ctypes "
          f"{c / 1000:.1f} us: {(py - c) / 1000:.1f} us of Python per call")
    print(f"{op} over {count} files: pxfx apply -j 2 {tool:.2f} s ({count / tool:.1f} files/s), "
          f"python -m pxfx batch (2 workers, cluster start included) {dask:.2f} s ({count / dask:.1f} files/s)")


if __name__ == "__main__":
    main()
