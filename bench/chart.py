# SPDX-License-Identifier: MIT
"""Draws what operations take as bars, readable in both colour schemes."""

import math

NAMES = ("library", "libgit2", "git")
WIDTH = 760
LEFT = 150
RIGHT = 70
TOP = 78
BAR = 14
GAP = 16

STYLE = """
text { font: 13px system-ui, sans-serif; fill: #24292f; }
.title { font-size: 15px; font-weight: 600; }
.value { font-size: 12px; }
.page { fill: #ffffff; }
.axis { stroke: #d0d7de; }
.library { fill: #0969da; }
.libgit2 { fill: #bc4c00; }
.git { fill: #6e7781; }
@media (prefers-color-scheme: dark) {
  text { fill: #e6edf3; }
  .page { fill: #0d1117; }
  .axis { stroke: #3d444d; }
  .library { fill: #4493f8; }
  .libgit2 { fill: #f0883e; }
  .git { fill: #9198a1; }
}
"""


def show(milliseconds):
    return f"{milliseconds:,.0f}" if milliseconds >= 10 else f"{milliseconds:.1f}"


class Scale:
    """A logarithmic axis from a power of ten below the values to one above them."""

    def __init__(self, values):
        self.first = math.floor(math.log10(min(values)))
        self.last = math.ceil(math.log10(max(values)))

    def place(self, value):
        share = (math.log10(value) - self.first) / (self.last - self.first)
        return LEFT + share * (WIDTH - LEFT - RIGHT)


def bars(rows, scale):
    for number, (title, values) in enumerate(rows):
        top = TOP + number * (len(NAMES) * BAR + GAP)
        yield (f'<text x="{LEFT - 10}" y="{top + 1.5 * BAR + 4:.0f}" text-anchor="end">'
               f"{title}</text>")
        for place, (name, value) in enumerate(zip(NAMES, values)):
            y = top + place * BAR
            end = scale.place(value)
            yield (f'<rect class="{name}" x="{LEFT}" y="{y}" width="{end - LEFT:.1f}" '
                   f'height="{BAR - 2}"/>')
            yield f'<text class="value" x="{end + 5:.1f}" y="{y + BAR - 3}">{show(value)}</text>'


def axis(scale, bottom):
    for power in range(scale.first, scale.last + 1):
        x = scale.place(10 ** power)
        yield f'<line class="axis" x1="{x:.1f}" y1="{TOP - 8}" x2="{x:.1f}" y2="{bottom}"/>'
        yield (f'<text class="value" x="{x:.1f}" y="{bottom + 16}" text-anchor="middle">'
               f"{10 ** power:,g}</text>")


def legend():
    for number, name in enumerate(NAMES):
        x = LEFT + number * 90
        yield f'<rect class="{name}" x="{x}" y="40" width="12" height="12"/>'
        yield f'<text x="{x + 18}" y="51">{name}</text>'


def draw(rows, title):
    """An SVG. A row is a title and the milliseconds of NAMES."""
    scale = Scale([value for _, values in rows for value in values])
    bottom = TOP + len(rows) * (len(NAMES) * BAR + GAP)
    said = "; ".join(
        f"{row}: " + ", ".join(f"{name} {show(value)}" for name, value in zip(NAMES, values))
        for row, values in rows)
    return "\n".join([
        f'<svg xmlns="http://www.w3.org/2000/svg" viewBox="0 0 {WIDTH} {bottom + 46}" '
        f'width="{WIDTH}" height="{bottom + 46}" role="img" aria-label="{title}. {said}.">',
        f"<style>{STYLE}</style>",
        # Of its own, because a page may not have the colour scheme of the system.
        '<rect class="page" width="100%" height="100%" rx="6"/>',
        f'<text class="title" x="{LEFT}" y="22">{title}</text>',
        *legend(), *axis(scale, bottom), *bars(rows, scale),
        f'<text class="value" x="{LEFT}" y="{bottom + 36}">milliseconds, logarithmic scale; '
        "shorter is faster</text>",
        "</svg>", ""])
