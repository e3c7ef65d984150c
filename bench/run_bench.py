#!/usr/bin/env python3
"""Measures text tables, spreadsheets of the host, scripts, Factors, dates and joins, alone and against peers.

Every number is the median of paired runs: ours and a peer's take turns, each in a process of its
own, and a ratio is the median of the ratios of neighbours. "1.50x" says that the peer took 1.5
times as long as we did. The inner times are of the calls alone (file to table, table to file),
without the start of an interpreter or a process; the whole times are of one process that starts,
reads, writes and ends.
"""

import argparse
import os
import shutil
import statistics
import subprocess
import sys
import tempfile
import time

SEED = 1

# kind: rows, columns, and what the ratios of the inner times should reach.
WORKLOADS = {
    "numeric": (1_000_000, 10, {"fread": 1.0, "fwrite": 1.0, "read_csv": 3.0}),
    "mixed": (1_000_000, 8, {"fread": 1.0, "fwrite": 1.0, "read_csv": 2.0}),
    "wide": (1_000, 10_000, {}),
    "text": (5_000_000, 1, {}),
}

# Texts in memory that become dates: rows, the form of their texts here and in R.
DATE_WORKLOADS = {
    "dates-iso": (5_000_000, "iso", "%Y-%m-%d"),
    "dates-dmy": (5_000_000, "dmy", "%d/%m/%Y"),
}
DATE_GOAL = 5.0

# Beyond the image of the file, for numbers.
GREATEST_BYTES_A_CELL = 26

# Millions of bytes a second of a script of numbers.
LEAST_SCRIPT_RATE = 150

# Numbers in a spreadsheet file of the host. Millions of bytes a second each way, or that part of what a
# plain copy of the file makes; and a request from text to file against the reading of the text.
SPREADSHEETS = {"spreadsheet": (1_000_000, 10)}
LEAST_SPREADSHEET_RATE = 1000
PART_OF_COPY = 0.7
MOST_OF_READING = 1.15

R_SCRIPT = """
suppressMessages(library(data.table))
setDTthreads(1)
a <- commandArgs(TRUE)
taken <- function(work) system.time(work)[["elapsed"]]
r <- taken(d <- fread(a[1], nThread = 1, showProgress = FALSE))
w <- taken(fwrite(d, a[2], nThread = 1, showProgress = FALSE))
cat(sprintf("read_seconds %.6f\\nwrite_seconds %.6f\\n", r, w))
"""

R_DATE_SCRIPT = """
a <- commandArgs(TRUE)
texts <- format(as.Date("1900-01-01") + (seq_len(as.integer(a[1])) - 1L) %% 40000L, a[2])
cat(sprintf("convert_seconds %.6f\\n", system.time(as.Date(texts, format = a[2]))[["elapsed"]]))
"""

PANDAS_SCRIPT = """
import sys, time
import pandas
start = time.perf_counter()
table = pandas.read_csv(sys.argv[1], engine="c")
read = time.perf_counter() - start
start = time.perf_counter()
table.to_csv(sys.argv[2], index=False)
print("read_seconds %.6f\\nwrite_seconds %.6f" % (read, time.perf_counter() - start))
"""

# Texts that become a Factor: rows, and how many different ones there are.
FACTORS = {"factor-40": (5_000_000, 40), "factor-1000000": (5_000_000, 1_000_000)}
FACTOR_GOAL = 1.0

R_FACTOR_SCRIPT = """
x <- readLines(commandArgs(TRUE)[1])
seconds <- system.time(f <- factor(x))[["elapsed"]]
sum <- sum(as.numeric(as.integer(f)) * (seq_along(x) %% 1000))
cat(sprintf("factor_seconds %.6f\\nlevels %d\\nsum %.0f\\n", seconds, nlevels(f), sum))
"""


# Sheets in memory: rows, labels or columns.
JOINS = {
    "sort": 5_000_000,
    "merge": 1_000_000,
    "transpose": 2_000,
    "levels": 1_000_000,
    "append": 40_000,
}
TRANSPOSED_COLUMNS = 50_000
SORT_GOAL = 1 / 1.2
MERGE_GOAL = 2.0
TRANSPOSE_GOAL = 4.0
TEN_TIMES_GOAL = 12.0


