import gc
import itertools
import multiprocessing
import os
import signal
import subprocess
import sys
import threading
import time

import pytest
from conftest import PHOTOS, ROOT, resident_bytes, threads

import quavel

NIGHT = str(PHOTOS / "night.nef")
ENDLESS = "import itertools, quavel\nscan = quavel.scan(itertools.repeat({!r}))\n".format(NIGHT)


def outcome(result):
    return result.record.width if result.record else result.error.reason


@pytest.mark.parametrize("jobs", [None, 1, 2, 50])
def test_order(jobs, cut, photos):
    cases = [
        (NIGHT, 6032),
        (cut, "cut-short"),
        (b"/none.nef", "cannot-open"),
        (photos / "river.cr3", 6000),
        ("a\0.nef", "bad-path"),
        (photos, "folder"),
        (ROOT / "README.md", "unknown-extension"),
    ]
    paths, expected = zip(*cases * 300)
    results = list(quavel.scan(iter(paths), jobs))
    assert [result.path for result in results] == list(paths)
    assert [outcome(result) for result in results] == list(expected)
    assert all((result.record is None) != (result.error is None) for result in results)
    assert results[1].error.path == cut
    assert list(quavel.scan([])) == []


def test_folders(tmp_path):
    names = ["b/z.nef", "b.nef", "B.NEF", "a/x/y.nef", "b/notes.txt", "._b.nef", ".trash/t.nef"]
    for name in names:
        path = tmp_path / name
        path.parent.mkdir(parents=True, exist_ok=True)
        path.write_bytes((PHOTOS / "night.nef").read_bytes())
    os.mkfifo(tmp_path / "pipe.nef")
    (tmp_path / "a" / "loop").symlink_to(tmp_path)
    (tmp_path / "self.nef").symlink_to("self.nef")
    (tmp_path / "gone.nef").symlink_to("nowhere")
    (tmp_path / "link.nef").symlink_to("b.nef")
    expected = ["B.NEF", "a/x/y.nef", "b/z.nef", "b.nef", "gone.nef", "link.nef"]
    for folder in (tmp_path, f"{tmp_path}/"):
        results = {os.path.relpath(r.path, tmp_path): outcome(r) for r in quavel.scan(folder)}
        assert list(results) == expected
        assert [name for name, found in results.items() if found != 6032] == ["gone.nef"]
    assert [outcome(r) for r in quavel.scan([tmp_path / "pipe.nef"])] == ["special-file"]


def test_failures_of_the_iterable():
    def paths(last):
        yield from [NIGHT] * 500
        raise last

    for last in (LookupError("lost"), KeyboardInterrupt()):
        count = 0
        with pytest.raises(type(last)):
            for _ in quavel.scan(paths(last)):
                count += 1
        assert (count == 500) == isinstance(last, LookupError)  # an interrupt comes at once
    with pytest.raises(TypeError, match="paths_or_folder must be str, bytes or .* not int"):
        list(quavel.scan([NIGHT, 1]))
    assert threads() == 1


def test_ends_its_threads():
    pulled = itertools.count()
    for leave in ("close", "collect", "error", "cycle"):
        holder = {}
        scan = quavel.scan((NIGHT for _ in pulled if holder is not None), 4)
        assert next(scan).record.width == 6032
        assert sum(1 for _ in itertools.islice(scan, 1000)) == 1000
        assert 1 < threads() <= 5
        if leave == "close":
            scan.close()
        elif leave == "error":
            with pytest.raises(LookupError):
                scan.throw(LookupError())
        elif leave == "cycle":
            holder["scan"] = scan  # which the iterable of the scan refers to
        del scan, holder
        gc.collect()
        assert threads() == 1
        assert list(itertools.islice(pulled, 1))[0] < 7000  # and has not run far ahead


def test_constant_memory():
    def peak(count):
        most = 0
        for index, _ in enumerate(quavel.scan(itertools.repeat(NIGHT, count))):
            if index % 1000 == 0:
                most = max(most, resident_bytes())
        return most

    assert peak(50_000) - peak(2000) < 2_000_000


