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
from conftest import PHOTOS, ROOT

import quavel

NIGHT = PHOTOS / "night.nef"
RELEASED = memoryview(b"II*\0")
RELEASED.release()


@pytest.mark.parametrize(
    "call, error, text",
    [
        (lambda: quavel.read(1), TypeError, "path must be str, bytes or os.PathLike, not int"),
        (lambda: quavel.get(None), TypeError, "path must be .* not NoneType"),
        (lambda: quavel.explain(["a.nef"]), TypeError, "path must be .* not list"),
        (lambda: quavel.get("a\0.nef"), ValueError, "path"),
        (lambda: quavel.read(b"a\0.nef"), ValueError, "path"),
        (lambda: quavel.read_bytes("text", "nef"), TypeError, "buffer must be a bytes-like .* str"),
        (lambda: quavel.read_bytes(RELEASED, "nef"), ValueError, "buffer must be .* not released"),
        (lambda: quavel.read_bytes(memoryview(b"abcd")[::2], "nef"), ValueError, "buffer must be"),
        (lambda: quavel.read_bytes(b"", b"nef"), TypeError, "extension must be str, not bytes"),
        (lambda: quavel.read_bytes(b"", "\ud800"), ValueError, "extension"),
        (lambda: quavel.read_file(io.BytesIO(), None), TypeError, "extension must be str"),
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
        assert quavel.read(path).width == 6032
        assert [result[:2] for result in quavel.scan([path])] == [(path, quavel.read(NIGHT))]
    assert [result.path for result in quavel.scan(tmp_path)] == [os.fsdecode(odd)]
    assert [result.path for result in quavel.scan(os.fsencode(tmp_path))] == [odd]


def test_kinds_of_buffers():
    data = NIGHT.read_bytes()
    even = data + b"\0" * (len(data) % 2)
    with open(NIGHT, "rb") as file, mmap.mmap(file.fileno(), 0, prot=mmap.PROT_READ) as mapped:
        buffers = [data, bytearray(data), memoryview(b"ab" + data)[2:], array.array("H", even)]
        for buffer in [*buffers, mapped]:
            for extension in ("nef", ".nef", ".NEF"):
                assert quavel.read_bytes(buffer, extension).width == 6032
    buffers[1].clear()  # nothing holds on to it
    for extension in ("", "txt", "nef\0", "né"):
        with pytest.raises(quavel.NoRecord) as raised:
            quavel.read_bytes(data, extension)
        assert raised.value.reason == "unknown-extension"


class Odd(io.BytesIO):
    """A file whose nth call of a method gives something else."""

    def __init__(self, method, call, result):
        super().__init__(NIGHT.read_bytes())
        self.method, self.call, self.result = method, call, result
        self.calls = 0

    def _pass(self, method, *arguments):
        self.calls += method == self.method
        if method == self.method and self.calls == self.call:
            if isinstance(self.result, BaseException):
                raise self.result
            return self.result
        return getattr(super(), method)(*arguments)

    def read(self, *arguments):
        return self._pass("read", *arguments)

    def seek(self, *arguments):
        return self._pass("seek", *arguments)


@pytest.mark.parametrize(
    "method, result, error, text",
    [
        ("read", OSError(5, "broken"), OSError, "broken"),
        ("seek", KeyError("lost"), KeyError, "lost"),
        ("read", KeyboardInterrupt(), KeyboardInterrupt, ""),
        ("read", None, TypeError, "read.* returns must be a bytes-like object, not NoneType"),
        ("read", "text", TypeError, "read.* returns must be a bytes-like object, not str"),
        ("read", b"x" * 100_000, ValueError, r"read\(\d+\) returned 100000 bytes"),
        ("read", memoryview(b"abcd")[::2], ValueError, "read.* contiguous"),
    ],
)
def test_files_that_misbehave(method, result, error, text):
    with pytest.raises(error, match=text):
        quavel.read_file(Odd(method, 1, result), "nef")


def test_a_later_request_that_fails():
    class Far(Odd):
        """The photo's directories lie in blocks far from each other."""

        def read(self, size):
            return self._pass("read", min(size, 8))

    for call in range(1, 6):
        with pytest.raises(OSError, match="gone"):
            quavel.read_file(Far("read", call, OSError("gone")), "nef")


def test_kinds_of_files(tmp_path):
    class Dribble(io.RawIOBase):
        """Delivers a byte at a time."""

        def __init__(self):
            self.bytes = io.BytesIO(NIGHT.read_bytes())

        def read(self, size=-1):
            return memoryview(self.bytes.read(min(size, 1)))

        def seek(self, *arguments):
            return self.bytes.seek(*arguments)

    archive = tmp_path / "photos.zip"
    with zipfile.ZipFile(archive, "w", zipfile.ZIP_DEFLATED) as file:
        file.write(NIGHT, "night.nef")
    with zipfile.ZipFile(archive) as file, file.open("night.nef") as member:
        member.read(10)  # the position it stands at does not matter
        assert quavel.read_file(member, "nef").width == 6032
    with open(NIGHT, "rb", buffering=0) as file:
        assert quavel.read_file(file, "nef").width == 6032
    assert quavel.read_file(Dribble(), ".NEF").width == 6032
    counted = Odd("read", 0, None)
    assert quavel.read_file(counted, "nef").width == 6032
    assert counted.calls <= 2


class Ranges(http.server.SimpleHTTPRequestHandler):
    """Serves a photo by byte ranges, as web servers do and Python's own does not."""

    requests: "list[str]" = []

    def do_GET(self):
        data = NIGHT.read_bytes()
        self.requests.append(self.headers["Range"])
        start, end = (int(n) for n in self.headers["Range"].partition("=")[2].split("-"))
        self.send_response(206)
        self.send_header("Content-Range", f"bytes {start}-{end}/{len(data)}")
        self.send_header("Content-Length", str(len(data[start : end + 1])))
        self.end_headers()
        self.wfile.write(data[start : end + 1])

    def do_HEAD(self):
        self.send_response(200)
        self.send_header("Content-Length", str(NIGHT.stat().st_size))
        self.send_header("Accept-Ranges", "bytes")
        self.end_headers()

    def log_message(self, *arguments):
        pass


def test_remote_photos(tmp_path):
    """The example with fsspec, on an archive and a web server."""
    pytest.importorskip("fsspec")
    pytest.importorskip("aiohttp")
    example = ROOT / "python" / "examples" / "remote_photos.py"
    with zipfile.ZipFile(tmp_path / "photos.zip", "w", zipfile.ZIP_DEFLATED) as file:
        file.write(NIGHT, "night.nef")
    with http.server.ThreadingHTTPServer(("127.0.0.1", 0), Ranges) as server:
        threading.Thread(target=server.serve_forever, daemon=True).start()
        urls = [
            f"zip://night.nef::{tmp_path}/photos.zip",
            f"http://127.0.0.1:{server.server_port}/night.nef",
            f"zip://gone.nef::{tmp_path}/photos.zip",
        ]
        command = [sys.executable, example, *urls]
        lines = subprocess.run(command, stdout=subprocess.PIPE, text=True, check=True).stdout
        server.shutdown()
    zipped, served, gone = lines.splitlines()
    assert zipped == f"{urls[0]}: 6032 x 4032, 2021:05:01 10:00:00"
    assert served == f"{urls[1]}: 6032 x 4032, 2021:05:01 10:00:00"
    assert gone.startswith(urls[2])
    assert 1 <= len(Ranges.requests) <= 2
