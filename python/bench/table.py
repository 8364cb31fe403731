#!/usr/bin/python3
"""Times the reading of photos from Python, with quavel and with others, as a Markdown table.

Of each reader, the files count that give it any metadata. It is timed in turn with quavel.get on the
same files, in many short passes, of which the fastest counts: whatever else the machine does only
adds time.
"""
import argparse
import logging
import resource
import subprocess
import time
import warnings

import exifread
import PIL.Image

import quavel

ROUNDS = 40
PASSES = 30  # of the fast readers, in a round
SCANNED = 200  # times the files, so that starting the threads does not count


def exif_read(path):
    with open(path, "rb") as file:
        return exifread.process_file(file)


def exif_read_less(path):
    """Without maker notes and thumbnails."""
    with open(path, "rb") as file:
        return exifread.process_file(file, details=False)


def pillow(path):
    with PIL.Image.open(path) as image:
        return image.getexif()


def gives_something(read, path):
    try:
        return bool(read(path))
    except Exception:  # what it cannot read, it tells in many ways
        return False


def each(read, passes=1):
    """The fastest pass over the files."""

    def run(paths):
        fastest = float("inf")
        for _ in range(passes):
            start = time.perf_counter()
            for path in paths:
                read(path)
            fastest = min(fastest, time.perf_counter() - start)
        return fastest * 1e6 / len(paths)

    return run


def scan(paths):
    start = time.perf_counter()
    count = sum(1 for _ in quavel.scan(paths * SCANNED))
    return (time.perf_counter() - start) * 1e6 / count


def exiftool(paths):
    """The processor's time, which other programs hardly change. One call is too long to be alone."""
    many = paths * 4  # so that the start of the program counts less
    before = resource.getrusage(resource.RUSAGE_CHILDREN)
    subprocess.run(["exiftool", "-json", *many], stdout=-3, stderr=-3, check=False)
    after = resource.getrusage(resource.RUSAGE_CHILDREN)
    seconds = after.ru_utime + after.ru_stime - before.ru_utime - before.ru_stime
    return seconds * 1e6 / len(many)


def readers(by_path):
    def native(paths):
        command = [by_path, str(PASSES), *paths]
        return float(subprocess.run(command, capture_output=True, check=True).stdout)

    def attributes(path):
        return quavel.get(path).to_dict()

    return [
        ("quavel, C++ by path", native, quavel.get),
        ("`quavel.get`", each(quavel.get, PASSES), quavel.get),
        ("`quavel.get(...).to_dict()`", each(attributes, PASSES), quavel.get),
        ("`quavel.scan`", scan, quavel.get),
        ("exifread", each(exif_read), exif_read),
        ("exifread, `details=False`", each(exif_read_less), exif_read_less),
        ("Pillow, `getexif`", each(pillow), pillow),
        ("exiftool, one call (processor time)", exiftool, quavel.get),
    ]


def rows(name, paths, by_path):
    print(f"| {name} | Files | µs a file | Times `quavel.get` |\n|---|--:|--:|--:|")
    for label, run, probe in readers(by_path):
        readable = [path for path in paths if gives_something(probe, path)]
        if not readable:
            continue
        rounds = 2 if run is exiftool else ROUNDS
        times = [(run(readable), each(quavel.get, PASSES)(readable)) for _ in range(rounds)]
        own, get = (min(column) for column in zip(*times))
        print(f"| {label} | {len(readable)} | {own:.1f} | {own / get:.2f} |", flush=True)
    print()


def main():
    parser = argparse.ArgumentParser(description=__doc__)
    parser.add_argument("by_path", help="the program that reads in C++")
    parser.add_argument("folder", nargs="+")
    options = parser.parse_args()
    logging.disable()
    warnings.simplefilter("ignore")

    results = [result for folder in options.folder for result in quavel.scan(folder)]
    paths = [result.path for result in results if result.record]
    jpegs = [path for path in paths if path.lower().endswith((".jpg", ".jpeg"))]
    rows("JPEG", jpegs, options.by_path)
    rows("All formats", paths, options.by_path)


if __name__ == "__main__":
    main()
