#!/usr/bin/env python3
"""Generates the module's static class meta-data and instance structs from MOF.

Input: the MOF files of schema/ (the DMTF extract and the module's classes).
Output, in --out (the build's generated/schema folder):
  <Class>.h           flat instance struct per class (and method-call structs)
  Classes.h           includes every <Class>.h
  Repository.h        declares cimple::nrv_meta_repository
  ProviderClasses.h   X-macro lists of the provider classes
  MetaDecls.h         extern declarations of every feature record
  MetaTables_<n>.cpp  the Meta_* records, split into a few translation units
  Repository.cpp      the repository array

Layout: a 24-byte instance header; then every feature slot in feature order,
each placed like the C struct { T value; uint8_t null; } at the next offset
aligned to alignof(T); references are bare pointers (or Array handles) with
no null flag.  An overriding declaration keeps its ancestor's slot, so an
instance of a subclass can be read through any ancestor's meta-data.

Python 3 standard library only.
"""

import argparse
import os
import sys

sys.path.insert(0, os.path.dirname(os.path.abspath(__file__)))
import mof  # noqa: E402

HEADER_SIZE = 24
NUM_CHUNKS = 8

TYPE_CODE = {t: i for i, t in enumerate(mof.CIM_TYPES)}
# (slot size, slot alignment) of a scalar property slot: { T value; uint8_t null; }
SCALAR_SLOT = {
    "boolean": (2, 1), "uint8": (2, 1), "sint8": (2, 1),
    "uint16": (4, 2), "sint16": (4, 2), "char16": (4, 2),
    "uint32": (8, 4), "sint32": (8, 4), "real32": (8, 4),
    "uint64": (16, 8), "sint64": (16, 8), "real64": (16, 8),
    "string": (16, 8), "datetime": (16, 8),
}
ARRAY_SLOT = (16, 8)
REFERENCE_SLOT = (8, 8)
CXX_TYPE = {"boolean": "boolean", "uint8": "uint8", "sint8": "sint8", "uint16": "uint16",
            "sint16": "sint16", "uint32": "uint32", "sint32": "sint32", "uint64": "uint64",
            "sint64": "sint64", "real32": "real32", "real64": "real64", "char16": "char16",
            "string": "String", "datetime": "Datetime"}
# Element type of default-value data (strings and datetimes are texts).
DEFAULT_CXX = dict(CXX_TYPE, string="char* const", datetime="char* const")

# Qualifier name -> flag name of framework/Meta.h (boolean qualifiers).
FLAG_QUALIFIERS = {
    "aggregate": "FLAG_AGGREGATE", "composition": "FLAG_COMPOSITION",
    "counter": "FLAG_COUNTER", "delete": "FLAG_DELETE", "dn": "FLAG_DN",
    "embeddedobject": "FLAG_EMBEDDED_OBJECT", "exception": "FLAG_EXCEPTION",
    "expensive": "FLAG_EXPENSIVE", "experimental": "FLAG_EXPERIMENTAL", "gauge": "FLAG_GAUGE",
    "ifdeleted": "FLAG_IFDELETED", "invisible": "FLAG_INVISIBLE", "key": "FLAG_KEY",
    "large": "FLAG_LARGE", "octetstring": "FLAG_OCTETSTRING", "read": "FLAG_READ",
    "required": "FLAG_REQUIRED", "static": "FLAG_STATIC", "terminal": "FLAG_TERMINAL",
    "weak": "FLAG_WEAK", "write": "FLAG_WRITE",
}
FLAG_ORDER = ["FLAG_PROPERTY", "FLAG_REFERENCE", "FLAG_METHOD", "FLAG_CLASS", "FLAG_ABSTRACT",
              "FLAG_AGGREGATE", "FLAG_AGGREGATION", "FLAG_ASSOCIATION", "FLAG_COMPOSITION",
              "FLAG_COUNTER", "FLAG_DELETE", "FLAG_DN", "FLAG_EMBEDDED_OBJECT", "FLAG_EXCEPTION",
              "FLAG_EXPENSIVE", "FLAG_EXPERIMENTAL", "FLAG_GAUGE", "FLAG_IFDELETED", "FLAG_IN",
              "FLAG_INDICATION", "FLAG_INVISIBLE", "FLAG_KEY", "FLAG_LARGE", "FLAG_OCTETSTRING",
              "FLAG_OUT", "FLAG_READ", "FLAG_REQUIRED", "FLAG_STATIC", "FLAG_TERMINAL",
              "FLAG_WEAK", "FLAG_WRITE", "FLAG_EMBEDDED_INSTANCE"]
