"""Conditions over integers, and the expressions that they compare."""

from __future__ import annotations

from typing import TYPE_CHECKING, Any, Iterable, Mapping, Union

from vtsym import _vtsym
from vtsym._nodes import DEFAULT, OPERATORS, N, Node, Value, combine, in_room, literal, make, number_in
from vtsym.results import Decision, Reasons, Relation, SetDecision

if TYPE_CHECKING:
    import numpy
    import numpy.typing

    #: Values of a name, one for each row: an array, or one value for all rows.
    Column = Any

_AND = OPERATORS["And"]
_OR = OPERATORS["Or"]
_NOT = OPERATORS["Not"]

#: An operand of arithmetic and comparisons.
Operand = Union["Expression", int, float]

#: A condition, or its text in C.
AnyCondition = Union["Condition", str]


class Condition(Node):
    """A condition over integers: every name stands for an integer, and a number holds where it is not zero.

    Made by :func:`parse` or by comparing a :class:`Symbol`, and combined with ``&``, ``|`` and ``~``.  Two conditions
    are ``==`` where they have the same structure; :meth:`equivalent` decides whether they mean the same.  Immutable,
    hashable, and safe to use in several threads.

    >>> import vtsym
    >>> a, b = vtsym.Symbol("A"), vtsym.Symbol("B")
    >>> condition = (a > 2) & (a < 4) & ~(b == 0)
    >>> condition
    Condition('A>2 && A<4 && !(B==0)')
    >>> condition.simplify()
    Condition('A==3 && B!=0')
    >>> condition == vtsym.parse("A > 2 && A < 4 && !(B == 0)")
    True

    Methods that take another condition take its text in C as well.
    """

    __slots__ = ()

    def __new__(cls, text: str) -> Condition:
        return parse(text)

    def __repr__(self) -> str:
        return f"Condition({str(self)!r})"

    def __bool__(self) -> bool:
        raise TypeError(
            "a condition is neither true nor false by itself: combine conditions with & | ~, "
            "ask .must_hold() or .can_hold(), or .evaluate() it"
        )

    def __eq__(self, other: object) -> bool:
        if not isinstance(other, Condition):
            return NotImplemented
        if self._table is other._table:
            return self._id == other._id
        return hash(self) == hash(other) and self._id == self._table.adopt(other._table, other._id)

    def __hash__(self) -> int:
        return self._table.hash(self._id)

    def __reduce__(self) -> tuple[Any, ...]:
        return _restored_condition, (self._table.structure(self._id),)

    # Combining

    def __and__(self, other: Condition | Expression | bool) -> Condition:
        """Both hold.  An expression holds where it is not zero."""
        if type(other) is not Condition:
            if not isinstance(other, (Node, bool)):
                return NotImplemented
            other = self._truth(other)
        return combine(Condition, _AND, self, other)

    def __rand__(self, other: Expression | bool) -> Condition:
        return combine(Condition, _AND, self._truth(other), self)

    def __or__(self, other: Condition | Expression | bool) -> Condition:
        """One of them holds, or both."""
        if type(other) is not Condition:
            if not isinstance(other, (Node, bool)):
                return NotImplemented
            other = self._truth(other)
        return combine(Condition, _OR, self, other)

    def __ror__(self, other: Expression | bool) -> Condition:
        return combine(Condition, _OR, self._truth(other), self)

    def __invert__(self) -> Condition:
        """The opposite."""
        return combine(Condition, _NOT, self, self)

    def _truth(self, other: Node | bool) -> Condition:
        if isinstance(other, Node):
            return make(Condition, other._table, other._id)
        return make(Condition, self._table, self._table.truth(other))

    def _beside(self, other: AnyCondition) -> tuple[_vtsym.Table, int, int]:
        """A table with room, and the numbers of this condition and another one in it."""
        table, number = in_room(self)
        if isinstance(other, str):
            return table, number, table.parse(other, False)
        if not isinstance(other, Node):
            raise TypeError(f"a condition or its text is needed, not {type(other).__name__}")
        return table, number, number_in(table, other)

    # Rewriting

    @property
    def is_true(self) -> bool:
        """Whether this is the constant that always holds; :meth:`must_hold` decides of any condition."""
        return self._id == self._table.truth(True)

    @property
    def is_false(self) -> bool:
        """Whether this is the constant that never holds."""
        return self._id == self._table.truth(False)

    def simplify(self) -> Condition:
        """The normal form, a sum of products of comparisons.

        >>> import vtsym
        >>> str(vtsym.parse("A < 3 || A > 3").simplify())
        'A!=3'
        """
        table, number = in_room(self)
        return make(Condition, table, table.simplify(number))

    def shortest(self) -> Condition:
        """The shortest form found that is proven equal for all integers.

        >>> import vtsym
        >>> str(vtsym.parse("A*2 > B && B > A*2 - 2").shortest())
        '2*A==B+1'
        """
        table, number = in_room(self)
        return make(Condition, table, table.shortest(number))

    def given(self, known: AnyCondition) -> Condition:
        """The shortest form found that is equal wherever ``known`` holds.

        >>> import vtsym
        >>> str(vtsym.parse("Mode != 2 && (Mode > 2 || Sport)").given("Mode == 1 || Mode == 2"))
        'Mode!=2 && Sport'
        """
        table, number, fact = self._beside(known)
        return make(Condition, table, table.given(number, fact))

    def replace(self, replacements: Mapping[str, str | Operand]) -> Condition:
        """The condition with names replaced, all at once, by other names, numbers or expressions.

        >>> import vtsym
        >>> str(vtsym.parse("A > B").replace({"A": "B", "B": 7}))
        'B>7'
        """
        return _replaced(self, replacements)

    # Deciding

    def can_hold(self) -> Decision:
        """Whether there are values for which it holds.

        >>> import vtsym
        >>> vtsym.parse("A > 17 && A < 391 && A*B == 391").can_hold().witness
        {'A': 23, 'B': 17}
        """
        table, number = in_room(self)
        return Decision._of(table.can_hold(number))

    def must_hold(self) -> Decision:
        """Whether it holds for all values."""
        table, number = in_room(self)
        return Decision._of(table.must_hold(number))

    def implies(self, other: AnyCondition) -> Decision:
        """Whether the other one holds wherever this one does."""
        table, a, b = self._beside(other)
        return Decision._of(table.implies(a, b))

    def equivalent(self, other: AnyCondition) -> Decision:
        """Whether both hold for the same values.

        >>> import vtsym
        >>> bool(vtsym.parse("A > 2 && A < 4").equivalent("A == 3"))
        True
        """
        table, a, b = self._beside(other)
        return Decision._of(table.equivalent(a, b))

    def disjoint(self, other: AnyCondition) -> Decision:
        """Whether the two never hold together."""
        table, a, b = self._beside(other)
        return Decision._of(table.disjoint(a, b))

    def compare(self, other: AnyCondition) -> Relation:
        """How the two relate, with the values that prove it and the operands that force it.

        >>> import vtsym
        >>> relation = vtsym.parse("Mode == 1 && Gear > 2").compare("Sport && Gear <= 1")
        >>> relation.kind, relation.reasons.operands
        ('disjoint', (Condition('Gear>2'), Condition('Gear<=1')))
        """
        table, a, b = self._beside(other)
        kind, bound, first, second, both = table.compare(a, b)
        reasons: Reasons | None = None
        if kind == "disjoint":
            reasons = _reasons(table, table.why_disjoint([a, b]))
        elif kind == "implies":
            reasons = _reasons(table, table.why_implies(a, b))
        elif kind == "implied by":
            reasons = _reasons(table, table.why_implies(b, a))
        return Relation(kind, bound, Decision._of(first), Decision._of(second), Decision._of(both), reasons)

    # Evaluating

    def evaluate(self, values: Mapping[str, Value] | None = None, /, **named: Value) -> bool:
        """Whether it holds for these values; names that it does not have are ignored.

        Integers have 32 bits here: sums wrap, quotients are cut.  Members are named in a mapping.

        >>> import vtsym
        >>> vtsym.parse("A > 1 && s.gear == 2").evaluate({"s.gear": 2}, A=3)
        True
        """
        result = self._run(named if values is None else {**values, **named})
        if isinstance(result, list):
            raise TypeError("a list is neither true nor false")
        return bool(result)

    def evaluate_many(self, columns: Mapping[str, Column]) -> numpy.typing.NDArray[numpy.bool_]:
        """Whether it holds, for each row of columns of values.

        Columns are arrays of one dimension and one length, of ``bool``, ``int32``, ``int64`` or ``float64``; they are
        read where they are.  A number stands for a column with this number in all rows.

        >>> import numpy, vtsym
        >>> vtsym.parse("A > B").evaluate_many({"A": numpy.array([1, 2, 3]), "B": 2})
        array([False, False,  True])
        """
        result = self._run_many(columns)
        if result.dtype == bool:
            return result  # type: ignore[no-any-return]
        return result != 0  # type: ignore[no-any-return]


