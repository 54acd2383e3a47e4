"""Runs the Python of the pages: the `pycon` blocks of a page, in its order, are one session.  Also compares the reference with the package."""

import doctest
import os
import sys
from pathlib import Path

import vtsym

DOCS = Path(__file__).parents[2]


def session(page):
    """The text of a page in which every line outside of its `pycon` blocks is empty."""
    lines, inside = [], False
    for line in page.read_text(encoding="utf-8").splitlines():
        if line.startswith("```"):
            inside = line == "```pycon"
            line = ""
        lines.append(line if inside else "")
    return "\n".join(lines) + "\n"


def main():
    os.chdir(DOCS.parent)
    runner = doctest.DocTestRunner(optionflags=doctest.ELLIPSIS)
    for page in sorted(DOCS.rglob("*.md")):
        runner.run(doctest.DocTestParser().get_doctest(session(page), {}, page.name, str(page), 0))
    failed, attempted = runner.summarize()
    reference = (DOCS / "reference" / "python.md").read_text(encoding="utf-8")
    missing = [name for name in vtsym.__all__ if not name.startswith("_") and f":: {name}\n" not in reference]
    if missing:
        print(f"not in the reference of the package: {', '.join(missing)}")
    sys.exit(1 if failed or missing or attempted < 20 else 0)


if __name__ == "__main__":
    main()
