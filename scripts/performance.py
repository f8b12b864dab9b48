#!/usr/bin/env python3
"""Runs the benchmark programs and writes docs/performance.md with its plots, whole.

A benchmark is named row/who/size, with who "ours", the name of a peer, or "bare" for the physical floor; the size is
left out where there is one only. Every program is run several times, its benchmarks in random order each time; ours
and the peer's of one run are a pair, and a figure of the document is the median of the pairs with its quartiles.
What is compared with what, and the goals, stand in performance_rows.json, with what profiles have shown: what was
mended for it, and what the remaining cost is made of.
"""

import argparse
import json
import math
import platform
import statistics
import subprocess
import sys
from pathlib import Path

ROWS_FILE = Path(__file__).with_name("performance_rows.json")
SECONDS_EACH = 0.05  # least time of one measurement
SECONDS = {"ns": 1e-9, "us": 1e-6, "ms": 1e-3, "s": 1.0}
PREFIXES = [(1e12, "T"), (1e9, "G"), (1e6, "M"), (1e3, "k"), (1, ""), (1e-3, "m"), (1e-6, "µ"), (1e-9, "n")]


class Measurements:
    """What several runs of one program measured: `runs` holds {benchmark: entry} of each."""

    def __init__(self, program, runs):
        print(f"running {program.name}", file=sys.stderr)
        self.runs = [run_once(program) for _ in range(runs)]

    def values(self, name, quantity):
        return [quantity_of(run[name], quantity) for run in self.runs]

    def median(self, name, quantity="seconds"):
        return statistics.median(self.values(name, quantity))

    def sizes(self, prefix):
        """The sizes of a benchmark as the last part of its name, or [None] where it has none."""
        names = self.runs[0]
        found = [name.removeprefix(prefix + "/") for name in names if name.startswith(prefix + "/")]
        return sorted(map(int, found)) or [None]


def run_once(program):
    command = [program, "--benchmark_format=json", "--benchmark_enable_random_interleaving=true"]
    output = subprocess.run([*command, f"--benchmark_min_time={SECONDS_EACH}"], check=True, stdout=subprocess.PIPE).stdout
    entries = json.loads(output)["benchmarks"]
    for entry in entries:
        if entry.get("error_occurred"):
            sys.exit(f"{entry['name']}: {entry['error_message']}")
    return {"/".join(part for part in entry["run_name"].split("/")[:3] if ":" not in part and "_time" not in part): entry
            for entry in entries}


def quantity_of(entry, quantity):
    """Processor seconds of an iteration (of child processes where the program measures those), or a counter."""
    if quantity != "seconds":
        return entry[quantity]
    is_manual = entry["run_name"].endswith("/manual_time")
    return entry["real_time" if is_manual else "cpu_time"] * SECONDS[entry["time_unit"]]


def sized(prefix, size):
    return prefix if size is None else f"{prefix}/{size}"


def engineering(value, unit=""):
    if value == 0:
        return f"0 {unit}".strip()
    factor, prefix = next(((f, p) for f, p in PREFIXES if abs(value) >= f), PREFIXES[-1])
    return f"{value / factor:.3g} {prefix}{unit}".strip()


def grouped(number):
    return f"{number:,}".replace(",", " ")


def keeps(value, goal):
    relation, bound = goal.split()
    return value <= float(bound) if relation == "<=" else value >= float(bound)


def verdict(value, goal, shown=None):
    return f"{shown or goal}: {'kept' if keeps(value, goal) else '**missed**'}" if goal else ""


