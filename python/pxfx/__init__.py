"""pxfx: the image operations of the pxfx library on NumPy arrays.

Every operation of the pxfx command-line tool is here, with the tool's
parameters, checks and results, taken from the library's operation registry:

    import numpy as np, pxfx
    from PIL import Image
    photo = np.asarray(Image.open("photo.png").convert("RGB"))
    sketch = pxfx.sketch(photo)
    shifted = pxfx.apply("channel-shift", photo, red=40)
    print([op.name for op in pxfx.operations()])

Arrays are uint8: H x W (8-bit), H x W x 3 or H x W x 4. Channels are red,
green, blue(, alpha) by default; pass order="bgr" for blue first (OpenCV's
order, and the library's own: such arrays are used without a copy when their
rows are C-contiguous and a multiple of 4 bytes long). Results are new arrays
in the same order; the input is never written, except through out=ARRAY or
inplace=True, which store the result in the given array.

`pxfx.lib` is the ctypes CDLL of libpxfx.so, for calling the C functions
themselves.
"""

import ctypes
import inspect
import json
from dataclasses import dataclass
from numbers import Real

import numpy as np

from . import _arrays, _native

__all__ = ["Operation", "Param", "apply", "lib", "operations", "seed"]

lib, _core, _ops = _native.load()
_ERROR_SIZE = 512
_libc = ctypes.CDLL(None)
_libc.srand48.argtypes = [ctypes.c_long]
_libc.seed48.argtypes = [ctypes.POINTER(ctypes.c_ushort)]


def seed(value=None):
    """Seeds libc's lrand48 stream, which the library's random operations
    (such as watercolour) draw from, for the whole process: srand48(value),
    or without a value the state of a process that never seeded it, the
    state the pxfx tool runs each picture in (so the next random operation
    gives the tool's result)."""
    if value is None:
        _libc.seed48((ctypes.c_ushort * 3)(0, 0, 0))
    else:
        _libc.srand48(value)


@dataclass(frozen=True)
class Param:
    """A parameter: `name` in the registry (and the tool's --name), `keyword`
    in Python ('-' becomes '_'), its range, default and help."""

    name: str
    keyword: str
    integer: bool
    min: float
    max: float
    default: float
    help: str


@dataclass(frozen=True)
class Operation:
    """An image operation: `name` in the registry, `function` the C function
    behind it, `bits` the bit counts it takes (others are converted first, as
    the tool does: to 24 or 32 bits for colour operations, to luma for 8-bit
    ones), `same_size` False when the result has another size."""

    name: str
    python_name: str
    function: str
    group: str
    summary: str
    bits: tuple
    same_size: bool
    params: tuple


def _python_name(name):
    return name.replace("-", "_")


def _read_registry():
    rows = json.loads(_ops.pxop_describe().decode("utf-8"))
    return tuple(
        Operation(
            name=r["name"],
            python_name=_python_name(r["name"]),
            function=r["function"],
            group=r["group"],
            summary=r["summary"],
            bits=tuple(r["bits"]),
            same_size=r["same_size"],
            params=tuple(
                Param(
                    name=p["name"],
                    keyword=_python_name(p["name"]),
                    integer=p["integer"],
                    min=p["min"],
                    max=p["max"],
                    default=p["default"],
                    help=p["help"],
                )
                for p in r["params"]
            ),
        )
        for r in rows
    )


_OPERATIONS = _read_registry()
_BY_NAME = {op.name: op for op in _OPERATIONS}
_BY_NAME.update({op.python_name: op for op in _OPERATIONS})


def operations():
    """Every image operation, grouped as the tool lists them."""
    return list(_OPERATIONS)


def _values(op, params):
    values = []
    keywords = {p.keyword for p in op.params}
    unknown = sorted(set(params) - keywords)
    if unknown:
        takes = ", ".join(sorted(keywords)) or "none"
        raise TypeError(f"{op.name} has no parameter {', '.join(unknown)} (it takes: {takes})")
    for p in op.params:
        v = params.get(p.keyword, p.default)
        if not isinstance(v, Real):
            raise TypeError(f"{op.name}: {p.keyword} takes a number, not {type(v).__name__}")
        values.append(float(v))
    return (ctypes.c_double * max(len(values), 1))(*values)


