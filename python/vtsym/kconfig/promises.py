"""What every configuration keeps: types, dependencies, selections, defaults, ranges and choices, a line each."""

from __future__ import annotations

from typing import Any, Iterator

from .comparisons import number_of
from .formulas import Formula, both, either, negated, size_of, text_of
from .library import kconfiglib
from .meaning import Meaning

#: Names in a condition that is written; a longer one says little and costs much.
MOST_NAMES = 32


class Promises(Meaning):
    """The conditions that hold in every configuration."""

    def lines(self) -> Iterator[str]:
        """Conditions that hold in every configuration, those about one symbol together."""
        for symbol in self.kconf.unique_defined_syms:
            if self.is_open(symbol):
                continue
            if symbol.orig_type in (kconfiglib.BOOL, kconfiglib.TRISTATE):
                yield from self._lines_of_logical(symbol)
            elif symbol.orig_type:
                yield from self._lines_of_value(symbol)
        for choice in self.kconf.unique_choices:
            yield from self._lines_of_choice(choice)

    def _written(self, *formulas: Formula) -> Iterator[str]:
        for formula in formulas:
            if formula is not True and size_of(formula) <= MOST_NAMES:
                yield text_of(formula)

    def _lines_of_logical(self, symbol: Any) -> Iterator[str]:
        low, high = self.bound(symbol)
        macro, module = self.macro(symbol), self.macro(symbol, "_MODULE")
        is_tristate = symbol.orig_type is kconfiglib.TRISTATE
        if high == 0:
            yield f"!defined({macro})" + (f" && !defined({module})" if is_tristate else "")
            return
        if low == 2:
            yield f"{macro} == 1" + (f" && !defined({module})" if is_tristate else "")
        elif not is_tristate or not self.is_modular(symbol):
            yield f"!defined({macro}) || {macro} == 1"
            if is_tristate:
                yield f"!defined({module})"
        else:
            yield f"!defined({macro}) || {macro} == 1 && !defined({module})"
            yield f"!defined({module}) || {module} == 1"
            modules = self.kconf.modules
            if self.bound(modules)[0] < 2 and not self.is_open(modules):
                yield f"!defined({module}) || defined({self.macro(modules)})"
        levels = (1, 2) if is_tristate and self.is_modular(symbol) else (1,)
        seen: set[str] = set()
        for level in levels:
            own = self.at_least(symbol, level, True)
            least = level if len(levels) > 1 else 1
            for line in self._written(*self._upper(symbol, own, least), *self._lower(symbol, own, least)):
                if line not in seen:
                    seen.add(line)
                    yield line
        for target, condition in symbol.selects:
            yield from self._lines_of_selection(symbol, target, condition)

    def _upper(self, symbol: Any, own: Formula, level: int) -> Iterator[Formula]:
        """What a symbol needs."""
        if own is True or own is False:
            return
        if symbol.choice:
            yield either(negated(own), self.visible(symbol, level, True))
            return
        selected = self.condition(symbol.rev_dep, level, True)
        weak: Formula = self.condition(symbol.weak_rev_dep, 1, True) if level == 2 else False
        yield either(negated(own), self.condition(symbol.direct_dep, level, True), selected, weak)
        if not any(node.prompt for node in symbol.nodes):
            # Without modules, a default of m is y.
            whole: Formula = negated(self.at_least(self.kconf.modules, 2, False)) if level == 2 else False
            given = (either(both(self.condition(value, level, True), self.condition(condition, level, True)),
                            both(whole, self.condition(value, 1, True), self.condition(condition, 1, True)))
                     for value, condition in symbol.defaults)
            yield either(negated(own), *given, self.condition(symbol.weak_rev_dep, 1, True), selected)

    def _lower(self, symbol: Any, own: Formula, level: int) -> Iterator[Formula]:
        """What a symbol without a prompt is at least."""
        if own is True or symbol.choice or any(node.prompt for node in symbol.nodes):
            return
        earlier: list[Formula] = []
        for value, condition in symbol.defaults:
            needs = both(self.condition(condition, level, False), self.condition(value, level, False))
            yield either(own, negated(needs), *earlier)
            earlier.append(self.condition(condition, 1, True))

    def _lines_of_selection(self, symbol: Any, target: Any, condition: Any) -> Iterator[str]:
        if target.choice or self.is_open(target) or target.orig_type not in (kconfiglib.BOOL, kconfiglib.TRISTATE):
            return
        for level in (1, 2) if self.is_modular(target) else (1,):
            own = self.at_least(symbol, level, False)
            # Where the symbol is known to be on, the line begins with what it selects.
            yield from self._written(either(negated(own), negated(self.condition(condition, level, False)),
                                            self.at_least(target, level, True)))

    def _lines_of_value(self, symbol: Any) -> Iterator[str]:
        macro = self.macro(symbol)
        defined = f"defined({macro})"
        yield from self._written(
            either(negated(defined), self.condition(symbol.direct_dep, 1, True)),
            either(defined, negated(self.visible(symbol, 1, False))))
        if symbol.orig_type is kconfiglib.STRING:
            yield f"{defined} || !{defined}"  # a name of the configuration
            return
        base = 16 if symbol.orig_type is kconfiglib.HEX else 10
        earlier: list[Formula] = []
        for low, high, condition in symbol.ranges:
            limits = []
            for limit, sign in ((low, ">="), (high, "<=")):
                number = number_of(limit.str_value, base) if self._is_fixed(limit) else None
                if number is not None and not self.is_unknown(limit):
                    limits.append(f"{macro} {sign} {number}")
            yield from self._written(either(negated(defined), negated(self.condition(condition, 1, False)), *earlier,
                                            both(*limits)))
            earlier.append(self.condition(condition, 1, True))
        if not any(node.prompt for node in symbol.nodes) and not symbol.ranges:
            values = [number_of(value.str_value, base) if self._is_fixed(value) and not self.is_unknown(value) else None
                      for value, _ in symbol.defaults]
            if all(value is not None for value in values):
                yield from self._written(either(negated(defined), *(f"{macro} == {value}" for value in values)))
        yield f"{defined} || !{defined}"

    def _lines_of_choice(self, choice: Any) -> Iterator[str]:
        symbols = [each for each in choice.syms if not self.is_open(each)]
        if not self.is_modular(choice) and not choice.is_optional and len(symbols) == len(choice.syms):
            shown = either(*(self.visible(each, 1, False) for each in symbols))
            yield from self._written(either(*(self.at_least(each, 2, True) for each in symbols),
                                            negated(self.condition(choice, 2, False)), negated(shown)))
        for at, symbol in enumerate(symbols):
            others = symbols[:at] + symbols[at + 1 :] if self.is_modular(choice) else symbols[at + 1 :]
            for first in range(0, len(others), MOST_NAMES - 1):
                off = (negated(self.at_least(each, 1, False)) for each in others[first : first + MOST_NAMES - 1])
                yield from self._written(either(negated(self.at_least(symbol, 2, True)), both(*off)))