class Expression(Node):
    """Arithmetic over names and numbers, as a dimension or a side of a comparison.

    Operators make further expressions, comparisons make conditions.  ``/`` and ``%`` are those of C, cut toward zero,
    except where dimensions are proven or simplified, whose quotients are exact.  ``& | ^ ~ << >>`` work on bits.

    >>> import vtsym
    >>> n = vtsym.Symbol("N")
    >>> n * 2 + 1
    Expression('N*2+1')
    >>> n * 2 + 1 == 7
    Condition('N*2+1==7')
    >>> (n * 2 + 1).evaluate(N=3)
    7

    Expressions cannot be put into sets, since ``==`` makes a condition; :meth:`same_as` compares two.
    """

    __slots__ = ()
    __hash__ = None  # type: ignore[assignment]

    def __new__(cls, text: str) -> Expression:
        node = parse(text)
        return make(Expression, node._table, node._id)

    def __repr__(self) -> str:
        return f"{type(self).__name__}({str(self)!r})"

    def __bool__(self) -> bool:
        raise TypeError("an expression is neither true nor false by itself: compare it, or ask .nonzero()")

    def __reduce__(self) -> tuple[Any, ...]:
        return _restored_expression, (type(self), self._table.structure(self._id))

    def _operand(self, other: Operand) -> Node | None:
        """Another operand; nothing for what is none."""
        if isinstance(other, Expression):
            return other
        if isinstance(other, (int, float)):
            table = self._table
            number = literal(table, other)
            while number < 0:
                table, _ = in_room(self)
                number = literal(table, other)
            return make(Expression, table, number)
        return None

    def _infix(self, op: int, other: Operand) -> Expression:
        operand = self._operand(other)
        if operand is None:
            return NotImplemented
        return combine(Expression, op, self, operand)

    def _reflected(self, op: int, other: Operand) -> Expression:
        operand = self._operand(other)
        if operand is None:
            return NotImplemented
        return combine(Expression, op, operand, self)

    def _compared(self, op: int, other: Operand) -> Condition:
        operand = self._operand(other)
        if operand is None:
            return NotImplemented
        return combine(Condition, op, self, operand)

    def __eq__(self, other: Operand) -> Condition:  # type: ignore[override]
        return self._compared(_EQUAL, other)

    def __ne__(self, other: Operand) -> Condition:  # type: ignore[override]
        return self._compared(_NOT_EQUAL, other)

    def __lt__(self, other: Operand) -> Condition:
        return self._compared(_LESS, other)

    def __le__(self, other: Operand) -> Condition:
        return self._compared(_LESS_EQUAL, other)

    def __gt__(self, other: Operand) -> Condition:
        return self._compared(_GREATER, other)

    def __ge__(self, other: Operand) -> Condition:
        return self._compared(_GREATER_EQUAL, other)

    def __add__(self, other: Operand) -> Expression:
        return self._infix(_PLUS, other)

    def __radd__(self, other: Operand) -> Expression:
        return self._reflected(_PLUS, other)

    def __sub__(self, other: Operand) -> Expression:
        return self._infix(_MINUS, other)

    def __rsub__(self, other: Operand) -> Expression:
        return self._reflected(_MINUS, other)

    def __mul__(self, other: Operand) -> Expression:
        return self._infix(_TIMES, other)

    def __rmul__(self, other: Operand) -> Expression:
        return self._reflected(_TIMES, other)

    def __truediv__(self, other: Operand) -> Expression:
        return self._infix(_DIVIDE, other)

    def __rtruediv__(self, other: Operand) -> Expression:
        return self._reflected(_DIVIDE, other)

    def __mod__(self, other: Operand) -> Expression:
        return self._infix(_MODULO, other)

    def __rmod__(self, other: Operand) -> Expression:
        return self._reflected(_MODULO, other)

    def __and__(self, other: Operand) -> Expression:
        return self._infix(_BIT_AND, other)

    def __rand__(self, other: int) -> Expression:
        return self._reflected(_BIT_AND, other)

    def __or__(self, other: Operand) -> Expression:
        return self._infix(_BIT_OR, other)

    def __ror__(self, other: int) -> Expression:
        return self._reflected(_BIT_OR, other)

    def __xor__(self, other: Operand) -> Expression:
        return self._infix(_BIT_XOR, other)

    def __rxor__(self, other: int) -> Expression:
        return self._reflected(_BIT_XOR, other)

    def __lshift__(self, other: Operand) -> Expression:
        return self._infix(_SHIFT_LEFT, other)

    def __rlshift__(self, other: int) -> Expression:
        return self._reflected(_SHIFT_LEFT, other)

    def __rshift__(self, other: Operand) -> Expression:
        return self._infix(_SHIFT_RIGHT, other)

    def __rrshift__(self, other: int) -> Expression:
        return self._reflected(_SHIFT_RIGHT, other)

    def __neg__(self) -> Expression:
        return combine(Expression, _NEGATE, self, self)

    def __invert__(self) -> Expression:
        return combine(Expression, _COMPLEMENT, self, self)

    def nonzero(self) -> Condition:
        """The condition that it is not zero, written as the expression itself.

        >>> import vtsym
        >>> vtsym.Symbol("Sport").nonzero() & (vtsym.Symbol("Gear") > 2)
        Condition('Sport && Gear>2')
        """
        return make(Condition, self._table, self._id)

    def same_as(self, other: Expression) -> bool:
        """Whether both have the same structure."""
        return self._id == number_in(self._table, other)

    def simplify(self) -> Expression:
        """The simplified form, in which quotients are exact.

        >>> import vtsym
        >>> str((vtsym.Symbol("A") - vtsym.Symbol("B") + vtsym.Symbol("A")).simplify())
        '2*A-B'
        """
        table, number = in_room(self)
        return make(Expression, table, table.simplify(number))

    def factored(self) -> Expression:
        """The form in which divisions are pulled outwards, as quotients of dimensions are exact.

        >>> import vtsym
        >>> str(vtsym.dimension("N*2 + N/3").factored())
        '(N*2*3+N)/3'
        """
        table, number = in_room(self)
        return make(Expression, table, table.factored(number))

    def replace(self, replacements: Mapping[str, str | Operand]) -> Expression:
        """The expression with names replaced, all at once; see :meth:`Condition.replace`."""
        return _replaced(make(Expression, self._table, self._id), replacements)

    def evaluate(self, values: Mapping[str, Any] | None = None, /, **named: Any) -> Any:
        """The value: a bool, an int, a float, or a list of these for a list of dimensions.

        Integers have 32 bits: sums wrap, quotients are cut.

        >>> import vtsym
        >>> vtsym.dimension("[N, N*2]").evaluate(N=3)
        [3, 6]
        """
        return self._run(named if values is None else {**values, **named})

    def evaluate_many(self, columns: Mapping[str, Column]) -> numpy.typing.NDArray[Any]:
        """The value for each row of columns; see :meth:`Condition.evaluate_many`.

        >>> import numpy, vtsym
        >>> (vtsym.Symbol("N") * 2 + 1).evaluate_many({"N": numpy.array([1, 2, 3])})
        array([3, 5, 7], dtype=int32)
        """
        return self._run_many(columns)  # type: ignore[no-any-return]


