# SPDX-License-Identifier: MIT
"""The table of results with limits and verdicts, and its page."""

import math
import sys


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
        header = [*self._columns, "Limit", "Verdict"]
        rule = ["---", *["---:"] * (len(header) - 2), "---"]
        return "\n".join(f"| {' | '.join(cells)} |" for cells in [header, rule, *self._rows])


def write_into(page, text, name="bench"):
    """Writes the text between the page's markers of this name."""
    begin, end = f"<!-- {name}:begin -->", f"<!-- {name}:end -->"
    with open(page, encoding="utf-8") as file:
        content = file.read()
    if content.count(begin) != 1 or content.count(end) != 1:
        sys.exit(f"bench: {page} must have each marker of the table exactly once")
    before, rest = content.split(begin)
    after = rest.split(end)[1]
    with open(page, "w", encoding="utf-8") as file:
        file.write(f"{before}{begin}\n{text}\n{end}{after}")
