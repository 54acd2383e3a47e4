"""What questions are answered with."""

from __future__ import annotations

from dataclasses import dataclass, field
from typing import TYPE_CHECKING, Dict, Literal, Optional, Tuple

if TYPE_CHECKING:
    from vtsym.conditions import Condition

#: An assignment of integers to names that proves an answer.
Witness = Dict[str, int]

#: How two conditions relate; the first of these that is true.
RelationKind = Literal["equivalent", "disjoint", "implies", "implied by", "overlaps", "undecided"]

#: How two dimensions are ordered wherever the assumptions hold; ``"?"`` where nothing is proven.
Order = Literal["==", "<", "<=", ">", ">=", "!=", "?"]

#: Why a question stayed open: it took too many steps, or depends on arithmetic beyond linear terms.
Bound = Literal["steps", "terms"]

RawDecision = Tuple[Optional[bool], Optional[Bound], Optional[Witness]]


@dataclass(frozen=True)
class Decision:
    """An exact answer, over all integers, or none.

    A decision is true or false like its answer; an open one is neither, so that it cannot be mistaken for a no.

    >>> import vtsym
    >>> decision = vtsym.parse("A > 1").implies("A > 2")
    >>> decision.answer, decision.witness
    (False, {'A': 2})
    >>> bool(decision)
    False
    """

    #: Yes, no, or ``None`` for an open question.
    answer: bool | None
    #: Why the question is open; ``None`` for an answer.
    bound: Bound | None = None
    #: Values that prove the answer, where values can.
    witness: Witness | None = field(default=None, hash=False)

    def __bool__(self) -> bool:
        if self.answer is None:
            reason = "it takes too many steps" if self.bound == "steps" else "it depends on arithmetic beyond linear terms"
            raise ValueError(f"the question is undecided: {reason}; ask .answer")
        return self.answer

    @classmethod
    def _of(cls, raw: RawDecision) -> Decision:
        return cls(*raw)


@dataclass(frozen=True)
class Reasons:
    """Operands of the conditions asked about, and assumptions, that alone force an answer."""

    #: The operands, as they were written.
    operands: tuple[Condition, ...]
    #: Whether the answer does not follow without any one of them.
    is_minimal: bool


@dataclass(frozen=True)
class Relation:
    """How two conditions relate, with the values that prove it and the operands that force it.

    >>> import vtsym
    >>> relation = vtsym.parse("x % 2 == 1").compare("x % 2 != 0")
    >>> relation.kind
    'implies'
    >>> relation.only_second.witness
    {'x': -1}
    """

    #: The relation in a word.
    kind: RelationKind
    #: Why it is undecided; ``None`` otherwise.
    bound: Bound | None
    #: Whether the first can hold without the second.
    only_first: Decision
    #: Whether the second can hold without the first.
    only_second: Decision
    #: Whether both can hold.
    both: Decision
    #: What forces an implication or that the two are disjoint; ``None`` for other relations and where it is not proven.
    reasons: Reasons | None = None

    def __str__(self) -> str:
        return self.kind


@dataclass(frozen=True)
class SetDecision:
    """An answer about a set of conditions, with two of its members where they prove it.

    True or false like its decision.
    """

    decision: Decision
    #: Positions of two conditions that hold together.
    members: tuple[int, int] | None = None

    def __bool__(self) -> bool:
        return bool(self.decision)
