#!/usr/bin/python3
"""Tells what there is in a folder of photos: cameras, months, and what cannot be read."""
from __future__ import annotations

import argparse
from collections import Counter

import quavel


def print_counts(title: str, counts: Counter[str]) -> None:
    print(f"\n{title}")
    for name, count in counts.most_common(10):
        print(f"{count:8}  {name}")


def main() -> None:
    parser = argparse.ArgumentParser(description=__doc__)
    parser.add_argument("folder")
    options = parser.parse_args()

    sizes: Counter[str] = Counter()
    months: Counter[str] = Counter()
    problems: Counter[str] = Counter()
    for _, record, error in quavel.scan(options.folder):
        if error is not None:
            problems[error.reason] += 1
        if record is not None:
            size = f"{record.width} x {record.height}" if record.width else "no size"
            sizes[size] += 1
            months[f"{record.captured:%Y-%m}" if record.captured else "no date"] += 1

    print(f"{sum(sizes.values())} photos, {sum(problems.values())} without a record")
    print_counts("Size in pixels", sizes)
    print_counts("Month", months)
    print_counts("No record", problems)


if __name__ == "__main__":
    main()
