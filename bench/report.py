#!/usr/bin/env python3
"""Writes docs/performance.md and its plots from the JSON that the benchmarks wrote.

    python3 bench/report.py RESULTS_DIR DOCS_DIR

RESULTS_DIR holds one Google Benchmark JSON file per program (--benchmark_out_format=json) and
run.json (how long the run took, on what). Every figure is a median over the repetitions of
this one run; every comparison is between contenders measured in the same run. The plots are
drawn by gnuplot into DOCS_DIR.
"""
import json
import math
import os
import re
import statistics
import subprocess
import sys
import tempfile

UNIT = {"ns": 1e-9, "us": 1e-6, "ms": 1e-3, "s": 1.0}


def load(results, program):
    path = os.path.join(results, program + ".json")
    if not os.path.exists(path):
        return {}
    try:
        with open(path) as f:
            data = json.load(f)
    except ValueError:  # a program that was stopped leaves its JSON unfinished
        return {}
    runs = {}
    for b in data.get("benchmarks", []):
        if b.get("run_type") != "iteration" or b.get("error_occurred"):
            continue
        key = re.sub(r"/(iterations|repeats|manual_time|real_time|min_time)[^/]*", "", b["run_name"])
        runs.setdefault(key, []).append(b)
    return runs


def seconds(runs, key):
    """Median wall time of one benchmark, in seconds; None when it did not run."""
    if key not in runs:
        return None
    return statistics.median(b["real_time"] * UNIT[b["time_unit"]] for b in runs[key])


def cpu_seconds(runs, key):
    if key not in runs:
        return None
    return statistics.median(b["cpu_time"] * UNIT[b["time_unit"]] for b in runs[key])


def counter(runs, key, name):
    if key not in runs:
        return None
    values = [b[name] for b in runs[key] if name in b]
    return statistics.median(values) if values else None


def fmt_time(s):
    if s is None:
        return "n/a"
    if s >= 1:
        return "%.2f s" % s
    if s >= 1e-3:
        return "%.2f ms" % (s * 1e3)
    return "%.1f µs" % (s * 1e6)


def fmt_ratio(r):
    return "n/a" if r is None else "%.2f×" % r


def exponent(points):
    """The growth exponent k of t ~ n^k: the least-squares slope of log t over log n, taken
    without the smallest point, where fixed costs (a process start, a flush) hide the growth."""
    pts = [(math.log(n), math.log(t)) for n, t in points if t][1:]
    if len(pts) < 2:
        return None
    mx = sum(x for x, _ in pts) / len(pts)
    my = sum(y for _, y in pts) / len(pts)
    return sum((x - mx) * (y - my) for x, y in pts) / sum((x - mx) ** 2 for x, _ in pts)


def fmt_exp(k):
    return "n/a" if k is None else "n^%.2f" % k


def verdict(ok):
    return "n/a" if ok is None else ("met" if ok else "**not met**")


def table(header, rows):
    out = ["| " + " | ".join(header) + " |", "|" + "---|" * len(header)]
    out += ["| " + " | ".join(str(c) for c in row) + " |" for row in rows]
    return "\n".join(out)


def quoted(text):
    """A gnuplot string: in double quotes, so that an apostrophe in the text stays text."""
    return '"%s"' % text.replace("\\", "\\\\").replace('"', '\\"')


