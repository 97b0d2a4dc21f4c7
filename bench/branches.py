# SPDX-License-Identifier: MIT
"""Compares the branch operations with the floor."""

import os
import shutil
import time

import working_copies
from programs import Ratios
from report import Table

ROUNDS = 7
DRIVER_ROUNDS = 21  # many, because a verdict depends on the times
FILES = 4_000
CHANGED = 1_000
IN_COMMON = 10  # one in so many is changed on both sides
BRANCHES = 10_000
DRIVEN = 100
PACKED = 2_000
FEW = 50


def text(number, first="first", last="last"):
    """Returns a file of twenty lines, of which each side of a merge can change one end."""
    middle = "".join(f"int value{number}_{line}();\n" for line in range(18))
    return f"// {first}\n{middle}// {last}\n"


def export_stream(base, ours, theirs, attributes):
    """Returns the input of git fast-import for a base and two branches on it, each a {number: text}."""
    yield b"blob\nmark :1\ndata 0\n\n"
    commits = (("main", base, None, ":2"), ("theirs", theirs, ":2", ":3"),
               ("main", ours, ":2", ":4"))
    for branch, files, parent, mark in commits:
        yield f"commit refs/heads/{branch}\nmark {mark}\n".encode()
        yield b"committer bench <bench@localhost> 1700000000 +0000\ndata 6\nchange\n"
        if parent:
            yield f"from {parent}\n".encode()
        elif attributes:
            yield b"M 100644 inline .gitattributes\ndata %d\n%s\n" % (
                len(attributes), attributes.encode())
        for number, content in files.items():
            name = working_copies.name_of(number)
            yield f"M 100644 inline {name}\ndata {len(content)}\n{content}\n".encode()


class Operation:
    """One operation in a working copy of its own, which is restored before each run."""

    def __init__(self, name, title, limit=None, driver=None, files=FILES, changed=CHANGED):
        self.name = name
        self.title = title
        self.limit = limit
        self.driver = driver
        self._tracked = files
        self._changed = changed
        self._branch = "theirs"
        # The number of branches that are made and packed, and how many of them the programs visit.
        self._packed = {"branches": BRANCHES, "delete": PACKED, "revisions": PACKED}.get(name)
        if name in ("delete", "revisions"):
            self._branch = str(FEW)

    def make(self, folder, env):
        self._env = env
        self._root = os.path.join(folder, self.title.replace(" ", "-").replace(",", ""))
        self._saved = self._root + ".saved"
        self.arguments = (self.name, self._root, self._branch)
        base, ours, theirs = self._sides()
        working_copies.make_repository(self._root, env)
        attributes = "*.cpp merge=tool\n" if self.driver else ""
        working_copies.git(self._root, env, "fast-import", "--quiet",
                           input=b"".join(export_stream(base, ours, theirs, attributes)))
        if self.driver:
            working_copies.git(self._root, env, "config", "merge.tool.driver", self.driver)
        if self._packed:
            lines = "".join(f"create refs/heads/topic-{number:05d} main\n"
                            for number in range(self._packed - 2))
            working_copies.git(self._root, env, "update-ref", "--stdin", input=lines.encode())
            working_copies.git(self._root, env, "pack-refs", "--all")
        self._files = {**base, **ours}
        working_copies.git(self._root, env, "read-tree", "main")
        working_copies.git(self._root, env, "checkout-index", "--all", "--force")
        self._touched = [working_copies.name_of(number) for number in theirs]
        self._write(self._files)
        working_copies.git(self._root, env, "update-index", "-q", "--refresh")
        shutil.copytree(os.path.join(self._root, ".git"), self._saved)

    def _sides(self):
        if self._packed:
            return {0: text(0)}, {}, {}
        if self.name == "driver":
            numbers = range(DRIVEN)
            return ({n: text(n) for n in numbers}, {n: text(n, first="ours") for n in numbers},
                    {n: text(n, last="theirs") for n in numbers})
        base = {n: text(n) for n in range(self._tracked)}
        theirs = {n: text(n, last="theirs") for n in range(self._changed)}
        first_of_ours = self._changed - self._changed // IN_COMMON
        ours = {n: text(n, first="ours")
                for n in range(first_of_ours, first_of_ours + self._changed)}
        return base, {} if self.name == "switch" else ours, theirs

    def _write(self, files):
        """Makes files older than the index, so that libgit2 need not read them to see if they changed."""
        past = time.time() - 1800
        for number, content in files.items():
            path = os.path.join(self._root, working_copies.name_of(number))
            with open(path, "w", encoding="ascii") as file:
                file.write(content)
            os.utime(path, (past, past))

    def put_back(self):
        if self.name in ("branches", "revisions"):
            return
        shutil.rmtree(os.path.join(self._root, ".git"))
        shutil.copytree(self._saved, os.path.join(self._root, ".git"))
        _, _, theirs = self._sides()
        self._write({number: self._files[number] for number in theirs})
        working_copies.git(self._root, self._env, "update-index", "-q", "--refresh")


