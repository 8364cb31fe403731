import collections
import concurrent.futures
import gc
import itertools
import multiprocessing
import os
import re
import signal
import subprocess
import sys
import time

import pytest
from conftest import NIGHT, PHOTOS, ROOT, resident_bytes, threads

import quavel

ENDLESS = f"import itertools, quavel\nscan = quavel.scan(itertools.repeat({str(NIGHT)!r}))\n"


def outcome(result):
    return result.record.width if result.record else result.error.reason


@pytest.mark.parametrize("jobs", [None, 1, 2, 50])
def test_order(jobs, cut):
    cases = [
        (str(NIGHT), 6032),
        (cut, "cut-short"),
        (b"/none.nef", "cannot-open"),
        (PHOTOS / "river.cr3", 6000),
        ("a\0.nef", "bad-path"),
        (PHOTOS, "folder"),
        (ROOT / "README.md", "unknown-extension"),
    ]
    paths, expected = zip(*cases * 300)
    results = list(quavel.scan(iter(paths), jobs))
    assert [result.path for result in results] == list(paths)
    assert [outcome(result) for result in results] == list(expected)
    assert all((result.record is None) != (result.error is None) for result in results)
    assert results[1].error.path == cut and results[2].error.errno == 2


def test_folders(tmp_path):
    names = ["b/z.nef", "b.nef", "B.NEF", "a/x/y.nef", "b/notes.txt", "._b.nef", ".trash/t.nef"]
    for name in names:
        path = tmp_path / name
        path.parent.mkdir(parents=True, exist_ok=True)
        path.write_bytes(NIGHT.read_bytes())
    os.mkfifo(tmp_path / "pipe.nef")
    for name, target in (("a/loop", tmp_path), ("gone.nef", "nowhere"), ("link.nef", "b.nef")):
        (tmp_path / name).symlink_to(target)
    expected = ["B.NEF", "a/x/y.nef", "b/z.nef", "b.nef", "gone.nef", "late", "link.nef"]
    (tmp_path / "late").mkdir()
    scan = quavel.scan(tmp_path)
    (tmp_path / "late").rmdir()  # which the scan has seen
    results = {os.path.relpath(r.path, tmp_path): r for r in scan}
    assert list(results) == expected
    assert {name for name, result in results.items() if result.error} == {"gone.nef", "late"}
    assert results["late"].error.args[1::2] == ("unreadable-folder", 2)
    assert [outcome(r) for r in quavel.scan([tmp_path / "pipe.nef"])] == ["special-file"]


def test_failures_of_the_iterable():
    def paths(last):
        yield from [NIGHT] * 500
        raise last

    for last in (LookupError("lost"), KeyboardInterrupt()):
        found = []
        with pytest.raises(type(last)):
            found.extend(quavel.scan(paths(last)))
        assert (len(found) == 500) == isinstance(last, LookupError)  # an interrupt comes at once
    with pytest.raises(TypeError, match="paths_or_folder must be str, bytes or .* not int"):
        list(quavel.scan([NIGHT, 1]))
    assert threads() == 1


def test_ends_its_threads():
    pulled = itertools.count()
    for leave in ("close", "collect", "cycle"):
        holder = {}
        scan = quavel.scan(map(lambda _, holder=holder: NIGHT, pulled), 4)
        assert {outcome(result) for result in itertools.islice(scan, 1000)} == {6032}
        assert 1 < threads() <= 5
        if leave == "close":
            scan.close()
        elif leave == "cycle":
            holder["scan"] = scan  # which the iterable of the scan refers to
        del scan, holder
        gc.collect()
        assert threads() == 1
        assert next(pulled) < 7000  # and has not run far ahead


def test_one_job_takes_no_thread():
    for paths in ([], [NIGHT] * 500, PHOTOS):
        assert {threads() for _ in quavel.scan(paths, 1)} <= {1}


