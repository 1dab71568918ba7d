"""The schema generator's reading of MOF: the rules it applies and the
mistakes in the module's MOF that it refuses."""

import os
import sys
import unittest

sys.dont_write_bytecode = True
sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)),
                                "..", "..", "tools", "schemagen"))

import emit_mof  # noqa: E402
import model  # noqa: E402
import mof  # noqa: E402

BASE = """
[Abstract] class CIM_A {
   [Key] string Id;
   [Write] uint16 Level = 3;
   [Experimental] string Note;
   uint32 Act([IN] string In1, [OUT] string InOut, [IN ( false ), OUT] CIM_A REF Out1);
};
[Association] class CIM_Link {
   [Key] CIM_A REF Left;
   [Key] CIM_A REF Right;
};
"""
F = model.FLAG


def build(own, base=BASE):
    return model.build(mof.parse(base, "base.mof"), mof.parse(own, "own.mof"))


class Rules(unittest.TestCase):
    def test_redeclaration_keeps_position_and_inherited_qualifiers(self):
        s = build("""
            class T_A : CIM_A {
               string Extra;
               [Override ( "Note" )] string Note;
               [Override ( "Level" ), Write ( false )] uint16 Level;
            };""")
        t = s.get("T_A")
        self.assertEqual([f.name for f in t.features], ["Id", "Level", "Note", "Act", "Extra"])
        self.assertEqual(t.locals, [False, True, True, False, True])
        level, note = t.features[1], t.features[2]
        # Write(false) clears the inherited flag; Experimental is not inherited.
        self.assertEqual(level.flags, F["property"])
        self.assertEqual(note.flags, F["property"])
        # A redeclaration without a value has no default.
        self.assertIsNone(level.default)
        self.assertEqual(s.get("CIM_A").features[1].default, 3)
        self.assertEqual(t.flags, F["class"])  # Abstract is not inherited


class Refused(unittest.TestCase):
    def refused(self, own, text):
        with self.assertRaises(mof.MofError) as e:
            build(own)
        self.assertIn(text, str(e.exception))

    def test_mistakes(self):
        self.refused('class T : CIM_A { [Vendorish] string X; };', "not a standard qualifier")
        self.refused('class T : CIM_A { [Override ( "Level" )] uint32 Level; };', "another type")
        self.refused('class T : CIM_A { [Override ( "Nope" )] string Nope; };', "overrides nothing")
        self.refused('class T : CIM_Link { };', "must repeat the Association")
        self.refused('[Association] class T : CIM_Link { [Override ( "Left" )] CIM_Link REF Left; };',
                     "not a subclass")
        self.refused('class T2 : T1 { }; class T1 : CIM_A { };', "before its declaration")
        self.refused('class T : CIM_A { uint16 X = 70000; };', "does not fit")
        self.refused('class T : CIM_A { datetime D = "2020"; };', "does not fit")
        self.refused('class T : CIM_Nope { };', "unknown superclass")
        self.refused('class T : CIM_A { string X; string x; };', "declared twice")


class ClassFiles(unittest.TestCase):
    """The DMTF classes written back for a CIM server's compiler."""

    # Referencing and embedding classes come first in the file, as in the
    # DMTF file the module is generated from.
    DMTF = """
        [Association, Version ( "2.1.0" )] class CIM_Uses {
           [Key] CIM_Thing REF Antecedent;
           [Key] CIM_Part REF Dependent;
        };
        [Abstract] class CIM_Thing {
           [Key, Description ( "x" )] string Id;
           [Write] uint16 Level = 3;
           string Names[] = {"a \\"b\\""};
           [Experimental] datetime Since = "00000000000500.000000:000";
           uint32 Act([IN ( false ), OUT, EmbeddedInstance ( "CIM_Note" )] string Note,
                      [IN] CIM_Part REF Where);
        };
        class CIM_Note { string Text; };
        class CIM_Part : CIM_Thing { };
    """

    def test_written_back_in_loading_order_with_the_same_model(self):
        decls = mof.parse(self.DMTF.replace("Description ( \"x\" )", "Required"), "dmtf.mof")
        text = emit_mof.classes_mof(decls)
        again = mof.parse(text, "written.mof")
        order = [d.name for d in again]
        self.assertEqual(order, ["CIM_Note", "CIM_Thing", "CIM_Part", "CIM_Uses"])

        def features(schema):
            return [(c.name, [(f.name, f.flags, f.default, f.ref_class, f.subscript,
                               [(p.name, p.flags, p.ref_class) for p in f.params])
                              for f in c.features])
                    for c in sorted(schema.classes, key=lambda c: c.name)]
        self.assertEqual(features(model.build(again, [])), features(model.build(decls, [])))

    def test_qualifiers_declared_and_classes_loadable(self):
        decls = mof.parse(self.DMTF, "dmtf.mof")
        with self.assertRaises(mof.MofError) as e:
            emit_mof.files(decls, [])
        self.assertIn("no declaration for qualifier Description", str(e.exception))
        used = emit_mof.qualifiers_mof(emit_mof._used_qualifiers(
            mof.parse(self.DMTF.replace("Description ( \"x\" )", "Required"), "dmtf.mof")))
        self.assertIn("Qualifier In : boolean = true, Scope(parameter)", used)
        self.assertNotIn("Qualifier Counter", used)
        circle = mof.parse("class CIM_P { CIM_Q REF Q; }; class CIM_Q { CIM_P REF P; };", "c.mof")
        with self.assertRaises(mof.MofError) as e:
            emit_mof.dependency_order(circle)
        self.assertIn("in a circle", str(e.exception))


if __name__ == "__main__":
    unittest.main()
