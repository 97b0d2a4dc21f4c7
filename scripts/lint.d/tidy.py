#!/usr/bin/env python3
# SPDX-License-Identifier: MIT
"""Runs clang-tidy on what a change can affect. scripts/lint calls this in the folder it checks."""

import argparse
import collections
import concurrent.futures
import math
import os
import pathlib
import re
import shutil
import subprocess
import sys
import time

sys.dont_write_bytecode = True
sys.path.insert(0, str(pathlib.Path(__file__).resolve().parent))

import reading  # noqa: E402
import units as units_module  # noqa: E402

SOURCES = (".cpp", ".hpp")


def fail(message):
    raise SystemExit(f"scripts/lint: {message}")


def configure(build):
    log = os.path.join(os.path.dirname(build), "logs", "editor-configure.log")
    os.makedirs(os.path.dirname(log), exist_ok=True)
    with open(log, "wb") as file:
        command = ["cmake", "--preset", "editor"]
        done = subprocess.run(command, stdout=file, stderr=file, check=False)
    if done.returncode != 0:
        with open(log, encoding="utf-8", errors="replace") as file:
            print(file.read())
        fail("the preset editor can't be configured")


def git_lines(command, *arguments):
    listed = subprocess.run(
        ["git", command, "-z", *arguments], capture_output=True, text=True, check=False
    )
    if listed.returncode != 0:
        fail(listed.stderr.strip())
    return {name for name in listed.stdout.split("\0") if name}


def find_files():
    names = git_lines("ls-files", "--cached", "--others", "--exclude-standard")
    return {name for name in names if os.path.isfile(name)}


def find_changed(base):
    """Returns the files that differ from the base, including deleted ones."""
    changed = git_lines("diff", "--name-only", "--no-renames", base, "--")
    return changed | git_lines("ls-files", "--others", "--exclude-standard")


def add_configured(changed, files):
    """Adds the files to which a changed configuration of clang-tidy applies."""
    folders = [
        os.path.dirname(name)
        for name in changed
        if os.path.basename(name) == units_module.CONFIGURATION
    ]
    applied = {
        name
        for name in files
        for folder in folders
        if name.endswith(SOURCES) and (not folder or name.startswith(folder + "/"))
    }
    return changed | applied


class Selection:
    """The units to read: changed ones, each by itself, and those that include a changed file.

    A unit is also read if it is unknown what it includes.
    """

    def __init__(self, project, changed, is_all):
        self.changed, self.affected = [], []
        paths = {project.path(name) for name in changed}
        for unit in project.units:
            if not project.is_made(unit) and (is_all or unit.source in paths):
                self.changed.append(unit)
            elif is_all or not unit.scanned or not paths.isdisjoint(unit.inputs):
                self.affected.append(unit)


def add_unread(project, files, changed, folder):
    """Adds a unit for each changed file that no unit reads; a header gets a unit that includes it."""
    read = {path for unit in project.units for path in [unit.source, *unit.inputs]}
    added = []
    for name in sorted(files & changed):
        path = project.path(name)
        if name.endswith(SOURCES) and path not in read:
            source = path
            if name.endswith(".hpp"):
                source = os.path.join(folder, name + ".cpp")
                os.makedirs(os.path.dirname(source), exist_ok=True)
                with open(source, "w", encoding="utf-8") as file:
                    file.write(f'#include "{path}"\n')
            added.append(project.add(source, path))
    return added


def generate_missing(project, selected):
    """Builds generated files that units include."""
    missing = {unit.missing for unit in selected if unit.missing}
    if not missing:
        return
    targets = subprocess.run(
        ["ninja", "-C", project.build, "-t", "targets", "all"],
        capture_output=True,
        text=True,
        check=False,
    ).stdout
    for name in sorted(missing):
        made = re.search(rf"^((?:.*/)?{re.escape(name)}): CUSTOM_COMMAND", targets, re.MULTILINE)
        if made:
            print(f"   builds {made[1]}, which is included", flush=True)
            subprocess.run(
                ["cmake", "--build", project.build, "--target", made[1]],
                stdout=subprocess.DEVNULL,
                check=False,
            )


