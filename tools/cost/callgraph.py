# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""The compiler's own call-graph information (VCG, one file for each source): frames, worst paths, indirect calls."""

import dataclasses
import re

INDIRECT = "__indirect_call"
OUTSIDE = {"memcpy", "memset", "memcmp", "memmove"}  # the kernel's
NODE = re.compile(r'^node: \{ title: "([^"]*)" label: "([^"]*)"', re.M)
EDGE = re.compile(r'^edge: \{ sourcename: "([^"]*)" targetname: "([^"]*)"(?: label: "([^"]*)")?', re.M)
FRAME = re.compile(r"\\n(\d+) bytes \((static|dynamic|dynamic,bounded)\)")


class CallGraphError(Exception):
    """The call graph has no worst path, or is not whole."""


@dataclasses.dataclass(frozen=True)
class Path:
    bytes: int
    names: tuple  # from the caller to the last callee with a frame


@dataclasses.dataclass
class Graph:
    frames: dict    # bytes of a function's own frame, by title
    callees: dict   # titles, by title
    labels: dict    # how each is called by people
    indirect: list  # (function, file and line) of every call through a pointer

    def worst(self, title, above=()):
        """The deepest stack from a function down."""
        if title in above:
            raise CallGraphError("recursion: " + " > ".join(self.labels[name] for name in (*above, title)))
        if title not in self._known:
            below = [self.worst(callee, (*above, title)) for callee in self.callees.get(title, ())]
            deepest = max(below, key=lambda path: path.bytes, default=Path(0, ()))
            names = deepest.names if deepest.bytes else ()
            self._known[title] = Path(self.frames[title] + deepest.bytes, (self.labels[title], *names))
        return self._known[title]

    def __post_init__(self):
        self._known = {}


def _label(title, text):
    """A function's plain name: what stands before the parameters in the compiler's description."""
    found = re.match(r"(?:.*?[\s*&])?([\w.]+)\(", text.split("\\n")[0])
    symbol = title.rsplit(":", 1)[-1]
    return (found[1] if found else symbol) + "".join(re.findall(r"\.(?:part|constprop|cold)\b", symbol))


def _place(label):
    """FILE:LINE of the compiler's FILE:LINE:COLUMN, whichever directory it was compiled in."""
    name, line, *_ = label.rsplit("/", 1)[-1].split(":")
    return f"{name}:{line}"


def read(texts, platform):
    """The graph of all files together. Functions of the platform have no frame here: their stack is the stack's."""
    frames, labels, callees, indirect = {}, {}, {}, []
    for text in texts:
        for title, label in NODE.findall(text):
            frame = FRAME.search(label)
            if frame and frame[2] == "dynamic":
                raise CallGraphError(f"{title}: a frame without a bound")
            if frame:
                if title in frames:
                    raise CallGraphError(f"{title} stands in two files")
                frames[title] = int(frame[1])
                labels[title] = _label(title, label)
        for source, target, label in EDGE.findall(text):
            if target == INDIRECT:
                indirect.append((source, _place(label)))
            elif target not in callees.setdefault(source, []):
                callees[source].append(target)
    for source, targets in callees.items():
        unknown = [target for target in targets
                   if target not in frames and target not in platform and target not in OUTSIDE]
        if unknown:
            raise CallGraphError(f"{source} calls {', '.join(unknown)}, of which nothing is known")
        callees[source] = [target for target in targets if target in frames]
    graph = Graph(frames, callees, labels, [])
    graph.indirect = sorted((labels[source], place) for source, place in indirect)
    for title in frames:
        graph.worst(title)
    return graph
