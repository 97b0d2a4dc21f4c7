#!/usr/bin/env python3
# SPDX-License-Identifier: MIT
"""Measures how the time of each operation grows with the working copy: the library, the floor and
git, on a memory file system and on disk. scripts/bench --growth calls it."""

import argparse
import os
import shutil
import statistics
import sys
import tempfile

import working_copies
from branches import Operation
from changes import Change
from chart import draw
from programs import Programs
from report import Table, exponent, output_of, system, versions, write_into

SIZES = (1_000, 5_000, 20_000)
ROUNDS = 3
CONCERNED = 40  # one in so many files
PROGRAMS = ("library", "floor", "git")
CHART = ("folder", "add", "commit", "revert", "switch", "merge")
TITLES = {"folder": "states of all files", "files": "states of a list", "add": "add",
          "remove": "remove", "revert": "revert", "commit": "commit", "switch": "switch",
          "merge": "merge"}


class States:
    """The states of a working copy that nothing changes."""

    def __init__(self, operation, tracked):
        self._operation = operation
        self._tracked = tracked

    def make(self, folder, env):
        root = os.path.join(folder, self._operation)
        working_copies.make_working_copy(root, self._tracked, env)
        working_copies.write_list(root + ".list", self._tracked // CONCERNED, self._tracked)
        arguments = (root, root + ".list") if self._operation == "files" else (root,)
        self.commands = [("library", self._operation, *arguments),
                         ("floor", self._operation, *arguments), ("floor", "child", *arguments)]

    def put_back(self):
        pass


class Changed:
    """A change of the index or the files, or a branch operation, in a working copy of its own."""

    def __init__(self, program, change):
        self._program = program
        self._change = change
        self.put_back = change.put_back

    def make(self, folder, env):
        self._change.make(folder, env)
        arguments = self._change.arguments
        self.commands = [(f"{self._program}_library", *arguments),
                         (f"{self._program}_floor", *arguments),
                         (f"{self._program}_floor", "child", *arguments)]


def operations(size):
    some = size // CONCERNED
    return {
        "folder": States("folder", size),
        "files": States("files", size),
        **{name: Changed("change", Change(name, "", size, some))
           for name in ("add", "remove", "revert", "commit")},
        **{name: Changed("branch", Operation(name, name, files=size, changed=some))
           for name in ("switch", "merge")}}


def measure(build, scratch, env):
    """Milliseconds of processor time on the file system of this folder: {(operation, size): (library,
    floor, git)}."""
    programs = Programs(build, scratch)
    taken = {}
    for size in SIZES:
        for name, operation in operations(size).items():
            folder = tempfile.mkdtemp(prefix="g", dir=scratch)
            operation.make(folder, env)
            rounds = programs.clock(operation.commands, ROUNDS, before=operation.put_back,
                                    clock="processor_nanoseconds")
            taken[name, size] = [statistics.median(times) / 1e6 for times in zip(*rounds)]
            shown = ", ".join(f"{number:,.1f}" for number in taken[name, size])
            print(f"   {size:,} files, {name}: {shown} ms", file=sys.stderr, flush=True)
            shutil.rmtree(folder)
    return taken


def show(milliseconds):
    return f"{milliseconds:,.0f}" if milliseconds >= 10 else f"{milliseconds:.1f}"


def table_of(where, taken):
    table = Table(f"Milliseconds, {where}: library, floor, git", *(f"{size:,} files" for size in SIZES),
                  "exponents")
    for name, title in TITLES.items():
        exponents = [exponent({size: taken[name, size][place] for size in SIZES})
                     for place in range(len(PROGRAMS))]
        table.row(title, [*(", ".join(map(show, taken[name, size])) for size in SIZES),
                          ", ".join(f"{number:.2f}" for number in exponents)])
    return table


def processor():
    with open("/proc/cpuinfo", encoding="utf-8") as file:
        models = [line.split(":")[1].strip() for line in file if line.startswith("model name")]
    return f"{len(models)} × {models[0]}" if models else f"{os.cpu_count()} processors"


def describe(disk):
    return (f"{versions()}, {processor()}, "
            f"load {os.getloadavg()[2]:.1f} at the end. Disk: {disk}. Processor time, median of {ROUNDS} "
            f"runs in turn. One file in {CONCERNED} is concerned: listed, added, removed, reverted, "
            f"committed, or different on the other branch.")


def draw_chart(path, taken):
    size = SIZES[-1]
    rows = [(TITLES[name], taken[name, size]) for name in CHART]
    with open(path, "w", encoding="utf-8") as file:
        file.write(draw(
            rows, f"Processor time in a working copy of {size:,} files on disk, {system()}"))


def main():
    parser = argparse.ArgumentParser(description=__doc__)
    parser.add_argument("--build", required=True, help="the build folder")
    parser.add_argument("--scratch", required=True, help="an empty folder with a short name, on disk")
    parser.add_argument("--page", help="file to write the tables into; the chart lies beside it")
    options = parser.parse_args()
    scratch = {"on disk": options.scratch, "in memory": tempfile.mkdtemp(prefix="vb", dir="/dev/shm")}
    taken = {}
    try:
        for where, folder in scratch.items():
            print(f"== {where}", file=sys.stderr, flush=True)
            home = os.path.join(folder, "home")
            os.mkdir(home)
            taken[where] = measure(options.build, folder, working_copies.environment(home))
    finally:
        shutil.rmtree(scratch["in memory"])
    disk = output_of("findmnt", "--noheadings", "--output=FSTYPE", "--target", options.scratch)
    description = describe(disk)
    tables = [table_of(where, taken[where]) for where in taken]
    print("\n\n".join([description, *map(str, tables)]))
    # The chart shows the first system of the tables.
    if options.page and write_into(options.page, description, tables, "growth")[0] == system():
        draw_chart(os.path.splitext(options.page)[0] + ".svg", taken["on disk"])
    return 0


if __name__ == "__main__":
    sys.exit(main())