class BranchBench:
    def __init__(self, programs, scratch):
        self._programs = programs
        self._scratch = scratch
        self._operations = [
            Operation("branches", f"{BRANCHES:,} branches listed", 1.15),
            Operation("delete", f"{FEW} of {PACKED:,} branches deleted", 1.15),
            Operation("revisions", f"{FEW} of {PACKED:,} branches asked for their commit", 1.15),
            Operation("switch", f"switch over {CHANGED:,} of {FILES:,} files", 1.03),
            Operation("merge", f"merge of {CHANGED:,} files on either side", 1.03),
            Operation("driver", f"merge of {DRIVEN} files by vkAutoMerge.sh", 1.10,
                      f'"{programs.tool}" %O %A %B %A'),
            Operation("driver", f"merge of {DRIVEN} files by cp", None, "cp %B %A")]

    def make_working_copies(self, env):
        folder = os.path.join(self._scratch, "branches")
        os.mkdir(folder)
        for operation in self._operations:
            operation.make(folder, env)

    def tasks(self):
        """Returns one task for each operation, because its runs take turns in one working copy."""
        return {("branch", operation.name): lambda o=operation: self._count(o)
                for operation in self._operations if not operation.driver}

    def _count(self, operation):
        return self._programs.count_in_turn(
            {program: (f"branch_{program}", *operation.arguments)
             for program in ("floor", "library")}, before=operation.put_back)

    def clock(self):
        self._rounds = {}
        for operation in self._operations:
            # The floor maps the same memory as the library, because the cost of a fork depends on it.
            added = {"BENCH_LOAD": self._programs.library}
            if operation.driver and self._programs.tool in operation.driver:
                added["BENCH_TOOL"] = self._programs.tool
            self._rounds[operation.title] = self._programs.clock(
                [("branch_floor", *operation.arguments), ("branch_library", *operation.arguments),
                 ("branch_floor", "child", *operation.arguments)],
                DRIVER_ROUNDS if operation.limit and operation.driver else ROUNDS,
                before=operation.put_back, added=added)

    def table(self, counted):
        table = Table("Branches", "instructions, floor", "library", "library ÷ floor",
                      "time, library ÷ floor", "time, git as a child process ÷ floor")
        for operation in self._operations:
            rounds = self._rounds[operation.title]
            clocked = Ratios(rounds, 1, 0)
            child = str(Ratios(rounds, 2, 0))
            if operation.driver:
                table.row(operation.title, ["", "", "", str(clocked), child], operation.limit,
                          [clocked.median])
                continue
            floor = counted["branch", operation.name]["floor"]
            library = counted["branch", operation.name]["library"]
            table.row(operation.title, [
                f"{floor:,}", f"{library:,}", f"{library / floor:.4f}", str(clocked), child],
                operation.limit, [library / floor])
        return table
