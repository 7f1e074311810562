# SPDX-License-Identifier: MIT
"""Writes what README and docs/speed.md say in figures, and a page for each level, from the data.

In README and docs/speed.md only what stands between "<!-- speed: NAME -->" and "<!-- end -->" is
replaced; the rest is written by hand.
"""
import re
import statistics
from fnmatch import fnmatchcase

from speedData import DATA, FAMILIES, LEVEL_WITH, ROOT, SIZES, read

DETAIL = {"avx3": "AVX-512", "avx2": "AVX2", "sse4": "SSE4"}
# The jobs of README, the same ones whatever they give.
SHOWN = {
    "convert/32-to-16": "32 bits to 5-6-5",
    "blend/over-32": "blending, \"over\", on 32 bits",
    "blend/over-16": "blending, \"over\", onto 5-6-5",
    "scale/bilinear-32-x1.5": "enlarging smoothly by 1.5",
    "yuv/YUY2-to-32": "video, YUY2 to 32 bits",
}

NOT_MEASURED = "Not measured in this run."

facts, rows = read()
levels = [name for name in DETAIL if any(key[0] == name for key in rows)]
best = levels[0]


def number(value):
    """Three digits are seen in the rounds."""
    return f"{float(f'{value:.3g}'):,.10g}" if value else "-"


def ratio(value):
    return f"{value:.2f}" if value is not None else "-"


def is_unheld(row):
    """Whether the best peer could not be held to the row's level: docs/speed.md says why."""
    peer = row.peer()
    copies = peer == "OpenCV" and row.job.startswith("copy/") or peer == "swscale" and row.job == "convert/32-to-32"
    return row.level == "sse4" and peer.startswith("Qt") or row.level in ("sse4", "avx2") and copies


def peer_of(row):
    """The best peer's name, with a plus where it could not be held to the row's level."""
    return row.peer() + ("+" if is_unheld(row) else "")


def table(head, body, right=0):
    """The columns from `right` on are numbers."""
    if not body:
        return NOT_MEASURED
    rule = ["---" if at < right else "---:" for at in range(len(head))]
    return "\n".join("| " + " | ".join(line) + " |" for line in [head, rule, *body])


def of(level, bits=64):
    """The rows that count: those of a family."""
    return [row for row in rows.values() if row.level == level and row.bits == bits and row.family()]


def with_peer(level):
    return [row for row in of(level) if row.of_peer() is not None]


def not_behind(level):
    return [row for row in with_peer(level) if row.of_peer() >= LEVEL_WITH]


def reasons(name):
    """The lines of a file of docs/speed: patterns of level, job and size, and the words."""
    known = []
    for line in (DATA.parent / name).read_text(encoding="utf-8").splitlines():
        if line and not line.startswith("#"):
            where, words = line.split(": ", 1)
            known.append((where.split(), words))
    return known


def reason(rows_behind, known):
    """The words for a job at a size that is behind at some levels."""
    found = {}
    for row in rows_behind:
        words = next((words for patterns, words in known
                      if all(map(fnmatchcase, (row.level, row.job, row.size), patterns))), None)
        if words:
            found.setdefault(words, []).append(row.level)
    return "; ".join(words if len(at) == len(rows_behind) else f"{', '.join(at)}: {words}"
                     for words, at in found.items()) or "not profiled"


def machine():
    return table(["what was measured on", ""], list(facts.items()), 2)


def summary():
    body = []
    for level in levels:
        ratios = [row.of_peer() for row in with_peer(level)]
        body.append([f"[{level}](speed/{level}.md)", str(len(ratios)),
                     str(sum(r > 1 / LEVEL_WITH for r in ratios)),
                     str(sum(LEVEL_WITH <= r <= 1 / LEVEL_WITH for r in ratios)),
                     str(sum(r < LEVEL_WITH for r in ratios)), ratio(statistics.median(ratios))])
    return table(["level", "rows with a peer", "ahead", "level (3 %)", "behind", "median ratio"], body, 1)


def table_of_behind(behind, least, known, words=lambda row: ""):
    """The jobs and sizes that are below `least` at some level, the worst first, with the reasons: `behind` gives
    pairs of a ratio and a row for a level, `words` what stands beside a ratio."""
    found = {}
    for level in levels:
        for value, row in behind(level):
            if value < least:
                found.setdefault((row.job, row.size), {})[level] = value, row
    cell = lambda at, level: f"{ratio(at[level][0])} {words(at[level][1])}".strip() if level in at else ""
    worst = lambda item: min(value for value, _ in item[1].values())
    body = [[job, size, *(cell(at, level) for level in levels), reason([row for _, row in at.values()], known)]
            for (job, size), at in sorted(found.items(), key=worst)]
    return table(["job", "size", *levels, "why"], body, 3 + len(levels)) if body else "None."


def lost():
    return table_of_behind(lambda level: [(row.of_peer(), row) for row in with_peer(level)], LEVEL_WITH,
                           reasons("reasons.txt"), peer_of)


