"""Installs Kolvane, moves it, and builds the examples on it as their own projects:
test_install.py SOURCE BUILD [CMAKE-OPTION...]; the options, for a cross build, go to the projects."""

import functools
import gzip
import os
import pathlib
import re
import shutil
import struct
import subprocess
import sys
import tempfile
import unittest

SOURCE, BUILD = pathlib.Path(sys.argv.pop(1)), pathlib.Path(sys.argv.pop(1))
OPTIONS = [word for word in sys.argv if word.startswith("-D")]
sys.argv = [word for word in sys.argv if word not in OPTIONS]
KOLVANE = [*os.environ.get("EMULATOR", "").split(), "bin/kolvane.exe" if OPTIONS else "bin/kolvane"]
CANCEL = "$$$/Dialog/Cancel=Cancel"


def run(*command, **options):
    """Returns the status, and standard output and error as one."""
    done = subprocess.run(list(map(str, command)), stdout=subprocess.PIPE, stderr=subprocess.STDOUT,
                          stdin=subprocess.DEVNULL, timeout=120, **options)
    return done.returncode, done.stdout.decode().replace("\r\n", "\n")


def contents(folder):
    files = (path for path in folder.rglob("*") if path.relative_to(folder).parts[0] not in ("build", ".git"))
    return {path: path.stat().st_mtime_ns for path in files if path.is_file() and "__pycache__" not in path.parts}


