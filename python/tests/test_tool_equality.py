# Every operation through Python gives the pxfx tool's pixels, byte for byte,
# with its default parameters and with others, in both channel orders; the
# library's own rows (zero-copy) and copied rows give the same result, and
# the input is only read.
import math
import subprocess

import numpy as np
import pytest
from PIL import Image

import pxfx
from conftest import BUILD, PORTRAIT, read_only

CLI = BUILD / "tools" / "pxfx"


def other_values(op):
    """A value other than the default for each parameter, inside its range."""
    values = {}
    for p in op.params:
        for t in (0.5, 0.25, 0.75):
            v = p.min + (p.max - p.min) * t
            v = math.floor(v) if p.integer else v
            if v != p.default:
                break
        values[p.keyword] = v
    return values


def tool(op, values, src, out):
    """The tool's result for `values` (keywords), or None when it fails."""
    args = []
    for p in op.params:
        if p.keyword in values:
            v = values[p.keyword]
            args += [f"--{p.name}", str(int(v)) if p.integer else repr(float(v))]
    run = subprocess.run([str(CLI), "apply", op.name, *args, str(src), str(out)], capture_output=True, text=True)
    assert run.returncode in (0, 1), run.stderr
    return np.asarray(Image.open(out)) if run.returncode == 0 else None


def python(op, array, values, order="rgb"):
    pxfx.seed()  # random operations draw what the tool's fresh process draws
    try:
        return pxfx.apply(op.name, array, order=order, **values)
    except ValueError:
        return None


def assert_same(got, want, what):
    if want is None:
        assert got is None, f"{what}: the tool fails, Python gives a result"
        return
    assert got is not None, f"{what}: Python fails, the tool gives a result"
    assert got.shape == want.shape and got.dtype == np.uint8, what
    assert np.array_equal(got, want), f"{what}: {np.count_nonzero(got != want)} bytes differ"


@pytest.mark.parametrize("op", pxfx.operations(), ids=lambda op: op.name)
def test_operation_equals_tool(op, portrait, tmp_path):
    bgr = read_only(portrait[..., ::-1], tmp_path)
    for label, values in (("defaults", {}), ("other values", other_values(op))):
        if label == "other values" and not values:
            continue
        want = tool(op, values, PORTRAIT, tmp_path / f"{op.name}.png")
        assert_same(python(op, portrait, values), want, f"{label}, rgb")
        got = python(op, bgr, values, order="bgr")
        if got is not None and got.ndim == 3:
            got = got[..., [2, 1, 0, 3]] if got.shape[2] == 4 else got[..., ::-1]
        assert_same(got, want, f"{label}, bgr in place")
    if 8 in op.bits:
        # An 8-bit plane: its own rows (read-only memory) and a copy of them agree.
        gray = np.ascontiguousarray(portrait[..., 1])
        assert_same(python(op, read_only(gray, tmp_path), {}), python(op, np.asfortranarray(gray), {}), "gray rows")