def plot(docs, name, title, xlabel, ylabel, series, logx=True, logy=True):
    """Draws series [(label, [(x, y)...])] into DOCS/name.png with gnuplot."""
    series = [(label, [(x, y) for x, y in pts if y]) for label, pts in series]
    series = [(label, pts) for label, pts in series if pts]
    if not series:
        return False
    with tempfile.TemporaryDirectory() as tmp:
        lines = [
            "set terminal png size 800,480",
            "set output '%s'" % os.path.join(docs, name + ".png"),
            "set title %s" % quoted(title),
            "set xlabel %s" % quoted(xlabel),
            "set ylabel %s" % quoted(ylabel),
            "set key left top",
            "set grid",
        ]
        if logx:
            lines.append("set logscale x 10")
        if logy:
            lines.append("set logscale y 10")
        plots = []
        for i, (label, pts) in enumerate(series):
            dat = os.path.join(tmp, "s%d.dat" % i)
            with open(dat, "w") as f:
                for x, y in pts:
                    f.write("%g %g\n" % (x, y))
            plots.append("'%s' using 1:2 with linespoints lw 2 pt 7 title %s" % (dat, quoted(label)))
        lines.append("plot " + ", ".join(plots))
        script = os.path.join(tmp, "plot.gp")
        with open(script, "w") as f:
            f.write("\n".join(lines) + "\n")
        subprocess.run(["gnuplot", script], check=True)
    return True


ROWS = [100, 1000, 10000, 100000]


def content_section(results, docs, targets):
    runs = load(results, "content_table_bench")
    kinds = [
        ("BM_LoadFromFile", "load (file → table)"),
        ("BM_LoadFromText", "parse (bytes → table)"),
        ("BM_ToFileText", "render (table → bytes)"),
        ("BM_ToFileTextOneRowChanged", "render, one row changed"),
        ("BM_SaveToFile", "save, durable"),
        ("BM_SaveWithoutFlush", "save, no flush"),
    ]
    rows = []
    for n in ROWS:
        rows.append(["{:,}".format(n)] + [fmt_time(seconds(runs, "%s/%d" % (k, n))) for k, _ in kinds])
    # Growth is read from CPU time: wall time on a shared machine jumps with the neighbours' load.
    rows.append(["growth from 1,000 rows, CPU"] + [fmt_exp(exponent([(n, cpu_seconds(runs, "%s/%d" % (k, n))) for n in ROWS]))
                                            for k, _ in kinds])
    drawn = plot(docs, "content_file", "Content file, 14 columns", "rows", "seconds",
                 [(label, [(n, seconds(runs, "%s/%d" % (k, n))) for n in ROWS]) for k, label in kinds])
    load_top = seconds(runs, "BM_LoadFromFile/100000")
    save_top = seconds(runs, "BM_SaveToFile/100000")
    k_load = exponent([(n, cpu_seconds(runs, "BM_LoadFromFile/%d" % n)) for n in ROWS])
    k_save = exponent([(n, cpu_seconds(runs, "BM_SaveToFile/%d" % n)) for n in ROWS])
    linear = None if k_load is None or k_save is None else (k_load < 1.25 and k_save < 1.25)
    targets.append(["Content file, 100,000 rows × 14 columns: load and save well under 1 s each, linear",
                    "load %s, save %s; CPU growth from 1,000 rows %s and %s" % (fmt_time(load_top), fmt_time(save_top),
                                                                     fmt_exp(k_load), fmt_exp(k_save)),
                    verdict(None if load_top is None or save_top is None else
                            load_top < 0.5 and save_top < 0.5 and linear)])
    # "Well under a second" is read as under half a second; "linear" as growing at most as n^1.25
    # over a decade of rows (caches make the largest tables a little dearer per row).
    small_save = seconds(runs, "BM_SaveToFile/100")
    small_noflush = seconds(runs, "BM_SaveWithoutFlush/100")
    out = ["## Content file", "",
           "Load and save of a content file of 14 columns (`bench/content_table_bench.cpp`). \"Load\" reads the file "
           "and builds the table (no row scripts); \"save, durable\" is `SaveToFile` as the pipeline calls it after "
           "every group, every row rendered (the file written and flushed, then put in place of the content file in one "
           "step); \"save, no flush\" writes and renames the same bytes without the flush. The table keeps each "
           "row's text until one of its cells changes, so the pipeline, which changes a group's rows between two "
           "saves, pays the \"one row changed\" render rather than the full one.", "",
           table(["rows"] + [label for _, label in kinds], rows), ""]
    if drawn:
        out += ["![content file](content_file.png)", ""]
    if small_save and small_noflush:
        out += ["Reading: load, parse and render grow linearly (about n^1.0 from 1,000 to 100,000 rows, the rest "
                "being the caches, which the largest tables outgrow). The durable "
                "save of a small table is almost all flushing: %s for 100 rows against %s without the flushes, so "
                "its cost is flat until the bytes themselves matter (above about 10,000 rows)." %
                (fmt_time(small_save), fmt_time(small_noflush)), ""]
    return out


