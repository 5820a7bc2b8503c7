# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""What somebody may send: {name: bytes}, made by classes, and files that are right but for a few bytes."""

import random
import struct
import zlib

DEEP = 30_000    # deeper than any stack, where each level is a call
LONG = 100_000


def shapes():
    """Of any format."""
    noise = random.Random(1).randbytes(20_000)
    return {
        "empty": b"",
        "newline": b"\n",
        "blanks": b" \t\r\n\v\f" * 50,
        "zeros": bytes(5_000),
        "noise": noise,
        "byte order mark": b"\xef\xbb\xbfPMX_Init\n",
        "no UTF-8": b"\xff\xfe\xc0\x80\xed\xa0\x80 \xf5\n",
        "terminal": b"\x1b]0;title\x07\x1b[2J\x9b31m\xc2\x9b1m\x7f\r\x08\n",
        "one long line": b"x" * LONG + b"\n",
        "longest line": b"x" * ((1 << 20) + 2),
        "no end": b"PMX_Init",
        "many lines": b"# nothing\n" * 10_000,
        "many words": b"a " * LONG + b"\n",
        "returns": b"PMX_Init\rPMX_Stop\r\n",
    }


def brackets():
    """Nested without end, closed and open."""
    found = {}
    for opening, closing in ((b"(", b")"), (b"[", b"]"), (b"{", b"}"), (b'{"a":', b"}"), (b"[{\"a\":", b"}]")):
        name = opening.decode()
        found[f"{name} open"] = opening * DEEP
        found[f"{name} closed"] = opening * DEEP + b"1" + closing * DEEP
        found[f"{name} closes nothing"] = closing * 100
    return found


def scenario_lines():
    """Lines that mean something, of values that nobody means."""
    numbers = (b"1e400", b"-1", b"99999999999999999999999", b"0x", b"nan", b"4294967296", b"'", b'"', b'"\\x"')
    patterns = (b"advance %bs", b"loglevel %b", b"poke ucMode %b", b"state arOutputConf[%b]", b"fault x_sema_lock %b",
                b"PMX_SetModeEx %b", b"sink valid %b %b", b"expect %b", b"source vdp%b start", b"flash %b %b",
                b"what-if %b", b"explain %b", b"why %b", b"meanwhile %b", b"power-on %b", b"neighbour %b",
                b"print %b", b"PMX_Printf 1 %b", b"help %b", b"stores %b", b"state %b")
    found = {}
    for pattern in patterns:
        for number in numbers:
            line = pattern.replace(b"%b", number)
            found[line.decode()] = b"PMX_Init\n" + line + b"\n"
    found["explain without end"] = b"explain " * 900 + b"PMX_Init\n"
    found["what-if without end"] = b"what-if " * 900 + b"PMX_Init\n"
    found["meanwhile without end"] = b"meanwhile x_sema_lock " * 400 + b"PMX_Init\n"
    found["expect deep"] = b"PMX_Init\nexpect call f(" + b"[" * DEEP + b"]" * DEEP + b")\n"
    found["printed control"] = b'print "\\x1b[31m\\x9b\\x07"\n'
    found["unknown control"] = b"\x1b[31mPMX_\x07\n"
    found["formats"] = b'PMX_Init\npoke PMX_debug_level 9\nPMX_Printf 1 "%n%s%999999999d%*d"\n'
    return found


