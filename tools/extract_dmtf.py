#!/usr/bin/env python3
"""Extracts from the DMTF CIM schema the class declarations the module needs.

The module's own MOF (schema/ minus schema/dmtf) names DMTF classes as
superclasses, reference targets, method parameter references and embedded
instance classes.  This tool closes that set over the DMTF schema and writes
the declarations of the closure, without descriptions and without the
qualifiers the meta-data does not use, into one MOF file per DMTF package
folder (Core.mof, Device.mof, ...).  The build reads only its output, never
the schema itself, so the output is committed.

Usage: python3 tools/extract_dmtf.py --schema ../shared/cim-schema --out schema/dmtf
"""

import argparse
import glob
import os
import sys

sys.path.insert(0, os.path.dirname(os.path.abspath(__file__)))
import mof  # noqa: E402

SCHEMA_VERSION = "2.49.0"

# The qualifiers that become meta-data flags, or that the generator needs to
# resolve overrides and defaults.  Everything else (descriptions, value maps,
# versions) is documentation only.
KEPT_QUALIFIERS = {q.lower() for q in (
    "Abstract", "Aggregate", "Aggregation", "Association", "Composition", "Counter",
    "Delete", "DN", "EmbeddedInstance", "EmbeddedObject", "Exception", "Expensive",
    "Experimental", "Gauge", "IfDeleted", "In", "Indication", "Invisible", "Key",
    "Large", "OctetString", "Out", "Override", "Read", "Required", "Static",
    "Terminal", "Weak", "Write")}

# Classes the module needs although no local declaration names them: the
# error class that methods return as embedded instances.
ALWAYS_NEEDED = ("CIM_Error",)


def kept(quals):
    return [q for q in quals if q.name.lower() in KEPT_QUALIFIERS]


def names_used_by(cls):
    """DMTF class names a declaration depends on."""
    used = []
    if cls.superclass:
        used.append(cls.superclass)
    for f in cls.features:
        if f.ref_class:
            used.append(f.ref_class)
        emb = f.quals.get("EmbeddedInstance")
        if isinstance(emb, str):
            used.append(emb)
        for p in f.params:
            if p.ref_class:
                used.append(p.ref_class)
            emb = p.quals.get("EmbeddedInstance")
            if isinstance(emb, str):
                used.append(emb)
    return used


def closure(dmtf, local):
    by_lower = {name.lower(): c for name, c in dmtf.items()}
    local_names = {c.name.lower() for c in local}
    needed = {}
    todo = list(ALWAYS_NEEDED)
    for c in local:
        todo.extend(names_used_by(c))
    while todo:
        name = todo.pop()
        low = name.lower()
        if low in local_names or low in needed:
            continue
        cls = by_lower.get(low)
        if cls is None:
            raise SystemExit("extract_dmtf: class %s is used but not in the DMTF schema" % name)
        needed[low] = cls
        todo.extend(names_used_by(cls))
    return list(needed.values())


def ordered(classes):
    """Superclasses before subclasses, otherwise by name, so every file reads
    top-down."""
    by_name = {c.name: c for c in classes}
    done, out = set(), []

    def visit(c):
        if c.name in done:
            return
        if c.superclass in by_name:
            visit(by_name[c.superclass])
        done.add(c.name)
        out.append(c)
    for c in sorted(classes, key=lambda c: c.name):
        visit(c)
    return out


def format_param(p):
    q = mof.format_qualifiers(kept(p.quals))
    text = (q + " " if q else "")
    if p.ref_class:
        text += "%s REF %s" % (p.ref_class, p.name)
    else:
        text += "%s %s" % (p.type, p.name)
    if p.is_array:
        text += "[]"
    return text


