# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""The layer's object code run instruction by instruction, in an emulator, for any of its processors: what it stores and
loads in the objects that others look at, when, and how wide; and every byte that it hands over by address.

The objects are linked at a fixed address with one empty function for each platform function. The machine answers in
their place, and notes the calls between the accesses.
"""

import pathlib
import struct
import subprocess
import sys
import tempfile

try:
    import unicorn
    from unicorn import arm_const, x86_const
except ImportError:
    sys.exit(f"{sys.executable}: no module unicorn: ./dev setup installs python3-unicorn")

IMAGE, IMAGE_SIZE = 0x00100000, 0x00100000
STACK, STACK_SIZE = 0x00300000, 0x00010000
CALLER, CALLER_SIZE = 0x00400000, 0x00010000  # what callers hand over by address
ARGUMENTS_SIZE = 0x100                        # of the stack, above the frame: arguments that no register holds
LIMIT = 1000000                               # instructions of one operation

LAYOUT = f"""
SECTIONS
{{
    . = {IMAGE};
    .text : {{ *(.text .text.*) }}
    .rodata : {{ *(.rodata .rodata.*) }}
    .data : {{ *(.data .data.*) *(.bss .bss.* COMMON) }}
    /DISCARD/ : {{ *(.debug* .note* .comment .ARM.attributes .ARM.exidx* .ARM.extab* .eh_frame) }}
}}
"""

SET_COLOR_MODE = 8  # the member's place in IVdp


class X86:
    """How a function is called, and what the tools are."""
    tools, word = "", 8
    empty_function = ".globl {0}\n.type {0}, %function\n{0}: ret\n.balign 16\n"
    registers = [getattr(x86_const, f"UC_X86_REG_{name}") for name in (
        "RAX RBX RCX RDX RSI RDI RBP R8 R9 R10 R11 R12 R13 R14 R15").split()]
    arguments = [getattr(x86_const, f"UC_X86_REG_{name}") for name in "RDI RSI RDX RCX R8 R9".split()]
    result, stack_pointer = x86_const.UC_X86_REG_RAX, x86_const.UC_X86_REG_RSP
    stack_arguments = 8  # from the stack pointer on entry: the return address stands below them

    @staticmethod
    def emulator():
        return unicorn.Uc(unicorn.UC_ARCH_X86, unicorn.UC_MODE_64)

    @staticmethod
    def enter(emulator, stack, return_address):
        stack -= 8
        emulator.mem_write(stack, struct.pack("<Q", return_address))
        emulator.reg_write(X86.stack_pointer, stack)


class Arm:
    """The same for both instruction sets: an odd address is Thumb code."""
    tools, word = "arm-none-eabi-", 4
    empty_function = ".globl {0}\n.thumb_func\n{0}: bx lr\n.balign 16\n"
    registers = [getattr(arm_const, f"UC_ARM_REG_R{number}") for number in range(13)]
    arguments = registers[:4]
    result, stack_pointer = registers[0], arm_const.UC_ARM_REG_SP
    stack_arguments = 0

    @staticmethod
    def emulator():
        return unicorn.Uc(unicorn.UC_ARCH_ARM, unicorn.UC_MODE_ARM)

    @staticmethod
    def enter(emulator, stack, return_address):
        emulator.reg_write(Arm.stack_pointer, stack)
        emulator.reg_write(arm_const.UC_ARM_REG_LR, return_address)


PROCESSORS = {62: X86, 40: Arm}  # by e_machine


def run(*command):
    result = subprocess.run([str(word) for word in command], capture_output=True, text=True, check=False,
                            env={"LC_ALL": "C", "PATH": "/usr/local/bin:/usr/bin:/bin"})
    if result.returncode != 0:
        sys.exit(f"{' '.join(map(str, command))}:\n{result.stderr.strip()}")
    return result.stdout


def processor_of(path):
    try:
        head = pathlib.Path(path).read_bytes()[:20]
    except OSError as error:
        sys.exit(f"{path}: cannot be read: {error.strerror}")
    if head[:4] != b"\x7fELF" or len(head) < 20:
        sys.exit(f"{path}: no object file")
    number = struct.unpack_from("<H", head, 18)[0]
    if number not in PROCESSORS:
        sys.exit(f"{path}: for a processor that is not known here ({number})")
    return PROCESSORS[number]


class Image:
    """Objects linked with empty platform functions: bytes, symbols, and the places that name a symbol."""

    def __init__(self, objects):
        self.processor = processor_of(objects[0])
        tools = self.processor.tools
        listed = [line.split() for path in objects for line in run(tools + "nm", path).splitlines()]
        defined = {fields[-1] for fields in listed if len(fields) == 3}
        self.needed = sorted({fields[-1] for fields in listed if fields[0] == "U"} - defined)

        with tempfile.TemporaryDirectory() as scratch:
            scratch = pathlib.Path(scratch)
            source = ".text\n.globl platform\nplatform:\n"
            if self.processor is Arm:
                source = ".syntax unified\n.arch armv7-a\n.thumb\n" + source
            for name in [*self.needed, "set_color_mode", "the_end"]:
                source += self.processor.empty_function.format(name)
            (scratch / "platform.s").write_text(source + ".globl platform_end\nplatform_end:\n", encoding="utf-8")
            (scratch / "layout").write_text(LAYOUT, encoding="utf-8")
            run(tools + "as", scratch / "platform.s", "-o", scratch / "platform.o")
            run(tools + "ld", "--emit-relocs", "--no-warn-mismatch", "-e", "the_end", "-T", scratch / "layout", "-o",
                scratch / "image", scratch / "platform.o", *objects)
            run(tools + "objcopy", "-O", "binary", "--set-section-flags", ".data=alloc,load,contents",
                scratch / "image", scratch / "bytes")
            self.bytes = (scratch / "bytes").read_bytes()
            if len(self.bytes) > IMAGE_SIZE:
                sys.exit(f"{objects[0]}: larger than the machine's memory")
            self.symbols, self.functions = {}, []
            self._read_symbols(run(tools + "readelf", "--wide", "--symbols", scratch / "image"))
            self._relocations = run(tools + "readelf", "--wide", "--relocs", scratch / "image")

    def _read_symbols(self, text):
        for line in text.splitlines():
            fields = line.split()
            # number value size type binding visibility index name
            if len(fields) == 8 and fields[0][:-1].isdecimal() and fields[6] not in ("UND", "ABS"):
                value, size = int(fields[1], 16), int(fields[2], 0)
                self.symbols[fields[7]] = value
                if fields[3] == "FUNC" and size > 0:
                    self.functions.append((value & ~1, size, fields[7]))

    def places_that_name(self, symbol, size):
        """Addresses in the image that were filled in with the symbol's address, whole or in part: by its name, or by
        one that the compiler gave to what lies there."""
        start = self.symbols[symbol]
        for line in self._relocations.splitlines():
            fields = line.split()
            # place information type symbol's-value symbol
            if len(fields) >= 5 and fields[2].startswith("R_") and start <= int(fields[3], 16) < start + size:
                yield int(fields[0], 16)

    def function_at(self, address):
        for start, size, name in self.functions:
            if start <= address < start + size:
                return f"{name}+{address - start:#x}"
        return f"{address:#x}"


class Access:
    """A load or a store in the object that is watched."""

    def __init__(self, is_store, offset, size, value):
        self.is_store, self.offset, self.size, self.value = is_store, offset, size, value


class Call:
    """A call of a platform function: six arguments, as whole registers and words of the stack, and what the pointers
    among them pointed to."""

    def __init__(self, name, arguments):
        self.name, self.arguments, self.handed = name, arguments, {}


class Machine:
    """One object in one emulator. Operations run one after the other, as on the target."""

    def __init__(self, objects, watched=None, watched_size=0):
        self.image = Image(objects)
        self.processor = self.image.processor
        self.answers = {}         # what a platform function returns: a number, or what a function of the call yields
        self.handed = {}          # what a platform function is handed: function of the call -> {argument: size}
        self.events = []          # accesses and calls of the last operation, in their order
        self.reached = set()      # addresses of the image that were executed, or read as data by what was
        self.fill = 0
        self._emulator = self.processor.emulator()
        for address, size in ((IMAGE, IMAGE_SIZE), (STACK, STACK_SIZE), (CALLER, CALLER_SIZE)):
            self._emulator.mem_map(address, size)
        self.power_on()

        symbols = self.image.symbols
        platform = symbols["platform"] & ~1, symbols["platform_end"] & ~1
        self._names = {address & ~1: name for name, address in symbols.items()
                       if platform[0] <= address < platform[1] and name != "platform"}
        self._code_end = IMAGE + len(self.image.bytes)
        hook = self._emulator.hook_add
        hook(unicorn.UC_HOOK_CODE, self._on_platform, begin=platform[0], end=platform[1] - 1)
        hook(unicorn.UC_HOOK_CODE, self._on_instruction, begin=platform[1], end=self._code_end)
        hook(unicorn.UC_HOOK_MEM_READ, self._on_data, begin=IMAGE, end=self._code_end)
        self.watched, self._watched_size = None, watched_size
        if watched:
            if watched not in symbols:
                sys.exit(f"{objects[0]}: has no {watched}")
            self.watched = symbols[watched]
            hook(unicorn.UC_HOOK_MEM_READ | unicorn.UC_HOOK_MEM_WRITE, self._on_access, begin=self.watched - 16,
                 end=self.watched + watched_size - 1)

    def power_on(self):
        """Objects as they are at load."""
        self._emulator.mem_write(IMAGE, self.image.bytes)
        self._emulator.mem_write(CALLER, bytes(CALLER_SIZE))
        self._caller_used = 0

    def write(self, address, data):
        self._emulator.mem_write(address, bytes(data))

    def read(self, address, size):
        return bytes(self._emulator.mem_read(address, size))

    def caller_memory(self, data):
        """Where a caller has these bytes."""
        address = CALLER + self._caller_used
        self._caller_used += (len(data) + 15) & ~15
        self.write(address, data)
        return address

    def call(self, function, *arguments):
        """Run an operation on a stack and with registers that are filled with one byte, and yield its result."""
        if function not in self.image.symbols:
            raise KeyError(f"{function}: not there")
        self.events = []
        emulator, processor = self._emulator, self.processor
        self.write(STACK, bytes([self.fill]) * STACK_SIZE)
        for register in processor.registers:
            emulator.reg_write(register, int.from_bytes(bytes([self.fill]) * processor.word, "little"))
        stack = STACK + STACK_SIZE - ARGUMENTS_SIZE
        for number, argument in enumerate(arguments):
            if number < len(processor.arguments):
                emulator.reg_write(processor.arguments[number], argument)
            else:
                self._write_word(stack + (number - len(processor.arguments)) * processor.word, argument)
        end = self.image.symbols["the_end"]
        processor.enter(emulator, stack, end)
        try:
            emulator.emu_start(self.image.symbols[function], end & ~1, count=LIMIT)
        except unicorn.UcError as error:
            sys.exit(f"{function}: stopped by the emulator: {error}")
        return emulator.reg_read(processor.result) & 0xFFFFFFFF

    def _write_word(self, address, value):
        self.write(address, value.to_bytes(self.processor.word, "little"))

    def _argument(self, number):
        processor = self.processor
        if number < len(processor.arguments):
            return self._emulator.reg_read(processor.arguments[number])
        stack = self._emulator.reg_read(processor.stack_pointer) + processor.stack_arguments
        address = stack + (number - len(processor.arguments)) * processor.word
        return int.from_bytes(self.read(address, processor.word), "little")

    def _on_instruction(self, _emulator, address, size, _data):
        self.reached.update(range(address, address + size))

    def _on_data(self, _emulator, _access, address, size, _value, _data):
        self.reached.update(range(address, address + size))

    def _on_access(self, _emulator, access, address, size, value, _data):
        if address + size > self.watched:
            is_store = access == unicorn.UC_MEM_WRITE
            self.events.append(Access(is_store, address - self.watched, size, value & ((1 << 8 * size) - 1)))

    def _on_platform(self, emulator, address, _size, _data):
        name = self._names.get(address)
        if name is None or name == "the_end":
            return
        call = Call(name, [self._argument(number) for number in range(6)])
        for number, size in self.handed.get(name, lambda _: {})(call).items():
            call.handed[number] = self.read(call.arguments[number], size) if call.arguments[number] else None
        self.events.append(call)
        emulator.reg_write(self.processor.result, self._answer(call))

    def _answer(self, call):
        if call.name in ("memcpy", "memset"):
            return self._move_memory(call)
        if call.name in ("x_sema_create", "x_timer_create"):  # the handle that the caller waits for
            self.write(call.arguments[0], struct.pack("<I", 0x51))
        if call.name == "i4ImQueryInterface":
            table = self.caller_memory(bytes(self.processor.word * 11))
            self._write_word(table + SET_COLOR_MODE * self.processor.word, self.image.symbols["set_color_mode"])
            self._write_word(call.arguments[3], table)
        answer = self.answers.get(call.name, 0)
        return answer(call) if callable(answer) else answer

    def _move_memory(self, call):
        """In the layer's place: what is watched there is a store, or a load, of that many bytes."""
        target, source, size = call.arguments[:3]
        if call.name == "memset":
            data = bytes([source & 0xFF]) * size
        else:
            data = self.read(source, size)
            self._note_block(False, source, data)
        self._note_block(True, target, data)
        self.write(target, data)
        return target

    def _note_block(self, is_store, address, data):
        if self.watched and address < self.watched + self._watched_size and address + len(data) > self.watched:
            self.events.append(Access(is_store, address - self.watched, len(data), int.from_bytes(data, "little")))


def check(usage, complaints, scenarios, what):
    """The program of a check: it names what complaints() finds in the objects of its command line, or says what it has
    seen, and how often."""
    objects = [pathlib.Path(argument) for argument in sys.argv[1:]]
    if not objects:
        sys.exit(usage)
    checked = objects[0] if len(objects) == 1 else objects[0].parent
    found = list(complaints(objects, scenarios))
    for complaint in found:
        print(f"{checked}: {complaint}")
    if not found:
        print(f"{checked}: {len(scenarios)} {what}")
    return 1 if found else 0
