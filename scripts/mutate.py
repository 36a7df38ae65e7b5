#!/usr/bin/env python3
"""Tries changed forms of src/ or table/ against the tests; scripts/mutate.sh prepares what it needs."""

import argparse
import collections
import concurrent.futures
import datetime
import os
import pathlib
import queue
import random
import re
import resource
import shutil
import subprocess
import sys
import threading
import time

import figures
import mutants

SHUFFLED = ["--gtest_shuffle", "--gtest_random_seed=7"]
# How many tests that noticed a change of a file are asked first about the next one.
ASKED_FIRST = 8
# Tests that take longer than this part of the time of all are asked last.
SLOW = 0.01
COMPILER = os.environ.get("CXX", "g++")
# Several times as fast as the usual one, which links a library for each change.
LINKER = ["-fuse-ld=lld"] if shutil.which("ld.lld") else []
# A change that grows without end.
MEMORY_LIMIT = 4 << 30
OUTCOMES = ("killed", "marked", "same program", "not compiled", "survived")


class Library:
    """Objects of the unchanged sources, and libraries in which some of them are others."""

    # What the tests are linked with: the library with every name visible.
    NAME, HEADER = "libvornjsondb_testable.so", "VornJsonDbApi.h"
    DEFINED = ()
    # In one process a test may hide behind what an earlier one left.
    ORDERS = ([], SHUFFLED)

    def __init__(self, folder, pool):
        self.folder = folder
        self.sources = self.find_sources()
        json = subprocess.run(["pkg-config", "--cflags", "jsoncpp"], capture_output=True, text=True, check=True)
        self.flags = ["-std=c++17", "-fPIC", "-w", *self.DEFINED]
        self.flags += [f"-I{folder}/header", "-Iinclude"] + json.stdout.split()
        # Compiled once, together with the headers that it includes.
        (folder / "header").mkdir(exist_ok=True)
        header = str(shutil.copy(f"include/{self.HEADER}", folder / "header"))
        subprocess.run([COMPILER, *self.flags, "-O0", "-x", "c++-header", header, "-o", header + ".gch"], check=True)
        # Whoever works on the sources meanwhile shall not change what is tried.
        self.original = folder / "original"
        copy_sources(self.original)
        shutil.rmtree(folder / "objects", ignore_errors=True)
        (folder / "objects").mkdir()
        for compiled in pool.map(lambda s: self.compile(s, self.object_of(s)), self.sources):
            if compiled.returncode != 0:
                sys.exit(compiled.stderr)
        self.users = self.find_users()

    def find_sources(self):
        return sorted(pathlib.Path("src").rglob("*.cpp"))

    def make_tests(self):
        """The program of all tests, which takes the library from LD_LIBRARY_PATH."""
        return self.folder / "tests" / "vornjsondb_tests"

    def compile(self, source, output, options=("-O0",)):
        command = [COMPILER, *self.flags, *options, "-include", self.HEADER, "-c", str(source), "-o", str(output)]
        return subprocess.run(command, capture_output=True, text=True)

    def object_of(self, source, kind=""):
        return self.folder / "objects" / (str(source).replace("/", "_") + kind + ".o")

    def find_users(self):
        """For each header the sources that include it."""
        users = {}
        for source in self.sources:
            command = [COMPILER, *self.flags, "-MM", str(source)]
            names = subprocess.run(command, capture_output=True, text=True, check=True).stdout
            for name in re.findall(r"[^\s\\:]+\.h\b", names):
                header = pathlib.Path(os.path.relpath(os.path.normpath(name)))
                users.setdefault(header, []).append(source)
        return users

    def link(self, worker, replaced):
        objects = [str(replaced.get(source, self.object_of(source))) for source in self.sources]
        subprocess.run([COMPILER, *LINKER, "-shared", "-Wl,-Bsymbolic-functions", f"-Wl,-soname,{self.NAME}",
                        "-o", str(worker / self.NAME), *objects, "-ljsoncpp", "-lsqlite3"], check=True)  # fmt: skip

    def is_same_program(self, worker, replaced):
        """Whether the optimised code of the changed sources is that of the unchanged ones."""
        for source in replaced:
            original, changed = self.object_of(source, ".O2"), worker / "O2.o"
            if not original.exists():
                self.compile(self.original / source, original, ("-O2", "-fvisibility=hidden"))
            self.compile(worker / source, changed, ("-O2", "-fvisibility=hidden"))
            if original.read_bytes() != changed.read_bytes():
                return False
        return True


