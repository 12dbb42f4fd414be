"""Builds libpxfx.so and libpxfx_operations.so with CMake (the repository's
build directory, or PXFX_BUILD_DIR, configured without tests and benchmarks
when it is new) and bundles them in the package."""

import os
import shutil
import subprocess
from pathlib import Path

from setuptools import setup
from setuptools.command.build_py import build_py
from setuptools.dist import Distribution

ROOT = Path(__file__).resolve().parent.parent
LIBRARIES = ("libpxfx.so.0", "libpxfx_operations.so")  # the names the package loads (pxfx/_native.py)


class BuildWithLibraries(build_py):
    def run(self):
        super().run()
        build = Path(os.environ.get("PXFX_BUILD_DIR", ROOT / "build")).resolve()
        if not (build / "CMakeCache.txt").is_file():
            generator = ["-G", "Ninja"] if shutil.which("ninja") else []
            subprocess.check_call(
                ["cmake", "-S", str(ROOT), "-B", str(build), *generator, "-DCMAKE_BUILD_TYPE=Release",
                 "-DPXFX_BUILD_TESTS=OFF", "-DPXFX_BUILD_BENCH=OFF"]
            )
        subprocess.check_call(
            ["cmake", "--build", str(build), "-j", str(os.cpu_count() or 1), "--target", "pxfx", "pxfx_operations_capi"]
        )
        target = Path(self.build_lib) / "pxfx" / "_lib"
        target.mkdir(parents=True, exist_ok=True)
        for name in LIBRARIES:
            shutil.copyfile((build / name).resolve(), target / name)


class BinaryDistribution(Distribution):
    """The package carries native libraries: its wheel is for this platform."""

    def has_ext_modules(self):
        return True


setup(cmdclass={"build_py": BuildWithLibraries}, distclass=BinaryDistribution)
