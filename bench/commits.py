# SPDX-License-Identifier: MIT
"""Compares what commits spare libgit2 with libgit2's own refresh of the index: many changes, one
large text, a sparse checkout."""

import os
import random
import shutil
import time

import working_copies
from programs import Ratios
from report import Table, exponent

MANY_RATIO = 0.6
FEW_RATIO = 1.05
LARGE_RATIO = 1.5
LARGE_MEMORY = 32 * 1024
EXPONENT = 1.1
ROUNDS = 3
LINES = 60
LARGE_MIB = 16
SPARSE = (10_000, 20_000, 40_000, 80_000)
PRESENT = 100


def source(number, change=""):
    """A file of some 2 KB, of which a change touches each line."""
    return "".join(f"    int value{number}_{line} = compute{change}({line}, {number});\n"
                   for line in range(LINES))


def export_stream(files):
    """What git fast-import takes: one commit of {name: content}."""
    yield b"commit refs/heads/main\ncommitter bench <bench@localhost> 1700000000 +0000\n"
    yield b"data 5\nfiles\n"
    for name, content in files:
        yield b"M 100644 inline %s\ndata %d\n%s\n" % (name.encode(), len(content), content)


def date_back(path, seconds):
    past = time.time() - seconds
    os.utime(path, (past, past))


class Situation:
    """A working copy with changes, whose repository is put back before each run."""

    def __init__(self, name, title):
        self.name = name
        self.title = title

    def make(self, folder, env):
        self.root = os.path.join(folder, self.name)
        self._saved = self.root + ".saved"
        self.list = self.root + ".list"
        working_copies.make_repository(self.root, env)
        working_copies.git(self.root, env, "fast-import", "--quiet",
                           input=b"".join(export_stream(self.files())))
        working_copies.git(self.root, env, "read-tree", "HEAD")
        self.check_out(env)
        for name in self.changed():
            path = os.path.join(self.root, name)
            with open(path, "wb") as file:
                file.write(self.content(name))
            date_back(path, 1800)
        with open(self.list, "w", encoding="ascii") as file:
            file.writelines(f"{name}\n" for name in self.changed())
        shutil.copytree(os.path.join(self.root, ".git"), self._saved)

    def check_out(self, env):
        working_copies.git(self.root, env, "checkout-index", "--all", "--force")
        for name, _ in self.files():
            date_back(os.path.join(self.root, name), 3600)
        working_copies.git(self.root, env, "update-index", "--refresh")

    def put_back(self):
        shutil.rmtree(os.path.join(self.root, ".git"))
        shutil.copytree(self._saved, os.path.join(self.root, ".git"))

    def commit(self, program):
        return (f"change_{program}", "commit", self.root, self.list)