def script_section(results):
    runs = load(results, "row_script_bench")
    scripts = [(0, "`FORCED = TRUE`"), (1, "typical (two assignments, FileVersionAtLeast, FileExists)")]
    rows = []
    for arg, label in scripts:
        rows.append([label] + [fmt_time(cpu_seconds(runs, "%s/%d" % (k, arg))) for k in
                               ("BM_RowScriptParse", "BM_RowScriptValidate", "BM_RowScriptExecute",
                                "BM_RowScriptWhole")] + [fmt_time(seconds(runs, "BM_RowScriptWholeLogged/%d" % arg))])
    sizes = [1 << 10, 1 << 12, 1 << 14, 1 << 16]
    shapes = [(0, "assignments in a row"), (1, "one call, ever more arguments")]
    long_rows = [["{:,} bytes".format(n)] + [fmt_time(cpu_seconds(runs, "BM_RowScriptParseLong/%d/%d" % (n, shape)))
                                            for shape, _ in shapes] for n in sizes]
    long_rows.append(["growth, CPU"] + [fmt_exp(exponent([(n, cpu_seconds(runs, "BM_RowScriptParseLong/%d/%d" % (n, shape)))
                                                        for n in sizes])) for shape, _ in shapes])
    return ["## Row script", "",
            "One row's dynamic-field script as row preparation runs it (`bench/row_script_bench.cpp`, "
            "`expr/execution_plan.h`): CPU time per script with the trace log writing nowhere, and the whole script "
            "with the log writing its file as in a real run (wall time).", "",
            table(["script", "parse", "validate", "execute", "whole", "whole, logged"], rows), "",
            "Reading: the language itself costs microseconds per row; a real run pays mostly for the trace lines "
            "that every step writes (one file open and close each, see below).", "",
            "Parse of long scripts, up to the bound on a script's length (64 KiB, `expr/override_parser.h`):", "",
            table(["script"] + [label for _, label in shapes], long_rows), "",
            "Reading: parse time grows with the text (about n^1.0); operands are moved into the nodes built from "
            "them, never copied.", ""]


def decompress_section(results, targets):
    runs = load(results, "decompress_bench")
    names = [
        ("BM_SzddExpandRivzip", "SZDD, our codec (Rivzip), file to file"),
        ("BM_SzddExpandLibmspack", "SZDD, libmspack, file to file"),
        ("BM_CopyExpandedBytes", "plain copy of the expanded bytes"),
        ("BM_ZlibExpandFile", "zlib, file to file"),
        ("BM_ExpandLzwInPlace", "LZW download expanded in place (dispatcher)"),
        ("BM_ExpandZlibInPlace", "ZLIB download expanded in place (dispatcher)"),
        ("BM_CopyExpandedFile", "durable copy of the expanded file"),
    ]
    rows = []
    for key, label in names:
        s = seconds(runs, key)
        rows.append([label, fmt_time(s), "n/a" if not s else "%.0f MiB/s" % (64 / s)])
    ours = seconds(runs, "BM_SzddExpandRivzip")
    mspack = seconds(runs, "BM_SzddExpandLibmspack")
    copy = seconds(runs, "BM_CopyExpandedBytes")
    speedup = mspack / ours if ours and mspack else None
    over_copy = ours / copy if ours and copy else None
    targets.append(["SZDD, 64 MiB: at least 3× faster than libmspack on the same file",
                    "libmspack / ours = %s" % fmt_ratio(speedup), verdict(None if speedup is None else speedup >= 3)])
    targets.append(["SZDD, 64 MiB: within 2× of a plain copy of the expanded bytes",
                    "ours / copy = %s" % fmt_ratio(over_copy), verdict(None if over_copy is None else over_copy <= 2)])
    return ["## Decompression", "",
            "64 MiB of installer-like data (`bench/decompress_bench.cpp`), median wall time, the contenders "
            "interleaved in one run. Rates are of expanded bytes.", "",
            table(["what", "time", "rate"], rows), "",
            "libmspack / ours: **%s**; ours / plain copy: **%s**. In place, the pipeline also copies the download "
            "to a staging file and flushes the expansion before it takes the download's name, which is why those "
            "rows sit beside a durable copy rather than the plain one." % (fmt_ratio(speedup), fmt_ratio(over_copy)),
            ""]


