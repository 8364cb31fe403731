"""Shooting metadata of camera files: image size, orientation, dates, camera, lens, exposure.

>>> import quavel
>>> quavel.read("night.nef").width
6032
>>> for path, record, error in quavel.scan("/srv/photos"):
...     print(path, record.captured if record else error.reason)
"""
from __future__ import annotations

import os
from collections.abc import Generator, Iterable
from typing import TYPE_CHECKING, List, Optional, Union

from . import _quavel

_quavel.refuse_subinterpreter()  # a second interpreter gets the module without its init function

from ._quavel import Record, __version__  # noqa: E402
from ._types import NoRecord, Note, Path, Result  # noqa: E402

if TYPE_CHECKING:
    from _typeshed import ReadableBuffer as Buffer

    from ._quavel import BinaryFile

__all__ = [
    "NoRecord",
    "Note",
    "Record",
    "Result",
    "__version__",
    "explain",
    "get",
    "read",
    "read_bytes",
    "read_file",
    "scan",
]

_MAX_JOBS = 256


# Written in Python, since pickle cannot pass functions of the extension to other processes.


def read(path: Path) -> Record:
    """Give the record of the photo at a path, or raise NoRecord.

    What follows the path's last "." names the format, in any case.
    """
    return _quavel.read(path)


def get(path: Path) -> Optional[Record]:
    """Give the record of the photo at a path, or None when there is none."""
    return _quavel.get(path)


def read_bytes(buffer: "Buffer", extension: str) -> Record:
    """Give the record of a photo in memory, or raise NoRecord.

    The buffer is bytes, a memoryview, an mmap, a numpy array or anything else with the buffer
    protocol. It is read in place, and must not change meanwhile. The extension, such as "nef" or
    ".NEF", names the format.
    """
    return _quavel.read_bytes(buffer, extension)


def read_file(file: "BinaryFile", extension: str) -> Record:
    """Give the record of a photo in a seekable binary file object, or raise NoRecord.

    The file is read from position 0, 16 KB first and 8 KB or more at a time from then on, and left
    at any position. Whatever its methods raise passes through. The extension, such as "nef" or
    ".NEF", names the format.
    """
    return _quavel.read_file(file, extension)


def explain(path: Path) -> List[Note]:
    """Tell what a read of the photo at a path comes across.

    The notes say what was read, why there is no record, or why attributes of the record are None.
    """
    return _quavel.explain(path)


def scan(
    paths_or_folder: Union[Path, Iterable[Path]], jobs: Optional[int] = None
) -> Generator[Result, None, None]:
    """Read many photos on threads; give a Result for each, in order, whether it can be read or not.

    Of a folder, the photos in it and in the folders in it are read, in the order of their names.
    Any other path stands for itself. An iterable is run on the caller's thread, ahead of the
    results. `jobs` files are read at a time, at most 256; by default as many as there are
    processors, or 32 when the files turn out not to be cached.

    Closing the iterator, or leaving it to the garbage collector, ends the threads.
    """
    if jobs is not None and not isinstance(jobs, int):
        raise TypeError(f"jobs must be int or None, not {type(jobs).__name__}")
    if jobs is not None and not 1 <= jobs <= _MAX_JOBS:
        raise ValueError(f"jobs must be from 1 to {_MAX_JOBS}, not {jobs}")
    paths = paths_or_folder
    if isinstance(paths, (str, bytes, os.PathLike)):
        path = os.fspath(paths)
        if os.path.isdir(path):
            return _results(_quavel.Scanner(path, True, jobs or 0))
        os.stat(path)  # raises if it is missing: a mistyped folder is the caller's error
        paths = [paths]
    elif not isinstance(paths, Iterable):
        kind = type(paths).__name__
        raise TypeError(f"paths_or_folder must be a path or an iterable of paths, not {kind}")
    return _results(_quavel.Scanner(iter(paths), False, jobs or 0))


def _results(scanner: _quavel.Scanner) -> Generator[Result, None, None]:
    try:
        while batch := scanner.next_batch():
            yield from batch
    finally:
        scanner.close()
