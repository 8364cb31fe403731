import contextlib
import locale
import os
from pathlib import Path

import pytest

ROOT = Path(__file__).resolve().parents[2]
PHOTOS = ROOT / "examples" / "photos"
NIGHT = PHOTOS / "night.nef"
FOLDERS = [PHOTOS] + [ROOT / p for p in [os.environ.get("QUAVEL_SAMPLES")] if p]

with contextlib.suppress(locale.Error):  # a decimal comma, where there is one, changes no number
    locale.setlocale(locale.LC_NUMERIC, "de_DE.UTF-8")


def threads():
    return len(os.listdir("/proc/self/task"))


def resident_bytes():
    with open("/proc/self/statm") as file:
        return int(file.read().split()[1]) * os.sysconf("SC_PAGESIZE")


@pytest.fixture
def cut(tmp_path):
    """A photo that ends too early."""
    path = tmp_path / "cut.nef"
    path.write_bytes(NIGHT.read_bytes()[:100])
    return path