def trace_section(results, targets):
    runs = load(results, "trace_log_bench")
    rows = []
    for depth in (1, 4, 8):
        rows.append(["opened and closed per line, log %d folder%s below C:\\" % (depth, "" if depth == 1 else "s"),
                     fmt_time(seconds(runs, "BM_TraceLineOpenClosePerLine/%d" % depth)),
                     fmt_time(cpu_seconds(runs, "BM_TraceLineOpenClosePerLine/%d" % depth))])
    rows.append(["keepOpen, 4 folders below C:\\", fmt_time(seconds(runs, "BM_TraceLineKeepOpen/4")),
                 fmt_time(cpu_seconds(runs, "BM_TraceLineKeepOpen/4"))])
    rows.append(["no file (format and time stamp only)", fmt_time(seconds(runs, "BM_TraceLineNoFile")),
                 fmt_time(cpu_seconds(runs, "BM_TraceLineNoFile"))])
    rows.append(["C loop: open (append, create), one write, close; same file, same bytes",
                 fmt_time(seconds(runs, "BM_TraceLineCLoop")), fmt_time(cpu_seconds(runs, "BM_TraceLineCLoop"))])
    per_line = seconds(runs, "BM_TraceLineOpenClosePerLine/4")
    kept = seconds(runs, "BM_TraceLineKeepOpen/4")
    c_loop = seconds(runs, "BM_TraceLineCLoop")
    over_c = per_line / c_loop if per_line and c_loop else None
    targets.append(["Trace line, opened and closed per line: at most 2× the C loop on the same disk",
                    "%s (4 folders below C:\\)" % fmt_ratio(over_c), verdict(None if over_c is None else over_c <= 2)])
    out = ["## Trace line", "",
           "One `TRACE` line (`bench/trace_log_bench.cpp`, `diag/trace_log.h`), wall and CPU time per line, beside "
           "the operating system's least cost of the same line: a C loop that opens the log's file for appending, "
           "writes the line's bytes once and closes it, measured in the same run.", "",
           table(["how", "wall", "CPU"], rows), ""]
    if per_line and kept and c_loop:
        out += ["Reading: a line opened and closed per line costs %s the C loop. Per line the log makes four system "
                "calls: open (append, create), the share check (one non-blocking lock, held while the line is "
                "written and let go with the close), one write, close; its host path is mapped once per "
                "configuration. A line written to a file kept open costs %s." % (fmt_ratio(over_c), fmt_time(kept)),
                ""]
    return out


def run_rows(runs, keys):
    rows = []
    for key, label in keys:
        if key not in runs:
            rows.append([label] + ["n/a"] * 6)
            continue
        reps = runs[key]
        mendler = statistics.median(b["mendler_s"] for b in reps)
        floor = statistics.median(b["floor_s"] for b in reps)
        ratios = ", ".join("%.2f" % (b["mendler_s"] / b["floor_s"]) for b in reps if b["floor_s"] > 0)
        rows.append([label, fmt_time(floor), fmt_time(mendler), "**%s**" % fmt_ratio(mendler / floor), ratios,
                     fmt_time(counter(runs, key, "floor_cpu_s")), fmt_time(counter(runs, key, "mendler_cpu_s"))])
    return rows


