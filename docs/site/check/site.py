"""Checks the built site: every link inside leads somewhere, nothing is loaded from elsewhere, and every public class has its page.

site.py FOLDER
"""

import re
import sys
from html.parser import HTMLParser
from pathlib import Path
from urllib.parse import unquote, urlsplit

ROOT = Path(__file__).parents[3]


class Page(HTMLParser):
    def __init__(self, path):
        super().__init__()
        self.anchors = set()
        self.links = []
        self.loaded = []
        self.feed(path.read_text(encoding="utf-8"))

    def handle_starttag(self, tag, attrs):
        for name, value in attrs:
            if name in ("id", "name"):
                self.anchors.add(value)
            elif name == "href" and tag == "a":
                self.links.append(value)
            elif name in ("src", "href"):
                self.loaded.append(value)


def brokenLinks(pages):
    for path, page in pages.items():
        for link in page.links + page.loaded:
            parts = urlsplit(link)
            if parts.scheme or parts.netloc:
                if link in page.loaded:
                    yield f"{path}: loads {link}, which readers without a network do not have"
                continue
            target = (path.parent / unquote(parts.path)).resolve() if parts.path else path
            if not target.exists():
                yield f"{path}: {link} leads nowhere"
            elif target in pages and parts.fragment and unquote(parts.fragment) not in pages[target].anchors:
                yield f"{path}: {link} names no place of the page"


def publicClasses():
    """The classes that the headers of vtsym.hpp define, but for helpers in namespaces of their own and what derives from a class shown."""
    for header in re.findall(r'^#include "([^"]+)"', (ROOT / "vtsym.hpp").read_text(encoding="utf-8"), re.M):
        text = (ROOT / header).read_text(encoding="utf-8")
        text = re.sub(r"^namespace (?:VT::)?detail \{.*?^\} // namespace", "", text, flags=re.M | re.S)
        for name in re.findall(r"^(?:class|struct|enum class) (?:VTSYM_API )?(\w+)(?: final)?[^;{]*\{", text, re.M):
            yield header, name


def main():
    site = Path(sys.argv[1]).resolve()
    pages = {path.resolve(): Page(path) for path in site.rglob("*.html")}
    faults = list(brokenLinks(pages))
    shown = (site / "genindex.html").read_text(encoding="utf-8")
    for header, name in publicClasses():
        if not re.search(rf"\b{name}\b", shown):
            faults.append(f"{name} of {header} is on no page of the reference")
    print("\n".join(faults), file=sys.stderr)
    sys.exit(1 if faults or len(pages) < 30 else 0)


if __name__ == "__main__":
    main()
