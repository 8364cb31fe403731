#!/usr/bin/python3
"""Reads photos wherever fsspec reads files, such as inside archives and on web servers.

    remote_photos.py zip://night.nef::photos.zip https://example.org/night.nef

Of each photo a block or two are fetched, not the whole file. Needs fsspec, and aiohttp for HTTP.
"""
from __future__ import annotations

import sys

import fsspec

import quavel


def read_url(url: str) -> quavel.Record:
    """Give the record of a photo at a URL of fsspec's, or raise what it or quavel raises."""
    extension = url.partition("::")[0].rpartition(".")[2]
    protocol = url.partition("://")[0]
    # By default, fsspec fetches 5 MB from a web server at a time.
    options = {"block_size": 16384} if protocol in ("http", "https") else {}
    with fsspec.open(url, "rb", **options) as file:
        return quavel.read_file(file, extension)


def main() -> None:
    for url in sys.argv[1:]:
        try:
            record = read_url(url)
            print(f"{url}: {record.width} x {record.height}, {record.capture_date}")
        except (quavel.NoRecord, OSError, KeyError) as error:  # zip raises KeyError
            print(f"{url}: {error}")


if __name__ == "__main__":
    main()