def median_of(runs, key, field):
    if key not in runs:
        return None
    return statistics.median(b[field] for b in runs[key])


def ratio_of(runs, key):
    m, f = median_of(runs, key, "mendler_s"), median_of(runs, key, "floor_s")
    return m / f if m and f else None


def series(runs, prefix, counts, field):
    return [(n, counter(runs, "BM_UpdateAll/%s/%d" % (prefix, n), field)) for n in counts]


def scaling_rows(runs, prefix, counts):
    rows = []
    for n in counts:
        key = "BM_UpdateAll/%s/%d" % (prefix, n)
        m, f = counter(runs, key, "mendler_s"), counter(runs, key, "floor_s")
        mc = counter(runs, key, "mendler_cpu_s")
        rows.append(["{:,}".format(n), fmt_time(f), fmt_time(m), fmt_ratio(m / f if m and f else None),
                     fmt_time(m / n if m else None), fmt_time(mc), fmt_time(mc / n if mc else None)])
    km = exponent(series(runs, prefix, counts, "mendler_s"))
    kf = exponent(series(runs, prefix, counts, "floor_s"))
    kc = exponent(series(runs, prefix, counts, "mendler_cpu_s"))
    rows.append(["growth (without the smallest)", fmt_exp(kf), fmt_exp(km), "", "", fmt_exp(kc), ""])
    return rows


def update_section(results, docs, targets):
    runs = load(results, "update_all_bench")
    out = ["## Whole update runs", "",
           "`pexupdate --machine DIR all` (the host loads `Mendler.dll`, which starts its log and runs `UpdateAll` "
           "over the registered product) against the floor, `bench/floor.c`: for every file, copy the existing "
           "target to a backup and flush it, copy the download over the target and flush it; at the end remove "
           "the backups and the downloads. The floor also does the specified writes that are not file work: it "
           "appends as many lines as the run's log holds, of their mean length, each by the C loop of the trace-line "
           "table (open, one write, close), and after every group writes a status file of the content file's size "
           "and flushes it. Both start from identical machines made and flushed to disk outside "
           "the timing; every file replaces an existing target, so every file is backed up. Each repetition runs "
           "both, one after the other (`bench/update_all_bench.cpp`). \"Without the log's file\" is the same run "
           "with the programs copied beside a plain file called \"log\", so that the library cannot open its "
           "trace log: every line is still built, none is written (and the floor writes none).", ""]
    out += [table(["run", "floor", "UpdateAll", "UpdateAll / floor (median)", "ratio per repetition", "floor CPU",
                   "UpdateAll CPU"],
                  run_rows(runs, [("BM_UpdateAll/small", "1,000 files of 64 KiB, a group each"),
                                  ("BM_UpdateAll/small-nolog", "the same, without the log's file"),
                                  ("BM_UpdateAll/small-grouped", "1,000 files of 64 KiB, 10 groups of 100"),
                                  ("BM_UpdateAll/small-one", "1,000 files of 64 KiB, one group"),
                                  ("BM_UpdateAll/large", "8 files of 64 MiB, a group each")])), ""]
    small, bare = ratio_of(runs, "BM_UpdateAll/small"), ratio_of(runs, "BM_UpdateAll/small-nolog")
    grouped, one = ratio_of(runs, "BM_UpdateAll/small-grouped"), ratio_of(runs, "BM_UpdateAll/small-one")
    large = ratio_of(runs, "BM_UpdateAll/large")
    out += ["The log's lines are part of the floor (its C loop), so the ratios with the log count what the "
            "library's lines cost beyond the operating system's; the run without the log's file is measured against "
            "a floor without lines, on a disk whose flush latency moves between the two rows.", ""]
    targets.append(["UpdateAll, 1,000 × 64 KiB over existing targets, with the log: at most 1.5× the floor",
                    "%s (one group), %s (a group each), %s (10 groups of 100); without the log's file %s" %
                    (fmt_ratio(one), fmt_ratio(small), fmt_ratio(grouped), fmt_ratio(bare)),
                    verdict(None if one is None else one <= 1.5) + " (one group); " +
                    verdict(None if small is None else small <= 1.5) + " (a group each)"])
    targets.append(["UpdateAll, 8 × 64 MiB over existing targets: at most 1.1× the floor",
                    fmt_ratio(large), verdict(None if large is None else large <= 1.1)])

    header = ["floor", "UpdateAll", "ratio", "UpdateAll per %s", "UpdateAll CPU", "CPU per %s"]
    for prefix, title, counts, what in (
            ("files", "Files in one group", [10, 100, 1000, 10000], "files"),
            ("folder", "Files in one group, all in one folder", [10, 100, 1000], "files"),
            ("groups", "Files in a group each", [10, 100, 1000], "groups")):
        out += ["### %s (4 KiB files)" % title, "",
                table([what] + [h.replace("%s", what[:-1]) for h in header], scaling_rows(runs, prefix, counts)), ""]
        if plot(docs, "update_" + prefix, title + " (4 KiB files)", what, "seconds",
                [("UpdateAll", series(runs, prefix, counts, "mendler_s")),
                 ("UpdateAll, CPU", series(runs, prefix, counts, "mendler_cpu_s")),
                 ("floor", series(runs, prefix, counts, "floor_s"))]):
            out += ["![%s](update_%s.png)" % (prefix, prefix), ""]

    chain, bare_chain = [10, 30, 100, 300], [10, 30, 100, 300, 1000]
    out += ["### A chain of dependent groups (4 KiB files)", "",
            "Each group depends on the one that sorts after it, so every pass of the application loop applies one "
            "group. With the log:", "",
            table(["groups"] + [h.replace("%s", "group") for h in header], scaling_rows(runs, "chain", chain)), "",
            "Without the log's file (its lines are still built):", "",
            table(["groups"] + [h.replace("%s", "group") for h in header],
                  scaling_rows(runs, "chain-nolog", bare_chain)), ""]
    if plot(docs, "update_chain", "A chain of dependent groups (4 KiB files)", "groups", "seconds",
            [("UpdateAll", series(runs, "chain", chain, "mendler_s")),
             ("UpdateAll without the log's file", series(runs, "chain-nolog", bare_chain, "mendler_s")),
             ("floor", series(runs, "chain-nolog", bare_chain, "floor_s"))]):
        out += ["![chain](update_chain.png)", ""]
    return out


