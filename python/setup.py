"""Builds the wheel: CMake compiles the module, the library and the program, and installs them into the package.

The version is that of the CMake project.  Everything that is made on the way is below the build folder.
"""

import re
import subprocess
from pathlib import Path

from setuptools import Extension, setup
from setuptools.command.build_ext import build_ext

ROOT = Path(__file__).resolve().parent.parent
BUILD = ROOT / "build" / "python"


class CMakeBuild(build_ext):
    """Runs CMake instead of a compiler."""

    def build_extension(self, ext: Extension) -> None:
        package = Path(self.get_ext_fullpath(ext.name)).resolve().parent
        if not (BUILD / "build.ninja").exists():
            subprocess.run(["cmake", "--preset", "python"], cwd=ROOT, check=True)
        subprocess.run(["cmake", "--build", BUILD, "--target", "vtsym_python", "vtsym_program"], check=True)
        for component in ("python_module", "python_wheel"):
            install = ["cmake", "--install", BUILD, "--component", component, "--prefix", package, "--strip"]
            subprocess.run(install, check=True)
        for link in filter(Path.is_symlink, list(package.iterdir())):
            link.resolve().replace(link)  # a wheel has no links: the name that is loaded stays


def version() -> str:
    """The version of the CMake project."""
    found = re.search(r"project\(vtsym VERSION ([0-9.]+)", (ROOT / "CMakeLists.txt").read_text())
    assert found, "CMakeLists.txt names a version"
    return found[1]


(BUILD / "wheel").mkdir(parents=True, exist_ok=True)
setup(
    version=version(),
    packages=["vtsym", "vtsym.kconfig"],
    package_data={"vtsym": ["py.typed", "*.pyi"]},
    ext_modules=[Extension("vtsym._vtsym", [])],
    cmdclass={"build_ext": CMakeBuild},
    options={
        "build": {"build_base": str(BUILD / "wheel")},
        "egg_info": {"egg_base": str(BUILD / "wheel")},
        "bdist_wheel": {"bdist_dir": str(BUILD / "wheel" / "tree")},
    },
)
