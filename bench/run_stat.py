#!/usr/bin/env python3
"""Measures files of statistics packages: the command from each to a spreadsheet of the host, against the same table
from such a spreadsheet or from comma text.

Every ratio is the median of the ratios of neighbours in paired runs; "1.20" says that the first took 1.2 times as long.
"""

import argparse
import os
import shutil
import statistics
import subprocess
import sys
import tempfile
import time

# Files made by make_sav: form, rows, numbers, texts, labels, distinct labelled values.
FILES = {
    "plain.sav": ("plain", 1_000_000, 7, 2, 8, 8),
    "coded.sav": ("coded", 1_000_000, 7, 2, 8, 8),
    "uncounted.sav": ("uncounted", 1_000_000, 7, 2, 8, 8),
    "labels.sav": ("plain", 5_000_000, 1, 0, 40, 40),
    "no-labels.sav": ("plain", 5_000_000, 1, 0, 0, 40),
    "wide.sav": ("plain", 50_000, 200, 0, 0, 0),
    "names.sav": ("plain", 20, 50_000, 0, 0, 0),
    "names-tenth.sav": ("plain", 20, 5_000, 0, 0, 0),
    "tenth.sav": ("plain", 100_000, 7, 2, 8, 8),
}

# From which files by the command the others are made.
CONVERTED = {"table.tss": "plain.sav", "table.xpt": "plain.sav", "table.csv": "plain.sav"}

# What is compared: a name, the input and options of both, and what the ratio may come to.
PAIRS = [
    ("plain .sav against .tss", ["plain.sav"], ["table.tss"], 1.25),
    ("coded .sav against .tss", ["coded.sav"], ["table.tss"], 1.25),
    (".xpt against .tss", ["table.xpt"], ["table.tss"], 1.25),
    (".sav not counted against counted", ["uncounted.sav"], ["plain.sav"], 1.1),
    (".por against comma text", ["table.por"], ["table.csv"], 1.0),
    ("40 labels against none, 5,000,000 rows", ["labels.sav"], ["no-labels.sav"], 1.3),
    ("3 of 200 columns against all", ["wide.sav", "--keep", "1,100,200"], ["wide.sav"], 0.4),
    ("50,000 variables against 5,000", ["names.sav"], ["names-tenth.sav"], 11),
    ("1,000,000 cases against 100,000", ["plain.sav"], ["tenth.sav"], 11),
]


def seconds(command):
    start = time.perf_counter()
    subprocess.run(command, check=True, stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL)
    return time.perf_counter() - start


def make_files(build, folder, scale):
    for name, (form, rows, *others) in FILES.items():
        rows = max(int(rows * scale), 1) if rows > 1000 else rows
        subprocess.run([os.path.join(build, "bench/make_sav"), os.path.join(folder, name), form, str(rows)]
                       + [str(other) for other in others], check=True)
    for name, source in CONVERTED.items():
        subprocess.run([os.path.join(build, "ingester"), os.path.join(folder, source), os.path.join(folder, name)],
                       check=True, stderr=subprocess.DEVNULL)


def make_portable(folder):
    """Only another program writes them."""
    if shutil.which("pspp") is None:
        return
    orders = os.path.join(folder, "make.sps")
    with open(orders, "w", encoding="ascii") as file:
        file.write('GET FILE="%s/plain.sav".\nEXPORT OUTFILE="%s/table.por".\n' % (folder, folder))
    subprocess.run(["pspp", orders], check=False, stdout=subprocess.DEVNULL)


def compare(build, folder, pair, pairs):
    name, first, second, goal = pair
    inputs = [[os.path.join(folder, work[0])] + work[1:] for work in (first, second)]
    if not all(os.path.exists(work[0]) for work in inputs):
        print("%-42s skipped: no program that makes the file is installed" % name)
        return
    out = os.path.join(folder, "out.tss")
    found = [[], []]
    for _ in range(pairs):
        for times, work in zip(found, inputs):
            times.append(seconds([os.path.join(build, "ingester"), work[0], out, "--force"] + work[1:]))
    ratio = statistics.median(a / b for a, b in zip(*found))
    print("%-42s %.3f s  %.3f s  %5.2f  (goal %.2f: %s)"
          % (name, statistics.median(found[0]), statistics.median(found[1]), ratio, goal,
             "reached" if ratio <= goal else "SHORT"))
    sys.stdout.flush()


def show_writing(build, folder, pairs):
    """A transport file, against a plain copy of it."""
    out = os.path.join(folder, "out.xpt")
    found = [[], []]
    for _ in range(pairs):
        found[0].append(seconds([os.path.join(build, "ingester"), os.path.join(folder, "table.tss"), out, "--force"]))
        found[1].append(seconds(["cp", os.path.join(folder, "table.xpt"), os.path.join(folder, "copy.xpt")]))
    size = os.path.getsize(out)
    print("%-42s %.3f s with the reading of the .tss; a copy %.3f s; %.0f MB"
          % (".xpt written", statistics.median(found[0]), statistics.median(found[1]), size / 1e6))


def main():
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("--build", default="build/release", help="folder of the built programs")
    parser.add_argument("--rows-scale", type=float, default=1.0, help="part of the rows, for a quick run")
    parser.add_argument("--pairs", type=int, default=5, help="paired runs (default %(default)s)")
    options = parser.parse_args()
    memory_folder = "/dev/shm"
    root = memory_folder if os.access(memory_folder, os.W_OK) else None
    with tempfile.TemporaryDirectory(prefix="ingester-bench-", dir=root) as folder:
        make_files(options.build, folder, options.rows_scale)
        make_portable(folder)
        for pair in PAIRS:
            compare(options.build, folder, pair, options.pairs)
        show_writing(options.build, folder, options.pairs)


if __name__ == "__main__":
    main()
