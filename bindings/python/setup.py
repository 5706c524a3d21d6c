"""Builds the package's extension module with the rules of CMake."""

import os
import re
import shlex
import subprocess
import sys
from pathlib import Path

from setuptools import Extension, setup
from setuptools.command.build_ext import build_ext

ROOT = Path(__file__).resolve().parents[2]


class CMakeBuild(build_ext):
    """Lets CMake compile the library and the module, in a build folder."""

    def build_extension(self, ext: Extension) -> None:
        package = Path(self.get_ext_fullpath(ext.name)).resolve().parent
        build = Path(self.build_temp).resolve()
        options = {
            "CMAKE_BUILD_TYPE": "Release",
            "MORVIK_TESTS": "OFF",
            "MORVIK_BENCH": "OFF",
            "MORVIK_MPI": "OFF",
            "MORVIK_PYTHON": "ON",
            "MORVIK_PYTHON_PACKAGE_DIR": package,
            "Python3_EXECUTABLE": sys.executable,
        }
        definitions = [f"-D{name}={value}" for name, value in options.items()]
        definitions += shlex.split(os.environ.get("CMAKE_ARGS", ""))
        subprocess.run(["cmake", "-S", ROOT, "-B", build, "-G", "Ninja", *definitions], check=True)
        jobs = str(self.parallel or len(os.sched_getaffinity(0)))
        subprocess.run(["cmake", "--build", build, "--target", "morvik_python", "--parallel", jobs], check=True)


version = re.search(r"project\(morvik VERSION ([0-9.]+)", (ROOT / "CMakeLists.txt").read_text())[1]
setup(version=version, ext_modules=[Extension("morvik._core", [])], cmdclass={"build_ext": CMakeBuild})
