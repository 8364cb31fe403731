#!/usr/bin/python3
"""Reads a folder tree of photos into one CSV table, on the workers of a Dask cluster.

Each task reads a batch of paths in the worker's own process. Without --scheduler, the cluster is a
number of processes on this machine; with it, the workers must see the photos under the same paths.
"""
import argparse
import csv
import os
import sys

import quavel
from distributed import Client, LocalCluster, as_completed

EXTENSIONS = ("tiff", "tif", "dng", "nef", "cr2", "raf", "arw", "jpeg", "jpg", "nrw", "3fr", "cr3")
COLUMNS = ("capture_date", "width", "height", "orientation", "model", "lens_model", "iso")
COLUMNS += ("exposure_time", "f_number", "focal_length")


def photo_paths(folder):
    for parent, _, names in os.walk(folder):
        for name in names:
            if name.rpartition(".")[2].lower() in EXTENSIONS:
                yield os.path.join(parent, name)


def batches(paths, size):
    batch = []
    for path in paths:
        batch.append(path)
        if len(batch) == size:
            yield batch
            batch = []
    if batch:
        yield batch


def read_batch(paths):
    """The map step: one row for each path, with an `error` where there is no record."""
    rows = []
    # Dask runs a task for each core already.
    for path, record, error in quavel.scan(paths, jobs=1):
        row = {"path": path}
        if record:
            row.update((column, getattr(record, column)) for column in COLUMNS)
        else:
            row.update(error=error.text, reason=error.reason)
        rows.append(row)
    return rows


def write_table(rows, out):
    table = csv.DictWriter(out, ("path", *COLUMNS, "error", "reason"))
    table.writeheader()
    table.writerows(rows)


def main():
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("folder")
    parser.add_argument("--scheduler", help="address of a running cluster's scheduler")
    parser.add_argument("--workers", type=int, default=os.cpu_count(), help="[%(default)s]")
    parser.add_argument("--batch", type=int, default=500, help="photos in a task [%(default)s]")
    options = parser.parse_args()
    sys.stdout.reconfigure(errors="surrogateescape")  # names that are not UTF-8 keep their bytes

    cluster = options.scheduler or LocalCluster(
        n_workers=options.workers, threads_per_worker=1, host="127.0.0.1", dashboard_address=None
    )
    with Client(cluster) as client:
        workers = client.scheduler_info()["workers"]
        parts = list(batches(photo_paths(options.folder), options.batch))
        # pure=False: what is at a path may have changed since it was last read.
        tasks = client.map(read_batch, parts, pure=False)
        rows = [row for _, part in as_completed(tasks, with_results=True) for row in part]
    rows.sort(key=lambda row: row["path"])  # batches end in any order
    write_table(rows, sys.stdout)
    failed = sum("error" in row for row in rows)
    print(f"{len(rows)} photos, {failed} without a record, {len(workers)} workers", file=sys.stderr)


if __name__ == "__main__":
    main()
