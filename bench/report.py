#!/usr/bin/env python3
"""Turn the results of dictionary-bench into docs/performance.md and its picture.

    report.py RESULTS.json FOLDER
"""

import argparse
import datetime
import json
import os
import platform

import picture
import targets
from results import OURS, SUBJECTS, Results, number

SET_TITLES = {
    "mixed-paths": "Mixed paths",
    "one-pattern": "One pattern",
    "iso-codes": "iso-codes",
}

INTRODUCTION = """\
# Performance

![Time of a lookup by number of keys](performance.svg)

This page shows the time and memory that lookups and loads take, compared with other libraries.

`scripts/bench` writes this page. It installs missing packages, builds, and measures for about ten minutes.
With options of `dictionary-bench`, such as `scripts/bench --sizes 1000,100000 --subjects kolvane-binary,limit`,
it measures only what the options select, and writes nothing.
"""

ROWS = """\
## Subjects and measures

| Row | Subject | Text returned |
|---|---|---|
| kolvane, binary image | `KolvaneDictionary`, loaded from a binary dictionary of version 1.5 with UTF-16 values | UTF-16 |
| kolvane, UTF-16 text | the same, loaded from a text dictionary in UTF-16 | UTF-16 |
| kolvane, code-page text | the same, loaded from a text dictionary in windows-1252 | UTF-16 |
| kolvane, message | a translator object that has loaded the UTF-16 text, queried by messages through the kernel | UTF-16 |
| kolvane, coercion | the same object, queried by coercion: the kernel converts keys that are stored as data | UTF-16 |
| limit | a yardstick: `boost::unordered_flat_map` of views into one block. Its load copies two arrays and fills the reserved map; \
it parses, decodes and checks nothing | UTF-16 |
| limit, XXH3 | the same, with XXH3 instead of the map's own string hash | UTF-16 |
| ICU | a resource bundle made by `genrb`, read by `ures_openDirect` and `ures_getStringByKey` | UTF-16 |
| Qt | `QTranslator` with a catalogue made by `lrelease` | UTF-16 |
| gettext | the C library's `dgettext` with a catalogue made by `msgfmt` | UTF-8 |
| Boost.Locale | its message catalogue, loaded from the same file as gettext's | UTF-8 |
| read | no lookup: reads the dictionary file with `read`, from the system's cache into fresh memory | none |

All subjects have the same keys and translations. Each is given a key and copies the answer to the caller's
reused vector. If there is no translation, the answer is the default text that came with the key. Kolvane is
given a terminated `$$$/Key=Default text`, the other subjects the bare key.

Before timing, each subject looks up every key of the set and up to 100,000 missing keys, and each answer is
checked. During timing, the total length of the answers is checked.

Key sets:

* **Mixed paths**: paths of two to five words and a number, 25 to 60 bytes long.
* **One pattern**: paths such as `/App/Section/Item0000123/Dialog/Headline`. The bucket hash samples none of
  the digits, so that all keys share one bucket.
* **iso-codes**: the German names of languages, countries and currencies from the package of that name.

In the first two sets, translations are French words, 28 units long on average.

Measures:

* **Hit**: the time to look up a key of the set, in random order, in nanoseconds. **Miss**: the same for a key
  of the same kind that the dictionary lacks.
* **Load**: the time to load a dictionary, in milliseconds. ICU, Qt and gettext map their files and read only
  the parts that lookups need. Therefore **load and ask**, a load followed by one lookup of every key, is a
  fairer comparison.
* **Peak memory**: bytes per entry, beyond what the process used before. The dictionary's bytes that Kolvane
  loads belong to the host and are not counted. Files that other subjects map are counted.

Subjects take turns, round by round. The fastest of at least {rounds} rounds counts.

About 100,000 keys with their translations just fit into the last-level cache. If other machines share this cache,
figures at that size vary by up to a factor of two between sets and between runs.
"""

TARGETS = """\
## Targets

Kolvane is measured with three images, that is, dictionary files: binary, UTF-16 text and code-page text. A target
that names no image is judged by the slowest of them. Peers are the libraries that return UTF-16. The number before
a colon is the number of keys. [Subjects and measures](#subjects-and-measures) explains the other terms.

"""


def machine(results):
    with open("/proc/cpuinfo", encoding="utf-8") as lines:
        models = [line.partition(":")[2].strip() for line in lines if line.startswith("model name")]
    versions = ", ".join(dict.fromkeys(results.libraries.values())).replace("_", ".")
    return (f"Measured on {datetime.date.today()}: {models[0] if models else platform.machine()}, "
            f"{os.cpu_count()} cores, {platform.system()} {platform.release()}; {results.compiler}; {versions}.\n")


def table(header, lines):
    head = "| " + " | ".join(header) + " |\n|---" + "|---:" * (len(header) - 1) + "|\n"
    return head + "".join("| " + " | ".join(line) + " |\n" for line in lines)