class TableLibrary(Library):
    """The second handle, shared instead of static."""

    NAME, HEADER = "libvornjsondb_table_changed.so", "VornJsonDbTable.h"
    DEFINED = ("-DVORN_TYPES_WITHOUT_TREATMENTS",)
    # It keeps nothing between calls that a test could hide behind.
    ORDERS = ([],)

    def find_sources(self):
        shared = re.findall(r"PROJECT_SOURCE_DIR}/(src/\S+\.cpp)", pathlib.Path("table/CMakeLists.txt").read_text())
        return sorted({*pathlib.Path("table").glob("*.cpp"), *map(pathlib.Path, shared)})

    def make_tests(self):
        self.link(self.folder, {})
        program = self.folder / "table_tests"
        objects = (self.folder / "tests/table/CMakeFiles/vornjsondb_table_tests.dir").rglob("*.o")
        # nanosleep and clock_gettime of the tests must be found before the real ones.
        subprocess.run([COMPILER, *LINKER, "-rdynamic", "-o", str(program), *map(str, sorted(objects)),
                        f"-L{self.folder}", f"-l:{self.NAME}", "-lvornjsondb", f"-Wl,-rpath,{self.folder.resolve()},--enable-new-dtags",
                        "-lgtest_main", "-lgmock", "-lgtest", "-ljsoncpp", "-lsqlite3"], check=True)  # fmt: skip
        return program


def copy_sources(folder):
    shutil.rmtree(folder, ignore_errors=True)
    for name in ("src", "table"):
        shutil.copytree(name, folder / name)


class Check:
    """Builds changed libraries and runs the tests against them."""

    def __init__(self, folder, jobs, library):
        self.folder = folder
        self.pool = concurrent.futures.ThreadPoolExecutor(jobs)
        self.library = library(folder, self.pool)
        self.tests = self.library.make_tests()
        self.workers = queue.Queue()
        for number in range(jobs):
            worker = (folder / f"worker{number}").resolve()
            copy_sources(worker)
            self.workers.put(worker)
        self.quick, self.slow, self.failing = [], [], []
        self.seconds = {}
        # For each file the tests that noticed a change of it, with how many they noticed.
        self.noticed = collections.defaultdict(collections.Counter)
        self.sort_tests()

    def run_tests(self, worker, options, seconds):
        """The test that fails against the worker's library, in bounded time of the processor; "" if none does."""
        shutil.rmtree(worker / "tmp", ignore_errors=True)
        (worker / "tmp").mkdir()
        environment = dict(os.environ, LD_LIBRARY_PATH=str(worker), TMPDIR=str(worker / "tmp"))
        with open(worker / "tests.log", "w") as log:
            limits = ["prlimit", f"--cpu={seconds}", f"--as={MEMORY_LIMIT}"]
            process = subprocess.Popen([*limits, str(self.tests), *options], env=environment,
                                       stdout=log, stderr=subprocess.STDOUT, start_new_session=True)  # fmt: skip
            try:
                if process.wait(600) == 0:
                    return ""
            except subprocess.TimeoutExpired:
                os.killpg(process.pid, 9)
                process.wait()
        text = (worker / "tests.log").read_text(errors="replace")
        # One that crashed or went on for ever is the last that was begun.
        failed = re.findall(r"^\[  FAILED  \] ([\w/.]+)", text, re.M)
        begun = re.findall(r"^\[ RUN      \] (\S+)", text, re.M)
        return (failed[:1] or begun[-1:] or ["none"])[0]

    def sort_tests(self):
        """Those that fail without any change can tell nothing; those that take long are asked last."""
        worker = self.workers.get()
        self.library.link(worker, {})
        failing = set()
        for order in self.library.ORDERS:
            before = resource.getrusage(resource.RUSAGE_CHILDREN)
            self.run_tests(worker, order, 300)
            used = resource.getrusage(resource.RUSAGE_CHILDREN).ru_utime - before.ru_utime
            text = (worker / "tests.log").read_text(errors="replace")
            failing.update(re.findall(r"^\[  FAILED  \] ([\w/]+\.[\w/]+)", text, re.M))
        taken = re.findall(r"^\[       OK \] (\S+) \((\d+) ms\)", text, re.M)
        total = sum(int(ms) for _, ms in taken)
        self.failing = sorted(failing)
        for name, ms in taken:
            if name not in failing:
                (self.slow if int(ms) > SLOW * total else self.quick).append(name)
        for tests in (self.quick, self.slow):
            part = sum(int(ms) for name, ms in taken if name in tests) / total
            self.seconds[id(tests)] = max(3, round(3 * used * part))
        self.workers.put(worker)
        if failing:
            print(f"{len(failing)} tests fail without any change and are left out: {' '.join(self.failing)}")

    def passes(self, worker, path, tests, order=()):
        """Whether no test of these notices the change."""
        noticed = self.noticed[path]
        first = [name for name, _ in noticed.most_common(ASKED_FIRST) if name in tests] if not order else []
        # The quick ones are named by what they are not, which is shorter.
        rest = "*-" + ":".join([*self.slow, *self.failing, *first]) if tests is self.quick else ":".join(tests)
        for chosen in filter(None, (":".join(first), rest)):
            options = ["--gtest_fail_fast", f"--gtest_filter={chosen}", *order]
            if name := self.run_tests(worker, options, self.seconds[id(tests)]):
                noticed[name] += 1
                return False
        return True

    def attempt(self, change):
        """What becomes of a change: not compiled, killed, same program, survived."""
        worker = self.workers.get()
        try:
            (worker / change.path).write_text(change.text)
            replaced = {}
            for source in self.library.users.get(change.path, [change.path]):
                replaced[source] = worker / (source.name + ".o")
                if self.library.compile(worker / source, replaced[source]).returncode != 0:
                    return "not compiled"
            self.library.link(worker, replaced)
            if not self.passes(worker, change.path, self.quick):
                return "killed"
            if self.library.is_same_program(worker, replaced):
                return "same program"
            # The order counts among the quick ones alone: the others are a handful.
            orders = self.library.ORDERS[1:]
            if not all(self.passes(worker, change.path, self.quick, order) for order in orders):
                return "killed"
            return "survived" if self.passes(worker, change.path, self.slow) else "killed"
        finally:
            shutil.copy(self.library.original / change.path, worker / change.path)
            self.workers.put(worker)


