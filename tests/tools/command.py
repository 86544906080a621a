"""What the tests of the kolvane command share. The command is their first argument."""

import functools
import os
import pathlib
import struct
import subprocess
import sys
import tempfile
import unittest

KOLVANE = [*os.environ.get("EMULATOR", "").split(), sys.argv.pop(1)]
PAD = b"\n" * 30  # no file is too short for its lines


def utf16(text):
    return ("\ufeff" + text + PAD.decode()).encode("utf-16-le", "surrogatepass")


def bucket(key):
    return functools.reduce(lambda hashed, byte: (32 * hashed + byte) % 1021, key, 0)


def image(groups, encoding=0, minor=5):
    """A binary image of groups: (bucket, [(key, value bytes)...])."""
    head = b"Kolvane Binary Format" + bytes([1, minor, encoding])
    entries = [entry for _, group in groups for entry in group]
    if minor == 5:
        counts, total = b"", 0
        for _, group in groups:
            total += 2 * len(group)
            counts += struct.pack("<I", total)
        return (head + struct.pack("<I", len(groups)) + counts
                + b"".join(struct.pack("<II", len(key), len(value)) for key, value in entries)
                + b"".join(struct.pack("<H", bucket) for bucket, _ in groups)
                + b"".join(key + value for key, value in entries))
    records, data = b"", b""
    start = len(head) + 2 + 6 * (len(groups) + 1)
    for bucket, group in groups:
        records += struct.pack("<HI", bucket, start + len(data))
        for key, value in group:
            data += struct.pack("<I", len(key)) + key + struct.pack("<I", len(value)) + value
    return head + struct.pack("<H", len(groups) + 1) + records + struct.pack("<HI", 0, start + len(data)) + data


class CommandTest(unittest.TestCase):
    """Runs the command in a folder of each test's own."""

    maxDiff = None

    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.folder = pathlib.Path(folder.name)

    def run_kolvane(self, *arguments, stdin=b"", **options):
        """Returns the status, standard output and standard error."""
        given = {"input" if isinstance(stdin, bytes) else "stdin": stdin}
        chosen = {"cwd": self.folder, "timeout": 60, "stdout": subprocess.PIPE, "stderr": subprocess.PIPE, **given, **options}
        done = subprocess.run([*KOLVANE, *map(str, arguments)], **chosen)
        return done.returncode, done.stdout or b"", (done.stderr or b"").decode()

    def open_terminal(self):
        """Returns the test's end and the command's end."""
        try:
            return os.openpty()
        except (AttributeError, OSError) as error:
            self.skipTest(f"cannot open a terminal: {error}")

    def file(self, content, name="d.txt"):
        self.folder.joinpath(name).write_bytes(content)
        return name
