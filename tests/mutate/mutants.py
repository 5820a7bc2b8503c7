# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""What could be written wrongly in the layer: small changes of its sources, each with a name that outlives edits
elsewhere. clang reads the sources; what it says of places, types and conversions is all that is gone by."""

import bisect
import collections
import dataclasses
import hashlib
import json
import re
import subprocess

KINDS = ("argument", "cell", "condition", "constant", "narrow", "operator", "order", "statement", "text", "truth")
BESIDE = {"<": ("<=", ">="), "<=": ("<", ">"), ">": (">=", "<="), ">=": (">", "<"), "==": ("!=",), "!=": ("==",),
          "&&": ("||",), "||": ("&&",), "+": ("-",), "-": ("+",), "*": ("/",), "/": ("*",), "%": ("*",),
          "<<": (">>",), ">>": ("<<",), "&": ("|",), "|": ("&",), "^": ("|",), "+=": ("-=",), "-=": ("+=",),
          "|=": ("&=",), "&=": ("|=",), "<<=": (">>=",), ">>=": ("<<=",), "++": ("--",), "--": ("++",)}
OF_TWO = {"&&", "||", "|", "&"}  # either side could have been forgotten
COMPARES = {"<", "<=", ">", ">=", "==", "!="}
TRUTHS = {"TRUE": 1, "FALSE": 0, "0": 0, "1": 1}
NARROWER = {"unsigned long": "UINT32", "unsigned int": "UINT16", "int": "short", "unsigned short": "UCHAR"}
WIDTH = {"bool": 1, "char": 8, "unsigned char": 8, "signed char": 8, "short": 16, "unsigned short": 16, "int": 32,
         "unsigned int": 32, "long": 64, "unsigned long": 64}
WITHOUT_OPERATION = ("ImplicitCastExpr", "ParenExpr", "ConstantExpr", "ExprWithCleanups", "MaterializeTemporaryExpr")
LEAVES = ("ReturnStmt", "BreakStmt", "ContinueStmt")
NAME = re.compile(r"[A-Za-z_]\w*")
BLANKS = re.compile(r"(?:\s|//[^\n]*\n|/\*.*?\*/)*", re.S)


class Failed(Exception):
    """Something that ends the run."""


@dataclasses.dataclass(frozen=True)
class Mutant:
    file: str
    function: str
    kind: str
    name: str  # FILE:FUNCTION:KIND:ORDINAL-HASH
    start: int  # what is replaced
    end: int
    text: str

    def applied(self, original):
        return original[:self.start] + self.text + original[self.end:]


class Syntax:
    """One source as clang reads it."""

    def __init__(self, path, command):
        ran = subprocess.run([*command, str(path)], capture_output=True, check=False)
        if ran.returncode != 0:
            raise Failed(f"{path}: clang cannot read it:\n{ran.stderr.decode()[-2000:]}")
        self.tree = json.loads(ran.stdout)
        self._file = None
        self._note_files(self.tree)

    def _note_files(self, node):
        """A place tells its file only where that is another one than the place before it."""
        if "offset" in node:
            node["file"] = self._file = node.get("file", self._file)
        for value in node.values():
            for each in value if isinstance(value, list) else [value]:
                if isinstance(each, dict):
                    self._note_files(each)


def kind_of(node):
    return node.get("kind", "")


def children(node):
    return [child for child in node.get("inner", []) if child]


def within(node, kind):
    """All of that kind, however deep."""
    for child in children(node):
        if kind_of(child) == kind:
            yield child
        yield from within(child, kind)


def bare(node):
    """What stands there, without the conversions around it."""
    while kind_of(node) in WITHOUT_OPERATION and len(children(node)) == 1:
        node = children(node)[0]
    return node


def type_of(node):
    """The type behind the names of types, without const."""
    told = node.get("type", {})
    found = told.get("desugaredQualType", told.get("qualType", ""))
    return re.sub(r"\b(const|volatile)\b ?", "", found).strip()


def is_constant(node):
    node = bare(node)
    if kind_of(node) in ("UnaryOperator", "BinaryOperator", "CStyleCastExpr", "UnaryExprOrTypeTraitExpr"):
        return all(is_constant(child) for child in children(node))
    reference = node.get("referencedDecl", {})
    return (kind_of(node).endswith("Literal") or kind_of(node) == "CXXNullPtrLiteralExpr" or
            kind_of(reference) == "EnumConstantDecl" or is_named_constant(node))


def is_named_constant(node):
    """Of integer type, and const: a name of a number."""
    reference = node.get("referencedDecl", {})
    told = reference.get("type", {}).get("qualType", "")
    return kind_of(reference) == "VarDecl" and told.startswith("const ") and type_of(node) in WIDTH


class File:
    """The mutants of one file, in the order in which they are found."""

    def __init__(self, path, text):
        self._path, self.text, self._found, self._seen = str(path), text, [], set()
        self._bytes_before = None if text.isascii() else self._offsets()
        self._file = path.name

    def _offsets(self):
        """clang counts bytes."""
        total, offsets = 0, []
        for character in self.text:
            offsets.append(total)
            total += len(character.encode())
        return [*offsets, total]

    def _at(self, offset):
        return offset if self._bytes_before is None else bisect.bisect_left(self._bytes_before, offset)

    def _end_of_macro(self, start, length):
        """Of a macro with arguments the place is its name alone."""
        end = start + length
        if not NAME.fullmatch(self.text[start:end]) or self.text[end:end + 1] != "(":
            return end
        depth = 0
        for match in re.finditer(r'"(?:\\.|[^"\\])*"|[()]', self.text[end:]):
            depth += {"(": 1, ")": -1}.get(match[0], 0)
            if depth == 0:
                return end + match.end()
        raise Failed(f"{self._file}: a bracket without its end behind {self.text[start:end]}")

    def _place(self, place):
        """(start, end) of a token, or of the macro that it comes from."""
        spelt, used = place.get("spellingLoc"), place.get("expansionLoc")
        if used is None:
            if place.get("file") != self._path or "offset" not in place:
                return None
            start = self._at(place["offset"])
            return start, start + place["tokLen"]
        if used.get("isMacroArgExpansion") and spelt.get("file") == self._path:
            start = self._at(spelt["offset"])
            return start, start + spelt["tokLen"]
        if used.get("file") != self._path:
            return None
        start = self._at(used["offset"])
        return start, self._end_of_macro(start, used["tokLen"])

    def span(self, node):
        """(start, end) of what is written there; none when that is not in one piece."""
        begin, end = (self._place(node.get("range", {}).get(side, {})) for side in ("begin", "end"))
        if begin is None or end is None or begin[0] >= end[1]:
            return None
        text = self.text[begin[0]:end[1]]
        return (begin[0], end[1]) if text.count("(") == text.count(")") or '"' in text else None

    def written(self, node):
        span = self.span(node)
        return self.text[span[0]:span[1]] if span else ""

    def note(self, function, kind, span, text):
        if span is None or (*span, text) in self._seen or self.text[span[0]:span[1]] == text:
            return
        self._seen.add((*span, text))
        self._found.append((function, kind, span, text))

    def mutants(self):
        """A name has the text of the line, and counts among those of the same text: other lines may come and go."""
        number = collections.Counter()
        for function, kind, (start, end), text in sorted(self._found, key=lambda found: (found[2], found[1])):
            first, last = self.text.rfind("\n", 0, start) + 1, self.text.find("\n", start)
            line = " ".join(self.text[first:last].split())
            said = f"{self._file}:{function}:{kind}"
            digest = hashlib.sha256(line.encode()).hexdigest()[:6]
            number[said, digest] += 1
            yield Mutant(self._file, function, kind, f"{said}:{number[said, digest]}-{digest}", start, end, text)


class Finder:
    """Goes through one function or table of a file."""

    def __init__(self, file, declaration):
        self._file, self._function = file, declaration["name"]
        self._is_table = kind_of(declaration) == "VarDecl"
        self._counters = {counter.get("name") for loop in within(declaration, "ForStmt")
                          for counter in children(loop["inner"][0])}
        self._is_own = declaration.get("storageClass") == "static"  # others know its parameters' types

    def _note(self, kind, node, text):
        self._file.note(self._function, kind, self._file.span(node), text)

    def visit(self, node):
        look = getattr(self, f"_{kind_of(node)}", None)
        if look:
            look(node)
        for child in children(node):
            self.visit(child)

    # constants

    def _number(self, node):
        kind = "cell" if self._is_table else "constant"
        written = self._file.written(node)
        if written in ("TRUE", "FALSE"):
            self._note(kind, node, "FALSE" if written == "TRUE" else "TRUE")
            return
        if not NAME.fullmatch(written):
            for other in self._beside(written):
                self._note(kind, node, other)
            return
        for step in ("+ 1", "- 1"):
            self._note(kind, node, f"((decltype({written}))({written} {step}))")

    @staticmethod
    def _beside(written):
        found = re.fullmatch(r"(0[xX][0-9a-fA-F]+|\d+)([uUlL]*)", written)
        if not found:
            return []
        value = int(found[1], 0)
        values = {value + 1, value - 1, 0} - {value, -1}
        return [(hex(each) if found[1][:2].lower() == "0x" else str(each)) + found[2] for each in sorted(values)]

    def _IntegerLiteral(self, node):
        self._number(node)

    def _CharacterLiteral(self, node):
        self._note("constant", node, f"({self._file.written(node)} + 1)")

    def _CXXBoolLiteralExpr(self, node):
        self._note("constant", node, "false" if node.get("value") else "true")

    def _UnaryExprOrTypeTraitExpr(self, node):
        for step in ("+ 1", "- 1"):
            self._note("constant", node, f"({self._file.written(node)} {step})")

    def _DeclRefExpr(self, node):
        if kind_of(node.get("referencedDecl", {})) == "EnumConstantDecl" or is_named_constant(node):
            self._number(node)

    def _StringLiteral(self, node):
        written = self._file.written(node)
        if re.match(r'"[^"]|[A-Z_]+\(', written):
            self._note("text", node, f'"~" {written}')

    def _InitListExpr(self, node):
        """Neighbours of a row."""
        if self._is_table:
            self._swaps("cell", children(node))

    # operators

    def _operator(self, node, left, right):
        """Where the operator stands, if it is written between the two."""
        before, behind = self._file.span(left), self._file.span(right)
        if before is None or behind is None or before[1] >= behind[0]:
            return None
        start = before[1] + BLANKS.match(self._file.text, before[1]).end() - before[1]
        end = start + len(node["opcode"])
        return (start, end) if self._file.text[start:end] == node["opcode"] else None

    def _BinaryOperator(self, node):
        opcode, (left, right) = node["opcode"], children(node)
        place = self._operator(node, left, right)
        for other in BESIDE.get(opcode, ()) if place else ():
            self._file.note(self._function, "operator", place, other)
        if opcode in OF_TWO and place:
            for side in (left, right):
                self._note("operator", node, f"({self._file.written(side)})")
        if opcode in ("==", "!="):
            self._truth_of_comparison(node, opcode, left, right)
        if opcode == "=":
            self._value(right)

    def _CompoundAssignOperator(self, node):
        self._BinaryOperator(node)

    def _UnaryOperator(self, node):
        opcode, span, inner = node["opcode"], self._file.span(node), self._file.written(children(node)[0])
        if opcode in ("!", "-", "~"):
            self._note("operator", node, f"({inner})")
        elif opcode in ("++", "--") and span:
            other = BESIDE[opcode][0]
            self._note("operator", node, f"{inner}{other}" if node.get("isPostfix") else f"{other}{inner}")

    def _ConditionalOperator(self, node):
        condition, then, otherwise = children(node)
        self._condition(condition)
        first, second = self._file.written(then), self._file.written(otherwise)
        if first and second and first != second:
            self._note("operator", node, f"({self._file.written(condition)} ? {second} : {first})")

    # conditions

    def _condition(self, node):
        for text in ("true", "false"):
            self._note("condition", node, text)
        inside = bare(node)
        if kind_of(inside) != "BinaryOperator":
            self._note("condition", node, f"!({self._file.written(node)})")
            if type_of(inside) in WIDTH and type_of(inside) != "bool":
                self._note("truth", node, f"({self._file.written(node)}) == 1")

    def _IfStmt(self, node):
        parts = children(node)
        self._condition(parts[0])
        for part in parts[1:]:
            self._drop(part)

    def _loop(self, condition, body):
        if condition:
            self._note("condition", condition, "false")
        self._drop(body)

    def _WhileStmt(self, node):
        self._loop(*children(node)[:2])

    def _ForStmt(self, node):
        self._loop(node["inner"][2], node["inner"][4])

    def _truth_of_comparison(self, node, opcode, left, right):
        written = self._file.written(right)
        if written not in TRUTHS or type_of(bare(left)) not in WIDTH:
            return
        one, zero = ("TRUE", "FALSE") if written in ("TRUE", "FALSE") else ("1", "0")
        is_zero, opposite = TRUTHS[written] == 0, {"==": "!=", "!=": "=="}[opcode]
        self._note("truth", node, f"{self._file.written(left)} {opposite} {one if is_zero else zero}")

    # values that are handed on

    def _value(self, node):
        inside, written = bare(node), self._file.written(node)
        if not written or is_constant(node) or kind_of(inside) in ("InitListExpr", "StringLiteral"):
            return
        widths = [WIDTH.get(type_of(each), 0) for each in (node, inside)]
        # What a call answers is a success or a failure; what counts up to a few stays small.
        is_small = kind_of(inside) == "CallExpr" or not set(NAME.findall(written)) - self._counters
        if min(widths) > 8 and type_of(node) in NARROWER and not is_small:
            self._note("narrow", node, f"({NARROWER[type_of(node)]})({written})")
        is_compared = kind_of(inside) == "BinaryOperator" and inside["opcode"] in COMPARES | {"&&", "||"}
        if inside.get("type", {}).get("qualType", "").split()[-1:] == ["BOOL"] and not is_compared:
            self._note("truth", node, f"({written} != FALSE)")
            self._note("truth", node, f"({written} == TRUE)")

    def _ReturnStmt(self, node):
        for child in children(node):
            self._value(child)

    def _VarDecl(self, node):
        for child in children(node)[-1:] if "init" in node else []:
            self._value(child)
        if not self._is_table:
            self._declared(node)

    def _ParmVarDecl(self, node):
        if self._is_own:
            self._declared(node)

    def _declared(self, node):
        """The type as it is written in front of the name, if that is one word."""
        span = self._file.span(node)
        narrower = NARROWER.get(type_of(node))
        if span and narrower and node.get("name") not in self._counters:
            match = re.compile(r"(?:const )?(UINT32|INT32|UINT16|size_t)\b").match(self._file.text, span[0])
            if match:
                self._file.note(self._function, "narrow", match.span(1), narrower)

    def _CStyleCastExpr(self, node):
        inner = children(node)[-1]
        if type_of(node) in WIDTH and type_of(bare(inner)) in WIDTH:
            self._note("narrow", node, f"({self._file.written(inner)})")

    # calls

    def _CallExpr(self, node):
        arguments = children(node)[1:]
        for argument in arguments:
            self._value(argument)
        self._swaps("argument", arguments)

    def _swaps(self, kind, values):
        for first, second in zip(values, values[1:]):
            texts = self._file.written(first), self._file.written(second)
            spans = self._file.span(first), self._file.span(second)
            if type_of(first) != type_of(second) or not all(spans) or texts[0] == texts[1] or not all(texts):
                continue
            if spans[0][1] <= spans[1][0]:
                between = self._file.text[spans[0][1]:spans[1][0]]
                self._file.note(self._function, kind, (spans[0][0], spans[1][1]), texts[1] + between + texts[0])

    # statements

    def _statement(self, node):
        """(start, end) with its semicolon; none for what is nothing in what ships."""
        span = self._file.span(node)
        if span is None or self._file.text.startswith("PMX_NOTE", span[0]):
            return None
        match = re.compile(r"\s*;").match(self._file.text, span[1])
        return (span[0], match.end()) if match else span

    def _drop(self, node):
        if kind_of(node) in ("CompoundStmt", "DeclStmt", "NullStmt"):
            return
        span = self._statement(node)
        if span:
            lines = "\n" * self._file.text.count("\n", *span)
            self._file.note(self._function, "statement", span, "{}" + lines)

    def _CompoundStmt(self, node):
        statements = children(node)
        for statement in statements:
            self._drop(statement)
        for first, second in zip(statements, statements[1:]):
            self._exchange(first, second)

    def _exchange(self, first, second):
        spans = self._statement(first), self._statement(second)
        if not all(spans) or {kind_of(first), kind_of(second)} & set(LEAVES):
            return
        texts = [self._file.text[start:end] for start, end in spans]
        declared = [each.get("name", "") for each in children(first)] if kind_of(first) == "DeclStmt" else []
        if texts[0] == texts[1] or any(re.search(rf"\b{name}\b", texts[1]) for name in declared if name):
            return
        between = self._file.text[spans[0][1]:spans[1][0]]
        self._file.note(self._function, "order", (spans[0][0], spans[1][1]), texts[1] + between + texts[0])


def of_file(path, text, syntax):
    """All mutants of a file of the layer."""
    file = File(path, text)
    for node in syntax.tree["inner"]:
        where = node.get("loc", {})
        where = where.get("expansionLoc", where)
        if where.get("file") != str(path) or kind_of(node) not in ("FunctionDecl", "VarDecl"):
            continue
        has_body = any(kind_of(child) == "CompoundStmt" for child in children(node))
        runs = has_body and "consteval" not in file.written(node)[:40]  # the compiler alone runs that
        if kind_of(node) == "VarDecl" or runs:
            Finder(file, node).visit(node)
    return list(file.mutants())


def used_by(syntax):
    """By name of a table or constant, the functions and tables that have it in them."""
    users = collections.defaultdict(set)
    for node in syntax.tree["inner"]:
        for reference in within(node, "DeclRefExpr") if "name" in node else ():
            users[reference["referencedDecl"].get("name", "")].add(node["name"])
    return users


def of_layer(folder, command):
    """All mutants of the sources of a folder, and of the header that has the same name as one of them; and who uses
    what."""
    found, users = [], collections.defaultdict(set)
    for path in sorted(folder.glob("*.cpp")):
        syntax = Syntax(path, command)
        for name, its_users in used_by(syntax).items():
            users[name] |= its_users
        for each in (path, path.with_suffix(".h")):
            if each.exists():
                found += of_file(each, each.read_text(encoding="utf-8"), syntax)
    return found, users
