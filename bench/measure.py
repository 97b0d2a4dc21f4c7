#!/usr/bin/env python3
# SPDX-License-Identifier: MIT
"""Compares the library with the floor. scripts/bench calls it, and describes what is measured."""

import argparse
import concurrent.futures
import contextlib
import os
import platform
import sys

import working_copies
from branches import BranchBench
from changes import ChangeBench
from commits import CommitBench
from programs import COUNTS, Programs, Ratios
from remotes import RemoteBench
from report import Table, versions, write_into

SIZES = {1_000: 31, 10_000: 15, 100_000: 7}  # files: rounds of paired runs
LISTS = (100, 1_000)
LIST_ROUNDS = 5
# libgit2 compares each listed name with each file: callgrind would need an hour for 1,000 names among 100,000
# files, and many minutes for several counts.
MOST_COMPARISONS = 10_000_000
MOST_COMPARISONS_COUNTED_OFTEN = 1_000_000
QUICK_PART = 4  # one in so many files

FOLDER_RATIO = 1.10
FOLDER_ALLOCATIONS = 2
FOLDER_BYTES = 200
FLATNESS = 1.10
FILES_RATIO = 1.03
PROBE_INSTRUCTIONS = 300_000
LESS_ALLOCATIONS = 0


def slope(values):
    """Returns the cost of each further file, from the smallest to the largest of {files: value}."""
    small, large = min(values), max(values)
    return (values[large] - values[small]) / (large - small)