def picture(name, words):
    return f"""<picture>
  <source media="(prefers-color-scheme: dark)" srcset="images/{name}-dark.svg">
  <img src="images/{name}-light.svg" alt="{words}">
</picture>"""


def families():
    return picture("speed-families", "Bars by family and size: the rates of this library and of the fastest "
                   "public library as parts of the limit")


def growth():
    if not any(key[2].startswith("growth/") for key in rows):
        return NOT_MEASURED
    return (picture("speed-growth", "Twelve small charts: the rate over the side of a square, of this library, "
                    "the fastest public library and the limit")
            + "\n\nSingle rows and single columns:\n\n"
            + picture("speed-lines", "Twelve small charts: the rate over the length of a single row and of a "
                      "single column"))


def calls():
    sizes = ["0x0", "1x1", "4x4", "16x16"]
    jobs = dict.fromkeys(row.job for row in rows.values() if row.job.startswith("call/"))
    time = lambda job, size, bits: rows.get((best, bits, job, size))
    cell = lambda row: f"{row.ours:.0f}" if row else "-"
    body = [[job[5:]] + [f"{cell(time(job, s, 64))} / {cell(time(job, s, 32))}" for s in sizes]
            for job in jobs]
    return table(["call", "empty", *sizes[1:]], body, 1)


def scalar():
    body = [[row.job[6:], row.size, number(row.rate(row.ours)), ratio(row.of_limit()),
             ratio(row.of_peer())] for row in of("scalar") if row.peers]
    if not body:
        return NOT_MEASURED
    worst = [line for line in body if float(line[4]) < LEVEL_WITH]
    ahead = f"{len(body) - len(worst)} of {len(body)} rows are ahead of or level with pixman's portable code."
    return ahead + ("\n\n" + table(["blend", "size", "Mpx/s", "of limit", "of pixman"], worst, 2) if worst else "")


NARROW = .8  # below this part of the 64-bit rate a row of the 32-bit build wants a reason
SMALL = ("16x16", "4x4", "1x1")


def narrow_pairs(level):
    """The parts of the 64-bit rates that the rows of the 32-bit build reach."""
    wide = {(row.job, row.size): row for row in of(level)}
    return [(wide[row.job, row.size].ours / row.ours, row) for row in of(level, 32)
            if row.ours and (row.job, row.size) in wide and wide[row.job, row.size].ours]


def narrow():
    """The 32-bit build beside the 64-bit one."""
    body = []
    for level in levels:
        pairs = narrow_pairs(level)
        if not pairs:
            continue
        low = [pair for pair in pairs if pair[0] < NARROW]
        body.append([level, str(len(pairs)), ratio(statistics.median(p[0] for p in pairs)), str(len(low)),
                     str(sum(row.size not in SMALL for _, row in low))])
    return table(["level", "rows", "median of 32-bit / 64-bit", f"below {NARROW}", "of these above 16x16"], body, 1)


def narrow_low():
    return table_of_behind(lambda level: [pair for pair in narrow_pairs(level) if pair[1].size not in SMALL], NARROW,
                           reasons("reasons32.txt"))


def narrow_calls():
    """How much more calls take in the 32-bit build."""
    more = {}
    for row in rows.values():
        wide = rows.get((best, 64, row.job, row.size))
        if row.job.startswith("call/") and (row.level, row.bits) == (best, 32) and wide:
            more.setdefault(row.size, []).append(row.ours - wide.ours)
    if "0x0" not in more:
        return NOT_MEASURED
    middle = {size: f"{statistics.median(times):.0f}" for size, times in more.items()}
    return (f"At {best} an empty call takes {min(more['0x0']):.0f} to {max(more['0x0']):.0f} ns longer than in 64-bit "
            f"(median {middle['0x0']}), one of\n4x4 {middle['4x4']} and one of 16x16 {middle['16x16']}.")


# What is called with nothing to do, for the jobs that begin so; the first that fits.
EMPTY_CALLS = {
    "fill": "fill-32", "ropfill": "fill-32", "copy": "copy-32", "ropcopy": "ropcopy-32-xor", "tile": "tile-32-copy-64x64",
    "bits": "bits-32", "convert": "convert-32-to-16", "compare": "compare-32-equal", "scale/box": "scale-box-32-x0.5",
    "scale": "scale-bilinear-32-x1.5", "yuv": "yuv-YUY2-to-32", "blend": "blend-over-32"}


def longer_call(job):
    """How much longer an empty call of a job's kind takes in the 32-bit build, in ns."""
    name = next((call for start, call in EMPTY_CALLS.items() if job.startswith(start)), None)
    both = [rows.get((best, bits, f"call/{name}", "0x0")) for bits in (32, 64)]
    return both[0].ours - both[1].ours if all(both) else None