class Symbol(Expression):
    """A name, or a member ``owner.field``.

    >>> import vtsym
    >>> vtsym.Symbol("Gear") > 2
    Condition('Gear>2')
    """

    __slots__ = ()

    def __new__(cls, name: str) -> Symbol:
        table = DEFAULT.get()
        return make(cls, table, table.symbol(name))

    @property
    def name(self) -> str:
        """The name."""
        return str(self)


def parse(text: str, lang: str = "c") -> Condition:
    """The condition of a text in C (``"c"``) or in Quill (``"quill"``).

    Raises :class:`~vtsym.ParseError` for a text that is not a condition.

    >>> import vtsym
    >>> vtsym.parse("A > 1 && B")
    Condition('A>1 && B')
    >>> vtsym.parse("A ~= 1 && B", lang="quill").to("c")
    'A!=1 && B'
    """
    return parse_in(DEFAULT.get(), text, lang)


def parse_in(table: _vtsym.Table, text: str, lang: str) -> Condition:
    """The condition of a text in a table."""
    if lang not in ("c", "quill"):
        raise ValueError(f"there is no language {lang!r}: use 'c' or 'quill'")
    return make(Condition, table, table.parse(text, lang == "quill"))


def dimension(text: str) -> Expression:
    """The dimension expression of a text in Quill; its numbers are integers.

    >>> import vtsym
    >>> vtsym.dimension("N*2 + M/3")
    Expression('N*2+M/3')
    """
    table = DEFAULT.get()
    return make(Expression, table, table.parse_dimension(text))


