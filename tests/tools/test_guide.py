"""Runs what the guide for authors of dictionaries shows: test_guide.py COMMAND GUIDE."""

import pathlib
import re
import shutil
import subprocess
import sys
import unittest

from command import KOLVANE, CommandTest, utf16

GUIDE = pathlib.Path(sys.argv.pop(1)).read_text(encoding="utf-8")
BLOCKS = re.findall(r"^```(\w+)(?: file=(\S+))?\n(.*?)^```$", GUIDE, re.M | re.S)
ROWS = [[cell.strip() for cell in re.split(r"(?<!\\)\|", row)[1:-1]] for row in re.findall(r"^\|.*\|$", GUIDE, re.M)]


def code(cell):
    return re.findall(r"`([^`]+)`", cell)


class Guide(CommandTest):
    def output_of(self, *arguments):
        return self.run_kolvane(*arguments)[1].decode()

    @unittest.skipUnless(shutil.which("bash"), "no shell")
    def test_console(self):
        quoted = " ".join(f"'{word}'" for word in KOLVANE)
        commands = 0
        for kind, name, text in BLOCKS:
            if name:
                self.folder.joinpath(name).write_text(text, encoding="utf-8", newline="\n")
                continue
            for command, expected in re.findall(r"^\$ (.*)\n((?:(?!\$ ).*\n)*)", text, re.M):
                done = subprocess.run(["bash", "-c", f"kolvane() {{ {quoted} \"$@\"; }}; {command}"], cwd=self.folder, timeout=60,
                                      stdout=subprocess.PIPE, stderr=subprocess.STDOUT)
                self.assertEqual(done.stdout.decode(), expected, command)
                commands += 1
        self.assertGreater(commands, 8)

    def test_escapes(self):
        pairs = [(code(written)[0], character) for row in ROWS for written, character in zip(row[::2], row[1::2])
                 if character.startswith("U+")]
        self.assertEqual(len(pairs), 17 + 6 + 132)
        answers = self.output_of("translate", "--nul", *("=" + written for written, _ in pairs)).split("\0")
        for (written, character), answer in zip(pairs, answers):
            self.assertEqual(" ".join(f"U+{ord(each):04X}" for each in answer), character, written)

    def test_traps(self):
        listed = {line.split()[0] for line in self.output_of("check", "--list-rules").splitlines()}
        rules = [(code(row[0])[0], row[1:]) for row in ROWS if row[0].startswith("`") and code(row[0])[0] in listed]
        self.assertEqual(sorted(rule for rule, _ in rules), sorted(listed))
        for rule, cells in rules:
            examples = [code(cell) for cell in cells[:-1]]
            if not any(examples):
                continue
            reference = []
            if len(examples) == 2:  # of reference and translation
                reference = ["--reference", self.file(utf16(f'"/a={"".join(examples[0])}"'), "r")]
                self.file(utf16(f'"/a={"".join(examples[1])}"'), "d")
            else:
                self.file(utf16("\n".join(examples[0] if rule == "mark-in-key" else ["", *examples[0]])), "d")
            found = self.output_of("check", "--no-snippet", "--info", "d", *reference)
            self.assertIn(f"[{rule}]", found)
            self.assertEqual(found.count("["), 1, found)


if __name__ == "__main__":
    unittest.main()
