"""Runs `kolvane stats` as its users do: test_stats.py COMMAND SAMPLES."""

import csv
import io
import json
import os
import pathlib
import re
import sys
import unittest
from xml.etree import ElementTree

from command import KOLVANE, PAD, CommandTest, image

SAMPLES = pathlib.Path(sys.argv.pop(1)).absolute()


def text(**values):
    return ("\ufeff" + "".join(f'"$$$/{key}={value}"\n' for key, value in values.items())).encode() + PAD


def page_of(output):
    """Fails for what is not closed, runs, or is fetched; returns the texts, and the cells of the table's rows."""
    page = ElementTree.fromstring(re.sub(r"(?i)<!doctype[^>]*>|<meta[^>]*>", "", output))
    for element in page.iter():
        assert element.tag not in ("script", "link", "img", "iframe", "object"), element.tag
        assert not [name for name in element.keys() if name in ("href", "src") or name.startswith("on")], element.attrib
    rows = [[text for cell in row for text in [cell.text or "", *(part.tail or "" for part in cell)] if text.strip()] for row in page.iter("tr")]
    return list(page.itertext()), rows


class Stats(CommandTest):
    def stats(self, *arguments, **options):
        status, output, errors = self.run_kolvane("stats", *arguments, **options)
        return status, output.decode(), errors

    def figures(self, *arguments, status=0):
        done = self.stats("--format", "json", *arguments)
        self.assertEqual(done[0], status, done[2])
        return json.loads(done[1])["files"]

    def test_coverage(self):
        for original, translation, expected in [  # translated, identical, missing, extra, percent
                ("File", "Datei", [1, 0, 0, 0, 100.0]), ("OK", "OK", [0, 1, 0, 0, 0.0]),
                ("File", "", [0, 0, 1, 0, 0.0]), ("File", None, [0, 0, 1, 1, 0.0]),
                ("", "", [1, 0, 0, 0, 100.0]), ("", "x", [1, 0, 0, 0, 100.0]),
                ("100 %", "100 %", [1, 0, 0, 0, 100.0]), ("字", "字", [0, 1, 0, 0, 0.0]),
                ("{name}, {0:N2}: {}", "{name}, {0:N2}: {}", [1, 0, 0, 0, 100.0]),
                ("%1$s/%-5.2ld/%%", "%1$s/%-5.2ld/%%", [1, 0, 0, 0, 100.0]),
                ("{a b", "{a b", [0, 1, 0, 0, 0.0]), ("%y", "%y", [0, 1, 0, 0, 0.0])]:
            with self.subTest(original=original, translation=translation):
                reference = self.file(text(a=original), "r.txt")
                found = self.figures("--reference", reference, self.file(text(**{"b" if translation is None else "a": translation})))
                self.assertEqual(list(found[0].values())[3:8], expected)

    def test_words(self):
        words = {"": 0, "&Datei öffnen...\\tStrg+O": 3, "– … &": 0, "Da{0}tei don't 5#{nbsp}s": 4, "ファイルを開く": 7,
                 "Heron編集ー。": 4, "파일 열기": 2, "เปิดไฟล์": 1, "a\u3000b 𝄞 𠀀𠀁": 4}
        files = [self.file(text(a=value), str(number)) for number, value in enumerate(words)]
        self.assertEqual([figures["words"] for figures in self.figures(*files)], list(words.values()))

    def test_chains(self):
        keys = {f"thirteen-here{end}"[:14]: "x" for end in "abc"} | dict.fromkeys("wxyz", "y")
        spread = list(self.figures(self.file(text(**keys)))[0].values())[3:]
        self.assertEqual((len(keys), spread), (7, [5, 3, 1.43]))
        # Of a key's two entries the second is never found, and the first entry has no business in this bucket.
        path = self.file(image([(580, [(b"/b", b"x"), (b"/a", b"y"), (b"/a", b"z")])], 1))
        self.assertEqual(list(self.figures(path, status=1)[0].values())[1:], [1, 1, 1, 3, 2.0])
        self.assertIn("error: byte 58: the image is damaged, a key is filed where it is never found", self.stats(path)[2])

    def test_every_format_has_the_same_numbers(self):
        name = 'a,"b" <&>.txt' if os.name != "nt" and len(KOLVANE) == 1 else "a,'b' &.txt"
        reference = self.file(text(a="A", b="B", c="C"), "r.txt")
        arguments = ["--reference", reference, self.file(text(a="Ä", b="B", d="D"), name), SAMPLES / "it.bin"]
        files = self.figures(*arguments)
        self.assertEqual(list(files[0].values())[1:], [3, 3, 1, 1, 1, 1, 33.3, 3, 1, 1.0])
        rows = list(csv.DictReader(io.StringIO(self.stats("--format", "csv", *arguments)[1])))
        self.assertEqual(rows, [{key: f"{value:.2f}" if key == "meanSteps" else str(value) for key, value in file.items()}
                                for file in files])
        texts, shown_rows = page_of(self.stats("--format", "html", *arguments)[1])
        table = self.stats(*arguments)[1].splitlines()
        self.assertEqual(table[0], f"compared with {reference}, 3 keys")
        self.assertEqual(len(set(map(len, table[2:]))), 1)
        for row, line, shown in zip(rows, table[3:], shown_rows[1:], strict=True):
            order = ["keys", "words", "translated", "translatedPercent", "identical", "missing", "extra",
                     "usedBuckets", "longestChain", "meanSteps"]
            self.assertEqual([line[:len(row["file"])], *line[len(row["file"]):].split()], [row["file"], *map(row.get, order)])
            counts = map(row.get, ["translated", "identical", "missing", "extra", "keys", "words"])
            self.assertEqual(shown, [row["file"], row["translatedPercent"] + " %", *counts])
            self.assertIn("{usedBuckets} in use, the fullest with {longestChain}; {meanSteps} steps to a key".format(**row), texts)
        self.assertEqual(self.stats(reference)[1].split(), "file keys words buckets longest steps r.txt 3 3 3 1 1.00".split())
        self.assertEqual(page_of(self.stats("--format", "html", reference)[1])[1][1], [str(reference), "3", "3"])

    def test_fail_under(self):
        reference = self.file(text(a="A", b="B", c="C"), "r.txt")
        path = self.file(text(a="Ä", b="Ö", c="C"))
        for percent, status in [("66.6", 0), ("66.666666", 0), ("66.666667", 1), ("67", 1), ("100", 1), ("0", 0)]:
            self.assertEqual(self.stats("--reference", reference, "--fail-under", percent, path)[0], status, percent)
        self.assertIn(f"{path}: 66.6 % is translated, less than 67 %",
                      self.stats("--reference", reference, path, reference, "--fail-under=67")[2])

    def test_files_that_are_not_as_they_should_be(self):
        path, reference = self.file(text(a="x")), self.file(text(b="y"), "r.txt")
        cut = self.file((SAMPLES / "it.bin").read_bytes()[:1500], "cut.bin")
        status, output, errors = self.stats(path, "missing", cut, "-", stdin=text(a="x"))
        self.assertEqual((status, [line.split()[0] for line in output.splitlines()]), (2, ["file", str(path), str(cut), "-"]))
        self.assertRegex(errors, r"^kolvane: missing: No such file.*\nkolvane: .*cut.bin: error: the image is cut short: .*\n$")
        for other, status in [(cut, 1), ("missing", 2), (self.file(PAD, "no-keys"), 2), (reference, 0)]:
            self.assertEqual(self.stats("--reference", other, path)[0], status, other)


if __name__ == "__main__":
    unittest.main()
