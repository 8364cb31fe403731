import copy
import gc
import json
import os
import pickle
import subprocess
import sys
from datetime import datetime

import pytest
from conftest import FOLDERS, NIGHT, PHOTOS, resident_bytes

import quavel

RIVER = PHOTOS / "river.cr3"


@pytest.mark.parametrize("folder", FOLDERS, ids=lambda folder: folder.name)
def test_equals_the_command(folder):
    command = [os.environ["QUAVEL_COMMAND"], "--jsonl", "--quiet", folder]
    output = subprocess.run(command, stdout=subprocess.PIPE, check=False).stdout
    lines = [json.loads(line) for line in output.splitlines()]
    results = list(quavel.scan(folder))
    assert len(lines) >= 12
    assert [result.path for result in results] == [line.pop("path") for line in lines]
    for (path, record, error), line in zip(results, lines):
        extension = path.rpartition(".")[2]
        assert quavel.get(path) == record
        if "error" in line:
            assert (error.reason, error.position) == (line["reason"], line.get("position"))
            with pytest.raises(quavel.NoRecord) as raised, open(path, "rb") as file:
                quavel.read_file(file, extension)
            assert raised.value.reason == error.reason
            continue
        values = record.to_dict()
        assert values == {name: getattr(record, name) for name in values}
        del values["captured"]
        assert {k.replace("_", ""): v for k, v in values.items()} == {
            k.lower(): float(v) if v in ("Infinity", "-Infinity") else v for k, v in line.items()
        }
        with open(path, "rb") as file:
            assert quavel.read_file(file, extension) == record
            file.seek(0)
            assert quavel.read_bytes(file.read(), extension) == record


def test_dates():
    moments = {b"2021:05:01 10:07:59": datetime(2021, 5, 1, 10, 7, 59)}
    wrong = b"2021:02:30 10:00:00|0000:00:00 00:00:00|    :  :     :  :  |2021:05:01 24:00:00|"
    wrong += b"2021:05:01 10:00:-0|2021:05:01T10:00:00|2021:05:01 10:00:00Z|2021|caf\xc3\xa9|"
    for text in [*moments, *wrong.split(b"|"), b"caf\xe9"]:
        stored = text + b"\0" * max(1, 5 - len(text))
        head = b"II*\0\x08\0\0\0\x01\0\x32\x01\x02\0" + len(stored).to_bytes(4, "little")
        record = quavel.read_bytes(head + b"\x1a\0\0\0\0\0\0\0" + stored, "tif")
        assert record.captured == moments.get(text)
        encoding = "latin-1" if b"\xe9" in text else "utf-8"  # whichever fits
        assert record.date_time == (text.decode(encoding) or None)
        assert pickle.loads(pickle.dumps(record)) == record != quavel.read(RIVER)


def test_is_a_value():
    record, same, other = (quavel.read(path) for path in (RIVER, RIVER, PHOTOS / "field.raf"))
    assert (record.captured, record.focal_length_in_35mm_film) == (datetime(2021, 5, 1, 10), 56)
    assert record == same and record is not same and hash(record) == hash(same)
    assert record != other != quavel.read(NIGHT) and record != 1
    for value in (record, other):  # in the other, texts and numbers are absent
        copies = [copy.copy(value), copy.deepcopy(value)]
        copies += [pickle.loads(pickle.dumps(value, p)) for p in range(pickle.HIGHEST_PROTOCOL + 1)]
        assert copies == [value] * len(copies)
        assert ("f_number=5.6" in repr(value), "f_number" in repr(value)) == (value is record,) * 2
    for name in ("width", "captured", "colour"):
        with pytest.raises(AttributeError):
            setattr(record, name, 1)
    make = [quavel.Record, lambda: quavel.Record.__new__(quavel.Record)]
    for call in [*make, lambda: type("Mine", (quavel.Record,), {})]:
        with pytest.raises(TypeError):
            call()


def test_no_record(cut, tmp_path):
    with pytest.raises(quavel.NoRecord) as raised:
        quavel.read(cut)
    for error in (raised.value, pickle.loads(pickle.dumps(raised.value))):
        assert (error.reason, error.path, error.errno) == ("cut-short", cut, None)
        assert error.position == 220  # where IFD0 says that its SubIFDs are
        assert str(error) == f"{cut}: {error.text}" and "100" in error.text
    with pytest.raises(quavel.NoRecord) as raised:
        quavel.read(tmp_path / "missing.nef")
    assert raised.value.args[1:4] == ("cannot-open", None, 2) and raised.value.errno == 2
    with pytest.raises(quavel.NoRecord, match="^[^:]*looks like") as raised:
        quavel.read_bytes(b"\x89PNG\r\n\x1a\n", "jpg")
    assert (raised.value.reason, raised.value.path) == ("other-kind", None)
    assert quavel.get(cut) is quavel.get(tmp_path / "missing.nef") is None


def test_explain(cut):
    notes = quavel.explain(NIGHT)
    absent = {name for name, value in quavel.read(NIGHT).to_dict().items() if value is None}
    assert {note.field for note in notes if note.kind == "absence"} == absent
    step = next(note for note in notes if note.kind == "step")
    assert (step.reason, step.position, step.field) == (None, 0, None)
    assert quavel.explain(cut)[-1][:2] == ("refusal", "cut-short")


def test_leaks_nothing(cut):
    path, data = str(RIVER), NIGHT.read_bytes()

    def use():
        record = quavel.get(path)
        record.captured, record.model, record.f_number
        quavel.get(str(cut)), quavel.read_bytes(data, "nef")

    def refuse():
        for call, error in ((lambda: quavel.read(cut), quavel.NoRecord), (quavel.read, TypeError)):
            with pytest.raises(error):
                call()
        record = quavel.read(path)
        hash(record), repr(record), record.to_dict(), pickle.dumps(record)
        quavel.explain(path), list(quavel.scan([path]))

    for work, rounds in ((use, 10_000), (refuse, 1000)):
        for count in (200, rounds):  # the first times fill caches
            gc.collect()
            blocks, memory = sys.getallocatedblocks(), resident_bytes()
            for _ in range(count):
                work()
        gc.collect()
        assert sys.getallocatedblocks() - blocks < rounds / 2  # caches come and go
        assert resident_bytes() - memory < 1_000_000
