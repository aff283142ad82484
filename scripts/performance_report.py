#!/usr/bin/python3
"""Writes docs/performance.md and its plots from the measurements of scripts/bench.sh.

The prose of the page is in performance.template.md, beside this script.

usage: performance_report.py RESULTS_FOLDER CLIENT_FOLDER DOCS_FOLDER
"""

import io
import json
import math
import re
import statistics
import sys
from collections import namedtuple
from pathlib import Path

import client_performance
import matplotlib

matplotlib.use("svg")
import matplotlib.pyplot as plt  # noqa: E402

LIBRARY = "this library"
RETURNING = "this library, value returned"
WALK = "hand-written walk"
WALK_IN_PLACE = "hand-written walk, in place"
FRESH = "XPath, fresh"
COMPILED = "XPath, compiled"
LISTED = "XPath, fresh, into a list"
LIBXMLPP = "libxml++"
BOOST = "Boost.PropertyTree"
POCO = "Poco XMLConfiguration"
PUGIXML = "pugixml"
TINYXML = "TinyXML-2"
OTHERS = (PUGIXML, TINYXML, POCO, BOOST, LIBXMLPP)

PLAIN = "look up, match at sibling"
CONDITION = "look up with a condition, match at sibling"
TEXTS = "look up, values collected"
LEVELS = "look up, levels"
AND_TERMS = "look up with a condition, terms joined by &"
OR_TERMS = "look up with a condition, terms joined by |"
UPDATE = "update one value in a document of 100 KB"
SAVE = UPDATE + " and save"
ITERATE = "iterate over 10000 children"
LIST = "list 10000 children"
FIND_CHILD = "find a child by name, match at sibling"
ATTRIBUTES = "list four attributes"
QUERY_NAME = "find 200 nodes by XPath, by name"
QUERY_VALUE = "find 200 nodes by XPath, among 1000 by value"


class Results:
    """The measurements, by workload and implementation."""

    def __init__(self, folder):
        rounds = {}
        for path in sorted(folder.glob("time-*.json")):
            measured = json.loads(path.read_text())
            self.context = measured["context"]
            number = path.stem.split("-")[1]
            rounds.setdefault(number, {}).update(medians(measured["benchmarks"]))
        self.rounds = list(rounds.values())
        self.times = {name: statistics.median(round[name] for round in self.rounds) for name in self.rounds[0]}
        self.allocations = json.loads((folder / "allocations.json").read_text())
        self.instructions = counts(folder / "instructions.txt")
        self.as_it_is = counts(folder / "as_it_is.txt")
        self.without = {variant: counts(folder / f"{variant}.txt") for variant in ("no_gates",)}

    def workloads(self):
        return list(dict.fromkeys(split(name)[0] for name in self.times))

    def implementations(self, workload):
        return [split(name)[1] for name in self.times if split(name)[0] == workload]

    def sizes(self, workload, first=1):
        """The workload's names with each size from the first on, for those that were measured with one."""
        found = (re.fullmatch(re.escape(workload) + r" (\d+)", name) for name in self.workloads())
        return [match[0] for match in sorted(found_ones(found), key=size_of) if size_of(match) >= first]

    def ratio(self, workload, implementation, reference, of="times"):
        """The median of the ratios of the rounds: what disturbs a round disturbs both sides of a ratio."""
        return statistics.median(self.ratios(workload, implementation, reference, of))

    def ratios(self, workload, implementation, reference, of="times"):
        """The ratio in each of the rounds; the only one of what repeats."""
        values = self.rounds if of == "times" else [getattr(self, of)]
        one, other = f"{workload}/{implementation}", f"{workload}/{reference}"
        return [round[one] / round[other] for round in values]


def found_ones(matches):
    return (match for match in matches if match)


def size_of(match):
    return int(match[1])


def medians(benchmarks):
    """The median time of each benchmark in nanoseconds, in the order of their registration."""
    times = {}
    for run in sorted(benchmarks, key=lambda run: run["family_index"]):
        if run["run_type"] == "iteration":
            nanoseconds = run["cpu_time"] * {"ns": 1, "us": 1e3, "ms": 1e6, "s": 1e9}[run["time_unit"]]
            times.setdefault(run["name"], []).append(nanoseconds)
    return {name: statistics.median(values) for name, values in times.items()}


def split(name):
    workload, implementation = name.rsplit("/", 1)
    return workload, implementation


