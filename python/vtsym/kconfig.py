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

from __future__ import annotations

import argparse
import os
import re
import sys
from pathlib import Path
from typing import Any, Callable, Iterable, Iterator, Optional, TextIO, Tuple, Union

try:
    import kconfiglib  # type: ignore[import]
except ImportError:  # said by main()
    kconfiglib = None

#: Names in a condition that is written; a longer one says little and costs much.
MOST_NAMES = 32

#: What a command of the configuration's shell prints is not known: it differs from machine to machine.
UNKNOWN = "VTSYM_UNKNOWN"

MEANINGS = """\
#define IS_BUILTIN(option) (option == 1)
#define IS_MODULE(option) (option##_MODULE == 1)
#define IS_ENABLED(option) (option == 1 || option##_MODULE == 1)
#define IS_REACHABLE(option) (option == 1 || option##_MODULE == 1 && defined(MODULE))
"""

#: A condition: a text that is one operand, or the operator with its operands.
Formula = Union[bool, str, Tuple[Any, ...]]
Interval = Tuple[int, int]


def negated(a: Formula) -> Formula:
    if isinstance(a, bool):
        return not a
    if isinstance(a, str):
        return ("!", a)
    if a[0] == "!":
        inner: Formula = a[1]
        return inner
    return ("&&" if a[0] == "||" else "||", *(negated(each) for each in a[1:]))


def joined(op: str, *operands: Formula) -> Formula:
    """The operands joined by && or ||, each once, in their order."""
    deciding = op == "||"
    kept: dict[Formula, None] = {}
    for operand in operands:
        if isinstance(operand, bool):
            if operand == deciding:
                return deciding
        elif isinstance(operand, tuple) and operand[0] == op:
            kept.update(dict.fromkeys(operand[1:]))
        else:
            kept[operand] = None
    if any(negated(each) in kept for each in kept):
        return deciding
    if len(kept) > 1:
        return (op, *kept)
    return list(kept)[0] if kept else not deciding


def either(*operands: Formula) -> Formula:
    return joined("||", *operands)


def both(*operands: Formula) -> Formula:
    return joined("&&", *operands)


def text_of(formula: Formula) -> str:
    if isinstance(formula, bool):
        return "1" if formula else "0"
    if isinstance(formula, str):
        return formula
    if formula[0] == "!":
        of = text_of(formula[1])
        return "!" + (of if of.startswith("defined") or " " not in of else f"({of})")
    parts = [text_of(each) for each in formula[1:]]
    if formula[0] == "&&":
        parts = [f"({part})" if isinstance(each, tuple) and each[0] == "||" else part
                 for part, each in zip(parts, formula[1:])]
    return f" {formula[0]} ".join(parts)


def size_of(formula: Formula) -> int:
    """How many operands a condition has."""
    if isinstance(formula, tuple):
        return sum(size_of(each) for each in formula[1:])
    return 1


class Meaning:
    """The conditions of one configuration over the macros that code sees."""

    def __init__(self, kconf: Any, open_names: frozenset[str] = frozenset()) -> None:
        self.kconf = kconf
        self.prefix: str = kconf.config_prefix
        #: Macros that sources define or undefine themselves.
        self.open_names = open_names
        self.bounds: dict[Any, Interval] = {}
        self._narrow()

    # Bounds.

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

    # Conditions over macros.

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

    # What holds.

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


def sign_of(operator: Any) -> str:
    """The sign of a comparison in C."""
    signs = {kconfiglib.EQUAL: "==", kconfiglib.UNEQUAL: "!=", kconfiglib.LESS: "<", kconfiglib.LESS_EQUAL: "<=",
             kconfiglib.GREATER: ">", kconfiglib.GREATER_EQUAL: ">="}
    return signs[operator]


def compares(operator: Any, a: int, b: int) -> bool:
    """Whether a comparison of two numbers holds."""
    sign = sign_of(operator)
    return (a == b and "=" in sign and sign != "!=") or (a < b and sign[0] in "<!") or (a > b and sign[0] in ">!")


def number_of(text: str, base: int = 0) -> Optional[int]:
    """A number that a directive can be compared with: not negative, within an int."""
    try:
        number = int(text, base) if base else int(text, 16 if text.lower().startswith("0x") else 10)
    except ValueError:
        return None
    return number if 0 <= number < 2**31 else None


# Reading.


def read(kconfig: Path, arch: Optional[str] = None) -> Any:
    """Reads a Kconfig file as a build for an architecture does.  No command of the shell is run."""
    if arch is not None:
        for name, value in {"ARCH": arch, "SRCARCH": arch, "SUBARCH": arch, "HEADER_ARCH": arch}.items():
            os.environ.setdefault(name, value)
        os.environ["ARCH"] = os.environ["SRCARCH"] = arch
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
    meaning = Meaning(kconf, open_names)
    print(f"# What a configuration of {of or kconf.filename} promises to the code.", file=out)
    print(MEANINGS, end="", file=out)
    print(f"#pragma closed {meaning.prefix}", file=out)
    lines = list(meaning.lines())
    if sources:
        lines = related(lines, sources.used, meaning.prefix)
    named = set(re.findall(r"\w+", " ".join(lines)))
    # What is left out is not known, rather than not defined.
    own = {meaning.macro(each) for each in kconf.unique_defined_syms}
    left_out = own - named
    for name in sorted({*open_names, *left_out, *(each + "_MODULE" for each in left_out)}):
        print(f"#pragma open {name}", file=out)
    for line in lines:
        print(line, file=out)
    count = len(lines)
    if sources:
        for macro in sorted({meaning.prefix + name for name in sources.symbols} - own):
            if macro not in open_names and sources.used & {macro, macro + "_MODULE"}:
                print(f"!defined({macro}) && !defined({macro}_MODULE)", file=out)  # of another architecture
                count += 1
    return count


def main(arguments: Optional[list[str]] = None) -> int:
    assert __doc__ is not None
    parser = argparse.ArgumentParser(prog="python3 -m vtsym.kconfig", description=__doc__.splitlines()[0])
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