KIND_FLAGS = {"FLAG_PROPERTY", "FLAG_REFERENCE", "FLAG_METHOD"}
# Class qualifiers that subclasses inherit (the others, like Abstract, are
# restricted to the class that states them).
INHERITED_CLASS_FLAGS = {"FLAG_ASSOCIATION", "FLAG_AGGREGATION", "FLAG_INDICATION",
                         "FLAG_EXCEPTION"}

# The framework's root meta-class, the class of an embedded object of unknown class.
ROOT_META_CLASS = "Instance_meta_class"


class SchemaError(Exception):
    pass


def align(offset, alignment):
    return (offset + alignment - 1) // alignment * alignment


def qualifier_flags(quals):
    """Flag names set, and flag names explicitly cleared, by boolean qualifiers."""
    on, off = set(), set()
    for q in quals:
        flag = FLAG_QUALIFIERS.get(q.name.lower())
        if flag is None:
            continue
        (off if q.value is False else on).add(flag)
    emb = quals.get("EmbeddedInstance")
    if isinstance(emb, str):
        on.add("FLAG_EMBEDDED_INSTANCE")
    return on, off


class Slot:
    """A resolved property, reference or parameter: what a Meta_Property or
    Meta_Reference record and a struct member are made of."""

    def __init__(self, name, kind, cim_type, ref_class, is_array, flags, default, owner, symbol):
        self.name = name
        self.kind = kind            # "property" or "reference"
        self.type = cim_type        # CIM type of a property
        self.ref_class = ref_class  # class name of a reference; None: any instance
        self.is_array = is_array
        self.flags = flags          # set of flag names
        self.default = default
        self.owner = owner          # declaring class name
        self.symbol = symbol        # C++ name of its record
        self.offset = None

    def slot_shape(self):
        if self.kind == "reference":
            return REFERENCE_SLOT
        return ARRAY_SLOT if self.is_array else SCALAR_SLOT[self.type]


class Method:
    def __init__(self, name, return_type, flags, params, owner):
        self.name = name
        self.kind = "method"
        self.return_type = return_type
        self.flags = flags
        self.params = params        # Slots, return_value last
        self.owner = owner
        self.struct = "%s_%s_method" % (owner, name)
        self.size = None


class ResolvedClass:
    def __init__(self, decl):
        self.decl = decl
        self.name = decl.name
        self.superclass = None      # ResolvedClass
        self.flags = set()
        self.features = []          # Slots and Methods, inherited first
        self.locals = []            # parallel to features
        self.end = HEADER_SIZE      # first free byte after the last slot
        self.size = HEADER_SIZE

    @property
    def num_keys(self):
        return sum(1 for f in self.features if "FLAG_KEY" in f.flags)

    def is_association(self):
        return "FLAG_ASSOCIATION" in self.flags


def slot_from_decl(f, owner):
    """A property or reference declaration (or method parameter) as a Slot.
    Embedded instances and objects are held as references to their class."""
    on, _ = qualifier_flags(f.quals)
    ref_class = f.ref_class
    kind = "reference" if ref_class else "property"
    emb = f.quals.get("EmbeddedInstance")
    if kind == "property" and isinstance(emb, str):
        kind, ref_class = "reference", emb
    elif kind == "property" and "FLAG_EMBEDDED_OBJECT" in on:
        kind, ref_class = "reference", None
    on.add("FLAG_REFERENCE" if kind == "reference" else "FLAG_PROPERTY")
    if kind == "property" and f.type not in SCALAR_SLOT:
        raise SchemaError("%s.%s: unknown type %s" % (owner, f.name, f.type))
    default = getattr(f, "default", None) if kind == "property" else None
    return Slot(f.name, kind, f.type if kind == "property" else None, ref_class,
                f.is_array, on, default, owner, None)


