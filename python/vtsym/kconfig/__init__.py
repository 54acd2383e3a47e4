"""Writes what a Kconfig configuration promises to the code that it configures, for ``vtsym scan --assume``.

    python3 -m vtsym.kconfig Kconfig --arch x86 -o x86.assume

Method: kconfiglib (Debian: python3-kconfiglib) reads the files.  Bounds of all symbols are narrowed to a fixed point first, so
that what never or always holds leaves the conditions.  Then each type, dependency, selection, default, range and choice
becomes a condition over the macros that code sees.  A tristate expression is two conditions, "not n" and "y"; what has no
condition over macros (strings, results of shell commands, names that the sources define themselves) is replaced by
the side that promises less.  So every configuration keeps every condition, but not every definition of
macros that keeps them is a configuration.

Cost: linear in the Kconfig files for each round of narrowing, and in the bytes of the sources that are searched.
"""

from .formulas import text_of
from .promises import Promises
from .sources import Sources, read
from .writing import write

__all__ = ["Promises", "Sources", "read", "text_of", "write"]
