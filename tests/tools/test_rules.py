"""One bad dictionary for each rule of `kolvane check`, and what is said of it: test_rules.py COMMAND."""

import unittest

from command import PAD, CommandTest, image


def utf16(text):
    return ("\ufeff" + text + PAD.decode()).encode("utf-16-le", "surrogatepass")


HI = "Hi".encode("utf-16-le")
ONE = image([(580, [(b"/a", HI)])])

# Rule, dictionary, and its findings without the file's name; then, where there is one, the reference.
CASES = [
    ("too-short", b'"$$$/a=b"\n', ["error: a file with fewer than 21 bytes, its byte-order mark not counted, is ignored"]),
    ("zero-character", b'"$$$/a=b"\0' + PAD, ["1:10: error: a zero character ends the line here"]),
    ("zero-character", b'"$$$/a=some text"\n\n\0"$$$/b=c"', ["3:1: error: a zero character at the start of the line ends the file for a translator"]),
    ("utf-16-without-mark", '"$$$/a=some text"\n'.encode("utf-16-le"), ["error: this is UTF-16 without its byte-order mark, which is read in the code page"]),
    ("utf-16-without-mark", '"$$$/a=some text"\n'.encode("utf-16-be"), ["error: this is UTF-16 without its byte-order mark, which is read in the code page"]),
    ("utf-8-as-code-page", '"$$$/a=Größe"'.encode() + PAD, ["warning: this is UTF-8, which is read in the code page when it is loaded as it is"]),
    ("malformed-input", utf16('"$$$/a=\ud800b😀"'), ["1:8: error: U+D800 is half of a character"]),
    ("malformed-input", utf16('"$$$/a=b"') + b"\n", ["error: the file ends in half of a character"]),
    ("malformed-input", '"$$$/a=ä"\n"$$$/b=ö"\n"$$$/d=Ё"\n"$$$/c=é'.encode() + b"\xff\"\n",
     ["4:9: error: a byte here is no UTF-8, so that the whole file is read in the code page"]),
    ("malformed-input", b'"$$$/a=b \x81"' + PAD, ["1:10: error: a byte here is no character of the code page"]),
    ("malformed-input", image([(580, [(b"/a", b"a\0\0\xd8")])]), ["entry 1, byte 46: error: U+D800 in the value is half of a character"]),
    ("malformed-input", image([(580, [(b"/a", b"a\xff")])], 1, 0), ["entry 1, byte 49: error: a byte of the value is no UTF-8"]),
    ("dropped-line", utf16('"$$/a=b"'), ["1:2: error: the line is dropped: '$$$' is due, or no '$'"]),
    ("missing-equals", utf16('"$$$/a=b"\r\n; a remark'), ["2:1: warning: without '=' all of it is a key, with an empty value"]),
    ("text-outside-quotes", utf16('x "$$$/a=b"\n"$$$/b=say "hi""'),
     ["1:1: warning: text before the opening quote is ignored",
      "2:13: warning: text after the closing quote is ignored; a quote in a value is written \\\""]),
    ("missing-closing-quote", utf16('"$$$/a=b\n"$$$/b=C:\\\\'), ["1:1: warning: the quote is not closed on this line"]),
    ("swallowed-closing-quote", utf16('"$$$/a=C:\\\\"'), ["1:12: error: the backslash before it makes the last quote a part of the value"]),
    ("empty-key", utf16('"$$$=b"'), ["1:5: warning: the key is empty"]),
    ("empty-key", image([(0, [(b"", HI)])]), ["entry 1, byte 42: warning: the key is empty"]),
    ("unmatchable-key", utf16('"$$$/größe=b"'), ["1:8: error: no lookup in UTF-8 matches a key of a text dictionary with U+00F6"]),
    ("unmatchable-key", utf16('"$$$/\u0141=b"'), ["1:6: error: no lookup in UTF-8 matches a key of a text dictionary with U+0141, but those of '/A' match this one"]),
    ("unmatchable-key", image([(544, [(b"/=", HI)])]), ["entry 1, byte 42: error: no lookup matches '/=': it holds '='"]),
    ("unmatchable-key", image([(483, [(b"/\0", HI)])]), ["entry 1, byte 42: error: no lookup matches '/\\x00': it holds a zero character"]),
    ("unmatchable-key", image([(738, [(b"/\xff", HI)])]), ["entry 1, byte 42: error: no lookup in UTF-8 matches '/ÿ', which is none"]),
    ("mark-in-key", utf16("$$$/a=b"), ["1:1: error: the byte-order mark becomes a part of the key; quotes keep it out"]),
    ("misplaced-dollars", utf16('\n $$$/a=b\n"$$$$/b=c"\n\'$$$/c=d\'\n"$$$/d/$$$=5 $$$"'),
     ["2:1: error: the key is ' $$$/a': '$$$' stands at the start, and once",
      "3:5: error: the key is '$/b': '$$$' stands at the start, and once",
      "4:1: error: the key is ''$$$/c': '$$$' stands at the start, and once"]),
    ("duplicate-key", utf16('"$$$/a=b"\n/b=c\n/a=d\n/a=e'),
     ["3:1: error: key '/a' is defined again; the last definition wins", "1:2: note: first defined here",
      "4:1: error: key '/a' is defined again; the last definition wins", "1:2: note: first defined here"]),
    ("unknown-escape", utf16('"$$$/a=^x \\z ^^ \\\\ ^"'),
     ["1:8: warning: '^x' is no escape and stays as it is", "1:11: warning: '\\z' is no escape and stays as it is",
      "1:20: warning: '^' at the end escapes nothing"]),
    ("unknown-named-character", utf16('"$$$/a=^n#{Euro} #{euro}"'), ["1:10: warning: '#{Euro}' names no character and stays as it is"]),
    ("unknown-named-character", utf16('"$$$/a=b#{user.name} #' + "{" + 33 * "x" + '}"'),
     ["1:9: warning: '#{user.name}' names no character and stays as it is"]),
    ("unfinished-named-character", utf16('"$$$/a=#{amp and #{amp"'),
     ["1:8: warning: '#{amp' lacks its closing brace and stays as it is",
      "1:18: warning: '#{amp' lacks its closing brace and stays as it is"]),
    ("hidden-named-character", utf16('"$$$/a=^#{amp} #"'), ["1:8: warning: '^#' is an escape, which leaves '{amp}' as it is"]),
    ("truncated-image", ONE[:-1], ["byte 44: error: what begins here is not all there"]),
    ("damaged-image", ONE[:24] + bytes(4) + ONE[28:], ["byte 24: error: the count of groups is 0"]),
    ("damaged-image", image([(1021, [(b"/a", HI)])]), ["byte 40: error: there is no such bucket; the group's entries are dropped"]),
    ("damaged-image", image([(580, [(b"/a", HI)])], minor=0).replace(b"\x34\0\0\0", b"\x33\0\0\0", 1),
     ["byte 34: error: a group does not end at its offset"]),
    ("unsupported-version", ONE[:22] + b"\7" + ONE[23:], ["byte 21: error: this version of the binary format is neither 1.0 nor 1.5"]),
    ("misfiled-entry", image([(7, [(b"/a", HI)])]), ["entry 1, byte 42: error: no lookup finds '/a': it lies in bucket 7, not in 580"]),
    ("shadowed-entry", image([(580, [(b"/a", HI)]), (580, [(b"/a", HI), (b"/a", HI)])]),
     ["entry 1, byte 64: warning: '/a' hides behind another entry of its key", "entry 2, byte 70: note: this one is found",
      "entry 3, byte 76: warning: '/a' hides behind another entry of its key", "entry 2, byte 70: note: this one is found"]),
    ("missing-key", utf16('"$$$/a=b"'), ["warning: key '/b' is missing", "3:1: note: the reference is here"], "/a=x\n/b=y"),
    ("extra-key", utf16('"$$$/a=b"\n"$$$/b=c"'), ["2:2: warning: the reference has no key '/b'"], "/a=x"),
    ("accelerator-clash", utf16('"$$$/m/a=&Datei"\n"$$$/m/b=&drucken"\n"$$$/n/a=&Da"\n"$$$/m/c=&Aus"\n"$$$/m/d=&An"'),
     ["2:2: warning: '/m/b' has the same accelerator as '/m/a'", "1:2: note: the other one is here"],
     "/m/a=&File\n/m/b=&Print\n/n/a=&Di\n/m/c=&Out\n/m/d=&Other"),
]

