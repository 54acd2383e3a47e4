"""The least and the largest value that each symbol can have, in any configuration.

Method: a fixed point.  All symbols begin with every value, and each round narrows them by their prompts, defaults, selections
and dependencies, whose bounds follow from those of their symbols.
"""

from __future__ import annotations

from abc import ABC, abstractmethod
from typing import Any, Callable, Tuple

from .formulas import Formula
from .library import kconfiglib

Interval = Tuple[int, int]

#: What a command of the configuration's shell prints is not known: it differs from machine to machine.
UNKNOWN = "VTSYM_UNKNOWN"


class Bounds(ABC):
    """The bounds of the symbols and choices of one configuration: 0 for n, 1 for m, 2 for y."""

    def __init__(self, kconf: Any) -> None:
        self.kconf = kconf
        self.bounds: dict[Any, Interval] = {}
        self._narrow()

    @abstractmethod
    def relation(self, expr: Any, over: bool) -> Formula:
        """A comparison as a condition; whether it holds, where that is known."""

    def is_unknown(self, symbol: Any) -> bool:
        return bool(symbol.name) and UNKNOWN in symbol.name

    def bound(self, expr: Any) -> Interval:
        """The least and the largest value of an expression: 0 for n, 1 for m, 2 for y."""
        if not isinstance(expr, tuple):
            if expr.__class__ is kconfiglib.Choice or expr.orig_type in (kconfiglib.BOOL, kconfiglib.TRISTATE):
                return self.bounds.get(expr, (expr.tri_value,) * 2 if expr.is_constant else (0, 2))
            return (0, 2) if self.is_unknown(expr) else (0, 0)
        if expr[0] is kconfiglib.NOT:
            low, high = self.bound(expr[1])
            return 2 - high, 2 - low
        if expr[0] in (kconfiglib.AND, kconfiglib.OR):
            a, b = self.bound(expr[1]), self.bound(expr[2])
            pick: Callable[[int, int], int] = min if expr[0] is kconfiglib.AND else max
            return pick(a[0], b[0]), pick(a[1], b[1])
        relation = self.relation(expr, True), self.relation(expr, False)
        return (2 if relation[1] is True else 0, 0 if relation[0] is False else 2)

    def is_modular(self, item: Any) -> bool:
        """Whether a symbol or a choice may be m."""
        modules = self.bounds.get(self.kconf.modules, (0, 2))
        return bool(item.orig_type is kconfiglib.TRISTATE and modules[1] > 0)

    def promoted(self, low: int, high: int, item: Any) -> Interval:
        """Bounds of an item whose m is y unless it is a tristate and there are modules."""
        always = item.orig_type is kconfiglib.TRISTATE and self.bounds.get(self.kconf.modules, (0, 2))[0] == 2
        return 2 if low == 1 and not self.is_modular(item) else low, 2 if high == 1 and not always else high

    def _visible(self, item: Any) -> Interval:
        bounds = [self.bound(node.prompt[1]) for node in item.nodes if node.prompt]
        low = max((each[0] for each in bounds), default=0)
        high = max((each[1] for each in bounds), default=0)
        return low, self.promoted(low, high, item)[1]

    def _bound_of_choice(self, choice: Any) -> Interval:
        low, high = self._visible(choice)
        return self.promoted(0 if choice.is_optional else min(low, 1), high, choice)

    def _bound_of_default(self, symbol: Any) -> Interval:
        low, high = 2, 0
        for value, condition in symbol.defaults:
            given, when = self.bound(value), self.bound(condition)
            if when[1] == 0:
                continue
            low = min(low, given[0], max(when[0], 1))
            high = max(high, min(given[1], when[1]))
            if when[0] > 0:
                return low, high
        return 0, high

    def _bound_of_symbol(self, symbol: Any) -> Interval:
        visible = self._visible(symbol)
        if symbol.choice:
            return 0, visible[1]
        default, selected = self._bound_of_default(symbol), self.bound(symbol.rev_dep)
        implied = self.bound(symbol.weak_rev_dep)[1]
        high = max(visible[1], default[1], selected[1], min(implied, 2 * self.bound(symbol.direct_dep)[1]))
        low = max(selected[0], default[0] if visible[1] == 0 else 0)
        if high == 1 and implied == 2:
            high = 2
        return self.promoted(low, high, symbol)

    def _narrow(self) -> None:
        items = [each for each in self.kconf.unique_defined_syms
                 if each.orig_type in (kconfiglib.BOOL, kconfiglib.TRISTATE)]
        choices = list(self.kconf.unique_choices)
        for item in items + choices:
            self.bounds[item] = (0, 2)
        changed = True
        while changed:
            changed = False
            for item in choices + items:
                find = self._bound_of_choice if item.__class__ is kconfiglib.Choice else self._bound_of_symbol
                low, high = self.bounds[item]
                found = find(item)
                narrow = max(low, found[0]), min(high, found[1])
                if narrow != (low, high) and narrow[0] <= narrow[1]:
                    self.bounds[item] = narrow
                    changed = True