class Sources(Situation):
    """Source files, of which some have other lines."""

    def __init__(self, name, tracked, changed):
        super().__init__(name, f"{changed:,} of {tracked:,} files changed")
        self._tracked = tracked
        self._changed = changed

    def files(self):
        return ((working_copies.name_of(number), source(number).encode())
                for number in range(self._tracked))

    def changed(self):
        return [working_copies.name_of(number * self._tracked // self._changed)
                for number in range(self._changed)]

    def content(self, name):
        return source(int(name[-9:-4]), "Anew").encode()


class LargeText(Situation):
    def __init__(self, mebibytes):
        super().__init__("large", f"a text of {mebibytes} MiB with its lines shuffled")
        numbers = random.Random(1)
        self._lines = [b"%08d %032x\n" % (line, numbers.getrandbits(128))
                       for line in range(mebibytes * 1024 * 1024 // 42)]

    def files(self):
        return [("text", b"".join(self._lines))]

    def changed(self):
        return ["text"]

    def content(self, _):
        lines = self._lines[:]
        random.Random(2).shuffle(lines)
        return b"".join(lines)


class Sparse(Situation):
    """A checkout of so many files, of which a hundred are present, and one is changed."""

    def __init__(self, tracked):
        super().__init__(f"sparse{tracked}", f"{PRESENT} of {tracked:,} files checked out")
        self.tracked = tracked

    def files(self):
        return ((working_copies.name_of(number), b"int value%d();\n" % number)
                for number in range(self.tracked))

    def check_out(self, env):
        names = [name for name, _ in self.files()]
        working_copies.git(self.root, env, "update-index", "--skip-worktree", "--stdin",
                           input="".join(f"{name}\n" for name in names[PRESENT:]).encode())
        working_copies.git(self.root, env, "checkout-index", "--force", "--stdin",
                           input="".join(f"{name}\n" for name in names[:PRESENT]).encode())
        for name in names[:PRESENT]:
            date_back(os.path.join(self.root, name), 3600)
        working_copies.git(self.root, env, "update-index", "--refresh")

    def changed(self):
        return [working_copies.name_of(0)]

    def content(self, _):
        return b"changed\n"


class CommitBench:
    def __init__(self, programs, scratch, part=1):
        """:param part: one in so many files and bytes"""
        self._programs = programs
        self._scratch = scratch
        self._many = Sources("many", 10_000 // part, 5_000 // part)
        self._few = Sources("few", 20_000 // part, 1)
        self._large = LargeText(LARGE_MIB // part)
        self._sparse = [Sparse(tracked) for tracked in SPARSE if tracked <= SPARSE[-1] // part]

    def make_working_copies(self, env):
        folder = os.path.join(self._scratch, "commits")
        os.mkdir(folder)
        for situation in (self._many, self._few, self._large, *self._sparse):
            situation.make(folder, env)

    def tasks(self):
        """One task a situation, since its runs take turns in one working copy."""
        return {
            ("commits", "many"): lambda: self._compare(self._many),
            ("commits", "few"): lambda: self._compare(self._few),
            ("commits", "large"): self._count_large,
            **{("commits", sparse.tracked): lambda s=sparse: self._count(s, s.commit("library"))
               for sparse in self._sparse}}

    def _count(self, situation, command):
        situation.put_back()
        return self._programs.instructions(*command)

    def _compare(self, situation):
        return {program: self._count(situation, situation.commit(program))
                for program in ("floor", "library")}

    def _store(self):
        return ("change_floor", "store", self._large.root, self._large.list)

    def _count_large(self):
        counted = {"store": self._count(self._large, self._store()),
                   "library": self._count(self._large, self._large.commit("library"))}
        for name, command in (("store", self._store()),
                              ("library", self._large.commit("library"))):
            self._large.put_back()
            counted["peak", name] = self._programs.run(*command)["peak_kib"]
        return counted

    def clock(self):
        self._rounds = {}
        for situation in (self._many, self._few):
            self._rounds[situation.name] = self._programs.clock(
                [situation.commit("floor"), situation.commit("library")], ROUNDS,
                before=situation.put_back)
        self._rounds["large"] = self._programs.clock(
            [self._store(), self._large.commit("library")], ROUNDS, before=self._large.put_back)
        self._sparse_times = {
            sparse.tracked: self._programs.clock([sparse.commit("library")], ROUNDS,
                                                 before=sparse.put_back,
                                                 clock="processor_nanoseconds")
            for sparse in self._sparse}

    def tables(self, counted):
        return [self._table(counted), self._sparse_table(counted)]

    def _table(self, counted):
        table = Table("Commits", "instructions, floor", "library", "library ÷ floor",
                      "time, library ÷ floor")
        for situation, limit in ((self._many, MANY_RATIO), (self._few, FEW_RATIO)):
            counts = counted["commits", situation.name]
            ratio = counts["library"] / counts["floor"]
            table.row(situation.title,
                      [f"{counts['floor']:,}", f"{counts['library']:,}", f"{ratio:.4f}",
                       str(Ratios(self._rounds[situation.name], 1, 0))], limit, [ratio])
        large = counted["commits", "large"]
        ratio = large["library"] / large["store"]
        table.row(f"{self._large.title}; the floor only hashes and stores it",
                  [f"{large['store']:,}", f"{large['library']:,}", f"{ratio:.4f}",
                   str(Ratios(self._rounds["large"], 1, 0))], LARGE_RATIO, [ratio])
        over = large["peak", "library"] - large["peak", "store"]
        table.row("the same, KiB of peak memory",
                  [f"{large['peak', 'store']:,}", f"{large['peak', 'library']:,}",
                   f"{over:+,}", ""], LARGE_MEMORY, [over])
        return table

    def _sparse_table(self, counted):
        sizes = [sparse.tracked for sparse in self._sparse]
        table = Table(f"Commits with {PRESENT} files checked out",
                      *(f"of {tracked:,}" for tracked in sizes), "exponent")
        instructions = {tracked: counted["commits", tracked] for tracked in sizes}
        growth = exponent(instructions)
        table.row("instructions, library", [*(f"{instructions[t]:,}" for t in sizes),
                                            f"{growth:.2f}"], EXPONENT, [growth])
        times = {tracked: min(taken[0] for taken in self._sparse_times[tracked])
                 for tracked in sizes}
        table.row("milliseconds of processor time, library, the shortest run",
                  [*(f"{times[t] / 1e6:,.0f}" for t in sizes), f"{exponent(times):.2f}"])
        return table
