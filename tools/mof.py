"""A small MOF (DMTF Managed Object Format) reader for class declarations.

It understands what the DMTF CIM schema and the module's own MOF files use:
pragmas (include is followed, the rest ignored), qualifier declarations
(skipped), class declarations with qualifiers, properties, references and
methods with parameters, arrays and default values; and writes class
declarations back.  Descriptions and every
other qualifier value are kept as parsed Python values so callers can choose
what matters.  Instance declarations are skipped.

Python 3 standard library only: the build runs the generator with it.
"""

import os
import re

__all__ = ["MofError", "Qualifier", "Feature", "Param", "CimClass", "parse_files",
           "parse_text", "format_value", "format_qualifiers", "format_class"]

CIM_TYPES = ("boolean", "uint8", "sint8", "uint16", "sint16", "uint32", "sint32",
             "uint64", "sint64", "real32", "real64", "char16", "string", "datetime")


class MofError(Exception):
    pass


class Qualifier:
    """One qualifier as written: its name in source spelling and its value
    (True for a bare flag, a list for {...}, else a scalar)."""

    def __init__(self, name, value):
        self.name = name
        self.value = value

    def __repr__(self):
        return "Qualifier(%r, %r)" % (self.name, self.value)


class Quals:
    """An ordered, case-insensitive qualifier list."""

    def __init__(self, items=None):
        self.items = list(items or [])

    def get(self, name, default=None):
        low = name.lower()
        for q in self.items:
            if q.name.lower() == low:
                return q.value
        return default

    def has(self, name):
        low = name.lower()
        return any(q.name.lower() == low for q in self.items)

    def flag(self, name):
        """True when the boolean qualifier is present and not set to false."""
        v = self.get(name)
        return v is not None and v is not False

    def __iter__(self):
        return iter(self.items)


class Param:
    def __init__(self, name, type_, ref_class, is_array, quals):
        self.name = name
        self.type = type_          # CIM type name, or None for a reference
        self.ref_class = ref_class  # class name for a reference
        self.is_array = is_array
        self.quals = quals

    @property
    def is_ref(self):
        return self.ref_class is not None


class Feature:
    """A property, reference or method of a class declaration."""

    def __init__(self, kind, name, type_, ref_class, is_array, array_size, quals,
                 default=None, params=None):
        self.kind = kind            # "property", "reference" or "method"
        self.name = name
        self.type = type_           # CIM type; method return type
        self.ref_class = ref_class
        self.is_array = is_array
        self.array_size = array_size
        self.quals = quals
        self.default = default      # parsed value or None
        self.params = params or []


class CimClass:
    def __init__(self, name, superclass, quals, features, source):
        self.name = name
        self.superclass = superclass
        self.quals = quals
        self.features = features
        self.source = source

    def feature(self, name):
        low = name.lower()
        for f in self.features:
            if f.name.lower() == low:
                return f
        return None


_TOKEN_RE = re.compile(r"""
    (?P<ws>\s+)
  | (?P<comment>//[^\n]*|/\*.*?\*/)
  | (?P<string>"(?:[^"\\\n]|\\.)*")
  | (?P<char>'(?:[^'\\\n]|\\.[^']*)')
  | (?P<number>[+-]?(?:0[xX][0-9a-fA-F]+|[0-9]+\.[0-9]*(?:[eE][+-]?[0-9]+)?|\.[0-9]+(?:[eE][+-]?[0-9]+)?|[0-9]+(?:[eE][+-]?[0-9]+)?)[bB]?)
  | (?P<ident>[A-Za-z_][A-Za-z0-9_]*)
  | (?P<pragma>\#pragma)
  | (?P<punct>[\[\]{}(),;:=$])
""", re.VERBOSE | re.DOTALL)

_ESCAPES = {"b": "\b", "t": "\t", "n": "\n", "f": "\f", "r": "\r", '"': '"',
            "'": "'", "\\": "\\"}


def _unescape(body):
    out = []
    i = 0
    while i < len(body):
        c = body[i]
        if c == "\\" and i + 1 < len(body):
            n = body[i + 1]
            if n in _ESCAPES:
                out.append(_ESCAPES[n])
                i += 2
                continue
            if n in "xX":
                m = re.match(r"[0-9a-fA-F]{1,4}", body[i + 2:])
                if m:
                    out.append(chr(int(m.group(0), 16)))
                    i += 2 + len(m.group(0))
                    continue
        out.append(c)
        i += 1
    return "".join(out)


