#!/usr/bin/python3
"""Reads a folder tree of photos into one CSV table, on the workers of a Dask cluster.

Each task hands a batch of paths to `quavel --jsonl`. Without --scheduler, the cluster is a number
of processes on this machine; with it, the workers must see the photos under the same paths.
"""
import argparse
import csv
import json
import os
import subprocess
import sys

from distributed import Client, LocalCluster, as_completed

EXTENSIONS = ("tiff", "tif", "dng", "nef", "cr2", "raf", "arw", "jpeg", "jpg", "nrw", "3fr", "cr3")


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


def read_batch(command, paths):
    """The map step: one object for each path, with an `error` where there is no record."""
    names = b"".join(os.fsencode(path) + b"\0" for path in paths)
    # Dask runs a task for each core already, so the command reads one file at a time.
    arguments = [command, "--jsonl", "--quiet", "--jobs", "1", "--null", "--files-from", "-"]
    result = subprocess.run(arguments, input=names, capture_output=True, check=False)
    if result.returncode not in (0, 1):  # 1: some files gave no record, and their lines say so
        raise RuntimeError(result.stderr.decode(errors="replace"))
    return [json.loads(line) for line in result.stdout.splitlines()]


def write_table(rows, out):
    columns = list(dict.fromkeys(key for row in rows for key in row))
    table = csv.DictWriter(out, columns, restval="")
    table.writeheader()
    for row in rows:
        # Python would write True where the command and other tools write true.
        table.writerow({k: json.dumps(v) if isinstance(v, bool) else v for k, v in row.items()})


def main():
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("folder")
    parser.add_argument("--command", default="quavel", help="the quavel command [%(default)s]")
    parser.add_argument("--scheduler", help="address of a running cluster's scheduler")
    parser.add_argument("--workers", type=int, default=os.cpu_count(), help="[%(default)s]")
    parser.add_argument("--batch", type=int, default=500, help="photos in a task [%(default)s]")
    options = parser.parse_args()

    cluster = options.scheduler or LocalCluster(
        n_workers=options.workers, threads_per_worker=1, host="127.0.0.1", dashboard_address=None
    )
    with Client(cluster) as client:
        workers = client.scheduler_info()["workers"]
        parts = list(batches(photo_paths(options.folder), options.batch))
        # pure=False: the files behind equal paths may have changed since they were read last.
        tasks = client.map(read_batch, [options.command] * len(parts), parts, pure=False)
        rows = [row for _, part in as_completed(tasks, with_results=True) for row in part]
    rows.sort(key=lambda row: row["path"])  # batches end in any order
    write_table(rows, sys.stdout)
    failed = sum("error" in row for row in rows)
    print(f"{len(rows)} photos, {failed} without a record, {len(workers)} workers", file=sys.stderr)


if __name__ == "__main__":
    main()
