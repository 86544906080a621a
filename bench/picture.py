"""The picture of docs/performance.md: the time of a hit by the number of keys, both logarithmic."""

import collections
import math


WIDTH, HEIGHT = 760, 460
LEFT, RIGHT, TOP, BOTTOM = 62, 586, 64, 408
SET = "mixed-paths"

Line = collections.namedtuple("Line", "subject label light dark style")

# Solid lines give UTF-16, dashed ones UTF-8, and the dotted one is the limit.
LINES = [
    Line("kolvane-binary", "Kolvane", "#0b62d6", "#6cb2ff", "ours"),
    Line("limit", "limit: a bare map", "#6b6b6b", "#a8a8a8", "dotted"),
    Line("icu", "ICU", "#b3470b", "#f2955c", ""),
    Line("qt", "Qt", "#2b7a3b", "#72c987", ""),
    Line("gettext", "gettext (UTF-8)", "#8a2f8f", "#d991de", "dashed"),
    Line("boost-locale", "Boost.Locale (UTF-8)", "#8a6a00", "#d9b945", "dashed"),
]

STYLE = """\
text { font-family: system-ui, -apple-system, "Segoe UI", sans-serif; font-size: 13px; fill: #333; }
.title { font-size: 16px; font-weight: 600; }
.background { fill: #fff; }
.grid { stroke: #ddd; stroke-width: 1; }
.line { fill: none; stroke-width: 2; stroke-linejoin: round; }
.ours { stroke-width: 4; }
.label-ours { font-weight: 600; }
.dashed { stroke-dasharray: 7 4; }
.dotted { stroke-dasharray: 2 4; stroke-linecap: round; }
"""

DARK = """\
text { fill: #ddd; }
.background { fill: #14171c; }
.grid { stroke: #3a3f47; }
"""


def colours(attribute):
    return "".join(
        f".{line.subject} {{ stroke: {getattr(line, attribute)}; }}\n"
        f".{line.subject}-fill {{ fill: {getattr(line, attribute)}; }}\n" for line in LINES)


def style():
    return f"{STYLE}{colours('light')}@media (prefers-color-scheme: dark) {{\n{DARK}{colours('dark')}}}\n"


class Scale:
    """From logarithms to pixels."""

    def __init__(self, low, high, start, end):
        self.low, self.high, self.start, self.end = math.log10(low), math.log10(high), start, end

    def __call__(self, value):
        share = (math.log10(value) - self.low) / max(self.high - self.low, 1e-9)
        return self.start + share * (self.end - self.start)


def steps(low, high):
    """1, 2 and 5 times the powers of ten, from one at or below `low` to one at or above `high`."""
    all_steps = [factor * 10**power for power in range(0, 8) for factor in (1, 2, 5)]
    first = max(step for step in all_steps if step <= low)
    last = min(step for step in all_steps if step >= high)
    return [step for step in all_steps if first <= step <= last]


def curves(results):
    """The points of each line that has any."""
    found = {}
    for line in LINES:
        points = [(size, results.value(SET, size, line.subject, "hit")) for size in results.sizes(SET)]
        points = [point for point in points if point[1] is not None]
        if points:
            found[line] = points
    return found


def spread(places, gap):
    """Moves labels apart, in their order, as little as that takes."""
    order = sorted(places, key=places.get)
    moved = {}
    for key in order:
        moved[key] = max([places[key]] + [moved[other] + gap for other in moved])
    overshoot = max(moved.values()) - BOTTOM
    for key in reversed(order):
        if overshoot <= 0:
            break
        moved[key] -= overshoot
        below = [moved[other] for other in order[order.index(key) + 1:]]
        moved[key] = min([moved[key]] + [place - gap for place in below])
    return moved


def grid(x_scale, y_scale, sizes, times):
    parts = []
    for time in times:
        y = y_scale(time)
        parts.append(f'<path class="grid" d="M{LEFT} {y:.1f}H{RIGHT}"/>'
                     f'<text x="{LEFT - 8}" y="{y + 4:.1f}" text-anchor="end">{time:,}</text>')
    for size in sizes:
        parts.append(f'<text x="{x_scale(size):.1f}" y="{BOTTOM + 22}" text-anchor="middle">{size:,}</text>')
    return parts


def curve(line, points, x_scale, y_scale):
    places = [(x_scale(size), y_scale(time)) for size, time in points]
    path = "M" + "L".join(f"{x:.1f} {y:.1f}" for x, y in places)
    radius = 5 if line.style == "ours" else 3.5
    dots = "".join(f'<circle class="{line.subject}-fill" cx="{x:.1f}" cy="{y:.1f}" r="{radius}"/>'
                   for x, y in places)
    return f'<path class="line {line.subject} {line.style}" d="{path}"/>{dots}'


def labels(found, y_scale):
    ends = spread({line: y_scale(points[-1][1]) for line, points in found.items()}, 18)
    for line, y in ends.items():
        weight = " label-ours" if line.style == "ours" else ""
        yield (f'<text class="{line.subject}-fill{weight}" x="{RIGHT + 12}" y="{y + 4:.1f}">'
               f"{line.label}</text>")


def draw(results):
    found = curves(results)
    times = [time for points in found.values() for _, time in points] or [10, 100]
    sizes = results.sizes(SET) or [1000]
    marks = steps(min(times), max(times))
    x_scale = Scale(sizes[0], sizes[-1], LEFT + 16, RIGHT - 8)
    y_scale = Scale(marks[0], marks[-1], BOTTOM, TOP)
    parts = [f'<svg xmlns="http://www.w3.org/2000/svg" viewBox="0 0 {WIDTH} {HEIGHT}" width="{WIDTH}" '
             f'height="{HEIGHT}" role="img" aria-label="Time of a lookup by number of keys">',
             f"<style>\n{style()}</style>", f'<rect class="background" width="{WIDTH}" height="{HEIGHT}"/>',
             f'<text class="title" x="{LEFT}" y="28">Time of a lookup, by number of keys</text>',
             f'<text x="{LEFT}" y="48">nanoseconds, the answer copied; mixed paths; less is better</text>']
    parts += grid(x_scale, y_scale, sizes, marks)
    parts += [curve(line, points, x_scale, y_scale) for line, points in found.items()]
    parts += labels(found, y_scale) if found else []
    parts.append(f'<text x="{(LEFT + RIGHT) / 2}" y="{HEIGHT - 10}" text-anchor="middle">keys in the dictionary'
                 "</text></svg>")
    return "\n".join(parts) + "\n"


