"""The exceptions of the package.

All of them are a :class:`VtsymError`, and a :class:`ValueError` or :class:`OSError` as well, so that a caller may
catch either.
"""

from __future__ import annotations


class VtsymError(Exception):
    """The base of all exceptions of the package."""


class ParseError(VtsymError, ValueError):
    """A text is not a condition or an expression.

    The message shows the place:

    >>> import vtsym
    >>> try:
    ...     vtsym.parse("A > && B")
    ... except vtsym.ParseError as error:
    ...     print(error)
    ...     print(error.offset)
    The condition "A > && B" cannot be read at byte 3, before "> && B".
      A > && B
        ^
    2
    """

    #: What is wrong, in one sentence.
    message: str
    #: The identifier of the message, which never changes.
    message_id: str
    #: The text that was refused.
    text: str
    #: The place of the fault in ``text``, in characters from 0; ``None`` where the fault has no place.
    offset: int | None
    #: Two lines: the text around the fault, and a caret below it; empty without an offset.
    caret: str

    def __init__(self, message: str, message_id: str, text: str, offset: int | None, caret: str) -> None:
        super().__init__(message, message_id, text, offset, caret)
        self.message = message
        self.message_id = message_id
        self.text = text
        self.offset = offset
        self.caret = caret

    def __str__(self) -> str:
        return f"{self.message}\n{self.caret}" if self.caret else self.message


class EvaluationError(VtsymError, ValueError):
    """An expression has no value: a name has none, or an operator is not one of arithmetic.

    >>> import vtsym
    >>> vtsym.parse("A > B").evaluate(A=1)
    Traceback (most recent call last):
    vtsym.errors.EvaluationError: "B" has no value: give it one.
    """

    #: The identifier of the message, which never changes.
    message_id: str

    def __init__(self, message: str, message_id: str) -> None:
        super().__init__(message, message_id)
        self.message_id = message_id

    def __str__(self) -> str:
        return str(self.args[0])


class ModelError(VtsymError, ValueError):
    """A text is not a model."""

    #: The place in the text, from 1.
    line: int
    column: int

    def __init__(self, message: str, line: int, column: int) -> None:
        super().__init__(message, line, column)
        self.line = line
        self.column = column

    def __str__(self) -> str:
        return f"line {self.line}: {self.args[0]}"


class SourceError(VtsymError, OSError):
    """A file or folder cannot be read."""

    def __str__(self) -> str:
        return str(self.args[0])
