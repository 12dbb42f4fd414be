"""One operation over many picture files, as Dask tasks.

Each picture is one task: read (PNG, JPEG or BMP, turned upright as its EXIF
orientation says), run through pxfx.apply, written as DIR/STEM-OPERATION.EXT,
the name the pxfx tool gives it. A task writes under a temporary name in DIR
and renames the file when it is complete, so a worker that dies leaves no
file under the final name; a later run skips the outputs that exist. A
picture that fails is reported and the others go on.

Random operations draw from libc's lrand48 stream, which is one per process.
Each task reseeds it (pxfx.seed()) right before its picture, under a lock
held by every task of the worker process, so each picture gets the stream
the tool runs it with and a batch equals the serial run whatever the
workers, threads and order of the tasks.
"""

import os
import sys
import threading
from pathlib import Path

import numpy as np

from . import apply, seed

__all__ = ["output_name", "process", "run"]

EXTENSIONS = ("png", "jpg", "bmp")
_OPTIONS = {"JPEG": {"quality": 92}, "PNG": {"compress_level": 1}}  # the tool's defaults: fast PNG
_stream = threading.Lock()


def output_name(src, out_dir, op, ext="png"):
    """Where the result of `op` on `src` goes: OUT_DIR/STEM-OP.EXT."""
    return Path(out_dir) / f"{Path(src).stem}-{op}.{ext}"


def _read(path):
    from PIL import Image, ImageOps

    with Image.open(path) as im:
        im = ImageOps.exif_transpose(im)
        alpha = im.mode in ("RGBA", "LA", "PA") or "transparency" in im.info
        return np.asarray(im.convert("RGBA" if alpha else "RGB"))


def _write(pixels, path, fmt):
    from PIL import Image

    im = Image.fromarray(pixels)
    if fmt == "JPEG" and im.mode == "RGBA":
        under = Image.new("RGB", im.size, (255, 255, 255))
        under.paste(im, mask=im.getchannel("A"))
        im = under
    im.save(path, format=fmt, **_OPTIONS.get(fmt, {}))


def process(op, src, dst, params):
    """Runs `op` with `params` on picture file `src` and writes `dst`, which
    appears only once complete. Returns None, or the error message."""
    dst = Path(dst)
    temp = dst.with_name(f".pxfx-{os.getpid()}-{threading.get_ident()}-{dst.name}")
    fmt = {"png": "PNG", "jpg": "JPEG", "bmp": "BMP"}[dst.suffix[1:]]
    try:
        pixels = _read(src)
        with _stream:
            seed()
            result = apply(op, pixels, **params)
        _write(result, temp, fmt)
        os.replace(temp, dst)
    except Exception as e:  # any failure of this picture is its report, the batch goes on
        temp.unlink(missing_ok=True)
        return f"{src}: {e}"
    return None


def _bar(done, total, stream):
    width = 30
    filled = done * width // total
    stream.write(f"\r[{'#' * filled}{' ' * (width - filled)}] {done}/{total}")
    stream.flush()


def run(op, inputs, out_dir, params=None, *, ext="png", scheduler=None, workers=2, stream=None):
    """Runs `op` over the picture files `inputs` into `out_dir`: on the Dask
    cluster whose scheduler is at address `scheduler`, or on a local cluster
    of `workers` processes. Prints a progress bar (when `stream` is a
    terminal) and each failure to `stream` (default sys.stderr); returns the
    failures as (input, message) pairs, none when every picture was written
    or was already there. ValueError when two inputs would give one output
    name; OSError when the scheduler cannot be reached."""
    from distributed import Client, LocalCluster, as_completed

    params = dict(params or {})
    stream = sys.stderr if stream is None else stream
    if ext not in EXTENSIONS:
        raise ValueError(f"ext takes {', '.join(EXTENSIONS)}, not {ext!r}")
    out_dir = Path(out_dir)
    out_dir.mkdir(parents=True, exist_ok=True)
    todo = [(str(src), output_name(src, out_dir, op, ext)) for src in inputs]
    sources = {}
    for src, dst in todo:
        if sources.setdefault(dst, src) != src:
            raise ValueError(f"{sources[dst]} and {src} would both be written as {dst}")
    todo = [(src, dst) for dst, src in sources.items() if not dst.exists()]
    failures = []
    if not todo:
        return failures
    cluster = None
    if scheduler is None:
        cluster = LocalCluster(
            n_workers=workers, threads_per_worker=1, processes=True, host="127.0.0.1", dashboard_address=":0"
        )
        scheduler = cluster.scheduler_address
    bar = stream.isatty()
    try:
        with Client(scheduler) as client:
            futures = {
                client.submit(process, op, src, str(dst), params, pure=False): src
                for src, dst in todo
            }
            for done, future in enumerate(as_completed(futures), 1):
                src = futures[future]
                try:
                    error = future.result()
                except Exception as e:  # its worker lost on every try
                    error = f"{src}: {type(e).__name__}: {e}"
                if error is not None:
                    failures.append((src, error))
                    stream.write(("\r\033[K" if bar else "") + error + "\n")
                if bar:
                    _bar(done, len(futures), stream)
    finally:
        if cluster is not None:
            cluster.close()
    written = len(todo) - len(failures)
    stream.write(("\n" if bar else "") + f"{len(todo)} files, {written} written, {len(failures)} failed\n")
    return failures
