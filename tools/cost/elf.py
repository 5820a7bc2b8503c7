# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Reads what the cost is measured by from an object file: sections and symbols."""

import dataclasses
import pathlib
import struct

WRITE, ALLOC, EXEC, MERGE, STRINGS = 0x1, 0x2, 0x4, 0x10, 0x20
NOBITS = 8
SYMTAB = 2
OBJECT, FUNC, FILE = 1, 2, 4


@dataclasses.dataclass(frozen=True)
class Section:
    name: str
    type: int
    flags: int
    offset: int
    size: int
    link: int
    align: int
    address: int


@dataclasses.dataclass(frozen=True)
class Symbol:
    name: str
    value: int
    size: int
    type: int
    is_local: bool
    section: Section | None


class Elf:
    """A little-endian ELF file of either class."""

    def __init__(self, path):
        self.content = pathlib.Path(path).read_bytes()
        if self.content[:4] != b"\x7fELF" or self.content[5] != 1:
            raise ValueError(f"{path} is no little-endian ELF file")
        self.is_64 = self.content[4] == 2
        self.sections = self._sections()
        self.symbols = self._symbols()

    def bytes_of(self, section):
        return b"" if section.type == NOBITS else self.content[section.offset:section.offset + section.size]

    def _sections(self):
        offset, = struct.unpack_from("<Q" if self.is_64 else "<I", self.content, 40 if self.is_64 else 32)
        size, count, names = struct.unpack_from("<HHH", self.content, 58 if self.is_64 else 46)
        layout = "<IIQQQQIIQQ" if self.is_64 else "<IIIIIIIIII"
        rows = [struct.unpack_from(layout, self.content, offset + i * size) for i in range(count)]
        texts = rows[names][4]
        return [Section(self._text(texts + name), kind, flags, at, length, link, align, address)
                for name, kind, flags, address, at, length, link, _, align, _ in rows]

    def _text(self, offset):
        return self.content[offset:self.content.index(b"\0", offset)].decode()

    def _symbols(self):
        found = []
        for table in (section for section in self.sections if section.type == SYMTAB):
            texts = self.sections[table.link].offset
            layout = struct.Struct("<IBBHQQ" if self.is_64 else "<IIIBBH")
            for offset in range(table.offset, table.offset + table.size, layout.size):
                row = layout.unpack_from(self.content, offset)
                name, info, _, index, value, size = row if self.is_64 else (row[0], *row[3:6], row[1], row[2])
                section = self.sections[index] if 0 < index < len(self.sections) else None
                found.append(Symbol(self._text(texts + name), value, size, info & 0xF, info >> 4 == 0, section))
        return found

    def objects(self):
        """Objects that are written at run time, in the order of their names."""
        return sorted((symbol.name, symbol.size) for symbol in self.symbols
                      if symbol.type == OBJECT and symbol.section and symbol.section.flags & WRITE)

    def functions(self):
        return {symbol.name for symbol in self.symbols if symbol.type == FUNC and symbol.section}