def format_class(c):
    lines = []
    q = mof.format_qualifiers(kept(c.quals))
    if q:
        lines.append(q)
    head = "class %s" % c.name
    if c.superclass:
        head += " : %s" % c.superclass
    lines.append(head + " {")
    for f in c.features:
        q = mof.format_qualifiers(kept(f.quals))
        if q:
            lines.append("  " + q)
        if f.kind == "method":
            params = [format_param(p) for p in f.params]
            if params:
                lines.append("  %s %s(" % (f.type, f.name))
                for i, p in enumerate(params):
                    lines.append("      " + p + ("," if i + 1 < len(params) else ");"))
            else:
                lines.append("  %s %s();" % (f.type, f.name))
            continue
        if f.kind == "reference":
            decl = "%s REF %s" % (f.ref_class, f.name)
        else:
            decl = "%s %s" % (f.type, f.name)
        if f.is_array:
            decl += "[%s]" % (f.array_size or "")
        if f.default is not None:
            decl += " = " + mof.format_value(f.default)
        lines.append("  " + decl + ";")
    lines.append("};")
    return "\n".join(lines) + "\n"


def package_of(cls, schema_root):
    rel = os.path.relpath(cls.source, schema_root)
    parts = rel.split(os.sep)
    # DMTF/<Package>/CIM_X.mof
    return parts[1] if len(parts) >= 3 else "Misc"


def header(package):
    return (
        "// DMTF CIM Schema %s, package %s: the class declarations this module\n"
        "// needs, reduced to names, types, arrays, defaults, method signatures and\n"
        "// the qualifiers its meta-data uses.  Generated by tools/extract_dmtf.py;\n"
        "// do not edit.\n"
        "//\n"
        "// Copyright 1998-2008 Distributed Management Task Force, Inc. (DMTF).\n"
        "// All rights reserved.\n"
        "// DMTF is a not-for-profit association of industry members dedicated\n"
        "// to promoting enterprise and systems management and interoperability.\n"
        "// DMTF specifications and documents may be reproduced by\n"
        "// members and non-members, provided that correct attribution is given.\n"
        "// As DMTF specifications may be revised from time to time,\n"
        "// the particular version and release date should always be noted.\n"
        "// Source: DMTF CIM Schema %s (Final).\n\n" % (SCHEMA_VERSION, package, SCHEMA_VERSION))


def local_mof_files(out_dir):
    schema_dir = os.path.dirname(os.path.abspath(out_dir))
    files = []
    for path in sorted(glob.glob(os.path.join(schema_dir, "**", "*.mof"), recursive=True)):
        if os.path.abspath(path).startswith(os.path.abspath(out_dir) + os.sep):
            continue
        files.append(path)
    return files


def main():
    ap = argparse.ArgumentParser(description=__doc__.split("\n")[0])
    ap.add_argument("--schema", required=True, help="folder holding CIM_Schema.mof")
    ap.add_argument("--out", required=True, help="output folder, e.g. schema/dmtf")
    ap.add_argument("--local", nargs="*", help="the module's MOF files (default: the "
                    "other .mof files under the output folder's parent)")
    args = ap.parse_args()

    top = os.path.join(args.schema, "CIM_Schema.mof")
    dmtf = {c.name: c for c in mof.parse_files([top])}
    local_files = args.local if args.local is not None else local_mof_files(args.out)
    local = mof.parse_files(local_files)
    needed = closure(dmtf, local)

    packages = {}
    for c in ordered(needed):
        packages.setdefault(package_of(c, args.schema), []).append(c)

    os.makedirs(args.out, exist_ok=True)
    for old in glob.glob(os.path.join(args.out, "*.mof")):
        os.remove(old)
    for package, classes in sorted(packages.items()):
        with open(os.path.join(args.out, package + ".mof"), "w", encoding="utf-8") as f:
            f.write(header(package))
            f.write("\n".join(format_class(c) for c in classes))
    print("extract_dmtf: %d DMTF classes from %d local files into %d files under %s"
          % (len(needed), len(local_files), len(packages), args.out))


if __name__ == "__main__":
    main()
