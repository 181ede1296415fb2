"""Checks of the schema resolution and layout rule on small hand-written MOF.

Run by ctest (schema_generator_test) with the tools folder on sys.path.
"""

import json
import os
import sys
import tempfile
import unittest

sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)), "..", "..", "tools"))
import gen_meta  # noqa: E402
import mof  # noqa: E402
from meta_model import Schema, SchemaError  # noqa: E402
from provider_lists import ListsError, ProviderLists  # noqa: E402

BASE = """
[Abstract] class T_Root { [Key] string Id; uint64 Gen; };
class T_All : T_Root {
  boolean B; uint8 U8; sint8 S8; uint16 U16; sint16 S16; char16 C; uint32 U32; sint32 S32;
  real32 R32; uint64 U64; sint64 S64; real64 R64; string S; datetime D; uint16 A[];
};
[Association, Abstract] class T_Link { [Key] T_Root REF Left; [Key] T_Root REF Right; };
[Association, Aggregation] class T_Whole : T_Link {
  [Override ( "Left" )] T_All REF Left;
  uint16 Weight = 3;
};
class T_Sub : T_Whole { };
"""


def schema(text):
    return Schema(mof.parse_text(text))


def offsets(rc):
    return {f.name: f.offset for f in rc.features if f.kind != "method"}


class LayoutRule(unittest.TestCase):
    def test_each_type_takes_the_slot_of_value_plus_null_flag(self):
        s = schema(BASE)
        got = offsets(s.lookup("T_All"))
        # header 24; Id 24..40; Gen 40..56; then the scalars in order.
        want = {"Id": 24, "Gen": 40, "B": 56, "U8": 58, "S8": 60, "U16": 62, "S16": 66, "C": 70,
                "U32": 76, "S32": 84, "R32": 92, "U64": 104, "S64": 120, "R64": 136, "S": 152,
                "D": 168, "A": 184}
        self.assertEqual(got, want)
        self.assertEqual(s.lookup("T_All").size, 200)

    def test_references_are_bare_pointers(self):
        s = schema(BASE)
        whole = s.lookup("T_Whole")
        self.assertEqual(offsets(whole), {"Left": 24, "Right": 32, "Weight": 40})
        self.assertEqual(whole.size, 48)

    def test_size_rounds_up_to_eight(self):
        s = schema("class T_One { boolean B; };")
        self.assertEqual(s.lookup("T_One").size, 32)

    def test_method_records_end_with_the_return_value(self):
        s = schema("""class T_S { uint32 Go([IN] uint16 A, [IN ( false ), OUT] T_S REF Job,
                                           [IN] datetime When, uint8 Data[]); };""")
        go = s.lookup("T_S").features[0]
        self.assertEqual([(p.name, p.offset) for p in go.params],
                         [("A", 24), ("Job", 32), ("When", 40), ("Data", 56), ("return_value", 72)])
        self.assertEqual(go.size, 80)
        flags = {p.name: p.flags for p in go.params}
        self.assertIn("FLAG_IN", flags["A"])
        self.assertNotIn("FLAG_IN", flags["Job"])
        self.assertIn("FLAG_OUT", flags["Job"])
        self.assertIn("FLAG_IN", flags["Data"])  # In is the default
        self.assertEqual(flags["return_value"], {"FLAG_PROPERTY", "FLAG_OUT"})


class Inheritance(unittest.TestCase):
    def test_override_keeps_slot_and_key_and_narrows_class(self):
        s = schema(BASE)
        left = s.lookup("T_Whole").features[0]
        self.assertEqual((left.name, left.offset, left.ref_class), ("Left", 24, "T_All"))
        self.assertIn("FLAG_KEY", left.flags)
        self.assertEqual(s.lookup("T_Whole").locals, [True, False, True])
        self.assertEqual(s.lookup("T_Whole").num_keys, 2)

    def test_class_flags(self):
        s = schema(BASE)
        self.assertEqual(s.lookup("T_Root").flags, {"FLAG_CLASS", "FLAG_ABSTRACT"})
        self.assertEqual(s.lookup("T_Link").flags, {"FLAG_ASSOCIATION", "FLAG_ABSTRACT"})
        # Association and Aggregation pass on, Abstract does not.
        self.assertEqual(s.lookup("T_Sub").flags, {"FLAG_ASSOCIATION", "FLAG_AGGREGATION"})

    def test_defaults_pass_to_subclasses(self):
        s = schema(BASE)
        weight = s.lookup("T_Sub").features[2]
        self.assertEqual((weight.name, weight.default, weight.owner), ("Weight", 3, "T_Whole"))

    def test_embedded_instances_become_references(self):
        s = schema("""class T_E { [EmbeddedInstance ( "T_E" )] string One;
                                  [EmbeddedObject] string Many[]; };""")
        one, many = s.lookup("T_E").features
        self.assertEqual((one.kind, one.ref_class, one.offset), ("reference", "T_E", 24))
        self.assertIn("FLAG_EMBEDDED_INSTANCE", one.flags)
        self.assertEqual((many.kind, many.ref_class, many.is_array), ("reference", None, True))
        self.assertIn("FLAG_EMBEDDED_OBJECT", many.flags)


