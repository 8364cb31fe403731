"""Builds the Python package with CMake, the library linked into it."""
import os
import re
import shutil
import subprocess
import sys
from importlib.util import find_spec
from pathlib import Path

from setuptools import Extension, setup
from setuptools.command.build_ext import build_ext

ROOT = Path(__file__).resolve().parent


def version():
    text = (ROOT / "include/quavel/version.h").read_text()
    return ".".join(re.findall(r"#define QUAVEL_VERSION_\w+ (\d+)", text))


class CMakeBuild(build_ext):
    def build_extension(self, ext):
        pybind11 = find_spec("pybind11")  # else CMake finds Debian's pybind11-dev by itself
        target = Path(self.get_ext_fullpath(ext.name)).resolve()
        options = [
            "-DCMAKE_BUILD_TYPE=Release",
            "-DBUILD_SHARED_LIBS=OFF",
            "-DQUAVEL_BUILD_PYTHON=ON",
            "-DQUAVEL_BUILD_APPS=OFF",
            "-DQUAVEL_BUILD_TESTS=OFF",
            "-DQUAVEL_INSTALL=OFF",
            f"-DPython_EXECUTABLE={sys.executable}",
            f"-Dpybind11_ROOT={Path(pybind11.origin).parent if pybind11 else ''}",
        ]
        if shutil.which("ninja") and not Path(self.build_temp, "CMakeCache.txt").exists():
            options.append("-GNinja")
        subprocess.run(["cmake", "-S", ROOT, "-B", self.build_temp, *options], check=True)
        jobs = str(os.cpu_count() or 1)
        build = ["cmake", "--build", self.build_temp, "--target", "quavel_python", "-j", jobs]
        subprocess.run(build, check=True)
        target.parent.mkdir(parents=True, exist_ok=True)
        shutil.copy(Path(self.build_temp, "python/quavel", target.name), target)


setup(
    version=version(),
    ext_modules=[Extension("quavel._quavel", sources=[])],
    cmdclass={"build_ext": CMakeBuild},
    # pip fetches it for a machine that lacks it.
    setup_requires=[] if shutil.which("cmake") else ["cmake>=3.23"],
)