def counts(path):
    lines = (line.split("\t") for line in path.read_text().splitlines())
    return {name: int(count) for count, name in lines}


# --- Targets

# A few allocations come and go: the engine seeds the tables of each parse anew.
FEW_MORE = "10 more"

Check = namedtuple("Check", "workload implementation reference of limit faster")
Check.__new__.__defaults__ = ("times", 0, False)
Target = namedtuple("Target", "operation against limit checks note")
Target.__new__.__defaults__ = (None,)
Note = namedtuple("Note", "words workload implementation reference")


def at_most(limit, workloads, implementations=(LIBRARY,), reference=WALK, of="times"):
    return [Check(w, i, reference, of, limit, False) for w in workloads for i in implementations]


def at_least(limit, workloads, reference):
    return [Check(w, LIBRARY, reference, "times", limit, True) for w in workloads]


def with_limits(make, limits, *arguments):
    """The checks of a condition at each of these numbers of siblings, each with its own limit."""
    return [check for size, limit in limits.items() for check in make(limit, [f"{CONDITION} {size}"], *arguments)]


def targets(results):
    both = (LIBRARY, RETURNING)
    loads = [w for w in results.workloads() if w.startswith("load")]
    largest = f"{CONDITION} 100000"
    terms = results.sizes(AND_TERMS) + results.sizes(OR_TERMS)
    return [
        Target("load, read one value, destroy", "the walk after the same parse", "1.03×",
               at_most(1.03, loads)),
        Target("the same, allocations", "the walk after the same parse", "the same",
               at_most(FEW_MORE, loads, of="allocations")),
        Target("look up, match at the only sibling", "the walk", "1.7×",
               at_most(1.7, [f"{PLAIN} 1"], both)),
        Target("look up, match at sibling 10 and beyond", "the walk", "1.1×",
               at_most(1.1, results.sizes(PLAIN, 10), both)),
        Target("the same from 1,000 on, instructions", "the walk", "1.2×",
               at_most(1.2, results.sizes(PLAIN, 1000), both, of="instructions")),
        Target("look up with a condition, 10 / 1,000 / 100,000 siblings", "the walk, with `xmlGetProp` on each",
               "0.6× / 0.4× / 0.5×", with_limits(at_most, {10: 0.6, 1000: 0.4, 100000: 0.5}, both)),
        Target("the same from 1,000 on", "the walk, attributes in place", "1.2×",
               at_most(1.2, [f"{CONDITION} 1000", f"{CONDITION} 100000"], both, WALK_IN_PLACE)),
        Target("collect one value", "the walk", "1.4×", at_most(1.4, [f"{TEXTS} 1"])),
        Target("collect 100 and more", "the walk", "1.1×", at_most(1.1, results.sizes(TEXTS, 100))),
        Target("2 to 250 levels", "the walk", "3×",
               at_most(3, results.sizes(LEVELS), both)),
        Target("conditions of 1 to 10,000 terms", "the walk, with the terms split beforehand", "3×",
               at_most(3, terms, both)),
        Target("update one value", "a walk of the whole tree", "1.25×", at_most(1.25, [UPDATE])),
        Target("update and save", "the same with `xmlSaveFileEnc`", "1.08×", at_most(1.08, [SAVE])),
        Target("iterate over children through handles", "`xmlNextElementSibling`", "2.5×", at_most(2.5, [ITERATE])),
        Target("`Children()`", "a list of raw pointers", "1.25×", at_most(1.25, [LIST])),
        Target("`FindChildNode()`, match at sibling 10", "the walk", "1.15×",
               at_most(1.15, [f"{FIND_CHILD} 10"])),
        Target("`FindChildNode()`, at 1,000 and beyond", "the walk", "1.08×",
               at_most(1.08, results.sizes(FIND_CHILD, 1000))),
        Target("`GetAttributeItems()` of four", "a list of pairs of strings", "1.9×", at_most(1.9, [ATTRIBUTES])),
        Target("`FindAllNodes()`, 200 by name", "the evaluation, into a list of raw pointers", "1.05×",
               at_most(1.05, [QUERY_NAME], reference=LISTED)),
        Target("`FindAllNodes()`, 200 among 1,000 by value", "the evaluation alone", "1.25×",
               at_most(1.25, [QUERY_VALUE], reference=FRESH)),
        Target("look up with a condition, 10 / 1,000 / 100,000 siblings", "XPath, compiled",
               "10 / 10 / 3 times as fast", with_limits(at_least, {10: 10, 1000: 10, 100000: 3}, COMPILED),
               Note("the walk", largest, COMPILED, WALK)),
        Target("the same", "libxml++", "15 / 10 / 3 times as fast",
               with_limits(at_least, {10: 15, 1000: 10, 100000: 3}, LIBXMLPP),
               Note("the walk", largest, LIBXMLPP, WALK)),
    ]