def main():
    results, docs = sys.argv[1], os.path.abspath(sys.argv[2])
    os.makedirs(docs, exist_ok=True)
    with open(os.path.join(results, "run.json")) as f:
        run = json.load(f)
    targets = []
    body = []
    body += content_section(results, docs, targets)
    body += script_section(results)
    body += decompress_section(results, targets)
    body += trace_section(results, targets)
    body += update_section(results, docs, targets)
    with open(os.path.join(os.path.dirname(os.path.abspath(__file__)), "report_notes.md")) as f:
        notes = f.read().strip()
    head = ["# Performance", "",
            "Generated by `./run.sh bench` (an optimised build in `build-bench/`, every program in `bench/`, then "
            "`bench/report.py`). This run: %s, %d CPUs, load average at the end %s; the build took %d s and the "
            "benchmarks %d s (%s)." % (run["date"], run["cpus"], run["load"], run.get("build_seconds", 0),
                                       run["seconds"],
                                       ", ".join("%s %d s" % (k, v) for k, v in run["programs"].items())),
            "",
            "Numbers are medians over the repetitions of this run; comparisons are between contenders measured in "
            "the same run. The machine is shared and its disk's flush latency varies by an order of magnitude from "
            "one minute to the next, so absolute times move between runs; the ratios move much less.", "",
            "## Targets", "", table(["target", "measured", "verdict"], targets), ""]
    with open(os.path.join(docs, "performance.md"), "w") as f:
        f.write("\n".join(head + body + [notes, ""]))


if __name__ == "__main__":
    main()
