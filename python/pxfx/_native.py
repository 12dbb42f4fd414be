"""Loading libpxfx.so and libpxfx_operations.so, and the Image record."""

import ctypes
import os
from pathlib import Path

# Where the package keeps the libraries it was built with.
BUNDLED = Path(__file__).resolve().parent / "_lib"
CORE_NAME = "libpxfx.so.0"
OPERATIONS_NAME = "libpxfx_operations.so"

PXOP_OK, PXOP_INVALID, PXOP_FAILED, PXOP_NO_MEMORY = 0, 1, 2, 3


class Image(ctypes.Structure):
    """The library's padded-row picture record (include/pxfx/core.h)."""

    _fields_ = [
        ("width", ctypes.c_int32),
        ("height", ctypes.c_int32),
        ("bitCount", ctypes.c_uint32),
        ("bits", ctypes.POINTER(ctypes.c_uint8)),
        ("pitch", ctypes.c_uint32),
        ("tag", ctypes.c_uint32),
    ]


ImagePtr = ctypes.POINTER(Image)


def library_paths():
    """The paths of libpxfx.so and libpxfx_operations.so to load.

    PXFX_LIBRARY names libpxfx.so; libpxfx_operations.so is then taken from
    the same directory (the build tree and installations keep them together).
    Otherwise the copies bundled when the package was built are used.
    """
    override = os.environ.get("PXFX_LIBRARY")
    if override:
        core = Path(override)
        return core, core.parent / OPERATIONS_NAME
    return BUNDLED / CORE_NAME, BUNDLED / OPERATIONS_NAME


def load():
    """(lib, core, operations): the public CDLL of libpxfx.so, a private one
    with the prototypes this package uses, and libpxfx_operations.so.

    libpxfx.so is loaded first, so that libpxfx_operations.so binds to that
    very copy (the same soname) and the two share one heap of pictures.
    """
    core_path, operations_path = library_paths()
    for path in (core_path, operations_path):
        if not path.is_file():
            raise ImportError(
                f"pxfx: {path} not found; install the package from the repository "
                "(scripts/install-python.sh) or set PXFX_LIBRARY to a built libpxfx.so"
            )
    lib = ctypes.CDLL(str(core_path))
    core = ctypes.CDLL(str(core_path))
    core.malloc_Image.argtypes = [ctypes.c_int32, ctypes.c_int32, ctypes.c_int32]
    core.malloc_Image.restype = ImagePtr
    core.free_Image.argtypes = [ctypes.POINTER(ImagePtr), ctypes.c_int32]
    core.free_Image.restype = None
    operations = ctypes.CDLL(str(operations_path))
    operations.pxop_describe.argtypes = []
    operations.pxop_describe.restype = ctypes.c_char_p
    operations.pxop_apply.argtypes = [
        ctypes.c_char_p,
        ImagePtr,
        ctypes.POINTER(ctypes.c_double),
        ctypes.c_int,
        ctypes.POINTER(ImagePtr),
        ctypes.c_char_p,
        ctypes.c_size_t,
    ]
    operations.pxop_apply.restype = ctypes.c_int
    return lib, core, operations
