"""Contexts: what is assumed while conditions are decided."""

from __future__ import annotations

from typing import Iterable, TypeVar

from vtsym._nodes import Node, Room, make, number_in
from vtsym.conditions import AnyCondition, Condition, Expression, Symbol, parse_in
from vtsym.results import Decision, Order

N = TypeVar("N", bound=Node)


class Context:
    """Conditions that are decided under assumptions, apart from those of other contexts.

    Without assumptions :func:`vtsym.parse` and :class:`vtsym.Symbol` suffice.  Assumptions count for every question
    about a condition of the context; where conditions of two contexts meet, the one of the first condition counts.

    >>> import vtsym
    >>> context = vtsym.Context(assume=["N >= 1 && N <= 64"])
    >>> bool(context.parse("N > 0").must_hold())
    True
    >>> str(context.parse("N > 0 && N < 32").shortest())
    'N<32'

    Dimensions are proven under the assumptions as well; their quotients are exact.

    >>> context = vtsym.Context(assume=["N >= 4", "N % 4 == 0"])
    >>> bool(context.prove("N*2 >= 8"))
    True
    >>> context.order(context.dimension("N/2"), context.dimension("N/4 + 1"))
    '>='

    With ``bits=32`` names are signed integers of 32 bits; integers have no bounds otherwise.
    """

    def __init__(self, assume: Iterable[AnyCondition] = (), *, bits: int | None = None) -> None:
        if bits not in (None, 32):
            raise ValueError(f"bits is 32 or None, not {bits!r}")
        self._room = Room(bits == 32)
        self._assumptions: tuple[Condition, ...] = ()
        for condition in [assume] if isinstance(assume, (str, Condition)) else assume:
            self.assume(condition)

    @property
    def assumptions(self) -> tuple[Condition, ...]:
        """What is assumed."""
        return self._assumptions

    def assume(self, condition: AnyCondition) -> None:
        """Assumes a condition from now on.

        Raises :class:`ValueError` where it contradicts what is assumed; the context answers anything then.
        """
        made = self._own(condition)
        made._table.assume(made._id)
        self._assumptions += (made,)
        all_of_them = [number_in(made._table, each) for each in self._assumptions]
        is_proven, _, operands = made._table.why_disjoint(all_of_them)
        if is_proven:
            texts = ", ".join(made._table.print(operand, "c") for operand in operands)
            raise ValueError(f"the assumptions contradict each other: {texts}")

    def parse(self, text: str, lang: str = "c") -> Condition:
        """The condition of a text; see :func:`vtsym.parse`."""
        return parse_in(self._room.get(), text, lang)

    def symbol(self, name: str) -> Symbol:
        """A name; see :class:`vtsym.Symbol`."""
        table = self._room.get()
        return make(Symbol, table, table.symbol(name))

    def dimension(self, text: str) -> Expression:
        """The dimension expression of a text in Quill; see :func:`vtsym.dimension`."""
        table = self._room.get()
        return make(Expression, table, table.parse_dimension(text))

    def prove(self, claim: AnyCondition) -> Decision:
        """Whether a claim about dimensions, comparisons joined by ``&& || !``, holds wherever the assumptions do.

        A witness breaks the claim.
        """
        made = self._own(claim)
        return Decision._of(made._table.prove(made._id))

    def is_non_negative(self, dimension: Expression) -> Decision:
        """Whether a dimension is at least 0."""
        made = self._adopted(dimension)
        return Decision._of(made._table.is_non_negative(made._id))

    def is_divisible(self, dimension: Expression, divisor: int) -> Decision:
        """Whether a dimension is a multiple of a positive integer."""
        made = self._adopted(dimension)
        return Decision._of(made._table.is_divisible(made._id, divisor))

    def order(self, first: Expression, second: Expression) -> Order:
        """The strongest order of two dimensions that is proven; ``"?"`` for none."""
        a, b = self._adopted(first), self._adopted(second)
        return a._table.order(a._id, a._table.adopt(b._table, b._id))

    def _own(self, condition: AnyCondition) -> Condition:
        return self.parse(condition) if isinstance(condition, str) else self._adopted(condition)

    def _adopted(self, node: N) -> N:
        table = self._room.get()
        return make(type(node), table, table.adopt(node._table, node._id))
