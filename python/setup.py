"""Builds a wheel: CMake compiles the module together with both libraries.

    python3 -m build --wheel python

TARN_ENGINE_BASE_BUILD_DIR names a build directory that is there already.
"""

import os
import shutil
import subprocess
import sys
from pathlib import Path

from setuptools import Extension, setup
from setuptools.command.build_ext import build_ext

ROOT = Path(__file__).resolve().parent.parent


class CMakeBuild(build_ext):
    def build_extension(self, ext: Extension) -> None:
        module = Path(self.get_ext_fullpath(ext.name)).resolve()
        build = Path(os.environ.get("TARN_ENGINE_BASE_BUILD_DIR", self.build_temp)).resolve()
        options = [
            "-D", "CMAKE_BUILD_TYPE=Release",
            "-D", "BUILD_SHARED_LIBS=OFF",
            "-D", "TARN_ENGINE_BASE_BUILD_PYTHON=ON",
            "-D", "TARN_ENGINE_BASE_BUILD_TESTS=OFF",
            "-D", "TARN_ENGINE_BASE_BUILD_EXAMPLES=OFF",
            "-D", f"Python_EXECUTABLE={sys.executable}",
        ]  # fmt: skip
        subprocess.run(["cmake", "-S", ROOT, "-B", build, *options], check=True)
        subprocess.run(["cmake", "--build", build, "--parallel", str(os.cpu_count() or 1)], check=True)
        module.parent.mkdir(parents=True, exist_ok=True)
        shutil.copy(build / "python" / "tarn_engine_base" / module.name, module)


version = subprocess.run([ROOT / "scripts" / "version"], check=True, capture_output=True, text=True).stdout.strip()
setup(version=version, ext_modules=[Extension("tarn_engine_base._native", [])], cmdclass={"build_ext": CMakeBuild})
