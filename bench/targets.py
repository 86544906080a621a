"""The targets, as ratios, and whether results meet them."""

import collections

from results import OURS, SUBJECTS, number

Verdict = collections.namedtuple("Verdict", "text measured verdict")

SYNTHETIC = ("mixed-paths", "one-pattern")
ANY = float("inf")
TITLES = {"mixed-paths": "mixed", "one-pattern": "one pattern", "iso-codes": "iso-codes"}


def verdict(text, checks):
    """Each check is (label, value, whether it is met); one without a value was not measured."""
    known = [check for check in checks if check[1] is not None]
    if not known:
        return Verdict(text, "–", "not measured")
    measured = ", ".join(f"{label}: {number(value)}" + ("" if met else " **missed**") for label, value, met in known)
    return Verdict(text, measured, "yes" if all(met for *_, met in known) else "no")


def comparison(text, checks):
    return verdict(text, checks)._replace(verdict="no target")


def quotient(value, base):
    """With two decimals, which is as exact as a measurement is."""
    return round(value / base, 2) if value is not None and base else None


def at_most(label, value, base, bound):
    ratio = quotient(value, base)
    return label, ratio, ratio is not None and ratio <= bound


def at_least(label, value, base, bound):
    ratio = quotient(value, base)
    return label, ratio, ratio is not None and ratio >= bound


def places(results, sets, least=0, most=10**9):
    """The sets and sizes that were measured, with a label for each."""
    for name in sets:
        for size in results.sizes(name):
            if least <= size <= most:
                yield name, size, f"{TITLES[name]} {size:,}"


def hit_to_limit(results, bound, limit="limit", **sizes):
    return [at_most(label, results.slowest(name, size, "hit"), results.value(name, size, limit, "hit"), bound)
            for name, size, label in places(results, TITLES, **sizes)]


def hit_to_peers(results, bound, **sizes):
    return [at_least(label, results.fastest_peer(name, size, "hit")[1], results.slowest(name, size, "hit"), bound)
            for name, size, label in places(results, TITLES, **sizes)]


def pattern_to_mixed(results, bound):
    checks = []
    for size in results.sizes("one-pattern"):
        pairs = [[results.value(name, size, subject, "hit") for name in ("one-pattern", "mixed-paths")]
                 for subject in OURS]
        ratios = [quotient(*pair) for pair in pairs if None not in pair]
        worst = max(ratios, default=None)
        checks.append((f"{size:,}", worst, worst is not None and worst <= bound))
    return checks


def load_to_read(results, subject, bound):
    return [at_most(label, results.value(name, size, subject, "load"),
                    results.value(name, size, OURS[subject], "load"), bound)
            for name, size, label in places(results, TITLES)]


def linear(results, bound, few=10_000, many=1_000_000):
    """What an entry costs among many, in terms of what it costs among few."""
    checks = []
    for name in SYNTHETIC:
        for subject in OURS:
            label = f"{TITLES[name]}, {SUBJECTS[subject].title.partition(', ')[2]}"
            loads = [results.value(name, size, subject, "load") for size in (few, many)]
            base = loads[0] and loads[0] * many / few
            checks.append(at_most(label, loads[1], base, bound))
    return checks


def memory(results, factor, fixed, bound, measure="memory-loaded"):
    return [at_most(label, results.value(name, size, "kolvane-binary", measure),
                    factor * results.payload(name, size) + fixed, bound)
            for name, size, label in places(results, TITLES, least=10_000)]


def road(results, bound):
    size = 1000
    return [at_most("mixed 1,000", results.value("mixed-paths", size, "kernel-message", "hit"),
                    results.value("mixed-paths", size, "kolvane-utf16", "hit"), bound)]


def judge(results):
    return [
        verdict("hit ≤ 1.5 times the limit at 1,000 keys", hit_to_limit(results, 1.5, most=1000)),
        verdict("hit ≤ 1.25 times the limit at 10,000 keys and more", hit_to_limit(results, 1.25, least=10_000)),
        comparison("for comparison: hit, as a multiple of the limit with XXH3",
                   hit_to_limit(results, ANY, "limit-xxh3")),
        verdict("hit ≥ 1.5 times faster than the fastest peer up to 100,000 keys",
                hit_to_peers(results, 1.5, most=100_000)),
        verdict("hit ≥ 1.25 times faster than the fastest peer at 1,000,000 keys",
                hit_to_peers(results, 1.25, least=10**6)),
        verdict("hit in one pattern ≤ 1.2 times the hit in mixed paths", pattern_to_mixed(results, 1.2)),
        verdict("binary load ≤ 1.5 times the read of the same file", load_to_read(results, "kolvane-binary", 1.5)),
        verdict("UTF-16 text load ≤ 5 times the read of the same file", load_to_read(results, "kolvane-utf16", 5)),
        verdict("code-page text load ≤ 5 times the read of the same file", load_to_read(results, "kolvane-code-page", 5)),
        verdict("linear load: time per entry at 1,000,000 keys ≤ 2 times that at 10,000 keys", linear(results, 2)),
        verdict("peak memory after a binary load ≤ 1 times the budget: 1.3 times keys and values, "
                "plus 72 bytes per entry",
                memory(results, 1.3, 72, 1)),
        comparison("for comparison: the same after a lookup of every key",
                   memory(results, 1.3, 72, ANY, "memory-used")),
        verdict("hit by message ≤ 6 times the hit by direct call", road(results, 6)),
    ]
