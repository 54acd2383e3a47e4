"""What a tree says besides its configuration: the Kconfig files as a build reads them, and the names that its sources use."""

from __future__ import annotations

import os
import re
from pathlib import Path
from typing import Any, Iterable, Optional

from .bounds import UNKNOWN
from .library import kconfiglib


#: Architectures whose files are in the folder of another one.
FOLDERS = {"i386": "x86", "x86_64": "x86", "sparc32": "sparc", "sparc64": "sparc", "parisc64": "parisc"}


def read(kconfig: Path, arch: Optional[str] = None) -> Any:
    """Reads a Kconfig file as a build for an architecture does.  No command of the shell is run."""
    if arch is not None:
        folder = FOLDERS.get(arch, arch)
        for name in ("SUBARCH", "HEADER_ARCH"):
            os.environ.setdefault(name, folder)
        os.environ.update(ARCH=arch, SRCARCH=folder)
        if arch == "um":
            os.environ["SUBARCH"] = os.environ["HEADER_ARCH"] = "x86"
    os.environ.setdefault("srctree", str(kconfig.parent))
    for name, value in {"CC": "cc", "LD": "ld", "KERNELVERSION": "0"}.items():
        os.environ.setdefault(name, value)
    commands: dict[str, str] = {}

    def shell(_kconf: Any, _name: str, command: str) -> str:
        return commands.setdefault(command, f"{UNKNOWN}_{len(commands)}")

    class Kconfig(kconfiglib.Kconfig):  # type: ignore[misc]
        """Knows `modules` without `option`, as newer files have it."""

        def _tokenize(self, line: str) -> Any:
            return super()._tokenize("option modules" if line.strip() == "modules" else line)

    kconfiglib._shell_fn = shell
    return Kconfig(str(kconfig.resolve()), warn=False)


DEFINES = re.compile(rb"#[ \t]*(?:define|undef)[ \t]+(\w+)")
OPTIONS = re.compile(rb"-[DU][ \t]*(\w+)")
SYMBOLS = re.compile(rb"^[ \t]*(?:menu)?config[ \t]+(\w+)", re.M)


#: Files that name settings without being code.
SETTINGS = re.compile(r"Makefile|Kbuild|.*(defconfig|\.config|\.rst|\.txt|\.dtsi?|\.yaml|\.json|\.svg)$")


class Sources:
    """The names of a tree: those that its sources use, those that they define themselves, and those of all Kconfig files."""

    def __init__(self, tree: Path, prefix: str, excluded: Iterable[str] = ()) -> None:
        self.used: set[str] = set()
        self.defined: set[str] = set()
        self.symbols: set[str] = set()
        self._prefix = prefix.encode()
        self._used = re.compile(rb"\b" + re.escape(self._prefix) + rb"\w+")
        left_out = {str(tree / each) for each in excluded}
        for folder, folders, files in os.walk(tree):
            folders[:] = [each for each in folders if os.path.join(folder, each) not in left_out]
            for file in files:
                if not os.path.islink(os.path.join(folder, file)):
                    self._read(folder, file)

    def _read(self, folder: str, file: str) -> None:
        with open(os.path.join(folder, file), "rb") as opened:
            data = opened.read()
        if file.startswith("Kconfig") or file.endswith(".kconfig"):
            self.symbols.update(each.decode() for each in SYMBOLS.findall(data))
        elif self._prefix in data:
            for pattern in (DEFINES, OPTIONS):
                self.defined.update(each.decode() for each in pattern.findall(data) if each.startswith(self._prefix))
            if not SETTINGS.match(file):
                self.used.update(each.decode() for each in self._used.findall(data))
