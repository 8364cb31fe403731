"""The command under test, and a folder of its own for each test."""

import contextlib
import fcntl
import json
import os
import pty
import struct
import subprocess
import tempfile
import termios
import unittest
from pathlib import Path

COMMAND = os.environ["QUAVEL_COMMAND"]
ROOT = Path(__file__).resolve().parents[2]
SAMPLES = os.environ.get("QUAVEL_SAMPLES")
if SAMPLES:
    SAMPLES = os.environ["QUAVEL_SAMPLES"] = str(ROOT / SAMPLES)  # a relative path starts there


def open_terminal(width):
    """Both ends of a terminal with that many columns."""
    main, side = pty.openpty()
    fcntl.ioctl(side, termios.TIOCSWINSZ, struct.pack("HHHH", 24, width, 0, 0))
    return main, side


class CommandTest(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.folder = Path(folder.name)

    def put(self, name, content):
        path = os.path.join(os.fsencode(self.folder), os.fsencode(name))
        os.makedirs(os.path.dirname(path), exist_ok=True)
        with open(path, "wb") as file:
            file.write(content)
        return path

    def run_quavel(self, *arguments, status=0, **options):
        done = subprocess.run([COMMAND, *arguments], cwd=self.folder, capture_output=True, timeout=60, **options)
        self.assertEqual(done.returncode, status, done.stderr)
        return done

    def objects(self, *arguments, **options):
        output = self.run_quavel("--jsonl", *arguments, **options).stdout.decode()
        return [json.loads(line) for line in output.splitlines()]

    def on_terminal(self, *command, width=80, **options):
        """What any command writes to a terminal, its standard error and its status."""
        main, side = open_terminal(width)
        with subprocess.Popen(command, cwd=self.folder, stdin=subprocess.DEVNULL, stdout=side,
                              stderr=subprocess.PIPE, **options) as process:
            os.close(side)
            shown = b""
            with contextlib.suppress(OSError):  # the end, to Linux
                while piece := os.read(main, 65536):
                    shown += piece
            os.close(main)
            errors = process.communicate(timeout=60)[1]
        return shown.replace(b"\r\n", b"\n").decode(), errors.decode(), process.returncode
