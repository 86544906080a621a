"""Runs `kolvane check` as its users do: test_check.py COMMAND SAMPLES."""

import json
import os
import pathlib
import re
import sys
import unicodedata
import unittest

from command import KOLVANE, CommandTest, utf16

SAMPLES = pathlib.Path(sys.argv.pop(1)).absolute()
DROPPED = '"$/dropped=x"\n'
ESCAPE = '"$$$/escape=^q"\n'
TWICE = '"$$$/twice=100%"\n"$$$/twice=100%, {0}"\n'


def room(text):
    """The columns that a text takes between its tabs."""
    def columns(character):
        return 0 if unicodedata.combining(character) else 1 + (unicodedata.east_asian_width(character) in "WF")
    return [sum(map(columns, part)) for part in text.split("\t")]


def fingerprint(*parts):
    """FNV-1a; people keep fingerprints, so that it may not change."""
    value = 0xCBF29CE484222325
    for byte in "\0".join(parts).encode():
        value = (value ^ byte) * 0x100000001B3 % 2**64
    return f"{value:016x}"


class Check(CommandTest):
    def file(self, content, name="d.txt"):
        return super().file(content if isinstance(content, bytes) else utf16(content), name)

    def check(self, *arguments, environment=None, **options):
        """Returns the status, standard output and standard error."""
        clean = {name: value for name, value in os.environ.items() if name not in ("NO_COLOR", "CLICOLOR_FORCE")}
        status, output, errors = self.run_kolvane("check", *arguments, env={**clean, **(environment or {})}, **options)
        return status, output.decode(), errors

    def findings(self, *arguments):
        return json.loads(self.check("--format=json", *arguments)[1])["findings"]

    def rules(self, *arguments):
        return [finding["rule"] for finding in self.findings(*arguments)]

    def test_text(self):
        name = self.file(DROPPED + TWICE)
        status, output, errors = self.check("--no-snippet", name)
        self.assertEqual((status, errors), (1, "kolvane: 2 errors, 0 warnings in 1 file\n"))
        self.assertRegex(output, r"\Ad.txt:1:\d+: error: .* \[dropped-line\]\nd.txt:3:\d+: error: .* \[duplicate-key\]\nd.txt:2:\d+: note: .*\n\Z")
        self.assertEqual(self.check("-q", self.file('"$$$/a=b"\n')), (0, "", ""))

    def test_mark_stands_under_its_column(self):
        for before in ["abc", "\t", "日本語\t한", "e\u0301ﾊﾝ", "𝄞🙂", "x" * 80]:
            with self.subTest(before):
                name = self.file(f'"$$$/escape={before}^q日"\n')
                [finding] = self.findings(name)
                _, line, mark = self.check(name)[1].split("\n")[:3]
                self.assertEqual(line, f'  "$$$/escape={before}^q日"')
                self.assertTrue(mark.endswith("^") and mark.isascii())
                self.assertEqual(room(mark[:-1]), room(line[:2 + finding["column"] - 1]))

    def test_long_line_is_cut_around_the_place(self):
        name = self.file('"$$$/escape=' + "日" * 50000 + "^q" + "x" * 50000 + '"\n')
        _, line, mark = self.check(name)[1].split("\n")[:3]
        self.assertRegex(line, r"^  \.\.\.日+\^qx+\.\.\.$")
        self.assertLess(sum(room(line)), 220)
        self.assertIn(len(mark) - 1 - sum(room(line[:line.index("^")])), (0, 1))
        self.assertEqual(len(self.findings(self.file('"$$$/escape=' + "^q" * 100000 + '"\n'))), 20)

    def test_colours(self):
        name = self.file(DROPPED)
        plain = self.check(name)[1]
        for choice, environment, coloured in [("auto", {}, False), ("auto", {"CLICOLOR_FORCE": "1"}, True), ("auto", {"CLICOLOR_FORCE": "0"}, False),
                                              ("auto", {"CLICOLOR_FORCE": "1", "NO_COLOR": "1"}, False),
                                              ("auto", {"CLICOLOR_FORCE": "1", "NO_COLOR": ""}, True),
                                              ("always", {"NO_COLOR": "1"}, True), ("never", {"CLICOLOR_FORCE": "1"}, False)]:
            with self.subTest(choice, **environment):
                output = self.check(f"--color={choice}", name, environment=environment)[1]
                self.assertEqual("\x1b[" in output, coloured)
                self.assertEqual(re.sub("\x1b\\[[0-9;]*m", "", output), plain)

    @unittest.skipIf(len(KOLVANE) > 1, "the emulator has a terminal of its own")
    def test_colours_on_a_terminal(self):
        name = self.file(DROPPED)
        for kind, coloured in [("xterm", True), ("dumb", False)]:
            ours, terminal = self.open_terminal()
            self.check(name, stdout=terminal, environment={"TERM": kind})
            os.close(terminal)
            self.assertEqual(b"\x1b[" in os.read(ours, 4096), coloured)
            os.close(ours)

    def test_json(self):
        text = self.file(TWICE)
        binary = self.file((SAMPLES / "it.bin").read_bytes()[:1500], "d.bin")
        status, output, errors = self.check("--format=json", text, "none", binary)
        report = json.loads(output)
        self.assertEqual((status, report["version"], report["files"]), (2, 1, [text, binary]))
        self.assertEqual([unread["file"] for unread in report["unreadFiles"]], ["none"])
        self.assertIn("kolvane: " + report["unreadFiles"][0]["message"] + "\n", errors)
        twice, cut = report["findings"][0], report["findings"][-1]
        self.assertEqual([twice[name] for name in ("file", "line", "severity", "rule")], [text, 2, "error", "duplicate-key"])
        self.assertEqual((twice["key"].lstrip("/"), twice["notes"][0]["line"]), ("twice", 1))
        self.assertEqual((cut["rule"], cut["file"], "line" in cut), ("truncated-image", binary, False))
        self.assertGreater(cut["offset"], 20)
        self.assertEqual(twice["fingerprint"], fingerprint("duplicate-key", twice["key"], text, "0"))
        self.assertRegex(self.check(binary)[1], r"d\.bin: (entry \d+, )?byte \d+: error: .* \[truncated-image\]\n$")

    def test_sarif(self):
        text = self.file(TWICE.replace("twice", "{0}"), "ä b#{0}.txt")
        binary = self.file((SAMPLES / "it.bin").read_bytes()[:1500], "d.bin")
        for more in [], ["none"]:
            log = json.loads(self.check("--format=sarif", "./" + text, binary, *more)[1])
            [run] = log["runs"]
            [invocation] = run["invocations"]
            self.assertEqual((invocation["executionSuccessful"], len(invocation["toolExecutionNotifications"])), (not more, len(more)))
        self.assertEqual((log["version"], run["columnKind"]), ("2.1.0", "unicodeCodePoints"))
        self.assertEqual(sorted(run["newlineSequences"]), ["\n", "\r", "\r\n", "\u2028", "\u2029"])
        for result in run["results"]:
            rule = run["tool"]["driver"]["rules"][result["ruleIndex"]]
            self.assertEqual((rule["id"], rule["defaultConfiguration"]["level"]), (result["ruleId"], result["level"]))
            self.assertRegex(list(result["partialFingerprints"].values())[0], "^[0-9a-f]{16}$")
            self.assertRegex(result["message"]["text"], r"^([^{}]|{{|}})+$")
        places = [result["locations"][0]["physicalLocation"] for result in run["results"]]
        self.assertEqual((places[0]["artifactLocation"]["uri"], places[0]["region"]["startLine"]), ("%C3%A4%20b%23%7B0%7D.txt", 2))
        self.assertGreater(places[-1]["region"]["byteOffset"], 20)
        self.assertEqual(run["results"][0]["relatedLocations"][0]["physicalLocation"]["region"]["startLine"], 1)

    def test_github(self):
        name = self.file(TWICE + ESCAPE, "a,b%.txt")
        lines = self.check("--format=github", name, "none")[1].splitlines()
        for line, start in zip(lines, ["error file={},line=2,col=#,title=duplicate-key::",
                                       "warning file={},line=3,col=#,title=unknown-escape::", "error file=none::"], strict=True):
            start = re.escape("::" + start.format("a%2Cb%25.txt")).replace(r"\#", r"\d+")
            self.assertRegex(line, f"^{start}([^%]|%25|%0A)+$")
        self.assertRegex(lines[0], r"%0Aa,b%25\.txt:1:\d+: note: ")
        same = self.file('"$$$/a=same words"\n', "same")
        self.assertRegex(self.check("--format=github", "--info", "--reference", same, same)[1], "^::notice file=same,line=1,")

    def test_baseline_silences_exactly(self):
        name = self.file(DROPPED + TWICE + ESCAPE)
        self.file(self.check("--format=json", name)[1].encode(), "old.json")
        self.assertEqual(self.check("--baseline", "old.json", name), (0, "", "kolvane: 0 errors, 0 warnings in 1 file\n"))
        self.file("\n\n" + DROPPED + TWICE + '"$$$/twice=3"\n' + ESCAPE + '"$$$/new=^q"\n')
        self.assertEqual(self.rules("--baseline", "old.json", "./" + name), ["duplicate-key", "unknown-escape"])
        self.file(DROPPED, "other.txt")
        self.assertEqual(self.rules("--baseline", "old.json", "other.txt"), ["dropped-line"])
        for content in [b"", b"[", b"[" * 100000, b"[]", b"{}", b'{"version": 2, "findings": []}', b'{"version": 1, "findings": 7}',
                        b'{"version": 1, "findings": [{"fingerprint": 1}]}', b'{"version": 1, "findings": ["\xff"]}']:
            with self.subTest(content[:60]):
                status, output, errors = self.check("--baseline", self.file(content, "bad.json"), name)
                self.assertEqual((status, output), (2, ""))
                self.assertRegex(errors, r"\Akolvane: bad\.json: is [^\n]*\n\Z")
        self.assertEqual(self.check("--baseline", "none", name)[:2], (2, ""))

    def test_what_is_shown_and_what_fails(self):
        warning = self.file(ESCAPE, "warning")
        error = self.file(DROPPED, "error")
        info = self.file('"$$$/a=same words"\n', "info")
        reference = ["--reference", info]
        for arguments, status, rules in [([warning], 0, ["unknown-escape"]), (["-W", warning], 1, ["unknown-escape"]),
                                         (["--fail-on=warning", warning], 1, ["unknown-escape"]), ([error, warning], 1, ["dropped-line", "unknown-escape"]),
                                         (["--disable", "dropped-line", error, "--disable=unknown-escape", warning], 0, []),
                                         ([*reference, info], 0, []), ([*reference, "--info", "-W", info], 0, ["untranslated"]),
                                         ([*reference, "--fail-on", "info", info], 1, ["untranslated"]), (["none", error], 2, ["dropped-line"]),
                                         (["--reference=none", error], 2, ["dropped-line"])]:
            with self.subTest(arguments):
                self.assertEqual(self.check(*arguments)[0], status)
                self.assertEqual(self.rules(*arguments), rules)
        short = self.file(b'"$$$/a=b"', "short")
        self.assertEqual(self.rules("--reference", short, error), ["too-short", "dropped-line"])
        self.assertEqual(self.rules("--reference", info, short), ["too-short", "missing-key"])
        self.assertEqual(self.check("-", "--no-snippet", "-q", stdin=DROPPED.encode() + 30 * b"\n")[1][:4], "-:1:")

    def test_rules_are_listed(self):
        status, output, errors = self.check("--list-rules")
        self.assertEqual((status, errors), (0, ""))
        for line in output.splitlines():
            self.assertRegex(line, r"^[a-z0-9-]+ +(error|warning|info) +\S.*$")


if __name__ == "__main__":
    unittest.main()
