"""The DMTF classes the module builds on, written back as MOF that a CIM
server's compiler loads as it is: the declarations of the qualifiers they use
in one file, and the classes in another, each class after every class it
names (superclass, referenced classes, embedded-instance classes, in
properties and method parameters alike).

The two are apart because some servers compile their own qualifier
declarations into every namespace and refuse to see one declared again;
servers whose new namespaces start empty load the qualifiers first.
"""

from model import ROOT
from mof import MofError

QUALIFIERS_FILE = "schema/generated/dmtf_qualifiers.mof"
CLASSES_FILE = "schema/generated/dmtf_classes.mof"

# The DMTF declarations of the standard qualifiers the class files use.
# A qualifier used without a declaration here is an error, so that the
# files never reach a server that would not know it.
DECLARATIONS = [
    ("Abstract", "boolean = false", "class, association, indication", "EnableOverride, Restricted"),
    ("Aggregate", "boolean = false", "reference", "DisableOverride, ToSubclass"),
    ("Aggregation", "boolean = false", "association", "DisableOverride, ToSubclass"),
    ("Association", "boolean = false", "association", "DisableOverride, ToSubclass"),
    ("Composition", "boolean = false", "association", "DisableOverride, ToSubclass"),
    ("Counter", "boolean = false", "property, method, parameter", None),
    ("EmbeddedInstance", "string = null", "property, method, parameter", None),
    ("EmbeddedObject", "boolean = false", "property, method, parameter", "DisableOverride, ToSubclass"),
    ("Exception", "boolean = false", "class, indication", "DisableOverride, ToSubclass"),
    ("Experimental", "boolean = false", "any", "EnableOverride, Restricted"),
    ("Gauge", "boolean = false", "property, method, parameter", None),
    ("In", "boolean = true", "parameter", "DisableOverride, ToSubclass"),
    ("Indication", "boolean = false", "class, indication", "DisableOverride, ToSubclass"),
    ("Key", "boolean = false", "property, reference", "DisableOverride, ToSubclass"),
    ("OctetString", "boolean = false", "property, method, parameter", "DisableOverride, ToSubclass"),
    ("Out", "boolean = false", "parameter", "DisableOverride, ToSubclass"),
    ("Override", "string = null", "property, reference, method", "EnableOverride, Restricted"),
    ("Required", "boolean = false", "property, reference, method, parameter", "DisableOverride, ToSubclass"),
    ("Version", "string = null", "class, association, indication", "EnableOverride, Restricted, Translatable"),
    ("Weak", "boolean = false", "reference", "DisableOverride, ToSubclass"),
    ("Write", "boolean = false", "property", None),
]
DECLARED = {d[0].lower(): d for d in DECLARATIONS}


def _items(decl):
    """The class, its properties and methods, and their parameters."""
    yield decl
    for p in decl.properties:
        yield p
    for m in decl.methods:
        yield m
        for p in m.params:
            yield p


def _used_qualifiers(decls):
    used = {}
    for d in decls:
        for item in _items(d):
            for key, q in item.qualifiers.items():
                if key not in DECLARED:
                    raise MofError("%s:%d: no declaration for qualifier %s" % (d.source, q.line, q.name))
                used[key] = DECLARED[key]
    return [d for d in DECLARATIONS if d[0].lower() in used]


def _string(text):
    out = []
    for c in text:
        if c in '"\\':
            out.append("\\" + c)
        elif c == "\n":
            out.append("\\n")
        elif c == "\t":
            out.append("\\t")
        elif ord(c) < 0x20:
            out.append("\\x%04x" % ord(c))
        else:
            out.append(c)
    return '"%s"' % "".join(out)


def _value(v):
    if v is None:
        return "null"
    if isinstance(v, bool):
        return "true" if v else "false"
    if isinstance(v, (int, float)):
        return repr(v)
    if isinstance(v, str):
        return _string(v)
    if isinstance(v, list):
        return "{%s}" % ", ".join(_value(x) for x in v)
    raise MofError("cannot write the value %r as MOF" % (v,))


def _qualifier_list(item):
    if not item.qualifiers:
        return ""
    parts = []
    for key, q in item.qualifiers.items():
        name = DECLARED[key][0]
        parts.append(name if q.value is True else "%s ( %s )" % (name, _value(q.value)))
    return "[%s] " % ", ".join(parts)