class Peer:
    """Another program that reads and writes the same files."""

    def __init__(self, name, reads, writes, command, version):
        self.name, self.reads, self.writes, self.command = name, reads, writes, command
        self.version = self.find(version)

    def find(self, version):
        if shutil.which(self.command[0]) is None:
            return None
        found = subprocess.run(version, capture_output=True, text=True, check=False)
        return found.stdout.strip() if found.returncode == 0 else None


def find_peers():
    python = "/usr/bin/python3" if os.path.exists("/usr/bin/python3") else sys.executable
    return [
        Peer("data.table, 1 thread", "fread", "fwrite", ["Rscript", "-e", R_SCRIPT],
             ["Rscript", "-e", "cat(as.character(packageVersion('data.table')))"]),
        Peer("pandas, C reader", "read_csv", "to_csv", [python, "-c", PANDAS_SCRIPT],
             [python, "-c", "import pandas; print(pandas.__version__)"]),
    ]


def run(command):
    """One process: the "name number" lines it prints, its seconds and its peak memory."""
    start = time.perf_counter()
    process = subprocess.Popen(command, stdout=subprocess.PIPE, text=True)
    printed = process.stdout.read()
    _, status, usage = os.wait4(process.pid, 0)
    taken = time.perf_counter() - start
    process.returncode = os.waitstatus_to_exitcode(status)
    process.stdout.close()
    if process.returncode != 0:
        sys.exit("bench: failed with %d: %s" % (process.returncode, " ".join(command)[:200]))
    result = {"whole_seconds": taken, "whole_peak": usage.ru_maxrss * 1024}
    for line in printed.splitlines():
        words = line.split()
        if len(words) == 2:
            result[words[0]] = float(words[1])
    return result


def make_data(make, folder, kind, rows, columns):
    path = os.path.join(folder, "%s-%dx%d-%d.csv" % (kind, rows, columns, SEED))
    if not os.path.exists(path):
        os.makedirs(folder, exist_ok=True)
        subprocess.run([make, kind, str(rows), str(columns), str(SEED), path + ".part"], check=True)
        os.replace(path + ".part", path)
    with open(path, "rb") as file:  # so that the first run finds it in memory, as the others do
        while file.read(1 << 24):
            pass
    return path


class Measures:
    """The values of all runs, by name."""

    def __init__(self):
        self.values = {}

    def add(self, name, value):
        self.values.setdefault(name, []).append(value)

    def __getitem__(self, name):
        return statistics.median(self.values[name])


def measure(programs, peers, data, out, pairs):
    """Our runs and each peer's in turn: packed, peer, padded, script, and the command."""
    found = Measures()

    def ours(*arguments):
        result = run(list(arguments))
        result["out_bytes"] = os.path.getsize(out)
        os.remove(out)
        return result

    for _ in range(pairs):
        for peer in peers or [None]:
            packed = ours(programs["time_text"], data, out, "packed")
            theirs = ours(*peer.command, data, out) if peer else None
            padded = ours(programs["time_text"], data, out, "padded")
            script = ours(programs["time_text"], data, out, "script")
            command = ours(programs["ingester"], data, out)
            for name, value in packed.items():
                found.add(name, value)
            found.add("padded_seconds", padded["write_seconds"])
            found.add("script_seconds", script["write_seconds"])
            found.add("script_rate", script["out_bytes"] / 1e6 / script["write_seconds"])
            found.add("script_peak", script["peak_after_write"] - script["peak_after_read"])
            found.add("command_seconds", command["whole_seconds"])
            found.add("command_peak", command["whole_peak"])
            if peer:
                for name, value in theirs.items():
                    found.add(peer.name + name, value)
                for name, above, below in (
                        ("read", theirs["read_seconds"], packed["read_seconds"]),
                        ("packed", theirs["write_seconds"], packed["write_seconds"]),
                        ("padded", theirs["write_seconds"], padded["write_seconds"]),
                        ("script", theirs["write_seconds"], script["write_seconds"]),
                        ("whole", theirs["whole_seconds"], command["whole_seconds"])):
                    found.add(peer.name + name + "_ratio", above / max(below, 1e-6))
    return found


