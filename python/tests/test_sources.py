"""Paths, buffers and files: good ones, odd ones, and arguments that are none."""
import array
import http.server
import io
import mmap
import os
import subprocess
import sys
import threading
import zipfile

import pytest
from conftest import NIGHT, ROOT

import quavel


@pytest.mark.parametrize(
    "call, error, text",
    [
        (lambda: quavel.read(1), TypeError, "^path must be str, bytes or os.PathLike, not int"),
        (lambda: quavel.get("a\0.nef"), ValueError, "^path contains"),
        (lambda: quavel.explain(["a.nef"]), TypeError, "^path must be .* not list"),
        (lambda: quavel.read_bytes("text", "nef"), TypeError, "buffer must be a bytes-like .* str"),
        (lambda: quavel.read_bytes(b"", b"nef"), TypeError, "extension must be str, not bytes"),
        (lambda: quavel.read_bytes(b"", "\ud800"), ValueError, "extension"),
        (lambda: quavel.read_file("night.nef", "nef"), TypeError, "file must be .* not str"),
        (lambda: quavel.scan(1), TypeError, "paths_or_folder must be .* not int"),
        (lambda: quavel.scan([], "2"), TypeError, "jobs must be int or None, not str"),
        (lambda: quavel.scan([], 0), ValueError, "jobs must be from 1 to 256, not 0"),
        (lambda: quavel.scan([], jobs=257), ValueError, "jobs must be from 1 to 256, not 257"),
        (lambda: quavel.scan("/no/such/folder"), FileNotFoundError, "/no/such/folder"),
    ],
)
def test_wrong_arguments(call, error, text):
    with pytest.raises(error, match=text):
        call()


def test_kinds_of_paths(tmp_path):
    odd = os.fsencode(tmp_path) + b"/\xff\xc3\xa9.nef"
    with open(odd, "wb") as file:
        file.write(NIGHT.read_bytes())
    for path in (str(NIGHT), os.fsencode(NIGHT), NIGHT, odd, os.fsdecode(odd)):
        for paths in (path, [path]):
            assert [result[:2] for result in quavel.scan(paths)] == [(path, quavel.read(NIGHT))]
    assert [result.path for result in quavel.scan(tmp_path)] == [os.fsdecode(odd)]
    assert [result.path for result in quavel.scan(os.fsencode(tmp_path))] == [odd]


def test_kinds_of_buffers():
    data = NIGHT.read_bytes()
    even = data + b"\0" * (len(data) % 2)
    with open(NIGHT, "rb") as file, mmap.mmap(file.fileno(), 0, prot=mmap.PROT_READ) as mapped:
        buffers = [data, bytearray(data), memoryview(b"ab" + data)[2:], array.array("H", even)]
        for buffer, extension in zip([*buffers, mapped], ("nef", ".nef", ".NEF", "NEF", "nEf")):
            assert quavel.read_bytes(buffer, extension).width == 6032
    buffers[1].clear()  # nothing holds on to it
    for extension in ("", "txt", "nef\0", "né"):
        with pytest.raises(quavel.NoRecord, match="extension"):
            quavel.read_bytes(data, extension)


class Odd(io.BytesIO):
    """A file whose nth call of a method gives something else, and the others a few bytes."""

    def __init__(self, method="", result=None, nth=1, most=100_000):
        super().__init__(NIGHT.read_bytes())
        self.odd, self.result, self.nth, self.most, self.calls = method, result, nth, most, 0

    def _pass(self, method, argument):
        self.calls += method == self.odd
        if method != self.odd or self.calls != self.nth:
            return getattr(super(), method)(argument)
        if isinstance(self.result, BaseException):
            raise self.result
        return self.result

    def read(self, size):
        return self._pass("read", min(size, self.most))

    def seek(self, offset):
        return self._pass("seek", offset)


@pytest.mark.parametrize(
    "method, result, error, text",
    [
        ("read", OSError(5, "broken"), OSError, "broken"),
        ("seek", KeyError("lost"), KeyError, "lost"),
        ("read", "text", TypeError, "read.* returns must be a bytes-like object, not str"),
        ("read", b"x" * 100_000, ValueError, r"read\(\d+\) returned 100000 bytes"),
        ("read", memoryview(b"abcd")[::2], ValueError, "read.* contiguous"),
    ],
)
def test_files_that_misbehave(method, result, error, text):
    for nth in range(1, 6 if isinstance(result, OSError) else 2):
        with pytest.raises(error, match=text):
            quavel.read_file(Odd(method, result, nth, most=8), "nef")


def test_kinds_of_files():
    counted = Odd("read", nth=0)
    for file in (counted, Odd(most=1)):
        file.seek(10)  # the position it stands at does not matter
        assert quavel.read_file(file, ".NEF").width == 6032
    assert counted.calls <= 2


class Ranges(http.server.BaseHTTPRequestHandler):
    """Serves a photo by byte ranges, as web servers do and Python's own does not."""

    requests: "list[str]" = []

    def do_GET(self):
        data, headers = NIGHT.read_bytes(), {"Accept-Ranges": "bytes"}
        if self.command == "GET":
            self.requests.append(self.headers["Range"])
            start, end = (int(n) for n in self.headers["Range"].partition("=")[2].split("-"))
            headers["Content-Range"] = f"bytes {start}-{end}/{len(data)}"
            data = data[start : end + 1]
        self.send_response(206 if self.command == "GET" else 200)
        for header in [*headers.items(), ("Content-Length", str(len(data)))]:
            self.send_header(*header)
        self.end_headers()
        self.wfile.write(data if self.command == "GET" else b"")

    do_HEAD = do_GET


def test_the_example_with_fsspec(tmp_path):
    """On an archive and a web server."""
    pytest.importorskip("fsspec")
    pytest.importorskip("aiohttp")
    with zipfile.ZipFile(tmp_path / "photos.zip", "w", zipfile.ZIP_DEFLATED) as file:
        file.write(NIGHT, "night.nef")
    with http.server.ThreadingHTTPServer(("127.0.0.1", 0), Ranges) as server:
        threading.Thread(target=server.serve_forever, daemon=True).start()
        urls = [f"zip://{name}::{tmp_path}/photos.zip" for name in ("night.nef", "gone.nef")]
        urls.insert(1, f"http://127.0.0.1:{server.server_port}/night.nef")
        command = [sys.executable, ROOT / "python" / "examples" / "remote_photos.py", *urls]
        lines = subprocess.run(command, stdout=subprocess.PIPE, text=True, check=True).stdout
        server.shutdown()
    *found, gone = lines.splitlines()
    assert found == [f"{url}: 6032 x 4032, 2021:05:01 10:00:00" for url in urls[:2]]
    assert gone.startswith(urls[2])
    assert 1 <= len(Ranges.requests) <= 2
