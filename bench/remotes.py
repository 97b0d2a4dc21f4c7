# SPDX-License-Identifier: MIT
"""Compares clones and the operations with a remote with the floor."""

import os
import shutil

import working_copies
from daemon import Daemon
from programs import COUNTS, Ratios
from report import Table

LIMIT = 1.03
ROUNDS = 5
# A pack arrives in pieces of different sizes each time, so libgit2 copies it more or less often. That is up to 2 %
# of a call. A clone by path differs by up to 1 % with the place of its paths in memory.
MANY_COUNTS = 9
CLONED = 10_000
COMMITS = 1_000
HEADS = 10_000


def commit_stream(count):
    """Returns the input of git fast-import for further commits on main, of one file each."""
    for number in range(count):
        text = b"int later%d();\n" % number
        yield b"commit refs/heads/main\ncommitter bench <bench@localhost> %d +0000\n" % (
            1_700_000_100 + number)
        yield b"data 6\nchange\n" + (b"from refs/heads/main^0\n" if number == 0 else b"")
        name = working_copies.name_of(number % 100).encode()
        yield b"M 100644 inline %s\ndata %d\n%s\n" % (name, len(text), text)


class Operation:
    """One operation with a remote of its own. Its changes are undone before each run."""

    def __init__(self, operation, title, counts=COUNTS, by_path=False):
        self.operation = operation
        self.title = title
        self.counts = counts
        self._by_path = by_path
        self._name = operation + ("-by-path" if by_path else "")

    def make(self, folder, url, env):
        self._env = env
        self._root = os.path.join(folder, self._name)
        self._remote = os.path.join(folder, self._name + ".git")
        address = self._remote if self._by_path else f"{url}/{self._name}.git"
        self._address = address
        self._make_remote()
        if self.operation != "clone":
            self._make_working_copy(address)
        self._changed = {"fetch": [self._root], "push": [self._root, self._remote]}.get(
            self.operation, [])
        for path in self._changed:
            shutil.copytree(path, path + ".saved")

    def _git(self, root, *arguments, **options):
        working_copies.git(root, self._env, *arguments, **options)

    def _import(self, root, stream):
        self._git(root, "fast-import", "--quiet", input=b"".join(stream))

    def _make_remote(self):
        working_copies.make_repository(self._remote, self._env, "--bare")
        self._import(self._remote, working_copies.export_stream(
            CLONED if self.operation == "clone" else 100))
        if self.operation == "heads":
            lines = "".join(f"create refs/heads/topic-{number:05d} main\n"
                            for number in range(HEADS - 2))
            self._git(self._remote, "update-ref", "--stdin", input=lines.encode())
            self._git(self._remote, "pack-refs", "--all")

    def _make_working_copy(self, address):
        working_copies.make_repository(self._root, self._env)
        self._git(self._root, "remote", "add", "origin", address)
        self._git(self._root, "fetch", "--quiet", "origin", "main:refs/remotes/origin/main")
        self._git(self._root, "update-ref", "refs/heads/main", "refs/remotes/origin/main")
        if self.operation == "push":
            self._import(self._root, commit_stream(COMMITS))
        elif self.operation == "fetch":
            self._import(self._remote, commit_stream(COMMITS))

    def arguments(self):
        return (self.operation, self._root, self._address)

    def put_back(self):
        if self.operation == "clone":
            shutil.rmtree(self._root, ignore_errors=True)
        for path in self._changed:
            shutil.rmtree(path)
            shutil.copytree(path + ".saved", path)


class RemoteBench:
    """The operations with remotes. They need a server: see serve()."""

    def __init__(self, programs, scratch):
        self._programs = programs
        self._folder = os.path.join(scratch, "remotes")
        self._operations = [
            Operation("clone", f"clone of {CLONED:,} files by path", MANY_COUNTS, by_path=True),
            Operation("clone", f"clone of {CLONED:,} files", MANY_COUNTS),
            Operation("fetch", f"fetch of {COMMITS:,} commits", MANY_COUNTS),
            Operation("push", f"push of {COMMITS:,} commits"),
            Operation("heads", f"{HEADS:,} references listed")]

    def make_working_copies(self, env):
        for operation in self._operations:
            operation.make(self._folder, self._daemon.url, env)

    def serve(self, env):
        """Returns a context with a server of the remotes, in which all measurements must run."""
        os.mkdir(self._folder)
        self._daemon = Daemon(self._folder, env)
        return self._daemon

    def tasks(self):
        """Returns one task for each operation, because its runs take turns with one remote."""
        return {("remote", operation.title): lambda o=operation: self._count(o)
                for operation in self._operations}

    def _count(self, operation):
        return self._programs.count_in_turn(
            {program: (f"remote_{program}", *operation.arguments())
             for program in ("floor", "library")}, operation.counts, operation.put_back)

    def clock(self):
        self._rounds = {operation.title: self._programs.clock(
            [("remote_floor", *operation.arguments()), ("remote_library", *operation.arguments()),
             ("remote_floor", "child", *operation.arguments())],
            ROUNDS, before=operation.put_back) for operation in self._operations}

    def table(self, counted):
        table = Table("Remotes, over git:// except where the row says so", "instructions, floor",
                      "library", "library ÷ floor", "time, library ÷ floor",
                      "time, git as a child process ÷ floor")
        for operation in self._operations:
            rounds = self._rounds[operation.title]
            floor = counted["remote", operation.title]["floor"]
            library = counted["remote", operation.title]["library"]
            table.row(operation.title, [
                f"{floor:,}", f"{library:,}", f"{library / floor:.4f}",
                str(Ratios(rounds, 1, 0)), str(Ratios(rounds, 2, 0))], LIMIT, [library / floor])
        return table