def comparison_line(comparison, measured, size):
    """One line of a row's table: ours beside the peer's, and their paired ratio or difference."""
    quantity, unit = comparison.get("quantity", "seconds"), comparison.get("unit", "s")
    ours = measured.values(sized(comparison["ours"], size), quantity)
    peers = measured.values(sized(comparison["peer"], size), comparison.get("peer_quantity", quantity))
    is_difference = comparison.get("by") == "difference"
    pairs = [a - b if is_difference else a / b for a, b in zip(ours, peers)]
    lower, median, upper = statistics.quantiles(pairs, n=4)
    show = (lambda value: engineering(value, unit)) if is_difference else (lambda value: f"{value:.3g}")
    applies = size in comparison.get("goal_sizes", [size])
    goal, bound = comparison.get("goal", "") if applies else "", comparison.get("goal", "").split()[-1:]
    shown = f"{goal.split()[0]} {show(float(bound[0]))}" if goal else None
    of_size = f"; {grouped(size)} {comparison['size_unit']}" if size else ""
    cells = [comparison["what"] + of_size,
             engineering(statistics.median(ours), unit), engineering(statistics.median(peers), unit),
             show(median), f"{show(lower)} to {show(upper)}", verdict(median, goal, shown)]
    return "| " + " | ".join(cells) + " |"


def comparison_table(row, measured):
    lines = []
    for comparison in row.get("comparisons", []):
        common = set(measured.sizes(comparison["ours"])) & set(measured.sizes(comparison["peer"]))
        sizes = sorted(common & set(comparison.get("sizes", common)), key=lambda size: size or 0)
        lines += [comparison_line(comparison, measured, size) for size in sizes]
    header = ["| what, against what | ours | theirs | ratio or excess | quartiles | goal |", "|---|---|---|---|---|---|"]
    return [*header, *lines, ""] if lines else []


def fact_table(row, measured):
    lines = []
    for fact in row.get("facts", []):
        value = measured.median(fact["name"], fact.get("quantity", "seconds"))
        shown = engineering(value, fact.get("unit", ""))
        lines.append(f"| {fact['what']} | {shown} | {verdict(value, fact.get('goal', ''))} |")
    return ["| what | ours | goal |", "|---|---|---|", *lines, ""] if lines else []


def slope(points):
    """Of the line through the points in a log-log plot: the power by which time grows with size."""
    return statistics.linear_regression([math.log(x) for x, _ in points], [math.log(y) for _, y in points]).slope


def growth_lines(row, measured, images):
    lines = []
    for growth in row.get("growth", []):
        name = growth["ours"]
        points = [(size, measured.median(f"{name}/{size}")) for size in measured.sizes(name)]
        power = slope(points)
        picture = images / f"performance-{name.split('/')[0]}.svg"
        plot(points, f"{growth['what']}: slope {power:.2f}", growth["size"], picture)
        text = f"{growth['what']}, {grouped(points[0][0])} to {grouped(points[-1][0])} {growth['size']}: time grows"
        text += f" with size to the power of {power:.2f}"
        text += f" ({verdict(power, growth['slope_goal'])})." if "slope_goal" in growth else "."
        lines += [text, *cost_lines(growth, points), "", f"![{growth['what']}](images/{picture.name})", ""]
    return lines


def cost_lines(growth, points):
    """How even the time is once it is divided by what it is expected to grow with."""
    if "even_over" not in growth:
        return []
    divide = {"size": lambda x: x, "log size": math.log}[growth["even_over"]]
    costs = [y / divide(x) for x, y in points]
    if "spread_goal" in growth:
        spread = max(costs) / min(costs)
        return [f"Time divided by {growth['even_over']} spreads by {spread:.2f} ({verdict(spread, growth['spread_goal'])})."]
    rises = {size: cost / costs[0] for (size, _), cost in zip(points[1:], costs[1:])}
    goal_size = growth["goal_size"]
    rise = max(rise for size, rise in rises.items() if size <= goal_size)
    beyond = [f"{rise:.2f} times at {grouped(size)}" for size, rise in rises.items() if size > goal_size]
    text = f"Time divided by {growth['even_over']} is at most {rise:.2f} times that of the smallest up to"
    return [f"{text} {grouped(goal_size)} ({verdict(rise, growth['rise_goal'])}), and {' and '.join(beyond)}."]


class Axis:
    """A logarithmic axis of whole decades, from `start` to `end` in the picture."""

    def __init__(self, values, start, end):
        self.low = math.floor(math.log10(min(values)))
        self.high = max(math.ceil(math.log10(max(values))), self.low + 1)
        self.start, self.end = start, end

    def place(self, value):
        return self.start + (math.log10(value) - self.low) / (self.high - self.low) * (self.end - self.start)

    def decades(self):
        return [(10.0**power, self.place(10.0**power)) for power in range(self.low, self.high + 1)]