def covers(conditions: Iterable[Condition]) -> SetDecision:
    """Whether some condition of a set holds for all values; a witness is left out by all.

    >>> import vtsym
    >>> vtsym.covers([vtsym.parse("A < 3"), vtsym.parse("A > 3")]).decision.witness
    {'A': 3}
    """
    return _about_set(conditions, "covers")


def disjoint(conditions: Iterable[Condition]) -> SetDecision:
    """Whether no two conditions of a set hold together.

    >>> import vtsym
    >>> overlap = vtsym.disjoint([vtsym.parse("A < 3"), vtsym.parse("A > 5"), vtsym.parse("A > 1")])
    >>> overlap.members, overlap.decision.witness
    ((0, 2), {'A': 2})
    """
    return _about_set(conditions, "all_disjoint")


def _about_set(conditions: Iterable[Condition], question: str) -> SetDecision:
    members = list(conditions)
    table = in_room(members[0])[0] if members else DEFAULT.get()
    raw, pair = getattr(table, question)([number_in(table, member) for member in members])
    return SetDecision(Decision._of(raw), pair)


def _reasons(table: _vtsym.Table, raw: tuple[bool, bool, list[int]]) -> Reasons | None:
    is_proven, is_minimal, operands = raw
    return Reasons(tuple(make(Condition, table, each) for each in operands), is_minimal) if is_proven else None


