"""Runs mo-to-dictionary on real catalogues, and asks a dictionary what gettext answers:
test_mo_to_dictionary.py KOLVANE SCRIPT."""

import gettext
import pathlib
import subprocess
import sys
import unittest

from command import CommandTest

SCRIPT = sys.argv.pop(1)
CATALOGUES = pathlib.Path("/usr/share/locale")


class MoToDictionary(CommandTest):
    def convert(self, *arguments):
        done = subprocess.run([sys.executable, SCRIPT, "-o", "d.txt", *arguments], cwd=self.folder, capture_output=True)
        return done.returncode, done.stderr.count(b"\n")

    def test_dictionaries_answer_as_gettext_does(self):
        for language, encoding in [("de", "utf-16"), ("ja", "utf-8"), ("es", "code-page")]:
            path = CATALOGUES / language / "LC_MESSAGES/iso_3166-1.mo"
            with open(path, "rb") as stream:
                messages = {key: text for key, text in gettext.GNUTranslations(stream)._catalog.items()
                            if isinstance(key, str) and key and key.isascii() and not set(key) & set('%="\\\n')}
            self.assertGreater(len(messages), 300)
            self.assertEqual(self.convert("--prefix", "/iso", "--encoding", encoding, path)[0], 0)
            keys = "".join(f"$$$/iso/{key}\0" for key in messages).encode()
            answers = self.run_kolvane("translate", "--nul", "--dictionary", "d.txt", stdin=keys)[1].decode()
            self.assertEqual(dict(zip(messages, answers.split("\0"))), messages)

    def test_damaged_catalogues_leave_nothing_behind(self):
        whole = (CATALOGUES / "de/LC_MESSAGES/iso_3166-1.mo").read_bytes()
        for damaged in [b"", b"text", whole[:20], whole[:5000], whole[:8] + b"\xff\xff\xff\x7f" + whole[12:]]:
            self.assertEqual(self.convert(self.file(damaged, "d.mo")), (2, 1))
            self.assertFalse(self.folder.joinpath("d.txt").exists())


if __name__ == "__main__":
    unittest.main()