def param_flags(p):
    on, _ = qualifier_flags(p.quals)
    if p.quals.get("In", True) is not False:
        on.add("FLAG_IN")
    if p.quals.flag("Out"):
        on.add("FLAG_OUT")
    return on


class Schema:
    def __init__(self, decls):
        self.decls = {}
        for d in decls:
            low = d.name.lower()
            if low in self.decls:
                raise SchemaError("class %s declared twice (%s, %s)"
                                  % (d.name, self.decls[low].source, d.source))
            self.decls[low] = d
        self.classes = {}
        self.order = []
        self.pending_narrowing = []
        for d in sorted(decls, key=lambda d: d.name):
            self.resolve(d.name, ())
        self.check_references()

    def lookup(self, name):
        return self.classes[name.lower()]

    def resolve(self, name, chain):
        low = name.lower()
        if low in self.classes:
            return self.classes[low]
        if low in chain:
            raise SchemaError("class %s is its own ancestor" % name)
        decl = self.decls.get(low)
        if decl is None:
            raise SchemaError("class %s is not declared" % name)
        rc = ResolvedClass(decl)
        if decl.superclass:
            sup = self.resolve(decl.superclass, chain + (low,))
            rc.superclass = sup
            rc.flags = sup.flags & INHERITED_CLASS_FLAGS
            rc.features = list(sup.features)
            rc.locals = [False] * len(sup.features)
            rc.end = sup.end
        on, off = qualifier_flags(decl.quals)
        rc.flags = (rc.flags | (on & INHERITED_CLASS_FLAGS)) - off
        if decl.quals.flag("Association"):
            rc.flags.add("FLAG_ASSOCIATION")
        if decl.quals.flag("Aggregation"):
            rc.flags.add("FLAG_AGGREGATION")
        if decl.quals.flag("Indication"):
            rc.flags.add("FLAG_INDICATION")
        if decl.quals.flag("Abstract"):
            rc.flags.add("FLAG_ABSTRACT")
        rc.flags.add("FLAG_ASSOCIATION" in rc.flags and "FLAG_ASSOCIATION" or "FLAG_CLASS")
        if "FLAG_ASSOCIATION" not in rc.flags:
            rc.flags.discard("FLAG_AGGREGATION")
        seen_local = set()
        for f in decl.features:
            if f.name.lower() in seen_local:
                raise SchemaError("%s.%s declared twice" % (rc.name, f.name))
            seen_local.add(f.name.lower())
            self.add_feature(rc, f)
        rc.size = align(rc.end, 8)
        self.classes[low] = rc
        self.order.append(rc)
        return rc

    def add_feature(self, rc, f):
        index = next((i for i, old in enumerate(rc.features)
                      if old.name.lower() == f.name.lower()), None)
        inherited = rc.features[index] if index is not None else None
        if f.kind == "method":
            new = self.make_method(rc, f)
            if inherited is not None and inherited.kind != "method":
                raise SchemaError("%s.%s: a method overrides a property" % (rc.name, f.name))
        else:
            new = slot_from_decl(f, rc.name)
            new.symbol = "meta_%s_%s" % (rc.name, f.name)
            if inherited is not None:
                self.check_override(rc, inherited, new)
                _, off = qualifier_flags(f.quals)
                new.flags = (new.flags | (inherited.flags - KIND_FLAGS)) - off
                if new.default is None and new.kind == "property":
                    new.default = inherited.default
                new.offset = inherited.offset
        if inherited is not None:
            rc.features[index] = new
            rc.locals[index] = True
        else:
            if new.kind != "method":
                size, alignment = new.slot_shape()
                new.offset = align(rc.end, alignment)
                rc.end = new.offset + size
            rc.features.append(new)
            rc.locals.append(True)

    def check_override(self, rc, old, new):
        where = "%s.%s" % (rc.name, new.name)
        if old.kind != new.kind or old.is_array != new.is_array:
            raise SchemaError("%s: override changes the kind or array-ness of %s.%s"
                              % (where, old.owner, old.name))
        if new.kind == "property" and old.type != new.type:
            raise SchemaError("%s: override changes the type %s to %s" % (where, old.type, new.type))
        if new.kind == "reference" and old.ref_class and new.ref_class:
            # Narrowing only: checked once every class is resolved.
            self.pending_narrowing.append((where, old.ref_class, new.ref_class))

    def make_method(self, rc, f):
        params = []
        for p in f.params:
            s = slot_from_decl(p, rc.name)
            s.flags = (s.flags - {"FLAG_KEY"}) | param_flags(p)
            s.default = None
            s.symbol = "meta_%s_%s_%s" % (rc.name, f.name, p.name)
            params.append(s)
        ret = Slot("return_value", "property", f.type, None, False, {"FLAG_PROPERTY", "FLAG_OUT"},
                   None, rc.name, "meta_%s_%s_return_value" % (rc.name, f.name))
        params.append(ret)
        names = [p.name.lower() for p in params]
        if len(set(names)) != len(names):
            raise SchemaError("%s.%s: duplicate parameter names" % (rc.name, f.name))
        on, _ = qualifier_flags(f.quals)
        m = Method(f.name, f.type, {"FLAG_METHOD"} | (on & {"FLAG_STATIC"}), params, rc.name)
        end = HEADER_SIZE
        for p in params:
            size, alignment = p.slot_shape()
            p.offset = align(end, alignment)
            end = p.offset + size
        m.size = align(end, 8)
        return m

    def check_references(self):
        def check_target(where, name):
            if name is not None and name.lower() not in self.classes:
                raise SchemaError("%s refers to undeclared class %s" % (where, name))
        for rc in self.order:
            for f in rc.features:
                slots = f.params if f.kind == "method" else [f]
                for s in slots:
                    if s.kind == "reference":
                        check_target("%s.%s" % (rc.name, s.name), s.ref_class)
        for where, old, new in self.pending_narrowing:
            if not self.is_subclass(self.lookup(old), self.lookup(new)):
                raise SchemaError("%s: %s is not a subclass of %s" % (where, new, old))

    def is_subclass(self, ancestor, rc):
        while rc is not None:
            if rc is ancestor:
                return True
            rc = rc.superclass
        return False


