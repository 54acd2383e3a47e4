"""Comparisons of a Kconfig expression, and the numbers in them."""

from __future__ import annotations

from typing import Any, Optional

from .library import kconfiglib


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
