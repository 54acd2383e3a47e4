#!/usr/bin/python3
"""Scans the C and C++ sources of many trees on a Dask cluster.

    scan_trees.py [--scheduler ADDRESS | --workers N] [--report FILE] TREE...

Files are independent, so the work is cut into batches of about equal size; a task costs the scheduler some milliseconds,
a file often less.  Results are written in the order of the files, whichever worker is first, so that two runs give the
same bytes.  A batch whose worker is lost runs again elsewhere.  Only a bounded number of batches is under way at once:
memory does not grow with the number of trees.
"""

import argparse
import collections
import json
import pathlib
import sys
import time
from typing import Any, Callable, Deque, Iterable, Iterator, List, NamedTuple, Optional, TextIO

import dask
from distributed import Client, Future, LocalCluster

import vtsym

BATCH_BYTES = 4 << 20  # about half a second of scanning
BATCH_FILES = 2000
BATCHES_PER_THREAD = 4  # under way: enough to keep every worker busy
RETRIES = 3  # of a batch whose worker dies


class Outcome(NamedTuple):
    """What a batch came to."""

    lines: List[str]  # findings, one JSON object each
    problems: List[str]
    seconds: float  # of scanning


def files_of(trees: Iterable[str], on_problem: Callable[[str, str], None]) -> Iterator[str]:
    """The sources of each tree, tree after tree, in the order of the scan."""
    for tree in trees:
        yield from vtsym.source_files(tree, on_problem=on_problem)


def batches_of(files: Iterable[str]) -> Iterator[List[str]]:
    batch: List[str] = []
    size = 0
    for file in files:
        batch.append(file)
        try:
            size += pathlib.Path(file).stat().st_size
        except OSError:
            pass  # the scan reports it
        if size >= BATCH_BYTES or len(batch) >= BATCH_FILES:
            yield batch
            batch, size = [], 0
    if batch:
        yield batch


def scan_batch(files: List[str]) -> Outcome:
    """Runs on a worker."""
    begin = time.perf_counter()
    problems: List[str] = []
    findings = vtsym.scan(files, on_problem=lambda path, sentence: problems.append(f"{path}: {sentence}"))
    lines = [
        json.dumps({"file": each.file, "line": each.line, "kind": each.kind, "directive": each.directive,
                    "proposed": each.proposed})
        for each in findings
    ]
    return Outcome(lines, problems, time.perf_counter() - begin)


class Totals:
    """What all batches came to."""

    def __init__(self) -> None:
        self.files = self.batches = self.findings = self.problems = 0
        self.seconds = 0.0

    def add(self, files: int, outcome: Outcome) -> None:
        self.files += files
        self.batches += 1
        self.findings += len(outcome.lines)
        self.problems += len(outcome.problems)
        self.seconds += outcome.seconds


class Pending(NamedTuple):
    """A batch under way."""

    files: int
    outcome: Future


def scan_trees(
    client: Client, trees: Iterable[str], report: TextIO, on_batch: Callable[[Totals], None] = lambda totals: None
) -> Totals:
    """Scans the trees and writes findings as JSON lines, in the order of the files."""
    totals = Totals()
    pending: Deque[Pending] = collections.deque()

    def write_oldest() -> None:
        files, future = pending.popleft()
        outcome: Outcome = future.result()
        totals.add(files, outcome)
        for line in outcome.lines:
            print(line, file=report)
        for problem in outcome.problems:
            print(problem, file=sys.stderr)
        on_batch(totals)

    def note_problem(path: str, sentence: str) -> None:
        totals.problems += 1
        print(f"{path}: {sentence}", file=sys.stderr)

    for batch in batches_of(files_of(trees, note_problem)):
        pending.append(Pending(len(batch), client.submit(scan_batch, batch, retries=RETRIES, pure=False)))
        if len(pending) >= BATCHES_PER_THREAD * max(1, sum(client.nthreads().values())):
            write_oldest()
    while pending:
        write_oldest()
    return totals


def start(scheduler: Optional[str], workers: int) -> Client:
    """A cluster that is there, or one on this machine."""
    dask.config.set({"distributed.scheduler.allowed-failures": RETRIES})
    if scheduler:
        return Client(scheduler)
    return Client(LocalCluster(n_workers=workers, threads_per_worker=1, dashboard_address=None))


def main(arguments: Optional[List[str]] = None) -> int:
    assert __doc__ is not None
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("--scheduler", help="address of a Dask scheduler; without it, a cluster on this machine")
    parser.add_argument("--workers", type=int, default=2, help="processes of the cluster on this machine")
    parser.add_argument("--report", help="file for the findings, instead of standard output")
    parser.add_argument("trees", nargs="+", metavar="TREE")
    options = parser.parse_args(arguments)
    with start(options.scheduler, options.workers) as client:
        begin = time.perf_counter()
        if options.report:
            unfinished = pathlib.Path(options.report + ".part")
            with unfinished.open("w", encoding="utf-8") as report:
                totals = scan_trees(client, options.trees, report)
            unfinished.rename(options.report)  # a report is whole or not there
        else:
            totals = scan_trees(client, options.trees, sys.stdout)
        elapsed = time.perf_counter() - begin
        workers = max(1, sum(client.nthreads().values()))
    print(f"{totals.files} files in {totals.batches} batches: {totals.findings} findings, {totals.problems} problems,"
          f" {elapsed:.2f} s, of which each of {workers} workers scanned {totals.seconds / workers:.2f} s", file=sys.stderr)
    return 2 if totals.problems else 1 if totals.findings else 0


if __name__ == "__main__":
    sys.exit(main())
