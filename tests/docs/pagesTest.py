# SPDX-License-Identifier: MIT
"""The pages of the tree hold together. usage: pagesTest.py ROOT

Every relative link leads to a file, and its anchor to a heading; every picture has alternative text;
docs/README.md names every page in docs; no picture in docs/images is without a page; and what
scripts/speed writes stands between its marks.
"""
import pathlib
import re
import sys

LINK = re.compile(r"(!?)\[([^\]]*)\]\(([^)\s]+)\)")
PICTURE = re.compile(r"<(?:img|source)\b[^>]*>")
SOURCE = re.compile(r'(?:src|srcset)="([^"]+)"')


def prose(page):
    """The text without the blocks of code, in which brackets are no links."""
    text = page.read_text(encoding="utf-8")
    return re.sub(r"`[^`\n]*`", "", re.sub(r"^```.*?^```", "", text, flags=re.DOTALL | re.MULTILINE))


def anchors(page):
    headings = re.findall(r"^#+ (.*)$", page.read_text(encoding="utf-8"), flags=re.MULTILINE)
    return {re.sub(r"[^\w\- ]", "", heading.lower()).replace(" ", "-") for heading in headings}


def problem(page, target):
    """What is wrong with a link, or None."""
    path, _, anchor = target.partition("#")
    file = (page.parent / path).resolve() if path else page
    if not file.exists():
        return f"no {target}"
    if anchor and file.suffix == ".md" and anchor not in anchors(file):
        return f"no heading for {target}"
    return None


def main():
    root = pathlib.Path(sys.argv[1]).resolve()
    pages = [*root.glob("*.md"), *root.glob("docs/**/*.md")]
    if len(pages) < 10:
        raise SystemExit(f"only {len(pages)} pages")
    found, targets = [], set()
    for page in pages:
        text, name = prose(page), page.relative_to(root)
        links = [(mark, words, target) for mark, words, target in LINK.findall(text)
                 if not re.match(r"[a-z]+:", target)]
        found += [f"{name}: a picture without a text: {target}" for mark, words, target in links
                  if mark and not words.strip()]
        pictures = PICTURE.findall(text)
        found += [f"{name}: a picture without a text: {tag}" for tag in pictures
                  if tag.startswith("<img") and not re.search(r'alt="[^"]+"', tag)]
        named = [target for _, _, target in links] + SOURCE.findall(" ".join(pictures))
        found += [f"{name}: {wrong}" for wrong in (problem(page, target) for target in named) if wrong]
        targets |= {(page.parent / target.partition("#")[0]).resolve() for target in named}
    index = {(root / "docs" / target).resolve() for _, _, target in LINK.findall(prose(root / "docs/README.md"))}
    found += [f"docs/README.md does not name {page.name}" for page in root.glob("docs/*.md")
              if page.name != "README.md" and page not in index]
    found += [f"no page shows docs/images/{image.name}" for image in root.glob("docs/images/*")
              if image not in targets]
    sys.exit("\n".join(found) or 0)


main()
