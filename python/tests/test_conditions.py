"""Conditions: building, identity, rewriting and deciding, against the tables of the C++ tests and Python's own sums."""

from __future__ import annotations

import copy
import itertools
import pickle
import subprocess
import sys

import pytest
from conftest import RandomConditions, cases

import vtsym
from vtsym import Condition, Context, Symbol


def test_simplified_forms() -> None:
    for text, wanted in cases("simplify.txt", "conditions"):
        assert str(vtsym.parse(text).simplify()).replace(" ", "") == wanted.replace(" ", ""), text


def shown(decision: vtsym.Decision) -> str:
    answer = {True: "yes", False: "no", None: f"undecided {decision.bound}"}[decision.answer]
    if decision.answer is None:
        return answer
    if decision.witness is None:
        return answer
    return ": ".join([answer, " ".join(f"{name}={value}" for name, value in decision.witness.items())])


def fits(decision: vtsym.Decision, wanted: str) -> bool:
    """A table says nothing of a witness without names."""
    return shown(decision).strip(": ") == wanted.strip(": ")


@pytest.mark.parametrize("bits", [None, 32])
def test_decisions_of_one(bits: int | None) -> None:
    context = Context(bits=bits)
    for text, can_hold, must_hold in cases("decide.txt", "of one, in 32 bits" if bits else "of one"):
        condition = context.parse(text)
        assert fits(condition.can_hold(), can_hold), (text, condition.can_hold())
        assert fits(condition.must_hold(), must_hold), (text, condition.must_hold())


def test_decisions_of_two() -> None:
    rows = [row + [""] for row in cases("decide.txt", "linear")] + cases("decide.txt", "of two")
    for first, second, kind, only_first, only_second, both in rows:
        relation = vtsym.parse(first).compare(second)
        assert relation.kind == kind, (first, second)
        assert fits(relation.only_first, only_first) and fits(relation.only_second, only_second), (first, second)
        assert not both or fits(relation.both, both), (first, second)


def test_decisions_of_sets() -> None:
    for row in cases("decide.txt", "of sets"):
        covers, disjoint, pair, *texts = row if len(row) > 2 else [*row, ""]
        conditions = [vtsym.parse(text) for text in texts]
        assert fits(vtsym.covers(conditions).decision, covers), texts
        answer = vtsym.disjoint(conditions)
        assert fits(answer.decision, disjoint), texts
        assert " ".join(map(str, answer.members or ())) == pair, texts
    assert not vtsym.covers([]) and vtsym.disjoint([])


def test_relations_name_their_reasons() -> None:
    relation = vtsym.parse("Gear > 3 && Sport && Mode == 1").compare("Mode < 2 && Gear != 3")
    assert relation.kind == "implies" and relation.reasons is not None and relation.reasons.is_minimal
    assert sorted(map(str, relation.reasons.operands)) == ["Gear>3", "Mode==1"]
    assert vtsym.parse("A > 1").compare("A < 5").reasons is None
    assert bool(relation.only_second) and not relation.only_first
    with pytest.raises(ValueError, match="undecided.*linear"):
        bool(vtsym.parse("A*A == 2").can_hold())


GRID = list(itertools.product(range(-3, 4), repeat=3))


def test_operators_mean_what_pythons_do(random_conditions: RandomConditions) -> None:
    symbols = {name: Symbol(name) for name in "abc"}
    for _ in range(60):
        text = random_conditions.condition(3)
        condition = eval(text, {}, symbols)
        code = compile(text.replace("~", "1 - "), text, "eval")
        truths = [bool(eval(code, {}, dict(zip("abc", point)))) for point in GRID]
        for form in (condition, condition.simplify(), condition.shortest(), pickle.loads(pickle.dumps(condition))):
            prepared = [form.evaluate(a=a, b=b, c=c) for a, b, c in GRID]
            assert prepared == truths, (text, str(form))
        assert vtsym.parse(str(condition)).equivalent(condition)
        assert vtsym.parse(condition.to("quill"), lang="quill").equivalent(condition)
        witness = condition.can_hold().witness
        assert (witness is not None) or not any(truths)
        if witness is not None and all(abs(value) < 2**20 for value in witness.values()):
            assert condition.evaluate({"a": 0, "b": 0, "c": 0, **witness})


def test_given_agrees_where_the_known_one_holds(random_conditions: RandomConditions) -> None:
    for _ in range(20):
        first, known = (eval(random_conditions.condition(2), {}, {n: Symbol(n) for n in "abc"}) for _ in "12")
        shorter = first.given(known)
        assert (known & first).equivalent(known & shorter)
        assert len(str(shorter)) <= max(len(str(first)), len("false"))


def test_identity_is_structure_in_every_table() -> None:
    text = "A > 1 && f(s.gear, [1, 2]) || !(B + 2.5 == C)"
    one, other = vtsym.parse(text), Context().parse(text)
    assert one == other and hash(one) == hash(other) and one != Context().parse("A > 1") and one != text
    assert len({one, other, vtsym.parse(text), copy.deepcopy(other)}) == 1
    assert (one & other) == (one & one) and (Symbol("A") > 1) == vtsym.parse("A > 1")
    assert vtsym.parse("A == 1").__ne__(vtsym.parse("A == 2")) is True