def _replaced(node: N, replacements: Mapping[str, str | Operand]) -> N:
    table, number = in_room(node)
    numbers: dict[int, int] = {}
    for name, value in replacements.items():
        if isinstance(value, str):
            other = table.symbol(value)
        elif isinstance(value, Node):
            other = number_in(table, value)
        else:
            room = DEFAULT.get()
            other = table.adopt(room, literal(room, value))
        numbers[table.symbol(name)] = other
    return make(type(node), table, table.replace(number, numbers))


def _restored_condition(parts: list[tuple[int, Any, list[int]]]) -> Condition:
    table = DEFAULT.get()
    return make(Condition, table, table.restore(parts))


def _restored_expression(kind: type[Expression], parts: list[tuple[int, Any, list[int]]]) -> Expression:
    table = DEFAULT.get()
    return make(kind, table, table.restore(parts))


_PLUS = OPERATORS["Plus"]
_MINUS = OPERATORS["Minus"]
_NEGATE = OPERATORS["UnaryMinus"]
_TIMES = OPERATORS["Multiply"]
_DIVIDE = OPERATORS["Divide"]
_MODULO = OPERATORS["Modulo"]
_EQUAL = OPERATORS["Equal"]
_NOT_EQUAL = OPERATORS["NotEqual"]
_LESS = OPERATORS["LessThan"]
_LESS_EQUAL = OPERATORS["LessThanEqual"]
_GREATER = OPERATORS["GreaterThan"]
_GREATER_EQUAL = OPERATORS["GreaterThanEqual"]
_BIT_AND = OPERATORS["BitAnd"]
_BIT_OR = OPERATORS["BitOr"]
_BIT_XOR = OPERATORS["BitXOr"]
_COMPLEMENT = OPERATORS["BitCompl"]
_SHIFT_LEFT = OPERATORS["ShiftLeft"]
_SHIFT_RIGHT = OPERATORS["ShiftRight"]