def goal_text(ratio, goal):
    if goal is None:
        return ""
    return "  (goal %.2gx: %s)" % (goal, "reached" if ratio >= goal else "SHORT")


def show(kind, data, peers, found, goals):
    size = os.path.getsize(data)
    rows, columns = int(found["rows"]), int(found["columns"])
    cells = max(rows * columns, 1)
    print("\n%s: %d rows x %d columns, %.1f MB" % (kind, rows, columns, size / 1e6))
    print("  ours, inner    read %.3f s (%.0f MB/s)   write packed %.3f s   padded %.3f s"
          % (found["read_seconds"], size / 1e6 / found["read_seconds"], found["write_seconds"],
             found["padded_seconds"]))
    note = ""
    if kind == "numeric":
        note = "  (goal %d: %s)" % (LEAST_SCRIPT_RATE,
                                    "reached" if found["script_rate"] >= LEAST_SCRIPT_RATE else "SHORT")
    print("  ours, script   write %.3f s, %.0f MB/s%s; adds %.1f MB to the peak"
          % (found["script_seconds"], found["script_rate"], note, found["script_peak"] / 1e6))
    print("  ours, whole    command %.3f s, peak %.1f MB"
          % (found["command_seconds"], found["command_peak"] / 1e6))
    read_peak = found["peak_after_read"] - found["resident_before"]
    beyond = (read_peak - size) / cells
    note = ""
    if kind in ("numeric", "wide"):
        note = "  (goal %d: %s)" % (GREATEST_BYTES_A_CELL,
                                    "reached" if beyond <= GREATEST_BYTES_A_CELL else "SHORT")
    print("  ours, memory   peak of the read %.1f MB = the file's image + %.1f bytes a cell%s"
          % (read_peak / 1e6, beyond, note))
    print("                 the Sheet itself %.1f bytes a cell; writing adds %.1f MB to the peak"
          % ((found["resident_after_read"] - found["resident_before"]) / cells,
             (found["peak_after_write"] - found["peak_after_read"]) / 1e6))
    for peer in peers:
        if peer.version is None:
            print("  %s: skipped: not installed" % peer.name)
            continue
        value = lambda name: found[peer.name + name]
        print("  %s" % peer.name)
        print("    %-8s     %.3f s   %.2fx%s" % (peer.reads, value("read_seconds"), value("read_ratio"),
                                              goal_text(value("read_ratio"), goals.get(peer.reads))))
        for form in ("packed", "padded", "script"):
            ratio = value(form + "_ratio")
            print("    %-8s     %.3f s   %.2fx to our %s form%s"
                  % (peer.writes, value("write_seconds"), ratio, form,
                     goal_text(ratio, goals.get(peer.writes))))
        print("    whole        %.3f s   %.2fx to our command, peak %.1f MB"
              % (value("whole_seconds"), value("whole_ratio"), value("whole_peak") / 1e6))
    sys.stdout.flush()


def run_factors(build, kind, scale, pairs):
    """Our conversion of texts to a Factor and R's factor(), in turn; their levels must agree."""
    rows, labels = FACTORS[kind]
    rows = max(int(rows * scale), 1)
    data = os.path.join("build/bench/data", "%s-%d.csv" % (kind, rows))
    os.makedirs(os.path.dirname(data), exist_ok=True)
    program = [os.path.join(build, "bench/time_factor"), data, str(rows), str(labels)]
    script = shutil.which("Rscript")
    os.environ["LC_ALL"] = "C"  # both sort by bytes
    found = Measures()
    for _ in range(pairs):
        ours = run(program)
        found.add("ours", ours["factor_seconds"])
        if script is None:
            continue
        theirs = run([script, "--vanilla", "-e", R_FACTOR_SCRIPT, data])
        if (ours["levels"], ours["sum"]) != (theirs["levels"], theirs["sum"]):
            sys.exit("bench: our levels of %s are not R's" % data)
        found.add("R", theirs["factor_seconds"])
        found.add("ratio", theirs["factor_seconds"] / max(ours["factor_seconds"], 1e-6))
    print("\n%s: %d texts, %d of them different" % (kind, rows, int(ours["levels"])))
    print("  ours           %.3f s" % found["ours"])
    if script is None:
        print("  R factor()     skipped: not installed")
    else:
        print("  R factor()     %.3f s   %.2fx%s" % (found["R"], found["ratio"],
                                                    goal_text(found["ratio"], FACTOR_GOAL)))
    sys.stdout.flush()


