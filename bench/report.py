#!/usr/bin/env python3
"""Makes docs/performance.md and its curves of what the benchmarks measured.

    bench/report.py RESULTS DOCS

RESULTS holds the JSON files of the benchmark programs, whose names are
ROW/WHO, perhaps with a size behind, or curve/CURVE/WHO/SIZE; names that begin
with also/ are no rows of the page. WHO is ours, literal, limit (a memory copy
or a hand loop that does the least that has to be done) or the name of a peer.
bench/rows.toml says which rows there are and what floor each of them has.
"""

import glob
import json
import os
import statistics
import subprocess
import sys
import tomllib
from collections import defaultdict

NANOSECONDS = {"ns": 1.0, "us": 1e3, "ms": 1e6, "s": 1e9}
NO_PEERS = ("ours", "literal", "limit")


def read_times(folder):
    """Gives the median nanoseconds of every benchmark, by its full name."""
    runs = defaultdict(list)
    for path in sorted(glob.glob(os.path.join(folder, "*.json"))):
        with open(path, encoding="utf-8") as file:
            for run in json.load(file)["benchmarks"]:
                if run.get("run_type", "iteration") != "iteration":
                    continue
                if run.get("error_occurred"):
                    sys.exit(f"report: {run['name']}: {run['error_message']}")
                # Where more than one process works, the clock on the wall
                # counts.
                wall = run["name"].endswith(("manual_time", "real_time"))
                time = run["real_time" if wall else "cpu_time"]
                time *= NANOSECONDS[run["time_unit"]]
                runs[clean_name(run["name"])].append(time)
    return {name: statistics.median(times) for name, times in runs.items()}


def clean_name(name):
    """Drops what the benchmark library adds to a name."""
    parts = name.split("/")
    return "/".join(part for part in parts
                    if part not in ("real_time", "manual_time", "process_time")
                    and not part.startswith(("iterations:", "min_time:",
                                             "repeats:")))


def rows_and_curves(times):
    rows = defaultdict(dict)
    curves = defaultdict(lambda: defaultdict(list))
    for name, time in times.items():
        parts = name.split("/")
        if parts[0] == "also":
            continue
        if parts[0] == "curve":
            curves[parts[1]][parts[2]].append((int(parts[3]), time))
        elif len(parts) == 2 or len(parts) == 3 and parts[2].isdigit():
            rows[parts[0]][parts[1]] = time
        else:
            sys.exit(f"report: {name} is neither a row nor a curve")
    return rows, curves


def in_words(nanoseconds):
    for unit, size in (("s", 1e9), ("ms", 1e6), ("us", 1e3)):
        if nanoseconds >= size:
            return f"{nanoseconds / size:.3g} {unit}"
    return f"{nanoseconds:.3g} ns"


def against(floor, measured):
    """The time that a floor compares ours with, and whose it is."""
    whom = floor["of"]
    if whom == "peers":
        names = [who for who in measured if who not in NO_PEERS]
    elif isinstance(whom, list):
        names = [who for who in whom if who in measured]
    else:
        names = [whom] if whom in measured else []
    if not names:
        return None, None
    best = min(names, key=lambda who: measured[who])
    return measured[best], best


def judge(floor, measured):
    """One floor in words: the ratio that it asks and the one that was met."""
    time, who = against(floor, measured)
    if time is None:
        asked = floor["of"] if isinstance(floor["of"], str) else \
            ", ".join(floor["of"])
        return f"{asked}: not measured", False
    ours = measured["ours"]
    if "at_most" in floor:
        ratio = ours / time
        met = ratio <= floor["at_most"]
        text = f"{ratio:.2f} of {who} (at most {floor['at_most']:g})"
    else:
        ratio = time / ours
        met = ratio >= floor["at_least"]
        text = f"{ratio:.2f} x {who} (at least {floor['at_least']:g})"
    return (text if met else f"**{text}**"), met


