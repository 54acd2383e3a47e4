"""The stub of the C++ module names the functions that there are, with the arguments that they take."""

from __future__ import annotations

import ast
import re
from pathlib import Path
from typing import Iterable

import vtsym
from vtsym import _vtsym


def public(names: Iterable[str]) -> set[str]:
    return {name for name in names if not name.startswith("_")}


def test_stub_agrees_with_the_module() -> None:
    stub = ast.parse((Path(vtsym.__file__).parent / "_vtsym.pyi").read_text())
    checked = 0
    for owner in [stub, *(node for node in stub.body if isinstance(node, ast.ClassDef))]:
        runtime = getattr(_vtsym, owner.name) if isinstance(owner, ast.ClassDef) else _vtsym
        for node in owner.body:
            if not isinstance(node, ast.FunctionDef) or any(ast.unparse(d) == "property" for d in node.decorator_list):
                continue
            signature = re.match(r"\w+\((.*)\) ->", getattr(runtime, node.name).__doc__ or "")
            assert signature, node.name
            names = re.findall(r"(\w+): ", re.sub(r"\[[^\]]*\]", "", signature[1]))
            assert [n for n in names if n != "self"] == [a.arg for a in node.args.args if a.arg != "self"], node.name
            checked += 1
        names_of_stub = {n.name for n in owner.body if isinstance(n, (ast.FunctionDef, ast.ClassDef))}
        names_of_stub |= {n.target.id for n in owner.body if isinstance(n, ast.AnnAssign) and isinstance(n.target, ast.Name)}
        assert public(names_of_stub) == public(vars(runtime)), runtime
    assert checked > 40
