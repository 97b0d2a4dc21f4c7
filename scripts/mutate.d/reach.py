# SPDX-License-Identifier: MIT
"""Which tests reach which lines of the library."""

import bisect
import collections
import hashlib
import json
import os
import pathlib
import re
import subprocess

import workplace

# The recorded seconds of a fast test, and of all tests that are tried on a mutant.
TEST_SECONDS = 10
ALL_SECONDS = 150
# The number of lines before and after a mutant whose tests are tried too.
AROUND = 3

Test = collections.namedtuple("Test", "program name seconds")


class Reach:
    """The records of a workplace's programs. A program records again only if it has changed."""

    def __init__(self, workplace):
        self.workplace = workplace
        self.folder = os.path.join(workplace.tree, "build", "reach")
        # For each file its lines that have a place, and for each of these the tests that reach it.
        self.lines = {}
        self.tests = collections.defaultdict(lambda: collections.defaultdict(set))
        self.all_tests = set()

    def record(self, executor):
        os.makedirs(self.folder, exist_ok=True)
        programs = sorted(self.workplace.programs, key=self._size, reverse=True)
        for program, file in zip(programs, list(executor.map(self._record_program, programs))):
            self._read(program, file)
        self.lines = {file: sorted(of_file) for file, of_file in self.tests.items()}

    def tests_for(self, mutation, source):
        """Returns the fast tests that can notice the mutant."""
        room = workplace.room_of(mutation.file)
        fast = [t for t in self._reaching(mutation, source) if t.seconds < TEST_SECONDS]
        fast.sort(key=lambda test: (test.seconds + (0 if room in test.program else 1), test.name))
        tests, seconds = [], 0.0
        for test in fast:
            seconds += test.seconds
            if seconds <= ALL_SECONDS:
                tests.append(test)
        return tests

    def _reaching(self, mutation, source):
        """Returns the tests that reach a place in the mutant's lines or near them.

        Near them, because the compiler leaves out places that others imply. For a mutant outside functions,
        returns the tests that reach the file, or all tests if the file has no places.
        """
        lines = self.lines.get(mutation.file)
        if lines is None:
            return self.all_tests
        of_file = self.tests[mutation.file]
        if not mutation.in_function:
            return set().union(*of_file.values()) or self.all_tests
        last = mutation.line + source.count("\n", mutation.begin, mutation.end)
        begin = max(bisect.bisect_right(lines, mutation.line) - AROUND, 0)
        end = bisect.bisect_right(lines, last) + AROUND
        return set().union(*(of_file[line] for line in lines[begin:end]))

    def _size(self, program):
        """Large programs are likely to take the longest."""
        return os.path.getsize(self.workplace.program(program))

    def _record_program(self, program):
        content = pathlib.Path(self.workplace.program(program)).read_bytes()
        digest = hashlib.sha256(content).hexdigest()[:16]
        file = os.path.join(self.folder, f"{os.path.basename(program)}.{digest}")
        if not os.path.exists(file):
            self.workplace.record(program, file + ".new")
            os.replace(file + ".new", file)
        return file

    def _read(self, program, file):
        with open(file, encoding="utf-8") as records:
            places = self._places(program, file + ".lines", next(records).split()[1:])
            for name, line in places:
                self.tests[name].setdefault(line, set())
            for record in records:
                name, milliseconds, *reached = record.split()
                test = Test(program, name, int(milliseconds) / 1000)
                self.all_tests.add(test)
                for number in reached:
                    file_name, line = places[int(number)]
                    self.tests[file_name][line].add(test)

    def _places(self, program, file, addresses):
        """Returns the result of _find_lines, which is slow and therefore stored."""
        if not os.path.exists(file):
            found = json.dumps(self._find_lines(program, addresses))
            pathlib.Path(file).write_text(found, encoding="utf-8")
        return json.loads(pathlib.Path(file).read_text(encoding="utf-8"))

    def _find_lines(self, program, addresses):
        """Returns file and line for each address."""
        answers = subprocess.run(
            ["addr2line", "-e", self.workplace.program(program)],
            input="\n".join(hex(int(address)) for address in addresses),
            stdout=subprocess.PIPE,
            text=True,
            check=True,
        ).stdout.splitlines()
        found = []
        for answer in answers:
            match = re.match(r"(.*):(\d+)", answer)
            if match is None:
                found.append(("", 0))
            else:
                path = os.path.join(self.workplace.build, match[1])
                found.append((os.path.relpath(path, self.workplace.tree), int(match[2])))
        return found
