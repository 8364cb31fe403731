"""Shooting metadata of camera files: image size, orientation, dates, camera, lens, exposure.

>>> import quavel
>>> quavel.read("night.nef").width
6032
>>> for path, record, error in quavel.scan("/srv/photos"):
...     print(path, record.captured if record else error.reason)
"""
from __future__ import annotations

import os
from typing import Iterable, Iterator, Optional, Union

from . import _quavel

_quavel.refuse_subinterpreter()  # a second interpreter is handed the module without its start

from ._quavel import Record, __version__, explain, get, read, read_bytes, read_file  # noqa: E402
from ._types import NoRecord, Note, Path, Result  # noqa: E402

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

_MOST_JOBS = 256


def scan(
    paths_or_folder: Union[Path, Iterable[Path]], jobs: Optional[int] = None
) -> Iterator[Result]:
    """Read many photos on threads; give a Result for each, in order, whether it can be read or not.

    Of a folder, the photos in it and in the folders in it are read, in the order of their names.
    Any other path stands for itself. An iterable is run on the caller's thread, and some hundred
    paths ahead. `jobs` files are read at a time, at most 256; by default as many as there are
    processors, or 32 when the files turn out not to be cached.

    Closing the iterator, or leaving it to the garbage collector, ends the threads.
    """
    if jobs is not None and not isinstance(jobs, int):
        raise TypeError(f"jobs must be int or None, not {type(jobs).__name__}")
    if jobs is not None and not 1 <= jobs <= _MOST_JOBS:
        raise ValueError(f"jobs must be from 1 to {_MOST_JOBS}, not {jobs}")
    if isinstance(paths_or_folder, (str, bytes, os.PathLike)):
        path = os.fspath(paths_or_folder)
        if os.path.isdir(path):
            return _results(_quavel.Scanner(path, True, jobs or 0))
        os.stat(path)  # a mistyped folder is an error of the caller's, not a photo's
        paths: Iterable[Path] = [paths_or_folder]
    elif isinstance(paths_or_folder, Iterable):
        paths = paths_or_folder
    else:
        kind = type(paths_or_folder).__name__
        raise TypeError(f"paths_or_folder must be a path or an iterable of paths, not {kind}")
    return _results(_quavel.Scanner(iter(paths), False, jobs or 0))


def _results(scanner: _quavel.Scanner) -> Iterator[Result]:
    try:
        while batch := scanner.next_batch():
            yield from batch
    finally:
        scanner.close()
