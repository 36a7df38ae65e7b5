"""What the figures were measured with."""

import os
import re


def first(pattern, path, default="unknown"):
    with open(path) as file:
        found = re.search(pattern, file.read(), re.MULTILINE)
    return found.group(1).strip() if found else default


def describe(results):
    memory = int(first(r"^MemTotal:\s+(\d+)", "/proc/meminfo", "0")) / 2**20
    packages = dict(line.split() for line in open(os.path.join(results, "packages.txt")))
    versions = ", ".join(f"{name} {version}" for name, version in sorted(packages.items()))
    compiler = open(os.path.join(results, "compiler.txt")).read().strip()
    system = first(r'^PRETTY_NAME="([^"]*)"', "/etc/os-release")
    return "\n".join([
        f"- Processor: {first(r'^model name.*: (.*)$', '/proc/cpuinfo')}, {os.cpu_count()} of its "
        "cores, virtual; other work ran on it at the same time",
        f"- Memory: {memory:.0f} GiB",
        f"- System: {system}, Linux {'.'.join(os.uname().release.split('.')[:2])}",
        f"- Compiler: {compiler}, -O2",
        f"- Packages: {versions}",
    ])