@pytest.mark.parametrize("file, section", [("simplify.txt", "conditions"), ("decide.txt", "linear")])
def test_pickles_are_the_same_structure(file: str, section: str) -> None:
    for text, *_ in cases(file, section):
        condition = vtsym.parse(text)
        assert pickle.loads(pickle.dumps(condition)) == condition, text
    for text in ["[a b; 1:3 d]", "f.g(1)'", "{1, 2}", "@(x) x + 1", "a.^2 .* b"]:
        condition = vtsym.parse(text, lang="quill")
        assert pickle.loads(pickle.dumps(condition)) == condition, text


def test_pickles_of_deep_conditions() -> None:
    deep = Symbol("A") > 0
    for _ in range(100_000):
        deep = ~deep & (Symbol("A") > 0)
    assert pickle.loads(pickle.dumps(deep)) == deep


def test_pickles_of_another_process() -> None:
    script = "import pickle, sys, vtsym; sys.stdout.buffer.write(pickle.dumps(vtsym.parse('A > 1 && B')))"
    data = subprocess.run([sys.executable, "-c", script], check=True, capture_output=True).stdout
    assert pickle.loads(data) == vtsym.parse("A > 1 && B")


def test_a_condition_has_no_truth() -> None:
    condition = Symbol("A") > 1
    for wrong in (lambda: bool(condition), lambda: 0 < Symbol("A") < 3, lambda: bool(Symbol("A")), lambda: {Symbol("A")}):
        with pytest.raises(TypeError):
            wrong()
    for wrong_operand in (lambda: condition & 1, lambda: condition | "A", lambda: Symbol("A") + "1"):
        with pytest.raises(TypeError):
            wrong_operand()


def test_expressions_stand_for_their_truth_beside_conditions() -> None:
    a, b = Symbol("A"), Symbol("B")
    assert str((a > 1) & b) == "A>1 && B" and str(b & (a > 1)) == "B && A>1" and str(a & b) == "A&B"
    assert ((a > 1) & True) == (a > 1) and ((a > 1) | True).is_true and (False & (a > 1)).is_false
    assert str(3 - a) == "3-A" and str(1 < a) == "A>1" and str(-(a << 2)) == "-(A<<2)" and str(~a % 3) == "~A%3"


def test_numbers_beyond_bounds_are_refused() -> None:
    for value, error in ((2**31, OverflowError), (-(2**31) - 1, OverflowError), (float("nan"), ValueError)):
        with pytest.raises(error):
            Symbol("A") > value
    assert str(Symbol("A") == -(2**31)) == "A==-2147483648"


def test_replacing() -> None:
    condition = vtsym.parse("A > B && s.gear == 2 && f(A)")
    replaced = condition.replace({"A": "B", "B": Symbol("A") + 1, "s.gear": 2.5})
    assert str(replaced) == "B>A+1 && 2.5==2 && f(B)"
    assert condition.symbols == ("A", "B", "s.gear") and str(vtsym.parse("A").replace({"A": 3})) == "3"


def test_assumptions() -> None:
    context = Context(assume=["N >= 1", "N <= 64"])
    assert context.parse("N != 65").must_hold() and not vtsym.parse("N != 65").must_hold()
    assert [str(condition) for condition in context.assumptions] == ["N>=1", "N<=64"]
    relation = context.parse("N > 60").compare("N < 70")
    assert relation.kind == "implies" and relation.reasons and [str(o) for o in relation.reasons.operands] == ["N<=64"]
    with pytest.raises(ValueError, match="contradict each other: N>=1, N<0"):
        context.assume("N < 0")


def test_full_tables_are_followed_by_others() -> None:
    from vtsym import _vtsym

    context = Context()
    context._room.table = _vtsym.Table(False, 200)
    context.assume("Known > 3")
    tables = set()
    symbol = context.symbol("A")
    every = symbol == 0
    for i in range(1, 2000):
        condition = (symbol == i) & context.parse("Known > 2")
        tables.add(condition._table)
        every = every | (symbol == i)
        assert condition.equivalent(f"A == {i}")
    assert len(tables) > 5 and every.evaluate(A=1999) and not every.evaluate(A=2000)
    for i in range(2000):  # questions about what a full table holds are asked in another one
        assert (symbol > 0).implies(f"A > -{i} - 1") and not vtsym.parse("A > 0").replace({"A": i}).symbols
        tables.add((symbol > 0)._table)
    assert symbol._table.integer(123) < 0  # the full table grew no further
    assert str(every) == " || ".join(f"A=={i}" for i in range(2000))


def test_pictures() -> None:
    condition = vtsym.parse('A < 1 && f(B)')
    assert condition._repr_html_() == f"<code>A&lt;1 &amp;&amp; f(B)</code><pre>{condition.tree().replace('<', '&lt;').replace('&&', '&amp;&amp;')}</pre>"
    assert isinstance(eval(repr(condition), {"Condition": Condition}), Condition)
    assert str(vtsym.parse("true")) == "true" and vtsym.parse("").to("pp") == "1"
