"""Bad dictionaries for each rule of `kolvane check`, and what is said of them: test_rules.py COMMAND."""

import json
import random
import unittest

from command import PAD, CommandTest, bucket, image, utf16

HI = "Hi".encode("utf-16-le")
ONE = image([(580, [(b"/a", HI)])])

# Rule, dictionary, and its findings without the file's name; then, where there is one, the reference.
CASES = [
    ("no-dictionary", b'msgid ""\nmsgstr "Language: de"', ["error: this is a PO file, not a dictionary"]),
    ("too-short", b'"$$$/a=b"\n', ["error: a file with fewer than 21 bytes, its byte-order mark not counted, is ignored"]),
    ("zero-character", b'"$$$/a=b"\0' + PAD, ["1:10: error: a zero character ends the line here"]),
    ("zero-character", b'"$$$/a=some text"\n\n\0"$$$/b=c"', ["3:1: error: a zero character at the start of the line ends the file for a translator"]),
    ("utf-16-without-mark", '"$$$/a=some text"\n'.encode("utf-16-le"), ["error: this is UTF-16 without its byte-order mark, which is read in the code page"]),
    ("utf-16-without-mark", '"$$$/a=some text"\n'.encode("utf-16-be"), ["error: this is UTF-16 without its byte-order mark, which is read in the code page"]),
    ("utf-8-as-code-page", '"$$$/a=Größe"'.encode() + PAD, ["warning: this is UTF-8, which is read in the code page when it is loaded as it is"]),
    ("malformed-input", utf16('"$$$/a=\ud800b😀"'), ["1:8: error: U+D800 is half of a character"]),
    ("malformed-input", utf16('"$$$/a=b"') + b"\n", ["error: the file ends in half of a character"]),
    ("malformed-input", '"$$$/a=ä"\n"$$$/b=ö"\n"$$$/d=Ё"\n"$$$/c=é'.encode() + b"\xff\"\n",
     ["4:9: error: a byte here is no UTF-8"]),
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
    ("line-breaks", utf16('"$$$/a=b\\nc"'),
     ["1:2: warning: the translation has 1 line break, the reference has 0", "2:2: note: the reference is here"], '"$$$/a=x"'),
    ("accelerator-clash", utf16('"$$$/m/a=&Datei"\n"$$$/m/b=&drucken"\n"$$$/n/a=&Da"\n"$$$/m/c=&Aus"\n"$$$/m/d=&An"'),
     ["2:2: warning: '/m/b' has the same accelerator as '/m/a'", "1:2: note: the other one is here"],
     "/m/a=&File\n/m/b=&Print\n/n/a=&Di\n/m/c=&Out\n/m/d=&Other"),
]

