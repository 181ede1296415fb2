"""The module's class schema resolved into meta-data records and instance layout.

Schema(classes) takes the class declarations that mof.py parsed and resolves
each class: its flags, its feature list (inherited features first, in schema
order; an overriding declaration replaces the inherited entry in place), its
key count and the byte layout of its instances and method-call records.

Layout rule: a 24-byte instance header; then every new feature slot in
declaration order, each placed like the C struct { T value; uint8_t null; }
at the next offset aligned to alignof(T); references are bare pointers (or
Array handles) with no null flag; the record size rounds up to 8.  An
overriding declaration keeps its ancestor's slot, so an instance of a
subclass can be read through any ancestor's meta-data.  Embedded instances
and embedded objects are held as references to their class.

Python 3 standard library only.
"""

__all__ = ["Schema", "SchemaError", "Slot", "Method", "ResolvedClass", "HEADER_SIZE"]

HEADER_SIZE = 24

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
KIND_FLAGS = {"FLAG_PROPERTY", "FLAG_REFERENCE", "FLAG_METHOD"}
# Class qualifier -> flag.  All but Abstract pass to subclasses.
CLASS_QUALIFIERS = {"association": "FLAG_ASSOCIATION", "aggregation": "FLAG_AGGREGATION",
                    "indication": "FLAG_INDICATION", "exception": "FLAG_EXCEPTION",
                    "abstract": "FLAG_ABSTRACT"}
INHERITED_CLASS_FLAGS = {"FLAG_ASSOCIATION", "FLAG_AGGREGATION", "FLAG_INDICATION",
                         "FLAG_EXCEPTION"}

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
        rc.flags = self.class_flags(decl, rc.flags)
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

    @staticmethod
    def class_flags(decl, inherited):
        """Association, Aggregation, Indication and Exception pass to
        subclasses; Abstract belongs to the class that states it.  A class is
        either an association or an ordinary class ("Class")."""
        flags = set(inherited)
        for qualifier, flag in CLASS_QUALIFIERS.items():
            value = decl.quals.get(qualifier)
            if value is False:
                flags.discard(flag)
            elif value is not None:
                flags.add(flag)
        if "FLAG_ASSOCIATION" in flags:
            flags.add("FLAG_ASSOCIATION")
        else:
            flags.discard("FLAG_AGGREGATION")
            flags.add("FLAG_CLASS")
        return flags

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
