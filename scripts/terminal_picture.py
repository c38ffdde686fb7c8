#!/usr/bin/env python3
# SPDX-FileCopyrightText: The mediidx developers
# SPDX-License-Identifier: MIT
"""terminal_picture.py OUT.svg SHOWN=REAL… -- COMMAND WORD… [-- COMMAND WORD…]…

Runs the commands one after the other on a terminal and draws what it shows in the end. In the
picture the text SHOWN stands for each REAL.
"""
import fcntl
import os
import pty
import struct
import sys
import termios
from xml.sax.saxutils import escape

COLUMNS, ROWS = 108, 60
WIDTH, HEIGHT, MARGIN = 8.6, 18, 16  # Of a character, a line, and around them, in pixels.


def run(command):
    """What the command writes to a terminal."""
    child, terminal = pty.fork()
    if child == 0:
        fcntl.ioctl(0, termios.TIOCSWINSZ, struct.pack("HHHH", ROWS, COLUMNS, 0, 0))
        os.execvp(command[0], command)
    out = b""
    while True:
        try:
            out += os.read(terminal, 65536)
        except OSError:  # The end of a terminal.
            break
    os.waitpid(child, 0)
    return out.decode("utf-8", "replace")


def lines_of(text):
    """The lines that stay: of one that was cleared and drawn anew, the last."""
    lines = text.replace("\r\n", "\n").rstrip("\n").split("\n")
    return [line.split("\r\x1b[K")[-1].rstrip() for line in lines]


def wrapped(line):
    return [line[at : at + COLUMNS] for at in range(0, max(len(line), 1), COLUMNS)]


def picture(lines):
    width, height = COLUMNS * WIDTH + 2 * MARGIN, len(lines) * HEIGHT + 2 * MARGIN
    texts = "".join(
        f'<text x="{MARGIN}" y="{MARGIN + HEIGHT * row + 13}"{kind}>{escape(line)}</text>\n'
        for row, line in enumerate(lines)
        for kind in [' class="typed"' if line.startswith("$ ") else ""]
    )
    return (
        f'<svg xmlns="http://www.w3.org/2000/svg" width="{width:.0f}" height="{height}" '
        f'viewBox="0 0 {width:.0f} {height}" role="img" aria-label="A scan on a terminal">\n'
        # What the picture says of itself: REUSE-IgnoreStart
        "<!-- SPDX-FileCopyrightText: The mediidx developers\n"
        "     SPDX-License-Identifier: MIT -->\n"
        # REUSE-IgnoreEnd
        "<style>text { font: 14px ui-monospace, 'DejaVu Sans Mono', Menlo, Consolas, monospace; "
        "fill: #d5dae5; white-space: pre } .typed { fill: #8fd18f }</style>\n"
        f'<rect width="100%" height="100%" rx="10" fill="#161a22"/>\n{texts}</svg>\n'
    )


def main():
    words = sys.argv[2:]
    begin = words.index("--")
    commands, lines = [], []
    for word in words[begin:]:
        if word == "--":
            commands.append([])
        else:
            commands[-1].append(word)
    for command in commands:
        text = "$ " + " ".join(command) + "\n" + run(command)
        for shown, real in (word.split("=", 1) for word in words[:begin]):
            text = text.replace(real, shown)
        for line in lines_of(text):
            lines += wrapped(line)
    with open(sys.argv[1], "w", encoding="utf-8") as out:
        out.write(picture(lines))


main()
