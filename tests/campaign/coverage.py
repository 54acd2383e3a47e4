"""Lists the open branches of a coverage report: coverage.py ROOT EXPORT REASONS.

A branch of a template or of a header counts as run where one of its instances runs.  REASONS has a file, a part of the line and the
reason that it stays open, between tabs; the last line of the output is the figure.
"""

import collections
import json
import pathlib
import sys

root = pathlib.Path(sys.argv[1])
reasons = [line.rstrip("\n").split("\t") for line in open(sys.argv[3]) if "\t" in line and not line.startswith("#")]
sides = collections.Counter()
for function in json.load(open(sys.argv[2]))["data"][0]["functions"]:
    for line, column, end_line, end_column, taken, missed, file, _, kind in function.get("branches", []):
        place = (function["filenames"][file], line, column)
        sides[(*place, True)] += taken
        sides[(*place, False)] += missed
totals = json.load(open(sys.argv[2]))["data"][0]["totals"]["lines"]

texts, explained, missing = {}, 0, []
for (path, line, column, side), count in sorted(sides.items()):
    name = str(pathlib.Path(path).relative_to(root)) if path.startswith(str(root)) else path
    if count or not name.startswith(("base/", "parser/")):
        continue
    text = texts.setdefault(path, open(path).read().split("\n"))[line - 1].strip()
    if any(reason[0] == name and reason[1] in text for reason in reasons):
        explained += 1
    else:
        missing.append(f"{name}:{line}:{column}\tnever {str(side).lower()}\t{text}")
ours = sum(1 for path, *_ in sides if path.startswith((str(root / "base"), str(root / "parser"))))
print("\n".join(missing))
run = ours - explained - len(missing)
print(f"coverage: {totals['covered']} of {totals['count']} lines ({totals['percent']:.1f} %), {run} of {ours} sides of branches "
      f"({100 * run / ours:.1f} %), {explained} open with a reason, {len(missing)} open")  # fmt: skip
