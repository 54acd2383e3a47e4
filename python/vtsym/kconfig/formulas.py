"""Conditions as they are put together, and the text of one."""

from __future__ import annotations

from typing import Any, Tuple, Union

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
