"""Files that are damaged, in another encoding than they seem, or no dictionaries: test_inputs.py COMMAND."""

import json
import os
import random
import signal
import subprocess
import time
import unittest

from command import KOLVANE, PAD, CommandTest, utf16

RUSSIAN = '"$$$/a=Привет"\n"$$$/b=Мир"\n"$$$/c=Дверь"\n'.encode()
PO = 'msgid ""\nmsgstr ""\n"Content-Type: text/plain; charset=UTF-8\\n"\n\n#: a.c:1\nmsgid "Cancel"\nmsgstr "Größe"\n'
XML = '<?xml version="1.0"?>\n<texts>\n  <text key="a=b">Größe</text>\n</texts>\n'
JSON = '{\n  "version": 1, "entries": [\n{"key":"/a","value":"Größe"}\n]}\n'
DATA = random.Random(1).randbytes(3000)

# The place of the first byte that is not UTF-8 in a file that is meant as such.
MALFORMED = [
    (RUSSIAN.replace("М".encode(), b"\xff"), "2:8: error: byte 28"),
    (RUSSIAN.replace("ь".encode(), b"\xd1"), "3:12: error: byte 51"),
    (b"\xef\xbb\xbf" + b'"$$$/a=\xe9t\xe9"' + PAD, "1:8: error: byte 10"),
    ('é\n\r\n"ü\u2028"ö"\r"ä'.encode() + b"\xe9\xe8\xe7" + PAD, "5:3: error: byte 19"),
    ("\u20ac\U0001f600".encode() * 9 + b"\xed\xa0\x80\n" + b"\xf4\x90\x80\x80" + PAD, "1:19: error: byte 63"),
]

# Text of the code page, in which bytes of UTF-8 may stand side by side by chance.
CODE_PAGE = ["Größe", "„Spaß“", "«CAFÉ» déjà vu", "São João", "Ã©tat déjà", "½ Año", "ÿþ"]

# What is told of a file that is no text dictionary in the encoding that it is read in.
KINDS = [
    *((content, f"this is {name}, not a dictionary")
      for name, text in [("a PO file", PO), ("XML", XML), ("XML", XML.partition("\n")[2]), ("JSON", JSON), ("JSON", f"[\n// note\n{JSON}]")]
      for content in [text.encode(), b"\xef\xbb\xbf" + text.encode(), text.encode("cp1252"), utf16(text), text.replace("\n", "\r\n").encode()]),
    (DATA, "this is binary data, not a dictionary"),
    *((f'"$$$/a={"some text" * 9}"'.encode(encoding), "this is UTF-16 without its byte-order mark, which is read in the code page")
      for encoding in ["utf-16-le", "utf-16-be"]),
]

# Dictionaries that look a little like something else.
DICTIONARIES = ['<b> "$$$/a=b" </b>', '{ "$$$/a=b" }', '[menu]\n"$$$/a=b"', 'msgid "$$$/a=b"', '# msgstr ""\n"$$$/a=b"', '"$$$/a=\x01\x02"']

# Text in UTF-8 whose first line the mark of UTF-16 would change, and its entries.
FIRST_LINES = [
    ("$$$/a=ä", {"/a": "ä"}), ("/a=x\n/b=ä", {"/a": "x", "/b": "ä"}), ("\n\r\n/a=ä\r\n/b=x", {"/a": "ä", "/b": "x"}), ("/a=ä\\", {"/a": "ä\\"}),
    ('/a=\\"ä\\"', {"/a": '"ä"'}), ('\n"/a=ä" x', {"/a": "ä"}), ("\n/a=ä\0/b=x", {"/a": "ä", "/b": "x"}), ("\u2028/a=ä", {"/a": "ä"}), ("$/a=ä", {}),
]


