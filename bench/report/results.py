"""Reads what the benchmark programs have written."""

import json
import re


def medians(path):
    """The median of each benchmark: {(name, argument): its entry}, argument None if it has none."""
    with open(path) as file:
        entries = json.load(file)["benchmarks"]
    found = {}
    for entry in entries:
        if entry.get("aggregate_name") != "median":
            continue
        name = re.sub(r"/(iterations:\d+|real_time|manual_time|repeats:\d+)", "", entry["run_name"])
        name, _, argument = name.partition("/")
        found[name, int(argument) if argument else None] = entry
    return found


def series(entries, name, field="cpu_time"):
    """The figures of one benchmark by its argument, in the order of the argument."""
    pairs = [(argument, entry[field]) for (found, argument), entry in entries.items() if found == name]
    return sorted(pairs)


def columns(path):
    """The lines of a text of words, without comments."""
    with open(path) as file:
        return [line.split() for line in file if line.strip() and not line.startswith("#")]
