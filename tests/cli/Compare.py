"""For the tests that compare real data whole: the command, a second reader of CSV, exact values."""

import json
import os
import re
import subprocess
import sys
import tempfile

COMMAND = os.environ['VORNJSONDB']
FILES = os.environ['VORNJSONDB_REAL_FILES']
if not os.path.isdir(FILES):
    sys.exit(f'{FILES} is missing; scripts/real-files.sh makes it')


class Run:
    """One call of the command: exit code, output and messages."""

    def __init__(self, *words, given=None):
        environment = dict(os.environ, LC_ALL='C.UTF-8', TERM='dumb')
        done = subprocess.run([COMMAND, *words], input=given, capture_output=True, env=environment)
        self.code = done.returncode
        self.out = done.stdout
        self.errors = done.stderr.decode()

    def records(self):
        """The records of an export as JSON Lines."""
        return [Exact(line) for line in self.out.decode().split('\n')[:-1]]


def Exact(text):
    """A JSON text as values that are equal only if JSON's are: 1 is 1.0, but neither is true."""
    return Tagged(json.loads(text))


def Tagged(value):
    if isinstance(value, bool):
        return ('boolean', value)
    if isinstance(value, dict):
        return {name: Tagged(each) for name, each in value.items()}
    if isinstance(value, list):
        return [Tagged(each) for each in value]
    return value


CELL = re.compile(r'(?:"((?:[^"]|"")*)"|([^\r\n%s]*))(%s|\r\n|\r|\n|$)')


def Cells(text, delimiter=',', quotes=True):
    """CSV as lists of cells: None for a bare empty cell, a text for all others."""
    if not quotes:
        return [[cell or None for cell in line.split(delimiter)] for line in text.splitlines() if line]
    pattern = re.compile(CELL.pattern % (re.escape(delimiter), re.escape(delimiter)))
    rows, row, place = [], [], 0
    while place < len(text):
        found = pattern.match(text, place)
        row.append(found[1].replace('""', '"') if found[1] is not None else found[2] or None)
        place = found.end()
        if found[3] != delimiter:
            if row != [None]:  # an empty line is no row
                rows.append(row)
            row = []
        elif place == len(text):
            row.append(None)
    if row:
        rows.append(row)
    return rows


NUMBER = re.compile(r'-?(0|[1-9][0-9]*)(\.[0-9]+([eE][+-]?[0-9]+)?)?')


def IsCell(value, cell):
    """Whether an exported value is what the cell says, by the cell's own spelling."""
    if isinstance(value, (int, float)):
        return cell is not None and NUMBER.fullmatch(cell) and value == (
            int(cell) if isinstance(value, int) else float(cell))
    return value == cell


class Checks:
    """Collects what is wrong, so that one run shows all of it."""

    def __init__(self):
        self.failures = 0
        self.done = 0

    def Same(self, what, found, expected):
        self.done += 1
        if found != expected:
            self.failures += 1
            print(f'FAILED {what}\n  found:    {Short(found)}\n  expected: {Short(expected)}')

    def SameRecords(self, what, found, expected):
        self.Same(f'{what}: number of records', len(found), len(expected))
        for number, (one, other) in enumerate(zip(found, expected), 1):
            if one != other:
                self.Same(f'{what}: record {number}', one, other)
                return

    def Finish(self):
        print(f'{self.done} comparisons, {self.failures} failed')
        sys.exit(self.failures > 0)


def Short(value):
    text = repr(value)
    return text if len(text) <= 500 else text[:500] + '...'


def Folder():
    # In memory, where there is such a folder: each import ends with a commit.
    place = '/dev/shm' if os.access('/dev/shm', os.W_OK) else None
    return tempfile.TemporaryDirectory(prefix='vornjsondb-', dir=place)
