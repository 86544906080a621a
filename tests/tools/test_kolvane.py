"""Runs the kolvane command as its users do: test_kolvane.py COMMAND SAMPLES STUBBORN-PLUG-IN KERNEL."""

import itertools
import os
import pathlib
import signal
import subprocess
import sys
import unittest

from command import KOLVANE, PAD, CommandTest, bucket, image

SAMPLES = pathlib.Path(sys.argv.pop(1))
STUBBORN = pathlib.Path(sys.argv.pop(1))
KERNEL = sys.argv.pop(1)
CANCEL = "$$$/Dialog/Cancel=Cancel"


class Translate(CommandTest):
    def translate(self, *arguments, **options):
        status, output, errors = self.run_kolvane("translate", *arguments, **options)
        return status, output.decode(), errors

    def test_dictionaries_before_defaults_before_default_text(self):
        first = self.file(b'"$$$/a=first"\n"$$$/b=first"\n', "1")
        second = self.file(b'"$$$/b=second"\n' + PAD, "2")
        fallback = self.file(b'"$$$/b=fallback"\n"$$$/c=fallback"\n', "3")
        keys = [f"$$$/{name}=text" for name in "abcd"]
        self.assertEqual(self.translate("--dictionary", first, "--default-dictionary", fallback, "--dictionary", second, *keys),
                         (0, "first\nsecond\nfallback\ntext\n", ""))

    def test_keys(self):
        long = "x" * 300000
        for arguments, stdin, expected in [
                (["[a,b]=x", "[]", "{}", "", "/a=ä€𝄞", "-", "a=two\nlines"], b"b=2\n", "x\n\n\n\nä€𝄞\n\ntwo\nlines\n"),
                (["--nul", "a=1", "--", "--b=2", "--"], b"", "1\0" + "2\0" + "\0"),
                ([], b"", ""), ([], b"a=1\n\nb=2", "1\n\n2\n"), ([], b"a=1\r\nb=2\n", "1\n2\n"), ([], b"a=1\0b=2\n", "1\n2\n"),
                (["--nul"], b"a=1\r\0", "1\r\0"), ([], f"a={long}".encode(), long + "\n"), (["--nul"], b"a=1\n\0\0b=2", "1\n\0\0" + "2\0"),
                (["--dictionary", "-", "$$$/a=b"], b'"$$$/a=from standard input"\n', "from standard input\n")]:
            self.assertEqual(self.translate(*arguments, stdin=stdin), (0, expected, ""))

    def test_answers_come_while_the_input_stays_open(self):
        with subprocess.Popen([*KOLVANE, "translate"], stdin=subprocess.PIPE, stdout=subprocess.PIPE) as process:
            for number in range(3):
                process.stdin.write(b"a=%d\na" % number)  # and the start of the next key
                process.stdin.flush()
                self.assertEqual(process.stdout.readline(), b"%d\n" % number)

    def test_input_without_keys(self):
        nothing, folder = open(os.devnull, "rb"), os.open(self.folder, os.O_RDONLY)
        self.addCleanup(nothing.close)
        self.addCleanup(os.close, folder)
        self.assertEqual(self.translate(stdin=nothing), (0, "", ""))
        self.assertEqual(self.translate(stdin=folder), (2, "", "kolvane: cannot read standard input\n"))

    def test_a_terminal_without_keys(self):
        ours, terminal = self.open_terminal()
        status, _, errors = self.translate(stdin=terminal)
        os.close(terminal)
        os.close(ours)
        self.assertEqual(status, 2)
        self.assertIn("try 'kolvane translate --help'", errors)

    def test_encodings(self):
        text = '"$$$/a={}"\n"$$$/b=x"\n'
        utf8 = text.format("Żółć").encode()
        legacy = text.format("Größe").encode("cp1252")
        binary = image([(bucket(b"/a"), [(b"/a", "ä".encode())])], 1)
        for content, how, expected in [(utf8, "auto", "Żółć"), (utf8, "image", "Å»Ã³Å‚Ä‡"), (utf8, "utf-8", "Żółć"),
                                       (b"\xef\xbb\xbf" + utf8, "auto", "Żółć"), (b"\xef\xbb\xbf" + utf8, "utf-8", "Żółć"),
                                       (legacy, "auto", "Größe"), (binary, "auto", "ä")]:
            with self.subTest(content, how=how):
                self.assertEqual(self.translate("--encoding", how, "--dictionary", self.file(content), "$$$/a=none"), (0, expected + "\n", ""))

    def test_tells_what_a_translator_forgives(self):
        binary = (SAMPLES / "it.bin").read_bytes()
        for content, message in [
                (b"", "error: the file is empty; nothing was loaded"),
                (b'"$$$/a=b"', "error: the file is too short for a dictionary; nothing was loaded"),
                (b"\n" * 30, "warning: the file adds nothing"),
                (b'"$$$/a=some text"\r\n\r\n\0rest', "error: the text ends at a zero character at the start of line 3; 1 entry was loaded"),
                (b'"$$$/a=some text"\n"$/b=c"\n', "warning: 1 line was dropped: it begins with one or two dollar signs where none or three are due"),
                ('\ufeff"$$$/a=1"\r\n\u2028"$$$/b=2"\n\0x'.encode("utf-16-be"),
                 "error: the text ends at a zero character at the start of line 4; 2 entries were loaded"),
                ('\ufeff"$$$/a=some text"\n'.encode("utf-16-le") + b"\n",
                 "error: the text is cut short: byte 38 is half a character; 1 entry was loaded"),
                (binary[:1500], "error: the image is cut short: byte "),
                (binary[:21] + b"\2" + binary[22:], "error: byte 21: this version of the binary format is not supported; nothing was loaded"),
        ]:
            with self.subTest(message):
                path = self.file(content)
                status, output, errors = self.translate("--dictionary", path, "$$$/x=still works")
                self.assertEqual((status, output), (2 if message.startswith("error") else 0, "still works\n"))
                self.assertTrue(errors.startswith(f"kolvane: {path}: {message}"), errors)
                self.assertEqual(errors.count("\n"), 1)

    def test_names_beyond_ascii(self):
        dictionary = self.file('\ufeff"$$$/size=日本𝄞"\n// fills the image up\n'.encode("utf-16-le"), "Wörter-日本.txt")
        self.assertEqual(self.translate("--dictionary", dictionary, "$$$/size=x", "$$$/none=größe"), (0, "日本𝄞\ngröße\n", ""))
        self.assertIn("kein Wörterbuch-日本: No such file", self.translate("--dictionary", "kein Wörterbuch-日本", "x")[2])

    def test_plug_ins(self):
        self.folder.joinpath(self.file(STUBBORN.read_bytes(), "copy.so")).chmod(0o755)
        self.assertEqual(self.translate("--plugin", "copy.so", CANCEL, CANCEL), (0, "no\nno\n", ""))
        broken = self.file(b"short", "a-long-name-" * 9)
        for step, message, answer in [("15 initialize", "the plug-in cannot be initialised", ""),
                                      ("77 create", "cannot create a translator", ""),
                                      ("15 make-default", "cannot make a translator the default", ""),
                                      ("15 set-translations", f"{broken}: cannot be loaded", ""),
                                      ("77 translate-string", r"cannot translate 'k\x09=v'", ""),
                                      ("15 terminate", "the plug-in cannot be terminated", "no\n"),
                                      ("6 unload", "the plug-in cannot be unloaded", "no\n")]:
            with self.subTest(step):
                dictionaries = ["--dictionary", broken] * 2 if "set" in step else []
                done = self.translate("--plugin", STUBBORN, *dictionaries, "k\t=v", env={**os.environ, "STUBBORN": step})
                result = step.split()[0]
                name = {"15": " (kResultInvariantViolation)", "6": " (kVRKInUse)"}.get(result, "")
                line = f"kolvane: {message}: result {result}{name}\n"
                self.assertEqual(done, (2, answer, line * max(1, len(dictionaries) // 2)))
        for plug_in, shown, reason in [(SAMPLES / "de.txt", SAMPLES / "de.txt", ".+"), ("none.so", "none.so", ".+"),
                                       ("a\nb.so", r"a\\x0Ab.so", "[^\n]+"), ("", "", r"result 2 \(kVRKInvalidArgument\)"),
                                       (KERNEL, KERNEL, "it has no entry point VRKKolvanesInitialize")]:
            status, output, errors = self.translate("--plugin", plug_in, "x=y")
            self.assertEqual((status, output), (2, ""))
            self.assertRegex(errors, rf"\Akolvane: cannot load the plug-in {shown}: {reason}\n\Z")

    def test_trace(self):
        plain = self.translate("--dictionary", SAMPLES / "de.txt", CANCEL)
        status, output, trace = self.translate("--trace", "--dictionary", SAMPLES / "de.txt", CANCEL)
        self.assertEqual((status, output), plain[:2])
        self.assertEqual(trace, self.translate("--trace", "--dictionary", SAMPLES / "de.txt", CANCEL)[2])
        for line in [r'VRKObjectFactoryRegister\("class:[\w.-]+string-translator", 0, \*, \*\)',
                     r'VRKObjectCreate\("class:[\w.-]+string-translator", null\) {',
                     r'  VRKObjectCreate\(null, dictionary 0x\w+\) -> object 0x\w+',
                     r'VRKDataCreate\("type:orvane.vrk.utf16", \*, 6518, 0\) -> data 0x\w+ '
                     r'\(type:orvane.vrk.utf16, 6518 bytes ".{20,70}\.\.\."\)',
                     r'VRKObjectDeliverMessage\(object 0x\w+, "message:[\w.-]+translate-string", dictionary 0x\w+, 1\) {',
                     r'  VRKDictionaryGetEntry\(dictionary 0x\w+, "parameter:[\w.-]+translation-key"\) -> '
                     r'data 0x\w+ \(type:orvane.vrk.utf8, 24 bytes "\$\$\$/Dialog/Cancel=Cancel"\)',
                     r'  VRKDataGetData\(data 0x\w+\) -> \*, 24',
                     r'  VRKDataCreate\("type:orvane.vrk.utf16le", \*, 20, 0\) -> data 0x\w+ '
                     r'\(type:orvane.vrk.utf16le, 20 bytes "Abbrechen\\x00"\)',
                     r'  VRKDataRelease\(data 0x\w+\)', r'}', r'} -> object 0x\w+']:
            self.assertRegex(trace, rf"(?m)^{line}$")
        self.assertNotRegex(trace, r"Re(tain|lease)\(null")
        long = "x" * 57
        for key, shown in [(f"k={long}é", rf'"k={long}\.\.\."'), (f"é={long}", f'"é={long}"')]:
            self.assertRegex(self.translate("--trace", key)[2], rf"VRKDataCreate.* {shown}")
        failing = self.translate("--trace", "--plugin", STUBBORN, CANCEL,
                            env={**os.environ, "STUBBORN": "15 translate-string"})[2]
        self.assertIn("\n} -> result 15 (kResultInvariantViolation)\n", failing)
        self.assertNotIn("VRKObjectFactoryUnregister", failing)


class EveryCommand(CommandTest):
    # What each is called with before a file, in a way that prints something.
    CALLS = [["translate", "--dictionary"], ["check", "-W", "--fail-on=info"], ["compile", "-o", "-"], ["dump"],
             ["convert", "-o", "-", "--to", "utf-8"], ["stats"]]

    def test_files_that_cannot_be_read(self):
        self.folder.joinpath("folder").mkdir()
        for call in self.CALLS:
            for name, reason in [("folder", "folder: (Is a directory|Permission denied)"), ("no\nsuch", r"no\\x0Asuch: (No such file.*|Invalid argument)")]:
                status, _, errors = self.run_kolvane(*call, name)
                self.assertEqual(status, 2, call)
                self.assertRegex(errors, f"^kolvane: {reason}\n")

    @unittest.skipUnless(os.path.exists("/dev/full"), "no full device")
    def test_what_cannot_be_written(self):
        self.file(b'"/a=b"\n"/a=\xe9^x"' + PAD, "in")
        self.file(b'"/a=' + b"x" * 100000, "large")
        calls = [[*call, "in"] for call in [*self.CALLS, *(["check", f"--format={form}"] for form in ["json", "sarif", "github"])]]
        with open("/dev/full", "wb") as full:
            for call in [*calls, ["--help"], ["--version"], ["translate", "--help"]]:
                status, _, errors = self.run_kolvane(*call, stdin=b"a=b\n", stdout=full)
                self.assertEqual(status, 2, call)
                self.assertIn("kolvane: cannot write to standard output: No space left on device\n", errors)
            for call, expected in [(["bogus"], (2, b"", "")), (["translate", "--dictionary", "/dev/null", "a=b"], (2, b"b\n", ""))]:
                self.assertEqual(self.run_kolvane(*call, stderr=full), expected)
        for source, name in [("in", "/dev/full"), ("large", "/dev/full"), ("in", "no-folder/out")]:
            status, output, errors = self.run_kolvane("compile", source, "-o", name)
            self.assertEqual((status, output), (2, b""))
            self.assertRegex(errors, f"^kolvane: {name}: .+\n$")

    def test_closed_pipe_is_quiet(self):
        self.file(b'"/a=\xe9^x"\n' * 20000)
        emulated = len(KOLVANE) > 1  # it does not tell of a closed pipe while that is not full
        for call, isIgnored in itertools.product(self.CALLS[:2] if emulated else self.CALLS, (False, True)):
            reading, writing = os.pipe()
            os.close(reading)
            with os.fdopen(writing, "wb") as closed:
                done = self.run_kolvane(*call, "d.txt", stdin=b"a=b\n" * 100000, stdout=closed, restore_signals=not isIgnored)
            self.assertEqual(done, (2 if isIgnored or emulated else -signal.SIGPIPE, b"", ""), call)

    def test_help(self):
        for arguments in [["--help"], ["help"], ["translate", "--help"], ["help", "translate"], ["--version"], ["check", "--help"]]:
            status, _, errors = self.run_kolvane(*arguments)
            self.assertEqual((status, errors), (0, ""), arguments)
        self.assertEqual(self.run_kolvane("help", "translate"), self.run_kolvane("translate", "--help"))
        self.assertIn(b"Examples:\n  kolvane check ", self.run_kolvane("check", "--help")[1])
        self.assertRegex(self.run_kolvane("--version")[1], rb"^kolvane \d+\.\d+\.\d+\n.*1\.0 and 1\.5")

    def test_wrong_use(self):
        self.file(b'"/a=b"' + PAD, "r")
        for command, wrong in {
                "": [[], ["bogus"], ["help", "bogus"]],
                "translate": [["--bogus", "x"], ["x", "-n"], ["--encoding", "x", "y"], ["--encoding", "a\nb\u009b", "y"], ["--dictionary"],
                              ["--dictionary=", "x"], ["--dictionary", "-"], ["--dictionary", "-", "--dictionary", "-", "x"]],
                "check: no file is named": [[]],
                "check: unknown rule 'dropped-lime'": [["--disable=dropped-lime", "x"]],
                "check: standard input": [["-", "-"], ["--baseline=-", "--reference=-", "x"]],
                "check: --format": [["--format=xml", "x"]],
                "check: --color": [["--color=sometimes", "x"]],
                "check: --fail-on": [["--fail-on=fatal", "x"]],
                "stats": [["--fail-under", "5", "r"], ["--reference", "r", "--fail-under", "100.1", "r", "r"], [], ["--reference", "r", "r"],
                          ["--reference", "-", "-"], ["--format", "xml", "r"], ["--reference", "r", "--fail-under", "nan", "r"],
                          ["--reference", "", "r", "-", "-"]]}.items():
            name = command.partition(":")[0]
            for arguments in wrong:
                status, output, errors = self.run_kolvane(*filter(None, [name]), *arguments)
                self.assertEqual((status, output), (2, b""), arguments)
                hint = f"kolvane {name}".strip()
                self.assertRegex(errors, rf"\Akolvane: {command}[^\x00-\x1f\x7f-\x9f]*\ntry '{hint} --help'\n\Z")


if __name__ == "__main__":
    unittest.main()
