import itertools
import mmap
import os
from pathlib import Path

import numpy as np
import pytest
from PIL import Image

ROOT = Path(__file__).resolve().parents[2]
BUILD = Path(os.environ.get("PXFX_BUILD_DIR", ROOT / "build"))
PORTRAIT = ROOT / "tests" / "data" / "portrait-128.bmp"
_files = itertools.count()


@pytest.fixture(scope="session")
def portrait():
    """The sample portrait, 128 x 128 RGB, as the tool reads it."""
    return np.array(Image.open(PORTRAIT).convert("RGB"))


def read_only(array, directory):
    """A copy of `array` in memory mapped read-only: writing it kills the process."""
    path = directory / f"pixels-{next(_files)}.raw"
    path.write_bytes(np.ascontiguousarray(array).tobytes())
    with open(path, "rb") as f:
        mapped = mmap.mmap(f.fileno(), 0, access=mmap.ACCESS_READ)
    return np.frombuffer(mapped, dtype=np.uint8).reshape(array.shape)