class Errors(unittest.TestCase):
    def test_an_override_may_not_change_the_type(self):
        with self.assertRaises(SchemaError):
            schema("class T_A { uint16 X; }; class T_B : T_A { uint32 X; };")

    def test_an_override_may_only_narrow_a_reference(self):
        with self.assertRaises(SchemaError):
            schema(BASE + "class T_X { }; class T_Bad : T_Link { [Override ( \"Left\" )] T_X REF Left; };")

    def test_undeclared_classes_are_reported(self):
        with self.assertRaises(SchemaError):
            schema("class T_A : T_Missing { };")
        with self.assertRaises(SchemaError):
            schema("class T_A { T_Missing REF R; };")

    def test_duplicates_are_reported(self):
        with self.assertRaises(SchemaError):
            schema("class T_A { }; class T_A { };")
        with self.assertRaises(SchemaError):
            schema("class T_A { string X; uint8 x; };")


class Output(unittest.TestCase):
    def test_generated_files_name_every_class(self):
        with tempfile.TemporaryDirectory() as out:
            src = os.path.join(out, "t.mof")
            with open(src, "w") as f:
                f.write(BASE.replace("T_", "NRVTAVO_"))
            gen_meta.generate([src], out)
            names = set(os.listdir(out))
            for expected in ("NRVTAVO_All.h", "Classes.h", "Repository.h", "ProviderClasses.h",
                             "MetaDecls.h", "Repository.cpp", "MetaTables_0.cpp"):
                self.assertIn(expected, names)
            with open(os.path.join(out, "ProviderClasses.h")) as f:
                text = f.read()
            self.assertIn("X(NRVTAVO_Whole)", text.split("NRV_FOR_EACH_ASSOCIATION_PROVIDER_CLASS")[1]
                          .split("#define")[0])
            self.assertNotIn("X(NRVTAVO_All)", text.split("NRV_FOR_EACH_ASSOCIATION_PROVIDER_CLASS")[1]
                             .split("#define")[0])
            with open(os.path.join(out, "NRVTAVO_Whole.h")) as f:
                header = f.read()
            self.assertIn("NRVTAVO_All* Left;", header)
            self.assertIn("NRVTAVO_Root* Right;", header)
            self.assertIn("Property<uint16> Weight;", header)


LISTS_SCHEMA = """
class P_Host { [Key] string Id; };
class NRVTAVO_A { [Key] string Id; };
class NRVTAVO_S { [Key] string Id; };
class NRVTAVO_H { [Key] string Id; };
class NRVTAVO_R { [Key] string Id; };
"""
LISTS = """# a valid set
[adapter catalogue]
NRVTAVO_A
[SAN catalogue]
NRVTAVO_S
[hand-written]
NRVTAVO_H
NRVTAVO_R
[refresh]
NRVTAVO_R
[not yet built]
NRVTAVO_R   # served by the template meanwhile
[clearAdapterMaps HOST]
P_Host
[clearAdapterMaps MAIN]
NRVTAVO_A
NRVTAVO_R
[clearSANMaps SAN]
NRVTAVO_S
[survivors]
NRVTAVO_H
"""


class Lists(unittest.TestCase):
    def lists(self, text):
        with tempfile.TemporaryDirectory() as d:
            path = os.path.join(d, "lists.txt")
            with open(path, "w") as f:
                f.write(text)
            return ProviderLists(path, schema(LISTS_SCHEMA), "NRVTAVO_")

    def test_valid_lists_give_the_sets_and_groups_in_order(self):
        lists = self.lists(LISTS)
        self.assertEqual(lists.own_providers(), ["NRVTAVO_H"])
        self.assertEqual([(fn, g) for fn, g, _ in lists.groups],
                         [("clearAdapterMaps", "HOST"), ("clearAdapterMaps", "MAIN"), ("clearSANMaps", "SAN")])

    CASES = [  # (edits of the valid lists, expected error)
        ([("[adapter catalogue]\nNRVTAVO_A", "[adapter catalogue]")], "NRVTAVO_A is in none of"),
        ([("[SAN catalogue]\nNRVTAVO_S", "[SAN catalogue]\nNRVTAVO_S\nNRVTAVO_A")],
         "is in [adapter catalogue] and in [SAN catalogue]; a class has one provider"),
        ([("NRVTAVO_R\n[refresh]", "NRVTAVO_R\nP_Host\n[refresh]")], "P_Host in [hand-written] is not a provider"),
        ([("[refresh]\nNRVTAVO_R", "[refresh]\nNRVTAVO_A")], "NRVTAVO_A in [refresh] is not hand-written"),
        ([("[survivors]\nNRVTAVO_H", "[survivors]")], "map of NRVTAVO_H is in no clearing group"),
        ([("[survivors]\nNRVTAVO_H", "[survivors]\nNRVTAVO_H\nNRVTAVO_A")],
         "NRVTAVO_A is in [clearAdapterMaps MAIN] and in [survivors]; a map is emptied by one group"),
        ([("[clearAdapterMaps MAIN]\nNRVTAVO_A", "[clearAdapterMaps MAIN]"),
          ("[clearSANMaps SAN]\nNRVTAVO_S", "[clearSANMaps SAN]\nNRVTAVO_S\nNRVTAVO_A")],
         "the SAN catalogue and the maps clearSANMaps empties differ in NRVTAVO_A"),
        ([("[survivors]", "[survivor]")], "unknown section [survivor]"),
        ([("NRVTAVO_R   #", "NRVTAVO_Q   #")], ":12: NRVTAVO_Q is not a class of the schema"),
        ([("[survivors]", "[refresh]")], "section [refresh] given twice"),
    ]

    def test_each_broken_rule_is_named(self):
        for edits, message in self.CASES:
            with self.subTest(message=message):
                text = LISTS
                for old, new in edits:
                    self.assertIn(old, text)
                    text = text.replace(old, new, 1)
                with self.assertRaises(ListsError) as caught:
                    self.lists(text)
                self.assertIn(message, str(caught.exception))