def measured(results, checks):
    """What was measured of the checks: a list of (figure, check)."""
    figures = []
    for check in checks:
        if f"{check.workload}/{check.reference}" not in getattr(results, check.of):
            continue
        ratio = results.ratio(check.workload, check.implementation, check.reference, check.of)
        figures.append((1 / ratio if check.faster else ratio, check))
    return figures


def worst(figures):
    """The one that comes closest to its limit or misses it most."""
    def share(entry):
        figure, check = entry
        return figure / check.limit if isinstance(check.limit, (int, float)) else figure
    return (min if figures[0][1].faster else max)(figures, key=share)


def spread(results, check):
    """The least and the most that single rounds measured; nothing of what repeats."""
    if check.of != "times":
        return ""
    ratios = results.ratios(check.workload, check.implementation, check.reference)
    figures = sorted(1 / ratio if check.faster else ratio for ratio in ratios)
    digits = 1 if check.faster else 2
    return f"{figures[0]:.{digits}f} to {figures[-1]:.{digits}f}"


def is_kept(results, figure, check):
    if check.limit == FEW_MORE:
        own, reference = (results.allocations[f"{check.workload}/{i}"] for i in (check.implementation, check.reference))
        return own <= reference + 10
    return figure >= check.limit if check.faster else figure <= check.limit


def target_rows(results):
    for target in targets(results):
        figures = measured(results, target.checks)
        if not figures:
            yield [target.operation, target.against, target.limit, "not measured", "", ""]
            continue
        figure, check = worst(figures)
        note = note_text(results, target.note)
        where = "" if len(target.checks) == 1 else f" ({place(check, target)})"
        shown = f"{figure:.1f} times" if check.faster else f"{figure:.2f}×"
        kept = [c for f, c in figures if is_kept(results, f, c)]
        yield [target.operation, target.against, target.limit, shown + where + note, spread(results, check),
               partial_verdict(kept, figures, target)]
    yield from growth_targets(results)
    name, percent = dearest_lookup(results, "no_gates")
    yield ["log gates, instructions of a lookup", "a build without them", "5 %",
           f"{percent:.1f} % ({escape(name)})", "", verdict(percent <= 5)]


def growth_targets(results):
    """One row for each kind of growth that has to be linear; beginnings weigh, so that less than 1 is usual."""
    for name, curves in (("levels", (LEVELS,)), ("terms", (AND_TERMS, OR_TERMS))):
        exponents = [(exponent(results.instructions, curve, LIBRARY), curve)
                     for curve in CURVES if curve.workload in curves]
        steepest, curve = max(exponents, key=lambda entry: entry[0])
        where = "" if len(exponents) == 1 else f" ({escape(curve.title)})"
        yield [f"growth with the number of {name}, instructions", "a straight line, fitted exponent", "1.02",
               f"{steepest:.3f}{where}", "", verdict(steepest <= 1.02)]


def verdict(kept):
    return "kept" if kept else "**missed**"


def partial_verdict(kept, figures, target):
    if not kept or len(kept) == len(figures):
        return verdict(kept)
    return "**missed**; kept at " + ", ".join(place(check, target) for check in kept)


def note_text(results, note):
    """The same figure for another implementation, for comparison with that of the library."""
    if note is None:
        return ""
    ratio = results.ratio(note.workload, note.implementation, note.reference)
    size = note.workload.rsplit(" ", 1)[1]
    where = f" at {size}" if size.isdigit() else ""
    times = f"{ratio:.1f} times" if note.reference == WALK else f"{ratio:.2f}×"
    return f"; {note.words}{where}: {times}"


def place(check, target):
    """Which of a target's checks it is, in few words."""
    words = check.workload.removeprefix("load and read, ")
    for known, short in ((AND_TERMS, "terms joined by &"), (OR_TERMS, "terms joined by \\|")):
        if words.startswith(known):
            return words.replace(known + " ", "") + " " + short
    words = re.sub(r".* (sibling|levels|collected) (\d+)$", r"\2", words)
    several = {c.implementation for c in target.checks}
    return words + (", returned" if len(several) > 1 and check.implementation == RETURNING else "")


