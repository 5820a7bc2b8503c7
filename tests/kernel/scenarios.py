# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Scenarios as the module under tests/kernel/module understands them: names are numbers, lists are flat, files are
bytes. What the board makes of the same scenario, in the module's form."""

import json
import pathlib
import re
import subprocess
import sys
import tempfile
import tomllib

sys.dont_write_bytecode = True
ROOT = pathlib.Path(__file__).resolve().parents[2]
sys.path.insert(0, str(ROOT / "cmake"))

import declarations  # noqa: E402

# What only looks, or concerns the tool alone.
LOOKING = {"expect", "print", "state", "diff", "save", "what-if", "trace", "stores", "status", "explain", "why"}
# Time goes on between two commands of a real kernel; on the board it stands still. So much more is slept.
MARGIN_MS = 5
TOKEN = re.compile(r'"(?:[^"\\]|\\.)*"|[\[\]{},=]|[^\s\[\]{},=]+')
OUTPUTS = {"hdmi": "PMX_OUTPUT_HDMI", "component": "PMX_OUTPUT_CAV", "composite": "PMX_OUTPUT_CVBS",
           "digital": "PMX_OUTPUT_CCIR"}
DISPLAY_PART = {"off": "-2", "never": "-1"}
OUTPUT_FIELDS = ("fgOutputEnable", "eResMode", "u4VFreq", "eCcirDrvInfo")
PORT_FIELDS = ("eDgoMode", "eDgoFmt", "eDgiMode", "eDgiFmt")
LAYOUT = "src/driver/pmx/pmx_layout.cpp"


class Unknown(Exception):
    """What a scenario says, and the module cannot do."""


class Names:
    """Numbers by the names that the headers give them."""

    def __init__(self):
        self._numbers = {"TRUE": 1, "FALSE": 0}
        for header in sorted((ROOT / "src").glob("*/*inc/*.h")):
            text = declarations.read(header)
            self._numbers |= {one.name: one.number for one in declarations.constants(text)}
            for enumeration in declarations.enumerations(text):
                self._numbers |= {one.name: one.number for one in enumeration.enumerators}
        for constant, other in re.findall(r"^#define (\w+) \(?([A-Za-z_]\w*)\)?\s*(?:/|$)", "\n".join(
                declarations.read(header) for header in sorted((ROOT / "src").glob("*/*inc/*.h"))), re.M):
            if other in self._numbers:
                self._numbers.setdefault(constant, self._numbers[other])

    def number(self, word):
        if word in self._numbers:
            return self._numbers[word]
        try:
            return int(word, 0)
        except ValueError:
            raise Unknown(f"argument {word}") from None


class Arguments:
    """The arguments of an operation, flat."""

    def __init__(self, text, names):
        self._tokens, self._names, self._at = TOKEN.findall(text), names, 0

    def _peek(self):
        return self._tokens[self._at] if self._at < len(self._tokens) else None

    def _next(self):
        self._at += 1
        return self._tokens[self._at - 1]

    def _group(self, close):
        listed, named = [], {}
        while self._peek() != close:
            if self._peek() is None:
                raise Unknown("a bracket that is not closed")
            if self._peek() == ",":
                self._next()
            elif self._tokens[self._at + 1:self._at + 2] == ["="]:
                name = self._next()
                self._next()
                named[name] = self._value()
            else:
                listed.append(self._value())
        self._next()
        return listed, named

    def _value(self):
        token = self._next()
        if token in "[{":
            return self._group({"[": "]", "{": "}"}[token])
        return token if token == "null" else self._names.number(token)

    def flat(self):
        words = []
        while self._peek() is not None:
            if self._peek() == ",":
                self._next()
                continue
            value = self._value()
            if not isinstance(value, tuple):
                words.append(value)
            elif value[0] and isinstance(value[0][0], tuple):
                words += [word for each in value[0] for word in _output(each)]
            else:
                words += value[0]
        return words


def _fields(names, value):
    listed, named = value
    return dict(zip(names, listed)) | named


def _output(value):
    fields = _fields(OUTPUT_FIELDS, value)
    port = _fields(PORT_FIELDS, fields.get("eCcirDrvInfo", ([], {})))
    return [fields.get(name, 0) for name in OUTPUT_FIELDS[:3]] + [port.get(name, 0) for name in PORT_FIELDS]