def plan(project, reader, selection, jobs):
    """Returns the tasks, the longest first, and how many units are known to be clean."""
    together = collections.defaultdict(list)
    alone = []
    known = 0
    for unit, ways in [(unit, (reading.ALONE, reading.TOGETHER)) for unit in selection.changed] + [
        (unit, (reading.TOGETHER,)) for unit in selection.affected
    ]:
        reader.remember(unit)
        wanted = [way for way in ways if not reader.is_clean(unit, way)]
        known += not wanted
        if reading.TOGETHER in wanted:
            together[project.kind(unit)].append(unit)
        if reading.ALONE in wanted:
            alone.append(unit)
    total = sum(map(len, together.values()))
    limit = max(3, min(reading.MOST_TOGETHER, math.ceil(total / jobs)))
    groups = []
    for of_kind in together.values():
        # A unit for a header adds little to what the others include.
        size = sum(0.25 if project.is_made(unit) else 1 for unit in of_kind)
        count = math.ceil(size / limit)
        groups += [of_kind[number::count] for number in range(count)]
    groups.sort(key=len, reverse=True)
    # A unit that is alone in a group is read once, with all checks.
    whole = {group[0] for group in groups if len(group) == 1}
    tasks = [(reader.read_together, group) for group in groups]
    tasks += [(reader.read_alone, unit) for unit in alone if unit not in whole]
    return tasks, known


def parse_arguments():
    parser = argparse.ArgumentParser(prog="scripts/lint.d/tidy.py", description=__doc__)
    add = parser.add_argument
    add("--base", metavar="COMMIT", help="reads what has changed since this commit (default: everything)")
    add("--no-cache", action="store_true", help="also reads what is known to be clean")
    return parser.parse_args()


def cache_folder():
    home = os.environ.get("XDG_CACHE_HOME") or os.path.join(os.path.expanduser("~"), ".cache")
    return os.path.join(home, "vclink-lint") if os.path.isabs(home) else None


def main():
    arguments = parse_arguments()
    begin = time.monotonic()
    root = os.path.realpath(os.getcwd())
    build = os.path.join(root, "build", "editor")
    folder = os.path.join(root, "build", "lint")
    jobs = len(os.sched_getaffinity(0))
    tidy = shutil.which("clang-tidy")
    scanner = os.path.join(os.path.dirname(os.path.realpath(tidy)), "clang-scan-deps")
    if not os.path.isfile(scanner):
        fail(f"{scanner} is missing: run scripts/setup")
    configure(build)
    os.makedirs(folder, exist_ok=True)

    project = units_module.Project(root, build)
    files = find_files()
    changed = files
    if arguments.base:
        changed = add_configured(find_changed(arguments.base), files)
    project.scan(project.units, scanner, jobs, folder)
    added = add_unread(project, files, changed, os.path.join(folder, "headers"))
    project.scan(added, scanner, jobs, folder)
    selection = Selection(project, changed, arguments.base is None)
    selected = selection.changed + selection.affected
    generate_missing(project, selected)
    project.scan([unit for unit in selected if unit.missing], scanner, jobs, folder)

    version = subprocess.check_output(["clang-tidy", "--version"], text=True)
    clean = reading.Clean(None if arguments.no_cache else cache_folder())
    reader = reading.Reader(project, clean, version, os.path.join(folder, "units"))
    tasks, known = plan(project, reader, selection, jobs)
    since = f"since {arguments.base}" if arguments.base else "in all"
    print(
        f"== clang-tidy: {len(selection.changed)} units changed {since}, "
        f"{len(selection.affected)} include what has; {known} are known to be clean",
        flush=True,
    )
    with concurrent.futures.ThreadPoolExecutor(jobs) as executor:
        for task in [executor.submit(work, subject) for work, subject in tasks]:
            task.result()
    clean.forget_old()
    print(
        f"   {len(selected) - known} read in {reader.runs} runs: "
        f"{time.monotonic() - begin:.0f} s, {reading.cpu_seconds():.0f} s of processors",
        flush=True,
    )
    return 1 if reader.failed else 0


if __name__ == "__main__":
    sys.exit(main())
