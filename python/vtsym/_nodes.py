"""Nodes of tables: what conditions and expressions have in common.

An object is a table of the library and the number of a node in it.  A table that is full makes no more nodes by
combining; the result is then made in its successor, and the full table goes with the last object that holds it, so
that endless work takes bounded memory.
"""

from __future__ import annotations

import html
from typing import TYPE_CHECKING, Any, Mapping, TypeVar, Union

from vtsym import _vtsym

if TYPE_CHECKING:
    from typing import Literal

    #: A language that conditions are written in: C, Quill, or C for a preprocessor directive.
    Language = Literal["c", "quill", "pp"]

#: A value of a name: a bool, an integer of 32 bits, or a float.
Value = Union[bool, int, float]

N = TypeVar("N", bound="Node")

#: The numbers of the library's operators.
OPERATORS = _vtsym.operators


class Node:
    """A node of a table.  Immutable; equal structures in one table have equal numbers."""

    __slots__ = ("_table", "_id", "_prepared", "__weakref__")

    _table: _vtsym.Table
    _id: int
    _prepared: _vtsym.Prepared

    def __copy__(self: N) -> N:
        return self

    def __deepcopy__(self: N, memo: object) -> N:
        return self

    def __str__(self) -> str:
        return self._table.print(self._id, "c")

    def to(self, language: Language) -> str:
        """The text in C (``"c"``), in Quill (``"quill"``), or in C as it is written after ``#if`` (``"pp"``).

        >>> import vtsym
        >>> condition = vtsym.parse("A % 4 != 0 && (B || s.gear)")
        >>> condition.to("quill")
        'rem(A,4)~=0 && (B || s.gear)'
        >>> condition.to("pp")
        'A % 4 != 0 && (B || s_gear)'
        """
        if language not in ("c", "quill", "pp"):
            raise ValueError(f"there is no language {language!r}: use 'c', 'quill' or 'pp'")
        return self._table.print(self._id, language)

    @property
    def symbols(self) -> tuple[str, ...]:
        """The names in it, members as ``owner.field``, in the order of their first occurrence.

        >>> import vtsym
        >>> vtsym.parse("B > A && f(s.gear) && B").symbols
        ('B', 'A', 's.gear')
        """
        return tuple(self._table.symbols(self._id))

    def tree(self) -> str:
        """A drawing of the structure, in lines.

        >>> import vtsym
        >>> print(vtsym.parse("A > 1 && B").tree())
        And &&
        ├─ GreaterThan >
        │  ├─ A
        │  └─ 1
        └─ B
        """
        return self._table.tree(self._id)

    def _repr_html_(self) -> str:
        """The text and the drawing, for notebooks."""
        return f"<code>{html.escape(str(self))}</code><pre>{html.escape(self.tree())}</pre>"

    def _run(self, values: Mapping[str, Any]) -> Any:
        return self._ready().run(values if type(values) is dict else dict(values))

    def _run_many(self, columns: Mapping[str, Any]) -> Any:
        import numpy

        arrays = {
            str(name): column if isinstance(column, (bool, int, float)) else numpy.asarray(column)
            for name, column in columns.items()
        }
        return self._ready().run_many(arrays)

    def _ready(self) -> _vtsym.Prepared:
        try:
            return self._prepared
        except AttributeError:
            self._prepared = self._table.prepare(self._id)
            return self._prepared


def make(kind: type[N], table: _vtsym.Table, number: int) -> N:
    """The object of a node."""
    node = object.__new__(kind)
    node._table = table
    node._id = number
    return node


def number_in(table: _vtsym.Table, node: Node) -> int:
    """The number of a node's copy in a table."""
    return node._id if node._table is table else table.adopt(node._table, node._id)


def in_room(node: Node) -> tuple[_vtsym.Table, int]:
    """The node's own table, or the successor that has room, and the node's number there."""
    table, number = node._table, node._id
    while table.is_full():
        roomier = table.successor(number)
        number = roomier.adopt(table, number)
        table = roomier
    return table, number


def combine(kind: type[N], op: int, first: Node, second: Node) -> N:
    """Makes a node of an operator; an operator of one operand takes it twice."""
    table = first._table
    made = table.combine(op, first._id, second._id) if second._table is table else -1
    while made < 0:  # another table, or a full one
        table, a = in_room(first)
        made = table.combine(op, a, number_in(table, second))
    node = object.__new__(kind)
    node._table = table
    node._id = made
    return node


def literal(table: _vtsym.Table, value: Value) -> int:
    """The number of a literal, or of a truth constant; below 0 in a full table."""
    if isinstance(value, bool):
        return table.truth(value)
    if isinstance(value, int):
        if not -(2**31) <= value < 2**31:
            raise OverflowError(f"the integer {value} does not fit 32 bits")
        return table.integer(value)
    if value != value or value in (float("inf"), float("-inf")):
        raise ValueError(f"{value} is not a number that can be written: use a finite one")
    return table.real(value)


class Room:
    """The table that new nodes are made in."""

    #: Nodes and kept decisions of a table that begins empty: some 100 MB.
    CAPACITY = 1 << 18

    def __init__(self, bits32: bool = False) -> None:
        self.table = _vtsym.Table(bits32, self.CAPACITY)

    def get(self) -> _vtsym.Table:
        """The table, or its successor once it is full."""
        if self.table.is_full():
            self.table = self.table.successor(self.table.truth(True))
        return self.table


#: The table of the package's own functions, without assumptions.
DEFAULT = Room()
