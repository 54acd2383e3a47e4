"""The examples of the docstrings and of the README."""

from __future__ import annotations

import doctest
import importlib
import pkgutil

import pytest
from conftest import ROOT

import vtsym

MODULES = sorted(
    {module.name for module in pkgutil.iter_modules(vtsym.__path__, "vtsym.")} - {"vtsym._vtsym", "vtsym.__main__"}
) + ["vtsym"]


@pytest.fixture(autouse=True)
def in_the_root(monkeypatch: pytest.MonkeyPatch) -> None:
    monkeypatch.chdir(ROOT)


@pytest.mark.parametrize("name", MODULES)
def test_docstrings(name: str) -> None:
    result = doctest.testmod(importlib.import_module(name), optionflags=doctest.IGNORE_EXCEPTION_DETAIL)
    assert result.failed == 0


def test_readme() -> None:
    result = doctest.testfile(str(ROOT / "python/README.md"), module_relative=False)
    assert result.attempted > 10 and result.failed == 0


def test_public_names_are_documented() -> None:
    for name in vtsym.__all__:
        member = getattr(vtsym, name)
        if isinstance(member, type):
            public = {n: m for n, m in vars(member).items() if not n.startswith("_") and callable(m)}
            for each in (member, *public.values()):
                assert each.__doc__, each
        elif callable(member):
            assert member.__doc__ and ">>>" in member.__doc__, name
