"""What small operations cost from Python, beside the same calls in C++: python/bench/run.

The least processor time of several rounds, so that other programs have no say.
"""

from __future__ import annotations

import subprocess
import sys
import time
import timeit

import vtsym

a, b = vtsym.parse("A > 1"), vtsym.parse("B")
other = vtsym.parse("A > 1 && B")
condition = vtsym.parse("A > 1 && B")
symbol = vtsym.Symbol("A")
OPERATIONS = {
    "a & b": lambda: a & b,
    "symbol > 1": lambda: symbol > 1,
    "a == b": lambda: a == b,
    "parse('A > 1 && B')": lambda: vtsym.parse("A > 1 && B"),
    "str(condition)": lambda: str(condition),
    "simplify() again": lambda: condition.simplify(),
    "implies() again": lambda: condition.implies(a),
    "evaluate(A=3, B=1)": lambda: condition.evaluate(A=3, B=1),
}

cpp = dict(line.split("\t") for line in subprocess.run([sys.argv[1]], capture_output=True, text=True, check=True).stdout.splitlines())
print(f"{'operation':24}{'C++':>10}{'Python':>10}{'more':>10}")
for name, call in OPERATIONS.items():
    calls = 100_000
    nanoseconds = min(timeit.repeat(call, timer=time.process_time, number=calls, repeat=7)) / calls * 1e9
    floor = float(cpp[name])
    print(f"{name:24}{floor:8.0f}ns{nanoseconds:8.0f}ns{nanoseconds - floor:8.0f}ns")
