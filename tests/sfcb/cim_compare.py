#!/usr/bin/env python3
"""Compares what SFCB answered (through wbemcli) with what the CIMOM stand-in
answered (through nrv-cim) for the same requests.

For each request NAME the stage left in DIR:
  NAME.sfcb, NAME.sfcb.err, NAME.sfcb.rc   wbemcli -nl: stdout, stderr, exit status
  NAME.host, NAME.host.err, NAME.host.rc   nrv-cim:     stdout, stderr, exit status
Both answers are brought to one form before they are compared: an error is its
CIM status code; instances are sets of (class, {property: value}) with null
properties dropped (SFCB fills in every property of the class, the module only
those it has); object paths lose wbemcli's host:port prefix and have their keys
sorted; names compare without regard to case; arrays are element lists (so a
scalar is a one-element list: wbemcli prints both alike).

Usage: cim_compare.py [--xfail NAME]... DIR NAME[=OP] ...   (OP: the wbemcli
operation, default NAME's prefix up to the first '-'). Prints a side-by-side
table and, for every difference, both normalised answers; exit status 1 when
any differ, except requests named with --xfail (expected to differ: XFAIL, or
XPASS when they agree).
"""

import os
import re
import socket
import sys

# CMPI return codes as nrv-cim names them = CIM status codes as wbemcli prints them.
RC_CODES = {
    "CMPI_RC_ERR_FAILED": 1, "CMPI_RC_ERR_ACCESS_DENIED": 2, "CMPI_RC_ERR_INVALID_NAMESPACE": 3,
    "CMPI_RC_ERR_INVALID_PARAMETER": 4, "CMPI_RC_ERR_INVALID_CLASS": 5, "CMPI_RC_ERR_NOT_FOUND": 6,
    "CMPI_RC_ERR_NOT_SUPPORTED": 7, "CMPI_RC_ERR_CLASS_HAS_CHILDREN": 8,
    "CMPI_RC_ERR_CLASS_HAS_INSTANCES": 9, "CMPI_RC_ERR_INVALID_SUPERCLASS": 10,
    "CMPI_RC_ERR_ALREADY_EXISTS": 11, "CMPI_RC_ERR_NO_SUCH_PROPERTY": 12,
    "CMPI_RC_ERR_TYPE_MISMATCH": 13, "CMPI_RC_ERR_QUERY_LANGUAGE_NOT_SUPPORTED": 14,
    "CMPI_RC_ERR_INVALID_QUERY": 15, "CMPI_RC_ERR_METHOD_NOT_AVAILABLE": 16,
    "CMPI_RC_ERR_METHOD_NOT_FOUND": 17,
}
PATH_OPS = ("ein", "ain", "rin")
INSTANCE_OPS = ("ei", "gi", "ai", "ri")


def split_top(text, sep=","):
    """Splits at `sep` outside double quotes (backslash escapes) and braces."""
    parts, depth, quoted, start, i = [], 0, False, 0, 0
    while i < len(text):
        c = text[i]
        if quoted:
            if c == "\\":
                i += 1
            elif c == '"':
                quoted = False
        elif c == '"':
            quoted = True
        elif c == "{":
            depth += 1
        elif c == "}":
            depth -= 1
        elif c == sep and depth == 0:
            parts.append(text[start:i])
            start = i + 1
        i += 1
    parts.append(text[start:])
    return [p.strip() for p in parts]


def unquote(text):
    if len(text) >= 2 and text[0] == '"' and text[-1] == '"':
        return re.sub(r"\\(.)", r"\1", text[1:-1]), True
    return text, False


def canonical_scalar(text):
    value, quoted = unquote(text)
    if quoted:
        return canonical_path(value) if looks_like_path(value) else value
    low = value.lower()
    if low in ("true", "false"):
        return low
    try:
        return repr(float(value)) if re.search(r"[.eE]", value) else str(int(value))
    except ValueError:
        return canonical_path(value) if looks_like_path(value) else value


def canonical_value(text):
    """An element list, or None for a null (or empty) value."""
    text = text.strip()
    if text in ("", "NULL", "{}"):
        return None
    if looks_like_path(text):
        return (canonical_path(text),)  # a reference as wbemcli prints it: unquoted
    if text.startswith("{") and text.endswith("}"):
        text = text[1:-1]
    return tuple(canonical_scalar(e) for e in split_top(text))


def looks_like_path(text):
    return re.match(r"^(//[^/]+/|[\w.-]+:\d+/)?[\w/]+:\w+(\.|$)", text) is not None


# wbemcli puts the CIMOM's host name before the namespace of the paths associator and
# reference names answer ("vm/root/x:C.k=1"); a namespace may hold '/' too, so only this
# machine's names are taken off.
HOST_PREFIX = re.compile(r"^(//[^/]+/|[\w.-]+:\d+/|(%s)/)" % "|".join(
    re.escape(h) for h in {socket.gethostname(), socket.gethostname().split(".")[0], "localhost"}))


