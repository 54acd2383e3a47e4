"""The command: ``python3 -m vtsym.kconfig Kconfig -o all.assume``."""

from __future__ import annotations

import argparse
import sys
from pathlib import Path
from typing import Optional

import vtsym.kconfig

from .library import kconfiglib
from .sources import Sources, read
from .writing import write


def main(arguments: Optional[list[str]] = None) -> int:
    assert vtsym.kconfig.__doc__ is not None
    parser = argparse.ArgumentParser(prog="python3 -m vtsym.kconfig", description=vtsym.kconfig.__doc__.splitlines()[0])
    parser.add_argument("kconfig", type=Path, help="the Kconfig file at the top")
    parser.add_argument("--arch", help="architecture, as in ARCH=x86 of a build")
    parser.add_argument("-o", "--output", help="file to write, instead of standard output")
    parser.add_argument("--sources", type=Path, help="the sources (the folder of the Kconfig file unless given)")
    parser.add_argument("--exclude", action="append", default=[], metavar="FOLDER",
                        help="folder of sources that other builds configure, such as tools")
    options = parser.parse_args(arguments)
    if kconfiglib is None:
        print("vtsym.kconfig: kconfiglib is missing: install python3-kconfiglib", file=sys.stderr)
        return 2
    try:
        kconf = read(options.kconfig, options.arch)
        sources = Sources(options.sources or options.kconfig.parent, kconf.config_prefix, options.exclude)
        if options.output:
            unfinished = Path(options.output + ".part")
            with unfinished.open("w", encoding="utf-8") as out:
                write(kconf, out, sources, str(options.kconfig))
            unfinished.rename(options.output)
        else:
            write(kconf, sys.stdout, sources, str(options.kconfig))
    except (OSError, kconfiglib.KconfigError) as error:
        print(f"vtsym.kconfig: {error}", file=sys.stderr)
        return 2
    return 0


if __name__ == "__main__":
    sys.exit(main())