def test_side_by_side():
    expected = list(quavel.scan([NIGHT] * 2000))
    found = {}
    many = [
        threading.Thread(target=lambda i=i: found.update({i: list(quavel.scan([NIGHT] * 2000, 2))}))
        for i in range(3)
    ]
    for thread in many:
        thread.start()
    for a, b in zip(quavel.scan([NIGHT] * 2000), quavel.scan([NIGHT] * 2000)):
        assert a == b == expected[0]
    for thread in many:
        thread.join()
    assert found == {0: expected, 1: expected, 2: expected}


def test_fork():
    scan = quavel.scan(itertools.repeat(NIGHT), 2)
    next(scan)
    child = os.fork()
    if child == 0:
        signal.alarm(60)  # rather than wait for threads that are not there
        try:
            for _ in scan:  # first what the parent had taken over already
                pass
        except RuntimeError as error:
            fresh = [outcome(r) for r in quavel.scan([NIGHT] * 200)]
            os._exit(0 if "fork" in str(error) and fresh == [6032] * 200 else 1)
        finally:
            os._exit(2)
    assert os.waitpid(child, 0)[1] == 0
    assert next(scan).record.width == 6032  # the parent's goes on
    scan.close()


@pytest.mark.parametrize("method", ["fork", "spawn"])
def test_worker_processes(method, cut):
    with multiprocessing.get_context(method).Pool(2) as pool:
        records = pool.map(quavel.get, [NIGHT, PHOTOS / "river.cr3", cut])
        assert records == [quavel.get(NIGHT), quavel.get(PHOTOS / "river.cr3"), None]
        with pytest.raises(quavel.NoRecord) as raised:
            pool.map(quavel.read, [cut])
    assert raised.value.reason == "cut-short"


def test_ctrl_c():
    # A test run in the background may have been told to ignore the signal.
    heed = "import signal\nsignal.signal(signal.SIGINT, signal.default_int_handler)\n"
    code = heed + ENDLESS + "print(next(scan).record.width, flush=True)\nfor _ in scan: pass"
    with subprocess.Popen([sys.executable, "-c", code], stdout=-1, stderr=-1, text=True) as process:
        try:
            assert process.stdout.readline() == "6032\n"
            time.sleep(0.1)
            process.send_signal(signal.SIGINT)
            assert "KeyboardInterrupt" in process.communicate(timeout=60)[1]
        finally:
            process.kill()
    assert process.returncode == -signal.SIGINT


def test_exit_with_a_scan_open_or_threads_reading():
    reading = (
        "import collections, itertools, quavel, threading, time\n"
        f"for _ in range(4):\n    reads = map(quavel.get, itertools.repeat({NIGHT!r}))\n"
        "    threading.Thread(target=collections.deque, args=(reads, 0), daemon=True).start()\n"
        "time.sleep(0.1)\n"
    )
    for code in (ENDLESS + "next(scan)", reading, reading):
        assert subprocess.run([sys.executable, "-c", code], timeout=20, check=False).returncode == 0


@pytest.mark.parametrize("first", ["", "import quavel\n"])
def test_subinterpreters_are_refused(first):
    pytest.importorskip("_xxsubinterpreters")
    code = first + (
        "import _xxsubinterpreters as interpreters\n"
        "one = interpreters.create()\n"
        "try:\n"
        "    interpreters.run_string(one, 'import quavel')\n"
        "except interpreters.RunFailedError as error:\n"
        "    print(error)\n"
        "interpreters.destroy(one)\n"
        f"import quavel\nprint(quavel.read({NIGHT!r}).width)\n"
    )
    result = subprocess.run([sys.executable, "-c", code], capture_output=True, text=True, check=True)
    refusal, width = result.stdout.splitlines()
    assert "ImportError" in refusal and "sub-interpreter" in refusal
    assert width == "6032"
