"""Writes mutated copies of sources: mutate.py ROOT OUT COMPILE_COMMANDS FOLDER...

Each operator, condition, literal and statement that a mutant changes becomes a call of Mutants.hpp with the mutant's number; the
syntax tree is clang's.  What is evaluated by the compiler or comes from a macro is left alone.  What g++ then refuses (a narrowing,
a bit-field) is taken back, line by line, until it compiles, and counted.  OUT receives the copies and mutants.txt: number, file,
line, what was changed.
"""

import json
import multiprocessing
import pathlib
import re
import shlex
import subprocess
import sys

from clang.cindex import Config, CursorKind as Kind, Index, TypeKind

Config.set_library_file("/usr/lib/llvm-14/lib/libclang.so.1")

OPERATORS = {
    "<": "less", "<=": "lessEqual", ">": "greater", ">=": "greaterEqual", "==": "equal", "!=": "notEqual",
    "+": "plus", "-": "minus", "*": "times", "/": "divided", "%": "remainder",
    "&": "bitAnd", "|": "bitOr", "^": "bitXor", "<<": "shiftLeft", ">>": "shiftRight",
}  # fmt: skip
NUMBERS = {kind for kind in vars(TypeKind).values() if isinstance(kind, TypeKind) and TypeKind.BOOL.value <= kind.value <= 23}
STATEMENTS = {Kind.CALL_EXPR, Kind.UNEXPOSED_EXPR, Kind.BINARY_OPERATOR, Kind.COMPOUND_ASSIGNMENT_OPERATOR, Kind.UNARY_OPERATOR}
CONDITIONAL = {Kind.IF_STMT, Kind.WHILE_STMT, Kind.CONDITIONAL_OPERATOR}
BODIES = {Kind.COMPOUND_STMT, Kind.CONSTRUCTOR}


def is_number(expression, operator):
    kind = expression.type.get_canonical().kind
    return kind in NUMBERS or (kind == TypeKind.ENUM and operator in ("==", "!="))


class Source:
    """The mutants of one source: (line, what, insertions), where an insertion is (offset, text) around its extent."""

    def __init__(self, path, arguments):
        self.path = path
        self.bytes = pathlib.Path(path).read_bytes()
        self.mutants = []
        unit = Index.create().parse(path, args=arguments)
        for cursor in unit.cursor.get_children():
            if cursor.location.file and cursor.location.file.name == path:
                self.visit(cursor, False)

    def span(self, cursor):
        return cursor.extent.start.offset, cursor.extent.end.offset

    def text(self, start, end):
        return self.bytes[start:end].decode()

    def add(self, cursor, what, before, after, operator=None):
        start, end = self.span(cursor)
        if start < end <= len(self.bytes):
            self.mutants.append((cursor.extent.start.line, what, start, end, before, after, operator))

    def visit(self, cursor, in_function):
        kind = cursor.kind
        start, end = self.span(cursor)
        head = self.text(start, min(end, start + 60))
        if kind in (Kind.STATIC_ASSERT, Kind.ENUM_CONSTANT_DECL) or re.search(r"\bconsteval\b", head):
            return
        if kind == Kind.VAR_DECL and re.search(r"\bconst(expr|init)\b", head):
            return
        children = list(cursor.get_children())
        if kind == Kind.CASE_STMT or (kind == Kind.IF_STMT and re.match(r"if\s+constexpr", head)):
            children = children[1:]
        in_function = in_function or kind in BODIES
        if kind == Kind.VAR_DECL:  # what comes before its name is its type
            children = [child for child in children if self.span(child)[0] > cursor.location.offset]
        if in_function:
            self.mutate(cursor, children, start, head)
        for child in children:
            self.visit(child, in_function)
        if in_function:
            self.mutate_statements(cursor, children)

    def mutate(self, cursor, children, start, head):
        kind = cursor.kind
        if kind == Kind.BINARY_OPERATOR and len(children) == 2:
            between = (self.span(children[0])[1], self.span(children[1])[0])
            operator = re.sub(r"//.*|/\*.*?\*/|\s", "", self.text(*between))
            place = between[0] + self.text(*between).find(operator)
            if operator in OPERATORS and all(is_number(child, operator) for child in children):
                self.add(cursor, operator, f"::VT::Mutation::{OPERATORS[operator]}(#, ", ")", (place, len(operator), ","))
            elif operator in ("&&", "||"):
                self.add(cursor, operator, "::VT::Mutation::flip(#, ::VT::Mutation::flip(#, static_cast<bool>(",
                         ")))", (place, 2, f")) {operator} ::VT::Mutation::flip(#, static_cast<bool>("))  # fmt: skip
        elif kind == Kind.INTEGER_LITERAL and re.fullmatch(r"[0-9]+[uUlL]*", head):
            self.add(cursor, head, "::VT::Mutation::next(#, ", ")")
        elif kind == Kind.CXX_BOOL_LITERAL_EXPR and head in ("true", "false"):
            self.add(cursor, head, "::VT::Mutation::flip(#, ", ")")
        elif kind == Kind.UNARY_OPERATOR and head.startswith("!"):
            self.add(cursor, "!", "::VT::Mutation::flip(#, ", ")")
        elif kind in CONDITIONAL and children and children[0].kind in (Kind.CALL_EXPR, Kind.UNEXPOSED_EXPR, Kind.DECL_REF_EXPR):
            inner = children[0]
            while inner.kind == Kind.UNEXPOSED_EXPR and len(list(inner.get_children())) == 1:
                inner = next(inner.get_children())
            if inner.kind in (Kind.CALL_EXPR, Kind.DECL_REF_EXPR, Kind.MEMBER_REF_EXPR) and not head.startswith("if constexpr"):
                self.add(children[0], "condition", "::VT::Mutation::flip(#, static_cast<bool>(", "))")
        elif kind == Kind.RETURN_STMT and children and children[0].type.get_canonical().kind == TypeKind.BOOL:
            if children[0].kind in (Kind.CALL_EXPR, Kind.DECL_REF_EXPR):
                self.add(children[0], "answer", "::VT::Mutation::flip(#, ", ")")

    def mutate_statements(self, cursor, children):
        if cursor.kind == Kind.COMPOUND_STMT:
            bodies = children
        elif cursor.kind in (Kind.IF_STMT, Kind.WHILE_STMT):
            bodies = children[1:]
        elif cursor.kind in (Kind.FOR_STMT, Kind.CXX_FOR_RANGE_STMT):
            bodies = children[-1:]
        else:
            return
        for body in bodies:
            start, end = self.span(body)
            if body.kind in STATEMENTS and self.text(end, end + 1) == ";":
                self.add(body, "statement", "::VT::Mutation::on(#) ? void() : static_cast<void>(", ")")
            elif body.kind in (Kind.BREAK_STMT, Kind.CONTINUE_STMT) and not re.match(r";\s*else", self.text(end, end + 99)):
                self.add(body, self.text(start, end), "if (!::VT::Mutation::on(#)) ", "")

    def written(self, kept, numbers):
        """The source with the mutants `kept`; numbers[i] is the number of mutant i."""
        insertions = []
        for index in kept:
            _, _, start, end, before, after, operator = self.mutants[index]
            number = str(numbers[index])
            insertions.append((start, 1, -end, index, 0, before.replace("#", number)))
            insertions.append((end, 0, -start, -index, 0, after))
            if operator:
                insertions.append((operator[0], 1, 0, index, operator[1], operator[2].replace("#", number)))
        parts, at = [], 0
        for offset, _, _, _, dropped, text in sorted(insertions):
            parts.append(self.text(at, offset))
            parts.append(text)
            at = offset + dropped
        parts.append(self.text(at, len(self.bytes)))
        return "".join(parts)