# --- Growth

Curve = namedtuple("Curve", "title workload unit first")
CURVES = [
    Curve("siblings", PLAIN, "siblings", 100),
    Curve("siblings, with a condition", CONDITION, "siblings", 100),
    Curve("values collected", TEXTS, "values", 100),
    Curve("levels", LEVELS, "levels", 10),
    Curve("terms joined by &", AND_TERMS, "terms", 10),
    Curve("terms joined by |", OR_TERMS, "terms", 10),
]


def points(values, curve, implementation):
    pattern = re.compile(re.escape(curve.workload) + r" (\d+)/" + re.escape(implementation) + "$")
    found = ((pattern.match(name), value) for name, value in values.items())
    return sorted((int(match[1]), value) for match, value in found if match)


def exponent(values, curve, implementation):
    """The slope of a straight line through the logarithms, from the curve's first point on."""
    line = [(math.log(x), math.log(y)) for x, y in points(values, curve, implementation) if x >= curve.first]
    mean_x = statistics.mean(x for x, _ in line)
    mean_y = statistics.mean(y for _, y in line)
    return sum((x - mean_x) * (y - mean_y) for x, y in line) / sum((x - mean_x) ** 2 for x, _ in line)


def growth_rows(results):
    for curve in CURVES:
        sizes = [x for x, _ in points(results.times, curve, LIBRARY) if x >= curve.first]
        row = [escape(curve.title), f"{sizes[0]:,} to {sizes[-1]:,}"]
        for values in (results.instructions, results.times):
            for implementation in (LIBRARY, WALK):
                row.append(f"{exponent(values, curve, implementation):.3f}")
        yield row


# --- Text

def escape(text):
    return text.replace("|", "\\|")


def table(header, rows):
    lines = ["| " + " | ".join(header) + " |"]
    lines.append("| " + " | ".join("---" if i == 0 else "---:" for i in range(len(header))) + " |")
    lines += ["| " + " | ".join(row) + " |" for row in rows]
    return "\n".join(lines)


def text_table(header, rows):
    return table(header, rows).replace("---:", "---")


def time_text(nanoseconds):
    for limit, unit in ((1e3, "ns"), (1e6, "µs"), (1e9, "ms")):
        if nanoseconds < limit:
            value = nanoseconds / (limit / 1e3)
            return f"{value:.{max(0, 2 - int(math.log10(max(value, 1))))}f} {unit}"
    return f"{nanoseconds / 1e9:.2f} s"


def ratio_text(ratio):
    """Two places, and for what is far from one three digits that count."""
    if 0.1 <= ratio < 100:
        return f"{ratio:.2f}×"
    return f"{ratio:,.0f}×" if ratio >= 100 else f"{float(f'{ratio:.2g}'):.{1 - math.floor(math.log10(ratio))}f}×"


def workload_rows(results, workload):
    names = results.implementations(workload)
    order = [LIBRARY, RETURNING, WALK, WALK_IN_PLACE, FRESH, LISTED, COMPILED]
    names.sort(key=lambda name: (order.index(name) if name in order else len(order), name))
    for name in names:
        key = f"{workload}/{name}"
        counted = results.instructions.get(key)
        yield [
            name,
            time_text(results.times[key]),
            ratio_text(results.ratio(workload, name, WALK)),
            f"{results.allocations[key]:,}",
            f"{counted:,}" if counted is not None else "",
            ratio_text(results.ratio(workload, name, WALK, "instructions")) if counted is not None else "",
        ]


def workload_tables(results, workloads):
    header = ["", "time", "to the walk", "allocations", "instructions", "to the walk"]
    parts = []
    for workload in workloads:
        parts.append(f"#### {workload[0].upper() + workload[1:]}\n\n{table(header, workload_rows(results, workload))}")
    return "\n\n".join(parts)


def loading_rows(results):
    """For each other library, its speed relative to this one in the least and in the most favorable file."""
    for name in OTHERS:
        factors = [1 / results.ratio(workload, name, LIBRARY) for workload in results.workloads()
                   if workload.startswith("load and read") and f"{workload}/{name}" in results.times]
        yield [name, f"{min(factors):.1f}", f"{max(factors):.1f}"]


# The operations that the verdict lists.
STANDING = ["load and read, 100 KB", f"{PLAIN} 10", f"{PLAIN} 1000", f"{CONDITION} 10", f"{CONDITION} 1000",
            UPDATE, SAVE, ITERATE, f"{FIND_CHILD} 10", QUERY_NAME]


