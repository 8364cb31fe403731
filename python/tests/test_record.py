import copy
import gc
import json
import locale
import os
import pickle
import subprocess
import sys
from datetime import datetime

import pytest
from conftest import FOLDERS, resident_bytes, tiff

import quavel


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
            assert record is None
            assert (error.reason, error.position) == (line["reason"], line.get("position"))
            with pytest.raises(quavel.NoRecord) as raised, open(path, "rb") as file:
                quavel.read_file(file, extension)
            assert raised.value.reason == error.reason
            continue
        assert error is None
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


def test_attributes(photos):
    record = quavel.read(photos / "river.cr3")
    assert record.captured == datetime(2021, 5, 1, 10)
    assert (record.capture_date, record.date_time_original) == ("2021:05:01 10:00:00", None)
    assert (record.width, record.is_raw, record.model) == (6000, True, "Camera R")
    assert (record.f_number, record.focal_length_in_35mm_film) == (5.6, 56)
    nef = quavel.read(photos / "night.nef")
    assert (nef.width, nef.model, nef.iso, nef.f_number) == (6032, None, None, None)
    assert nef.has_shooting_info is False
    plain = quavel.read_bytes(tiff(b""), "tif").to_dict()
    assert {k: v for k, v in plain.items() if v is not None} == {
        "is_raw": False,
        "has_shooting_info": False,
    }


@pytest.mark.parametrize(
    "text, moment",
    [
        (b"2021:05:01 10:07:59", datetime(2021, 5, 1, 10, 7, 59)),
        (b"2021:02:30 10:00:00", None),
        (b"0000:00:00 00:00:00", None),
        (b"    :  :     :  :  ", None),
        (b"2021:05:01 24:00:00", None),
        (b"2021:05:01 10:00:-1", None),
        (b"2021:05:01T10:00:00", None),
        (b"2021:05:01 10:00:00Z", None),
        (b"2021:05:01", None),
        (b"caf\xc3\xa9", None),
        (b"caf\xe9", None),  # Latin-1 where it is not UTF-8
    ],
)
def test_dates(text, moment):
    record = quavel.read_bytes(tiff(text), "tif")
    assert record.captured == moment
    assert record.date_time == text.decode("latin-1" if b"\xe9" in text else "utf-8")


def test_is_a_value(photos):
    record, same, other = (quavel.read(photos / n) for n in ("river.cr3", "river.cr3", "field.raf"))
    assert record == same and record is not same and hash(record) == hash(same)
    assert record != other and record != 1 and other == quavel.read(photos / "field.raf")
    copies = [copy.copy(record), copy.deepcopy(record)]
    copies += [pickle.loads(pickle.dumps(record, p)) for p in range(pickle.HIGHEST_PROTOCOL + 1)]
    assert copies == [record] * len(copies)
    absent = pickle.loads(pickle.dumps(other))
    assert absent == other and absent.f_number is None
    for name in ("width", "captured", "colour"):
        with pytest.raises(AttributeError):
            setattr(record, name, 1)
    assert "f_number=5.6" in repr(record) and "f_number" not in repr(other)
    for make in (quavel.Record, lambda: quavel.Record.__new__(quavel.Record)):
        with pytest.raises(TypeError):
            make()
    with pytest.raises(TypeError):
        type("Mine", (quavel.Record,), {})


def test_the_locale_changes_no_number(photos):
    try:
        locale.setlocale(locale.LC_NUMERIC, "de_DE.UTF-8")
    except locale.Error:
        pytest.skip("no locale with a decimal comma")
    try:
        assert quavel.read(photos / "river.cr3").f_number == 5.6
    finally:
        locale.setlocale(locale.LC_NUMERIC, "C")


def test_odd_bytes_survive_pickling():
    record = quavel.read_bytes(tiff(b"caf\xe9"), "tif")
    assert pickle.loads(pickle.dumps(record)) == record != quavel.read_bytes(tiff(b"caf"), "tif")


def test_no_record(cut, tmp_path):
    with pytest.raises(quavel.NoRecord) as raised:
        quavel.read(cut)
    error = raised.value
    assert (error.reason, error.path, error.errno) == ("cut-short", cut, None)
    assert error.position == 220  # where IFD0 says that its SubIFDs are
    assert str(error) == f"{cut}: {error.text}" and "100" in error.text
    again = pickle.loads(pickle.dumps(error))
    assert (str(again), again.reason, again.position) == (str(error), "cut-short", error.position)
    with pytest.raises(quavel.NoRecord) as raised:
        quavel.read(tmp_path / "missing.nef")
    assert (raised.value.reason, raised.value.errno, raised.value.position) == ("cannot-open", 2, None)
    with pytest.raises(quavel.NoRecord, match="looks like") as raised:
        quavel.read_bytes(b"\x89PNG\r\n\x1a\n", "jpg")
    assert (raised.value.reason, raised.value.path) == ("other-kind", None)
    assert quavel.get(cut) is quavel.get(tmp_path / "missing.nef") is None


def test_explain(photos, cut):
    notes = quavel.explain(photos / "night.nef")
    record = quavel.read(photos / "night.nef").to_dict()
    absent = {name for name, value in record.items() if value is None}
    assert {note.field for note in notes if note.kind == "absence"} == absent
    step = next(note for note in notes if note.kind == "step")
    assert (step.reason, step.position, step.field) == (None, 0, None)
    assert quavel.explain(cut)[-1][:2] == ("refusal", "cut-short")


def test_leaks_nothing(photos, cut):
    path, data = str(photos / "river.cr3"), (photos / "night.nef").read_bytes()

    def use():
        record = quavel.get(path)
        record.captured, record.model, record.f_number
        assert quavel.get(str(cut)) is None
        quavel.read_bytes(data, "nef")

    def refuse():
        with pytest.raises(quavel.NoRecord):
            quavel.read(cut)
        with pytest.raises(TypeError):
            quavel.read(1)
        record = quavel.read(path)
        hash(record), repr(record), record.to_dict(), pickle.dumps(record)
        quavel.explain(path), list(quavel.scan([path]))

    for work, rounds in ((use, 34_000), (refuse, 1000)):
        for _ in range(200):
            work()
        gc.collect()
        blocks, memory = sys.getallocatedblocks(), resident_bytes()
        for _ in range(rounds):
            work()
        gc.collect()
        assert sys.getallocatedblocks() - blocks < rounds / 2  # caches come and go
        assert resident_bytes() - memory < 2_000_000
