"""Checks the grammars of the page of languages against the program, in both directions.

Sentences are made from a grammar at random, and some are damaged by a few characters.  The program has to read exactly those that the
grammar derives.  The recogniser shares nothing with the program: it computes, for a rule and a place, every place at which the rule
may end, and remembers that.
"""

import functools
import os
import random
import re
import subprocess
import sys
from pathlib import Path

sys.path.insert(0, str(Path(__file__).parents[1]))
import ebnf  # noqa: E402

PAGE = Path(__file__).parents[2] / "grammar.md"
SENTENCES = 1500  # for each language
DEEPEST = 24
HUGE = r"\d{9}|[eE][+-]?\d{3}"  # numbers that may be beyond their bounds
LEFT_TO_WORDS = {"c": HUGE, "quill": r"%|\.\.\.|\bend\b|" + HUGE}


def isToken(name):
    return name == name.upper()


class Writer:
    """Makes random sentences of a grammar; beyond a depth it takes the shortest way out."""

    def __init__(self, rules, dice):
        self.rules = rules
        self.dice = dice
        self.least = dict.fromkeys(rules, 10**6)  # the depth that a rule needs
        for _ in rules:
            for name, tree in rules.items():
                self.least[name] = min(self.least[name], 1 + self.depth(tree))

    def depth(self, tree):
        kind = tree[0]
        if kind == "name":
            return self.least[tree[1]]
        if kind == "all":
            return max(map(self.depth, tree[1]))
        return min(map(self.depth, tree[1])) if kind == "any" else 0

    def write(self, tree, room, blanks):
        kind = tree[0]
        if kind == "text":
            return self.blank(blanks) + tree[1]
        if kind == "range":
            return chr(self.dice.randint(ord(tree[1]), ord(tree[2])))
        if kind == "name":
            token = isToken(tree[1])
            before = self.blank(blanks) if token else ""
            return before + self.write(self.rules[tree[1]], room - 1, blanks and not token)
        if kind == "all":
            return "".join(self.write(part, room, blanks) for part in tree[1])
        if kind == "any":
            fitting = [part for part in tree[1] if self.depth(part) < room] or [min(tree[1], key=self.depth)]
            return self.write(self.dice.choice(fitting), room, blanks)
        times = 0 if self.depth(tree[1]) >= room else min(self.dice.choice((0, 0, 0, 1, 1, 2)), 1 if kind == "optional" else 2)
        return "".join(self.write(tree[1], room - 2, blanks) for _ in range(times))

    def blank(self, blanks):
        return " " if blanks and self.dice.random() < 0.1 else ""

    def damage(self, text):
        for _ in range(self.dice.randint(1, 2)):
            at = self.dice.randrange(len(text) + 1)
            if self.dice.random() < 0.5:
                text = text[:at] + text[at + 1 :]
            else:
                text = text[:at] + self.dice.choice("aB1.0()[]{},;:|&^=!~<>+-*/%'\\@#e") + text[at:]
        return text


def derives(rules, start, text):
    """Whether a grammar derives a text."""

    def skip(place):
        while place < len(text) and text[place] == " ":
            place += 1
        return place

    @functools.lru_cache(None)
    def rule(name, place):
        return ends(rules[name], place, isToken(name))

    def ends(tree, place, inToken):
        kind = tree[0]
        if kind == "text":
            place = place if inToken else skip(place)
            return {place + len(tree[1])} if text.startswith(tree[1], place) else set()
        if kind == "range":
            return {place + 1} if place < len(text) and tree[1] <= text[place] <= tree[2] else set()
        if kind == "name":
            return rule(tree[1], skip(place) if isToken(tree[1]) and not inToken else place)
        if kind == "any":
            return set().union(*(ends(part, place, inToken) for part in tree[1]))
        if kind == "all":
            places = {place}
            for part in tree[1]:
                places = set().union(*(ends(part, each, inToken) for each in places))
            return places
        reached, new = {place}, {place}
        while new:
            new = set().union(*(ends(tree[1], each, inToken) for each in new)) - reached
            reached |= new
            if kind == "optional":
                break
        return reached

    return any(skip(end) == len(text) for end in rule(start, 0))


def check(language, text):
    dice = random.Random(20)
    rules = ebnf.parse(text)
    start = next(iter(rules))
    writer = Writer(rules, dice)
    texts = set()
    while len(texts) < SENTENCES:
        sentence = writer.write(rules[start], dice.randint(12, DEEPEST), language == "c")
        if dice.random() < 0.5:
            sentence = writer.damage(sentence)
        if 0 < len(sentence) <= 60 and not re.search(LEFT_TO_WORDS[language], sentence):
            texts.add(sentence.strip() or "a")
    texts = sorted(texts)
    answers = subprocess.run(
        [os.environ["VTSYM_PROGRAM"], "convert", "--from", language, "--to", language],
        input="\n".join(texts) + "\n", capture_output=True, text=True, check=False,
    ).stdout.split("\n")[: len(texts)]
    derived = [derives(rules, start, each) for each in texts]
    wrong = [(each, expected) for each, expected, answer in zip(texts, derived, answers, strict=True) if expected != (answer != "")]
    for each, expected in wrong[:20]:
        print(f"{language}: {each!r} is {'derived' if expected else 'not derived'} by the grammar, unlike what the program reads")
    # A check that never saw a sentence, or never a damaged one, would say nothing.
    return not wrong and len(texts) // 4 < sum(derived) < len(texts)


def main():
    page = PAGE.read_text(encoding="utf-8")
    grammars = re.findall(r"^```\{grammar\} (\w+)\n(.*?)^```", page, re.M | re.S)
    if sorted(name for name, _ in grammars) != ["c", "quill"]:
        sys.exit("the page of languages does not have the two grammars")
    if not all([check(language, text) for language, text in grammars]):
        sys.exit("the grammars of the page of languages and the program differ")


if __name__ == "__main__":
    main()
