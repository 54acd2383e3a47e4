#!/usr/bin/python3
"""Scans trees in one process, on a cluster of this machine, and on one that loses a worker on the way.

The three reports have to have the same bytes.  Prints what a file costs beyond its scan.
"""

import io
import json
import os
import pathlib
import signal
import sys
import time
from typing import Callable, List

import scan_trees
from distributed import Client
from scan_trees import Totals

WORKERS = 2


def scan_here(trees: List[str], report: io.StringIO) -> Totals:
    """The same batches, in this process."""
    totals = Totals()
    for batch in scan_trees.batches_of(scan_trees.files_of(trees, lambda path, sentence: None)):
        outcome = scan_trees.scan_batch(batch)
        totals.add(len(batch), outcome)
        for line in outcome.lines:
            print(line, file=report)
    return totals


def ignore(totals: Totals) -> None:
    """Lets all workers live."""


class Killer:
    """Ends a worker after the first batch, as a machine does that fails."""

    def __init__(self, client: Client) -> None:
        self.client = client
        self.killed = 0

    def __call__(self, totals: Totals) -> None:
        if self.killed == 0:
            self.killed = min(self.client.run(os.getpid).values())
            os.kill(self.killed, signal.SIGKILL)


def main(trees: List[str]) -> int:
    # Small batches: a worker is lost while most of them are still to do, even in a small tree.
    size = sum(pathlib.Path(file).stat().st_size for file in scan_trees.files_of(trees, lambda path, sentence: None))
    scan_trees.BATCH_BYTES = min(scan_trees.BATCH_BYTES, size // (8 * WORKERS) + 1)
    begin = time.perf_counter()
    alone = io.StringIO()
    one = scan_here(trees, alone)
    print(f"one process: {one.files} files of {size / 1e6:.1f} MB in {time.perf_counter() - begin:.2f} s,"
          f" {one.findings} findings")
    if one.batches < 2 * WORKERS:
        sys.exit("the trees are too small to lose a worker on the way")
    failed = 0
    for loses in (False, True):
        begin = time.perf_counter()
        with scan_trees.start(None, WORKERS) as client:
            started = time.perf_counter()
            killer = Killer(client)
            report = io.StringIO()
            on_batch: Callable[[Totals], None] = killer
            if not loses:
                on_batch = ignore
            totals = scan_trees.scan_trees(client, trees, report, on_batch)
            elapsed = time.perf_counter() - started
            lost = loses and killer.killed not in client.run(os.getpid).values()
        name = "a cluster that loses a worker" if loses else "a cluster"
        same = report.getvalue() == alone.getvalue()
        failed += not same or lost != loses
        beyond = elapsed - totals.seconds / WORKERS
        print(f"{name}: started in {started - begin:.2f} s, {totals.batches} batches in {elapsed:.2f} s,"
              f" {beyond / totals.files * 1e6:.0f} us a file beyond the scan, the report is"
              f" {'the same' if same else 'another one'}{', a worker was lost' if lost else ''}")
    for line in alone.getvalue().splitlines():
        json.loads(line)
    return 1 if failed else 0


if __name__ == "__main__":
    sys.exit(main(sys.argv[1:] or [str(pathlib.Path(__file__).resolve().parents[2])]))