def plot(points, title, size_unit, path):
    """A log-log plot of (size, seconds) as an SVG picture."""
    width, height, left, top, bottom = 480, 300, 60, 40, 250
    across, up = Axis([x for x, _ in points], left, width - 20), Axis([y for _, y in points], bottom, top)
    parts = [
        f'<svg xmlns="http://www.w3.org/2000/svg" viewBox="0 0 {width} {height}" font-family="sans-serif" font-size="12">',
        f'<rect width="{width}" height="{height}" fill="white"/>',
        f'<text x="{width / 2}" y="24" text-anchor="middle" font-size="14">{title}</text>',
    ]
    for value, x in across.decades():
        parts.append(f'<path d="M{x:.1f} {top}V{bottom}" stroke="#ddd"/>')
        parts.append(f'<text x="{x:.1f}" y="{bottom + 18}" text-anchor="middle">{engineering(value)}</text>')
    for value, y in up.decades():
        parts.append(f'<path d="M{left} {y:.1f}H{width - 20}" stroke="#ddd"/>')
        parts.append(f'<text x="{left - 6}" y="{y + 4:.1f}" text-anchor="end">{engineering(value, "s")}</text>')
    places = [(across.place(x), up.place(y)) for x, y in points]
    line = " ".join(f"{x:.1f},{y:.1f}" for x, y in places)
    parts.append(f'<polyline points="{line}" fill="none" stroke="#1f77b4" stroke-width="2"/>')
    parts += [f'<circle cx="{x:.1f}" cy="{y:.1f}" r="3" fill="#1f77b4"/>' for x, y in places]
    parts += [f'<text x="{width / 2}" y="{height - 10}" text-anchor="middle">{size_unit}</text>', "</svg>"]
    path.parent.mkdir(parents=True, exist_ok=True)
    path.write_text("\n".join(parts) + "\n")


def row_section(row, measured, images):
    heading = [f"## {row['title']}", "", row["workload"], ""]
    tables = comparison_table(row, measured) + fact_table(row, measured)
    remarks = [line for key in ("mended", "remaining") if key in row for line in (row[key], "")]
    return heading + tables + growth_lines(row, measured, images) + remarks


def machine():
    names = [line.split(":", 1)[1].strip() for line in Path("/proc/cpuinfo").read_text().splitlines()
             if line.startswith("model name")]
    return f"{len(names)} cores of {names[0] if names else 'an unnamed processor'}, {platform.system()} {platform.machine()}"


def introduction(runs):
    return [
        "# Performance",
        "",
        f"Written by `scripts/bench.sh`, measured on {machine()}. Every figure is the median of {runs} runs; a ratio or "
        "an excess pairs ours with the peer's of the same run, with the quartiles of the pairs as its spread. Times are "
        "processor times of a release build. Theirs is a peer's program or the physical floor: the same work done by "
        "bare calls. `scripts/bench.sh ROW` measures one row anew and prints it.",
        "",
    ]


def main():
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("build", type=Path, help="build directory with the benchmark programs")
    parser.add_argument("document", type=Path, help="what is written, with images/ beside it")
    parser.add_argument("--runs", type=int, default=9)
    parser.add_argument("--only", metavar="ROW", help="measure this row alone and print its section")
    arguments = parser.parse_args()

    sections, measured = [], {}
    for row in json.loads(ROWS_FILE.read_text())["rows"]:
        if arguments.only in (None, row["row"]):
            program = arguments.build / "benchmarks" / row["program"]
            if program not in measured:
                measured[program] = Measurements(program, arguments.runs)
            sections += row_section(row, measured[program], arguments.document.parent / "images")
    text = "\n".join(introduction(arguments.runs) + sections).rstrip() + "\n"
    if arguments.only:
        print("\n".join(sections))
    else:
        arguments.document.write_text(text)


if __name__ == "__main__":
    main()