# ---------------------------------------------------------------------------
# C++ emission

GENERATED_NOTE = "// Generated by tools/gen_meta.py from the MOF files of schema/; do not edit.\n"


def flags_expr(flags):
    names = [f for f in FLAG_ORDER if f in flags]
    return " | ".join(names) if names else "0"


def cxx_string(s):
    out = []
    for ch in s:
        if ch in '"\\':
            out.append("\\" + ch)
        elif ch == "\n":
            out.append("\\n")
        elif ord(ch) < 32 or ord(ch) > 126:
            out.append('\\x%02x""' % ord(ch) if ord(ch) < 256 else "?")
        else:
            out.append(ch)
    return '"' + "".join(out) + '"'


def cxx_literal(cim_type, v):
    if cim_type in ("string", "datetime"):
        return cxx_string(str(v))
    if cim_type == "boolean":
        return "true" if v else "false"
    if cim_type == "char16":
        code = ord(v) if isinstance(v, str) else int(v)
        return "char16{%d}" % code
    if cim_type in ("real32", "real64"):
        return repr(float(v)) + ("f" if cim_type == "real32" else "")
    v = int(v) if not isinstance(v, str) else int(v, 0)
    if cim_type == "uint64":
        return "%dULL" % v
    if cim_type == "sint64":
        return "%dLL" % v if v != -(1 << 63) else "(-9223372036854775807LL - 1)"
    if cim_type == "uint32":
        return "%du" % v
    return str(v)


def member_decl(s, schema):
    if s.kind == "reference":
        if s.is_array:
            return "Array<Instance*> %s;" % s.name
        target = schema.lookup(s.ref_class).name if s.ref_class else "Instance"
        return "%s* %s;" % (target, s.name)
    t = CXX_TYPE[s.type]
    return ("Property<Array<%s>> %s;" if s.is_array else "Property<%s> %s;") % (t, s.name)


def ref_targets(slots, schema):
    return sorted({schema.lookup(s.ref_class).name for s in slots
                   if s.kind == "reference" and not s.is_array and s.ref_class})


