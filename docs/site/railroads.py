"""Draws each rule of a grammar: the directive `grammar`, whose text is EBNF as ebnf.py reads it.

A picture is SVG in the page, so that it takes the colours of the page, light or dark, and its names are links to their rules.  A part
that is repeated with a separator, `x { "," x }`, is drawn as one loop, and wide choices as columns, so that pictures fit a phone.
"""

import io
import re

import railroad
from docutils import nodes
from docutils.parsers.rst import directives
from sphinx.util.docutils import SphinxDirective

import ebnf

WIDEST = 330  # pixels of one line of a sequence


def draw(tree, anchor):
    kind = tree[0]
    if kind == "text":
        return railroad.Terminal(tree[1])
    if kind == "range":
        return railroad.Terminal(f"{tree[1]} … {tree[2]}")
    if kind == "name":
        return railroad.NonTerminal(tree[1], href="#" + anchor(tree[1]))
    if kind == "optional":
        return railroad.Optional(draw(tree[1], anchor))
    if kind == "repeat":
        return railroad.ZeroOrMore(draw(tree[1], anchor))
    if kind == "any":
        return railroad.Choice(0, *(draw(part, anchor) for part in tree[1]))
    return lines(drawn(tree[1], anchor))


def drawn(parts, anchor):
    """The parts of a sequence; x { s x } becomes one loop."""
    items = []
    for at, part in enumerate(parts):
        before = parts[at - 1] if at else None
        if part[0] == "repeat" and before is not None:
            inner = part[1][1] if part[1][0] == "all" else [part[1]]
            if inner[-1] == before:
                separator = drawn(inner[:-1], anchor)
                items[-1] = railroad.OneOrMore(draw(before, anchor), *separator)
                continue
        items.append(draw(part, anchor))
    return items


def lines(items):
    """A sequence, broken into lines where it is too wide."""
    rows, width = [[]], 0
    for item in items:
        if rows[-1] and width + item.width > WIDEST:
            rows.append([])
            width = 0
        rows[-1].append(item)
        width += item.width
    rows = [railroad.Sequence(*row) if len(row) > 1 else row[0] for row in rows]
    return rows[0] if len(rows) == 1 else railroad.Stack(*rows)


def picture(name, tree, anchor):
    diagram = railroad.Diagram(draw(tree, anchor), css=None)
    out = io.StringIO()
    diagram.writeSvg(out.write)
    svg = re.sub(r"<style>.*?</style>", "", out.getvalue(), flags=re.S).replace("xlink:href", "href")
    return svg.replace("<svg ", f'<svg role="img" aria-label="Railroad picture of {name}" ', 1)


class Grammar(SphinxDirective):
    """A grammar as text, and a picture of each of its rules."""

    has_content = True
    required_arguments = 1  # a prefix of the rules' anchors
    option_spec = {"class": directives.class_option}

    def run(self):
        text = "\n".join(self.content)
        rules = ebnf.parse(text)

        def anchor(name):
            return f"{self.arguments[0]}-{name.lower().replace('_', '-')}"

        pictures = []
        for name, tree in rules.items():
            figure = nodes.container(classes=["railroad"])
            figure["ids"].append(anchor(name))
            figure += nodes.paragraph("", "", nodes.literal("", name))
            figure += nodes.raw("", picture(name, tree, anchor), format="html")
            pictures.append(figure)
        block = nodes.literal_block(text, text, language="none")
        return [block, *pictures]


def setup(app):
    app.add_directive("grammar", Grammar)
    return {"parallel_read_safe": True, "parallel_write_safe": True}
