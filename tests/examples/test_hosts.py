"""Runs the minimal hosts: test_hosts.py GUIDE FOLDER PLUG-IN SAMPLES HOST..."""

import os
import pathlib
import re
import subprocess
import sys
import unittest

GUIDE, FOLDER, PLUG_IN, SAMPLES, *HOSTS = map(pathlib.Path, sys.argv[1:])
del sys.argv[1:]


class Hosts(unittest.TestCase):
    def test_translate_in_both_ways_or_say_what_is_wrong(self):
        self.assertEqual(len(HOSTS), 2)
        key = "$$$/Dialog/Cancel=Cancel"
        for arguments, status, output, reason in [
                ([PLUG_IN, SAMPLES / "de.txt", key], 0, "message: Abbrechen\ncoercion: Abbrechen\n", ""),
                ([PLUG_IN, SAMPLES / "ja.txt", key], 0, "message: キャンセル\ncoercion: キャンセル\n", ""),
                ([PLUG_IN, SAMPLES / "it.bin", key], 0, "message: Annulla\ncoercion: Annulla\n", ""),
                ([PLUG_IN], 2, "", "usage: host PLUG-IN DICTIONARY KEY\n"),
                (["./none.so", SAMPLES / "de.txt", "x"], 1, "", r"host: \./none.so: .*\n"), ([PLUG_IN, "none.txt", "x"], 1, "", "host: .*none.txt.*\n")]:
            for host in HOSTS:
                done = subprocess.run([*os.environ.get("EMULATOR", "").split(), host, *arguments], capture_output=True, timeout=60,
                                      stdin=subprocess.DEVNULL)
                self.assertEqual((done.returncode, done.stdout.decode().replace("\r\n", "\n")), (status, output))
                self.assertRegex(done.stderr.decode().replace("\r\n", "\n"), rf"\A{reason}\Z")

    def test_are_what_the_guide_quotes(self):
        quotes = re.findall(r"^```(cpp|c)\n(.*?)^```$", GUIDE.read_text(), re.M | re.S)
        self.assertGreater(len(quotes), 4)
        for language, quote in quotes:
            self.assertIn(quote, (FOLDER / f"host.{language}").read_text())


if __name__ == "__main__":
    unittest.main()