def _tokenize(text, source):
    tokens = []
    pos = 0
    line = 1
    n = len(text)
    while pos < n:
        m = _TOKEN_RE.match(text, pos)
        if not m:
            raise MofError("%s:%d: unexpected character %r" % (source, line, text[pos]))
        kind = m.lastgroup
        value = m.group(kind)
        if kind not in ("ws", "comment"):
            tokens.append((kind, value, line))
        line += value.count("\n")
        pos = m.end()
    tokens.append(("eof", "", line))
    return tokens


class _Parser:
    def __init__(self, tokens, source, include):
        self.toks = tokens
        self.i = 0
        self.source = source
        self.include = include
        self.classes = []

    # -- token helpers
    def peek(self, k=0):
        return self.toks[self.i + k]

    def next(self):
        t = self.toks[self.i]
        self.i += 1
        return t

    def error(self, msg):
        return MofError("%s:%d: %s" % (self.source, self.peek()[2], msg))

    def at(self, value):
        t = self.peek()
        return t[0] in ("punct", "ident") and t[1].lower() == value.lower()

    def expect(self, value):
        if not self.at(value):
            raise self.error("expected %r, found %r" % (value, self.peek()[1]))
        return self.next()

    def ident(self):
        t = self.next()
        if t[0] != "ident":
            raise MofError("%s:%d: expected a name, found %r" % (self.source, t[2], t[1]))
        return t[1]

    # -- grammar
    def parse(self):
        while self.peek()[0] != "eof":
            if self.peek()[0] == "pragma":
                self.pragma()
            elif self.at("qualifier"):
                self.skip_statement()
            elif self.at("instance"):
                self.skip_statement()
            else:
                quals = self.qualifier_list()
                if self.at("class"):
                    self.class_decl(quals)
                elif self.at("instance"):
                    self.skip_statement()
                else:
                    raise self.error("unexpected %r" % self.peek()[1])
        return self.classes

    def pragma(self):
        self.next()
        name = self.ident()
        self.expect("(")
        args = []
        while not self.at(")"):
            args.append(self.value())
            if self.at(","):
                self.next()
        self.expect(")")
        if name.lower() == "include":
            self.classes.extend(self.include(args[0], self.source))

    def skip_statement(self):
        depth = 0
        while True:
            t = self.next()
            if t[0] == "eof":
                raise self.error("unterminated statement")
            if t[1] in ("{", "(", "["):
                depth += 1
            elif t[1] in ("}", ")", "]"):
                depth -= 1
            elif t[1] == ";" and depth == 0:
                return

    def qualifier_list(self):
        quals = Quals()
        if not self.at("["):
            return quals
        self.next()
        while True:
            name = self.ident()
            value = True
            if self.at("("):
                self.next()
                value = self.value()
                self.expect(")")
            elif self.at("{"):
                value = self.array_value()
            if self.at(":"):  # flavors
                self.next()
                while self.peek()[0] == "ident":
                    self.next()
            quals.items.append(Qualifier(name, value))
            if self.at(","):
                self.next()
                continue
            self.expect("]")
            return quals

    def value(self):
        t = self.peek()
        if t[0] == "string":
            parts = []
            while self.peek()[0] == "string":
                parts.append(_unescape(self.next()[1][1:-1]))
            return "".join(parts)
        if t[0] == "char":
            self.next()
            return _unescape(t[1][1:-1])
        if t[0] == "number":
            self.next()
            return _number(t[1])
        if t[0] == "ident":
            self.next()
            low = t[1].lower()
            if low == "true":
                return True
            if low == "false":
                return False
            if low == "null":
                return None
            return t[1]
        if t[1] == "{":
            return self.array_value()
        raise self.error("expected a value, found %r" % t[1])

    def array_value(self):
        self.expect("{")
        items = []
        while not self.at("}"):
            items.append(self.value())
            if self.at(","):
                self.next()
        self.expect("}")
        return items

    def class_decl(self, quals):
        self.expect("class")
        name = self.ident()
        superclass = None
        if self.at(":"):
            self.next()
            superclass = self.ident()
        self.expect("{")
        features = []
        while not self.at("}"):
            features.append(self.feature())
        self.expect("}")
        self.expect(";")
        self.classes.append(CimClass(name, superclass, quals, features, self.source))

    def array_suffix(self):
        if not self.at("["):
            return False, 0
        self.next()
        size = 0
        if self.peek()[0] == "number":
            size = int(self.next()[1])
        self.expect("]")
        return True, size

    def feature(self):
        quals = self.qualifier_list()
        type_name = self.ident()
        if self.at("ref"):
            self.next()
            name = self.ident()
            is_array, size = self.array_suffix()
            default = None
            if self.at("="):
                self.next()
                default = self.value()
            self.expect(";")
            return Feature("reference", name, None, type_name, is_array, size, quals, default)
        name = self.ident()
        ltype = type_name.lower()
        if ltype not in CIM_TYPES:
            raise self.error("unknown type %r" % type_name)
        if self.at("("):
            params = self.params()
            self.expect(";")
            return Feature("method", name, ltype, None, False, 0, quals, params=params)
        is_array, size = self.array_suffix()
        default = None
        if self.at("="):
            self.next()
            default = self.value()
        self.expect(";")
        return Feature("property", name, ltype, None, is_array, size, quals, default)

    def params(self):
        self.expect("(")
        params = []
        while not self.at(")"):
            quals = self.qualifier_list()
            type_name = self.ident()
            ref_class = None
            ptype = type_name.lower()
            if self.at("ref"):
                self.next()
                ref_class, ptype = type_name, None
            elif ptype not in CIM_TYPES:
                raise self.error("unknown parameter type %r" % type_name)
            name = self.ident()
            is_array, _ = self.array_suffix()
            if self.at("="):
                self.next()
                self.value()
            params.append(Param(name, ptype, ref_class, is_array, quals))
            if self.at(","):
                self.next()
        self.expect(")")
        return params