def key_bindings(keys):
    """(name, value) pairs of a path's keys.  wbemcli prints a reference key's value
    unquoted, so the referenced path's own keys follow it as if they were the outer path's:
    they are joined back to the reference they follow."""
    pairs = []
    for part in split_top(keys):
        name, _, value = part.partition("=")
        value = value.strip()
        if pairs and pairs[-1][2] and not looks_like_path(value):
            pairs[-1][1] += "," + part.strip()
            continue
        pairs.append([name.strip(), value, not value.startswith('"') and looks_like_path(value)])
    return [(n, canonical_value(v)) for n, v, _ in pairs]


def canonical_path(text):
    """namespace:class.k=v,... with host prefix gone, names lower-cased, keys sorted."""
    text = HOST_PREFIX.sub("", text.strip())
    head, _, keys = text.partition(".")
    ns, _, cls = head.rpartition(":")
    bindings = ["%s=%s" % (name.lower(), value) for name, value in (key_bindings(keys) if keys else [])]
    return "%s:%s.%s" % (ns.lower(), cls.lower(), ",".join(sorted(bindings)))


def error_of(rc, err, tool):
    if rc == 0:
        return None
    if tool == "sfcb":
        m = re.search(r"Cim: \((\d+)\)", err)
        return ("error", int(m.group(1))) if m else ("error", "exit %d: %s" % (rc, err.strip()[:200]))
    m = re.match(r"\s*(CMPI_RC_\w+)", err)
    code = RC_CODES.get(m.group(1)) if m else None
    return ("error", code if code is not None else "exit %d: %s" % (rc, err.strip()[:200]))


def wbemcli_instances(text):
    out, current = [], None
    for line in text.splitlines():
        if not line.strip():
            continue
        if line.startswith("-"):
            name, _, value = line[1:].partition("=")
            v = canonical_value(value)
            if v is not None:
                current[1][name.lower()] = v
            continue
        path = canonical_path(line)
        current = (path.split(".")[0], {})
        out.append(current)
    return out


def nrvcim_instances(text):
    out, current = [], None
    for line in text.splitlines():
        m = re.match(r"instance of (\w+) \{", line)
        if m:
            current = (None, {})
            cls = m.group(1).lower()
            out.append((cls, current[1]))
            continue
        m = re.match(r"\s+(\w+) = (.*);$", line)
        if m and current is not None:
            v = canonical_value(m.group(2))
            if v is not None:
                current[1][m.group(1).lower()] = v
    return out


def instance_key(cls, props):
    return (cls.split(":")[-1], tuple(sorted(props.items())))


def normalised(directory, name, op, tool):
    base = os.path.join(directory, "%s.%s" % (name, tool))
    text = open(base).read() if os.path.exists(base) else ""
    err = open(base + ".err").read() if os.path.exists(base + ".err") else ""
    rc = int(open(base + ".rc").read().strip() or 1) if os.path.exists(base + ".rc") else 1
    error = error_of(rc, err, tool)
    if error:
        return error
    if op in PATH_OPS:
        return ("paths", tuple(sorted(canonical_path(l) for l in text.splitlines() if l.strip())))
    if op in INSTANCE_OPS:
        parse = wbemcli_instances if tool == "sfcb" else nrvcim_instances
        return ("instances", tuple(sorted(instance_key(c, p) for c, p in parse(text))))
    return ("ok",)


def summary(answer):
    if answer[0] == "error":
        return "error %s" % (answer[1],)
    if answer[0] in ("paths", "instances"):
        return "%d %s" % (len(answer[1]), answer[0])
    return "ok"


def main():
    args, xfail = sys.argv[1:], set()
    while len(args) >= 2 and args[0] == "--xfail":
        xfail.add(args[1])
        args = args[2:]
    if len(args) < 2:
        sys.exit(__doc__)
    directory, requests = args[0], args[1:]
    differ = 0
    print("%-28s %-22s %-22s %s" % ("request", "SFCB (wbemcli)", "host (nrv-cim)", "agree"))
    details = []
    for request in requests:
        name, _, op = request.partition("=")
        op = op or name.split("-")[0]
        sfcb = normalised(directory, name, op, "sfcb")
        host = normalised(directory, name, op, "host")
        same = sfcb == host
        if name in xfail:
            verdict = "XPASS" if same else "XFAIL"
        else:
            verdict = "yes" if same else "NO"
            differ += 0 if same else 1
        print("%-28s %-22s %-22s %s" % (name, summary(sfcb), summary(host), verdict))
        if not same:
            details.append("%s:\n  SFCB: %r\n  host: %r" % (name, sfcb, host))
    for d in details:
        print(d)
    return 1 if differ else 0


if __name__ == "__main__":
    sys.exit(main())