def standing_rows(results):
    """For each operation, the libraries that are faster and those that are slower, with their factors."""
    for workload in STANDING:
        ratios = {name: results.ratio(workload, name, LIBRARY) for name in OTHERS
                  if f"{workload}/{name}" in results.times}
        ordered = sorted(ratios.items(), key=lambda entry: entry[1])
        yield [workload, ratio_text(results.ratio(workload, LIBRARY, WALK)),
               ", ".join(f"{name} {ratio_text(ratio)}" for name, ratio in ordered if ratio < 1),
               ", ".join(f"{name} {ratio_text(ratio)}" for name, ratio in ordered if ratio >= 1)]


def missed_text(rows):
    """The targets that are not met, by operation and reference."""
    missed = [f"{row[0]} (relative to {row[1]})" for row in rows if "missed" in row[-1]]
    return f"Missed: {'; '.join(missed)}." if missed else ""


def price(results, variant, name):
    """What an operation pays for what the variant leaves out, in percent of its instructions there."""
    return (results.as_it_is[name] / results.without[variant][name] - 1) * 100


def price_rows(results):
    for name, whole in results.as_it_is.items():
        workload, _ = split(name)
        if not re.search(r"(\D|\b(1|2|4|6|10|1000|250))$", workload):
            continue
        yield [escape(operation_text(name)), f"{whole:,}"] + [
            cell for variant, bare in results.without.items()
            for cell in (f"{bare[name]:,}", f"{price(results, variant, name):.1f} %")]


def dearest_lookup(results, variant):
    """The lookup that pays most for what the variant leaves out, and how much."""
    name = max((name for name in results.as_it_is if name.startswith("look up")),
               key=lambda name: price(results, variant, name))
    return operation_text(name), price(results, variant, name)


def operation_text(name):
    workload, implementation = split(name)
    return workload + (", value returned" if implementation == RETURNING else "")


def caches(context):
    return ", ".join(f"L{cache['level']} {cache['size'] // 1024:,} KB" for cache in context["caches"]
                     if cache["type"] != "Instruction")


def versions(results):
    prefix = "version of "
    return ", ".join(f"{key.removeprefix(prefix)} {value}"
                     for key, value in results.context.items() if key.startswith(prefix))


# In the page and in the plot.
SECTIONS = [
    ("Load a file and read one value", "load and read"),
    ("Look up on a loaded document", "look up,"),
    ("Look up with a condition", "look up with"),
    ("Update", "update"),
    ("Nodes", ("iterate", "list", "find a child")),
    ("XPath", "find 200"),
]

TEMPLATE = Path(__file__).with_name("performance.template.md")


def page(results, client):
    workloads = results.workloads()
    small = [w for w in workloads if len(results.implementations(w)) > 3 or not w.startswith("look up")]
    parts = []
    for title, prefix in SECTIONS:
        chosen = [w for w in small if w.startswith(prefix)]
        if chosen:
            parts.append(f"### {title}\n\n{workload_tables(results, chosen)}")
    context = results.context
    targets_table = list(target_rows(results))
    return TEMPLATE.read_text().format(
        date=context["date"][:10],
        processor=context["processor"],
        cpus=context["num_cpus"],
        mhz=context["mhz_per_cpu"],
        caches=caches(context),
        flags=context["flags"],
        system=context["system"],
        compiler=context["compiler"],
        versions=versions(results),
        rounds=len(results.rounds),
        kept=sum(row[-1] == "kept" for row in targets_table),
        total=len(targets_table),
        missed=missed_text(targets_table),
        standing=text_table(["operation", "to the walk", "faster", "slower"], standing_rows(results)),
        targets=text_table(["operation", "measured against", "at most", "measured", "single rounds", ""],
                           targets_table),
        loading=table(["library", "least favorable file", "most favorable file"], loading_rows(results)),
        tables="\n\n".join(parts),
        client=client_performance.section_of(client),
        growth=table(["with the number of", "sizes", "instructions", "of the walk", "time", "of the walk"],
                     growth_rows(results)),
        prices=table(["operation", "as it is", "without gates", "price"],
                     price_rows(results)),
        gate_price=dearest_lookup(results, "no_gates"),
        example=f"{CONDITION} 1000/{LIBRARY}",
    )


# --- Plots

