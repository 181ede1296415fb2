"""The module's provider lists and catalogue map groups, read and checked.

The lists file (schema/provider_lists.txt) says, for every provider class of
the schema, who serves it, and for every map of the catalogue, who empties it:

  [adapter catalogue]   catalogue-backed classes read from the adapter catalogue
  [SAN catalogue]       catalogue-backed classes read from the SAN catalogue
  [hand-written]        classes whose provider is written by hand
  [refresh]             hand-written providers that refresh volatile values first
  [not yet built]       hand-written classes still served by the catalogue template
  [clearAdapterMaps G]  the maps clearAdapterMaps empties as group G, in order
  [clearSANMaps G]      the same for clearSANMaps
  [survivors]           maps no rebuild empties

Words are class names, "#" starts a comment.  ProviderLists(path, schema,
prefix) raises ListsError unless: every provider class (prefix) stands in
exactly one of the first three lists and nothing else does; refresh and not
yet built are hand-written; every map (each provider class, and any other
schema class a group names) is in exactly one group or among the survivors;
and the SAN catalogue is exactly what clearSANMaps empties.

Python 3 standard library only.
"""

import re

__all__ = ["ProviderLists", "ListsError"]

SERVED_BY = ("adapter catalogue", "SAN catalogue", "hand-written")
SUBSETS = ("refresh", "not yet built")
SURVIVORS = "survivors"
GROUP = re.compile(r"^(clearAdapterMaps|clearSANMaps) ([A-Z][A-Z0-9_]*)$")


class ListsError(Exception):
    pass


def read_sections(path):
    """[(section, [(word, line)])] in file order."""
    sections, current, seen = [], None, set()
    with open(path, encoding="utf-8") as f:
        for number, raw in enumerate(f, 1):
            line = raw.split("#", 1)[0].strip()
            if not line:
                continue
            if line.startswith("[") and line.endswith("]"):
                name = line[1:-1].strip()
                if name in seen:
                    raise ListsError("%s:%d: section [%s] given twice" % (path, number, name))
                seen.add(name)
                current = (name, [])
                sections.append(current)
            elif current is None:
                raise ListsError("%s:%d: class name before the first section" % (path, number))
            else:
                current[1].extend((w, number) for w in line.split())
    return sections


class ProviderLists:
    def __init__(self, path, schema, prefix):
        self.path = path
        self.lists = {}    # section -> [class name]
        self.groups = []   # (clearing function, group name, [class name]) in file order
        for name, words in read_sections(path):
            names = [self.class_name(schema, w, n) for w, n in words]
            m = GROUP.match(name)
            if m:
                self.groups.append((m.group(1), m.group(2), names))
            elif name in SERVED_BY + SUBSETS + (SURVIVORS,):
                self.lists[name] = names
            else:
                raise ListsError("%s: unknown section [%s]" % (path, name))
        for name in SERVED_BY + SUBSETS + (SURVIVORS,):
            self.lists.setdefault(name, [])
        self.provider_classes = [rc.name for rc in schema.order if rc.name.startswith(prefix)]
        self.check_served()
        self.check_groups()

    def class_name(self, schema, word, line):
        try:
            return schema.lookup(word).name
        except KeyError:
            raise ListsError("%s:%d: %s is not a class of the schema" % (self.path, line, word)) from None

    def once(self, entries, what):
        """{class: where} from (class, where) pairs; a class twice is an error."""
        found = {}
        for c, where in entries:
            if c in found:
                raise ListsError("%s: %s is in %s and in %s; %s" % (self.path, c, found[c], where, what))
            found[c] = where
        return found

    def check_served(self):
        served = self.once([(c, "[%s]" % s) for s in SERVED_BY for c in self.lists[s]],
                           "a class has one provider")
        for c in self.provider_classes:
            if c not in served:
                raise ListsError("%s: provider class %s is in none of %s" % (
                    self.path, c, ", ".join("[%s]" % s for s in SERVED_BY)))
        for c, where in served.items():
            if c not in self.provider_classes:
                raise ListsError("%s: %s in %s is not a provider class" % (self.path, c, where))
        hand = set(self.lists["hand-written"])
        for s in SUBSETS:
            self.once([(c, "[%s]" % s) for c in self.lists[s]], "a class is listed once")
            for c in self.lists[s]:
                if c not in hand:
                    raise ListsError("%s: %s in [%s] is not hand-written" % (self.path, c, s))

    def check_groups(self):
        entries = [(c, "[%s %s]" % (fn, g)) for fn, g, names in self.groups for c in names]
        entries += [(c, "[%s]" % SURVIVORS) for c in self.lists[SURVIVORS]]
        emptied = self.once(entries, "a map is emptied by one group or survives")
        for c in self.provider_classes:
            if c not in emptied:
                raise ListsError("%s: the map of %s is in no clearing group and not among the survivors"
                                 % (self.path, c))
        san = {c for fn, _, names in self.groups if fn == "clearSANMaps" for c in names}
        if san != set(self.lists["SAN catalogue"]):
            odd = sorted(san.symmetric_difference(self.lists["SAN catalogue"]))
            raise ListsError("%s: the SAN catalogue and the maps clearSANMaps empties differ in %s"
                             % (self.path, ", ".join(odd)))

    def served(self, section):
        return list(self.lists[section])

    def own_providers(self):
        """Hand-written classes whose provider exists."""
        unbuilt = set(self.lists["not yet built"])
        return [c for c in self.lists["hand-written"] if c not in unbuilt]