# A profile in the interop namespace, an element, and the association between them.
INTEROP = """
class CIM_ManagedElement { string Caption; };
class CIM_RegisteredProfile : CIM_ManagedElement { [Key] string InstanceID; };
[Association] class CIM_ElementConformsToProfile {
  [Key] CIM_RegisteredProfile REF ConformantStandard; [Key] CIM_ManagedElement REF ManagedElement; };
class NRVTAVO_Profile : CIM_RegisteredProfile { };
class PG_Profile : CIM_RegisteredProfile { };
class NRVTAVO_Port : CIM_ManagedElement { [Key] string DeviceID; uint16 Speed; };
class NRVTAVO_Setting : CIM_ManagedElement { [Key] string InstanceID; };
[Association] class NRVTAVO_PortConforms : CIM_ElementConformsToProfile {
  [Override ( "ConformantStandard" )] NRVTAVO_Profile REF ConformantStandard;
  [Override ( "ManagedElement" )] NRVTAVO_Port REF ManagedElement; };
"""


class CimomView(unittest.TestCase):
    def share(self):
        with tempfile.TemporaryDirectory() as out:
            src = os.path.join(out, "t.mof")
            with open(src, "w") as f:
                f.write(INTEROP)
            gen_meta.generate([src], out, share_dir=os.path.join(out, "share"), location="mod")
            files = {}
            for root, _, names in os.walk(os.path.join(out, "share")):
                for n in names:
                    with open(os.path.join(root, n)) as f:
                        files[os.path.relpath(os.path.join(root, n), os.path.join(out, "share"))] = f.read()
            return files

    def test_registration_names_each_provider_with_its_types_and_namespaces(self):
        entries = {}
        for block in self.share()["mod.reg"].split("[")[1:]:
            name, body = block.split("]", 1)
            entries[name] = dict(line.strip().split(": ", 1) for line in body.strip().splitlines())
        self.assertEqual(sorted(entries), ["NRVTAVO_Port", "NRVTAVO_PortConforms", "NRVTAVO_Profile",
                                           "NRVTAVO_Setting"])
        self.assertEqual(entries["NRVTAVO_Port"], {
            "provider": "NRVTAVO_Port_Provider", "location": "mod", "type": "instance method",
            "namespace": "root/norvane"})
        self.assertEqual(entries["NRVTAVO_Profile"]["namespace"], "root/pg_interop")
        self.assertEqual(entries["NRVTAVO_PortConforms"]["type"], "instance association method")
        self.assertEqual(entries["NRVTAVO_PortConforms"]["namespace"], "root/norvane root/pg_interop")

    def test_interop_mof_and_repository_hold_what_the_interop_classes_need(self):
        files = self.share()
        interop = files[os.path.join("mof", "mod_pg_interop.mof")]
        self.assertIn("class NRVTAVO_Port : CIM_ManagedElement", interop)
        self.assertNotIn("NRVTAVO_Setting", interop)
        self.assertNotIn("class CIM_", interop)
        self.assertIn("class NRVTAVO_Setting", files[os.path.join("mof", "mod.mof")])
        classes = {c["name"]: c for c in json.loads(files["repository.json"])["classes"]}
        self.assertEqual(classes["NRVTAVO_Setting"]["namespaces"], ["root/norvane"])
        self.assertEqual(classes["CIM_ManagedElement"]["namespaces"], ["root/norvane", "root/pg_interop"])
        self.assertEqual(classes["NRVTAVO_PortConforms"]["keys"], [
            {"name": "ConformantStandard", "type": "ref", "class": "NRVTAVO_Profile"},
            {"name": "ManagedElement", "type": "ref", "class": "NRVTAVO_Port"}])
        self.assertEqual(classes["NRVTAVO_Port"]["superclass"], "CIM_ManagedElement")
        # The platform's registered profiles are asked for in the interop namespace,
        # where the CIMOM's schema (never the module's MOF) declares them.
        self.assertEqual(classes["PG_Profile"]["namespaces"], ["root/norvane", "root/pg_interop"])
        self.assertNotIn("PG_Profile", interop)


if __name__ == "__main__":
    unittest.main()