def emit_class_header(rc, schema):
    slots = [f for f in rc.features if f.kind != "method"]
    methods = [f for f in rc.features if f.kind == "method"]
    own_methods = [m for m in methods if m.owner == rc.name]
    forward = set(ref_targets(slots, schema))
    for m in own_methods:
        forward |= set(ref_targets(m.params, schema))
    forward.discard(rc.name)
    includes = sorted({m.owner for m in methods if m.owner != rc.name})
    out = ["// Instance struct of the CIM class %s%s." % (
        rc.name, ", with its method-call structs" if methods else ""), GENERATED_NOTE,
        "#pragma once\n", '#include "framework/Instance.h"']
    out += ['#include "schema/%s.h"' % name for name in includes]
    out.append("\nnamespace cimple {\n")
    out += ["struct %s;" % name for name in sorted(forward)]
    if forward:
        out.append("")
    out.append("// Every feature, inherited ones included, at its meta-data offset.")
    out.append("struct %s : Instance {" % rc.name)
    out += ["  " + member_decl(s, schema) for s in slots]
    out.append("")
    out.append("  static const Meta_Class static_meta_class;")
    out.append("  static %s* create(bool defaults = false) {" % rc.name)
    out.append("    return static_cast<%s*>(::cimple::create(&static_meta_class, defaults));" % rc.name)
    out.append("  }")
    out.append("  static %s* clone(const %s* instance) {" % (rc.name, rc.name))
    out.append("    return static_cast<%s*>(::cimple::clone(instance));" % rc.name)
    out.append("  }")
    out.append("};\n")
    for m in methods:
        if m.owner != rc.name:
            out.append("using %s_%s_method = %s;" % (rc.name, m.name, m.struct))
            continue
        out.append("// The call record of %s.%s()." % (rc.name, m.name))
        out.append("struct %s : Instance {" % m.struct)
        out += ["  " + member_decl(p, schema) for p in m.params]
        out.append("")
        out.append("  static const Meta_Method static_meta_class;")
        out.append("  static %s* create() {" % m.struct)
        out.append("    return static_cast<%s*>(::cimple::create(&static_meta_class));" % m.struct)
        out.append("  }")
        out.append("};\n")
    out.append("}  // namespace cimple")
    return "\n".join(out) + "\n"


def emit_slot_record(s, schema, default_symbol):
    if s.kind == "reference":
        target = ("&%s::static_meta_class" % schema.lookup(s.ref_class).name
                  if s.ref_class else "&" + ROOT_META_CLASS)
        return ("extern const Meta_Reference %s = {0, %s, %s, 0, nullptr, %d, %s, %d};"
                % (s.symbol, flags_expr(s.flags), cxx_string(s.name), -1 if s.is_array else 0,
                   target, s.offset))
    return ("extern const Meta_Property %s = {0, %s, %s, 0, nullptr, %s, %d, %d, %s};"
            % (s.symbol, flags_expr(s.flags), cxx_string(s.name), s.type.upper(),
               -1 if s.is_array else 0, s.offset, "&" + default_symbol if default_symbol else "nullptr"))


def emit_default(s):
    """Definitions of the default value of a local property, and its symbol."""
    if s.kind != "property" or s.default is None:
        return [], None
    sym = s.symbol + "_default"
    elem = DEFAULT_CXX[s.type]
    if s.is_array:
        values = s.default if isinstance(s.default, list) else [s.default]
        if not values:
            return ["static const Meta_Value %s = {nullptr, 0};" % sym], sym
        lits = ", ".join(cxx_literal(s.type, v) for v in values)
        return ["static const %s %s_data[] = {%s};" % (elem, sym, lits),
                "static const Meta_Value %s = {%s_data, %d};" % (sym, sym, len(values))], sym
    return ["static const %s %s_data = %s;" % (elem, sym, cxx_literal(s.type, s.default)),
            "static const Meta_Value %s = {&%s_data, 1};" % (sym, sym)], sym


def feature_ptr(f):
    if f.kind == "method":
        sym = "%s::static_meta_class" % f.struct
    else:
        sym = f.symbol
    return "reinterpret_cast<const Meta_Feature*>(&%s)" % sym