# Reference, translation, and what is told of them.
COMPARISONS = [
    # Placeholders that are on both sides, in another order or form.
    ("%s has %d", "%s hat %i"),
    ("%s has %d", "%2$d hat %1$s"),
    ("%1$s, %2$x", "%s: %-#8X"),
    ("%1$s, %2$d", "%2$d: %1$s %1$s"),
    ("%*.*f of %+e", "%2$*1$d", "placeholder-missing: placeholders %*.*f, %+e are missing from the translation"),
    ("%lld %zu %hhd", "%I64d %Iu %-4hhi"),
    ("%Lf %lf %hs %ws", "%La %g %hs %ls"),
    ("{0} of {1:N2}, {{2}}", "{{x}}: {1}{0}{1,5}"),
    ("{n, plural, one {# {x}} other {#}}", "{n, plural, few {# {z}}}"),
    # One finding for all of a kind.
    ("{0}", "nichts", "placeholder-missing: placeholder {0} is missing from the translation"),
    ("{1} %1$s {0} %2$s %2$s {1}", "{0} %1$s", "placeholder-missing: placeholders {1}, %2$s are missing from the translation"),
    ("{file_name.0-a}", "{Datei:x} %d", "placeholder-missing: placeholder {file_name.0-a} is missing from the translation",
     "placeholder-extra: placeholders {Datei}, %d are not in the reference"),
    ("%*d", "%s", "placeholder-missing: placeholder %*d is missing from the translation", "placeholder-type: argument 1 is %s instead of %*d"),
    # Types.
    ("%s: %d", "%d: %s", "placeholder-type: argument 1 is %d instead of %s, argument 2 is %s instead of %d"),
    ("%d", "%lld", "placeholder-type: argument 1 is %lld instead of %d"),
    ("%d %p", "%u %n", "placeholder-type: argument 1 is %u instead of %d, argument 2 is %n instead of %p"),
    ("%c %s %f", "%lc %S %Lf",
     "placeholder-type: argument 1 is %lc instead of %c, argument 2 is %S instead of %s, argument 3 is %Lf instead of %f"),
    ("%1$d", "%1$d %1$s %1$s", "placeholder-type: argument 1 is %1$s instead of %1$d"),
    ("%1$d (0x%1$x)", "0x%1$x"),
    # Styles.
    ("%s %s", "%1$s %s", "placeholder-style: numbered %1$s and unnumbered %s stand in one text"),
    ("%1$*2$d {0}", "%1$*d", "placeholder-missing: placeholder {0} is missing from the translation",
     "placeholder-style: numbered %1$*d and unnumbered %1$*d stand in one text"),
    ("%1$s %s", "%d"),
    ("%1$*2$d", "%1$d", "placeholder-missing: placeholder %1$*2$d is missing from the translation"),
    # Text that looks like placeholders.
    ("100% complete", "100 % fertig"),
    ("50% off", "50%-os kedvezmény"),
    ("50%% off, invalid %-encoding", "50%-os"),
    ("50%% of 5%", "%d", "placeholder-extra: placeholder %d is not in the reference"),
    ("half", "50%"),
    ("half", "%"),
    ("half", "%0$d %10000$d %99999999999999999999$d %5.k %"),
    ("half", "%%d {} { 0} {-} {.a} {a b} {a: b} {é} } {a, {"),
    ("{{{0}}} {a, {b}", "{{{0}}}", "placeholder-missing: placeholder {b} is missing from the translation"),
    # Accelerators.
    ("&File", "&Datei"),
    ("&File", "ファイル(&F)"),
    ("&File", "Datei & && &\u00A0x &amp; &#38; '&' «&» (&) &\u0001 &",
     "accelerator-missing: the translation has no accelerator, the reference has accelerator &F"),
    ("Search && replace", "&Ersetzen", "accelerator-extra: the translation has accelerator &E, the reference has no accelerator"),
    ("&File", "&D&atei &\U00010400",
     "accelerator-extra: the translation has accelerators &D, &a, &\U00010400, the reference has accelerator &F"),
    ("&? &{0}", "? {0}", "accelerator-missing: the translation has no accelerator, the reference has accelerators &?, &{"),
    ("/?a=1&b=2&c=3", "/?a=1&b=4&c=5"),
    ("&File", "&\ud800"),
    # Space and words.
    ("a\r\nb\rc\u2028d\ne", "a\nb\nc\n\rd"),
    ("a\n", "b", "line-breaks: the translation has 0 line breaks, the reference has 1"),
    ("a\n\n", "b\r\n", "line-breaks: the translation has 1 line break, the reference has 2"),
    ("Name: ", "Nom\u00A0:", "edge-space: white space at the end is missing from the translation"),
    ("Name: ", "Nom\u00A0:\u00A0"),
    ("Name: ", "名前："),
    ("Name: ", "\U00020000"),
    ("Name:", "\tName: ", "edge-space: white space at the start is not in the reference",
     "edge-space: white space at the end is not in the reference"),
    ("Name: \n", "Nom:\n"),
    ("x", "", "empty-translation: the translation is empty"),
    ("", " &x %d\n"),
    ("OK", "OK", "untranslated: the translation is the same as the reference"),
    ("%d%% {name} 1.0 ", "%d%% {name} 1.0 "),
    ("{name} Ж", "{name} Ж", "untranslated: the translation is the same as the reference"),
    ("\ud800\udc00\udc00", "\udc00\ud800"),
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

    def compare(self, pairs):
        """Returns what is found of each reference and translation, all of which are in one dictionary."""
        for side, name in enumerate("rd"):
            entries = [(f"/{number}/".encode(), pair[side].encode("utf-16-le", "surrogatepass")) for number, pair in enumerate(pairs)]
            self.file(name=name, content=image([(bucket(key), [(key, value)]) for key, value in entries]))
        output = self.run_kolvane("check", "--format=json", "--info", "--disable=malformed-input", "--disable=accelerator-clash",
                                  "--reference", "r", "d", timeout=10)[1]
        found = [[] for _ in pairs]
        for finding in json.loads(output)["findings"]:
            found[int(finding["key"].strip("/"))].append(finding)
        return found

    def test_comparisons(self):
        severities = {"untranslated": "info", **dict.fromkeys(["missing", "extra", "type", "style"], "error")}
        for (reference, translation, *expected), found in zip(COMPARISONS, self.compare(COMPARISONS), strict=True):
            with self.subTest(reference=reference, translation=translation):
                self.assertEqual([f"{finding['rule']}: {finding['message']}" for finding in found], expected)
                for finding in found:
                    rule = finding["rule"].removeprefix("placeholder-")
                    self.assertEqual(finding["severity"], severities.get(rule, "warning"))

    # In far less time than it takes to look through the rest of a text for each start of a placeholder.
    def test_copies_have_no_differences(self):
        chance = random.Random(1)
        texts = ["".join(chance.choices(["%1$s", *"%$*.1dsl{}0:, &;#a\n\ud800\udc00"], k=chance.randrange(1, 16))) for _ in range(10000)]
        texts += [part * (300000 // len(part)) for part in ["{a,", "%*", "%1$s", "{", "&a;", "%9", "{a"]]
        rules = {finding["rule"] for found in self.compare([(text, text) for text in texts]) for finding in found}
        self.assertEqual(rules, {"untranslated", "placeholder-style"})

    def test_accelerators_that_clash(self):
        pairs = [("Save &As", "&a"), ("열기(&O)...", "&o"), ("&Файл", "&ф"), ("&Öffnen", "&ö"), ("&7", "&7"), ("&A; B", "&A"),
                 ("AT&&T", "&T"), ("&a&b", "&a"), ("&{0}", "&{0}"), ("&%d", "&%d")]  # from here on they do not
        self.file(name="d", content=utf16("".join(f'"/{i}/a={one}"\n"/{i}/b={other}"\n' for i, (one, other) in enumerate(pairs))))
        self.file(name="r", content=utf16("".join(f'"/{i}/a=&x"\n"/{i}/b=&y"\n' for i in range(len(pairs)))))
        clashes = [line for line in self.check("d", "--reference", "r")[1] if "[accelerator-clash]" in line]
        self.assertEqual([line.split("'")[1] for line in clashes], [f"/{i}/b" for i in range(6)])

    def test_across_files(self):
        for name in "ab":
            self.file(name=name, content=utf16(f'"$$$/{name}=x"\n"$$$/both=x"'))
        self.assertEqual(self.check("a", "b")[1], ["b:2:2: info: key '/both' is defined in another file too [duplicate-across-files]",
                                                   "a:2:2: note: defined here"])

    def test_columns_behind_a_zero_character(self):
        for content in [b'\n"$$$/a=\xe9b"\0"$$$/c=^x"', '\ufeff\n"$$$/a=😀b"\0"$$$/c=^x"'.encode("utf-16-be")]:
            self.file(name="d", content=content)
            self.assertEqual([line.split(" ")[0] for line in self.check("d")[1]], ["d:2:11:", "d:2:19:"])

    def test_columns_of_malformed_bytes(self):
        self.file(name="d", content=b'\xef\xbb\xbf"$$$/a=na\xefve"\n' + PAD + b'"$$$/b=na\xef\xbf"\r"$$$/c=\xc3\xa9\xff"')
        self.assertEqual([line.split(" ")[0] for line in self.check("--encoding=utf-8", "d")[1]], ["d:1:10:", "d:32:10:", "d:33:9:"])

    def test_another_encoding_than_the_files(self):
        self.file(name="d", content=utf16('"$$$/a=b"'))
        self.assertEqual(self.check("--encoding=utf-8", "d"), (1, ["d: error: this is UTF-16, not UTF-8 [malformed-input]"]))

    def test_every_rule_has_its_dictionary(self):
        listed = [line.split()[0] for line in self.check("--list-rules")[1]]
        told = {text.partition(":")[0] for case in COMPARISONS for text in case[2:]}
        self.assertEqual(sorted(listed), sorted({case[0] for case in CASES} | told | {"duplicate-across-files"}))

    def test_nothing_to_find(self):
        self.file(name="d", content=utf16('"$$$/a=^[Open^] \\"it\\" #{nbsp}100%"\r\n\r\n$$$/b=x=y\n  "/c=C:\\\\'))
        self.file(name="e", content=image([(580, [(b"/a", HI)])], minor=0))
        self.file(name="g", content=b'"$$$/a=\xc3\xa9"\n"$$$/b=\xe9"\n"$$$/c=\xe8"')
        self.file(name="h", content='"$$$/a=\\b\x85"'.encode() + PAD)
        self.file(name="f", content='\ufeff"$$$/d=long enough"\0'.encode("utf-16-le"))
        self.assertEqual(self.check("d", "e", "f", "g", "h", "--disable=utf-8-as-code-page", "--disable", "duplicate-across-files"), (0, []))


if __name__ == "__main__":
    unittest.main()
