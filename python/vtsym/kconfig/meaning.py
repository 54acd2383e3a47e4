"""Kconfig expressions as conditions over the macros that code sees.

A tristate expression is two conditions, "not n" and "y"; what has no condition over macros (strings, results of shell commands,
names that the sources define themselves) is replaced by the side that promises less.
"""

from __future__ import annotations

from typing import Any

from .bounds import Bounds
from .comparisons import compares, number_of, sign_of
from .formulas import Formula, both, either, negated
from .library import kconfiglib


class Meaning(Bounds):
    """The conditions of one configuration over the macros that code sees."""

    def __init__(self, kconf: Any, open_names: frozenset[str] = frozenset()) -> None:
        self.prefix: str = kconf.config_prefix
        #: Macros that sources define or undefine themselves.
        self.open_names = open_names
        super().__init__(kconf)  # narrowing asks for relations

    def macro(self, symbol: Any, suffix: str = "") -> str:
        return f"{self.prefix}{symbol.name}{suffix}"

    def is_open(self, symbol: Any) -> bool:
        """Whether the macros of a symbol are not those of the configuration alone."""
        return (symbol.env_var is not None or symbol is self.kconf.defconfig_list
                or self.macro(symbol) in self.open_names or self.macro(symbol, "_MODULE") in self.open_names)

    def at_least(self, symbol: Any, level: int, over: bool) -> Formula:
        """A symbol is m or y (level 1), or y (level 2)."""
        if symbol.orig_type not in (kconfiglib.BOOL, kconfiglib.TRISTATE):
            return over if self.is_unknown(symbol) else False
        low, high = self.bound(symbol)
        if low >= level or high < level:
            return low >= level
        if self.is_open(symbol):
            return over
        is_y: Formula = f"defined({self.macro(symbol)})" if high == 2 else False
        if level == 2 or not self.is_modular(symbol):
            return is_y
        return either(is_y, f"defined({self.macro(symbol, '_MODULE')})")

    def condition(self, expr: Any, level: int, over: bool) -> Formula:
        """An expression is at least m, or y: a condition that it implies (`over`), or that implies it."""
        if not isinstance(expr, tuple):
            if expr.__class__ is not kconfiglib.Choice:
                return self.at_least(expr, level, over)
            is_bool = not self.is_modular(expr)
            if not over and (expr.is_optional or (level == 2 and not is_bool)):
                return False
            return self.visible(expr, 1 if is_bool else level, over)
        if expr[0] is kconfiglib.NOT:
            return negated(self.condition(expr[1], 3 - level, not over))
        if expr[0] is kconfiglib.AND:
            return both(self.condition(expr[1], level, over), self.condition(expr[2], level, over))
        if expr[0] is kconfiglib.OR:
            return either(self.condition(expr[1], level, over), self.condition(expr[2], level, over))
        return self.relation(expr, over)

    def relation(self, expr: Any, over: bool) -> Formula:
        """A comparison, which is y or n."""
        operator, a, b = expr
        mirrored = {kconfiglib.LESS: kconfiglib.GREATER, kconfiglib.GREATER: kconfiglib.LESS,
                    kconfiglib.LESS_EQUAL: kconfiglib.GREATER_EQUAL, kconfiglib.GREATER_EQUAL: kconfiglib.LESS_EQUAL}
        if self.is_unknown(a) or self.is_unknown(b):
            return over
        if self._is_fixed(a) and not self._is_fixed(b):
            operator, a, b = mirrored.get(operator, operator), b, a
        if not self._is_fixed(b):
            return over
        if self._is_fixed(a):
            return bool(kconfiglib.expr_value(expr) == 2)
        if a.orig_type in (kconfiglib.BOOL, kconfiglib.TRISTATE):
            if b.str_value not in ("n", "m", "y"):
                return over
            wanted = "nmy".index(b.str_value)
            return either(*(self._is_level(a, level, over) for level in range(3) if compares(operator, level, wanted)))
        number = number_of(b.str_value)
        if a.orig_type not in (kconfiglib.INT, kconfiglib.HEX) or number is None or self.is_open(a):
            return over
        compared = f"{self.macro(a)} {sign_of(operator)} {number}"
        defined = f"defined({self.macro(a)})"
        return either(negated(defined), compared) if over else both(defined, compared)

    def _is_level(self, symbol: Any, level: int, over: bool) -> Formula:
        above = negated(self.at_least(symbol, level + 1, not over)) if level < 2 else True
        return both(self.at_least(symbol, level, over) if level > 0 else True, above)

    def _is_fixed(self, operand: Any) -> bool:
        """Whether an operand of a comparison is a constant: a name that is not defined is its own text."""
        return bool(operand.is_constant or not operand.orig_type)

    def visible(self, item: Any, level: int, over: bool) -> Formula:
        """Whether a prompt of a symbol or a choice is shown."""
        least = level if self.is_modular(item) else 1
        return either(*(self.condition(node.prompt[1], least, over) for node in item.nodes if node.prompt))
