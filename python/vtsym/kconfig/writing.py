"""The file for ``vtsym scan --assume``: meanings of macros, which names are open, and the conditions about what the sources use."""

from __future__ import annotations

import re
from typing import Any, Optional, TextIO

from .promises import Promises
from .sources import Sources

MEANINGS = """\
#define IS_BUILTIN(option) (option == 1)
#define IS_MODULE(option) (option##_MODULE == 1)
#define IS_ENABLED(option) (option == 1 || option##_MODULE == 1)
#define IS_REACHABLE(option) (option == 1 || option##_MODULE == 1 && defined(MODULE))
"""


def related(lines: list[str], names: set[str], prefix: str) -> list[str]:
    """The lines about names, each of which begins with what it is about, and those about the names in these."""
    name = re.compile(r"\b" + re.escape(prefix) + r"\w+")
    of_line = [name.findall(line) for line in lines]
    about: dict[str, list[int]] = {}
    for at, found in enumerate(of_line):
        about.setdefault(found[0], []).append(at)
    kept: set[int] = set()
    open_names = [*names, *(each + "_MODULE" for each in names), *(each.removesuffix("_MODULE") for each in names)]
    seen = set(open_names)
    while open_names:
        for at in about.get(open_names.pop(), ()):
            if at not in kept:
                kept.add(at)
                further = set(of_line[at]) - seen
                seen |= further
                open_names.extend(further)
    return [line for at, line in enumerate(lines) if at in kept]


def write(kconf: Any, out: TextIO, sources: Optional[Sources] = None, of: str = "") -> int:
    """Writes the conditions of a configuration; returns how many."""
    open_names = frozenset(sources.defined if sources else ())
    promises = Promises(kconf, open_names)
    print(f"# What a configuration of {of or kconf.filename} promises to the code.", file=out)
    print(MEANINGS, end="", file=out)
    print(f"#pragma closed {promises.prefix}", file=out)
    lines = list(promises.lines())
    if sources:
        lines = related(lines, sources.used, promises.prefix)
    named = set(re.findall(r"\w+", " ".join(lines)))
    # What is left out is not known, rather than not defined.
    own = {promises.macro(each) for each in kconf.unique_defined_syms}
    left_out = own - named
    for name in sorted({*open_names, *left_out, *(each + "_MODULE" for each in left_out)}):
        print(f"#pragma open {name}", file=out)
    for line in lines:
        print(line, file=out)
    count = len(lines)
    if sources:
        for macro in sorted({promises.prefix + name for name in sources.symbols} - own):
            if macro not in open_names and sources.used & {macro, macro + "_MODULE"}:
                print(f"!defined({macro}) && !defined({macro}_MODULE)", file=out)  # of another architecture
                count += 1
    return count
