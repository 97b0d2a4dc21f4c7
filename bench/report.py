# SPDX-License-Identifier: MIT
"""The table of results with limits and verdicts, and its page, which has rows of several systems."""

import datetime
import math
import subprocess
import sys

SYSTEM = "System"


def show(limit):
    if limit is None:
        return ""
    return f"≤ {limit:,}" if isinstance(limit, int) else f"≤ {limit:.2f}"


def exponent(values):
    """The slope of the straight line through the logarithms: {size: value}."""
    points = [(math.log(size), math.log(value)) for size, value in values.items()]
    x_mean = sum(x for x, _ in points) / len(points)
    y_mean = sum(y for _, y in points) / len(points)
    return (sum((x - x_mean) * (y - y_mean) for x, y in points)
            / sum((x - x_mean) ** 2 for x, _ in points))


def output_of(*command):
    return subprocess.run(command, capture_output=True, text=True, check=True).stdout.strip()


def versions():
    """Returns the date, the commit, and the versions of what is measured."""
    return (f"{datetime.date.today()}, commit {commit()}, libgit2 "
            f"{output_of('pkg-config', '--modversion', 'libgit2')}, gcc "
            f"{output_of('g++', '-dumpfullversion')}, git {output_of('git', '--version').split()[-1]}")


def system(release="/etc/os-release"):
    """Returns the name and the version of this system, e.g. "Debian 12"."""
    with open(release, encoding="utf-8") as file:
        values = dict(line.rstrip().split("=", 1) for line in file if "=" in line)
    return f"{values['NAME']} {values.get('VERSION_ID', '')}".replace('"', "").replace(
        " GNU/Linux", "").strip()


def commit():
    """Returns the abbreviated id of HEAD, with a plus sign if a tracked file differs from it, except
    what the measurements themselves write."""
    head = output_of("git", "rev-parse", "--short", "HEAD")
    changed = output_of("git", "status", "--porcelain", "--untracked-files=no", "--", ":/",
                        ":(top,exclude)docs/performance.md", ":(top,exclude)docs/performance.svg")
    return head + "+" if changed else head


class Table:
    def __init__(self, *columns):
        self._columns = columns
        self._rows = []
        self.failed = []

    def row(self, what, values, limit=None, measured=()):
        """Adds a row. If there is a limit, no number of `measured` may be above it."""
        verdict = ""
        if limit is not None:
            passed = all(number <= limit for number in measured)
            verdict = "pass" if passed else "**fail**"
            if not passed:
                self.failed.append(what)
        self._rows.append([what, *values, show(limit), verdict])

    def __str__(self):
        return "\n".join(["| " + " | ".join(cells) + " |"
                          for cells in [self._header(), self._rule(), *self._rows]])

    def _header(self):
        return [*self._columns, "Limit", "Verdict"]

    def _rule(self):
        return ["---", *["---:"] * (len(self._columns) - 1), "---:", "---"]

    def beside(self, system_name, earlier):
        """Returns the table with a column for the system, and after each row the rows of other systems
        about the same: {(header, what): {system: cells}}."""
        header, rule = self._header(), self._rule()
        lines = [[header[0], SYSTEM, *header[1:]], [rule[0], "---", *rule[1:]]]
        for what, *values in self._rows:
            rows = {**earlier.get((tuple(header), what), {}), system_name: values}
            lines += [[what, name, *rows[name]] for name in sorted(rows)]
        return "\n".join("| " + " | ".join(cells) + " |" for cells in lines)


def read_rows(text):
    """Returns the rows of the tables in the text: {(header, what): {system: cells}}."""
    rows = {}
    header = None
    for line in text.splitlines():
        cells = [cell.strip() for cell in line[1:-1].split("|")] if line.startswith("|") else None
        if cells is None:
            header = None
        elif header is None:
            header = cells
        elif SYSTEM in header[1:2] and not cells[0].startswith("---"):
            key = ((header[0], *header[2:]), cells[0])
            rows.setdefault(key, {})[cells[1]] = cells[2:]
    return rows


def read_runs(text):
    """Returns what the text has about the runs: {system: description}."""
    lines = (line[2:].split(": ", 1) for line in text.splitlines() if line.startswith("- "))
    return {line[0]: line[1] for line in lines if len(line) == 2}


def write_into(page, description, tables, name="bench", system_name=None):
    """Writes the tables between the page's markers of this name, in place of those of this system.
    Rows of other systems stay beside them. Returns the names of all systems."""
    system_name = system_name or system()
    begin, end = f"<!-- {name}:begin -->", f"<!-- {name}:end -->"
    with open(page, encoding="utf-8") as file:
        content = file.read()
    if content.count(begin) != 1 or content.count(end) != 1:
        sys.exit(f"bench: {page} must have each marker of the table exactly once")
    before, rest = content.split(begin)
    text, after = rest.split(end)
    rows = read_rows(text)
    runs = {**read_runs(text), system_name: description}
    listed = "\n".join(f"- {known}: {runs[known]}" for known in sorted(runs))
    text = "\n\n".join([listed, *(table.beside(system_name, rows) for table in tables)])
    with open(page, "w", encoding="utf-8") as file:
        file.write(f"{before}{begin}\n{text}\n{end}{after}")
    return sorted(runs)
