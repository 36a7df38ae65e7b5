"""command.py COMMAND RESULTS [RECORDS]: the command beside the sqlite3 shell and sqlite-utils.

Imports and exports a million records of eight members, in turns, each into a new database file with
the settings that a new file has. Before anything counts, the databases are compared. Writes CPU
times (all threads, the system's part included), for one row the time of the clock, and peak memory to
RESULTS, as ratios.json has them.
"""

import json
import os
import pathlib
import random
import statistics
import subprocess
import sys
import tempfile
import time

ROUNDS = 3
WORDS = ["café", "l'été", "rück", "piñata", "it's", "déjà", "o'clock", "straße",
         "depot", "north", "yard", "łódź", "harbour", "100%", "gate", "d'or"]
TYPES = {"id": "long long", "code": "string", "name": "string", "city": "string", "active": "bool",
         "level": "long long", "note": "string", "tags": "Json::arrayValue"}
COLUMNS = ("id INTEGER PRIMARY KEY, code TEXT, name TEXT, city TEXT, active INTEGER, level INTEGER, "
           "note TEXT, tags TEXT")
ISO_CODES = "/usr/share/iso-codes/json/iso_639-3.json"


def record(number, choice):
    def text(words):
        return " ".join(choice.choices(WORDS, k=words))
    return {"id": number, "code": f"{choice.getrandbits(48):012x}", "name": text(2), "city": text(1),
            "active": choice.random() < 0.5, "level": choice.randrange(1000), "note": text(4),
            "tags": choice.choices(WORDS, k=2)}


def write_records(count, lines, cells):
    """The same records as JSON Lines, and as CSV as the shell needs them for equal rows."""
    choice = random.Random(1)
    with open(lines, "w", encoding="utf-8") as to_lines, open(cells, "w", encoding="utf-8") as to_cells:
        for number in range(1, count + 1):
            one = record(number, choice)
            to_lines.write(json.dumps(one, ensure_ascii=False, separators=(",", ":")) + "\n")
            row = [str(int(one[name])) if name in ("id", "active", "level") else
                   json.dumps(one[name], ensure_ascii=False, separators=(",", ":"))
                   if name == "tags" else one[name] for name in TYPES]
            to_cells.write(",".join('"' + cell.replace('"', '""') + '"' for cell in row) + "\n")


def run(*words, output=subprocess.DEVNULL):
    """CPU seconds, peak KiB and seconds of the clock of a process that must succeed."""
    start = time.monotonic()
    process = subprocess.Popen(words, stdout=output, stderr=subprocess.DEVNULL)
    _, status, usage = os.wait4(process.pid, 0)
    process.returncode = os.waitstatus_to_exitcode(status)
    if process.returncode != 0:
        sys.exit(f"{' '.join(words)} failed with {process.returncode}")
    return usage.ru_utime + usage.ru_stime, usage.ru_maxrss, time.monotonic() - start


