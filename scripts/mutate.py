#!/usr/bin/env python3
"""Tries changed forms of src/ against the tests; scripts/mutate.sh prepares what it needs."""

import argparse
import concurrent.futures
import os
import pathlib
import queue
import random
import re
import shutil
import subprocess
import sys
import time

TOKEN = re.compile(
    r'(?P<comment>//[^\n]*|/\*.*?\*/)|(?P<text>"(?:\\.|[^"\\\n])*")|(?P<char>\'(?:\\.|[^\'\\])+\')'
    r"|(?P<number>\b\d+\b)|(?P<word>[A-Za-z_]\w*)|(?P<operator>&&|\|\||[<>=!]=|\+\+|--|\+=|-=|<<|>>|->|::|[<>+!-])",
    re.S,
)
OPERATORS = {
    "<": ["<=", ">"], ">": [">=", "<"], "<=": ["<"], ">=": [">"], "==": ["!="], "!=": ["=="],
    "&&": ["||"], "||": ["&&"], "++": ["--"], "--": ["++"], "+=": ["-="], "!": [""],
}  # fmt: skip
WORDS = {"true": ["false"], "false": ["true"], "isObject": ["isArray"], "empty": ["isNull"]}
CONDITION = re.compile(r"\b(?:if|while|VORN_FAIL_IF|VORN_WARN_IF|VORN_FAIL_IF_TEXT) ?\(")
STATEMENT = re.compile(r"^ +(?=\S)(?!return|const |static |using |struct |else|case|default)[^\n{}#]*;$", re.M)


# In one process a test may hide behind what an earlier one left.
ORDERS = ([], ["--gtest_shuffle", "--gtest_random_seed=7"])
PLAIN_JSON = pathlib.Path("src/base/PlainJson.cpp")


class Mutant:
    def __init__(self, path, source, begin, end, new):
        self.path, self.begin, self.end, self.new = path, begin, end, new
        self.line = source.count("\n", 0, begin) + 1
        self.text = source[:begin] + new + source[end:]
        self.is_text = source[begin] == '"' and new[:1] == '"'
        first = source.rfind("\n", 0, begin) + 1
        last = source.find("\n", end)
        self.before = " ".join(source[first:last].split())
        self.after = " ".join((source[first:begin] + new + source[end:last]).split())
        # How the list of explained changes names the place: a line that is not the only one of its
        # kind in the file has a number among them.
        lines = [" ".join(line.split()) for line in source.splitlines()]
        nth = lines[: self.line].count(self.before)
        self.place = f"{path} #{nth}" if lines.count(self.before) > 1 else f"{path}"

    def __str__(self):
        return f"{self.path}:{self.line}\n{self.place}\n- {self.before}\n+ {self.after}"


def closing(source, start):
    """Position of the parenthesis, or of the comma on its level, that ends what begins at start."""
    depth = 0
    for match in re.finditer(r'"(?:\\.|[^"\\])*"|[(){},\[\]]', source[start:]):
        sign = match.group()
        if sign in "([{":
            depth += 1
        elif depth == 0 and sign in "),":
            return start + match.start()
        elif sign in ")]}":
            depth -= 1
    return start


def changed_text(literal):
    """One character of a text is another, and one is missing."""
    body = [m for m in re.finditer(r"\\.|[^\\]", literal[1:-1])]
    for match in body:
        begin, end = match.start() + 1, match.end() + 1
        yield literal[:begin] + ("x" if match.group() != "x" else "y") + literal[end:]
        yield literal[:begin] + literal[end:]


