#!/usr/bin/env python3
"""The speeds in the README's table of formats, from those of docs/speed.md.

    bench/matrix.py docs/speed.md README.md

A cell is the quotient to the best other library at 320x240 with AVX2. Cells that the page has no row for stay."""

import re
import sys


def cells(line):
    return [c.strip() for c in line.strip("|").split("|")]


def speeds(page):
    """By (from, to); the conversions of simgp_csc before those in any colour."""
    found, target, head = {}, None, []
    for line in page.splitlines():
        if line.startswith("#### "):
            target = line[5:]
        elif line.startswith("| operation |"):
            head = cells(line)
        elif line.startswith("|") and target == "avx2" and "320x240" in head:
            row = dict(zip(head, cells(line)))
            name = re.fullmatch(r"(any_)?([a-z0-9]+)_to_([a-z0-9]+)", row["operation"])
            speed = row.get("320x240", "").strip("*")
            if name and re.fullmatch(r"[\d.]+", speed) and (not name[1] or name.groups()[1:] not in found):
                found[name.groups()[1:]] = speed
    return found


def filled(text, found):
    columns, lines = [], []
    for line in text.splitlines():
        if line.startswith("| from \\ to |"):
            columns = cells(line)
        elif not line.startswith("|"):
            columns = []
        elif columns and not line.startswith("|--"):
            row = cells(line)
            row[1:] = [c if c == "=" else found.get((row[0], to), c) for to, c in zip(columns[1:], row[1:])]
            line = f"| {' | '.join(row)} |"
        lines.append(line)
    return "\n".join(lines) + "\n"


if __name__ == "__main__":
    with open(sys.argv[1], encoding="utf-8") as page, open(sys.argv[2], encoding="utf-8") as readme:
        table = filled(readme.read(), speeds(page.read()))
    with open(sys.argv[2], "w", encoding="utf-8") as readme:
        readme.write(table)
