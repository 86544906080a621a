"""What dictionary-bench measured, and who took part."""

import collections

Subject = collections.namedtuple("Subject", "title gives")

# In the order of the tables.
SUBJECTS = {
    "kolvane-binary": Subject("kolvane, binary image", "UTF-16"),
    "kolvane-utf16": Subject("kolvane, UTF-16 text", "UTF-16"),
    "kolvane-code-page": Subject("kolvane, code-page text", "UTF-16"),
    "kernel-message": Subject("kolvane, message", "UTF-16"),
    "kernel-coercion": Subject("kolvane, coercion", "UTF-16"),
    "limit": Subject("limit", "UTF-16"),
    "limit-xxh3": Subject("limit, XXH3", "UTF-16"),
    "icu": Subject("ICU", "UTF-16"),
    "qt": Subject("Qt", "UTF-16"),
    "gettext": Subject("gettext (UTF-8)", "UTF-8"),
    "boost-locale": Subject("Boost.Locale (UTF-8)", "UTF-8"),
    "read-binary": Subject("read, binary image", None),
    "read-utf16": Subject("read, UTF-16 text", None),
    "read-code-page": Subject("read, code-page text", None),
}

# Each image with the read of its file.
OURS = {"kolvane-binary": "read-binary", "kolvane-utf16": "read-utf16", "kolvane-code-page": "read-code-page"}
PEERS = ("icu", "qt")  # that give UTF-16


def number(value):
    """Three digits that count."""
    if value == 0:
        return "0"
    digits = 2 if value < 10 else 1 if value < 100 else 0
    return f"{value:,.{3 if value < 0.1 else digits}f}"


class Results:
    def __init__(self, document):
        self.rounds, self.compiler = document["rounds"], document["compiler"]
        self.libraries = document["libraries"]
        self.sets = {(entry["set"], entry["size"]): entry for entry in document["sets"]}

    def sizes(self, set_name):
        return sorted(size for name, size in self.sets if name == set_name)

    def value(self, set_name, size, subject, measure):
        """The fastest round, or None for what was not measured."""
        entry = self.sets.get((set_name, size), {"results": {}})
        return entry["results"].get(subject, {}).get(measure, {}).get("least")

    def payload(self, set_name, size):
        """The bytes of the keys and values, an entry."""
        entry = self.sets[set_name, size]
        return (entry["keyBytes"] + 2 * entry["valueUnits"]) / size

    def slowest(self, set_name, size, measure):
        """Of our images."""
        values = [self.value(set_name, size, subject, measure) for subject in OURS]
        return max((value for value in values if value is not None), default=None)

    def fastest_peer(self, set_name, size, measure):
        values = {peer: self.value(set_name, size, peer, measure) for peer in PEERS}
        known = {peer: value for peer, value in values.items() if value is not None}
        peer = min(known, key=known.get, default=None)
        return peer, known.get(peer)

    def left_out(self, set_name):
        """Who took no part, and why, each said once."""
        reasons = collections.OrderedDict()
        for size in self.sizes(set_name):
            for subject, reason in self.sets[set_name, size]["leftOut"].items():
                reasons.setdefault((SUBJECTS[subject].title, reason), []).append(f"{size:,}")
        return [f"“{title}” is left out at {' and '.join(sizes)} keys: {reason}."
                for (title, reason), sizes in reasons.items()]
