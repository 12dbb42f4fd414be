# Batches on a two-worker Dask cluster: the outputs equal the serial run and
# the pxfx tool's, a corrupt input is reported while the others are written,
# and a worker that dies while writing leaves no partial file under a final
# name; a re-run writes only what is missing.
import os
import subprocess

import numpy as np
import pytest
from PIL import Image

import pxfx
from conftest import BUILD, PORTRAIT
from pxfx.__main__ import main
from pxfx.batch import output_name

distributed = pytest.importorskip("distributed")

OP = "watercolour"  # draws from lrand48: equal only when every picture is seeded alike
RANGE = 9  # its --range, other than the default


@pytest.fixture(scope="module")
def scheduler():
    with distributed.LocalCluster(
        n_workers=2, threads_per_worker=1, processes=True, dashboard_address=":0", host="127.0.0.1"
    ) as cluster:
        yield cluster.scheduler_address


@pytest.fixture
def pictures(tmp_path):
    """Three readable pictures (BMP, PNG with alpha, gray PNG) and a corrupt one."""
    rgb = np.asarray(Image.open(PORTRAIT).convert("RGB"))
    Image.open(PORTRAIT).save(tmp_path / "portrait.bmp")
    alpha = np.dstack([rgb[:96, :80], np.arange(96 * 80, dtype=np.uint8).reshape(96, 80, 1)])
    Image.fromarray(alpha).save(tmp_path / "alpha.png")
    Image.fromarray(rgb[..., 1]).save(tmp_path / "gray.png")
    (tmp_path / "corrupt.png").write_bytes(b"\x89PNG\r\n\x1a\n" + bytes(40))
    return [tmp_path / n for n in ("portrait.bmp", "alpha.png", "gray.png")], tmp_path / "corrupt.png"


def serial(src, **params):
    im = Image.open(src)
    pixels = np.asarray(im.convert("RGBA" if im.mode in ("RGBA", "LA") else "RGB"))
    pxfx.seed()
    return pxfx.apply(OP, pixels, **params)


def tool(src, out):
    cli = [str(BUILD / "tools" / "pxfx"), "apply", OP, "--range", str(RANGE), str(src), str(out)]
    subprocess.run(cli, check=True, capture_output=True)
    return np.asarray(Image.open(out))


def test_batch_equals_serial_and_tool_and_reports_a_corrupt_input(scheduler, pictures, tmp_path, capsys):
    good, corrupt = pictures
    out = tmp_path / "out"
    args = [*map(str, good), "-o", str(out), "--range", str(RANGE), "--scheduler", scheduler]
    status = main(["batch", OP, *args[:2], str(corrupt), *args[2:]])
    assert status == 1
    assert f"{corrupt}:" in capsys.readouterr().err
    assert sorted(os.listdir(out)) == sorted(output_name(src, out, OP).name for src in good)
    for src in good:
        written = np.asarray(Image.open(output_name(src, out, OP)))
        assert np.array_equal(written, serial(src, range=RANGE)), src.name
        assert np.array_equal(written, tool(src, tmp_path / f"tool-{src.stem}.png")), src.name
    assert main(["batch", OP, *args]) == 0  # the failed one left out, the others are there


def die_while_saving(marker):
    """Makes the first PIL save on any worker write half its bytes, then end
    the worker process; later saves work."""
    real = Image.Image.save

    def save(self, fp, *args, **kwargs):
        real(self, fp, *args, **kwargs)
        try:
            os.close(os.open(marker, os.O_CREAT | os.O_EXCL))
        except FileExistsError:
            return
        os.truncate(fp, os.path.getsize(fp) // 2)
        os._exit(1)

    Image.Image.save = save


def test_a_worker_dying_mid_write_leaves_no_partial_output(scheduler, pictures, tmp_path):
    good, _ = pictures
    out = tmp_path / "out"
    marker = tmp_path / "died"
    with distributed.Client(scheduler) as client:
        client.run(die_while_saving, str(marker))
    try:
        failures = pxfx.batch.run(OP, good, out, scheduler=scheduler)
    finally:
        with distributed.Client(scheduler) as client:
            client.restart()
    assert marker.exists() and failures == []
    names = {output_name(src, out, OP).name: src for src in good}
    partial = [n for n in os.listdir(out) if n not in names]
    assert len(partial) == 1 and partial[0].startswith(".pxfx-"), os.listdir(out)
    for name, src in names.items():
        assert np.array_equal(np.asarray(Image.open(out / name)), serial(src)), name
    # A re-run, on a local cluster of its own, writes only the outputs that are missing.
    first = output_name(good[0], out, OP)
    kept = {n: os.stat(out / n).st_mtime_ns for n in names if out / n != first}
    first.unlink()
    assert pxfx.batch.run(OP, good, out) == []
    assert np.array_equal(np.asarray(Image.open(first)), serial(good[0]))
    assert {n: os.stat(out / n).st_mtime_ns for n in kept} == kept
