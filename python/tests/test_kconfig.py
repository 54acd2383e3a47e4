"""Conditions of Kconfig files: what kconfiglib computes keeps all of them, and they say no less than it does."""

from __future__ import annotations

import io
import os
import random
import re
import subprocess
import sys
from pathlib import Path
from typing import Any, Iterator

import kconfiglib  # type: ignore[import]
import pytest

from vtsym import kconfig
from vtsym.kconfig.__main__ import main

LOGICAL = (kconfiglib.BOOL, kconfiglib.TRISTATE)


class RandomKconfig:
    """A text with symbols of all types, dependencies, selections, defaults, ranges and choices."""

    def __init__(self, seed: int) -> None:
        self.random = random.Random(seed)
        kinds = ["bool", "bool", "tristate", "tristate", "int", "hex"]
        self.types = {f"S{i}": self.random.choice(kinds) for i in range(12)}
        self.at = 0  # of the symbol that is written: it depends on earlier ones, and selects later ones

    def names(self, kinds: tuple[str, ...], first: int, last: int) -> list[str]:
        return [name for name, kind in list(self.types.items())[first:last] if kind in kinds]

    def logical(self) -> str:
        return self.random.choice([*self.names(("bool", "tristate"), 0, self.at), "MODULES"])

    def expression(self, depth: int) -> str:
        if depth == 0:
            kind = self.random.randint(0, 6)
            if kind == 0:
                return f"{self.logical()} {self.random.choice(['=', '!='])} {self.random.choice('nmy')}"
            numbers = self.names(("int", "hex"), 0, self.at)
            if kind == 1 and numbers:
                return f"{self.random.choice(numbers)} {self.random.choice(['=', '!=', '<', '<=', '>', '>='])} 4"
            return self.random.choice(["", "", "!"]) + self.random.choice([self.logical(), self.logical(), "y", "m", "UNSEEN"])
        op = self.random.choice(["&&", "||"])
        return f"({self.expression(depth - 1)} {op} {self.expression(self.random.randint(0, depth - 1))})"

    def condition(self) -> str:
        return f" if {self.expression(self.random.randint(0, 1))}" if self.random.random() < 0.4 else ""

    def symbol(self, name: str, kind: str) -> Iterator[str]:
        yield f"config {name}"
        yield f"\t{kind}" + (f' "{name}"' + self.condition() if self.random.random() < 0.7 else "")
        if self.random.random() < 0.6:
            yield f"\tdepends on {self.expression(self.random.randint(0, 2))}"
        for _ in range(self.random.randint(0, 2)):
            default = self.expression(0) if kind in ("bool", "tristate") else self.random.choice(["3", "5", "0x7"])
            yield f"\tdefault {default if kind != 'int' else '6'}" + self.condition()
        if kind in ("bool", "tristate"):
            for word in ("select", "imply"):
                targets = self.names(("bool", "tristate"), self.at + 1, len(self.types))
                if targets and self.random.random() < 0.3:
                    yield f"\t{word} {self.random.choice(targets)}{self.condition()}"
        elif self.random.random() < 0.6:
            yield f"\trange 2 8{self.condition()}"

    def text(self) -> str:
        lines = ["config MODULES", '\tbool "modules"', self.random.choice(["\toption modules", "\tmodules"])]
        for self.at, (name, kind) in enumerate(self.types.items()):
            lines.extend(self.symbol(name, kind))
        self.at = len(self.types)
        lines += ["choice", f"\t{self.random.choice(['bool', 'tristate'])} \"one\"{self.condition()}"]
        lines += [f"\t{self.random.choice(['depends on S0 || !S0', 'optional', 'default C1'])}"]
        for i in range(3):
            lines += [f"config C{i}", f'\t{self.random.choice(["bool", "tristate"])} "C{i}"{self.condition()}']
        return "\n".join([*lines, "endchoice", ""])


def evaluated(condition: str, macros: dict[str, str]) -> bool:
    """The value of a condition as #if has them."""
    text = re.sub(r"defined\((\w+)\)", r"('\1' in macros)", condition)
    text = text.replace("&&", " and ").replace("||", " or ")
    text = re.sub(r"!(?!=)", " not ", text)
    text = re.sub(r"(?<!')\bCONFIG_\w+", lambda name: str(int(macros.get(name[0], "0") or "0", 0)), text)
    return bool(eval(text, {"macros": macros}))  # a condition that this module made


