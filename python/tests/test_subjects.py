"""Dimensions, models, scanning, errors, and threads."""

from __future__ import annotations

import json
import os
import pickle
import subprocess
import sys
import threading
from pathlib import Path

import pytest
from conftest import ROOT, cases

import vtsym
from vtsym import Context, Symbol


def test_dimensions() -> None:
    context = Context(assume=["N >= 4", "N % 4 == 0"])
    n = context.dimension("N")
    assert context.is_divisible(n * 3, 12) and not context.is_divisible(n, 8)
    assert context.prove("N/2 >= 2") and context.is_non_negative(n - 4)
    refuted = context.prove("N >= 5")
    assert refuted.answer is False and refuted.witness == {"N": 4}
    assert context.order(n / 2, context.dimension("N/4 + N/4")) == "=="
    assert context.order(n, context.dimension("M")) == "?"
    assert context.order(n, Symbol("N") + 1) == "<"
    assert str(vtsym.dimension("N*2 + N/3").factored()) == "(N*2*3+N)/3"


def messages_of_the_program(*arguments: str) -> list[str]:
    done = subprocess.run([sys.executable, "-m", "vtsym", *arguments], cwd=ROOT, capture_output=True, text=True)
    return done.stdout.splitlines()


def test_models_have_the_findings_of_the_program() -> None:
    path = "examples/model.json"
    model = vtsym.Model.load(ROOT / path)
    report = model.check()
    assert [f"{path}:{finding}" for finding in report] == messages_of_the_program("check", path)
    assert len(report) == len(report.findings) and not report.problems
    again = vtsym.Model(json.loads((ROOT / path).read_text())).check()
    assert [finding.message for finding in again] == [finding.message for finding in report]
    assert model.name == "Vehicle" and model.language == "c"
    assert vtsym.Block("Engine/Petrol", "FUEL == 1 && POWER >= 0", 9, True) in model.blocks


def test_models_under_assumptions_and_with_reasons() -> None:
    model = vtsym.Model({"blocks": [{"name": "E", "choices": [{"name": "P", "condition": "F == 1"}]}]})
    [missing] = model.check(why=True)
    assert missing.kind == "missing" and missing.witness == "F=0" and missing.path == "E"
    assert [f.kind for f in model.check(assume=["F == 1"])] == ["always-active"]
    assert model.check(assume=["F =="]).problems
    assert pickle.loads(pickle.dumps(missing)) == missing


def test_wrong_models() -> None:
    with pytest.raises(vtsym.ModelError, match="^line 2: ") as caught:
        vtsym.Model('{"blocks":\n [{"name": 1}]}')
    assert caught.value.line == 2
    with pytest.raises(OSError, match="none.json"):
        vtsym.Model.load("none.json")


def test_scanning_finds_what_the_program_finds() -> None:
    kinds = {"dead": "dead", "always": "always-true", "removable": "removable", "spelled-out": "spelled-out"}
    for name, text, *rest in cases("scan-findings.txt", "findings"):
        language = rest[1] if len(rest) > 1 else ""
        if language == "strict":
            continue
        wanted = [line.split(" ")[:2] for line in (rest[0] if rest else "").split("\n") if line]
        found = vtsym.scan_text(text, is_cpp=language == "C++", spelled_out=True)
        assert [[str(f.line), f.kind] for f in found] == [[line, kinds[kind]] for line, kind in wanted], name


def test_scanning_folders(tmp_path: Path) -> None:
    dead = b"#ifdef A\n#elif defined A // \xe4\n#endif\n"
    (tmp_path / "b.c").write_bytes(dead)
    (tmp_path / os.fsdecode(b"\xff.h")).write_bytes(dead)
    (tmp_path / "a.txt").write_bytes(dead)
    (tmp_path / "c.c").mkdir()
    found = list(vtsym.scan(tmp_path))
    assert sorted(os.fsencode(Path(f.file).name) for f in found) == [b"b.c", b"\xff.h"]
    assert found[0].directive == "#elif defined A" and not found[0].reasons[0].holds
    with pytest.raises(vtsym.SourceError, match="missing.c"):
        list(vtsym.scan([tmp_path / "missing.c"]))
    problems: list[str] = []
    assert len(list(vtsym.scan([tmp_path / "missing.c", tmp_path], on_problem=lambda *p: problems.append(p[0])))) == 2
    assert problems == [str(tmp_path / "missing.c")]


def test_errors_show_their_place() -> None:
    for text, offset in (("A > && B", 2), ("é + 'x'", 0), ("A == 1 &&", 7), ("A\0B", 1), ("(" * 300, 256), ("1" * 20, 0)):
        with pytest.raises(vtsym.ParseError) as caught:
            vtsym.parse(text)
        error = caught.value
        assert error.offset == offset and error.text == text, text
        assert str(error) == f"{error.message}\n{error.caret}" and error.caret.count("\n") == 1
        assert pickle.loads(pickle.dumps(error)).args == error.args
    with pytest.raises(vtsym.ParseError) as caught:
        vtsym.dimension("N + + ü")
    assert isinstance(caught.value, ValueError) and isinstance(caught.value, vtsym.VtsymError)
    for name in ("A + 1", "true", "1", "", "A B"):
        with pytest.raises(ValueError):
            Symbol(name)
    with pytest.raises(ValueError, match="'basic'"):
        vtsym.parse("A", lang="basic")
    with pytest.raises(TypeError):
        vtsym.parse("A").implies(3)  # type: ignore[arg-type]


def run_in_threads(work: list[object]) -> None:
    failures: list[BaseException] = []

    def guarded(job: object) -> None:
        try:
            job()  # type: ignore[operator]
        except BaseException as error:
            failures.append(error)

    threads = [threading.Thread(target=guarded, args=(job,)) for job in work]
    for thread in threads:
        thread.start()
    for thread in threads:
        thread.join()
    if failures:
        raise failures[0]


def test_threads_share_conditions() -> None:
    shared = vtsym.parse("A > 3 && (B || C < 7)")
    contexts = [Context(assume=["A < 50"]), Context()]

    def job(number: int) -> None:
        symbol = Symbol("A")
        for i in range(150):
            own = (symbol == i) | shared if i % 3 else shared & contexts[number % 2].parse(f"A < {i}")
            assert own.evaluate(A=5, B=1, C=0) is not None
            assert pickle.loads(pickle.dumps(own)) == own
            assert own.simplify().equivalent(own)
            assert vtsym.Model({"blocks": [{"name": "E", "condition": f"X > {i} && X < {i}"}]}).check()

    run_in_threads([lambda number=number: job(number) for number in range(8)])


def test_long_work_lets_other_threads_run(tmp_path: Path) -> None:
    # Reading the pipe ends only when another thread of the same process can write to it.
    script = """
import os, sys, threading, vtsym
threading.Thread(target=lambda: open(sys.argv[1], "wb").write(b"#ifdef A\\n#elif defined A\\n#endif\\n")).start()
print([finding.kind for finding in vtsym.scan(sys.argv[1])])
"""
    os.mkfifo(tmp_path / "pipe.c")
    command = [sys.executable, "-c", script, str(tmp_path / "pipe.c")]
    done = subprocess.run(command, capture_output=True, text=True, timeout=100, check=True)
    assert done.stdout == "['dead']\n"