def _number(text):
    if re.fullmatch(r"[+-]?[01]+[bB]", text):
        return int(text[:-1], 2)
    if text.lower().lstrip("+-").startswith("0x"):
        return int(text, 16)
    if re.fullmatch(r"[+-]?[0-9]+", text):
        return int(text, 10)
    return float(text)


def parse_text(text, source="<text>", include=None):
    def no_include(path, _src):
        raise MofError("%s: include of %s not allowed here" % (source, path))
    parser = _Parser(_tokenize(text, source), source, include or no_include)
    return parser.parse()


def parse_files(paths):
    """Parses the files (following includes relative to the including file)
    and answers the class declarations in source order."""
    def include(path, including):
        full = os.path.join(os.path.dirname(including), path)
        return _parse_file(full, include)
    classes = []
    for p in paths:
        classes.extend(_parse_file(p, include))
    return classes


def _parse_file(path, include):
    with open(path, encoding="utf-8", errors="replace") as f:
        text = f.read()
    return _Parser(_tokenize(text, path), path, include).parse()


# -- writing MOF back -------------------------------------------------------

def _escape(s):
    out = []
    for c in s:
        if c == '"':
            out.append('\\"')
        elif c == "\\":
            out.append("\\\\")
        elif c == "\n":
            out.append("\\n")
        elif c == "\t":
            out.append("\\t")
        elif c == "\r":
            out.append("\\r")
        elif ord(c) < 32:
            out.append("\\x%04X" % ord(c))
        else:
            out.append(c)
    return "".join(out)


def format_value(v):
    if v is None:
        return "NULL"
    if v is True:
        return "true"
    if v is False:
        return "false"
    if isinstance(v, list):
        return "{ " + ", ".join(format_value(x) for x in v) + " }"
    if isinstance(v, (int, float)):
        return repr(v)
    return '"' + _escape(v) + '"'


def format_qualifiers(quals):
    parts = []
    for q in quals:
        if q.value is True:
            parts.append(q.name)
        elif isinstance(q.value, list):
            parts.append("%s %s" % (q.name, format_value(q.value)))
        else:
            parts.append("%s ( %s )" % (q.name, format_value(q.value)))
    return "[" + ", ".join(parts) + "]" if parts else ""


def _all_qualifiers(quals):
    return list(quals)


def _format_param(p, keep):
    q = format_qualifiers(keep(p.quals))
    text = (q + " " if q else "")
    if p.ref_class:
        text += "%s REF %s" % (p.ref_class, p.name)
    else:
        text += "%s %s" % (p.type, p.name)
    if p.is_array:
        text += "[]"
    return text


def format_class(c, keep=_all_qualifiers):
    """A class declaration as MOF text; `keep` chooses the qualifiers written
    (all by default) from each qualifier list."""
    lines = []
    q = format_qualifiers(keep(c.quals))
    if q:
        lines.append(q)
    head = "class %s" % c.name
    if c.superclass:
        head += " : %s" % c.superclass
    lines.append(head + " {")
    for f in c.features:
        q = format_qualifiers(keep(f.quals))
        if q:
            lines.append("  " + q)
        if f.kind == "method":
            params = [_format_param(p, keep) for p in f.params]
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
            decl += " = " + format_value(f.default)
        lines.append("  " + decl + ";")
    lines.append("};")
    return "\n".join(lines) + "\n"
