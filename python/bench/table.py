#!/usr/bin/python3
"""Times the reading of photos from Python, with quavel and with others, as a Markdown table.

Of each reader, the files count that give it any metadata. It is timed in turn with quavel.get on the
same files, in many short rounds, of which the fastest counts: whatever else the machine does only
adds time.
"""
import argparse
import logging
import subprocess
import time
import warnings

import exifread
import PIL.Image

import quavel

ROUNDS = 40
REPEATS = 30  # of the fast readers
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


def each(read, repeats=1):
    def run(paths):
        start = time.perf_counter()
        for _ in range(repeats):
            for path in paths:
                read(path)
        return (time.perf_counter() - start) * 1e6 / len(paths) / repeats

    return run


def scan(paths):
    start = time.perf_counter()
    count = sum(1 for _ in quavel.scan(paths * SCANNED))
    return (time.perf_counter() - start) * 1e6 / count


def exiftool(paths):
    start = time.perf_counter()
    subprocess.run(["exiftool", "-json", *paths], stdout=-3, stderr=-3, check=False)
    return (time.perf_counter() - start) * 1e6 / len(paths)


def readers(by_path):
    def native(paths):
        command = [by_path, str(REPEATS), *paths]
        return float(subprocess.run(command, capture_output=True, check=True).stdout)

    def attributes(path):
        return quavel.get(path).to_dict()

    return [
        ("quavel, C++ by path", native, quavel.get),
        ("`quavel.get`", each(quavel.get, REPEATS), quavel.get),
        ("`quavel.get(...).to_dict()`", each(attributes, REPEATS), quavel.get),
        ("`quavel.scan`", scan, quavel.get),
        ("exifread", each(exif_read), exif_read),
        ("exifread, `details=False`", each(exif_read_less), exif_read_less),
        ("Pillow, `getexif`", each(pillow), pillow),
        ("exiftool, one call", exiftool, quavel.get),
    ]


def rows(name, paths, by_path):
    print(f"| {name} | Files | µs a file | Times `quavel.get` |\n|---|--:|--:|--:|")
    for label, run, probe in readers(by_path):
        readable = [path for path in paths if gives_something(probe, path)]
        if not readable:
            continue
        rounds = 3 if run is exiftool else ROUNDS
        times = [(run(readable), each(quavel.get, REPEATS)(readable)) for _ in range(rounds)]
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
