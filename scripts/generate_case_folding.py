#!/usr/bin/env python3
"""Writes ktcheckname/caseFolding.inc from Unicode's CaseFolding.txt (Debian package unicode-data).

Usage: scripts/generate_case_folding.py [CaseFolding.txt] > ktcheckname/caseFolding.inc
"""

import re
import sys

# The letters whose case names disregard: Latin, the Latin ligatures, and Latin letters in other guises.
RANGES = [(0x0041, 0x0232), (0x1E00, 0x1E9B), (0x2160, 0x216F), (0x24B6, 0x24CF), (0xFB00, 0xFB06), (0xFF21, 0xFF3A)]
ROWS_PER_LINE = 4


def read_full_foldings(text):
    """Yields (code point, folded code points): statuses C and F, one to three code points each."""
    for match in re.finditer(r"^([0-9A-F]+); [CF]; ([0-9A-F ]+);", text, re.MULTILINE):
        yield int(match[1], 16), [int(code, 16) for code in match[2].split()]


def row(code_point, folded):
    return "{0x%04X, {%s}}," % (code_point, ", ".join("0x%04X" % code for code in folded))


def main():
    path = sys.argv[1] if len(sys.argv) > 1 else "/usr/share/unicode/CaseFolding.txt"
    with open(path, encoding="utf-8") as file:
        text = file.read()
    version = re.match(r"# CaseFolding-([0-9.]+)\.txt", text)[1]
    rows = [row(*folding) for folding in sorted(read_full_foldings(text))
            if any(first <= folding[0] <= last for first, last in RANGES)]
    print("// Case folding of Unicode %s, Latin letters; made by scripts/generate_case_folding.py." % version)
    print("// Code point, folded code points; ordered by code point.")
    for start in range(0, len(rows), ROWS_PER_LINE):
        print(" ".join(rows[start:start + ROWS_PER_LINE]))


if __name__ == "__main__":
    main()
