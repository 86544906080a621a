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
# What lookups and loads cost

![Time of a lookup by number of keys](performance.svg)

This page is written by `scripts/bench`, which installs what is missing, builds, measures, and takes some
ten minutes. `scripts/bench --sizes 1000,100000 --subjects kolvane-binary,limit`, or any other
options of `dictionary-bench`, measures that much only and writes nothing.
"""

ROWS = """\
## What is compared

| Row | What it is | Text it gives |
|---|---|---|
| kolvane, binary image | `KolvaneDictionary`, loaded from a binary image of version 1.5 with UTF-16 values | UTF-16 |
| kolvane, UTF-16 text | the same, loaded from a text dictionary in UTF-16 | UTF-16 |
| kolvane, code-page text | the same, loaded from a text dictionary in windows-1252 | UTF-16 |
| kolvane, message | the UTF-16 text in a translator object, asked by messages through the kernel | UTF-16 |
| kolvane, coercion | the same, asked by letting the kernel coerce keys that are kept as data | UTF-16 |
| limit | `boost::unordered_flat_map` of views into one block; its load copies two arrays and fills the reserved map: \
nothing is parsed, decoded or checked | UTF-16 |
| limit, XXH3 | the same with XXH3 for the map's own hash of strings | UTF-16 |
| ICU | a resource bundle by `genrb`, `ures_openDirect` and `ures_getStringByKey` | UTF-16 |
| Qt | `QTranslator` with a catalogue by `lrelease` | UTF-16 |
| gettext | the C library's `dgettext` with a catalogue by `msgfmt` | UTF-8 |
| Boost.Locale | its message catalogue, of the same file as gettext's | UTF-8 |
| read | the image's file, read with `read` into fresh memory, from the system's cache | none |

Everyone has the same keys and translations, gets a key and leaves the answer in the caller's reused
vector; where there is none, the default text that came with the key. Kolvane gets a terminated
`$$$/Key=Default text`, the others the bare key. Before anything is timed each one answers every key of
the set, and up to 100,000 that it lacks, and each answer is checked; while lookups are timed the total
length of the answers is.

* **Mixed paths** are paths of two to five words and a number, 25 to 60 bytes; **one pattern** is
  `/App/Section/Item0000123/Dialog/Headline`, whose digits lie between the bytes by which a dictionary is
  divided into buckets. Their translations are words of French, of 28 units on average. **iso-codes** are
  the German names of languages, countries and currencies of that package.
* A **hit** is a lookup of one of the keys in random order, in nanoseconds; a **miss** one of a key of the
  same kind that the dictionary lacks.
* **Load** is in milliseconds. ICU, Qt and gettext map their files and read what they are asked for, so
  that **load and ask**, a load and then every key once, says more.
* **Peak memory** is in bytes an entry, on top of what the process took before. The image that Kolvane
  loads is the host's and is not counted; the files that others map are.
* Subjects take turns round by round, and the fastest round of each counts: {rounds} rounds at least.
* 100,000 keys and their translations are about what the last cache holds. Where other machines share it,
  figures there differ by up to a factor of two from one set or run to the next.
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
        return ["*the fastest UTF-16 peer, times the slowest kolvane row*"] + cells

    def lookups(self, measure):
        subjects = [name for name in SUBJECTS if not name.startswith("read-")]
        lines = list(self.lines(subjects, measure, lambda _: "limit")) + [self.peer_line(measure)]
        return table(["ns, and in brackets times the limit"] + self.header, lines)

    def loads(self):
        lines = self.lines(SUBJECTS, "load", lambda subject: OURS.get(subject))
        return table(["ms, and in brackets times the read of the same image"] + self.header, lines)

    def first_use(self):
        lines = list(self.lines(SUBJECTS, "first-use", lambda _: "limit")) + [self.peer_line("first-use")]
        return table(["ms, and in brackets times the limit"] + self.header, lines)

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
        return table(["bytes an entry, loaded / all asked"] + [f"{size:,} keys" for size in sizes],
                     [size_line] + lines) if sizes else ""


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
    return ("## Against its targets\n\nOf Kolvane's three images the worst counts, of the peers those that give "
            "UTF-16. Sizes stand before the colons.\n\n" + head + body)


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