class Bench:
    def __init__(self, build, scratch, sizes, is_quick=False):
        part = QUICK_PART if is_quick else 1
        self._programs = Programs(build, scratch, is_quick)
        self._changes = ChangeBench(self._programs, scratch, part)
        self._commits = CommitBench(self._programs, scratch, part)
        self._others = [BranchBench(self._programs, scratch)]
        # Enters and leaves what the remotes need.
        self._server = contextlib.nullcontext
        if not is_quick:
            self._others.append(RemoteBench(self._programs, scratch))
            self._server = lambda: self._others[1].serve(self._env)
        self._most_comparisons = MOST_COMPARISONS // (10 if is_quick else 1)
        self._sizes = sizes
        self._scratch = scratch
        # Short names, because the root is in every key of the result.
        self._roots = {size: os.path.join(scratch, name) for size, name in zip(sizes, "abc")}

    def serving(self):
        """Returns a context with the servers that the measurements need."""
        home = os.path.join(self._scratch, "home")
        os.mkdir(home)
        self._env = working_copies.environment(home)
        return self._server()

    def make_working_copies(self):
        env = self._env
        for size, root in self._roots.items():
            working_copies.make_working_copy(root, size, env)
            for count in LISTS:
                working_copies.write_list(self._list(size, count), count, size)
        self._changes.make_working_copies(env)
        self._commits.make_working_copies(env)
        for other in self._others:
            other.make_working_copies(env)

    def _list(self, size, count):
        return f"{self._roots[size]}.{count}"

    def _lists(self):
        return [(size, count) for size in self._sizes for count in LISTS
                if size * count <= self._most_comparisons]

    def count(self):
        """Counts instructions and allocations. Several runs at once are possible, because neither
        depends on the clock."""
        programs = self._programs
        some = self._roots[self._sizes[0]]
        tasks = {
            **self._changes.tasks(),
            **self._commits.tasks(),
            **{key: task for other in self._others for key, task in other.tasks().items()},
            ("less", "instructions"): lambda: programs.instructions(
                "library", "less", some, self._list(self._sizes[0], 1_000)),
            ("less", "allocations"): lambda: programs.allocations(
                "library", "less", some, self._list(self._sizes[0], 1_000)),
            ("severity", "none"): lambda: programs.instructions("severity", "nothing"),
            ("severity", "record"): lambda: programs.instructions("severity", "record"),
            ("severity", "trace"): lambda: programs.instructions("severity", "trace"),
            ("probe", "floor"): lambda: programs.instructions("floor", "probe", some),
            ("probe", "guarded"): lambda: programs.instructions("library", "probe", some),
            ("probe", "alone"): lambda: programs.instructions("library", "probe-alone", some),
        }
        for size, count in reversed(self._lists()):
            tasks["files", size, count] = lambda s=size, c=count: self._count_list(s, c)
        for program in ("floor", "library"):
            for size, root in self._roots.items():
                arguments = (program, "folder", root)
                tasks["folder", program, size] = lambda a=arguments: programs.instructions(*a)
                tasks["allocations", program, size] = lambda a=arguments: programs.allocations(*a)
                tasks["peak", program, size] = lambda a=arguments: programs.run(*a)
        with concurrent.futures.ThreadPoolExecutor(os.cpu_count()) as pool:
            running = {key: pool.submit(task) for key, task in tasks.items()}
            self._counted = {key: task.result() for key, task in running.items()}

    def _count_list(self, size, count):
        often = size * count <= MOST_COMPARISONS_COUNTED_OFTEN
        return self._programs.count_in_turn(
            {program: (program, "files", self._roots[size], self._list(size, count))
             for program in ("floor", "library")}, COUNTS if often else 1)

    def clock(self):
        """Times the floor, the library and git as a child process, one after the other."""
        self._rounds = {}
        for size, root in self._roots.items():
            self._rounds[size] = self._programs.clock(
                [("floor", "folder", root), ("library", "folder", root), ("floor", "child", root)],
                SIZES[size])
        for size, count in self._lists():
            arguments = ("files", self._roots[size], self._list(size, count))
            self._rounds[size, count] = self._programs.clock(
                [("floor", *arguments), ("library", *arguments)], LIST_ROUNDS)
        self._changes.clock()
        self._commits.clock()
        for other in self._others:
            other.clock()

    def tables(self):
        return [self._folder_table(), self._files_table(),
                self._changes.table(self._counted), *self._commits.tables(self._counted),
                *(other.table(self._counted) for other in self._others), self._small_table()]

    def _per_file(self, program):
        return {size: self._counted["folder", program, size] / size for size in self._sizes}

    def _over_floor(self, group, name):
        return {size: self._counted[group, "library", size][name]
                - self._counted[group, "floor", size][name] for size in self._sizes}

    def _folder_table(self):
        table = Table("`getFolderStates`", *(f"{size:,} files" for size in self._sizes))
        floor, library = self._per_file("floor"), self._per_file("library")
        table.row("instructions a file, floor", [f"{floor[s]:,.0f}" for s in self._sizes])
        flatness = max(library.values()) / min(library.values())
        table.row("instructions a file, library", [f"{library[s]:,.0f}" for s in self._sizes])
        ratios = [library[size] / floor[size] for size in self._sizes]
        table.row("library ÷ floor", [f"{ratio:.3f}" for ratio in ratios], FOLDER_RATIO, ratios)
        blank = [""] * (len(self._sizes) - 1)
        table.row("largest ÷ smallest cost a file", [*blank, f"{flatness:.3f}"], FLATNESS,
                  [flatness])
        for what, name, limit in (("allocations", "allocations", FOLDER_ALLOCATIONS),
                                  ("bytes asked for", "allocated_bytes", FOLDER_BYTES)):
            over = self._over_floor("allocations", name)
            table.row(f"{what} over the floor", [f"{over[s]:,}" for s in self._sizes])
            table.row(f"{what} over the floor, each further file", [*blank, f"{slope(over):,.2f}"],
                      limit, [round(slope(over), 6)])
        held = {s: self._counted["allocations", "library", s]["held_bytes"] for s in self._sizes}
        table.row("bytes held by the result", [f"{held[s]:,}" for s in self._sizes])
        for program in ("floor", "library"):
            table.row(f"peak memory of the process, {program}", [
                f"{self._counted['peak', program, s]['peak_kib'] / 1024:.1f} MiB"
                for s in self._sizes])
        peak = {size: 1024 * kib for size, kib in self._over_floor("peak", "peak_kib").items()}
        table.row("bytes of peak memory over the floor, each further file",
                  [*blank, f"{slope(peak):,.0f}"])
        clocked = [Ratios(self._rounds[size], 1, 0) for size in self._sizes]
        table.row("time, library ÷ floor", [str(ratio) for ratio in clocked])
        children = [Ratios(self._rounds[size], 2, 0) for size in self._sizes]
        table.row("time, `git status --porcelain -uall` as a child process ÷ floor",
                  [str(ratio) for ratio in children])
        return table

    def _files_table(self):
        table = Table("`getFileStates`", "instructions, floor", "library", "library ÷ floor",
                      "time, library ÷ floor")
        for size, count in self._lists():
            floor = self._counted["files", size, count]["floor"]
            library = self._counted["files", size, count]["library"]
            table.row(f"{count:,} of {size:,} files", [
                f"{floor:,}", f"{library:,}", f"{library / floor:.4f}",
                str(Ratios(self._rounds[size, count], 1, 0))],
                FILES_RATIO, [library / floor])
        return table

    def _small_table(self):
        counted = self._counted
        table = Table("One call", "Measured")
        less = counted["less", "allocations"]
        table.row("`std::less<upath>`, allocations of 999 calls", [f"{less['allocations']}"],
                  LESS_ALLOCATIONS, [less["allocations"]])
        table.row("`std::less<upath>` of neighbours in a folder or not, instructions",
                  [f"{counted['less', 'instructions'] / less['entries']:.0f}"])
        table.row("`isAdapterFor` with a guard alive, instructions",
                  [f"{counted['probe', 'guarded']:,}"], PROBE_INSTRUCTIONS,
                  [counted["probe", "guarded"]])
        table.row("the same at the floor", [f"{counted['probe', 'floor']:,}"])
        table.row("`isAdapterFor` without a guard, instructions",
                  [f"{counted['probe', 'alone']:,}"])
        for what, name in (("log record", "record"), ("scope trace", "trace")):
            each = (counted["severity", name] - counted["severity", "none"]) / 100_000
            table.row(f"disabled {what}, instructions", [f"{each:.1f}"])
        return table


