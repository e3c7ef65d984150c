#!/usr/bin/env python3
"""Measures how time and memory grow with the table: text, script, spreadsheet and book of 10 columns of numbers.

Ten times the cells should take no more than eleven times as long, and eleven times the memory. Each figure is
the median of some runs; peers take their turns in the same run. A virtual machine gives memory that is not used
back to its host, and takes long to fetch that again: "held" steps are done a second time in one process, in
memory that it has not let go, and the time to touch as much fresh memory once stands beside them.
"""

import argparse
import os
import subprocess
import sys
import tempfile

from run_bench import Measures, find_peers, make_data, run

COLUMNS = 10
MOST_GROWTH = 11.0
BYTES_A_CELL = 24
HELD = ", held"
FORMS = ("packed", "script", "tss", "tbk")
STEPS = ["read text"] + ["write " + form for form in FORMS] + ["read tss", "read tbk"]
TOUCH = """
import mmap, time
memory = mmap.mmap(-1, %d)
start = time.perf_counter()
memory[::4096] = bytes(-(-len(memory) // 4096))
print("touch_seconds", time.perf_counter() - start)
"""


def add_steps(found, command, data, out, form, kind):
    """One run of reading `data` and writing it to `out`, and one of reading that."""
    result = run(command + [data, out, form])
    found.add("read text" + kind, result["read_seconds"])
    found.add("write " + form + kind, result["write_seconds"])
    if not kind:
        found.add("memory", result["resident_after_read"] - result["resident_before"])
    if form in ("tss", "tbk"):
        found.add("read " + form + kind, run(command + [out])["read_seconds"])
        found.add("copy" + kind, result["copy_seconds"])
    os.remove(out)


def measure(program, peers, data, folder, cells, runs):
    """Seconds of each step, and bytes beyond an empty process once the text is read."""
    found = Measures()
    for _ in range(runs):
        for form in FORMS:
            out = os.path.join(folder, "out." + {"packed": "csv", "script": "gen"}.get(form, form))
            add_steps(found, [program], data, out, form, "")
            add_steps(found, [program, "--held"], data, out, form, HELD)
        found.add("memory touched", run([sys.executable, "-c", TOUCH % (BYTES_A_CELL * cells)])["touch_seconds"])
        for peer in peers:
            result = run(peer.command + [data, os.path.join(folder, "out.csv")])
            found.add(peer.reads, result["read_seconds"])
            found.add(peer.writes, result["write_seconds"])
            os.remove(os.path.join(folder, "out.csv"))
    return found


def show(name, values, unit, scale):
    text = ["%10.3f" % (value * scale) for value in values]
    growth = [after / max(before, 1e-9) for before, after in zip(values, values[1:])]
    marks = ["%7.1fx%s" % (factor, "" if factor <= MOST_GROWTH else " MORE") for factor in growth]
    print("  %-18s%s %-3s%s" % (name, "".join(text), unit, "".join(marks)))


def main():
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("--build", default="build/release", help="folder of the built programs")
    parser.add_argument("--cells", type=int, nargs="+", default=[1_000_000, 10_000_000, 100_000_000])
    parser.add_argument("--runs", type=int, default=3, help="runs of each size (default %(default)s)")
    parser.add_argument("--peers", action="store_true", help="measure the peers that are installed as well")
    options = parser.parse_args()
    make = os.path.join(options.build, "bench/make_data")
    program = os.path.join(options.build, "bench/time_text")
    peers = [peer for peer in find_peers() if peer.version] if options.peers else []
    root = "/dev/shm" if os.access("/dev/shm", os.W_OK) else "build/bench"
    found = []
    for cells in options.cells:
        with tempfile.TemporaryDirectory(prefix="ingester-scale-", dir=root) as folder:
            data = make_data(make, folder, "numeric", cells // COLUMNS, COLUMNS)
            found.append(measure(program, peers, data, folder, cells, options.runs))
    print("cells             %s" % "".join("%10d" % cells for cells in options.cells))
    steps = STEPS + ["copy"]
    steps += [step + HELD for step in steps] + ["memory touched"]
    for step in steps + [name for peer in peers for name in (peer.reads, peer.writes)]:
        show(step, [one[step] for one in found], "s", 1)
    show("memory", [one["memory"] for one in found], "MB", 1e-6)
    return 0


if __name__ == "__main__":
    sys.exit(main())
