# SPDX-License-Identifier: MIT
"""A copy of the tree in which mutants are made, built and tested one after the other."""

import filecmp
import glob
import os
import pathlib
import re
import shutil
import subprocess

import sandbox

PRESET = "mutation"
ROOMS = ("error", "util", "options", "main")
FAULTS = "tests/fault/vclink_fault_libgit2_tests"
# A test may take this many times its recorded time, because the machine may be busy.
PATIENCE = 6
START_SECONDS = 30
BUILD_SECONDS = 1200
# The recorded seconds of the tests in one run of a program; quick tests run first.
SLICES = (0.7, 3, 12, 1e9)


class DoesNotCompile(Exception):
    """The compiler refuses the mutant."""


def room_of(file):
    return pathlib.PurePath(file).parts[0]


def _call(command, folder, environment=None):
    done = subprocess.run(
        command,
        cwd=folder,
        env=environment,
        stdin=subprocess.DEVNULL,
        stdout=subprocess.PIPE,
        stderr=subprocess.STDOUT,
        text=True,
        check=False,
    )
    if done.returncode != 0:
        raise SystemExit(f"{done.stdout}\nscripts/mutate: {command[0]} failed")
    return done.stdout


class Workplace:
    def __init__(self, root, number):
        self.root = root
        self.tree = os.path.join(root, "build", "mutate", str(number))
        self.build = os.path.join(self.tree, "build", PRESET)
        self.kept = os.path.join(self.tree, "build", "kept")
        self.programs = []
        self.objects = []

    def prepare(self):
        """Copies the tree, and builds it without a mutation."""
        self._copy_tree()
        environment = dict(os.environ)
        if shutil.which("ccache"):
            environment.update(
                CMAKE_C_COMPILER_LAUNCHER="ccache",
                CMAKE_CXX_COMPILER_LAUNCHER="ccache",
                CCACHE_BASEDIR=self.tree,
                CCACHE_NOHASHDIR="yes",
            )
        _call(["cmake", "--preset", PRESET], self.tree, environment)
        self.programs = self._find_programs()
        _call(["ninja", "-C", self.build, *self.programs], self.tree, environment)
        self._keep_objects()

    def program(self, name):
        return os.path.join(self.build, name)

    def record(self, name, file):
        """Runs a test program without a mutation, and writes what each test reaches to the file."""
        folder = os.path.dirname(file)
        pathlib.Path(file).unlink(missing_ok=True)
        status, output = sandbox.run(
            [self.program(name)],
            self.tree,
            self.build,
            3600,
            writable=folder,
            variables={"VCLINK_REACH": file},
        )
        if status != 0:
            raise SystemExit(f"{output}\nscripts/mutate: {name} fails without any mutation")

    def attempt(self, mutation, tests, jobs):
        """Makes the mutation and runs the tests until one fails.

        Returns the name of that test, or "time limit", or None if the mutant survives.
        """
        path = os.path.join(self.tree, mutation.file)
        before = pathlib.Path(path).stat()
        source = pathlib.Path(path).read_text()
        linked = []
        try:
            pathlib.Path(path).write_text(mutation.apply(source))
            if path.endswith(".cpp"):
                self._build(f"CMakeFiles/vclink_git_objects.dir/{mutation.file}.o", jobs)
            for name, names, seconds in self._slices(tests, room_of(mutation.file)):
                if name not in linked:
                    linked.append(name)
                    self._build(name, jobs)
                killer = self._run_tests(name, names, seconds)
                if killer is not None:
                    return killer
            return None
        finally:
            pathlib.Path(path).write_text(source)
            os.utime(path, ns=(before.st_atime_ns, before.st_mtime_ns))
            self._restore_objects()
            for name in linked:
                pathlib.Path(self.program(name)).unlink(missing_ok=True)

    def _copy_tree(self):
        listed = subprocess.check_output(
            ["git", "ls-files", "-z", "--cached", "--others", "--exclude-standard"],
            cwd=self.root,
            text=True,
        ).split("\0")
        files = {name for name in listed if os.path.isfile(os.path.join(self.root, name))}
        for name in files:
            original, copy = os.path.join(self.root, name), os.path.join(self.tree, name)
            if not os.path.isfile(copy) or not filecmp.cmp(original, copy, shallow=False):
                os.makedirs(os.path.dirname(copy), exist_ok=True)
                # Gives it a new time: the original's may be older than what was built from the last mutant.
                shutil.copy(original, copy)
        for path in pathlib.Path(self.tree).rglob("*"):
            name = str(path.relative_to(self.tree))
            if path.is_file() and not name.startswith("build/") and name not in files:
                path.unlink()

    def _find_programs(self):
        """Returns the programs with fast tests: those of the layers, except that of the shared library,
        and the one in which each call of libgit2 fails."""
        targets = _call(["ninja", "-C", self.build, "-t", "targets", "all"], self.tree)
        names = rf"tests/(?:{'|'.join(ROOMS)})/vclink_\w+_tests|{FAULTS}"
        found = re.findall(rf"^({names}): CXX_EX", targets, re.M)
        return sorted(name for name in found if not name.endswith("exported_tests"))

    def _keep_objects(self):
        """Gives each object a second name. Compilers rename a new file, so this name keeps the old one."""
        shutil.rmtree(self.kept, ignore_errors=True)
        self.objects = [
            os.path.relpath(path, self.build)
            for pattern in ("*.o", "*.a")
            for path in glob.glob(f"{self.build}/**/{pattern}", recursive=True)
        ]
        for name in self.objects:
            copy = os.path.join(self.kept, name)
            os.makedirs(os.path.dirname(copy), exist_ok=True)
            os.link(os.path.join(self.build, name), copy)

    def _restore_objects(self):
        for name in self.objects:
            built, kept = os.path.join(self.build, name), os.path.join(self.kept, name)
            if not os.path.exists(built) or not os.path.samefile(built, kept):
                spare = built + ".kept"
                os.link(kept, spare)
                os.replace(spare, built)

    def _build(self, target, jobs):
        # The preset does not run programs after linking them.
        command = ["ninja", f"-j{jobs}", target]
        try:
            status, output = sandbox.run(
                command, self.tree, self.build, BUILD_SECONDS, writable=self.tree
            )
        except sandbox.TimeLimit as limit:
            raise DoesNotCompile("in time") from limit
        if status != 0:
            raise DoesNotCompile(output)

    def _slices(self, tests, room):
        """Returns (program, its tests, their seconds): quick tests first, and the layer's own before others."""
        slices = []
        for name in {test.program for test in tests}:
            own = sorted((t for t in tests if t.program == name), key=lambda t: t.seconds)
            for size, limit in enumerate(SLICES):
                taken, seconds = [], 0.0
                while own and (not taken or seconds + own[0].seconds <= limit):
                    seconds += own[0].seconds
                    taken.append(own.pop(0).name)
                if taken:
                    slices.append((size, room not in name, seconds, name, taken))
        slices.sort()
        return [(name, taken, seconds) for _, _, seconds, name, taken in slices]

    def _run_tests(self, name, names, seconds):
        command = [
            self.program(name),
            "--gtest_filter=" + ":".join(names),
            "--gtest_fail_fast",
            "--gtest_brief=1",
        ]
        try:
            status, output = sandbox.run(
                command, self.tree, self.build, START_SECONDS + PATIENCE * seconds
            )
        except sandbox.TimeLimit:
            return "time limit"
        if status == 0:
            return None
        failed = re.findall(r"^\[  FAILED  \] (\S+?)(?:,|$| \()", output, re.M)
        return failed[0] if failed else f"{os.path.basename(name)} ended with status {status}"