@pytest.mark.parametrize("jobs", [1, 2])
def test_leaves_slow_photos_unread(tmp_path, jobs):
    slow = tmp_path / "slow.jpg"
    slow.write_bytes(b"\xff\xd8" * 3_000_000)
    start = time.monotonic()
    assert quavel.get(slow)
    one = time.monotonic() - start
    quick = 63 + 64 * 40  # batches have grown to 64 then, and the next one is all slow
    scan = quavel.scan(itertools.chain([NIGHT] * quick, itertools.repeat(slow)), jobs)
    assert sum(1 for _ in itertools.islice(scan, quick - 100)) == quick - 100
    signal.signal(signal.SIGALRM, signal.default_int_handler)
    signal.setitimer(signal.ITIMER_REAL, one + 0.02)
    start = time.monotonic()
    with pytest.raises(KeyboardInterrupt):
        collections.deque(scan, 0)
    scan.close()
    assert time.monotonic() - start < 12 * one + 0.7


def test_constant_memory():
    def peak(count):
        scan = enumerate(quavel.scan(itertools.repeat(NIGHT, count)))
        return max(resident_bytes() for index, _ in scan if index % 1000 == 0)

    assert peak(20_000) - peak(2000) < 2_000_000


def test_side_by_side():
    def pairs(jobs):
        return list(zip(quavel.scan([NIGHT] * 2000), quavel.scan([NIGHT] * 2000, jobs)))

    with concurrent.futures.ThreadPoolExecutor() as threads:
        found = list(threads.map(pairs, [1, 2, 3]))
    assert found == [[((NIGHT, quavel.read(NIGHT), None),) * 2] * 2000] * 3


def test_fork():
    scan = quavel.scan(itertools.repeat(NIGHT), 2)
    next(scan)

    def go_on():
        with pytest.raises(RuntimeError, match="fork"):
            collections.deque(scan, 0)  # first what the parent had taken over already
        assert {outcome(result) for result in quavel.scan([NIGHT] * 200)} == {6032}

    child = multiprocessing.get_context("fork").Process(target=go_on, daemon=True)
    child.start()
    child.join(60)  # rather than wait for threads that are not there
    assert child.exitcode == 0
    assert next(scan).record.width == 6032  # the parent's goes on
    scan.close()


@pytest.mark.parametrize("method", ["fork", "spawn"])
def test_worker_processes(method, cut):
    with multiprocessing.get_context(method).Pool(2) as pool:
        assert pool.map(quavel.get, [NIGHT, cut]) == [quavel.get(NIGHT), None]
        with pytest.raises(quavel.NoRecord, match="cut.nef"):
            pool.map(quavel.read, [cut])


def test_ctrl_c():
    code = ENDLESS + (
        "import collections, os, signal, threading\n"
        "signal.signal(signal.SIGINT, signal.default_int_handler)\n"  # a shell's "&" ignores it
        "threading.Timer(0.1, os.kill, (os.getpid(), signal.SIGINT)).start()\n"
        "collections.deque(scan, 0)"
    )
    result = subprocess.run([sys.executable, "-c", code], stderr=-1, timeout=60, check=False)
    assert b"KeyboardInterrupt" in result.stderr and result.returncode == -signal.SIGINT


def test_exit_with_a_scan_open_or_threads_reading():
    reading = (
        "import collections, itertools, quavel, threading, time\n"
        f"for _ in range(4):\n    reads = map(quavel.get, itertools.repeat({str(NIGHT)!r}))\n"
        "    threading.Thread(target=collections.deque, args=(reads, 0), daemon=True).start()\n"
        "time.sleep(0.05)\n"
    )
    for code in (ENDLESS + "next(scan)", reading, reading):
        subprocess.run([sys.executable, "-c", code], timeout=20, check=True)


@pytest.mark.parametrize("first", ["", "import quavel\n"])
def test_subinterpreters_are_refused(first):
    pytest.importorskip("_xxsubinterpreters")
    code = first + (
        "import _xxsubinterpreters as interpreters\n"
        "try:\n    interpreters.run_string(interpreters.create(), 'import quavel')\n"
        f"finally:\n    import quavel\n    assert quavel.read({str(NIGHT)!r}).width == 6032\n"
    )
    error = subprocess.run([sys.executable, "-c", code], stderr=-1, check=False).stderr
    assert re.search(b"ImportError.*: quavel cannot be used in a sub-interpreter$", error.strip())
