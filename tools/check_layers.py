#!/usr/bin/env python3
"""Checks that no source folder of the module includes a folder above it.

The module is built in layers, lowest first; a folder may include its own
headers and those of lower layers, never those of a higher one or of a peer
at the same height:

  framework < logging < access < data < agent < providers, derivedObjects < module

schema/ (the generated class headers, built on the framework alone) sits just
above the framework.  The stand-ins are held apart from the module: sim/ may
use only the management library's record types from access/, host/ nothing of
the module at all.  tools/, tests/ and bench/ may include anything.

Usage: check_layers.py [SOURCE_ROOT]   (exit 1 and one line per offending include)

Python 3 standard library only.
"""

import os
import re
import sys

# Height of every module layer; equal heights may not include each other.
RANK = {"framework": 0, "schema": 0.5, "logging": 1, "access": 2, "data": 3, "agent": 4,
        "providers": 5, "derivedObjects": 5, "module": 6}
# Folders outside the module, with the module folders each may include.
STAND_INS = {"sim": {"access"}, "host": set()}
SOURCE_SUFFIXES = (".h", ".hpp", ".c", ".cpp", ".cc")
INCLUDE = re.compile(r'^\s*#\s*include\s*"([A-Za-z_]+)/')


def allowed(folder, target):
    """May a file in `folder` include a header of `target`?"""
    if folder == target or target not in RANK:
        return True
    if folder not in RANK and folder not in STAND_INS:
        return True  # tools, tests, bench
    if folder in STAND_INS:
        return target in STAND_INS[folder]
    return RANK[target] < RANK[folder]


def violations(root):
    found = []
    for folder in sorted(set(RANK) | set(STAND_INS)):
        top = os.path.join(root, folder)
        for dirpath, dirnames, filenames in os.walk(top):
            dirnames.sort()
            for name in sorted(filenames):
                if not name.endswith(SOURCE_SUFFIXES):
                    continue
                path = os.path.join(dirpath, name)
                with open(path, encoding="utf-8", errors="replace") as f:
                    for number, line in enumerate(f, 1):
                        m = INCLUDE.match(line)
                        if m and not allowed(folder, m.group(1)):
                            found.append("%s:%d: %s/ includes %s/, a higher layer" % (
                                os.path.relpath(path, root), number, folder, m.group(1)))
    return found


def main():
    root = sys.argv[1] if len(sys.argv) > 1 else os.path.join(os.path.dirname(__file__), "..")
    found = violations(root)
    for line in found:
        print(line)
    print("layering: %d offending include(s)" % len(found))
    return 1 if found else 0


if __name__ == "__main__":
    sys.exit(main())