# What a translation has beside its reference; places and notes are the same for all.
TRANSLATIONS = [
    ("empty-translation", "Open", "", "warning"),
    ("placeholder-missing", "{0} of {1}", "von {0}", "error"),
    ("placeholder-extra", "Done", "%d fertig", "error"),
    ("placeholder-type", "%d files", "%s Dateien", "error"),
    ("placeholder-style", "%1$d of %2$d", "%1$d von %d", "error"),
    ("accelerator-missing", "&File", "Datei", "warning"),
    ("accelerator-extra", "File", "&Datei", "warning"),
    ("line-breaks", "One\\nTwo", "Eins zwei", "warning"),
    ("edge-space", "Name: ", "Name:", "warning"),
    ("untranslated", "Cancel", "Cancel", "info"),
]


class Rules(CommandTest):
    def check(self, *options):
        status, output, errors = self.run_kolvane("check", "--no-snippet", "-q", "--info", *options)
        self.assertEqual(errors, "")
        return status, output.decode().splitlines()

    def test_each_rule(self):
        for rule, content, expected, *reference in CASES:
            with self.subTest(rule, expected=expected):
                self.file(name="d", content=content)
                self.file(name="r", content=utf16("\n" + reference[0]) if reference else b"")
                status, lines = self.check("d", *(["--reference", "r"] if reference else []))
                named = [line for line in lines if f" [{rule}]" in line or ": note: " in line]
                self.assertEqual([line.replace(f" [{rule}]", "").partition(":")[2].strip() for line in named], expected)
                self.assertEqual(lines, named)
                self.assertEqual(status, int("error: " in expected[0]))

    def test_each_rule_beside_a_reference(self):
        for rule, reference, translation, severity in TRANSLATIONS:
            with self.subTest(rule):
                self.file(name="d", content=utf16(f'"$$$/a={translation}"'))
                self.file(name="r", content=utf16(f'"$$$/a={reference}"'))
                status, lines = self.check("d", "--reference", "r")
                self.assertRegex(lines[0], rf"^d:1:2: {severity}: .* \[{rule}\]$")
                self.assertEqual(lines[1:], ["r:1:2: note: the reference is here"])
                self.assertEqual(status, int(severity == "error"))

    def test_across_files(self):
        for name in "ab":
            self.file(name=name, content=utf16(f'"$$$/{name}=x"\n"$$$/both=x"'))
        self.assertEqual(self.check("a", "b")[1], ["b:2:2: info: key '/both' is defined in another file too [duplicate-across-files]",
                                                   "a:2:2: note: defined here"])

    def test_columns_behind_a_zero_character(self):
        for content in [b'\n"$$$/a=\xe9b"\0"$$$/c=^x"', '\ufeff\n"$$$/a=😀b"\0"$$$/c=^x"'.encode("utf-16-be")]:
            self.file(name="d", content=content)
            self.assertEqual([line.split(" ")[0] for line in self.check("d")[1]], ["d:2:11:", "d:2:19:"])

    def test_another_encoding_than_the_files(self):
        self.file(name="d", content=utf16('"$$$/a=b"'))
        self.assertEqual(self.check("--encoding=utf-8", "d"), (1, ["d: error: this is UTF-16, not UTF-8 [malformed-input]"]))

    def test_every_rule_has_its_dictionary(self):
        listed = [line.split()[0] for line in self.check("--list-rules")[1]]
        self.assertEqual(sorted(listed), sorted({case[0] for case in CASES + TRANSLATIONS} | {"duplicate-across-files"}))

    def test_nothing_to_find(self):
        self.file(name="d", content=utf16('"$$$/a=^[Open^] \\"it\\" #{nbsp}100%"\r\n\r\n$$$/b=x=y\n  "/c=C:\\\\'))
        self.file(name="e", content=image([(580, [(b"/a", HI)])], minor=0))
        self.file(name="g", content=b'"$$$/a=\xc3\xa9"\n"$$$/b=\xe9"\n"$$$/c=\xe8"')
        self.file(name="h", content='"$$$/a=\\b\x85"'.encode() + PAD)
        self.file(name="f", content='\ufeff"$$$/d=long enough"\0'.encode("utf-16-le"))
        self.assertEqual(self.check("d", "e", "f", "g", "h", "--disable=utf-8-as-code-page", "--disable", "duplicate-across-files"), (0, []))


if __name__ == "__main__":
    unittest.main()
