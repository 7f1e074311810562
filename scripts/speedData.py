# SPDX-License-Identifier: MIT
"""The figures of docs/speed/data.csv.

As a program: makes that file of the raw lines of scripts/speed. usage: speedData.py FACTS RAW
"""
import csv
import pathlib
import sys
from collections import namedtuple

ROOT = pathlib.Path(__file__).resolve().parent.parent
DATA = ROOT / "docs/speed/data.csv"
OURS, LIMIT = "raster", "limit"
HEAD = ["level", "bits", "job", "size", "units", OURS, LIMIT, "peers"]

# The prefixes of a family's jobs, in the order of the pages.
FAMILIES = {
    "Fill": ["fill", "fillalpha"],
    "Copy": ["copy"],
    "Raster operations": ["ropfill", "ropcopy"],
    "Tiling": ["tile"],
    "Bit planes": ["bits"],
    "Pixel formats": ["convert"],
    "Comparison": ["compare"],
    "Blending": ["blend"],
    "Scaling": ["scale"],
    "Video": ["yuv"],
    "Run-length blocks": ["rle"],
    "Image files": ["png", "bmp"],
    "Cursors": ["cursor"],
    "Lists of rectangles": ["rects"],
}
SIZES = ["4096x4096", "1920x1080", "256x64", "16x16", "4x4"]
LEVEL_WITH = .97  # from here on a row counts as level with its peer


class Row(namedtuple("Row", "level bits job size units ours limit peers")):
    """Times in nanoseconds of a call; 0 where there is none. peers: {name: time}."""

    def peer(self):
        """The name of the fastest peer, or None."""
        return min(self.peers, key=self.peers.get) if self.peers else None

    def rate(self, time):
        """Million units a second."""
        return self.units / time * 1000 if time else 0

    def of_limit(self):
        return self.limit / self.ours if self.limit and self.ours else None

    def of_peer(self):
        return self.peers[self.peer()] / self.ours if self.peers and self.ours else None

    def family(self):
        prefix = self.job.split("/")[0]
        return next((name for name, prefixes in FAMILIES.items() if prefix in prefixes), None)


def read():
    """The facts of the machine by name, and the rows by (level, bits, job, size)."""
    facts, rows = {}, {}
    with open(DATA, encoding="utf-8") as file:
        lines = []
        for line in file:
            if line.startswith("# "):
                name, _, value = line[2:].strip().partition(": ")
                facts[name] = value
            else:
                lines.append(line)
    for line in csv.DictReader(lines):
        peers = dict(peer.split("=") for peer in line["peers"].split(";") if peer)
        row = Row(line["level"], int(line["bits"]), line["job"], line["size"], float(line["units"]),
                  float(line[OURS] or 0), float(line[LIMIT] or 0),
                  {name: float(time) for name, time in peers.items()})
        rows[row.level, row.bits, row.job, row.size] = row
    return facts, rows


def merge(raw):
    """The best time of each contender of the raw lines, in the order in which they came."""
    rows = {}
    for line in csv.reader(raw):
        level, bits, job, size, units, contender, time = line
        times = rows.setdefault((level, bits, job, size, units), {})
        times[contender] = min(float(time), times.get(contender, float("inf")))
    return rows


def main():
    facts, raw = sys.argv[1:]
    sys.stdout.write(pathlib.Path(facts).read_text(encoding="utf-8"))
    out = csv.writer(sys.stdout, lineterminator="\n")
    out.writerow(HEAD)
    with open(raw, encoding="utf-8") as file:
        for key, times in merge(file).items():
            ours, limit = (f"{times.pop(name):.4g}" if name in times else "" for name in (OURS, LIMIT))
            out.writerow([*key, ours, limit, ";".join(f"{n}={t:.4g}" for n, t in times.items())])


if __name__ == "__main__":
    main()
