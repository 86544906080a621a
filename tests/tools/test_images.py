"""Runs compile, dump and convert: test_images.py COMMAND SAMPLES."""

import json
import os
import pathlib
import sys
import unittest

from command import KOLVANE, PAD, CommandTest, bucket, image

SAMPLES = pathlib.Path(sys.argv.pop(1)).resolve()


class Images(CommandTest):
    def good(self, *arguments, **options):
        status, output, errors = self.run_kolvane(*arguments, **options)
        self.assertEqual((status, errors), (0, ""), arguments)
        return output

    def bytes_of(self, name):
        return self.folder.joinpath(name).read_bytes()

    def test_real_dictionaries_stay_the_same(self):
        for path in [*SAMPLES.glob("*.txt"), SAMPLES / "it.bin"]:
            with self.subTest(path.name):
                self.good("compile", path, "-o", "one")
                self.good("compile", "-", "-o", "two", stdin=self.good("dump", "--sort", path))
                self.assertEqual(self.bytes_of("one"), self.bytes_of("two"))
                keys = b"".join(b"$$$" + entry["key"].encode() + b"=?\0" for entry in json.loads(self.good("dump", "--json", path))["entries"])
                self.assertEqual(self.good("translate", "--nul", "--dictionary", "one", stdin=keys),
                                 self.good("translate", "--nul", "--dictionary", path, stdin=keys))

    def test_dump_keeps_the_order_of_the_file(self):
        self.file(b'"/k=two"\n"/b=second"\n"/a=first"\n"/k=last"' + PAD)
        self.assertEqual(self.good("dump", "d.txt"), b'"$$$/k=last"\n"$$$/b=second"\n"$$$/a=first"\n')

    def test_an_equal_image_is_left_alone(self):
        self.file(name="a", content=b'"/k=one"' + PAD)
        self.good("compile", "a", "-o", "out")
        os.utime(self.folder / "out", (1, 1))
        self.good("compile", "a", "-o", "out")
        self.assertEqual(self.folder.joinpath("out").stat().st_mtime, 1)
        self.good("compile", "a", "-o", "out", "--format", "1.0")
        self.assertNotEqual(self.folder.joinpath("out").stat().st_mtime, 1)
        self.assertEqual(sorted(path.name for path in self.folder.iterdir()), ["a", "out"])

    @unittest.skipIf(len(KOLVANE) > 1, "links are the host's, and the emulator's files have no permissions")
    def test_links_and_permissions_stay(self):
        self.file(name="a", content=b'"/k=one"' + PAD)
        self.folder.joinpath("old").touch(0o640)
        for name in ["old", "new"]:
            self.folder.joinpath("to-" + name).symlink_to(name)
            self.good("compile", "a", "-o", "to-" + name)
            self.assertTrue(self.folder.joinpath("to-" + name).is_symlink())
            self.assertEqual(self.bytes_of(name), self.good("compile", "a", "-o", "-"))
        self.assertEqual(self.folder.joinpath("old").stat().st_mode & 0o777, 0o640)
        self.folder.joinpath("loop").symlink_to("loop")
        self.assertEqual(self.run_kolvane("compile", "a", "-o", "loop")[0], 2)
        self.assertEqual(sorted(path.name for path in self.folder.iterdir()), ["a", "loop", "new", "old", "to-new", "to-old"])

    def test_nothing_is_written_where_something_would_be_lost(self):
        self.file(name="polish", content='"/k=Żółć"\n"/a=ok"'.encode() + PAD)
        self.file(name="half", content='\ufeff"/k=a\ud800b"'.encode("utf-16-le", "surrogatepass") + PAD)
        image = self.good("compile", "polish", "-o", "-")
        self.file(name="cut", content=image[:-1])
        for arguments, message in [(["polish", "--values", "code-page"], "'/k': its translation holds U+017B, which the code page cannot carry"),
                                   (["half", "--values", "utf-8"], "'/k': its translation holds U+D800, which UTF-8 cannot carry"),
                                   (["missing", "cut"], "cut: error: the image is cut short"), (["polish", "missing"], "missing: No such file")]:
            status, output, errors = self.run_kolvane("compile", *arguments, "-o", "out")
            self.assertEqual((status, output), (2, b""))
            self.assertIn(message, errors)
            self.assertIn("nothing was written", errors)
            self.assertFalse(self.folder.joinpath("out").exists())
        self.good("compile", "half", "-o", "out")
        self.assertEqual(json.loads(self.good("dump", "--json", "out")), {"version": 1, "entries": [{"key": "/k", "valueUnits": [97, 0xD800, 98]}]})

    def test_dump_says_what_text_cannot_hold(self):
        values = ['"', "^#{", "\\", "a\0", "#{amp}", "\u2028", "\ud800", "\t\r\n\b", "plain"]
        keys = [f"/{i}".encode() for i in range(len(values))]
        data = [value.encode("utf-16-le", "surrogatepass") for value in values]
        self.file(name="image", content=image([(bucket(key), [(key, value)]) for key, value in zip(keys, data)]))
        status, output, errors = self.run_kolvane("dump", "image")
        self.assertEqual(status, 1)
        self.assertEqual(output.decode(), '"$$$/0=\\""\n"$$$/1=^^#{"\n"$$$/2=\\\\\n"$$$/7=\\t\\r\\n\\b"\n"$$$/8=plain"\n')
        self.assertEqual([line[len("kolvane: image: '/"):][0] for line in errors.splitlines()], ["3", "4", "5", "6"])
        self.assertEqual(self.run_kolvane("dump", "--utf-16", "image")[2].count("\n"), 3)
        self.assertEqual(len(json.loads(self.good("dump", "--json", "image"))["entries"]), len(keys))
        self.file(name="cut", content=self.bytes_of("image")[:-4])
        self.assertEqual(self.run_kolvane("dump", "--json", "cut")[0], 1)

    def test_convert_changes_the_encoding_alone(self):
        text = 'odd  "$$$/a=é" \r\r\n\n"$$$/b=^x€\rno end'
        forms = {"utf-8": text.encode(), "utf-16le": b"\xff\xfe" + text.encode("utf-16-le"),
                 "utf-16be": b"\xfe\xff" + text.encode("utf-16-be"), "code-page": text.encode("cp1252")}
        for source, content in forms.items():
            for target, expected in forms.items():
                self.file(name="in", content=content)
                self.good("convert", "in", "-o", "out", "--to", target)
                self.assertEqual(self.bytes_of("out"), expected, (source, target))

    def test_convert_names_what_the_target_lacks(self):
        image = self.good("compile", SAMPLES / "it.txt", "-o", "-")
        for content, options, message in [
                ('"/a=x"\r\n"/b=€ł"\n"/c=ń"\n'.encode(), ["--to", "code-page"], "in:2:6: U+0142 has no place in the code page\nkolvane: in:3:5: "),
                ('\ufeff"/a=😀\ud83d"'.encode("utf-16-be", "surrogatepass"), ["--to", "utf-8"], "in:1:6: U+D83D has no place in UTF-8\n"),
                (b'"/a=x"\n"/b=\xff"', ["--to", "utf-16le", "--encoding", "utf-8"], "in:2:5: error: byte 11 is malformed UTF-8; --encoding image reads"),
                ('\ufeff"é"\r\n\r\u2028é'.encode() + b"\xef\xbf", ["--to", "utf-16le", "--encoding", "utf-8"], "in:4:2: error: byte 15 is malformed UTF-8; --encoding image reads"),
                (b'\xff\xfe"', ["--to", "utf-8"], "in:1:1: byte 2 is half a character\n"),
                ('\ufeffÿþ'.encode("utf-16-le"), ["--to", "code-page"], "in:1:1: nothing was written, for without a byte-order mark"),
                ("\ufeffKolvane Binary Format".encode(), ["--to", "utf-8"], "would be taken for a binary dictionary\n"),
                (image, ["--to", "utf-8"], "in: a binary dictionary has no encoding to change")]:
            status, output, errors = self.run_kolvane("convert", self.file(name="in", content=content), "-o", "out", *options)
            self.assertEqual((status, output), (2, b""))
            self.assertIn(message, errors)
            self.assertFalse(self.folder.joinpath("out").exists())


if __name__ == "__main__":
    unittest.main()
