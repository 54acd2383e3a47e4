"""Scanning C and C++ sources for ``#if``s that are dead, always true or longer than they need be."""

from __future__ import annotations

import os
from dataclasses import dataclass
from typing import Callable, Iterable, Iterator, Union

from vtsym import _vtsym
from vtsym.errors import SourceError

AnyPath = Union[str, "os.PathLike[str]"]


@dataclass(frozen=True)
class Reason:
    """A directive that a finding follows from."""

    line: int
    #: As it is written: ``#if A > 2``.
    directive: str
    #: Whether it holds at the finding: true for one around it, false for one before it in its chain.
    holds: bool


@dataclass(frozen=True)
class SourceFinding:
    """A directive with a fault, proven for all values of the macros."""

    file: str
    #: ``dead``, ``always-true``, ``removable`` or ``spelled-out``.
    kind: str
    line: int
    column: int
    #: As it is written: ``#elif A > 2``.
    directive: str
    #: Its condition; empty for ``#else``.
    condition: str
    #: A condition to write instead; empty where there is none.
    proposed: str
    #: The directives that prove it.
    reasons: tuple[Reason, ...]

    def __str__(self) -> str:
        advice = f" (can be '{self.proposed}')" if self.kind in ("removable", "spelled-out") else ""
        return f"{self.file}:{self.line}: {self.kind}: {self.directive}{advice}"


def source_files(
    paths: AnyPath | Iterable[AnyPath], *, on_problem: Callable[[str, str], None] | None = None
) -> list[str]:
    """The files that :func:`scan` reads, in its order: C and C++ files below folders, and files that are named.

    A folder that cannot be read raises :class:`~vtsym.SourceError`, or is handed to ``on_problem`` with a sentence.

    >>> import vtsym
    >>> vtsym.source_files("examples")
    ['examples/radio.h']
    """
    given = [paths] if isinstance(paths, (str, os.PathLike)) else paths
    files, problems = _vtsym.source_files([os.fsencode(path) for path in given])
    for path, sentence in problems:
        if on_problem is None:
            raise SourceError(f"{path}: {sentence}")
        on_problem(path, sentence)
    return files


def scan(
    paths: AnyPath | Iterable[AnyPath],
    *,
    strict_includes: bool = False,
    spelled_out: bool = False,
    on_problem: Callable[[str, str], None] | None = None,
) -> Iterator[SourceFinding]:
    """Finds faults in C and C++ files, and in all such files below folders; yields them file by file.

    A path that cannot be read raises :class:`~vtsym.SourceError`, or is handed to ``on_problem`` with a sentence, after
    which the scan goes on.  With ``strict_includes`` an included file may change any macro.  With ``spelled_out`` an
    ``#elif`` that repeats that those before it do not hold is a finding, too.

    >>> import vtsym
    >>> for finding in vtsym.scan("examples/radio.h"):
    ...     print(finding)
    examples/radio.h:4: removable: #if PROTOCOL >= 2 && defined(CRC) (can be 'defined(CRC)')
    examples/radio.h:9: dead: #elif defined(LEGACY) && PROTOCOL > 2
    """

    def refuse(path: str, sentence: str) -> None:
        if on_problem is None:
            raise SourceError(f"{path}: {sentence}")
        on_problem(path, sentence)

    files = source_files(paths, on_problem=refuse)
    scanner = _vtsym.Scanner(strict_includes)
    for file in files:
        try:
            rows = scanner.scan_file(os.fsencode(file))
        except SourceError as error:
            refuse(file, str(error))
            continue
        yield from _findings(file, rows, spelled_out)


def scan_text(
    text: str | bytes, *, file: str = "<text>", is_cpp: bool = False, spelled_out: bool = False
) -> list[SourceFinding]:
    """The faults in a source text.

    >>> import vtsym
    >>> [finding] = vtsym.scan_text("#if A > 2\\n#if A > 1\\n#endif\\n#endif\\n")
    >>> finding.kind, finding.line, finding.reasons
    ('always-true', 2, (Reason(line=1, directive='#if A > 2', holds=True),))
    """
    source = text.encode("utf-8", "surrogateescape") if isinstance(text, str) else text
    return list(_findings(file, _vtsym.Scanner(False).scan_text(source, is_cpp), spelled_out))


def _findings(file: str, rows: list[_vtsym._Branch], spelled_out: bool) -> Iterator[SourceFinding]:
    for kind, line, column, directive, condition, proposed, reasons in rows:
        if kind == "spelled-out" and not spelled_out:
            continue
        because = tuple(Reason(*reason) for reason in reasons)
        yield SourceFinding(file, kind, line, column, directive, condition, proposed, because)