class Inputs(CommandTest):
    def compile(self, *arguments):
        """Fails where something is written that should not be; returns the status and what is said."""
        self.folder.joinpath("out").write_bytes(b"as it was")
        status, output, errors = self.run_kolvane("compile", *arguments, "-o", "out")
        self.assertEqual(output, b"")
        self.assertEqual(self.folder.joinpath("out").read_bytes() == b"as it was", status != 0, arguments)
        return status, errors

    def values(self, *arguments):
        status, output, errors = self.run_kolvane("dump", "--json", *arguments)
        self.assertEqual(status, 0, errors)
        return {entry["key"]: entry["value"] for entry in json.loads(output)["entries"]}

    def test_malformed_utf8_is_refused(self):
        for content, message in MALFORMED:
            for options in [[], ["--encoding", "utf-8"]]:
                with self.subTest(message, options=options):
                    name = self.file(content)
                    status, errors = self.compile(name, *options)
                    self.assertEqual((status, errors.splitlines()[1:]), (2, ["kolvane: nothing was written, for an input is not whole"]))
                    self.assertTrue(errors.startswith(f"kolvane: {name}:{message} is malformed UTF-8"), errors)
                    place = f"{name}:{message.partition(' ')[0]}"
                    self.assertIn(place, self.run_kolvane("check", "--disable=missing-equals", *options, name)[1].decode())
                    status, _, errors = self.run_kolvane("convert", *options, name, "-o", "-", "--to", "utf-16le")
                    self.assertEqual((status, errors.partition(" ")[2][:len(place)]), (2, place))
            self.assertEqual(self.compile(name, "--encoding", "image")[0], 0)

    def test_malformed_utf8_keeps_the_rest(self):
        name = self.file(MALFORMED[0][0])
        for status, *call in [(2, "translate", "--dictionary", name, "$$$/a=x", "$$$/b=x"), (1, "dump", "--sort", name), (1, "stats", name)]:
            done = self.run_kolvane(*call)
            self.assertEqual(done[0], status)
            self.assertIn(f"{name}:2:8: error: ", done[2])
            self.assertTrue("Привет".encode() in done[1] or "stats" in call, done[1])

    def test_other_code_pages_stay_what_they_are(self):
        for text in CODE_PAGE:
            name = self.file(f'"$$$/a={text}"\n"$$$/b=naïve"\n'.encode("cp1252"))
            self.assertEqual(self.values(name), {"/a": text, "/b": "naïve"})
            self.assertEqual(self.compile(name), (0, ""))
        self.assertEqual(self.compile(self.file('"/a=é"\n"/b='.encode() + b'\xe9"' + PAD)), (0, ""))

    def test_other_kinds_are_refused(self):
        for content, message in KINDS:
            for options in [[], ["--encoding", "image"], ["--encoding", "utf-8"]]:
                if options and not content.isascii():
                    continue
                with self.subTest(message, content=content[:40], options=options):
                    name = self.file(content)
                    line = f"kolvane: {name}: error: {message}\n"
                    self.assertEqual(self.compile(name, *options), (2, line + "kolvane: nothing was written, for an input is not whole\n"))
                    self.assertEqual(self.run_kolvane("translate", "--dictionary", name, *options, "$$$/z=ok"), (2, b"ok\n", line))
                    self.assertEqual(self.run_kolvane("dump", name, *options), (2, b"", line))
                    self.assertEqual(self.run_kolvane("stats", name, *options)[::2], (2, line))
                    status, output, _ = self.run_kolvane("check", "-q", name, *options)
                    self.assertRegex(output.decode(), rf"\A{name}: error: {message} \[[a-z0-9-]+\]\n\Z")
        self.assertEqual(self.run_kolvane("convert", name, "-o", "-", "--to", "utf-8"), (2, b"", line))
        self.assertEqual(self.compile(self.file(utf16('"/a=b"')), "--encoding", "utf-8")[1].partition("\n")[0], "kolvane: d.txt: error: this is UTF-16, not UTF-8")
        for text in DICTIONARIES:
            self.assertIn("/a", self.values(self.file(text.encode() + PAD)), text)

    def test_the_mark_stays_out_of_the_first_key(self):
        for text, expected in FIRST_LINES:
            for content in [text.encode() + PAD, b"\xef\xbb\xbf" + text.encode() + PAD]:
                with self.subTest(text, mark=content[:1] == b"\xef"):
                    name = self.file(content)
                    self.assertEqual(self.values(name), expected)
                    keys = [f"$$${key}=" for key in expected] or ["x="]
                    answers = "".join(value + "\0" for value in expected.values()) or "\0"
                    self.assertEqual(self.run_kolvane("translate", "--nul", "--dictionary", name, *keys)[:2], (0, answers.encode()))
                    self.assertEqual(json.loads(self.run_kolvane("stats", "--format=json", name)[1])["files"][0]["keys"], len(expected))
                    self.assertEqual(self.compile(name)[0], 0)
                    self.assertEqual(self.values("out"), expected)
                    found = json.loads(self.run_kolvane("check", "--format=json", "--disable=text-outside-quotes", "--disable=unknown-escape", "--encoding=utf-8", name)[1])["findings"]
                    rules = ["dropped-line"] if text[0] == "$" and not expected else ["zero-character"] if "\0" in text else []
                    self.assertEqual([(finding["rule"], finding["line"]) for finding in found], [(rule, 1 + text.count("\n")) for rule in rules])
        for text, line in [("\n\n\0ä=b", 3), ("\r\r\n/a=ä\r\n\r\n\0x", 5)]:
            name = self.file(text.encode() + PAD)
            self.assertIn(f"the text ends at a zero character at the start of line {line};", self.compile(name)[1])
            self.assertIn(f"{name}:{line}:1: error: ", self.run_kolvane("check", "--no-snippet", name)[1].decode())

    def test_an_output_is_no_input(self):
        self.file(b'"/k=one"' + PAD, "a")
        content = self.folder.joinpath("b").write_bytes(b'"/k=two"' + PAD) and self.folder.joinpath("b").read_bytes()
        names = ["b", "./b", self.folder / "b"]
        if len(KOLVANE) == 1:
            os.link(self.folder / "b", self.folder / "hard")
            os.symlink("b", self.folder / "soft")
            names += ["hard", "soft"]
        for name in names:
            status, output, errors = self.run_kolvane("compile", "a", "b", "-o", name)
            self.assertEqual((status, output, errors), (2, b"", f"kolvane: {name}: nothing was written, for the output is the input b\n"))
            self.assertEqual(self.folder.joinpath("b").read_bytes(), content)
        self.assertEqual(self.run_kolvane("convert", "b", "-o", "b", "--to", "utf-16le"), (0, b"", ""))
        self.assertEqual(self.values("b"), {"/k": "two"})

    @unittest.skipUnless(hasattr(signal, "SIGSTOP") and len(KOLVANE) == 1, "no signals, or those of an emulator")
    def test_an_end_on_the_way_leaves_nothing_beside(self):
        self.file(b'"/k=x"\n' * 3000000, "large")
        beside = lambda: [name for name in os.listdir(self.folder) if name.endswith(".tmp")]
        for number in (signal.SIGINT, signal.SIGTERM, signal.SIGHUP):
            for _ in range(20):  # until it is met while it writes
                with subprocess.Popen([*KOLVANE, "convert", "large", "-o", "out", "--to", "utf-16le"], cwd=self.folder) as process:
                    while process.poll() is None and not beside():
                        time.sleep(0)
                    process.send_signal(signal.SIGSTOP)
                    isWriting = bool(beside())
                    process.send_signal(number)
                    process.send_signal(signal.SIGCONT)
                self.assertEqual(beside(), [])
                self.folder.joinpath("out").unlink(missing_ok=True)
                if isWriting:
                    self.assertEqual(process.returncode, -number)
                    break
            self.assertTrue(isWriting)


if __name__ == "__main__":
    unittest.main()
