#!/usr/bin/env python3
"""Checks that our CMPI headers lay out every structure as another set of CMPI
headers (a real CIMOM's) does.

The structures and their members are read from our headers (cmpidt.h,
cmpift.h); one C unit that prints the size and alignment of each structure and
the offset and size of each member is compiled twice, against our headers and
against the other set, and the two printouts must be equal.  A member the other
headers do not have fails the compilation of their unit, which is reported.

Usage: cmpi_layout_check.py --ours DIR --theirs DIR [--cc CC] [--work DIR]
Exit status: 0 equal, 1 different (or their unit does not compile), 77 when
--theirs does not hold cmpift.h (nothing to compare with).
"""

import argparse
import os
import re
import subprocess
import sys
import tempfile

HEADERS = ("cmpidt.h", "cmpift.h")
# The CIMOM's headers choose their platform binding from this macro.
PLATFORM_FLAGS = ("-DCMPI_PLATFORM_LINUX_GENERIC_GNU", "-DCMPI_VERSION=200")


def strip_comments(text):
    text = re.sub(r"/\*.*?\*/", " ", text, flags=re.S)
    text = re.sub(r"//[^\n]*", " ", text)
    return re.sub(r"^\s*#[^\n]*", " ", text, flags=re.M)


def matching_brace(text, open_at):
    depth = 0
    for i in range(open_at, len(text)):
        if text[i] == "{":
            depth += 1
        elif text[i] == "}":
            depth -= 1
            if depth == 0:
                return i
    raise ValueError("unbalanced braces")


def member_name(decl):
    """The member a declaration names: `T (*name)(...)`, `T name[N]` or `T name`."""
    m = re.search(r"\(\s*\*\s*(\w+)\s*\)", decl)
    if m:
        return m.group(1)
    decl = re.sub(r"\[[^\]]*\]", "", decl)
    m = re.search(r"(\w+)\s*$", decl)
    return m.group(1) if m else None


def members(body):
    """Top-level declarations of a structure body, split at ';' outside parentheses."""
    out, depth, start = [], 0, 0
    for i, c in enumerate(body):
        if c in "({":
            depth += 1
        elif c in ")}":
            depth -= 1
        elif c == ";" and depth == 0:
            name = member_name(body[start:i].strip())
            if name:
                out.append(name)
            start = i + 1
    return out


def structures(text):
    """(C type name, [member names]) for every struct/union definition with a body."""
    found = []
    for m in re.finditer(r"\b(typedef\s+)?(struct|union)\s+(\w+)?\s*\{", text):
        close = matching_brace(text, m.end() - 1)
        body = text[m.end():close]
        after = re.match(r"\s*(\w+)?\s*;", text[close + 1:])
        if m.group(1) and after and after.group(1):
            name = after.group(1)
        elif m.group(3):
            name = "%s %s" % (m.group(2), m.group(3))
        else:
            continue
        found.append((name, members(body)))
    return found


def emit_unit(structs):
    lines = ["#include <stddef.h>", "#include <stdio.h>", '#include "cmpift.h"', "",
             "int main(void) {"]
    for name, names in structs:
        lines.append('  printf("%%s size %%zu align %%zu\\n", "%s", sizeof(%s), _Alignof(%s));'
                     % (name, name, name))
        for member in names:
            lines.append('  printf("%%s.%%s offset %%zu size %%zu\\n", "%s", "%s", offsetof(%s, %s), '
                         "sizeof(((%s*)0)->%s));" % (name, member, name, member, name, member))
    lines += ["  return 0;", "}", ""]
    return "\n".join(lines)


def layout(cc, include_dir, source, work, tag):
    exe = os.path.join(work, "layout_" + tag)
    cmd = [cc, "-std=c11", "-w", *PLATFORM_FLAGS, "-I", include_dir, source, "-o", exe]
    built = subprocess.run(cmd, capture_output=True, text=True)
    if built.returncode != 0:
        return None, built.stderr
    return subprocess.run([exe], capture_output=True, text=True, check=True).stdout, ""


def main():
    ap = argparse.ArgumentParser(description=__doc__.split("\n")[0])
    ap.add_argument("--ours", required=True)
    ap.add_argument("--theirs", required=True)
    ap.add_argument("--cc", default="cc")
    ap.add_argument("--work")
    args = ap.parse_args()

    if not os.path.isfile(os.path.join(args.theirs, "cmpift.h")):
        print("SKIP: no CMPI headers in %s (the SFCB build of the real-CIMOM stage "
              "installs them)" % args.theirs)
        return 77

    text = "".join(strip_comments(open(os.path.join(args.ours, h)).read()) for h in HEADERS)
    structs = structures(text)
    count = sum(len(m) for _, m in structs)
    work = args.work or tempfile.mkdtemp(prefix="cmpi-layout.")
    os.makedirs(work, exist_ok=True)
    source = os.path.join(work, "layout.c")
    with open(source, "w") as f:
        f.write(emit_unit(structs))

    ours, err = layout(args.cc, args.ours, source, work, "ours")
    if ours is None:
        print("our headers do not compile the layout unit:\n" + err)
        return 1
    theirs, err = layout(args.cc, args.theirs, source, work, "theirs")
    if theirs is None:
        print("the layout unit does not compile against %s (a member or structure of ours "
              "is missing there):\n%s" % (args.theirs, err))
        return 1
    diffs = [(a, b) for a, b in zip(ours.splitlines(), theirs.splitlines()) if a != b]
    for a, b in diffs:
        print("ours:   %s\ntheirs: %s" % (a, b))
    print("%d structures, %d members compared with %s: %s"
          % (len(structs), count, args.theirs, "%d differ" % len(diffs) if diffs else "same layout"))
    return 1 if diffs else 0


if __name__ == "__main__":
    sys.exit(main())
