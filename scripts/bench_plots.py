"""The plots of docs/benchmarks, as plain SVG."""
import math
from xml.sax.saxutils import escape

from bench_rows import SIZES

# Grey for the floor, one strong colour for Korvex, quieter ones for the peers.
COLOURS = {"floor": "#8a8a8a", "korvex": "#c2352b"}
PEERS = ("#3b6fb6", "#5aa469", "#c98a2b", "#7d5ba6", "#4aa6a6", "#a0756b")


def colour_of(names):
    """A colour for every name."""
    peers = sorted(name for name in names if name not in COLOURS)
    return {**COLOURS, **{name: PEERS[i % len(PEERS)] for i, name in enumerate(peers)}}


def text(x, y, words, anchor="start", size=12, weight="normal"):
    """A text at a place."""
    return (f'<text x="{x:.1f}" y="{y:.1f}" text-anchor="{anchor}" font-size="{size}" '
            f'font-weight="{weight}">{escape(str(words))}</text>')


def image(width, height, parts):
    """The whole image, on white, so that it reads on dark pages too."""
    return (f'<svg xmlns="http://www.w3.org/2000/svg" viewBox="0 0 {width} {height}" '
            f'width="{width}" height="{height}" font-family="sans-serif" fill="#222">\n'
            f'<rect width="{width}" height="{height}" fill="#fff"/>\n' + "\n".join(parts) + "\n</svg>\n")


def legend(names, colours, x, y):
    """Names beside their colours, in one line."""
    parts = []
    for name in names:
        parts.append(f'<rect x="{x}" y="{y - 10}" width="12" height="12" fill="{colours[name]}"/>')
        parts.append(text(x + 17, y, name))
        x += 34 + 7 * len(name)
    return parts


def bars(title, groups, unit, x, y, width, height):
    """Groups of bars side by side; each group is (label, value by name). Bars that would dwarf the
    others are cut, and every bar says its value."""
    colours = colour_of(dict.fromkeys(name for _, by in groups for name in by))
    top = min(max(max(by.values()) for _, by in groups), 3.2 * max(by["floor"] for _, by in groups))
    parts = [text(x, y - 8, f"{title}, {unit}", weight="bold")]
    step = width / len(groups)
    for g, (label, by) in enumerate(groups):
        bar = min(34, (step - 14) / len(by))
        for i, (name, value) in enumerate(by.items()):
            tall = 0.93 * height * min(value, top) / top  # the title stands above
            left = x + g * step + i * bar
            parts.append(f'<rect x="{left:.1f}" y="{y + height - tall:.1f}" width="{bar - 2:.1f}" '
                         f'height="{tall:.1f}" fill="{colours[name]}"/>')
            shown = f"{value / 1000:.1f}k" if value >= 10000 else f"{value:.0f}"
            parts.append(text(left + bar / 2 - 1, y + height - tall - 3, shown, "middle", 9))
        parts.append(text(x + g * step, y + height + 16, label))
    parts.append(f'<line x1="{x}" y1="{y + height}" x2="{x + width}" y2="{y + height}" stroke="#444"/>')
    return parts


def medians(results, row, metric="ns"):
    """Medians by name."""
    return {name: f["median"] for name, f in results["rows"][row][metric].items()}


def layouts(results):
    """Cost per message by layout."""
    rows = (("message", "%m%n"), ("dated", "%d [%t] %-5p %c: %m%n"), ("null", "the same, /dev/null"),
            ("rotation", "the same, rotation"))
    groups = [(label, medians(results, row)) for row, label in rows]
    names = list(dict.fromkeys(name for _, by in groups for name in by))
    return image(900, 360, legend(names, colour_of(names), 40, 24) +
                 bars("Cost per message", groups, "ns", 40, 70, 820, 250))


def threads(results):
    """Messages a second of all threads together, and the 99th percentile of a call."""
    rate, p99 = [], []
    for n in (n for n in (1, 2, 4, 8, 16) if f"threads-{n}" in results["rows"]):
        label = f"{n} thread{'s' if n > 1 else ''}"
        by = medians(results, f"threads-{n}")
        rate.append((label, {name: 1e6 / ns for name, ns in by.items()}))
        p99.append((label, medians(results, f"threads-{n}", "p99")))
    names = list(rate[0][1])
    return image(900, 620, legend(names, colour_of(names), 40, 24) +
                 bars("Throughput", rate, "thousand messages a second", 40, 70, 820, 220) +
                 bars("99th percentile of a call", p99, "ns", 40, 360, 820, 220))


def curves(title, results, kind, colours, x, y, width, height):
    """Nanoseconds by number of records, both logarithmic."""
    by_name = {}
    for n in SIZES:
        for name, ns in medians(results, f"{kind}-{n}").items():
            by_name.setdefault(name, []).append((n, ns))
    every = [ns for points in by_name.values() for _, ns in points]
    low, high = math.floor(math.log10(min(every))), math.ceil(math.log10(max(every)))

    def place(n, ns):
        across = (math.log10(n) - 2) / 4
        up = (math.log10(ns) - low) / (high - low)
        return f"{x + across * width:.1f},{y + height - up * height:.1f}"

    parts = [text(x, y - 10, title, weight="bold")]
    for decade in range(low, high + 1):
        level = y + height - (decade - low) / (high - low) * height
        parts.append(f'<line x1="{x}" y1="{level:.1f}" x2="{x + width}" y2="{level:.1f}" stroke="#ddd"/>')
        parts.append(text(x - 6, level + 4, f"{10 ** decade:,}", "end", 10))
    for n in SIZES:
        parts.append(text(x + (math.log10(n) - 2) / 4 * width, y + height + 16, f"{n:,}", "middle", 10))
    for name, points in reversed(by_name.items()):  # the floor and Korvex on top
        path = " ".join(place(n, ns) for n, ns in points)
        thick = 3 if name in COLOURS else 1.5
        parts.append(f'<polyline points="{path}" fill="none" stroke="{colours[name]}" '
                     f'stroke-width="{thick}"/>')
    return parts


def store(results):
    """Four operations by number of records."""
    names = list(results["rows"]["load-100"]["ns"])
    colours = colour_of(names)
    parts = legend(names, colours, 40, 24)
    kinds = (("load", "load, ns a record"), ("save", "save, ns a record"), ("get", "get, ns"),
             ("enumerate", "enumerate 10 matches, ns"))
    for i, (kind, title) in enumerate(kinds):
        parts += curves(title, results, kind, colours, 70 + i % 2 * 430, 75 + i // 2 * 280, 360, 200)
    return image(900, 600, parts)


def plots(results):
    """Every plot by its file's name."""
    return {"layouts.svg": layouts(results), "threads.svg": threads(results),
            "store.svg": store(results)}