class Install(unittest.TestCase):
    @classmethod
    def setUpClass(cls):
        folder = tempfile.TemporaryDirectory()
        cls.addClassCleanup(folder.cleanup)
        cls.folder, cls.sources = pathlib.Path(folder.name), contents(SOURCE)
        cls.prefix = cls.folder / "moved"
        subprocess.run(["cmake", "--install", BUILD, "--prefix", cls.folder / "first"], check=True, stdout=subprocess.DEVNULL)
        (cls.folder / "first").rename(cls.prefix)

    @classmethod
    def tearDownClass(cls):
        assert contents(SOURCE) == cls.sources, "something was written among the sources"

    def must(self, *command, **options):
        status, output = run(*command, **options)
        self.assertEqual(status, 0, output)
        return output

    def configure(self, source, *options, expected=0, **environment):
        build = pathlib.Path(tempfile.mkdtemp(dir=self.folder))
        place = f"Kolvane_DIR={self.prefix}/lib/cmake/Kolvane" if OPTIONS else f"CMAKE_PREFIX_PATH={self.prefix}"
        status, output = run("cmake", "-G", "Ninja", "-S", source, "-B", build, f"-D{place}", *OPTIONS, *options,
                             env={**os.environ, **environment})
        self.assertEqual(status, expected, output)
        return build, output

    def project(self, text):
        source = pathlib.Path(tempfile.mkdtemp(dir=self.folder))
        shutil.copy(SOURCE / "examples/dictionary-project/de.txt", source)
        (source / "CMakeLists.txt").write_text("cmake_minimum_required(VERSION 3.25)\nproject(P LANGUAGES NONE)\n"
                                               f"find_package(Kolvane 0.1 REQUIRED)\n{text}\n")
        return source

    def translate(self, dictionary):
        return self.must(*KOLVANE, "translate", "--dictionary", dictionary, CANCEL, cwd=self.prefix)

    def flags(self, name):
        folder = next(self.prefix.rglob("pkgconfig"))
        return self.must("pkg-config", "--cflags", "--libs", name, env={**os.environ, "PKG_CONFIG_PATH": folder}).split()

    def test_nothing_leads_back(self):
        for path in self.prefix.rglob("*"):
            self.assertFalse(path.is_symlink(), path)
            for trace in (SOURCE, self.folder) if path.is_file() else ():
                self.assertNotIn(os.fsencode(trace), path.read_bytes(), path)

    @unittest.skipUnless((BUILD / "build.ninja").exists() and not OPTIONS, "scripts/run uses Ninja, for this machine")
    def test_scripts_run_builds_all_that_is_installed(self):
        [target] = re.findall(r"--target (\S+)", (SOURCE / "scripts/run").read_text())
        ninja = functools.partial(self.must, "ninja", "-t", cwd=BUILD)
        rules = [line.rsplit(": ", 1) for line in ninja("targets", "all").splitlines()]
        built = {pathlib.Path(output).name for output, rule in rules if rule != "phony"}
        installed = {path.name for path in self.prefix.rglob("*") if path.is_file()}
        self.assertIn("kolvane", built & installed)
        needed = {pathlib.Path(node).name for node in re.findall(r'label="(.+?)"', ninja("graph", target))}
        self.assertEqual(built & installed - needed, set())

    @unittest.skipUnless(OPTIONS, "binaries of Windows")
    def test_symbols_are_apart(self):
        self.must("cmake", "--install", BUILD, "--prefix", self.folder / "symbols", "--component", "symbols")
        names = ["kolvane.exe", "VRKKolvanes.dll", "VarnelKernel.dll"]
        for name in names:
            image = (self.prefix / "bin" / name).read_bytes()
            header = struct.unpack_from("<I", image, 0x3C)[0]
            self.assertEqual(struct.unpack_from("<I", image, header + 16), (0,), "the number of symbols")
            self.assertTrue(f"{name}.debug".encode() in image, name)
        self.assertEqual(list(self.prefix.rglob("*.debug")), [])
        self.assertEqual({path.name for path in (self.folder / "symbols").rglob("*") if path.is_file()},
                         {f"{name}.debug" for name in names})

    @unittest.skipUnless(OPTIONS, "binaries of Windows")
    def test_libraries_do_not_link_the_standard_streams(self):
        for name in ("VRKKolvanes.dll", "VarnelKernel.dll"):
            self.assertLess((self.prefix / "bin" / name).stat().st_size, 700_000, name)

    @unittest.skipIf(OPTIONS, "no manual page on Windows")
    def test_manual_and_completions_know_every_option(self):
        share = self.prefix / "share"
        manual = gzip.open(share / "man/man1/kolvane.1.gz", "rt").read().split("\n.Sh COMMANDS")[1].replace("\\-", "-")
        bash, zsh = share / "bash-completion/completions/kolvane", next((share / "zsh").rglob("_kolvane")).read_text()
        commands = re.findall(r"^  ([a-z]+)  ", self.must(*KOLVANE, "help", cwd=self.prefix), re.M)
        self.assertIn("translate", commands)
        for command in commands:
            usage = self.must(*KOLVANE, command, "--help", cwd=self.prefix)
            options = {option for word in re.findall(r"^  (-\S+)", usage, re.M) for option in word.split(",")} - {"-h", "--help"}
            entry = re.search(rf"^\.It Cm {command}\b.*?(?=^\.It Cm|\Z)", manual, re.M | re.S).group()
            self.assertEqual({f"-{name}" for name in re.findall(r"(?:\.It|,) Fl (\S+)", entry)}, options)
            self.assertEqual(set(self.must("bash", "-c", f". {bash} && _kolvane_options {command}").split()), options)
            offered = re.search(rf"^    {command}\)\n(.*?);;", zsh, re.M | re.S).group(1)
            for option in options - {"--encoding"}:
                self.assertRegex(offered, rf"['{{*),]{option}\b")

    def test_a_dictionary_is_built_when_it_must_be(self):
        source = self.folder / "dictionary-project"
        shutil.copytree(SOURCE / "examples/dictionary-project", source)
        build, _ = self.configure(source)
        self.must("cmake", "--build", build)
        if not OPTIONS:
            self.must("ctest", "--test-dir", build)
        dictionary = self.folder / "installed/share/dictionary-example/de.kdict"
        self.must("cmake", "--install", build, "--prefix", self.folder / "installed")
        self.assertEqual(self.translate(dictionary), "Abbrechen\n")
        made = (build / "de.kdict").stat().st_mtime_ns
        (source / "de.txt").touch()
        self.assertIn("Compiling", self.must("cmake", "--build", build))
        self.assertIn("no work to do", self.must("cmake", "--build", build))
        self.assertEqual((build / "de.kdict").stat().st_mtime_ns, made)
        (source / "de.txt").write_text('"$$$/Dialog/Cancel=Verwerfen"\n')
        self.must("cmake", "--build", build)
        self.assertEqual(self.translate(build / "de.kdict"), "Verwerfen\n")

    @unittest.skipIf(OPTIONS, "compilers of this machine")
    def test_hosts(self):
        build, _ = self.configure(SOURCE / "examples/host")
        self.must("cmake", "--build", build)
        search = f"-Wl,-rpath,{next(self.prefix.rglob('libVarnelKernel.so')).parent}"
        self.must("gcc", SOURCE / "examples/host/host.c", "-o", build / "c", *self.flags("varnel-kernel"), search)
        self.must("g++", "-std=c++20", SOURCE / "examples/host/host.cpp", "-o", build / "cpp", *self.flags("kolvane"), search)
        for host in ("host", "host-c", "c", "cpp"):
            self.assertEqual(run(build / host, "libVRKKolvanes.so", SOURCE / "examples/dictionaries/de.txt", CANCEL),
                             (0, "message: Abbrechen\ncoercion: Abbrechen\n"))

    @unittest.skipIf(OPTIONS, "compilers of this machine")
    def test_the_dictionary_library_alone(self):
        program = self.folder / "alone"
        program.with_suffix(".cpp").write_text('#include <KolvaneDictionary.h>\nint main() { return KolvaneDictionary()'
                                               '.Translate("$$$/a=seven c", nullptr).BufferSize(); }\n')
        self.must("g++", "-std=c++20", program.with_suffix(".cpp"), "-o", program, *self.flags("kolvane-dictionary"))
        self.assertEqual(run(program), (8, ""))

    def test_calls_that_are_refused(self):
        (self.folder / "plain.txt").touch()
        for arguments, reason in [("", "<target> SOURCES"), ("FROMAT 1.0 SOURCES de.txt", "<target> SOURCES"),
                                  ("SOURCES de.txt OUTPUT ${CMAKE_SOURCE_DIR}/d.bin", "not in the build folder"),
                                  ("SOURCES de.txt OUTPUT ../d.bin", "not in the build folder"),
                                  ("SOURCES ${CMAKE_BINARY_DIR}/a OUTPUT a", "one of the SOURCES")]:
            _, output = self.configure(self.project(f"kolvane_add_dictionary(d {arguments})"), expected=1)
            self.assertIn(reason, " ".join(output.split()), arguments)

    def test_options_reach_the_command(self):
        source = self.project("kolvane_add_dictionary(d SOURCES de.txt de.txt OUTPUT sub/d.bin FORMAT 1.0 VALUES utf-8 ENCODING utf-8)")
        build, _ = self.configure(source)
        self.assertIn(f"compile {source}/de.txt {source}/de.txt -o {build}/sub/d.bin --format 1.0 --values utf-8 --encoding utf-8",
                      self.must("cmake", "--build", build, "--verbose"))
        self.assertEqual(self.translate(build / "sub/d.bin"), "Abbrechen\n")

    def test_the_build_fails_where_a_dictionary_would_be_garbled(self):
        text = '"$$$/Dialog/Cancel=Отмена"\n'
        sources = {"malformed": text.encode() + b"\xff\n", "po": b'msgid "Cancel"\nmsgstr "Abbrechen"\n', "unmarked": text.encode("utf-16-le")}
        calls = [f"kolvane_add_dictionary({name} SOURCES {name})" for name in sources]
        source = self.project("\n".join(["kolvane_add_dictionary(forced SOURCES de.txt malformed ENCODING utf-8)", *calls]))
        for name, content in sources.items():
            (source / name).write_bytes(content)
        build, _ = self.configure(source)
        status, output = run("cmake", "--build", build, "--", "-k", "0")
        self.assertNotEqual(status, 0)
        self.assertEqual(output.count("nothing was written"), 4, output)
        for message in ["malformed:2:1: error: byte 33 is malformed UTF-8", "po: error: this is a PO file", "unmarked: error: this is UTF-16 without"]:
            self.assertIn(message, output)
        self.assertEqual(list(build.glob("*.kdict")), [])

    @unittest.skipIf(OPTIONS, "pretends to be a cross build")
    def test_cross_builds_find_a_command(self):
        source = self.project("kolvane_add_dictionary(d SOURCES de.txt)")
        cross, command = "-DCMAKE_SYSTEM_NAME=Linux", self.prefix / "bin/kolvane"
        path = os.environ["PATH"]
        for options, environment, expected in [
                ([], {"PATH": f"{path}:{command.parent}"}, f"{command} compile"),
                ([f"-DKOLVANE_COMMAND={command}"], {}, f"{command} compile"),
                (["-DCMAKE_CROSSCOMPILING_EMULATOR=env;-u;NONE"], {}, f"env -u NONE {command} compile")]:
            with self.subTest(options):
                build, _ = self.configure(source, cross, *options, **environment)
                self.assertIn(expected, self.must("cmake", "--build", build, "--verbose"))
        _, output = self.configure(source, cross, expected=1)
        self.assertIn("Set KOLVANE_COMMAND", " ".join(output.split()))

    @unittest.skipIf(OPTIONS or not shutil.which("dpkg-shlibdeps"), "needs a Debian system")
    def test_debian_package(self):
        self.must("cpack", "-G", "DEB", "--config", BUILD / "CPackConfig.cmake", "-B", self.folder)
        package = next(self.folder.glob("kolvane_0.1.0_*.deb"))
        listed = [line.split(maxsplit=5) for line in self.must("dpkg-deb", "-c", package).splitlines()]
        files = {name.removeprefix("./usr/"): mode for mode, _, _, _, _, name in listed if mode[0] != "d"}
        installed = {str(path.relative_to(self.prefix)) for path in self.prefix.rglob("*") if path.is_file()}
        self.assertEqual(set(files), installed)
        self.assertEqual({mode for mode, *_ in listed}, {"drwxr-xr-x", "-rw-r--r--", "-rwxr-xr-x"})
        self.assertEqual([name for name, mode in files.items() if "x" in mode], ["bin/kolvane"])
        self.assertRegex(self.must("dpkg-deb", "-f", package, "Depends"), r"libc6 .*libfmt9 .*libstdc\+\+6")


if __name__ == "__main__":
    unittest.main()
