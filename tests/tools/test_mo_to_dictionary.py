"""Runs mo-to-dictionary on real catalogues, and asks a dictionary what gettext answers:
test_mo_to_dictionary.py KOLVANE SCRIPT."""

import gettext
import os
import pathlib
import subprocess
import sys
import tempfile
import unittest

KOLVANE = [*os.environ.get("EMULATOR", "").split(), sys.argv.pop(1)]
SCRIPT = sys.argv.pop(1)
CATALOGUES = pathlib.Path("/usr/share/locale")


class MoToDictionary(unittest.TestCase):
    def test_dictionaries_answer_as_gettext_does(self):
        for language, encoding in [("de", "utf-16"), ("ja", "utf-8"), ("es", "code-page")]:
            path = CATALOGUES / language / "LC_MESSAGES" / "iso_3166-1.mo"
            with open(path, "rb") as stream, tempfile.NamedTemporaryFile() as dictionary:
                messages = {key: text for key, text in gettext.GNUTranslations(stream)._catalog.items()
                            if isinstance(key, str) and key and key.isascii() and not set(key) & set('%="\\\n')}
                subprocess.run([sys.executable, SCRIPT, "--prefix", "/iso", "--encoding", encoding,
                                "-o", dictionary.name, path], check=True)
                answers = subprocess.run([*KOLVANE, "translate", "--nul", "--dictionary", dictionary.name],
                                         input="".join(f"$$$/iso/{key}\0" for key in messages).encode(),
                                         stdout=subprocess.PIPE, check=True).stdout.decode().split("\0")[:-1]
            self.assertGreater(len(messages), 300)
            self.assertEqual(dict(zip(messages, answers)), messages)

    def test_damaged_catalogues_leave_nothing_behind(self):
        whole = (CATALOGUES / "de" / "LC_MESSAGES" / "iso_3166-1.mo").read_bytes()
        with tempfile.TemporaryDirectory() as folder:
            source, target = pathlib.Path(folder, "d.mo"), pathlib.Path(folder, "d.txt")
            for damaged in [b"", b"text", whole[:20], whole[:5000], whole[:8] + b"\xff\xff\xff\x7f" + whole[12:]]:
                source.write_bytes(damaged)
                done = subprocess.run([sys.executable, SCRIPT, "-o", target, source], capture_output=True)
                self.assertEqual((done.returncode, done.stderr.count(b"\n"), target.exists()), (2, 1, False))


if __name__ == "__main__":
    unittest.main()
