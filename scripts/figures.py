#!/usr/bin/env python3
"""figures.py PAGE BLOCK: puts what it reads from standard input into a page of docs/.

A block stands between two comment lines, "<!-- BLOCK -->" and "<!-- /BLOCK -->"; what stands outside of
the blocks is written by hand and left alone.
"""

import re
import sys


def replaced(text, block, content):
    """The page's text with the block's content changed."""
    pattern = re.compile(f"(<!-- {block} -->\n).*?(<!-- /{block} -->)", re.DOTALL)
    if not pattern.search(text):
        sys.exit(f"the page has no block {block}")
    return pattern.sub(lambda found: found.group(1) + content.strip("\n") + "\n" + found.group(2), text)


def write(page, contents):
    """Puts contents, {block: text}, into the page."""
    with open(page) as file:
        text = file.read()
    for block, content in contents.items():
        text = replaced(text, block, content)
    with open(page, "w") as file:
        file.write(text)


if __name__ == "__main__":
    if len(sys.argv) != 3:
        sys.exit(__doc__)
    write(sys.argv[1], {sys.argv[2]: sys.stdin.read()})