def narrow_small(level):
    """The small rows of the 32-bit build that are below NARROW: where their time goes."""
    body = []
    for part, row in sorted(narrow_pairs(level), key=lambda pair: pair[0]):
        if part >= NARROW or row.size not in SMALL:
            continue
        wide = row.ours * part
        call = longer_call(row.job)
        body.append([row.job, row.size, ratio(part), f"{row.ours:.1f}", f"{wide:.1f}",
                     *(("-", "-") if call is None else (f"{call:.1f}", f"{row.ours - wide - call:.1f}"))])
    return table(["job", "size", "of the 64-bit rate", "ns", "ns in 64-bit", "more for the call", "for the rest"], body, 1)


def checked():
    """What the checks add to a call."""
    sizes = ["4x4", "16x16", "64x64", "256x256"]
    found = {(row.job[8:], row.size): row for row in rows.values()
             if row.job.startswith("checked/") and (row.level, row.bits) == (best, 64)}
    body = [[job] + [f"{found[job, s].ours - found[job, s].peers['exact']:+.0f} of {found[job, s].ours:.0f}"
                     for s in sizes] for job in dict.fromkeys(job for job, _ in found)]
    return table(["call", *sizes], body, 1)


def readme():
    count, total = len(not_behind(best)), len(with_peer(best))
    body = []
    for job, words in SHOWN.items():
        row = rows.get((best, 64, job, "1920x1080"))
        if row:
            body.append([words, number(row.rate(row.ours)), ratio(row.of_limit()), row.peer().split("~")[0],
                         ratio(row.of_peer())])
    head = ["a frame of 1920x1080", "million pixels/s", "of memcpy", "fastest public library", "times its rate"]
    sizes = [size for size in SIZES if any(row.size == size for row in with_peer(best))]
    return (f"**{count} of {total} jobs ahead of or level with the fastest public library** that does the "
            f"same\nwork, in sizes from {sizes[-1]} to {sizes[0]}, on one core of: {facts['processor']}.\n\n"
            + table(head, body, 1))


def cell(row, bits):
    if row is None or not row.ours:
        return "-"
    words = [number(row.rate(row.ours)), ratio(row.of_limit())]
    if bits == 64:
        words.append(f"{ratio(row.of_peer())} {peer_of(row)}" if row.peers else "-")
    else:
        wide = rows.get((row.level, 64, row.job, row.size))
        words.append(ratio(wide.ours / row.ours if wide else None))
    return " · ".join(words)


def family_tables(level, bits):
    text = []
    for family in FAMILIES:
        mine = [row for row in of(level, bits) if row.family() == family]
        usual = dict.fromkeys(row.job for row in mine if row.size in SIZES)
        other = [row for row in mine if row.job not in usual]
        sizes = [size for size in SIZES if any(row.size == size for row in mine)]
        body = [[job] + [cell(rows.get((level, bits, job, size)), bits) for size in sizes] for job in usual]
        if body:
            text.append(f"### {family}\n\n" + table(["job", *sizes], body, 1))
        if other:
            title = "" if body else f"### {family}\n\n"
            text.append(title + table(["job", "of its own size"], [[r.job, cell(r, bits)] for r in other], 1))
    return "\n\n".join(text)


def level_page(level):
    return f"""# Speed at level {level} ({DETAIL[level]})

Made by `scripts/speed`. [The page about speed](../speed.md) says what was measured on, what the marks after
a peer's name mean, and how the peers are held to this level. Rates are in million pixels a second (lists of
rectangles: million calls).

## 64-bit

A cell: rate · of the limit · of the best peer, and who that is.

{family_tables(level, 64)}

## 32-bit

A cell: rate · of the limit · of the 64-bit rate.

{family_tables(level, 32)}

### Rows of 16x16 and less below {NARROW} of the 64-bit rate

What they take longer: an empty call of their kind (for `-` none was measured), which is arguments on the stack
and the way to the library's data, and the rest: mostly constants and counters that seven general and eight
vector registers do not hold.

{narrow_small(level)}
"""


def replace(path, parts):
    text = path.read_text(encoding="utf-8")
    for name, make in parts.items():
        pattern = re.compile(rf"(<!-- speed: {name} -->\n).*?(\n?<!-- end -->)", re.DOTALL)
        text, count = pattern.subn(lambda found: f"{found[1]}{make()}\n<!-- end -->", text)
        if count != 1:
            raise SystemExit(f"{path}: {count} places for {name}")
    path.write_text(text, encoding="utf-8")


replace(ROOT / "README.md", {"figures": readme})
replace(ROOT / "docs/speed.md", {
    "machine": machine, "summary": summary, "families": families, "lost": lost, "growth": growth,
    "calls": calls, "checked": checked, "scalar": scalar, "narrow": narrow,
    "narrow-low": narrow_low, "narrow-calls": narrow_calls})
for page in DETAIL:
    file = DATA.parent / f"{page}.md"
    if page in levels:
        file.write_text(level_page(page), encoding="utf-8")
    else:
        file.unlink(missing_ok=True)