class Draw:
    """Hands out the changes in a drawn order, until enough of them compiled or the time is up."""

    def __init__(self, changes, seed, count, seconds):
        # Texts have so many characters that they would crowd out everything else.
        texts = [change for change in changes if kind_of(change) == "text"]
        others = [change for change in changes if kind_of(change) != "text"]
        chance = random.Random(seed)
        chance.shuffle(texts)
        chance.shuffle(others)
        self.waiting = [pair.pop() for _ in range(len(changes)) for pair in (others, others, texts) if pair]
        self.waiting.reverse()
        self.left, self.end = count, time.monotonic() + seconds
        self.lock = threading.Lock()

    def next(self):
        with self.lock:
            if not self.waiting or self.left <= 0 or time.monotonic() > self.end:
                return None
            self.left -= 1
            return self.waiting.pop()

    def not_compiled(self):
        with self.lock:
            self.left += 1


def try_all(check, draw, jobs):
    """Counts of (kind, outcome), and the changes that fail the check; these are printed as they are found."""
    counts, wrong = collections.Counter(), []

    def work():
        while change := draw.next():
            outcome = check.attempt(change)
            if outcome == "not compiled":
                draw.not_compiled()
            elif change.mark and outcome == "survived":
                outcome = "marked"
            elif change.mark or outcome == "survived":
                wrong.append(change)
                print(f"{'marked, but ' if change.mark else ''}{outcome}: {change}", flush=True)
            counts[kind_of(change), outcome] += 1

    for done in [check.pool.submit(work) for _ in range(jobs)]:
        done.result()
    return counts, wrong


def kind_of(change):
    if change.name.split()[0] in ("dropped", "doubled", "exchanged", "hoisted", "sunk"):
        return "structure"
    return "text" if change.name in ("text", "cut") else "other"


def table(counts):
    rows = [f"{'':9}" + "".join(f"{outcome:>14}" for outcome in OUTCOMES)]
    for kind in ("structure", "other", "text"):
        rows.append(f"{kind:9}" + "".join(f"{counts[kind, outcome]:14}" for outcome in OUTCOMES))
    return "\n".join(rows)


def arguments():
    parser = argparse.ArgumentParser()
    parser.add_argument("--folder", type=pathlib.Path, required=True)
    parser.add_argument("--jobs", type=int, default=2)
    parser.add_argument("--count", type=int, default=12)
    parser.add_argument("--all", action="store_true")
    parser.add_argument("--seconds", type=float, default=None)
    parser.add_argument("--seed", type=int, default=1)
    parser.add_argument("--table", action="store_true")
    parser.add_argument("--only", default="")
    parser.add_argument("--kind", choices=("structure", "text", "other"))
    parser.add_argument("--lines", action="store_true")
    parser.add_argument("--record", action="store_true")
    given = parser.parse_args()
    if given.all:
        given.count = sys.maxsize
    if given.seconds is None:
        given.seconds = 90 if given.count <= 12 else 86400
    return given


def main():
    given = arguments()
    files = mutants.sources("table" if given.table else "src", given.only)
    changes = [change for file in files for change in file.changes if given.kind in (None, kind_of(change))]
    idle = [f"{mark.path}:{mark.line}: no change for the mark: {', '.join(sorted(mark.unused))}"
            for file in files for mark in file.marks if mark.unused]  # fmt: skip
    print("".join(line + "\n" for line in idle), end="")
    if given.lines:
        print("\n".join(map(str, changes)))
        return 1 if idle else 0
    started = time.monotonic()
    check = Check(given.folder, given.jobs, TableLibrary if given.table else Library)
    counts, wrong = try_all(check, Draw(changes, given.seed, given.count, given.seconds), given.jobs)
    print(table(counts))
    print(f"{len(changes)} changes possible, seed {given.seed}, {time.monotonic() - started:.0f} s")
    if given.record:
        content = f"```\n{datetime.date.today()}, {sum(counts.values())} of {len(changes)} changes\n{table(counts)}\n```"
        figures.write("docs/reliability.md", {"table_mutation" if given.table else "mutation": content})
    return 1 if idle or wrong or check.failing else 0


if __name__ == "__main__":
    sys.exit(main())
