"""Results, notes and the exception."""
from __future__ import annotations

import os
from typing import TYPE_CHECKING, NamedTuple, Optional, Union

if TYPE_CHECKING:
    from ._quavel import Record

Path = Union[str, bytes, "os.PathLike[str]", "os.PathLike[bytes]"]


class NoRecord(Exception):
    """A photo gives no record: it is of no known format, cannot be read, or is not whole."""

    text: str
    """A sentence that says what the file holds and where, without a full stop."""
    reason: str
    """A code, such as 'cut-short' or 'cannot-open'."""
    position: Optional[int]
    """Where in the file, in bytes; None when it is about no place."""
    errno: Optional[int]
    """The system's error number, where the system refused."""
    path: Optional[Path]
    """As it was given; None when the photo was not read by path."""

    def __init__(
        self,
        text: str,
        reason: str,
        position: Optional[int] = None,
        errno: Optional[int] = None,
        path: Optional[Path] = None,
    ) -> None:
        super().__init__(text, reason, position, errno, path)  # pickle passes these again
        self.text = text
        self.reason = reason
        self.position = position
        self.errno = errno
        self.path = path

    def __str__(self) -> str:
        return self.text if self.path is None else f"{os.fsdecode(self.path)}: {self.text}"


class Note(NamedTuple):
    """One thing that happened while a photo was read."""

    kind: str
    """'refusal' or 'limit', why there is no record; 'step'; 'absence' of a field; or 'hint'."""
    reason: Optional[str]
    """A code, such as 'not-in-file'; None for steps."""
    position: Optional[int]
    """Where in the file, in bytes; None when it is about no place."""
    field: Optional[str]
    """Of an absence, the attribute of Record that is None."""
    text: str
    """A sentence, without a full stop."""
    errno: Optional[int]
    """The system's error number, where the system refused."""


class Result(NamedTuple):
    """What scan found at one path: a record, or else the error."""

    path: Path
    """As it was given; of a folder's photo, str, or bytes when the folder was bytes."""
    record: Optional[Record]
    error: Optional[NoRecord]


def restore(state: tuple[object, ...]) -> Record:
    """Unpickle a record."""
    from . import _quavel

    return _quavel.restore(state)