def describe(root_length):
    return (f"{versions()}, {platform.machine()}. Paths of 40 characters below a root of "
            f"{root_length}, all files clean. Instructions and "
            f"allocations are those of the call; times are ratios of runs in turn, the median "
            f"(smallest–largest).")


def parse():
    parser = argparse.ArgumentParser(description=__doc__)
    parser.add_argument("--build", required=True, help="the build folder")
    parser.add_argument("--scratch", required=True, help="an empty folder with a short name")
    parser.add_argument("--quick", action="store_true", help="smaller working copies, no remotes")
    parser.add_argument("--page", help="file to write the tables into")
    return parser.parse_args()


def main():
    options = parse()
    sizes = list(SIZES)[:2] if options.quick else list(SIZES)
    bench = Bench(options.build, options.scratch, sizes, options.quick)
    with bench.serving():
        for what, step in (("making working copies", bench.make_working_copies),
                           ("counting instructions and allocations", bench.count),
                           ("timing", bench.clock)):
            print(f"== {what}", file=sys.stderr, flush=True)
            step()
    tables = bench.tables()
    description = describe(len(options.scratch) + 2)
    print("\n\n".join([description, *map(str, tables)]))
    if options.page:
        write_into(options.page, description, tables)
    failed = [what for table in tables for what in table.failed]
    print(f"\nbench: {'over the limit: ' + '; '.join(failed) if failed else 'within all limits'}",
          file=sys.stderr)
    return 1 if failed else 0


if __name__ == "__main__":
    sys.exit(main())
