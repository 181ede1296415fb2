"""What a CIMOM is told about the module, written from the resolved schema.

- the SFCB provider registration: one entry per class the module serves (the
  classes of the generated provider lists), typed "instance method" plus
  "association" for association classes, in the namespaces its instances
  live in;
- the module's MOF for each namespace: every module class for the module's
  namespace; for the interop namespace the classes registered there and the
  module classes they derive from or refer to (DMTF classes come from the
  DMTF declarations or the CIMOM's schema);
- repository.json, the class repository the CIMOM stand-in (host/) reads:
  every class with its superclass, whether it is an association, its keys
  with their types and the namespaces it is declared in, so that the stand-in
  checks object paths and fans a request on a superclass out to the module's
  subclasses as a CIMOM does.

Where instances live: registered profiles (CIM_RegisteredProfile and its
subclasses) in the interop namespace, everything else in the module's
namespace; an association lives in the namespaces of the objects it links, so
that associator and reference requests from either end reach it.

Python 3 standard library only.
"""

import json
import os

import mof

__all__ = ["NAMESPACE", "INTEROP_NAMESPACE", "namespaces_of", "write_share"]

NAMESPACE = "root/norvane"
INTEROP_NAMESPACE = "root/pg_interop"
INTEROP_ROOT = "CIM_RegisteredProfile"
DMTF_PREFIX = "CIM_"
EMBEDDED_FLAGS = {"FLAG_EMBEDDED_INSTANCE", "FLAG_EMBEDDED_OBJECT"}


def is_reference(slot):
    return slot.kind == "reference" and not (slot.flags & EMBEDDED_FLAGS)


def slots(rc):
    return [f for f in rc.features if f.kind != "method"]


def home_of(class_name, schema):
    interop = schema.classes.get(INTEROP_ROOT.lower())
    target = schema.lookup(class_name)
    if interop is not None and schema.is_subclass(interop, target):
        return INTEROP_NAMESPACE
    return NAMESPACE


def namespaces_of(rc, schema):
    """The namespaces the instances of a class live in, the module's first."""
    if rc.is_association():
        homes = {home_of(s.ref_class, schema) for s in slots(rc) if is_reference(s) and s.ref_class}
    else:
        homes = {home_of(rc.name, schema)}
    return [ns for ns in (NAMESPACE, INTEROP_NAMESPACE) if ns in homes] or [NAMESPACE]


def classes_used_by(rc):
    """Classes a declaration needs: superclass, reference, embedded-instance and
    parameter classes."""
    used = [rc.superclass.name] if rc.superclass else []
    for f in rc.features:
        for s in (f.params if f.kind == "method" else [f]):
            if s.kind == "reference" and s.ref_class:
                used.append(s.ref_class)
    return used


def declared_in(schema, provided, with_platform=False):
    """Namespace -> lower-case names of the classes declared there: everything in the
    module's namespace, the closure of what is registered elsewhere.  `with_platform`
    adds the classes whose instances live elsewhere though the module does not serve
    them (the platform's own registered profiles, which the module asks for in the
    interop namespace): the CIMOM's schema declares those, never the module's MOF."""
    out = {NAMESPACE: set(schema.classes)}
    for ns in (INTEROP_NAMESPACE,):
        todo = [rc.name for rc in provided if ns in namespaces_of(rc, schema)]
        if with_platform:
            todo += [rc.name for rc in schema.order if not rc.is_association() and home_of(rc.name, schema) == ns]
        seen = set()
        while todo:
            rc = schema.lookup(todo.pop())
            if rc.name.lower() not in seen:
                seen.add(rc.name.lower())
                todo.extend(classes_used_by(rc))
        out[ns] = seen
    return out


def registration_text(provided, schema, location):
    out = ["# SFCB provider registration of %s: one entry per provider." % location,
           "# Generated from the module's class schema; do not edit.", ""]
    for rc in provided:
        kinds = "instance association method" if rc.is_association() else "instance method"
        out += ["[%s]" % rc.name,
                "   provider: %s_Provider" % rc.name,
                "   location: %s" % location,
                "   type: %s" % kinds,
                "   namespace: %s" % " ".join(namespaces_of(rc, schema)),
                ""]
    return "\n".join(out)


def module_mof(schema, names, location, ns):
    """The module's own classes declared in `ns`, superclasses first."""
    text = ["// %s: the module's classes in %s." % (location, ns),
            "// Generated from the module's class schema; do not edit.", ""]
    text += [mof.format_class(rc.decl) for rc in schema.order
             if rc.name.lower() in names and not rc.name.startswith(DMTF_PREFIX)]
    return "\n".join(text)


def key_record(slot):
    if is_reference(slot):
        return {"name": slot.name, "type": "ref", "class": slot.ref_class}
    return {"name": slot.name, "type": slot.type + ("[]" if slot.is_array else "")}


def repository_json(schema, declared):
    classes = []
    for rc in schema.order:
        low = rc.name.lower()
        classes.append({
            "name": rc.name,
            "superclass": rc.superclass.name if rc.superclass else None,
            "association": rc.is_association(),
            "keys": [key_record(s) for s in slots(rc) if "FLAG_KEY" in s.flags],
            "namespaces": [ns for ns, names in declared.items() if low in names],
        })
    return json.dumps({"classes": classes}, indent=1) + "\n"


def mof_file_name(location, ns):
    return location + ".mof" if ns == NAMESPACE else "%s_%s.mof" % (location, ns.split("/")[-1])


def share_files(schema, provided, location):
    """File name (relative to the share folder) -> text."""
    declared = declared_in(schema, provided)
    files = {location + ".reg": registration_text(provided, schema, location),
             "repository.json": repository_json(schema, declared_in(schema, provided, with_platform=True))}
    for ns, names in declared.items():
        files[os.path.join("mof", mof_file_name(location, ns))] = module_mof(schema, names, location, ns)
    return files


def write_share(share_dir, schema, provided, location, write):
    for name, text in share_files(schema, provided, location).items():
        path = os.path.join(share_dir, name)
        os.makedirs(os.path.dirname(path), exist_ok=True)
        write(path, text)