def mutants_of(path):
    source = path.read_text()
    comments = []
    for match in TOKEN.finditer(source):
        kind, token = match.lastgroup, match.group()
        begin, end = match.span()
        line = source[source.rfind("\n", 0, begin) + 1 : source.find("\n", end)]
        if kind == "comment":
            comments.append((begin, end))
            continue
        if line.lstrip().startswith(("#include", "#if", "#ifndef", "#define VORN_CORE", "#endif", "#pragma")):
            continue
        new = []
        if kind == "text":
            new = changed_text(token)
        elif kind == "number":
            new = [str(int(token) + 1)] + (["0"] if int(token) > 1 else [])
        elif kind == "char" and len(token) == 3:
            new = ["'x'"]
        elif kind == "word":
            new = WORDS.get(token, [])
        elif kind == "operator" and (token not in "<>" or f" {token} " in source[begin - 1 : end + 1]):
            new = OPERATORS.get(token, [])
        for replacement in new:
            yield Mutant(path, source, begin, end, replacement)
    inside = lambda at: any(begin <= at < end for begin, end in comments)
    for match in CONDITION.finditer(source):
        end = closing(source, match.end())
        line_start = source.rfind("\n", 0, match.start()) + 1
        if inside(match.start()) or source.startswith("#define", line_start):
            continue
        for replacement in ("true", "false", f"!({source[match.end():end]})"):
            if replacement == source[match.end() : end]:
                continue
            yield Mutant(path, source, match.end(), end, replacement)
    for match in STATEMENT.finditer(source):
        if not inside(match.end() - 1):
            indent = len(match.group()) - len(match.group().lstrip())
            yield Mutant(path, source, match.start() + indent, match.end(), ";")


class Library:
    """Objects of the unchanged sources, and libraries in which some of them are others."""

    def __init__(self, folder):
        self.folder = folder
        self.sources = sorted(pathlib.Path("src").rglob("*.cpp"))
        json = subprocess.run(["pkg-config", "--cflags", "jsoncpp"], capture_output=True, text=True, check=True)
        self.flags = ["-std=c++17", "-O0", "-fPIC", "-fvisibility=hidden", "-fvisibility-inlines-hidden", "-w"]
        self.flags += [f"-I{folder}/header", "-Iinclude"] + json.stdout.split()
        # Compiled once, together with the headers that it includes.
        (folder / "header").mkdir(exist_ok=True)
        header = str(shutil.copy("include/VornJsonDbApi.h", folder / "header"))
        subprocess.run(["g++", *self.flags, "-x", "c++-header", header, "-o", header + ".gch"], check=True)
        self.users = {}

    def compile(self, tree, source, output):
        command = ["g++", *self.flags, "-include", "VornJsonDbApi.h", "-c", str(tree / source), "-o", str(output)]
        return subprocess.run(command, capture_output=True, text=True)

    def object_of(self, source):
        return self.folder / "objects" / (str(source).replace("/", "_") + ".o")

    def build_all(self, pool):
        (self.folder / "objects").mkdir(exist_ok=True)
        for result in pool.map(lambda s: self.compile(pathlib.Path("."), s, self.object_of(s)), self.sources):
            if result.returncode != 0:
                sys.exit(result.stderr)
        for source in self.sources:
            command = ["g++", *self.flags, "-MM", str(source)]
            names = subprocess.run(command, capture_output=True, text=True, check=True).stdout
            for name in re.findall(r"[^\s\\:]+\.h\b", names):
                header = pathlib.Path(os.path.relpath(os.path.normpath(name)))
                self.users.setdefault(header, []).append(source)

    def link(self, worker, replaced):
        objects = [str(replaced.get(source, self.object_of(source))) for source in self.sources]
        subprocess.run(["g++", "-shared", "-Wl,-soname,libvornjsondb.so.6", "-Wl,--version-script=src/exports.map",
                        "-Wl,-Bsymbolic-functions", "-o", str(worker / "libvornjsondb.so.6"), *objects,
                        "-ljsoncpp", "-lsqlite3"], check=True)  # fmt: skip
        # The tests look at this part on its own, too, in a library that exports it.
        if PLAIN_JSON in replaced:
            subprocess.run(["g++", *self.flags, "-fvisibility=default", "-shared", str(worker / PLAIN_JSON),
                            "-o", str(worker / "libvornjsondb_plain_json.so"), "-ljsoncpp"], check=True)  # fmt: skip
        else:
            (worker / "libvornjsondb_plain_json.so").unlink(missing_ok=True)


def run_tests(folder, worker, options, seconds):
    """Whether the tests pass against the worker's library."""
    tests = folder / "tests" / "vornjsondb_tests"
    environment = dict(os.environ, LD_LIBRARY_PATH=str(worker), TMPDIR=str(worker))
    with open(worker / "tests.log", "w") as log:
        process = subprocess.Popen([str(tests), "--gtest_brief=1", *options], env=environment, stdout=log,
                                   stderr=subprocess.STDOUT, start_new_session=True)  # fmt: skip
        try:
            return process.wait(seconds) == 0
        except subprocess.TimeoutExpired:
            os.killpg(process.pid, 9)
            process.wait()
            return False