def _subscript(n):
    return "" if n == 0 else "[]" if n < 0 else "[%d]" % n


def _typed(p):
    kind = "%s REF" % p.ref_class if p.ref_class else p.type_name
    return "%s %s%s" % (kind, p.name, _subscript(p.subscript))


def _named_classes(decl):
    """(class, must_come_first) for each class a declaration names: its
    superclass and the classes of its properties must be known before it;
    those of method parameters are put before it where that is possible
    (a method may name a subclass of its own class)."""
    names = [(decl.superclass, True)] if decl.superclass else []
    for item in _items(decl):
        hard = item is decl or item in decl.properties
        if getattr(item, "ref_class", None):
            names.append((item.ref_class, hard))
        emb = item.qualifier("EmbeddedInstance")
        if emb is not None and isinstance(emb.value, str):
            names.append((emb.value, hard))
    return [(n, hard) for n, hard in names if n.lower() != ROOT.lower()]


def dependency_order(decls):
    """The declarations with every class after those it names (file order
    otherwise). A circle of classes that must come first is an error: no
    compiler could load it."""
    by_name = {d.name.lower(): d for d in decls}
    for d in decls:
        for n, _ in _named_classes(d):
            if n.lower() not in by_name:
                raise MofError("%s:%d: %s names unknown class %s" % (d.source, d.line, d.name, n))
    closures = {}

    def needs(d):
        """Every class that must come before d."""
        key = d.name.lower()
        if key not in closures:
            closures[key] = set()
            found = set()
            for n, hard in _named_classes(d):
                if hard:
                    found.add(n.lower())
                    found |= needs(by_name[n.lower()])
            closures[key] = found
        return closures[key]

    order, state = [], {}

    def visit(d, path):
        key = d.name.lower()
        if state.get(key) == "done":
            return
        if state.get(key) == "visiting":
            raise MofError("%s:%d: classes name each other in a circle: %s"
                           % (d.source, d.line, " -> ".join(path + [d.name])))
        state[key] = "visiting"
        on_path = {p.lower() for p in path + [d.name]}
        for n, hard in _named_classes(d):
            target = by_name[n.lower()]
            if hard or not (needs(target) | {n.lower()}) & on_path:
                visit(target, path + [d.name])
        state[key] = "done"
        order.append(d)

    for d in decls:
        visit(d, [])
    return order


def class_mof(decl):
    out = []
    if decl.qualifiers:
        out.append(_qualifier_list(decl).rstrip())
    out.append("class %s%s {" % (decl.name, " : %s" % decl.superclass if decl.superclass else ""))
    for p in decl.properties:
        default = "" if p.default is None else " = %s" % _value(p.default)
        out.append("   %s%s%s;" % (_qualifier_list(p), _typed(p), default))
    for m in decl.methods:
        params = ["%s%s" % (_qualifier_list(p), _typed(p)) for p in m.params]
        head = "   %s%s %s(" % (_qualifier_list(m), m.return_type, m.name)
        if not params:
            out.append(head + ");")
        else:
            out.append(head)
            out.append(",\n".join("      " + p for p in params) + ");")
    out.append("};")
    return "\n".join(out)


HEADER = """\
// Generated by tools/schemagen from the DMTF classes the module builds on. Do not edit.
//
"""


def qualifiers_mof(used):
    out = [HEADER + "// Declarations of the qualifiers the class files use. Load them first into\n"
           "// a namespace that does not have them yet.", ""]
    for name, typed, scope, flavor in used:
        line = "Qualifier %s : %s, Scope(%s)" % (name, typed, scope)
        out.append(line + (", Flavor(%s);" % flavor if flavor else ";"))
    return "\n".join(out) + "\n"


def classes_mof(decls):
    out = [HEADER + "// The DMTF classes the module's classes derive from and refer to, each after\n"
           "// the classes it names. Load it before tavrin.mof.", ""]
    for d in dependency_order(decls):
        out.append(class_mof(d))
        out.append("")
    return "\n".join(out)


def files(cim_decls, tavrin_decls):
    return {QUALIFIERS_FILE: qualifiers_mof(_used_qualifiers(cim_decls + tavrin_decls)),
            CLASSES_FILE: classes_mof(cim_decls)}