def emit_offset_checks(name, slots, size):
    out = []
    for s in slots:
        out.append("static_assert(offsetof(%s, %s) == %d);" % (name, s.name, s.offset))
    out.append("static_assert(sizeof(%s) == %d);" % (name, size))
    return out


def emit_class_tables(rc, schema):
    out = ["// ---- %s" % rc.name]
    for f in rc.features:
        if f.owner != rc.name:
            continue
        if f.kind == "method":
            for p in f.params:
                out.append(emit_slot_record(p, schema, None))
            arr = "%s_params" % f.struct
            out.append("static const Meta_Feature* const %s[] = {\n    %s};" % (
                arr, ",\n    ".join(feature_ptr(p) for p in f.params)))
            out.append("const Meta_Method %s::static_meta_class = {0, %s, %s, 0, nullptr, %s, %d, %d, %s};"
                       % (f.struct, flags_expr(f.flags), cxx_string(f.name), arr, len(f.params),
                          f.size, f.return_type.upper()))
            out += emit_offset_checks(f.struct, f.params, f.size)
        else:
            lines, dsym = emit_default(f)
            out += lines
            out.append(emit_slot_record(f, schema, dsym))
    n = len(rc.features)
    if n:
        out.append("static const Meta_Feature* const %s_features[] = {\n    %s};" % (
            rc.name, ",\n    ".join(feature_ptr(f) for f in rc.features)))
        out.append("static const uint8_t %s_locals[] = {%s};" % (
            rc.name, ", ".join("1" if x else "0" for x in rc.locals)))
    sup = "&%s::static_meta_class" % rc.superclass.name if rc.superclass else "nullptr"
    out.append("const Meta_Class %s::static_meta_class = {0, %s, %s, 0, nullptr, %s, %d, %d, %s, %s, %d, "
               "&nrv_meta_repository};" % (
                   rc.name, flags_expr(rc.flags), cxx_string(rc.name),
                   "%s_features" % rc.name if n else "nullptr", n, rc.size,
                   "%s_locals" % rc.name if n else "nullptr", sup, rc.num_keys))
    out += emit_offset_checks(rc.name, [f for f in rc.features if f.kind != "method"], rc.size)
    return "\n".join(out) + "\n"


def emit_decls(schema):
    out = ["// Declarations of every feature record, so that a class's feature array can",
           "// point at records its ancestors define in other translation units.",
           GENERATED_NOTE, "#pragma once\n", '#include "framework/Meta.h"\n', "namespace cimple {\n"]
    for rc in schema.order:
        for f in rc.features:
            if f.owner != rc.name:
                continue
            slots = f.params if f.kind == "method" else [f]
            for s in slots:
                kind = "Meta_Reference" if s.kind == "reference" else "Meta_Property"
                out.append("extern const %s %s;" % (kind, s.symbol))
    out.append("extern const Meta_Class %s;" % ROOT_META_CLASS)
    out.append("\n}  // namespace cimple")
    return "\n".join(out) + "\n"


def emit_chunk(classes, schema):
    out = ["// Static meta-data records of %d classes." % len(classes), GENERATED_NOTE,
           "#include <cstddef>\n", '#include "schema/Classes.h"', '#include "schema/MetaDecls.h"',
           '#include "schema/Repository.h"\n',
           "#pragma GCC diagnostic ignored \"-Winvalid-offsetof\"\n", "namespace cimple {\n"]
    out += [emit_class_tables(rc, schema) for rc in classes]
    out.append("}  // namespace cimple")
    return "\n".join(out) + "\n"


def emit_repository_cpp(schema):
    out = ["// The repository of every class of the module.", GENERATED_NOTE,
           '#include "schema/Classes.h"', '#include "schema/Repository.h"\n', "namespace cimple {\n",
           "static const Meta_Class* const nrv_meta_classes[] = {"]
    out += ["    &%s::static_meta_class," % rc.name for rc in schema.order]
    out.append("};\n")
    out.append("const Meta_Repository nrv_meta_repository = {nrv_meta_classes, %d};\n" % len(schema.order))
    out.append("}  // namespace cimple")
    return "\n".join(out) + "\n"


