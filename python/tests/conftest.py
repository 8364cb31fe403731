import os
from pathlib import Path

import pytest

ROOT = Path(__file__).resolve().parents[2]
PHOTOS = ROOT / "examples" / "photos"
FOLDERS = [PHOTOS] + [ROOT / p for p in [os.environ.get("QUAVEL_SAMPLES")] if p]


def threads():
    return len(os.listdir("/proc/self/task"))


def resident_bytes():
    with open("/proc/self/statm") as file:
        return int(file.read().split()[1]) * os.sysconf("SC_PAGESIZE")


def tiff(date):
    """A TIFF file that holds a DateTime and nothing else."""
    text = date + b"\0" * max(1, 5 - len(date))
    entry = b"\x32\x01\x02\x00" + len(text).to_bytes(4, "little") + (26).to_bytes(4, "little")
    return b"II*\0\x08\0\0\0" + b"\x01\x00" + entry + b"\0\0\0\0" + text


@pytest.fixture
def photos():
    return PHOTOS


@pytest.fixture
def cut(tmp_path):
    """A photo that ends too early."""
    path = tmp_path / "cut.nef"
    path.write_bytes((PHOTOS / "night.nef").read_bytes()[:100])
    return path
