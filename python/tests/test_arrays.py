# Arrays of every kind: those the package converts give the result of their
# contiguous copy, the others are refused with a ValueError naming the
# problem; results go where they are asked to and nowhere else.
import subprocess

import numpy as np
import pytest
from numpy.lib.stride_tricks import as_strided

import pxfx
from conftest import BUILD

# An operation for each input format: colour (any bit count), gray only, and
# one with parameters.
COLOUR, GRAY = "negative", "hue-plane"


def small(shape, seed=1):
    return np.random.default_rng(seed).integers(0, 256, size=shape, dtype=np.uint8)


@pytest.mark.parametrize(
    "make",
    [
        lambda: small((40, 61, 3))[::2, ::3],  # non-contiguous
        lambda: small((20, 21, 3))[::-1, ::-1],  # negative strides
        lambda: np.asfortranarray(small((17, 9, 4))),
        lambda: small((13, 5, 3)),  # rows of 15 bytes: padded copy
        lambda: small((13, 7)),  # 8-bit rows of 7 bytes
        lambda: small((13, 7, 1)),  # one channel
        lambda: small((64, 64, 4))[:, 16:48],  # rows 128 bytes apart in a wider array
        lambda: as_strided(small((1, 1, 3)), shape=(6, 8, 3), strides=(0, 0, 1)),  # every pixel one memory cell
        lambda: small((1, 1, 3)),
    ],
)
@pytest.mark.parametrize("order", ["rgb", "bgr"])
def test_converted_like_their_copy(make, order):
    a = make()
    before = a.copy()
    for name in (COLOUR, GRAY):
        assert np.array_equal(pxfx.apply(name, a, order=order), pxfx.apply(name, np.ascontiguousarray(a), order=order))
    assert np.array_equal(a, before)


@pytest.mark.parametrize(
    "array, message",
    [
        (small((8, 8, 3)).astype(np.float64), "uint8"),
        (small((8, 8)).astype(np.int16), "uint8"),
        (small((8, 8)) > 3, "uint8"),
        (np.array([["a", "b"]]), "uint8"),
        (np.empty((2, 2), dtype=object), "uint8"),
        ([[1, 2], [3, 4]], "uint8"),
        (small((8,)), "shape"),
        (small((2, 8, 8, 3)), "shape"),
        (small((8, 8, 2)), "shape"),
        (small((8, 8, 5)), "shape"),
        (small((0, 8, 3)), "1 x 1"),
        (small((8, 0)), "1 x 1"),
        (as_strided(np.zeros(1, np.uint8), shape=(50000, 50000), strides=(0, 0)), "2^31 - 1"),
        (as_strided(np.zeros(1, np.uint8), shape=(2**31, 1, 4), strides=(0, 0, 0)), "2^31 - 1"),
    ],
)
def test_refused_with_a_reason(array, message):
    with pytest.raises(ValueError, match=message.replace("^", r"\^")):
        pxfx.apply(COLOUR, array)


def test_results_go_where_asked():
    a = small((9, 10, 3))
    before = a.copy()
    want = pxfx.negative(a)
    out = np.zeros_like(a)
    assert pxfx.negative(a, out=out) is out and np.array_equal(out, want)
    assert np.array_equal(a, before)
    view = np.zeros((9, 20, 3), np.uint8)[:, ::2]
    pxfx.negative(a, out=view)
    assert np.array_equal(view, want)
    assert pxfx.negative(a, inplace=True) is a and np.array_equal(a, want)
    # A result of another shape, or an array that cannot take it, leaves everything as it was.
    for call in (
        lambda: pxfx.hue_plane(a, inplace=True),
        lambda: pxfx.negative(a, out=np.zeros((9, 10, 4), np.uint8)),
        lambda: pxfx.negative(a, out=np.zeros((9, 10, 3), np.int32)),
        lambda: pxfx.negative(a, out=np.zeros((9, 10, 3), np.uint8), inplace=True),
        lambda: pxfx.negative(np.frombuffer(a.tobytes(), np.uint8).reshape(a.shape), inplace=True),
    ):
        with pytest.raises(ValueError):
            call()
        assert np.array_equal(a, want)


def test_parameters_checked_as_the_tool_checks_them():
    a = small((16, 16, 3))
    assert np.array_equal(pxfx.channel_shift(a, red=40), pxfx.apply("channel-shift", a, red=40.0))
    for values, message in (
        ({"red": 400}, "channel-shift: red: 400 is outside -127..127"),
        ({"red": 1.5}, "red: not a whole number: 1.5"),
        ({"red": float("nan")}, "red: not a number"),
    ):
        with pytest.raises(ValueError, match=message):
            pxfx.channel_shift(a, **values)
    with pytest.raises(TypeError, match="no parameter"):
        pxfx.channel_shift(a, rouge=4)
    with pytest.raises(TypeError, match="takes a number"):
        pxfx.channel_shift(a, red="4")
    with pytest.raises(ValueError, match="unknown operation"):
        pxfx.apply("no-such-operation", a)
    with pytest.raises(ValueError, match="order"):
        pxfx.negative(a, order="rbg")


def test_operations_library_exports_only_its_interface():
    names = subprocess.run(
        ["nm", "-D", "--defined-only", "--format=just-symbols", str(BUILD / "libpxfx_operations.so")],
        capture_output=True,
        text=True,
        check=True,
    ).stdout.split()
    assert sorted(names) == ["pxop_apply", "pxop_describe"]
    assert pxfx.lib.malloc_Image and pxfx.lib.PX_IMG_Neon