def ratio_cell(value, yardstick):
    if value is None or not yardstick:
        return "–" if value is None else number(value)
    return f"{number(value)} ({number(value / yardstick)})"


class SetTables:
    """The tables of one key set: a row for each subject, a column for each size."""

    def __init__(self, results, set_name):
        self.results, self.set_name = results, set_name
        self.sizes = results.sizes(set_name)
        self.header = [f"{size:,} keys" for size in self.sizes]

    def value(self, size, subject, measure):
        return self.results.value(self.set_name, size, subject, measure)

    def lines(self, subjects, measure, yardstick=lambda subject: None):
        for subject in subjects:
            values = [self.value(size, subject, measure) for size in self.sizes]
            if all(value is None for value in values):
                continue
            bases = [self.value(size, yardstick(subject), measure) for size in self.sizes]
            yield [SUBJECTS[subject].title] + [ratio_cell(*pair) for pair in zip(values, bases)]

    def peer_line(self, measure):
        """What the fastest peer that gives UTF-16 takes, in terms of the slowest image."""
        cells = []
        for size in self.sizes:
            ours = self.results.slowest(self.set_name, size, measure)
            peer, least = self.results.fastest_peer(self.set_name, size, measure)
            cells.append(f"{number(least / ours)} ({SUBJECTS[peer].title})" if ours and peer else "–")
        return ["*fastest UTF-16 peer, as a multiple of the slowest kolvane image*"] + cells

    def lookups(self, measure):
        subjects = [name for name in SUBJECTS if not name.startswith("read-")]
        lines = list(self.lines(subjects, measure, lambda _: "limit")) + [self.peer_line(measure)]
        return table(["ns (multiple of the limit)"] + self.header, lines)

    def loads(self):
        lines = self.lines(SUBJECTS, "load", lambda subject: OURS.get(subject))
        return table(["ms (multiple of the read of the same file)"] + self.header, lines)

    def first_use(self):
        lines = list(self.lines(SUBJECTS, "first-use", lambda _: "limit")) + [self.peer_line("first-use")]
        return table(["ms (multiple of the limit)"] + self.header, lines)

    def destruction(self):
        return table(["ms"] + self.header, self.lines(OURS, "unload"))

    def memory(self):
        """From 10,000 keys on: the kernel counts in steps of up to some hundred kilobytes."""
        sizes = [size for size in self.sizes if size >= 10_000]
        lines = []
        for subject in SUBJECTS:
            pairs = [[self.value(size, subject, measure) for measure in ("memory-loaded", "memory-used")]
                     for size in sizes]
            if any(None not in pair for pair in pairs):
                lines.append([SUBJECTS[subject].title] +
                             ["–" if None in pair else "{:.0f} / {:.0f}".format(*pair) for pair in pairs])
        size_line = ["*keys and values*"] + [f"{self.results.payload(self.set_name, size):.0f}" for size in sizes]
        unit = "bytes per entry, after the load / after a lookup of every key"
        return table([unit] + [f"{size:,} keys" for size in sizes], [size_line] + lines) if sizes else ""


def set_chapter(results, set_name):
    tables = SetTables(results, set_name)
    sections = [("hits", tables.lookups("hit")), ("misses", tables.lookups("miss")), ("loads", tables.loads()),
                ("load and ask", tables.first_use()), ("destruction", tables.destruction()),
                ("peak memory", tables.memory())]
    text = f"## {SET_TITLES[set_name]}\n"
    for reason in results.left_out(set_name):
        text += f"\n{reason}\n"
    for title, content in sections:
        if content:
            text += f"\n### {SET_TITLES[set_name]}: {title}\n\n{content}"
    return text


def targets_chapter(results):
    lines = [[target.text, target.measured, target.verdict] for target in targets.judge(results)]
    head = "| Target | Measured | Met |\n|---|---|---|\n"
    body = "".join("| " + " | ".join(line) + " |\n" for line in lines)
    return TARGETS + head + body


def page(results):
    chapters = [INTRODUCTION, machine(results), targets_chapter(results),
                ROWS.format(rounds=results.rounds)]
    chapters += [set_chapter(results, name) for name in SET_TITLES if results.sizes(name)]
    return "\n".join(chapters)


def main():
    parser = argparse.ArgumentParser(description=__doc__, formatter_class=argparse.RawDescriptionHelpFormatter)
    parser.add_argument("results")
    parser.add_argument("folder")
    arguments = parser.parse_args()
    with open(arguments.results, encoding="utf-8") as stream:
        results = Results(json.load(stream))
    outputs = {"performance.md": page(results), "performance.svg": picture.draw(results)}
    for name, text in outputs.items():
        with open(os.path.join(arguments.folder, name), "w", encoding="utf-8") as stream:
            stream.write(text)


if __name__ == "__main__":
    main()