def show_dates(kind, program, pairs, scale):
    """Our conversion, which finds the format by itself, and R's, which is told it, in turn."""
    rows, form, r_format = DATE_WORKLOADS[kind]
    rows = max(int(rows * scale), 1)
    found = Measures()
    peer = Peer("R", "as.Date", "", ["Rscript", "-e", R_DATE_SCRIPT],
                ["Rscript", "-e", "cat(as.character(getRversion()))"])
    for _ in range(pairs):
        ours = run([program, str(rows), form])["convert_seconds"]
        found.add("ours", ours)
        if peer.version:
            theirs = run([*peer.command, str(rows), r_format])["convert_seconds"]
            found.add("theirs", theirs)
            found.add("ratio", theirs / max(ours, 1e-6))
    print("\n%s: %d texts\n  ours           %.3f s" % (kind, rows, found["ours"]))
    if peer.version:
        print("  R %s, as.Date  %.3f s   %.2fx%s"
              % (peer.version, found["theirs"], found["ratio"], goal_text(found["ratio"], DATE_GOAL)))
    else:
        print("  R: skipped: not installed")
    sys.stdout.flush()


def show_spreadsheet(kind, programs, folder, pairs, scale):
    """A file written from text, then read and written again and copied, all in memory."""
    rows, columns = SPREADSHEETS[kind]
    data = make_data(programs["make_data"], "build/bench/data", "numeric", max(int(rows * scale), 1), columns)
    first, second = (os.path.join(folder, name) for name in ("first.tss", "second.tss"))
    found = Measures()
    for _ in range(pairs):
        text = run([programs["time_text"], data, first, "tss"])
        ours = run([programs["time_text"], first, second, "tss"])
        size = os.path.getsize(first)
        for name in ("read", "write", "copy"):
            found.add(name, size / 1e6 / ours[name + "_seconds"])
        found.add("cells", (ours["peak_after_read"] - ours["resident_before"])
                  / (ours["rows"] * ours["columns"]))
        found.add("request", (text["read_seconds"] + text["write_seconds"]) / text["read_seconds"])
        os.remove(second)
    os.remove(first)
    least = min(LEAST_SPREADSHEET_RATE, PART_OF_COPY * found["copy"])
    verdict = lambda good: "reached" if good else "SHORT"
    print("\n%s: %.1f MB of numbers; a plain copy makes %.0f MB/s" % (kind, size / 1e6, found["copy"]))
    for name in ("read", "write"):
        print("  %-14s %.0f MB/s  (goal %.0f: %s)" % (name, found[name], least, verdict(found[name] >= least)))
    print("  memory         %.1f bytes a cell  (goal %d: %s)"
          % (found["cells"], GREATEST_BYTES_A_CELL, verdict(found["cells"] <= GREATEST_BYTES_A_CELL)))
    print("  text to file   %.2f of reading the text  (goal %.2f: %s)"
          % (found["request"], MOST_OF_READING, verdict(found["request"] <= MOST_OF_READING)))
    sys.stdout.flush()


