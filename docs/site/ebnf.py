"""Compact EBNF: its rules as trees.

    rule = "text" name [ optional ] { repeated } ( this | that ) "0".."9" ;

Rules whose names are in capitals are tokens: nothing may be between their parts.  Between the parts of any other rule there may be
white space.  A tree is a tuple: ("text", t), ("range", a, b), ("name", n), ("optional", x), ("repeat", x), ("all", [x, ...]),
("any", [x, ...]).  Recursive descent; a grammar is a page of text, so depth does not matter.
"""

import re

TOKEN = re.compile(r'\s*(?:"([^"]*)"|(\.\.)|(\w+)|(.))', re.S)


class Rules(dict):
    """Trees by the names of their rules, in the order of the text."""


def parse(text):
    tokens = []
    for match in TOKEN.finditer(text.rstrip()):
        kind = "text" if match[1] is not None else "name" if match[3] is not None else "sign"
        tokens.append((kind, next(group for group in match.groups() if group is not None)))
    tokens.append(("sign", ""))
    rules = Rules()
    place = 0

    def peek():
        return tokens[place]

    def take(sign=None):
        nonlocal place
        token = tokens[place]
        if sign is not None and token != ("sign", sign):
            raise ValueError(f"{sign!r} is missing before {token[1]!r}")
        place += 1
        return token

    def any_of():
        parts = [all_of()]
        while peek() == ("sign", "|"):
            take()
            parts.append(all_of())
        return parts[0] if len(parts) == 1 else ("any", parts)

    def all_of():
        parts = []
        while peek()[0] != "sign" or peek()[1] in ("[", "{", "("):
            parts.append(part())
        if not parts:
            raise ValueError(f"nothing is written before {peek()[1]!r}")
        return parts[0] if len(parts) == 1 else ("all", parts)

    def part():
        kind, value = take()
        if kind == "name":
            return ("name", value)
        if kind == "text":
            if peek() != ("sign", ".."):
                return ("text", value)
            take()
            return ("range", value, take()[1])
        inner = any_of()
        take({"[": "]", "{": "}", "(": ")"}[value])
        return {"[": ("optional", inner), "{": ("repeat", inner), "(": inner}[value]

    while peek() != ("sign", ""):
        kind, name = take()
        if kind != "name" or name in rules:
            raise ValueError(f"{name!r} is not the name of a new rule")
        take("=")
        rules[name] = any_of()
        take(";")
    missing = {name for tree in rules.values() for name in names(tree)} - set(rules)
    if missing:
        raise ValueError(f"no rules: {sorted(missing)}")
    return rules


def names(tree):
    """The rules that a tree refers to."""
    if tree[0] == "name":
        yield tree[1]
    for inner in tree[1] if tree[0] in ("all", "any") else tree[1:] if tree[0] in ("optional", "repeat") else ():
        yield from names(inner)
