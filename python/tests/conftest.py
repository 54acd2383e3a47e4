"""What the tests share: the tables of cases that the C++ tests read, and random conditions."""

from __future__ import annotations

import random
import re
from pathlib import Path

import pytest

ROOT = Path(__file__).resolve().parents[2]
ESCAPES = {"n": "\n", "t": "\t", "\\": "\\", "e": ""}


def byte(number: int) -> str:
    """A byte that need not be UTF-8, as Python keeps it."""
    return bytes([number]).decode("utf-8", "surrogateescape")


def unescaped(text: str) -> str:
    return re.sub(
        r"\\(x[0-9a-f]{2}|.)", lambda m: ESCAPES[m[1]] if m[1] in ESCAPES else byte(int(m[1][1:], 16)), text
    )


def cases(file: str, section: str) -> list[list[str]]:
    """The rows of a section of tests/data/cases; tests/support/Cases.hpp describes the format."""
    rows: list[list[str]] = []
    current = None
    for line in (ROOT / "tests/data/cases" / file).read_text().splitlines():
        heading = re.fullmatch(r"\[([^\t]*)\]", line)
        if heading:
            current = heading[1]
        elif current == section and line and not line.startswith("#"):
            rows.append([unescaped(column) for column in re.split("\t+", line)])
    assert rows, f"{file} has no section {section}"
    return rows


class RandomConditions:
    """Conditions as Python text over Symbols, and as a function of integers."""

    def __init__(self, seed: int) -> None:
        self.random = random.Random(seed)

    def arithmetic(self, depth: int) -> str:
        if depth == 0:
            return self.random.choice(["a", "b", "c", str(self.random.randint(-3, 3))])
        op = self.random.choice(["+", "-", "*", "&", "|", "^", "-"])
        return f"({self.arithmetic(depth - 1)} {op} {self.arithmetic(depth - 1)})"

    def condition(self, depth: int) -> str:
        if depth == 0:
            op = self.random.choice(["<", "<=", ">", ">=", "==", "!="])
            left = self.random.choice(["a", "b", "c", "(a + b)", "(2 * b - c)", f"(a + {self.arithmetic(1)})"])
            return f"({left} {op} {self.arithmetic(self.random.randint(0, 1))})"
        kind = self.random.randint(0, 4)
        if kind == 0:
            return f"(~{self.condition(depth - 1)})"
        return f"({self.condition(depth - 1)} {'&' if kind < 3 else '|'} {self.condition(depth - 1)})"


@pytest.fixture(params=range(4))
def random_conditions(request: pytest.FixtureRequest) -> RandomConditions:
    return RandomConditions(request.param)
