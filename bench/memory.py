#!/usr/bin/env python3
# SPDX-License-Identifier: MIT
"""Measures the peak memory of the library, the floor and git in large working copies. scripts/bench
--memory calls it."""

import argparse
import os
import subprocess
import sys

import working_copies
from programs import Programs
from report import Table

SIZES = (100_000, 500_000)
OPERATIONS = (("folder", "states of all files"), ("add", "one file added"),
              ("commit", "commit of one change"))


class WorkingCopy:
    """A working copy, and a change in it for each run."""

    def __init__(self, programs, root, size, env):
        self._programs = programs
        self._root = root
        self._list = root + ".list"
        self._runs = 0
        working_copies.make_working_copy(root, size, env)

    def peaks(self, operation):
        """Returns the KiB of the library, the floor and git."""
        if operation == "folder":
            runs = (("library", "folder", self._root), ("floor", "folder", self._root),
                    ("floor", "child", self._root))
        else:
            arguments = (operation, self._root, self._list)
            runs = (("change_library", *arguments), ("change_floor", *arguments),
                    ("change_floor", "child", *arguments))
        peaks = []
        for run in runs:
            self._change(operation)
            measured = self._programs.run(*run)
            peaks.append(measured.get("child_peak_kib", measured["peak_kib"]))
        return peaks

    def _change(self, operation):
        """Makes a new file to add, or changes a tracked one."""
        self._runs += 1
        name = working_copies.name_of(0) if operation == "commit" else f"new-{self._runs}"
        if operation != "folder":
            with open(os.path.join(self._root, name), "w", encoding="ascii") as file:
                file.write(f"run {self._runs}\n")
            with open(self._list, "w", encoding="ascii") as file:
                file.write(name + "\n")


def main():
    parser = argparse.ArgumentParser(description=__doc__)
    parser.add_argument("--build", required=True, help="the build folder")
    parser.add_argument("--scratch", required=True, help="an empty folder with a short name")
    options = parser.parse_args()
    home = os.path.join(options.scratch, "home")
    os.mkdir(home)
    env = working_copies.environment(home)
    programs = Programs(options.build, options.scratch)
    table = Table("Peak memory of the process, MiB", "library", "floor", "git")
    for size in SIZES:
        print(f"== {size:,} files", file=sys.stderr, flush=True)
        root = os.path.join(options.scratch, "w")
        copy = WorkingCopy(programs, root, size, env)
        for operation, title in OPERATIONS:
            peaks = [f"{kib / 1024:.1f}" for kib in copy.peaks(operation)]
            print(f"   {title}: {', '.join(peaks)}", file=sys.stderr, flush=True)
            table.row(f"{size:,} files: {title}", peaks)
        subprocess.run(["rm", "-rf", root], check=True)
    print(table)
    return 0


if __name__ == "__main__":
    sys.exit(main())
