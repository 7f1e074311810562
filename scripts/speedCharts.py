# SPDX-License-Identifier: MIT
"""Draws the charts of docs/speed.md from the data, for light and for dark pages."""
import math

import matplotlib

matplotlib.use("svg")
import matplotlib.pyplot as plt
from matplotlib.lines import Line2D
from matplotlib.patches import Patch

from speedData import FAMILIES, ROOT, SIZES, read

IMAGES = ROOT / "docs/images"
# Told apart without seeing colours, too: by lightness, and in the curves by the line.
THEMES = {
    "light": {"ink": "#24292f", "grid": "#d0d7de", "ours": "#0550ae", "peer": "#d4a72c", "limit": "#6e7781"},
    "dark": {"ink": "#e6edf3", "grid": "#3d444d", "ours": "#58a6ff", "peer": "#bb8009", "limit": "#8b949e"},
}
facts, rows = read()
best = next(iter(rows))[0]


def use(theme):
    colours = THEMES[theme]
    plt.rcdefaults()
    plt.rcParams.update({
        "svg.fonttype": "none", "svg.hashsalt": "speed", "font.family": "sans-serif", "font.size": 9,
        "text.color": colours["ink"], "axes.labelcolor": colours["ink"], "axes.edgecolor": colours["grid"],
        "xtick.color": colours["ink"], "ytick.color": colours["ink"], "grid.color": colours["grid"],
        "axes.spines.top": False, "axes.spines.right": False, "savefig.transparent": True})
    return colours


def save(figure, name, theme):
    figure.savefig(IMAGES / f"{name}-{theme}.svg", metadata={"Date": None})
    plt.close(figure)


NAMES = {"ours": "raster", "peer": "fastest public library", "limit": "limit: memcpy, memset"}


def legend(figure, colours, height, make):
    """One for all panels, below them; `make` makes the sign of a colour."""
    figure.get_layout_engine().set(rect=(0, height, 1, 1 - height))
    signs = [Line2D([], [], color=colours["limit"], linestyle="--") if who == "limit" else make(colours[who])
             for who in NAMES]
    figure.legend(signs, NAMES.values(), loc="lower center", ncol=3, frameon=False)


def mean(values):
    return math.exp(sum(map(math.log, values)) / len(values)) if values else None


def families(theme):
    """By family and size: the geometric mean of our rate and of the best peer's, as parts of the limit."""
    colours = use(theme)
    sizes = [size for size in SIZES if size != "4x4" and any(key[3] == size for key in rows)]
    figure, panels = plt.subplots(1, len(sizes), figsize=(10, 4.6), sharey=True, layout="constrained",
                                  squeeze=False)
    panels = panels[0]
    names = [name for name in FAMILIES if name not in ("Cursors", "Lists of rectangles", "Image files")]
    for panel, size in zip(panels, sizes):
        panel.set_title(size, fontsize=10)
        panel.set_xscale("log")
        panel.set_xlim(.01, 2)
        panel.set_xticks([.01, .1, 1], ["0.01", "0.1", "1"])
        panel.grid(axis="x")
        panel.set_axisbelow(True)
        panel.axvline(1, color=colours["limit"], linestyle="--")
        for at, family in enumerate(names):
            mine = [row for (level, bits, _, of), row in rows.items()
                    if (level, bits, of) == (best, 64, size) and row.family() == family
                    and row.peers and row.limit and row.ours]
            if not mine:
                continue
            ours = mean([row.of_limit() for row in mine])
            peer = mean([row.limit / row.peers[row.peer()] for row in mine])
            panel.barh(at - .2, ours, .38, color=colours["ours"])
            panel.barh(at + .2, peer, .38, color=colours["peer"])
    panels[0].set_yticks(range(len(names)), names)
    panels[0].invert_yaxis()
    legend(figure, colours, .07, lambda colour: Patch(color=colour))
    save(figure, "speed-families", theme)


def curve(panel, job, pick, colours, style="-"):
    """One job over its sizes; `pick` gives a size's place on the axis, or None."""
    mine = sorted((pick(*map(int, row.size.split("x"))), row) for (level, bits, name, _), row in rows.items()
                  if (level, bits, name) == (best, 64, job) and pick(*map(int, row.size.split("x"))))
    places = [place for place, _ in mine]
    lines = {"limit": lambda row: row.rate(row.limit), "ours": lambda row: row.rate(row.ours),
             "peer": lambda row: row.rate(row.peers[row.peer()]) if row.peers else None}
    for who, rate in lines.items():
        panel.plot(places, [rate(row) or math.nan for _, row in mine], color=colours[who],
                   linestyle="--" if who == "limit" else style, marker=".", markersize=4)


def growth(theme, name, picks, x_label):
    colours = use(theme)
    jobs = list(dict.fromkeys(key[2] for key in rows if key[2].startswith("growth/")))
    if not jobs:
        return
    columns = 4  # as many jobs as fill them: twelve
    figure, panels = plt.subplots(math.ceil(len(jobs) / columns), columns, figsize=(10, 9), sharex=True,
                                  layout="constrained", squeeze=False)
    for panel, job in zip(panels.flat, jobs):
        panel.set_title(job.removeprefix("growth/"), fontsize=9)
        panel.set_xscale("log", base=2)
        panel.set_yscale("log")
        panel.grid(alpha=.5)
        for pick, style in picks:
            curve(panel, job, pick, colours, style)
    for panel in panels[-1]:
        panel.set_xlabel(x_label)
    for panel in panels[:, 0]:
        panel.set_ylabel("million pixels/s")
    legend(figure, colours, .04, lambda colour: Line2D([], [], color=colour, marker="."))
    save(figure, name, theme)


def square(width, height):
    return width if width == height else None


def row_of(width, height):
    return width if height == 1 and width > 1 else None


def column_of(width, height):
    return height if width == 1 and height > 1 else None


for old in IMAGES.glob("speed-*.svg"):
    old.unlink()
for theme in THEMES:
    families(theme)
    growth(theme, "speed-growth", [(square, "-")], "side of a square, in pixels")
    growth(theme, "speed-lines", [(row_of, "-"), (column_of, ":")], "pixels in a row (—) or column (···)")
