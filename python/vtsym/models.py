"""Models of blocks with choices, and what is wrong with them."""

from __future__ import annotations

import json
import os
from dataclasses import dataclass
from typing import Any, Iterable, Iterator, Mapping

from vtsym import _vtsym
from vtsym.errors import SourceError


@dataclass(frozen=True)
class Block:
    """A block of a model."""

    #: Names from the top of the model, separated by ``/``.
    path: str
    #: The condition as it is written; empty without one.
    condition: str
    #: The line of its name in the file.
    line: int
    #: Whether it is a choice of the block around it.
    is_choice: bool


@dataclass(frozen=True)
class Related:
    """A condition that a finding follows from."""

    path: str
    line: int
    condition: str


@dataclass(frozen=True)
class ModelFinding:
    """Something that is wrong with a model, proven.  Its text is a message like a compiler's."""

    #: ``dead``, ``always-active``, ``redundant``, ``overlapping``, ``missing`` or ``mergeable``.
    kind: str
    #: The path of the block or port.
    path: str
    line: int
    column: int
    #: One sentence.
    message: str
    #: The condition as it is written.
    condition: str
    #: A condition to write instead.
    proposed: str | None
    #: Values that show it, as text.
    witness: str
    #: The operands that force it, where they were asked for.
    because: tuple[str, ...]
    #: Conditions around it that it follows from.
    follows: tuple[Related, ...]

    def __str__(self) -> str:
        return f"{self.line}: {self.message}"


@dataclass(frozen=True)
class Report:
    """The findings of a check.  Iterates over them."""

    findings: tuple[ModelFinding, ...]
    #: Sentences on conditions that could not be read or decided; what depends on them is missing.
    problems: tuple[str, ...]
    #: Remarks, such as the choices to remove so that no others overlap.
    notes: tuple[str, ...]

    def __iter__(self) -> Iterator[ModelFinding]:
        return iter(self.findings)

    def __len__(self) -> int:
        return len(self.findings)


class Model:
    """Nested blocks with conditions; wherever a block is active, one of its choices should be.

    >>> import vtsym
    >>> model = vtsym.Model({"blocks": [{"name": "Engine", "choices": [
    ...     {"name": "Petrol", "condition": "FUEL == 1"},
    ...     {"name": "Diesel", "condition": "FUEL > 1 && FUEL < 2"}]}]})
    >>> for finding in model.check():
    ...     print(finding.kind, finding.message, sep=": ")
    dead: Engine/Diesel is never active: FUEL > 1 && FUEL < 2 never holds
    missing: no choice of Engine is active for FUEL=0; FUEL!=1 closes the gap
    """

    def __init__(self, description: Mapping[str, Any] | str | bytes, file: str = "<model>") -> None:
        """Reads a model from a dict or from JSON text, in the form that the program's models have.

        Raises :class:`~vtsym.ModelError` where it is none.
        """
        text = json.dumps(description) if isinstance(description, Mapping) else description
        self._model = _vtsym.Model.read(text)
        self.file = file

    @classmethod
    def load(cls, path: str | os.PathLike[str]) -> Model:
        """Reads a model from a file."""
        try:
            with open(path, "rb") as file:
                return cls(file.read(), os.fspath(path))
        except OSError as error:
            raise SourceError(f"{os.fspath(path)}: cannot be read: {error.strerror}") from error

    @property
    def name(self) -> str:
        """The name of the model."""
        return self._model.name

    @property
    def language(self) -> str:
        """The language of its conditions, ``"c"`` or ``"quill"``."""
        return "quill" if self._model.is_quill else "c"

    @property
    def blocks(self) -> list[Block]:
        """All blocks, each after the block around it."""
        return [Block(*row) for row in self._model.blocks()]

    def check(
        self, *, bits: int | None = None, why: bool = False, merges: bool = False, assume: Iterable[str] = ()
    ) -> Report:
        """Finds dead, overlapping and missing choices; every finding is proven.

        ``why`` adds the operands that force each finding, ``merges`` finds choices that can be one, ``assume`` bounds
        the values, in the language of the model, and with ``bits=32`` names are signed integers of 32 bits.
        """
        if bits not in (None, 32):
            raise ValueError(f"bits is 32 or None, not {bits!r}")
        rows, problems, notes = self._model.check(self.file, bits == 32, why, merges, list(assume))
        return Report(
            tuple(map(_finding, rows)),
            tuple(f"{path}: {sentence}" if path else sentence for path, _, sentence in problems),
            tuple(notes),
        )

    def __repr__(self) -> str:
        return f"Model({self.file!r}, {len(self._model.blocks())} blocks)"


def _finding(row: _vtsym._Fault) -> ModelFinding:
    kind, path, line, column, message, condition, proposed, witness, because, follows = row
    related = tuple(Related(*each) for each in follows)
    return ModelFinding(kind, path, line, column, message, condition, proposed, witness, tuple(because), related)
