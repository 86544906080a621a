"""Runs the minimal hosts: test_hosts.py GUIDE FOLDER PLUG-IN SAMPLES HOST..."""

import os
import pathlib
import re
import subprocess
import sys
import unittest

GUIDE, FOLDER, PLUG_IN, SAMPLES = map(pathlib.Path, sys.argv[1:5])
HOSTS = sys.argv[5:]
del sys.argv[1:]


def run(host, *arguments):
    emulator = os.environ.get("EMULATOR", "").split()
    done = subprocess.run([*emulator, host, *map(str, arguments)], capture_output=True, timeout=60, stdin=subprocess.DEVNULL)
    return done.returncode, *(text.decode().replace("\r\n", "\n") for text in (done.stdout, done.stderr))


class Hosts(unittest.TestCase):
    def test_translate_in_both_ways(self):
        self.assertEqual(len(HOSTS), 2)
        for host in HOSTS:
            for name, cancel in [("de.txt", "Abbrechen"), ("ja.txt", "キャンセル"), ("it.bin", "Annulla")]:
                with self.subTest(host=host, name=name):
                    self.assertEqual(run(host, PLUG_IN, SAMPLES / name, "$$$/Dialog/Cancel=Cancel"),
                                     (0, f"message: {cancel}\ncoercion: {cancel}\n", ""))

    def test_say_what_is_wrong(self):
        for host in HOSTS:
            for arguments, expected, reason in [([PLUG_IN], 2, "usage: host PLUG-IN DICTIONARY KEY"),
                                                (["./none.so", SAMPLES / "de.txt", "x"], 1, r"host: \./none.so: .*"),
                                                ([PLUG_IN, "none.txt", "x"], 1, "host: .*none.txt.*")]:
                status, output, errors = run(host, *arguments)
                self.assertEqual((status, output), (expected, ""))
                self.assertRegex(errors, rf"\A{reason}\n\Z")

    def test_are_what_the_guide_quotes(self):
        quotes = re.findall(r"^```(cpp|c)\n(.*?)^```$", GUIDE.read_text(), re.M | re.S)
        self.assertGreater(len(quotes), 4)
        for language, quote in quotes:
            self.assertIn(quote, (FOLDER / f"host.{language}").read_text())


if __name__ == "__main__":
    unittest.main()