def prepare_worker(folder, number):
    worker = (folder / f"worker{number}").resolve()
    shutil.rmtree(worker, ignore_errors=True)
    shutil.copytree("src", worker / "src")
    return worker


def try_mutant(library, folder, workers, mutant, options):
    worker = workers.get()
    try:
        (worker / mutant.path).write_text(mutant.text)
        replaced = {}
        for source in library.users.get(mutant.path, [mutant.path]):
            output = worker / (source.name + ".o")
            if library.compile(worker, source, output).returncode != 0:
                return "not compiled"
            replaced[source] = output
        library.link(worker, replaced)
        passed = all(run_tests(folder, worker, ["--gtest_fail_fast", *order, *options], 60) for order in ORDERS)
        return "survived" if passed else "killed"
    finally:
        shutil.copy(mutant.path, worker / mutant.path)
        workers.put(worker)


def explained(mutant):
    listed = pathlib.Path("tests/mutants/equivalent.txt").read_text()
    line = f"{mutant.place}\n- {mutant.before}\n+ "
    return line + mutant.after + "\n" in listed or (mutant.is_text and line + "any text\n" in listed)


def arguments():
    parser = argparse.ArgumentParser()
    parser.add_argument("--folder", type=pathlib.Path, required=True)
    parser.add_argument("--jobs", type=int, default=2)
    parser.add_argument("--count", type=int, default=12)
    parser.add_argument("--seconds", type=float, default=None)
    parser.add_argument("--seed", type=int, default=1)
    parser.add_argument("--only", default="")
    parser.add_argument("--lines", action="store_true")
    given = parser.parse_args()
    if given.seconds is None:
        given.seconds = 90 if given.count <= 12 else 86400
    return given


def known_failures(folder, worker):
    """Names of the tests that fail without any change: they can tell nothing."""
    names = set()
    for order in ORDERS:
        if not run_tests(folder, worker, order, 300):
            log = (worker / "tests.log").read_text(errors="replace")
            names.update(re.findall(r"\[  FAILED  \] (\w+\.\w+)", log))
    return sorted(names)


def main():
    given = arguments()
    files = [path for path in sorted(pathlib.Path("src").rglob("*")) if path.suffix in (".cpp", ".h")]
    every = [mutant for path in files if given.only in str(path) for mutant in mutants_of(path)]
    if given.lines:
        print("\n".join(map(str, every)))
        return 0
    # Texts have so many characters that they would crowd out everything else.
    texts = [mutant for mutant in every if mutant.is_text]
    others = [mutant for mutant in every if not mutant.is_text]
    chance = random.Random(given.seed)
    chance.shuffle(texts)
    chance.shuffle(others)
    wanted = [pair.pop() for _ in range(given.count) for pair in (others, others, texts) if pair][: given.count]

    started = time.monotonic()
    pool = concurrent.futures.ThreadPoolExecutor(given.jobs)
    library = Library(given.folder)
    library.build_all(pool)
    workers = queue.Queue()
    for number in range(given.jobs):
        workers.put(prepare_worker(given.folder, number))
    worker = workers.get()
    library.link(worker, {})
    failing = known_failures(given.folder, worker)
    workers.put(worker)
    if failing:
        print(f"{len(failing)} tests fail without any change and are left out: {' '.join(failing)}")
    options = ["--gtest_filter=*-" + ":".join(failing)] if failing else []

    def attempt(mutant):
        if time.monotonic() - started > given.seconds:
            return mutant, "not tried"
        return mutant, try_mutant(library, given.folder, workers, mutant, options)

    counts = {"killed": 0, "survived": 0, "not compiled": 0, "not tried": 0, "explained": 0}
    for mutant, outcome in pool.map(attempt, wanted):
        if outcome == "survived" and explained(mutant):
            outcome = "explained"
        counts[outcome] += 1
        if outcome == "survived":
            print(f"survived: {mutant}", flush=True)
    print(f"{len(every)} changes possible, seed {given.seed}: " +
          ", ".join(f"{count} {outcome}" for outcome, count in counts.items()) +
          f", {time.monotonic() - started:.0f} s")  # fmt: skip
    return 1 if counts["survived"] or failing else 0


if __name__ == "__main__":
    sys.exit(main())