def row_lines(row, measured):
    """The line of one row, and whether all its floors were met."""
    if "ours" not in measured:
        return [f"| {row['title']} | not measured | | | | |"], False
    peers = "<br>".join(
        f"{who} {in_words(time)}" for who, time in sorted(
            measured.items(), key=lambda item: item[1])
        if who not in NO_PEERS)
    verdicts = [judge(floor, measured) for floor in row["floors"]]
    cells = [row["title"], in_words(measured["ours"])]
    for who in ("literal", "limit"):
        cells.append(in_words(measured[who]) if who in measured else "")
    cells.insert(3, peers)
    cells.append("<br>".join(text for text, _ in verdicts))
    return ["| " + " | ".join(cells) + " |"], all(met for _, met in verdicts)


def draw_curve(curve, lines, path):
    """Draws one curve with both axes logarithmic."""
    script = ["set terminal pngcairo size 760,420", f"set output '{path}'",
              "set logscale xy", "set grid", "set key left top",
              f"set title \"{curve['title']}\"",
              f"set xlabel \"{curve['size']}\"",
              f"set ylabel \"{curve['cost']}\"",
              "set format y '%.3g'"]
    plots, data = [], []
    for who in sorted(lines, key=lambda name: (name != "ours", name)):
        plots.append(f"'-' with linespoints linewidth 2 title '{who}'")
        each = curve.get("each", False)
        for size, time in sorted(lines[who]):
            data.append(f"{size} {time / size if each else time}")
        data.append("e")
    script.append("plot " + ", ".join(plots))
    subprocess.run(["gnuplot"], input="\n".join(script + data) + "\n",
                   text=True, check=True)


def machine():
    model = "an unnamed processor"
    with open("/proc/cpuinfo", encoding="utf-8") as file:
        for line in file:
            if line.startswith("model name"):
                model = line.split(":", 1)[1].strip()
                break
    compiler = subprocess.run(["c++", "-dumpfullversion"], text=True,
                              capture_output=True, check=True).stdout.strip()
    return f"{model}, {os.cpu_count()} cores, g++ {compiler}"


def write_table(file, section, rows):
    file.write(f"\n## {section['title']}\n\n")
    if "text" in section:
        file.write(section["text"].strip() + "\n\n")
    file.write("| work | ours | literal | peers | limit | ratios and floors |\n"
               "|---|---|---|---|---|---|\n")
    short = []
    for row in section["row"]:
        lines, met = row_lines(row, rows.get(row["id"], {}))
        file.write("\n".join(lines) + "\n")
        if not met:
            short.append(row)
    if short:
        file.write("\nBelow their floor, or not measured:\n\n")
    for row in short:
        reason = " ".join(row.get("note", "no reason is known yet.").split())
        file.write(f"- {row['title']}: {reason}\n")
    return len(short)


def write_curves(file, curves_wanted, curves, docs):
    if not any(curve["id"] in curves for curve in curves_wanted):
        return
    file.write("\n## Growth\n\nBoth axes are logarithmic.\n")
    for curve in curves_wanted:
        if curve["id"] not in curves:
            continue
        name = f"performance/{curve['id']}.png"
        os.makedirs(os.path.join(docs, "performance"), exist_ok=True)
        draw_curve(curve, curves[curve["id"]], os.path.join(docs, name))
        file.write(f"\n![{curve['title']}]({name})\n")


def main():
    results, docs = sys.argv[1:]
    here = os.path.dirname(os.path.abspath(__file__))
    with open(os.path.join(here, "rows.toml"), "rb") as file:
        wanted = tomllib.load(file)
    rows, curves = rows_and_curves(read_times(results))
    known = {row["id"] for section in wanted["section"]
             for row in section["row"]}
    for stray in sorted(set(rows) - known):
        print(f"report: no row is named {stray}", file=sys.stderr)

    short = 0
    with open(os.path.join(docs, "performance.md"), "w",
              encoding="utf-8") as file:
        file.write(wanted["introduction"].strip() + "\n")
        file.write(f"\nMeasured on {machine()}.\n")
        for section in wanted["section"]:
            short += write_table(file, section, rows)
        write_curves(file, wanted["curve"], curves, docs)
        file.write("\n## Left out\n\n" + wanted["left_out"].strip() + "\n")
    count = len(known)
    print(f"report: {count - short} of {count} rows reach all their floors")


if __name__ == "__main__":
    main()
