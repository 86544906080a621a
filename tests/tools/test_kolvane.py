"""Runs the kolvane command as its users do: test_kolvane.py COMMAND SAMPLES STUBBORN-PLUG-IN KERNEL."""

import contextlib
import os
import pathlib
import signal
import subprocess
import sys
import tempfile
import unittest

KOLVANE = [*os.environ.get("EMULATOR", "").split(), sys.argv.pop(1)]
SAMPLES = pathlib.Path(sys.argv.pop(1))
STUBBORN = pathlib.Path(sys.argv.pop(1))
KERNEL = sys.argv.pop(1)
CANCEL = "$$$/Dialog/Cancel=Cancel"


def run(*arguments, stdin=b"", **options):
    """Returns the status, standard output and standard error."""
    done = subprocess.run([*KOLVANE, *map(str, arguments)], input=stdin, stderr=subprocess.PIPE,
                          stdout=options.pop("stdout", subprocess.PIPE), timeout=60, **options)
    return done.returncode, (done.stdout or b"").decode(), done.stderr.decode()


def translate(*arguments, **options):
    return run("translate", *arguments, **options)


class Translate(unittest.TestCase):
    def setUp(self):
        self.folder = tempfile.TemporaryDirectory()
        self.addCleanup(self.folder.cleanup)

    def file(self, content, name="d.txt"):
        path = pathlib.Path(self.folder.name, name)
        path.write_bytes(content)
        return path

    def test_samples_in_every_form(self):
        for name, cancel in {"de.txt": "Abbrechen", "fr.txt": "Annuler", "ja.txt": "キャンセル", "es.txt": "Cancelar",
                             "pl.txt": "Anuluj", "it.txt": "Annulla", "it.bin": "Annulla"}.items():
            with self.subTest(name):
                self.assertEqual(translate("--dictionary", SAMPLES / name, CANCEL), (0, cancel + "\n", ""))

    def test_dictionaries_before_defaults_before_default_text(self):
        first = self.file(b'"$$$/a=first"\n"$$$/b=first"\n', "1")
        second = self.file(b'"$$$/b=second"\n\n\n\n\n\n\n\n\n', "2")
        fallback = self.file(b'"$$$/b=fallback"\n"$$$/c=fallback"\n', "3")
        keys = [f"$$$/{name}=text" for name in "abcd"]
        self.assertEqual(translate("--dictionary", first, "--default-dictionary", fallback, "--dictionary", second, *keys),
                         (0, "first\nsecond\nfallback\ntext\n", ""))

    def test_keys_are_taken_as_they_are(self):
        keys = ["[a,b]=x", "[]", "{}", "", "/a=ä€𝄞", "-", "a=two\nlines"]
        self.assertEqual(translate(*keys)[1], "x\n\n\n\nä€𝄞\n\ntwo\nlines\n")
        self.assertEqual(translate("--nul", "a=1", "--", "--b=2", "--")[1], "1\0" + "2\0" + "\0")

    def test_keys_on_standard_input(self):
        long = b"x" * 300000
        for options, stdin, expected in [([], b"", ""), ([], b"a=1\n\nb=2", "1\n\n2\n"), ([], b"a=1\r\nb=2\n", "1\n2\n"),
                                         ([], b"a=1\0b=2\n", "1\n2\n"), (["--nul"], b"a=1\r\0", "1\r\0"),
                                         ([], b"a=" + long, long.decode() + "\n"),
                                         (["--nul"], b"a=1\n\0\0b=2", "1\n\0\0" + "2\0")]:
            self.assertEqual(translate(*options, stdin=stdin), (0, expected, ""))
        self.assertEqual(translate("a=1", stdin=b"b=2\n")[1], "1\n")

    def test_answers_come_while_the_input_stays_open(self):
        with subprocess.Popen([*KOLVANE, "translate"], stdin=subprocess.PIPE, stdout=subprocess.PIPE) as process:
            for number in range(3):
                process.stdin.write(b"a=%d\na" % number)  # and the start of the next key
                process.stdin.flush()
                self.assertEqual(process.stdout.readline(), b"%d\n" % number)

    def test_encodings(self):
        utf8 = self.file('"$$$/a=Żółć"\n"$$$/b=x"\n'.encode())
        marked = self.file('\ufeff"$$$/a=Żółć"\n'.encode(), "marked")
        legacy = self.file('"$$$/a=Größe"\n"$$$/b=x"\n'.encode("cp1252"), "legacy")
        binary = self.file(bytes.fromhex("4b6f6c76616e652042696e61727920466f726d6174010501"
                                         "01000000020000000200000002000000440200002f61c3a4")
                           .replace(b"\x44\x02\0\0", b"\x44\x02"), "binary")
        for file, how, expected in [(utf8, "auto", "Żółć"), (utf8, "image", "Å»Ã³Å‚Ä‡"), (utf8, "utf-8", "Żółć"),
                                    (marked, "auto", "Żółć"), (marked, "utf-8", "Żółć"), (legacy, "auto", "Größe"),
                                    (legacy, "utf-8", "Gr\ufffd\ufffde"), (binary, "auto", "ä")]:
            with self.subTest(file=file, how=how):
                self.assertEqual(translate("--encoding", how, "--dictionary", file, "$$$/a=none"),
                                 (0, expected + "\n", ""))

    def test_warns_of_what_a_translator_forgives(self):
        binary = (SAMPLES / "it.bin").read_bytes()
        for content, warning in [
                (b"", "the file is empty; nothing was loaded"),
                (b'"$$$/a=b"', "the file is too short for a dictionary; nothing was loaded"),
                (b"\n" * 30, "the file adds nothing"),
                (b'"$$$/a=some text"\r\n\r\n\0rest', "the text ends at a zero character at the start of line 3; 1 entry was loaded"),
                (b'"$$$/a=some text"\n"$/b=c"\n', "1 line was dropped: it begins with one or two dollar signs where none or three are due"),
                ('\ufeff"$$$/a=1"\r\n\u2028"$$$/b=2"\n\0x'.encode("utf-16-be"),
                 "the text ends at a zero character at the start of line 4; 2 entries were loaded"),
                ('\ufeff"$$$/a=some text"\n'.encode("utf-16-le") + b"\n",
                 "the text is cut short: byte 38 is half a character; 1 entry was loaded"),
                (binary[:1500], "the image is cut short: byte "),
                (binary[:21] + b"\2" + binary[22:], "byte 21: this version of the binary format is not supported; nothing was loaded"),
        ]:
            with self.subTest(warning):
                path = self.file(content)
                status, output, errors = translate("--dictionary", path, "$$$/x=still works")
                self.assertEqual((status, output), (0, "still works\n"))
                self.assertTrue(errors.startswith(f"kolvane: {path}: warning: {warning}"), errors)
                self.assertEqual(errors.count("\n"), 1)

    def test_unreadable_files(self):
        missing = pathlib.Path(self.folder.name, "no\nsuch")
        status, output, errors = translate("--dictionary", missing, "--default-dictionary", self.folder.name, "a=b")
        self.assertEqual((status, output), (2, ""))
        self.assertRegex(errors, r"no\\x0Asuch: (No such file or directory|Invalid argument)\n")
        self.assertRegex(errors, rf"{self.folder.name}: (Is a directory|Permission denied)\n")
        self.assertEqual(translate("--dictionary", "-", "$$$/a=b", stdin=b'"$$$/a=from standard input"\n')[1],
                         "from standard input\n")

    def test_names_beyond_ascii(self):
        dictionary = self.file('\ufeff"$$$/size=日本𝄞"\n// fills the image up\n'.encode("utf-16-le"), "Wörter-日本.txt")
        self.assertEqual(translate("--dictionary", dictionary, "$$$/size=x", "$$$/none=größe"),
                         (0, "日本𝄞\ngröße\n", ""))
        self.assertIn("kein Wörterbuch-日本: No such file", translate("--dictionary", "kein Wörterbuch-日本", "x")[2])

    def test_unreadable_keys(self):
        folder = os.open(self.folder.name, os.O_RDONLY)
        self.addCleanup(os.close, folder)
        done = subprocess.run([*KOLVANE, "translate"], stdin=folder, capture_output=True, timeout=60)
        self.assertEqual((done.returncode, done.stderr), (2, b"kolvane: cannot read standard input\n"))

    @unittest.skipUnless(os.path.exists("/dev/full"), "no full device")
    def test_messages_that_cannot_be_written(self):
        with open("/dev/full", "wb") as full:
            for arguments, status, output in [(["bogus"], 2, b""), (["translate", "--dictionary", "/dev/null", "a=b"], 0, b"b\n")]:
                done = subprocess.run([*KOLVANE, *arguments], stdout=subprocess.PIPE, stderr=full, timeout=60)
                self.assertEqual((done.returncode, done.stdout), (status, output))

    @unittest.skipUnless(os.path.exists("/dev/full"), "no full device")
    def test_output_that_cannot_be_written(self):
        with open("/dev/full", "wb") as full:
            for arguments in [["translate", "a=b"], ["--help"], ["--version"], ["translate", "--help"]]:
                status, _, errors = run(*arguments, stdout=full)
                self.assertEqual(status, 2)
                self.assertIn("cannot write to standard output: No space left on device", errors)

    def test_closed_pipe_is_quiet(self):
        for ignored in (False, True):
            disposition = signal.SIG_IGN if ignored else signal.SIG_DFL
            with subprocess.Popen([*KOLVANE, "translate"], stdin=subprocess.PIPE, stdout=subprocess.PIPE,
                                  stderr=subprocess.PIPE, restore_signals=False,
                                  preexec_fn=lambda: signal.signal(signal.SIGPIPE, disposition)) as process:
                process.stdout.close()
                with contextlib.suppress(BrokenPipeError), process.stdin as keys:
                    keys.write(b"a=b\n" * 100000)
                self.assertEqual(process.stderr.read(), b"")
                self.assertEqual(process.wait(), 2 if ignored or len(KOLVANE) > 1 else -signal.SIGPIPE)

    def test_help_and_wrong_use(self):
        for arguments in [["--help"], ["help"], ["translate", "--help"], ["help", "translate"], ["--version"]]:
            status, output, errors = run(*arguments)
            self.assertEqual((status, errors), (0, ""), arguments)
        self.assertEqual(run("help", "translate"), run("translate", "--help"))
        self.assertRegex(run("--version")[1], r"^kolvane \d+\.\d+\.\d+\n.*1\.0 and 1\.5")
        for arguments, hint in [([], "kolvane"), (["bogus"], "kolvane"), (["help", "bogus"], "kolvane"),
                                (["translate", "--bogus", "x"], "kolvane translate"),
                                (["translate", "x", "-n"], "kolvane translate"),
                                (["translate", "--encoding", "x", "y"], "kolvane translate"),
                                (["translate", "--encoding", "a\nb\u009b", "y"], "kolvane translate"),
                                (["translate", "--dictionary"], "kolvane translate"),
                                (["translate", "--dictionary=", "x"], "kolvane translate"),
                                (["translate", "--dictionary", "-"], "kolvane translate"),
                                (["translate", "--dictionary", "-", "--dictionary", "-", "x"], "kolvane translate")]:
            status, output, errors = run(*arguments)
            self.assertEqual((status, output), (2, ""), arguments)
            self.assertRegex(errors, rf"^kolvane: [^\x00-\x1f\x7f-\x9f]*\ntry '{hint} --help'\n$")

    def test_plug_ins(self):
        (copy := self.file(STUBBORN.read_bytes(), "copy.so")).chmod(0o755)
        self.assertEqual(translate("--plugin", "copy.so", CANCEL, CANCEL, cwd=copy.parent), (0, "no\nno\n", ""))
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
                done = translate("--plugin", STUBBORN, *dictionaries, "k\t=v", env={**os.environ, "STUBBORN": step})
                result = step.split()[0]
                name = {"15": " (kResultInvariantViolation)", "6": " (kVRKInUse)"}.get(result, "")
                line = f"kolvane: {message}: result {result}{name}\n"
                self.assertEqual(done, (2, answer, line * max(1, len(dictionaries) // 2)))
        for plug_in, shown, reason in [(SAMPLES / "de.txt", SAMPLES / "de.txt", ".+"), ("none.so", "none.so", ".+"),
                                       ("a\nb.so", r"a\\x0Ab.so", "[^\n]+"), ("", "", r"result 2 \(kVRKInvalidArgument\)"),
                                       (KERNEL, KERNEL, "it has no entry point VRKKolvanesInitialize")]:
            status, output, errors = translate("--plugin", plug_in, "x=y")
            self.assertEqual((status, output), (2, ""))
            self.assertRegex(errors, rf"\Akolvane: cannot load the plug-in {shown}: {reason}\n\Z")

    def test_trace(self):
        plain = translate("--dictionary", SAMPLES / "de.txt", CANCEL)
        status, output, trace = translate("--trace", "--dictionary", SAMPLES / "de.txt", CANCEL)
        self.assertEqual((status, output), plain[:2])
        self.assertEqual(trace, translate("--trace", "--dictionary", SAMPLES / "de.txt", CANCEL)[2])
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
            self.assertRegex(translate("--trace", key)[2], rf"VRKDataCreate.* {shown}")
        failing = translate("--trace", "--plugin", STUBBORN, CANCEL,
                            env={**os.environ, "STUBBORN": "15 translate-string"})[2]
        self.assertIn("\n} -> result 15 (kResultInvariantViolation)\n", failing)
        self.assertNotIn("VRKObjectFactoryUnregister", failing)

    def test_nothing_to_read(self):
        done = subprocess.run([*KOLVANE, "translate"], stdin=subprocess.DEVNULL, capture_output=True, timeout=60)
        self.assertEqual((done.returncode, done.stdout, done.stderr), (0, b"", b""))

    def test_terminal_without_keys(self):
        try:
            ours, terminal = os.openpty()
        except (AttributeError, OSError):
            self.skipTest("no terminals")
        done = subprocess.run([*KOLVANE, "translate"], stdin=terminal, capture_output=True, timeout=10)
        os.close(ours)
        os.close(terminal)
        self.assertEqual(done.returncode, 2)
        self.assertIn(b"try 'kolvane translate --help'", done.stderr)


if __name__ == "__main__":
    unittest.main()
