#!/usr/bin/env python3
"""Reads polluted text tables by the command, by R's fread and by pandas with sep=None, all told nothing.

Prints how many come out as the clean table, and on how many tables where the other two agree the command
differs from them. Usage: compare_texts.py COMMAND [TABLES]. A reader that is missing is left out, and told.
"""
import csv, json, os, random, shutil, subprocess, sys, tempfile

try:
    import pandas
except ImportError:
    pandas = None

COLUMNS = ["plot", "site name", "yield", "code", "note"]
SITES = ["Kiel, north", "Oslo", "Nice", "Bern; old", "Graz"]
MISSING = {"", "NA", "nan", "NaN", "NULL"}


def clean(rows):
    return [[str(i), SITES[i % 5], f"{i * 3}.25", f"A{i}", f"note of {i}"] for i in range(1, rows + 1)]


def quoted(text, style):
    quote = style["quote"]
    if style["sep"] in text or quote in text or "\n" in text:
        return quote + text.replace(quote, style["escape"] + quote) + quote
    return text


def line(cells, style):
    return style["sep"].join(quoted(cell, style) for cell in cells) + style["tail"]


def polluted(choice, seed):
    """One table: its text, and the cells that it should read as."""
    chance = random.Random(seed)
    cells = clean(chance.choice([8, 20, 60]))
    style = {"sep": ",", "quote": '"', "escape": '"', "tail": "", "end": "\n"}
    at = chance.randrange(len(cells))
    lines = None
    front = behind = ""
    if "separator" in choice:
        style["sep"] = chance.choice([";", "\t", "|"])
    if "quotes" in choice:
        style["quote"], cells[at][4] = "'", "it, or that"
    if "backslash" in choice:
        style["escape"], cells[at][4] = "\\", 'say "hi", he said'
    if "ends" in choice:
        style["end"] = "\r\n"
    if "lines" in choice:
        cells[at][4] = "two\nlines"
    if "missing" in choice:
        cells[at][2] = ""
    if "title" in choice:
        front = "Yields of the year\nmade by hand\n"
    if "comma" in choice:
        style["sep"] = ";"
    if "tails" in choice:
        style["tail"] = style["sep"]
    shown = [[c.replace(".", ",") if "comma" in choice and i == 2 else c for i, c in enumerate(row)] for row in cells]
    lines = [line(COLUMNS, style)] + [line(row, style) for row in shown]
    if "empty" in choice:
        lines.insert(at + 1, "")
    if "other" in choice:
        cells[at][1], cells[at][4] = "Oslo", "x"
        lines[lines.index(line(shown[at], style))] = ("," if style["sep"] != "," else ";").join(cells[at])
    text = front + style["end"].join(lines) + behind + ("" if "open" in choice else style["end"])
    return text, [COLUMNS] + cells


KINDS = ["separator", "quotes", "backslash", "ends", "tails", "lines", "missing", "title", "comma", "empty", "other", "open"]


def canonical(rows):
    """Numbers by value, missing words as one."""
    def cell(text):
        text = text.strip()
        if text in MISSING:
            return ""
        try:
            return repr(float(text))
        except ValueError:
            return text
    width = max((len(row) for row in rows), default=0)
    table = [[cell(c) for c in row] + [""] * (width - len(row)) for row in rows]
    while width > 1 and all(row[width - 1] == "" or i == 0 for i, row in enumerate(table)) and len(COLUMNS) < width:
        width -= 1
        table = [row[:width] for row in table]
    return table


def by_command(command, paths, folder):
    for path in paths:
        out = os.path.join(folder, "out.csv")
        ran = subprocess.run([command, "-q", "-f", "--write-missing", "", path, out], capture_output=True, check=False)
        if ran.returncode != 0:
            yield None
            continue
        with open(out, encoding="utf-8", newline="") as file:
            yield canonical(list(csv.reader(file)))


def by_fread(paths, folder):
    script = os.path.join(folder, "read.R")
    with open(script, "w", encoding="utf-8") as file:
        file.write("suppressMessages(library(data.table))\nfor (p in readLines(commandArgs(TRUE)[1])) tryCatch("
                   "fwrite(suppressWarnings(fread(p)), paste0(p, '.R.csv'), na='', quote=TRUE),error=function(e) NULL)\n")
    listing = os.path.join(folder, "list")
    with open(listing, "w", encoding="utf-8") as file:
        file.write("\n".join(paths) + "\n")
    subprocess.run(["Rscript", script, listing], capture_output=True, check=False)
    for path in paths:
        try:
            with open(path + ".R.csv", encoding="utf-8", newline="") as file:
                yield canonical(list(csv.reader(file)))
        except OSError:
            yield None


def by_pandas(paths):
    for path in paths:
        try:
            frame = pandas.read_csv(path, sep=None, engine="python")
            rows = [[str(c) for c in frame.columns]] + [["" if pandas.isna(v) else str(v) for v in row] for row in frame.values.tolist()]
            yield canonical(rows)
        except Exception:  # whatever it can't read, it can't
            yield None


def main():
    command, tables = os.path.abspath(sys.argv[1]), int(sys.argv[2]) if len(sys.argv) > 2 else 300
    with tempfile.TemporaryDirectory() as folder:
        paths, wanted, chosen = [], [], []
        for seed in range(tables):
            chance = random.Random(seed)
            choice = chance.sample(KINDS, chance.choice([0, 1, 1, 2, 3]))
            if "comma" in choice and "separator" in choice:
                choice.remove("separator")
            if "quotes" in choice and "backslash" in choice:
                choice.remove("quotes")
            text, cells = polluted(choice, seed)
            paths.append(os.path.join(folder, f"t{seed}.csv"))
            with open(paths[-1], "w", encoding="utf-8", newline="") as file:
                file.write(text)
            wanted.append(canonical(cells))
            chosen.append(choice)
        results = {"command": list(by_command(command, paths, folder))}
        if shutil.which("Rscript"):
            results["fread"] = list(by_fread(paths, folder))
        if pandas is not None:
            results["pandas"] = list(by_pandas(paths))
        for name, read in results.items():
            print(name, sum(r == w for r, w in zip(read, wanted)), "of", tables)
        for name in {"fread", "pandas"} - set(results):
            print(name, "is missing")
        wrong = [chosen[i] for i in range(tables) if results["command"][i] != wanted[i]]
        print("wrong:", json.dumps(wrong[:10]))
        if "fread" in results and "pandas" in results:
            agreed = [i for i in range(tables) if results["fread"][i] is not None and results["fread"][i] == results["pandas"][i]]
            differs = [i for i in agreed if results["command"][i] != results["fread"][i]]
            right = sum(results["command"][i] == wanted[i] for i in differs)
            print("the other two agree on", len(agreed), "tables; the command differs on", len(differs),
                  "of them, where it is right on", right)


main()