def emit_repository_h():
    return "\n".join([
        "// The module's class repository: every meta-class the module serves or",
        "// refers to.  Static and read-only for the life of the module.",
        GENERATED_NOTE, "#pragma once\n", '#include "framework/Meta.h"\n', "namespace cimple {\n",
        "extern const Meta_Repository nrv_meta_repository;\n", "}  // namespace cimple", ""])


def emit_classes_h(schema):
    out = ["// Every instance struct of the module's classes.", GENERATED_NOTE, "#pragma once\n"]
    out += ['#include "schema/%s.h"' % rc.name for rc in schema.order]
    return "\n".join(out) + "\n"


def emit_provider_classes(schema, prefix):
    provided = [rc for rc in schema.order if rc.name.startswith(prefix)]

    def xlist(macro, items):
        lines = ["#define %s(X) \\" % macro]
        lines += ["  X(%s) \\" % rc.name for rc in items]
        lines.append("")
        return lines
    out = ["// X-macro lists of the classes that have a provider in this module:",
           "// all of them, the associations and the others.", GENERATED_NOTE, "#pragma once\n"]
    out += xlist("NRV_FOR_EACH_PROVIDER_CLASS", provided)
    out += xlist("NRV_FOR_EACH_ASSOCIATION_PROVIDER_CLASS", [rc for rc in provided if rc.is_association()])
    out += xlist("NRV_FOR_EACH_PLAIN_PROVIDER_CLASS", [rc for rc in provided if not rc.is_association()])
    out.append("#define NRV_PROVIDER_CLASS_COUNT %d" % len(provided))
    return "\n".join(out) + "\n"


def write_if_changed(path, text):
    try:
        with open(path, encoding="utf-8") as f:
            if f.read() == text:
                return
    except OSError:
        pass
    with open(path, "w", encoding="utf-8") as f:
        f.write(text)


def write(path, text):
    with open(path, "w", encoding="utf-8") as f:
        f.write(text)


def generate(mof_files, out_dir, prefix="NRVTAVO_"):
    """Headers are rewritten only when they change, so a schema edit rebuilds
    only what it affects; the .cpp files are the build's declared outputs and
    are always rewritten, so they are newer than every input."""
    schema = Schema(mof.parse_files(mof_files))
    os.makedirs(out_dir, exist_ok=True)
    for rc in schema.order:
        write_if_changed(os.path.join(out_dir, rc.name + ".h"), emit_class_header(rc, schema))
    write_if_changed(os.path.join(out_dir, "Classes.h"), emit_classes_h(schema))
    write_if_changed(os.path.join(out_dir, "Repository.h"), emit_repository_h())
    write_if_changed(os.path.join(out_dir, "MetaDecls.h"), emit_decls(schema))
    write_if_changed(os.path.join(out_dir, "ProviderClasses.h"), emit_provider_classes(schema, prefix))
    per = -(-len(schema.order) // NUM_CHUNKS)
    for i in range(NUM_CHUNKS):
        chunk = schema.order[i * per:(i + 1) * per]
        write(os.path.join(out_dir, "MetaTables_%d.cpp" % i), emit_chunk(chunk, schema))
    write(os.path.join(out_dir, "Repository.cpp"), emit_repository_cpp(schema))
    return schema


def output_names():
    return (["Classes.h", "Repository.h", "MetaDecls.h", "ProviderClasses.h", "Repository.cpp"]
            + ["MetaTables_%d.cpp" % i for i in range(NUM_CHUNKS)])


def main():
    ap = argparse.ArgumentParser(description=__doc__.split("\n")[0])
    ap.add_argument("--out", required=True, help="output folder (generated/schema)")
    ap.add_argument("--stamp", help="file to touch when done (for the build's dependency)")
    ap.add_argument("--list-outputs", action="store_true",
                    help="print the fixed output file names and exit")
    ap.add_argument("mof", nargs="*", help="MOF files")
    args = ap.parse_args()
    if args.list_outputs:
        print(";".join(output_names()))
        return
    try:
        schema = generate(args.mof, args.out)
    except (SchemaError, mof.MofError) as e:
        sys.exit("gen_meta: %s" % e)
    if args.stamp:
        with open(args.stamp, "w") as f:
            f.write("%d classes\n" % len(schema.order))


if __name__ == "__main__":
    main()