def milliseconds(text):
    match = re.fullmatch(r"(\d+)(s|ms|us)", text)
    if not match:
        raise Unknown(f"time {text}")
    scale = {"s": 1000000, "ms": 1000, "us": 1}[match[2]]
    return -(-int(match[1]) * scale // 1000)


def _image(path):
    content = path.read_bytes()
    return f"{len(content)} {' '.join(map(str, content))}"


def _board(path):
    described = tomllib.loads(path.read_text(encoding="utf-8"))
    left = set(described) - {"name", "mixer", "flash"}
    left |= set(described.get("mixer", {})) - {"plane_delay", "arrangement"}
    if left:
        raise Unknown(f"a board with {', '.join(sorted(left))}")
    for name, image in described.get("flash", {}).items():
        yield f"flash {name} {_image(path.parent / image)}"
    mixer = described.get("mixer", {})
    if "plane_delay" in mixer:
        yield "plane-delay " + " ".join(map(str, mixer["plane_delay"]))
    for one in mixer.get("arrangement", []):
        yield f"plane-delay-order {one['order']} " + " ".join(map(str, one["delay"]))


class Reader:
    """Lines of a scenario as commands of the module."""

    def __init__(self, scenario):
        self._folder = scenario.parent
        self._names = Names()
        layout = declarations.read(ROOT / LAYOUT)
        self._offsets = dict(re.findall(r"HOLDS_OFFSET\(PMX_CONF_T, (\w+), (\d+)\);", layout))

    def _number(self, word):
        return self._names.number(word)

    def _power_on(self, words):
        return ["POWER-ON", *(_board(self._folder / words[0]) if words else [])]

    def _advance(self, words):
        return [f"sleep {milliseconds(words[0])}"]

    def _sink(self, words):
        if words[0] in ("plug", "unplug"):
            return [f"sink {int(words[0] == 'plug')}"]
        if words[0] == "request-resolution":
            return [f"wanted {int(words[1:] != ['off'])}"]
        if words[1] == "asked":
            return ["valid 0 0 0"]
        return [f"valid 1 {self._number(words[1])} {self._number(words[2])}"]

    def _display_part(self, words):
        if words[0] in ("raise", "lower"):
            return [f"display-part-tells {int(words[0] == 'raise')}"]
        return [f"display-part {DISPLAY_PART.get(words[0]) or milliseconds(words[1])}"]

    def _video_plane(self, words):
        if words[0] == "waiting":
            return [f"planes-wait {int(words[1] == 'on')}"]
        return [f"hw-enable {words[1]} {self._number(words[2])}"]

    def _plane_delay(self, words):
        return ["plane-delay-" + " ".join(words) if words[0] == "order" else "plane-delay " + " ".join(words)]

    def _flash(self, words):
        if words[1] == "off":
            return [f"flash {words[0]} 0"]
        if words[1] == "word":
            return [f"flash {words[0]} 4 " + " ".join(map(str, self._number(words[2]).to_bytes(4, "little")))]
        return [f"flash {words[0]} {_image(self._folder / words[1])}"]

    def _fault(self, words):
        if words[1] == "off":
            return [f"fault {words[0]} 0 0 0"]
        when = {"on": 0, "from": 1, "always": 2}[words[2]] if len(words) > 2 else 0
        return [f"fault {words[0]} {self._number(words[1])} {when} {words[3] if len(words) > 3 else 1}"]

    def _source(self, words):
        match = re.fullmatch(r"(vdp|osd)(\d)", words[0])
        line = f"source {match[1]} {match[2]} {words[1]}"
        if words[1] == "connects-back":
            return [f"{line} {int(words[2] == 'on')}"]
        if words[1] not in ("start", "size"):
            return [line]
        line += " " + words[2].replace("x", " ")
        if words[1] == "size":
            return [line]
        if match[1] == "osd":
            return [f"{line} {self._number('DRV_GFX_COLOR_MODE_' + words[3].upper())}"]
        return [f"{line} {words[words.index('luma') + 1] if 'luma' in words else 0}"]

    def _ipmx(self, words):
        return [" ".join(["ipmx", words[0], words[1], *(str(self._number(word)) for word in words[2:])])]

    def _poke(self, words):
        value = self._number(words[1])
        if words[0] == "_fgBootUp":
            return [f"_fgBootUp {value}"]
        if words[0] not in self._offsets:
            raise Unknown(f"poke {words[0]}")
        return [f"poke {self._offsets[words[0]]} {4 if words[0].startswith('u4') else 1} {value}"]

    def _neighbour(self, words):
        if words[0] != "PMX_HalSwapPlane1_2":
            raise Unknown(f"neighbour {words[0]}")
        return [" ".join(words)]

    def _request(self, words):
        output = self._number(OUTPUTS[words[0]])
        if words[1] in ("on", "off"):
            return [f"request {output} 0 {int(words[1] == 'on')}"]
        return [f"request {output} 1 {self._number(words[1])}"]

    def _meanwhile(self, words):
        as_thread = words[:2] == ["as", "thread"]
        words = words[2:] if as_thread else words
        function, n = words[0], 1
        words = words[1:]
        if words[0] == "on":
            n, words = int(words[1]), words[2:]
        commands = list(self.line(" ".join(words)))
        if len(commands) != 1:
            raise Unknown(f"meanwhile {' '.join(words)}")
        return [f"meanwhile {int(as_thread)} {n} {function} {commands[0]}"]

    _VERBS = {"power-on": _power_on, "advance": _advance, "sink": _sink, "display-part": _display_part,
              "video-plane": _video_plane, "plane-delay": _plane_delay, "flash": _flash, "fault": _fault,
              "source": _source, "ipmx": _ipmx, "poke": _poke, "neighbour": _neighbour, "request": _request,
              "meanwhile": _meanwhile}

    def line(self, text):
        """The commands of one line."""
        verb, _, rest = text.partition(" ")
        if verb in LOOKING or verb == "loglevel":
            return []
        if verb in ("suspend", "resume"):
            return [verb]
        if verb in self._VERBS:
            return self._VERBS[verb](self, rest.split())
        if not re.match(r"(i4|d_|fg)?(PMX|Pmx)_?\w+$", verb):
            raise Unknown(verb)
        return [" ".join([verb, *map(str, Arguments(rest, self._names).flat())])]


def commands(scenario):
    """The scenario at that path, a command a line."""
    reader = Reader(scenario)
    pause = 0
    for line in scenario.read_text(encoding="utf-8").split("\n"):
        line = re.sub(r'#(?=(?:[^"]*"[^"]*")*[^"]*$).*', "", line).strip()
        for command in reader.line(line) if line else []:
            if command.startswith("sleep "):
                pause += int(command.split()[1])
                continue
            if pause:
                yield f"sleep {pause + MARGIN_MS}"
                pause = 0
            yield command
    if pause:
        yield f"sleep {pause + MARGIN_MS}"


def _quoted(text):
    return '"' + text.replace("\\", "\\\\").replace('"', '\\"').replace("\n", "\\n").replace("\t", "\\t") + '"'


def _shown(value):
    if value is None:
        return "0"
    if isinstance(value, (bool, int)):
        return str(int(value))
    if isinstance(value, str):
        return _quoted(value)
    if isinstance(value, list):
        return "[" + ", ".join(map(_shown, value)) + "]"
    if "symbol" in value:
        return value["symbol"]
    if "value" in value and set(value) <= {"value", "name", "hex"}:
        return _shown(value["value"])
    return "{" + ", ".join(map(_shown, value.values())) + "}"


def _in_order(trace):
    """The entries of a trace by the order of their beginnings, which is counted from each power-on."""
    board = {}
    for entry in map(json.loads, trace):
        if entry["sequence"] in board:
            yield from (board[number] for number in sorted(board))
            board = {}
        board[entry["sequence"]] = entry
    yield from (board[number] for number in sorted(board))


def calls(trace):
    """The board's trace, as JSON lines, in the module's form."""
    for entry in _in_order(trace):
        if entry["kind"] == "log":
            level = f" {entry['level']}" if "level" in entry else ""
            yield f"{entry['function']}{level} {_quoted(entry['text'])}"
        elif entry["kind"] in ("call", "assert"):
            result = f" = {_shown(entry['result'])}" if "result" in entry else ""
            yield f"{entry['function']}({', '.join(map(_shown, entry['arguments'].values()))}){result}"
        elif entry["kind"] == "notice" and entry["function"] == "expiry":
            yield "EXPIRY " + entry["text"].split(":")[0]


def results(shown):
    """What operations answered, of the lines that the board shows."""
    names, verb = Names(), ""
    for line in shown:
        match = re.match(r"> (\S+)|  (= \S+|\*\w+ = \S+|\*\w+ untouched)", line)
        if not match:
            continue
        if match[1]:
            verb = match[1]
            continue
        what, _, value = match[2].rpartition(" ")
        told = f"{what} {value if value == 'untouched' else names.number(value)}"
        yield f"{verb} {told}" if told.startswith("=") else told


def on_the_board(program, scenario):
    """(calls, results) of a scenario on the board."""
    def run(*arguments):
        return subprocess.run([program, "run", "--color=never", *arguments, scenario], cwd=ROOT, check=True,
                              capture_output=True, text=True).stdout.splitlines()

    with tempfile.NamedTemporaryFile("r", encoding="utf-8") as trace:
        run("--quiet", "--trace-format=jsonl", f"--trace-file={trace.name}")
        # The tool puts another file in its place.
        return list(calls(pathlib.Path(trace.name).read_text("utf-8").splitlines())), list(results(run()))