# Libraries differ by shape as well as by color.
Mark = namedtuple("Mark", "color shape")
MARKS = {LIBRARY: Mark("#c1121f", "D"), FRESH: Mark("#7fb3d5", "v"), COMPILED: Mark("#2471a3", "^"),
         POCO: Mark("#8e44ad", "s"), BOOST: Mark("#af7ac5", "*"), PUGIXML: Mark("#229954", "o"),
         TINYXML: Mark("#82c99a", "X"), LIBXMLPP: Mark("#d68910", "P"), WALK: Mark("#444444", "s")}


# Text stays text, which keeps the files small.
plt.rcParams.update({"svg.hashsalt": "fixed", "svg.fonttype": "none", "font.family": "sans-serif"})


# A page with its plots loads at once over a slow line, and a change of a plot stays readable.
LARGEST_PLOT = 60_000


def save(figure, path):
    drawing = io.StringIO()
    figure.savefig(drawing, format="svg", metadata={"Date": None}, bbox_inches="tight")
    plt.close(figure)
    svg = compact(drawing.getvalue())
    if len(svg) > LARGEST_PLOT:
        sys.exit(f"{path.name} would have {len(svg):,} bytes, more than {LARGEST_PLOT:,}")
    path.write_text(svg)


def compact(svg):
    """The same drawing without indentation and comments, and with coordinates to a tenth of a point."""
    rounded = re.sub(r"\d+\.\d{2,}", lambda number: f"{float(number[0]):.1f}", svg)
    return re.sub(r"^ +|<!--.*?-->\n", "", rounded, flags=re.M)


def calm_grid(axes):
    """Lines at the major ticks only, and no tick marks beside them."""
    axes.minorticks_off()
    axes.tick_params(bottom=False, left=False)
    axes.grid(alpha=0.3, zorder=0)


def plot_ratios(results, path):
    workloads = [w for _, prefix in SECTIONS for w in results.workloads()
                 if w.startswith(prefix) and len(set(results.implementations(w)) & set(MARKS)) > 2][::-1]
    figure, axes = plt.subplots(figsize=(10, 0.32 * len(workloads) + 1.5))
    for name, mark in MARKS.items():
        if name == WALK:
            continue
        known = [(results.ratio(w, name, WALK), row) for row, w in enumerate(workloads)
                 if f"{w}/{name}" in results.times]
        if known:
            axes.scatter(*zip(*known), color=mark.color, marker=mark.shape, label=name, zorder=3,
                         s=60 if name == LIBRARY else 36)
    axes.axvline(1, color=MARKS[WALK].color, linewidth=1)
    axes.set_xscale("log")
    axes.set_yticks(range(len(workloads)), workloads, fontsize=8)
    axes.set_xlabel("time relative to the hand-written walk over libxml2 (left is faster)")
    calm_grid(axes)
    axes.legend(fontsize=8, loc="upper center", bbox_to_anchor=(0.3, 1 + 1.6 / len(workloads)), ncol=4, frameon=False)
    save(figure, path)


def plot_growth(results, path):
    figure, grid = plt.subplots(2, 3, figsize=(12, 7), constrained_layout=True)
    for axes, curve in zip(grid.flat, CURVES):
        for name in (WALK, LIBRARY):
            line = points(results.times, curve, name)
            # The two lines nearly coincide: the walk shows as a border.
            axes.plot(*zip(*line), marker=MARKS[name].shape, color=MARKS[name].color, label=name,
                      markersize=8 if name == WALK else 4, linewidth=2.5 if name == WALK else 1.2)
        # From the last point of the walk backwards, as nothing weighs there but the size.
        (x, y), (start, _) = points(results.times, curve, WALK)[-1], line[0]
        axes.plot([start, x], [y * start / x, y], ":", color="#888888", label="linear", zorder=0)
        axes.set_xscale("log")
        axes.set_yscale("log")
        axes.set_title(curve.title, fontsize=10)
        axes.set_xlabel(curve.unit)
        axes.set_ylabel("time, ns")
        calm_grid(axes)
    grid.flat[0].legend(fontsize=8)
    save(figure, path)


def main():
    results = Results(Path(sys.argv[1]))
    docs = Path(sys.argv[3])
    plots = docs / "performance"
    plots.mkdir(exist_ok=True)
    plot_ratios(results, plots / "ratios.svg")
    plot_growth(results, plots / "growth.svg")
    (docs / "performance.md").write_text(page(results, Path(sys.argv[2])))


if __name__ == "__main__":
    main()
