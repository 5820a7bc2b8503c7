# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""`pmxboard shell` on a terminal: keys go in, and what the terminal gets comes out."""

import fcntl
import os
import pty
import select
import struct
import sys
import termios
import time

SKIPPED = 77
PATIENCE = 60  # seconds; reached only when something is wrong
TAB, UP, DOWN, RIGHT, ENTER = "\t", "\x1b[A", "\x1b[B", "\x1b[C", "\r"
CTRL_A, CTRL_C, CTRL_D, CTRL_E, CTRL_R, CTRL_U = "\x01", "\x03", "\x04", "\x05", "\x12", "\x15"
PROMPT = "pmx> "


class Terminal:
    """A shell on a terminal of its own."""

    def __init__(self, program, home, *arguments, columns=80, rows=24, pixels=0, command="shell", prepare=None,
                 **environment):
        variables = {name: value for name, value in os.environ.items()
                     if name not in ("XDG_STATE_HOME", "PMXBOARD_HISTORY", "PMXBOARD_GRAPHICS", "KITTY_WINDOW_ID",
                                     "EDITRC")}
        variables |= {"TERM": "xterm", "HOME": str(home), "NO_COLOR": "1"}
        for name, value in environment.items():
            if value is None:
                variables.pop(name, None)
            else:
                variables[name] = value
        self.seen = ""    # all that the terminal got
        self.behind = 0   # what has been waited for lies before this
        self.process, self.terminal = pty.fork()
        if self.process == 0:
            try:
                # The size has to be there before the first look at it.
                fcntl.ioctl(1, termios.TIOCSWINSZ, struct.pack("HHHH", rows, columns, pixels, 0))
                if prepare:
                    prepare()
                os.execve(program, [program, command, *arguments], variables)
            finally:
                os._exit(127)

    def type(self, *keys):
        os.write(self.terminal, "".join(keys).encode())

    def paste(self, text):
        """Type more than the terminal takes at once, and read what comes meanwhile."""
        data = text.encode()
        while data:
            readable, writable, _ = select.select([self.terminal], [self.terminal], [], PATIENCE)
            if not readable and not writable:
                raise AssertionError(f"it takes no more in {PATIENCE} s; the end of all of it:\n{self.seen[-2000:]!r}")
            if readable and not self.read_on():
                raise AssertionError(f"it ended; the end of all of it:\n{self.seen[-2000:]!r}")
            if writable:
                data = data[os.write(self.terminal, data[:256]):]

    def read_on(self):
        """More of what the shell writes; false when it has ended."""
        if not select.select([self.terminal], [], [], PATIENCE)[0]:
            raise AssertionError(f"nothing came in {PATIENCE} s; the end of all of it:\n{self.seen[-2000:]!r}")
        try:
            data = os.read(self.terminal, 65536)
        except OSError:  # the other end is closed
            return False
        self.seen += data.decode(errors="replace")
        return bool(data)

    def wait_for(self, text):
        """Wait until the text appears behind what was waited for before; what came until then, the text included."""
        limit = time.monotonic() + PATIENCE
        while (found := self.seen.find(text, self.behind)) < 0:
            if time.monotonic() > limit or not self.read_on():
                raise AssertionError(f"no {text!r} in {self.seen[self.behind:][-2000:]!r}")
        until = self.seen[self.behind:found + len(text)]
        self.behind = found + len(text)
        # The prompt is there a moment before the editor has the keys; until then Ctrl-D is the terminal's own.
        while text.endswith(PROMPT) and termios.tcgetattr(self.terminal)[3] & termios.ICANON:
            if time.monotonic() > limit:
                raise AssertionError("the editor does not begin")
            time.sleep(0.001)
        return until

    def command(self, *keys):
        """Type a line and wait for the next prompt; what came in between."""
        self.type(*keys, ENTER)
        self.wait_for("\n")
        return self.wait_for(PROMPT).replace("\r\n", "\n")

    def end(self):
        """Read the rest; the exit code, or that of the signal, negative."""
        while self.read_on():
            pass
        os.close(self.terminal)
        return os.waitstatus_to_exitcode(os.waitpid(self.process, 0)[1])


def no_terminals():
    """Why there can be no terminal here; nothing when there can."""
    try:
        for end in pty.openpty():
            os.close(end)
    except OSError as error:
        return str(error)
    return None


def program_of(arguments, usage):
    """The first argument, taken out: the program that is tested. Ends what runs where there can be no terminal."""
    if len(arguments) < 2:
        sys.exit(usage)
    why = no_terminals()
    if why:
        print(f"skipped: this machine gives out no terminals ({why})")
        sys.exit(SKIPPED)
    return os.path.abspath(arguments.pop(1))
