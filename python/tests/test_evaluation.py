"""Values of expressions: one assignment, and columns of any layout, against each other."""

from __future__ import annotations

import numpy
import pytest
from conftest import RandomConditions, cases

import vtsym
from vtsym import Symbol


def test_values_have_the_types_of_their_operands() -> None:
    n = Symbol("N")
    assert (n + 1).evaluate(N=2**31 - 1) == -(2**31)
    for value, wanted in ((3, 4), (True, 2), (0.5, 1.5), (numpy.int16(3), 4), (numpy.float32(0.5), 1.5), (numpy.True_, 2)):
        result = (n + 1).evaluate(N=value)
        assert result == wanted and type(result) is type(wanted)
    assert (n > 1).evaluate(N=2, M=7) is True
    assert (n * 2).evaluate({"N": [1, 2.5]}) == [2, 5.0]
    assert vtsym.parse("bitand(F, 4)", lang="quill").evaluate(F=7) is True


def test_lists_of_quill() -> None:
    for text, numbers in cases("eval.txt", "lists of Quill"):
        assert vtsym.Expression("0").evaluate() == 0
        expression = vtsym.parse(text, lang="quill")
        with pytest.raises(TypeError):
            expression.evaluate(N=3)
        assert expression._run({"N": 3}) == [int(number) for number in numbers.split()], text


def test_what_has_no_value() -> None:
    with pytest.raises(vtsym.EvaluationError, match='"B" has no value') as caught:
        vtsym.parse("A > B").evaluate(A=1)
    assert caught.value.message_id == "Vantor:SymbolicDims:UnboundSymbol"
    for wrong, error in (({"A": 2**31}, OverflowError), ({"A": "1"}, TypeError), ({"A": None}, TypeError)):
        with pytest.raises(error):
            vtsym.parse("A > 1").evaluate(wrong)
    with pytest.raises(vtsym.EvaluationError):
        vtsym.parse("f(A) > 1").evaluate(A=1)


TYPES = [numpy.bool_, numpy.int32, numpy.int64, numpy.float64]


def column(rng: numpy.random.Generator, rows: int) -> numpy.ndarray:
    """Values of any type that is read, in an array of any layout."""
    kind = TYPES[rng.integers(len(TYPES))]
    values = rng.integers(-3, 4, 2 * rows).astype(kind)
    layout = rng.integers(5)
    if layout == 0:
        return values[:rows]
    if layout == 1:
        return values[::2]
    if layout == 2:
        return values[:rows][::-1]
    if layout == 3:  # a field of records, at odd addresses
        records = numpy.zeros(rows, dtype=[("tag", "u1"), ("value", kind)])
        records["value"] = values[:rows]
        return records["value"]
    read_only = values[:rows].copy()
    read_only.flags.writeable = False
    return read_only


def test_columns_are_what_their_rows_are(random_conditions: RandomConditions) -> None:
    rng = numpy.random.default_rng(random_conditions.random.randrange(1000))
    for _ in range(40):
        text = random_conditions.condition(2)
        condition = eval(text, {}, {name: Symbol(name) for name in "abc"})
        rows = int(rng.integers(0, 40))
        columns = {name: column(rng, rows) for name in "abc"}
        answers = condition.evaluate_many(columns)
        assert answers.dtype == bool and answers.shape == (rows,)
        for row in range(rows):
            values = {name: columns[name][row] for name in "abc"}
            assert answers[row] == condition.evaluate(values), (text, values)
        number = eval(random_conditions.arithmetic(2), {}, {name: Symbol(name) for name in "abc"})
        if isinstance(number, vtsym.Expression):
            many = number.evaluate_many(columns)
            for row in range(rows):
                assert many[row] == number.evaluate({name: columns[name][row] for name in "abc"})


def test_columns_are_not_copied() -> None:
    import tracemalloc

    columns = {name: numpy.ones(1_000_000, numpy.int32) for name in "ab"}
    condition = vtsym.parse("a > 0 && b < 2")
    condition.evaluate_many(columns)
    tracemalloc.start()
    condition.evaluate_many(columns)
    _, peak = tracemalloc.get_traced_memory()
    tracemalloc.stop()
    assert peak < 1_100_000  # the answers alone


def test_columns_that_do_not_fit() -> None:
    condition = vtsym.parse("A > B")
    ones = numpy.ones(5, numpy.int64)
    wide = ones.copy()
    wide[3] = 2**31
    for columns, error, message in (
        ({"A": ones, "B": numpy.ones(4)}, ValueError, "4 rows.*5"),
        ({"A": ones, "B": numpy.ones((5, 2))}, ValueError, "2 dimensions"),
        ({"A": ones, "B": ones.astype(numpy.uint16)}, TypeError, "column B .*'H'.*int32"),
        ({"A": ones, "B": ones.astype(">i4")}, TypeError, "column B"),
        ({"A": ones, "B": numpy.array(["x"] * 5)}, TypeError, "column B"),
        ({"A": ones}, vtsym.EvaluationError, "B.*no value"),
        ({"A": 1, "B": 2}, ValueError, "no column"),
        ({"A": wide, "B": 1}, OverflowError, "2147483648 in row 3"),
    ):
        with pytest.raises(error, match=message):
            condition.evaluate_many(columns)
    with pytest.raises(ValueError):
        vtsym.dimension("[N, 2]").evaluate_many({"N": ones})
    assert condition.evaluate_many({"A": [1, 2], "B": 1, "unused": numpy.zeros(2)}).tolist() == [False, True]
    assert condition.evaluate(A=2, B=1)  # as before


def test_random_types_beside_numpy() -> None:
    rng = numpy.random.default_rng(5)
    a, b = rng.integers(-1000, 1000, (2, 10_000)).astype(numpy.int32)
    x = rng.normal(size=10_000)
    columns = {"a": a, "b": b, "x": x}
    condition = vtsym.parse("(a + b*3 > 100 || a - b < -50) && x*2.0 > x + 0.25 || !(a & 4)")
    wanted = ((a + b * 3 > 100) | (a - b < -50)) & (x * 2.0 > x + 0.25) | ((a & 4) == 0)
    assert (condition.evaluate_many(columns) == wanted).all()