def macros_of(kconf: Any) -> dict[str, str]:
    """What a build defines."""
    macros: dict[str, str] = {}
    for line in kconf._autoconf_contents("").splitlines():
        _, name, *value = line.split(None, 2)
        macros[name] = value[0] if value else ""
    return macros


def configure(kconf: Any, chance: random.Random) -> None:
    """Sets symbols to values that they may have."""
    for symbol in chance.sample(kconf.unique_defined_syms, len(kconf.unique_defined_syms)):
        if symbol.orig_type in LOGICAL and symbol.assignable:
            symbol.set_value(chance.choice(symbol.assignable))
        elif symbol.orig_type is kconfiglib.INT:
            symbol.set_value(str(chance.randint(0, 9)))
        elif symbol.orig_type is kconfiglib.HEX:
            symbol.set_value(hex(chance.randint(0, 9)))


def read(folder: Path, text: str) -> Any:
    (folder / "Kconfig").write_text(text)
    os.environ["srctree"] = str(folder)
    return kconfig.read(folder / "Kconfig")


def is_exact(item: Any) -> bool:
    """Whether macros show the whole value: not the mode of a choice, nor a number that is not written."""
    return isinstance(item, kconfiglib.Symbol) and item.orig_type in (*LOGICAL, kconfiglib.UNKNOWN)


@pytest.mark.parametrize("seed", range(60))
def test_configurations_keep_every_condition(tmp_path: Path, seed: int) -> None:
    text = RandomKconfig(seed).text()
    kconf = read(tmp_path, text)
    meaning = kconfig.Promises(kconf)
    lines = list(meaning.lines())
    chance = random.Random(seed)
    for _ in range(30):
        kconf.unset_values()
        configure(kconf, chance)
        macros = macros_of(kconf)
        for line in lines:
            assert evaluated(line, macros), f"{line}\n{macros}\n{text}"
        for symbol in kconf.unique_defined_syms:
            low, high = meaning.bound(symbol) if symbol.orig_type in LOGICAL else (0, 2)
            assert low <= symbol.tri_value <= high
            for expr in (symbol.direct_dep, symbol.rev_dep, *(node.prompt[1] for node in symbol.nodes if node.prompt)):
                for level in (1, 2):
                    holds = kconfiglib.expr_value(expr) >= level
                    over, under = (evaluated(kconfig.text_of(meaning.condition(expr, level, each)), macros)
                                   for each in (True, False))
                    assert under <= holds <= over, f"{expr}\n{macros}\n{text}"
                    if all(is_exact(item) for item in kconfiglib.expr_items(expr)):
                        assert under == over, f"{expr}\n{macros}\n{text}"


KCONFIG = """\
config MODULES
	bool "modules"
	modules
config NET
	tristate "net"
config USB
	tristate "usb"
config TLS
	bool "tls"
	depends on NET = y
config CPUS
	int "CPUs"
	range 2 64
config FAST
	def_bool $(shell,cc --fast && echo y)
choice
	prompt "size"
config SMALL
	bool "small"
config BIG
	bool "big"
endchoice
"""

CODE = """\
#include <linux/kconfig.h>
#ifdef CONFIG_TLS
#if IS_MODULE(CONFIG_NET)
#endif
#if IS_ENABLED(CONFIG_NET) && CONFIG_CPUS > 1
#endif
#endif
#if defined(CONFIG_SMALL) && defined(CONFIG_BIG)
#elif defined(CONFIG_FAST)
#endif
#ifdef CONFIG_NETWORK
#endif
#ifdef CONFIG_OWN
#endif
#ifdef CONFIG_OTHER
#endif
#if defined(CONFIG_USB_MODULE) && !defined(CONFIG_TLS_MODULE)
#endif
"""


