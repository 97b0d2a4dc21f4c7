# SPDX-License-Identifier: MIT
"""How each file compiles, which files it reads, and a key that changes with them."""

import functools
import hashlib
import json
import os
import re
import shlex
import subprocess

CONFIGURATION = ".clang-tidy"
# Flags for code generation and linking differ between targets, and do not matter to clang-tidy.
GENERATION = re.compile(
    r"-(f(PIC|PIE|cf-|stack-|visibility|sanitize|no-sanitize|no-omit)|g\d?$"
    r"|[DU]_FORTIFY_SOURCE|DBOOST_\w*LINK$|DBOOST_ALL_NO_LIB$)"
)
ERROR = re.compile(
    r"^(?:Error while scanning dependencies for (.*):|.*fatal error: '(.*)' file not found)$",
    re.MULTILINE,
)


class Unit:
    """A translation unit: its source, how it compiles and, after scan(), which files it reads."""

    def __init__(self, source, directory, compiler, arguments):
        self.source = source
        self.directory = directory
        self.compiler = compiler
        self.arguments = arguments
        self.inputs = [source]
        self.scanned = False
        self.missing = None

    def meaning(self):
        """Returns the flags that matter to clang-tidy."""
        return tuple(a for a in self.arguments if not GENERATION.match(a))


class Project:
    """A working tree, the folder of its configured build and how its files compile."""

    def __init__(self, root, build):
        self.root = root
        self.build = build
        self.units = []
        database = os.path.join(build, "compile_commands.json")
        with open(database, encoding="utf-8") as file:
            known = set()
            for entry in json.load(file):
                unit = Unit(entry["file"], entry["directory"], *_command(entry))
                way = (unit.source, *unit.meaning())
                if unit.source.endswith(".cpp") and way not in known:
                    known.add(way)
                    self.units.append(unit)

    def path(self, name):
        return os.path.join(self.root, name)

    def name(self, path):
        """Returns a path as git spells it, None outside the working tree."""
        name = os.path.relpath(path, self.root)
        return None if name.startswith("..") else name

    def is_made(self, unit):
        """Returns true if the unit was made here to include a header, and is not in the repository."""
        return unit.source.startswith(self.path("build") + os.sep)

    def add(self, source, like):
        """Adds a unit for a file that no target compiles, with the flags of a unit in a near folder."""

        def kinship(unit):
            return len(os.path.commonprefix([os.path.dirname(unit.source), os.path.dirname(like)]))

        relative = max(self.units, key=kinship)
        unit = Unit(source, relative.directory, relative.compiler, relative.arguments)
        self.units.append(unit)
        return unit

    def scan(self, units, scanner, jobs, folder):
        """Finds out which files each unit reads. A generated file that does not exist yet counts as empty."""
        self._scan(units, scanner, jobs, folder)
        absent = os.path.join(folder, "absent")
        incomplete = [unit for unit in units if unit.missing]
        for unit in incomplete:
            stand_in = os.path.join(absent, unit.missing)
            os.makedirs(os.path.dirname(stand_in), exist_ok=True)
            with open(stand_in, "wb"):
                pass
        self._scan(incomplete, scanner, jobs, folder, "-I", absent)

    @staticmethod
    def _scan(units, scanner, jobs, folder, *options):
        if not units:
            return
        names = {f"unit-{number}": unit for number, unit in enumerate(units)}
        database = os.path.join(folder, "scanned.json")
        with open(database, "w", encoding="utf-8") as file:
            json.dump([_entry(name, unit, options) for name, unit in names.items()], file)
        result = subprocess.run(
            [scanner, f"-compilation-database={database}", "-j", str(jobs)],
            capture_output=True,
            text=True,
            check=False,
        )
        errors = ERROR.findall(result.stderr)
        missing = {s: name for (s, _), (_, name) in zip(errors, errors[1:]) if s and name}
        for unit in units:
            unit.missing = unit.missing if options else missing.get(unit.source)
            unit.inputs = [unit.source]
            unit.scanned = False
        for rule in result.stdout.replace("\\\n", " ").splitlines():
            target, _, read = rule.partition(": ")
            paths = re.findall(r"(?:\\.|\S)+", read)
            names[target].inputs = sorted(set(map(_real_path, paths)))
            names[target].scanned = True

    def configurations(self, unit):
        """Returns the configurations of clang-tidy that apply to the files that the unit reads."""
        found = set()
        for path in unit.inputs + [unit.source]:
            found.update(self._configurations_above(os.path.dirname(path)))
        return sorted(found)

    def own_configurations(self, unit):
        return self._configurations_above(os.path.dirname(unit.source))

    @functools.lru_cache(maxsize=None)
    def _configurations_above(self, folder):
        if self.name(folder) is None:
            return ()
        here = os.path.join(folder, CONFIGURATION)
        above = () if folder == self.root else self._configurations_above(os.path.dirname(folder))
        return (here, *above) if os.path.isfile(here) else above

    def kind(self, unit):
        """Returns the unit's kind: units of one kind can be read together."""
        return self.own_configurations(unit), unit.meaning()

    def key(self, unit, version):
        """Returns a key of everything that decides clang-tidy's output, independent of the tree's path."""
        total = hashlib.sha256(version.encode())
        total.update("\0".join(unit.arguments).replace(self.root, ".").encode())
        for path in [unit.source, *unit.inputs, *self.configurations(unit)]:
            total.update(f"\n{self.name(path) or path} {self._digest(path)}".encode())
        return total.hexdigest()

    @functools.lru_cache(maxsize=None)
    def _digest(self, path):
        if self.name(path) is None:
            # A system file changes only with its package.
            of_file = os.stat(path)
            return f"{of_file.st_size} {of_file.st_mtime_ns}"
        with open(path, "rb") as file:
            content = file.read()
        # Files that CMake writes contain the tree's path.
        return hashlib.sha256(content.replace(self.root.encode(), b".")).hexdigest()


@functools.lru_cache(maxsize=None)
def _real_path(escaped):
    """Returns the file that a make rule names."""
    return os.path.realpath(re.sub(r"\\(.)|\$(\$)", r"\1\2", escaped))


def _command(entry):
    """Returns the compiler, and its arguments without names of files."""
    words = entry.get("arguments") or shlex.split(entry["command"])
    arguments = []
    following = iter(words[1:])
    for word in following:
        if word == "-o":
            next(following)
        elif word != "-c" and os.path.join(entry["directory"], word) != entry["file"]:
            arguments.append(word)
    return words[0], arguments


def _entry(name, unit, options):
    return {
        "directory": unit.directory,
        "file": unit.source,
        "arguments": [unit.compiler, *unit.arguments, *options, "-o", name, "-c", unit.source],
    }
