"""Runs the program that comes with the package: ``python3 -m vtsym simplify 'A > 1 && A > 2'``."""

from __future__ import annotations

import os
import sys
from pathlib import Path
from typing import NoReturn


def main() -> NoReturn:
    """Becomes the program, with the same arguments: the one of a wheel, or the installed one."""
    program = Path(__file__).parent / "vtsym"
    os.execvp(program if program.exists() else "vtsym", ["vtsym", *sys.argv[1:]])


if __name__ == "__main__":
    main()