def test_scanning_with_a_configuration(tmp_path: Path) -> None:
    (tmp_path / "Kconfig").write_text(KCONFIG)
    (tmp_path / "a.c").write_text(CODE)
    (tmp_path / "own.h").write_text("#define CONFIG_OWN 1\n")
    (tmp_path / "Kconfig.other").write_text("config OTHER\n\tbool\n")

    def run(*arguments: str) -> str:
        done = subprocess.run([sys.executable, "-m", *arguments], cwd=tmp_path, capture_output=True, text=True)
        assert done.returncode in (0, 1), done.stderr
        return done.stdout

    environment = os.environ.pop("srctree", None)
    run("vtsym.kconfig", "Kconfig", "-o", "all.assume")
    assert run("vtsym.kconfig", "Kconfig") == (tmp_path / "all.assume").read_text()
    if environment is not None:
        os.environ["srctree"] = environment
    found = [line.split(": ", 1) for line in run("vtsym", "scan", "--assume", "all.assume", "a.c").splitlines()]
    assert [[place, message.split(", since")[0]] for place, message in found] == [
        ["a.c:3", "'#if IS_MODULE(CONFIG_NET)' is dead"],
        ["a.c:5", "'#if IS_ENABLED(CONFIG_NET) && CONFIG_CPUS > 1' always holds"],
        ["a.c:8", "'#if defined(CONFIG_SMALL) && defined(CONFIG_BIG)' is dead"],
        ["a.c:11", "'#ifdef CONFIG_NETWORK' is dead"],
        ["a.c:15", "'#ifdef CONFIG_OTHER' is dead"],
        ["a.c:17", "'#if defined(CONFIG_USB_MODULE) && !defined(CONFIG_TLS_MODULE)' can be '#if defined(CONFIG_USB_MODULE)'"],
    ]
    assert "'CONFIG_NETWORK' is defined nowhere" in found[3][1]


def test_architectures_with_the_files_of_another(tmp_path: Path, monkeypatch: pytest.MonkeyPatch) -> None:
    (tmp_path / "arch").mkdir()
    (tmp_path / "arch/Kconfig.sparc").write_text('config WIDE\n\tbool "Wide" if "$(ARCH)" = "sparc"\n\tdefault "$(ARCH)" = "sparc64"\n')
    (tmp_path / "Kconfig").write_text('source "arch/Kconfig.$(SRCARCH)"\n')
    monkeypatch.setenv("srctree", str(tmp_path))
    for name in ("ARCH", "SRCARCH", "SUBARCH", "HEADER_ARCH"):
        monkeypatch.delenv(name, raising=False)
    values = {}
    for arch in ("sparc", "sparc64", "sparc32"):
        out = io.StringIO()
        kconfig.write(kconfig.read(tmp_path / "Kconfig", arch), out)
        values[arch] = [line for line in out.getvalue().splitlines() if not line.startswith("#")]
    assert values == {
        "sparc": ["!defined(CONFIG_WIDE) || CONFIG_WIDE == 1"],
        "sparc64": ["CONFIG_WIDE == 1"],
        "sparc32": ["!defined(CONFIG_WIDE)"],
    }


def test_wrong_files(tmp_path: Path, capsys: pytest.CaptureFixture[str]) -> None:
    (tmp_path / "Kconfig").write_text("config A\n\tmaybe\n")
    assert main([str(tmp_path / "Kconfig")]) == 2
    assert main([str(tmp_path / "none")]) == 2
    assert capsys.readouterr().err.count("vtsym.kconfig: ") == 2


def test_writing_without_sources(tmp_path: Path) -> None:
    out = io.StringIO()
    assert kconfig.write(read(tmp_path, KCONFIG), out) > 8
    assert "#pragma closed CONFIG_\n" in out.getvalue()


def test_the_example_of_the_documentation(tmp_path: Path, monkeypatch: pytest.MonkeyPatch) -> None:
    folder = Path(__file__).resolve().parents[2] / "docs/examples/kconfig"
    monkeypatch.chdir(folder)
    monkeypatch.delenv("srctree", raising=False)
    assert main(["Kconfig", "-o", str(tmp_path / "net.assume")]) == 0
    assert (tmp_path / "net.assume").read_text() == (folder / "net.assume").read_text()