def _target(array, out, inplace):
    if inplace:
        if out is not None:
            raise ValueError("pass either out= or inplace=True, not both")
        out = array
    if out is None:
        return None
    if not isinstance(out, np.ndarray):
        raise ValueError(f"results are stored only in NumPy arrays, not in a {type(out).__name__}")
    if out.dtype != np.uint8:
        raise ValueError(f"out= takes a uint8 array, not {out.dtype}")
    if not out.flags.writeable:
        raise ValueError("the array for the result is read-only")
    return out


def apply(name, array, *, order="rgb", out=None, inplace=False, **params):
    """Runs operation `name` (registry or Python name) on `array` with its
    parameters as keywords (defaults for those not given); returns the result
    as a new array, or stores it in `out` (or in `array` with inplace=True)
    and returns that array. Values the tool refuses raise ValueError with its
    message, so do pictures the operation cannot process; MemoryError when
    memory runs out."""
    op = _BY_NAME.get(name)
    if op is None:
        raise ValueError(f"unknown operation {name!r} (see pxfx.operations())")
    _arrays.check_order(order)
    values = _values(op, params)
    target = _target(array, out, inplace)
    error = ctypes.create_string_buffer(_ERROR_SIZE)
    result = _native.ImagePtr()
    with _arrays.Record(_core, array, order) as record:
        status = _ops.pxop_apply(
            op.name.encode(),
            ctypes.byref(record.image),
            values,
            len(op.params),
            ctypes.byref(result),
            error,
            _ERROR_SIZE,
        )
    if status != _native.PXOP_OK:
        message = error.value.decode("utf-8", "replace")
        raise MemoryError(message) if status == _native.PXOP_NO_MEMORY else ValueError(message)
    try:
        pixels = _arrays.result_view(result.contents, order)
        if target is None:
            return np.array(pixels)
        if target.shape != pixels.shape:
            raise ValueError(f"{op.name} gives a result of shape {pixels.shape}, the array for it has {target.shape}")
        np.copyto(target, pixels)
        return target
    finally:
        _core.free_Image(ctypes.byref(result), 0)


def _docstring(op):
    lines = [f"{op.summary}.", "", f"Runs {op.function} (group {op.group}); takes {', '.join(map(str, op.bits))} bits."]
    if not op.same_size:
        lines.append("The result has another size than the input.")
    if op.params:
        lines += ["", "Parameters:"]
        for p in op.params:
            fmt = "{:.0f}" if p.integer else "{:g}"
            lines.append(
                f"  {p.keyword}: {fmt.format(p.min)}..{fmt.format(p.max)}, default {fmt.format(p.default)}: {p.help}"
            )
    lines += ["", "order, out, inplace: as for pxfx.apply."]
    return "\n".join(lines)


def _make_function(op):
    def run(array, *, order="rgb", out=None, inplace=False, **params):
        return apply(op.name, array, order=order, out=out, inplace=inplace, **params)

    kw = inspect.Parameter.KEYWORD_ONLY
    run.__signature__ = inspect.Signature(
        [inspect.Parameter("array", inspect.Parameter.POSITIONAL_OR_KEYWORD)]
        + [inspect.Parameter(p.keyword, kw, default=int(p.default) if p.integer else p.default) for p in op.params]
        + [
            inspect.Parameter("order", kw, default="rgb"),
            inspect.Parameter("out", kw, default=None),
            inspect.Parameter("inplace", kw, default=False),
        ]
    )
    run.__name__ = run.__qualname__ = op.python_name
    run.__module__ = __name__
    run.__doc__ = _docstring(op)
    return run


for _op in _OPERATIONS:
    if _op.python_name in globals():
        raise ImportError(f"pxfx: operation {_op.name} would hide pxfx.{_op.python_name}")
    globals()[_op.python_name] = _make_function(_op)
    __all__.append(_op.python_name)
del _op
