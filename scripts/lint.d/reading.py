# SPDX-License-Identifier: MIT
"""Runs clang-tidy on units, on several at once if that is as good, and remembers clean ones."""

import hashlib
import os
import re
import resource
import shutil
import subprocess
import threading
import time

# These checks examine the compiled file only, not what it includes, so each changed unit is read by itself. All
# other checks find the same in units that are read together.
OF_THE_UNIT = ("misc-unused-alias-decls", "misc-unused-using-decls")
ALONE, TOGETHER = "alone", "together"
MOST_TOGETHER = 20
SECONDS = 900
KEPT_DAYS = 30
REMARK = re.compile(r"^(/.*?):\d+:\d+: (?:warning|error|fatal error): .*?(\[[^\]]*\])?$")


class Clean:
    """Keys of clean units: one file for each key, in a folder outside the working tree."""

    def __init__(self, folder):
        self.folder = folder

    def _file(self, key, way):
        name = hashlib.sha256(f"{key} {way}".encode()).hexdigest()
        return os.path.join(self.folder, name[:2], name[2:])

    def has(self, key, way):
        if self.folder is None:
            return False
        try:
            os.utime(self._file(key, way))
        except OSError:
            return False
        return True

    def add(self, key, way):
        if self.folder is not None:
            try:
                file = self._file(key, way)
                os.makedirs(os.path.dirname(file), exist_ok=True)
                with open(file, "wb"):
                    pass
            except OSError:
                self.folder = None

    def forget_old(self):
        oldest = time.time() - KEPT_DAYS * 24 * 3600
        for folder, _, files in os.walk(self.folder or ""):
            for file in files:
                try:
                    if os.stat(os.path.join(folder, file)).st_mtime < oldest:
                        os.remove(os.path.join(folder, file))
                except OSError:
                    continue


class Reader:
    """Runs clang-tidy."""

    def __init__(self, project, clean, version, folder):
        self.project = project
        self.clean = clean
        self.version = version
        self.folder = folder
        self.keys = {}
        self.seen = {}
        self.said = set()
        self.failed = False
        self.runs = 0
        self.lock = threading.Lock()
        self._checks = {}
        shutil.rmtree(folder, ignore_errors=True)
        # A joined unit must have the configuration of its members' folder.
        for unit in project.units:
            for file in project.own_configurations(unit):
                copy = os.path.join(folder, project.name(file))
                if project.name(file) != os.path.basename(file) and not os.path.exists(copy):
                    os.makedirs(os.path.dirname(copy), exist_ok=True)
                    shutil.copyfile(file, copy)

    def remember(self, unit):
        """Stores the unit's key and the current state of its files. Returns the key."""
        self.seen[unit] = self._state(unit)
        self.keys[unit] = self.project.key(unit, self.version)
        return self.keys[unit]

    @staticmethod
    def _state(unit):
        return [(s.st_mtime_ns, s.st_size) for s in map(os.stat, [unit.source, *unit.inputs])]

    def is_clean(self, unit, way):
        return self.clean.has(self.keys[unit], way)

    def _found_clean(self, unit, *ways):
        try:
            unchanged = self._state(unit) == self.seen[unit]
        except OSError:
            unchanged = False
        if unchanged and unit.scanned:
            for way in ways:
                self.clean.add(self.keys[unit], way)

    def read_whole(self, unit):
        """Runs all checks on one unit."""
        output = self._run(unit, unit.source)
        if output is None:
            self._found_clean(unit, ALONE, TOGETHER)
        else:
            self._tell(output)

    def read_alone(self, unit):
        """Checks what only a single unit shows: that it compiles, and that it uses what it declares."""
        output = self._run(unit, unit.source, "--checks=" + self._checks_of_the_unit(unit))
        if output is None:
            self._found_clean(unit, ALONE)
        else:
            self._tell(output)

    def read_together(self, units):
        """Runs all checks on several units as one. Reads suspected ones again, one by one."""
        if len(units) == 1:
            self.read_whole(units[0])
            return
        source = self._join(units)
        output = self._run(units[0], source)
        if output is None:
            for unit in units:
                self._found_clean(unit, TOGETHER)
            return
        remarks = [match.groups() for match in map(REMARK.match, output.splitlines()) if match]
        if not remarks or any("clang-diagnostic-error" in (check or "") for _, check in remarks):
            # Names clash, or one of them does not compile.
            half = len(units) // 2
            self.read_together(units[:half])
            self.read_together(units[half:])
            return
        files = {os.path.normpath(file) for file, _ in remarks}
        suspects = [unit for unit in units if unit.source in files]
        others = [unit for unit in units if unit.source not in files]
        headers = files - {unit.source for unit in suspects} - {source}
        for unit in suspects:
            self.read_whole(unit)
        for unit in others:
            # Any unit that includes a header can be the cause of a remark on the header.
            if not headers:
                self._found_clean(unit, TOGETHER)
            elif not headers <= self.files_told():
                self.read_whole(unit)

    def _join(self, units):
        own = self.project.own_configurations(units[0])
        below = self.project.name(os.path.dirname(own[0])) if own else "."
        lines = [
            f'#include "{unit.source}" // NOLINT(bugprone-suspicious-include)\n' for unit in units
        ]
        text = "".join(lines)
        name = hashlib.sha256(text.encode()).hexdigest()[:16]
        source = os.path.normpath(os.path.join(self.folder, below, f"{name}.cpp"))
        os.makedirs(os.path.dirname(source), exist_ok=True)
        with open(source, "w", encoding="utf-8") as file:
            file.write(text)
        return source

    def _checks_of_the_unit(self, unit):
        folder = os.path.dirname(unit.source)
        if folder not in self._checks:
            listed = subprocess.run(
                ["clang-tidy", "--list-checks", unit.source, "--"],
                capture_output=True,
                text=True,
                check=True,
            ).stdout.split()
            chosen = [check for check in OF_THE_UNIT if check in listed]
            self._checks[folder] = ",".join(["-*", "clang-diagnostic-*", *chosen])
        return self._checks[folder]

    def _run(self, unit, source, *options):
        """Returns clang-tidy's output, None if it has no remark."""
        command = ["clang-tidy", "--quiet", *options, source, "--", *unit.arguments]
        with self.lock:
            self.runs += 1
        try:
            result = subprocess.run(
                command,
                cwd=unit.directory,
                stdin=subprocess.DEVNULL,
                capture_output=True,
                text=True,
                errors="replace",
                timeout=SECONDS,
                check=False,
            )
        except subprocess.TimeoutExpired:
            return f"{source}:1:1: error: not read within {SECONDS} s [clang-diagnostic-error]\n"
        if result.returncode == 0 and not re.search(r": (warning|error): ", result.stdout):
            return None
        return result.stdout or result.stderr or f"clang-tidy ended with {result.returncode}\n"

    def files_told(self):
        """Returns the files whose remarks have been printed."""
        with self.lock:
            return {os.path.normpath(REMARK.match(line)[1]) for line in self.said}

    def _tell(self, output):
        """Prints remarks; those on a header only once."""
        with self.lock:
            self.failed = True
            lines = output.splitlines()
            told = not any(map(REMARK.match, lines))
            for line in lines:
                if REMARK.match(line):
                    told = line not in self.said
                    self.said.add(line)
                if told:
                    print(line, flush=True)


def cpu_seconds():
    used = resource.getrusage(resource.RUSAGE_CHILDREN)
    return used.ru_utime + used.ru_stime
