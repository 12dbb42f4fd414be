"""NumPy arrays to the library's Image records and back.

Arrays are H x W (8-bit, one byte per pixel), H x W x 3 or H x W x 4 uint8,
channels red, green, blue(, alpha) with order="rgb" or blue, green, red(,
alpha) with order="bgr". The library stores rows blue first, so an "rgb"
array is always copied into a record; a "bgr" (or gray) array whose rows are
C-contiguous, 4-byte aligned and a multiple of 4 bytes long is handed over
as it is.
"""

import ctypes

import numpy as np

from ._native import Image

BLOCK_LIMIT = 2**31 - 1  # the largest pixel block (pitch x height) the library takes
ORDERS = ("rgb", "bgr")
BITS_OF_CHANNELS = {1: 8, 3: 24, 4: 32}
CHANNELS_OF_BITS = {8: 1, 24: 3, 32: 4}


def check_order(order):
    if order not in ORDERS:
        raise ValueError(f"order must be 'rgb' or 'bgr', not {order!r}")


def as_picture(array):
    """The array as an H x W or H x W x 3/4 uint8 ndarray (a view), or ValueError."""
    a = np.asarray(array)
    if a.dtype != np.uint8:
        raise ValueError(f"pxfx takes uint8 arrays, not {a.dtype} (convert with .astype(np.uint8) if the values fit)")
    if a.ndim == 3 and a.shape[2] == 1:
        a = a[:, :, 0]
    if not (a.ndim == 2 or (a.ndim == 3 and a.shape[2] in (3, 4))):
        raise ValueError(f"pxfx takes H x W, H x W x 3 or H x W x 4 arrays, not shape {a.shape}")
    if a.shape[0] == 0 or a.shape[1] == 0:
        raise ValueError(f"pxfx takes pictures of at least 1 x 1 pixels, not shape {a.shape}")
    return a


def packed_pitch(width, channels):
    return (width * channels + 3) & ~3


def check_size(a):
    height, width = a.shape[:2]
    channels = 1 if a.ndim == 2 else a.shape[2]
    if packed_pitch(width, channels) * height > BLOCK_LIMIT:
        raise ValueError(
            f"picture of {width} x {height} pixels at {8 * channels} bits is above the library's "
            f"limit of 2^31 - 1 bytes"
        )


def channel_view(a, order):
    """The channels of `a` in the library's order (blue first), as a view."""
    if a.ndim == 2 or order == "bgr":
        return a
    return a[..., ::-1] if a.shape[2] == 3 else a[..., [2, 1, 0, 3]]


def zero_copy(a, order):
    """True when the array's own rows can be the record's rows."""
    channels = 1 if a.ndim == 2 else a.shape[2]
    row = a.shape[1] * channels
    return (
        (channels == 1 or order == "bgr")
        and a.flags.c_contiguous
        and row % 4 == 0
        and a.ctypes.data % 4 == 0
    )


class Record:
    """An Image record over an array: its own memory when possible, else a
    copy in a block made by malloc_Image (released by close())."""

    def __init__(self, core, array, order):
        a = as_picture(array)
        check_size(a)
        height, width = a.shape[:2]
        channels = 1 if a.ndim == 2 else a.shape[2]
        self._core = core
        self._owned = None
        self._array = a  # keeps the memory alive while the record is used
        if zero_copy(a, order):
            self.image = Image(
                width,
                height,
                BITS_OF_CHANNELS[channels],
                a.ctypes.data_as(ctypes.POINTER(ctypes.c_uint8)),
                width * channels,
                0,
            )
            return
        made = core.malloc_Image(width, height, BITS_OF_CHANNELS[channels])
        if not made:
            raise MemoryError(f"out of memory for a copy of {width} x {height} pixels")
        self._owned = made
        self.image = made.contents
        rows = pixel_rows(self.image)
        np.copyto(rows, channel_view(a, order).reshape(rows.shape))

    def close(self):
        if self._owned is not None:
            self._core.free_Image(ctypes.byref(self._owned), 0)
            self._owned = None

    def __enter__(self):
        return self

    def __exit__(self, *exc):
        self.close()


def pixel_rows(image):
    """The pixels of an Image record as an H x W x C (or H x W) view of its memory."""
    channels = CHANNELS_OF_BITS[image.bitCount]
    block = np.ctypeslib.as_array(image.bits, shape=(image.height * image.pitch,))
    rows = block.reshape(image.height, image.pitch)[:, : image.width * channels]
    return rows if channels == 1 else rows.reshape(image.height, image.width, channels)


def result_view(image, order):
    """The pixels of a result record in the caller's channel order (a view or a new array)."""
    if image.bitCount not in CHANNELS_OF_BITS:
        raise ValueError(f"the result has {image.bitCount} bits per pixel, which has no array form")
    return channel_view(pixel_rows(image), order)
