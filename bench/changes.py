# SPDX-License-Identifier: MIT
"""Compares the operations that change the repository with the floor."""

import os
import shutil
import time

import working_copies
from programs import Ratios
from report import Table

RATIO = 1.05
MEMORY = 1024 * 1024
ROUNDS = 7


class Change:
    """One operation in a working copy of its own, which is restored before each run."""

    def __init__(self, operation, title, tracked, listed):
        self.operation = operation
        self.title = title
        self._tracked = tracked
        self._listed = listed

    def make(self, folder, env):
        self._root = os.path.join(folder, self.operation)
        self._saved = self._root + ".saved"
        self.arguments = (self.operation, self._root, self._root + ".list")
        working_copies.make_working_copy(self._root, self._tracked, env)
        with open(self.arguments[2], "w", encoding="ascii") as file:
            file.writelines(f"{name}\n" for name in self._names())
        if self.operation != "remove":
            self._edit()
        if self.operation == "revert":
            # Half of the reverted changes are staged.
            staged = "".join(f"{name}\n" for name in self._names()[::2])
            working_copies.git(self._root, env, "add", "--pathspec-from-file=-",
                               input=staged.encode())
        shutil.copytree(os.path.join(self._root, ".git"), self._saved)

    def put_back(self):
        """Restores the repository as it was made, and the files that a revert touches."""
        shutil.rmtree(os.path.join(self._root, ".git"))
        shutil.copytree(self._saved, os.path.join(self._root, ".git"))
        if self.operation == "revert":
            self._edit()

    def _names(self):
        if self.operation == "add":
            return [working_copies.name_of(self._tracked + n) for n in range(self._listed)]
        return [working_copies.name_of(n * self._tracked // self._listed)
                for n in range(self._listed)]

    def _edit(self):
        """Changes the listed files, and makes them older than the index, so that libgit2 need not read
        other files to see if they changed."""
        past = time.time() - 1800
        for name in self._names():
            path = os.path.join(self._root, name)
            os.makedirs(os.path.dirname(path), exist_ok=True)
            with open(path, "w", encoding="ascii") as file:
                file.write(f"// {name}\n")
            os.utime(path, (past, past))


class ChangeBench:
    def __init__(self, programs, scratch, part=1):
        """:param part: one in so many files"""
        self._programs = programs
        self._scratch = scratch
        self._changes = [
            Change("add", f"{1_000 // part:,} files added to {1_000 // part:,}", 1_000 // part,
                   1_000 // part),
            Change("commit", f"commit of {1_000 // part:,} changes in {50_000 // part:,} files",
                   50_000 // part, 1_000 // part),
            Change("revert", f"{1_000 // part:,} of {2_000 // part:,} files reverted",
                   2_000 // part, 1_000 // part)]

    def make_working_copies(self, env):
        folder = os.path.join(self._scratch, "changes")
        os.mkdir(folder)
        for change in self._changes:
            change.make(folder, env)

    def tasks(self):
        """Returns one task for each operation, because its runs take turns in one working copy."""
        return {("change", change.operation): lambda c=change: self._count(c)
                for change in self._changes}

    def _count(self, change):
        commands = {program: (f"change_{program}", *change.arguments)
                    for program in ("floor", "library")}
        instructions = self._programs.count_in_turn(commands, before=change.put_back)
        counted = {("instructions", program): count for program, count in instructions.items()}
        for program, command in commands.items():
            change.put_back()
            counted["allocations", program] = self._programs.allocations(*command)
        return counted

    def clock(self):
        self._rounds = {}
        for change in self._changes:
            self._rounds[change.operation] = self._programs.clock(
                [("change_floor", *change.arguments), ("change_library", *change.arguments),
                 ("change_floor", "child", *change.arguments)], ROUNDS, before=change.put_back)

    def table(self, counted):
        table = Table("Changes", *(change.title for change in self._changes))
        of = [counted["change", change.operation] for change in self._changes]
        floor = [counts["instructions", "floor"] for counts in of]
        library = [counts["instructions", "library"] for counts in of]
        ratios = [above / below for above, below in zip(library, floor)]
        table.row("instructions, floor", [f"{number:,}" for number in floor])
        table.row("instructions, library", [f"{number:,}" for number in library])
        table.row("library ÷ floor", [f"{ratio:.4f}" for ratio in ratios], RATIO, ratios)
        heap = [[counts["allocations", program]["peak_bytes"] for counts in of]
                for program in ("floor", "library")]
        over = [above - below for below, above in zip(*heap)]
        table.row("most bytes held at once, floor", [f"{number:,}" for number in heap[0]])
        table.row("the same, library over floor", [f"{number:,}" for number in over], MEMORY, over)
        for what, above in (("library", 1), ("git as a child process", 2)):
            ratios = [Ratios(self._rounds[c.operation], above, 0) for c in self._changes]
            table.row(f"time, {what} ÷ floor", [str(ratio) for ratio in ratios])
        return table