def states(good):
    """Saved states, from one that is right."""
    found = {f"number {number.decode()}": b'{"schema":"pmxboard-state","version":1,"state":{"a":' + number + b"}}"
             for number in (b"1e400", b"-1e400", b"1e-400", b"99999999999999999999", b"-9223372036854775809", b"1.5",
                            b"NaN", b"-", b"{}", b"true")}
    head = b'{"schema":"pmxboard-state","version":1,"state":{'
    found["100000 keys"] = head + b",".join(b'"k%d":1' % i for i in range(100_000)) + b"}}"
    found["100000 records"] = head + b'"a":[' + b",".join([b'{"b":1}'] * 100_000) + b"]}}"
    found["same key"] = head + b'"a":1,"a":2}}'
    found["key of controls"] = head + b'"\\u001b[31m\\n":1}}'
    found["symbol of controls"] = head + b'"a":{"symbol":"\\u001b[31m\\n"}}}'
    found["name of controls"] = head + b'"a":{"value":1,"name":"\\u009b31m"}}}'
    found["text of controls"] = head + b'"a":"\\u001b[31m\\u009b\\u007f"}}'
    found["long key"] = head + b'"' + b"k" * LONG + b'":1}}'
    found["cut"] = good[:len(good) // 2]
    for version in (b"99", b"0", b"-1", b'"1"', b"1.0", b"null", b"[]", b"99999999999999999999"):
        found[f"version {version.decode()}"] = good.replace(b'"version": 1', b'"version": ' + version)
    for what, steps in (("no list", b"1"), ("no version", b"{}"), ("no commands", b'{"version":1,"commands":[]}'),
                        ("lost controls", b'{"version":1,"lost":"\\u001b[31m"}'),
                        ("100000 commands",
                         b'{"version":1,"commands":[' + b",".join([b'{"line":"x"}'] * 100_000) + b"]}"),
                        ("command of controls", b'{"version":1,"commands":[{"line":"\\u001b[31m"}]}'),
                        ("command that writes", b'{"version":1,"commands":[{"line":"save written"}]}'),
                        ("command within itself", b'{"version":1,"commands":[{"line":"restore x"}]}'),
                        ("directory of zero", b'{"version":1,"commands":[{"in":"\\u0000","line":"flash a b"}]}'),
                        ("brackets", b'{"version":1,"commands":[{"line":"' + b"[" * DEEP + b'"}]}')):
        found["steps, " + what] = head + b'"a":1},"steps":' + steps + b"}"
    return found


def _png(width, height, *, depth=8, kind=2, packed=None, more=b""):
    def chunk(name, content):
        return struct.pack(">I", len(content)) + name + content + struct.pack(">I", zlib.crc32(name + content))

    head = struct.pack(">IIBBBBB", width, height, depth, kind, 0, 0, 0)
    return (b"\x89PNG\r\n\x1a\n" + chunk(b"IHDR", head) + more + chunk(b"IDAT", packed or zlib.compress(b"\0" * 800)) +
            chunk(b"IEND", b""))


def pictures():
    """PNG and Y4M."""
    text = b"\0\0\0\x01tEXtx\0\0\0\0"
    found = {
        "png": _png(16, 16),
        "png of many pixels": _png(8192, 2048, packed=zlib.compress(bytes(2048 * (1 + 3 * 8192)), 9)),
        "png of too many": _png(65535, 65535, packed=zlib.compress(bytes(1 << 24), 9)),
        "png of no pixels": _png(0, 16),
        "png of no kind": _png(16, 16, kind=9),
        "png of 16 bits": _png(16, 16, depth=16),
        "png with wrong texts": _png(16, 16, more=text * 10_000),
        "png, cut": _png(16, 16)[:60],
        "y4m": b"YUV4MPEG2 W16 H16 F25:1 C420jpeg\nFRAME\n" + bytes(range(256)) + bytes(128),
        "y4m without end": b"YUV4MPEG2 " + b"W1 " * LONG,
    }
    for size in (b"W0 H0", b"W8192 H8192", b"W-1 H1", b"W99999999999999999999 H1", b"W H", b"W1"):
        found["y4m " + size.decode()] = b"YUV4MPEG2 " + size + b"\nFRAME\n" + bytes(100)
    return found


def boards():
    """Board files."""
    return {
        "dotted key": b".".join([b"a"] * DEEP) + b" = 1\n",
        "dotted heading": b"[" + b".".join([b"a"] * DEEP) + b"]\n",
        "list in list": b"fault = " + b"[" * DEEP + b"]" * DEEP,
        "table in table": b"a = " + b"{a=" * 4_000,
        "number": b"[console]\nlevel = 1e400\n",
        "large number": b"[console]\nlevel = 99999999999999999999\n",
        "name of controls": b'name = "\\u001b[31m\\u009b"\nnothing = 1\n',
        "key of controls": b'"\\u001b[31m" = 1\n',
        "image of controls": b'[flash]\n"a" = "\\u001b[31m"\n',
        "image far away": b'[flash]\na = "' + b"x/" * 2_000 + b'"\n',
        "faulted call": b'[[fault]]\nfunction = "x_sema_lock(' + b"[" * 1_000 + b'"\nanswer = 0\n',
        "fault's output": b'[[fault]]\nfunction = "x_sema_create"\nanswer = 0\noutputs = { phSema = "' +
                          b"[" * 1_000 + b'" }\n',
        "many sources": b'[[source]]\nname = "osd0"\n' * 10_000,
        "many modes": b"hdmi.modes = [" + b'{resolution="RES_480P",frequency=60},' * 10_000 + b"]\n",
        "fault without table": b'[[fault]]\nfunction = "i4ImQueryInterface"\nanswer = 0\nalways = true\n',
        "many arrangements": b"[[mixer.arrangement]]\n" * 10_000,
    }


def mutations(good, count, seed):
    """The right content with a few bytes changed, cut or doubled."""
    chance = random.Random(seed)
    found = {}
    for number in range(count):
        content = bytearray(good)
        for _ in range(chance.randrange(1, 6)):
            at = chance.randrange(len(content) + 1)
            what = chance.randrange(4)
            if what == 0 and at < len(content):
                content[at] = chance.randrange(256)
            elif what == 1:
                del content[at:at + chance.randrange(1, 40)]
            elif what == 2:
                content[at:at] = content[at:at + chance.randrange(1, 40)] * chance.randrange(1, 50)
            else:
                content[at:at] = chance.choice((b"\0", b"\x1b[", b"\xff", b'"', b"[", b"{", b"\\x", b"-", b"9" * 25))
        found[f"mutation {seed}.{number}"] = bytes(content)
    return found
