"""What inputs and interruptions do to the files that commands write: test_inputs.py COMMAND."""

import json
import os
import signal
import subprocess
import time
import unittest

from command import KOLVANE, PAD, CommandTest


class Inputs(CommandTest):
    def values(self, *arguments):
        status, output, errors = self.run_kolvane("dump", "--json", *arguments)
        self.assertEqual(status, 0, errors)
        return {entry["key"]: entry["value"] for entry in json.loads(output)["entries"]}

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