def show_join(kind, build, scale, pairs):
    """Sorting against GNU sort, merging against both sorts, transposing against a copy, and what ten times
    the size costs."""
    program = os.path.join(build, "bench/time_joins")
    size = max(int(JOINS[kind] * scale), 10)
    found = Measures()
    lines = os.path.join("build/bench", "joins.csv")
    for _ in range(pairs):
        if kind == "sort":
            ours = run([program, "sort", str(size), lines])["sort_seconds"]
            theirs = run(["env", "LC_ALL=C", "sort", "-s", "-t,", "-k1,1", "-k2,2n", "-o", lines + ".out",
                          lines])["whole_seconds"]
            found.add("ratio", theirs / max(ours, 1e-6))
        elif kind in ("levels", "append"):
            tenth = run([program, kind, str(size // 10)])[kind + "_seconds"]
            ours = run([program, kind, str(size)])[kind + "_seconds"]
            found.add("ratio", ours / max(tenth, 1e-6))
        else:
            extra = [str(max(int(TRANSPOSED_COLUMNS * scale), 10))] if kind == "transpose" else []
            result = run([program, kind, str(size), *extra])
            ours = result[kind + "_seconds"]
            found.add("ratio", ours / max(result["sorts_seconds" if kind == "merge" else "copy_seconds"], 1e-6))
        found.add("ours", ours)
    ratio = found["ratio"]
    word, good = {
        "sort": ("GNU sort / ours (goal %.2g" % SORT_GOAL, ratio >= SORT_GOAL),
        "merge": ("of both sorts (goal %.2g" % MERGE_GOAL, ratio < MERGE_GOAL),
        "transpose": ("of a copy of the cells (goal %.2g" % TRANSPOSE_GOAL, ratio < TRANSPOSE_GOAL),
    }.get(kind, ("of a tenth of the size (goal %.2g" % TEN_TIMES_GOAL, ratio <= TEN_TIMES_GOAL))
    print("\n%s: %d\n  ours           %.3f s   %.2fx %s: %s)"
          % (kind, size, found["ours"], ratio, word, "reached" if good else "SHORT"))
    sys.stdout.flush()


def main():
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("--build", default="build/release", help="folder of the built programs")
    parser.add_argument("--rows-scale", type=float, default=1.0, help="part of the rows, for a quick run")
    parser.add_argument("--only", choices=sorted(WORKLOADS | SPREADSHEETS | FACTORS | DATE_WORKLOADS | JOINS),
                        action="append", help="this workload; repeatable")
    parser.add_argument("--pairs", type=int, default=5, help="paired runs (default %(default)s)")
    options = parser.parse_args()

    programs = {"make_data": "bench/make_data", "time_text": "bench/time_text",
                "time_dates": "bench/time_dates", "ingester": "ingester"}
    programs = {name: os.path.join(options.build, path) for name, path in programs.items()}
    peers = find_peers()
    memory_folder = "/dev/shm"
    out_root = memory_folder if os.access(memory_folder, os.W_OK) else "build/bench"
    os.makedirs("build/bench", exist_ok=True)

    print("Medians of %d paired runs on %d processors. Input in memory (page cache); all parties write to %s."
          % (options.pairs, os.cpu_count(), out_root))
    for peer in peers:
        print("%s: %s" % (peer.name, peer.version or "skipped: not installed"))
    with tempfile.TemporaryDirectory(prefix="ingester-bench-", dir=out_root) as folder:
        for kind in options.only or WORKLOADS | SPREADSHEETS | FACTORS | DATE_WORKLOADS | JOINS:
            if kind in SPREADSHEETS:
                show_spreadsheet(kind, programs, folder, max(options.pairs, 1), options.rows_scale)
                continue
            if kind in JOINS:
                show_join(kind, options.build, options.rows_scale, max(options.pairs, 1))
                continue
            if kind in FACTORS:
                run_factors(options.build, kind, options.rows_scale, max(options.pairs, 1))
                continue
            if kind in DATE_WORKLOADS:
                show_dates(kind, programs["time_dates"], max(options.pairs, 1), options.rows_scale)
                continue
            rows, columns, goals = WORKLOADS[kind]
            rows = max(int(rows * options.rows_scale), 1)
            data = make_data(programs["make_data"], "build/bench/data", kind, rows, columns)
            found = measure(programs, [peer for peer in peers if peer.version], data,
                            os.path.join(folder, "out.csv"), max(options.pairs, 1))
            if (int(found["rows"]), int(found["columns"])) != (rows, columns):
                sys.exit("bench: our reader found %d rows x %d columns in %s"
                         % (found["rows"], found["columns"], data))
            show(kind, data, peers, found, goals)


if __name__ == "__main__":
    main()