def compiles(source, text, command, place):
    """The lines of the mutated text that g++ refuses."""
    place.parent.mkdir(parents=True, exist_ok=True)
    place.write_text(text)
    result = subprocess.run(command + ["-w", "-fsyntax-only", "-fmax-errors=0", str(place)], capture_output=True, text=True)
    lines = {int(line) for line in re.findall(r"^" + re.escape(source.path) + r":(\d+):\d+: (?:error|note)", result.stderr, re.M)}
    errors = {int(line) for line in re.findall(r"^" + re.escape(source.path) + r":(\d+):\d+: error", result.stderr, re.M)}
    if result.returncode and not lines:
        sys.exit(f"{source.path} does not compile:\n{result.stderr[:2000]}")
    return errors or lines


def one(job):
    path, arguments, command, root, out = job
    source = Source(path, arguments)
    kept = list(range(len(source.mutants)))
    numbers = dict.fromkeys(kept, 1)
    place = out / pathlib.Path(path).relative_to(root)
    header = f'#include "tests/mutation/Mutants.hpp"\n#line 1 "{path}"\n'
    while refused := compiles(source, header + source.written(kept, numbers), command, place):
        lines = source.bytes.count(b"\n") + 1
        left = [i for i in kept if not any(source.mutants[i][0] <= line <= end_line(source, i) for line in refused)]
        if len(left) == len(kept):
            sys.exit(f"{path}: refused lines {sorted(refused)[:5]} of {lines} have no mutants")
        kept = left
    return source.mutants, source.bytes, kept


def end_line(source, index):
    return source.bytes[: source.mutants[index][3]].count(b"\n") + 1


def main():
    root, out = pathlib.Path(sys.argv[1]), pathlib.Path(sys.argv[2])
    folders = tuple(str(root / folder) + "/" for folder in sys.argv[4:])
    resources = subprocess.run(["clang++", "-print-resource-dir"], capture_output=True, text=True, check=True).stdout.strip()
    jobs = []
    for entry in json.load(open(sys.argv[3])):
        path = entry["file"]
        if not path.startswith(folders) or any(job[0] == path for job in jobs):
            continue
        flags = [word for word in shlex.split(entry["command"]) if re.match(r"-[DI]|-isystem|-std", word)]
        flags += ["-I" + str(root)]
        jobs.append((path, flags + ["-resource-dir", resources], ["g++", "-std=c++20", *flags], root, out))
    jobs.sort()
    with multiprocessing.Pool() as pool:
        results = pool.map(one, jobs, chunksize=1)
    number, taken_back = 0, 0
    with open(out / "mutants.txt", "w") as table:
        for job, (mutants, content, kept) in zip(jobs, results):
            source = Source.__new__(Source)
            source.path, source.bytes, source.mutants = job[0], content, mutants
            numbers, lines = {}, content.decode().split("\n")
            for index in kept:
                number += 1
                numbers[index] = number
                line, what, start, end = mutants[index][:4]
                shown = re.sub(r"\s+", " ", source.text(start, end))[:100]
                if len(shown) < 12:  # too little to know it by
                    shown = lines[line - 1].strip()
                table.write(f"{number}\t{pathlib.Path(job[0]).relative_to(root)}\t{line}\t{what}\t{shown}\n")
            taken_back += len(mutants) - len(kept)
            place = out / pathlib.Path(job[0]).relative_to(root)
            text = f'#include "tests/mutation/Mutants.hpp"\n#line 1 "{job[0]}"\n' + source.written(kept, numbers)
            place.write_text(text)
    print(f"{number} mutants in {len(jobs)} sources, {taken_back} more do not compile")


main()