class Bench:
    def __init__(self, command, folder, count):
        self.command, self.folder = command, pathlib.Path(folder)
        self.lines, self.cells = str(self.folder / "t.jsonl"), str(self.folder / "t.csv")
        self.count = count
        write_records(count, self.lines, self.cells)

    def database(self, name):
        path = self.folder / name
        path.unlink(missing_ok=True)
        return str(path)

    def new_table(self):
        return run(self.command, "insert", self.database("new.db"), "t", self.lines, "--key", "id")

    def given_table(self):
        path = self.database("given.db")
        run(self.command, "init", path, "t", *(f"{name}:{kind}" for name, kind in TYPES.items()),
            "--key", "id")
        return run(self.command, "insert", path, "t", self.lines)

    def shell(self):
        path = self.database("shell.db")
        run("sqlite3", path, f"CREATE TABLE t ({COLUMNS})")
        return run("sqlite3", path, ".mode csv", f".import {self.cells} t")

    def utils(self):
        return run("sqlite-utils", "insert", self.database("utils.db"), "t", self.lines, "--nl", "--pk",
                   "id")

    def export(self):
        with open(self.folder / "ours.jsonl", "wb") as output:
            return run(self.command, "list", str(self.folder / "given.db"), "t", "--format", "jsonl",
                       output=output)

    def export_shell(self):
        with open(self.folder / "shell.json", "wb") as output:
            return run("sqlite3", "-json", str(self.folder / "shell.db"), "SELECT * FROM t",
                       output=output)

    def iso_codes(self):
        return run(self.command, "insert", self.database("iso.db"), "language", ISO_CODES)

    def check(self):
        """All databases hold the same rows, and what was exported is what went in."""
        rows = {subprocess.run(
            ["sqlite3", str(self.folder / name),
             "SELECT id, code, name, city, active, level, note, tags FROM t ORDER BY id LIMIT 20000"],
            check=True, capture_output=True).stdout for name in ("new.db", "given.db", "shell.db")}
        counts = {subprocess.run(["sqlite3", str(self.folder / name), "SELECT count(*) FROM t"],
                                 check=True, capture_output=True).stdout
                  for name in ("new.db", "given.db", "shell.db", "utils.db")}
        if len(rows) != 1 or len(counts) != 1:
            sys.exit("the imports differ")
        with open(self.lines, encoding="utf-8") as put, \
                open(self.folder / "ours.jsonl", encoding="utf-8") as got:
            for before, after in zip(put, got, strict=True):
                if json.loads(before) != json.loads(after):
                    sys.exit(f"exported otherwise: {after}")


def languages():
    with open(ISO_CODES, encoding="utf-8") as file:
        return len(json.load(file)["639-3"])


def row(name, work, against, ours, other, goal, unit="s"):
    return {"name": name, "work": work, "against": against, "ours": ours, "other": other,
            "unit": unit, "figure": ours / other, "goal": goal}


def measure(bench):
    works = [bench.new_table, bench.given_table, bench.shell, bench.export, bench.export_shell]
    runs = {work.__name__: [] for work in works}
    for _ in range(ROUNDS):
        for work in works:
            runs[work.__name__].append(work())
    runs["utils"] = [bench.utils()]
    runs["iso_codes"] = [bench.iso_codes()]
    bench.check()
    cpu = {name: statistics.median(one[0] for one in all) for name, all in runs.items()}
    peak = {name: max(one[1] for one in all) for name, all in runs.items()}
    clock = {name: statistics.median(one[2] for one in all) for name, all in runs.items()}
    most = max(peak[name] for name in ("new_table", "given_table", "export", "iso_codes")) / 1024
    return [
        row("command-given", "import into a given table", "shell's `.import` of CSV",
            cpu["given_table"], cpu["shell"], 1.05),
        row("command-new", "import into a new table, types from all records",
            "shell's `.import` of CSV", cpu["new_table"], cpu["shell"], 1.30),
        row("command-utils", f"the same ({cpu['utils'] / cpu['new_table']:.0f} times as fast)",
            "`sqlite-utils insert`", cpu["new_table"], cpu["utils"], 0.10),
        row("command-utils-clock",
            f"the same by the clock ({clock['utils'] / clock['new_table']:.0f} times as fast)",
            "`sqlite-utils insert`", clock["new_table"], clock["utils"], 0.10),
        row("command-export", "export as JSON Lines", "shell's `-json`", cpu["export"],
            cpu["export_shell"], 1.15),
        row("command-peak", "peak memory of any of these", "32 MiB", most, 32, 1.0, "MiB"),
        row("command-iso", "import of iso_639-3.json, which sqlite-utils refuses",
            "as many of the records above", cpu["iso_codes"] * 1e3,
            cpu["new_table"] * 1e3 * languages() / bench.count, 0, "ms"),
    ]


def main(command, results, count="1000000"):
    with tempfile.TemporaryDirectory() as folder:
        rows = measure(Bench(command, folder, int(count)))
    with open(results, "w", encoding="utf-8") as file:
        json.dump(rows, file, indent=1)
    for one in rows:
        print(f"{one['work']}: {one['ours']:.2f} {one['unit']} against {one['other']:.2f}, "
              f"ratio {one['figure']:.2f}, goal {one['goal'] or 'none'}")


if __name__ == "__main__":
    if len(sys.argv) not in (3, 4):
        sys.exit(__doc__)
    main(*sys.argv[1:])
