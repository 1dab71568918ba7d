"""The resolved class model: every class with its features flattened in
meta-data order, feature flags, defaults, keys and locals.
"""

import re

from mof import MofError

# Bit i of a flags word is named FLAG_NAMES[i].
FLAG_NAMES = [
    "Property", "Reference", "Method", "Class", "Abstract", "Aggregate",
    "Aggregation", "Association", "Composition", "Counter", "Delete", "DN",
    "EmbeddedObject", "Exception", "Expensive", "Experimental", "Gauge",
    "IfDeleted", "In", "Indication", "Invisible", "Key", "Large",
    "OctetString", "Out", "Read", "Required", "Static", "Terminal", "Weak",
    "Write", "EmbeddedInstance",
]
FLAG = {name.lower(): 1 << i for i, name in enumerate(FLAG_NAMES)}

# C++ spelling of each flag, as framework/Meta.h names it.
FLAG_CONSTANTS = {
    "embeddedobject": "FLAG_EMBEDDED_OBJECT",
    "embeddedinstance": "FLAG_EMBEDDED_INSTANCE",
    "ifdeleted": "FLAG_IFDELETED",
    "octetstring": "FLAG_OCTETSTRING",
}

KIND_FLAGS = FLAG["property"] | FLAG["reference"] | FLAG["method"] | FLAG["class"]
# Qualifiers whose flavor is Restricted: they do not pass to subclasses.
RESTRICTED = FLAG["experimental"] | FLAG["abstract"] | FLAG["terminal"]
# Class qualifiers that every subclass inherits.
INHERITED_CLASS_FLAGS = (FLAG["association"] | FLAG["aggregation"] | FLAG["indication"]
                         | FLAG["exception"] | FLAG["composition"])

# The DMTF standard qualifiers: anything else is refused, so that a MOF file
# written for this module loads into any conforming CIM server.
STANDARD_QUALIFIERS = {q.lower() for q in """
    Abstract Aggregate Aggregation Alias ArrayType Association BitMap BitValues
    ClassConstraint Composition Correlatable Counter Deprecated Description
    DisplayDescription DisplayName DN EmbeddedInstance EmbeddedObject Exception
    Experimental Gauge IfDeleted In Indication IsPUnit Key Large MappingStrings Max
    MaxLen MaxValue MethodConstraint Min MinLen MinValue ModelCorrespondence Nonlocal
    NonlocalType NullValue OctetString Out Override OverrideRequired Propagated
    PropertyConstraint PropertyUsage Provider PUnit Read Reference Required Revision
    Schema Source SourceType Static Syntax SyntaxType Terminal TriggerType UMLPackagePath
    Units UnknownValues UnsupportedValues ValueMap Values Version Weak Write
""".split()}

TYPES = ["boolean", "uint8", "sint8", "uint16", "sint16", "uint32", "sint32",
         "uint64", "sint64", "real32", "real64", "char16", "string", "datetime"]
INTEGER_RANGES = {
    "uint8": (0, 2**8 - 1), "sint8": (-2**7, 2**7 - 1),
    "uint16": (0, 2**16 - 1), "sint16": (-2**15, 2**15 - 1),
    "uint32": (0, 2**32 - 1), "sint32": (-2**31, 2**31 - 1),
    "uint64": (0, 2**64 - 1), "sint64": (-2**63, 2**63 - 1),
}
_DATETIME = re.compile(r'^(\d{14}\.\d{6}[+-]\d{3}|\d{14}\.\d{6}:000)$')

ROOT = "Instance"  # the implicit root class of every class


def flag_constant(bit):
    name = FLAG_NAMES[bit].lower()
    return FLAG_CONSTANTS.get(name, "FLAG_" + name.upper())


class Feature:
    """A property, reference or method as declared by one class.

    kind is "property", "reference" or "method". An embedded instance or
    object is a reference whose ref_class is the named class or ROOT.
    """

    def __init__(self, kind, name, owner, flags):
        self.kind = kind
        self.name = name
        self.owner = owner        # the Class that declares this record
        self.flags = flags
        self.type = None          # CIM type name of a property or a method's return
        self.subscript = 0
        self.ref_class = None     # class name of a reference
        self.default = None
        self.params = []          # method parameters (Feature), in order
        self.line = 0

    @property
    def is_array(self):
        return self.subscript != 0


class Class:
    def __init__(self, decl):
        self.decl = decl
        self.name = decl.name
        self.superclass = None    # Class or None
        self.flags = 0
        self.features = []        # all features in meta-data order (Feature records)
        self.locals = []          # parallel to features
        self.own = []             # the records this class declares, in feature order

    @property
    def num_keys(self):
        return sum(1 for f in self.features if f.flags & FLAG["key"])

    def ancestors(self):
        c = self.superclass
        while c is not None:
            yield c
            c = c.superclass

    def is_subclass_of(self, other_name):
        low = other_name.lower()
        if low == ROOT.lower() or self.name.lower() == low:
            return True
        return any(a.name.lower() == low for a in self.ancestors())

    def find(self, name):
        low = name.lower()
        for f in self.features:
            if f.name.lower() == low:
                return f
        return None

    @property
    def methods(self):
        return [f for f in self.features if f.kind == "method"]


class Schema:
    def __init__(self):
        self.classes = []         # in resolution order (superclass first)
        self.by_name = {}         # lower-case name -> Class

    def get(self, name):
        return self.by_name.get(name.lower())


def _error(decl, line, message):
    raise MofError("%s:%d: %s: %s" % (decl.source, line, decl.name, message))


def _check_qualifiers(decl, item):
    for q in item.qualifiers.values():
        if q.name.lower() not in STANDARD_QUALIFIERS:
            _error(decl, q.line, "qualifier %s is not a standard qualifier" % q.name)


def _apply_qualifiers(flags, item, allowed):
    """Sets (or, for Q(false), clears) the flag of each qualifier in allowed."""
    for key, q in item.qualifiers.items():
        if key in FLAG and FLAG[key] & allowed:
            if q.value is False:
                flags &= ~FLAG[key]
            else:
                flags |= FLAG[key]
    return flags


FEATURE_QUALIFIER_FLAGS = 0
for _n in ("Aggregate", "Counter", "Delete", "DN", "EmbeddedObject", "Expensive",
           "Experimental", "Gauge", "IfDeleted", "Invisible", "Key", "Large",
           "OctetString", "Read", "Required", "Static", "Weak", "Write",
           "EmbeddedInstance"):
    FEATURE_QUALIFIER_FLAGS |= FLAG[_n.lower()]
PARAMETER_QUALIFIER_FLAGS = FEATURE_QUALIFIER_FLAGS | FLAG["in"] | FLAG["out"]
CLASS_QUALIFIER_FLAGS = 0
for _n in ("Abstract", "Aggregation", "Association", "Composition", "Exception",
           "Experimental", "Indication", "Terminal"):
    CLASS_QUALIFIER_FLAGS |= FLAG[_n.lower()]


def _check_default(decl, pdecl, type_name):
    value = pdecl.default
    if value is None:
        return None
    values = value if isinstance(value, list) else [value]
    if isinstance(value, list) != (pdecl.subscript != 0):
        _error(decl, pdecl.line, "default of %s does not match its array-ness" % pdecl.name)
    for v in values:
        ok = False
        if type_name == "boolean":
            ok = isinstance(v, bool)
        elif type_name in INTEGER_RANGES:
            lo, hi = INTEGER_RANGES[type_name]
            ok = isinstance(v, int) and not isinstance(v, bool) and lo <= v <= hi
        elif type_name in ("real32", "real64"):
            ok = isinstance(v, (int, float)) and not isinstance(v, bool)
        elif type_name == "string":
            ok = isinstance(v, str)
        elif type_name == "datetime":
            ok = isinstance(v, str) and _DATETIME.match(v) is not None
        elif type_name == "char16":
            _error(decl, pdecl.line, "char16 defaults are not supported")
        if not ok:
            _error(decl, pdecl.line, "default %r does not fit %s %s" % (v, type_name, pdecl.name))
    return value


def _typed(decl, pdecl, feature):
    """Fills type, subscript and ref_class of a property, reference or parameter."""
    feature.subscript = pdecl.subscript
    feature.line = pdecl.line
    emb_inst = pdecl.qualifier("EmbeddedInstance")
    emb_obj = pdecl.has("EmbeddedObject")
    if pdecl.ref_class is not None:
        feature.kind = "reference"
        feature.ref_class = pdecl.ref_class
    elif emb_inst is not None or emb_obj:
        if pdecl.type_name.lower() != "string":
            _error(decl, pdecl.line, "%s: embedded instances and objects are strings" % pdecl.name)
        feature.kind = "reference"
        if emb_inst is not None:
            if not isinstance(emb_inst.value, str):
                _error(decl, pdecl.line, "EmbeddedInstance needs a class name")
            feature.ref_class = emb_inst.value
        else:
            feature.ref_class = ROOT
    else:
        t = pdecl.type_name.lower()
        if t not in TYPES:
            _error(decl, pdecl.line, "unknown type %s" % pdecl.type_name)
        feature.kind = "property"
        feature.type = t
    if feature.kind == "reference" and pdecl.default is not None:
        _error(decl, pdecl.line, "%s: references cannot have defaults" % pdecl.name)


def _resolve_class(cls, tavrin):
    decl = cls.decl
    _check_qualifiers(decl, decl)
    sup = cls.superclass
    flags = _apply_qualifiers(sup.flags & INHERITED_CLASS_FLAGS if sup else 0, decl,
                              CLASS_QUALIFIER_FLAGS)
    if tavrin and sup is not None:
        # Compilers of CIM servers want these repeated on every subclass.
        for q in ("Association", "Aggregation", "Indication"):
            if sup.flags & FLAG[q.lower()] and not decl.has(q):
                _error(decl, decl.line, "subclass of %s must repeat the %s qualifier" % (sup.name, q))
    if flags & FLAG["aggregation"] and not flags & FLAG["association"]:
        _error(decl, decl.line, "an aggregation must be an association")
    cls.flags = flags | (0 if flags & FLAG["association"] else FLAG["class"])

    features = list(sup.features) if sup else []
    local = [False] * len(features)
    index = {f.name.lower(): i for i, f in enumerate(features)}

    def place(feature):
        i = index.get(feature.name.lower())
        if i is None:
            index[feature.name.lower()] = len(features)
            features.append(feature)
            local.append(True)
        else:
            if local[i]:
                _error(decl, feature.line, "%s declared twice" % feature.name)
            features[i] = feature
            local[i] = True

    for p in decl.properties:
        _check_qualifiers(decl, p)
        inherited = features[index[p.name.lower()]] if p.name.lower() in index else None
        f = Feature(None, p.name, cls, 0)
        _typed(decl, p, f)
        if inherited is not None:
            if inherited.kind != f.kind or inherited.type != f.type or inherited.is_array != f.is_array:
                _error(decl, p.line, "%s redeclared with another type" % p.name)
            # The name keeps the spelling of the first declaration.
            f.name = inherited.name
            base = inherited.flags & ~KIND_FLAGS & ~RESTRICTED
        else:
            if p.qualifier("Override") is not None:
                _error(decl, p.line, "%s overrides nothing" % p.name)
            base = 0
        f.flags = _apply_qualifiers(base, p, FEATURE_QUALIFIER_FLAGS) | FLAG[f.kind]
        if f.kind == "property":
            f.default = _check_default(decl, p, f.type)
        if f.flags & FLAG["aggregate"] and not cls.flags & FLAG["aggregation"]:
            _error(decl, p.line, "Aggregate outside an aggregation")
        place(f)

    for m in decl.methods:
        _check_qualifiers(decl, m)
        inherited = features[index[m.name.lower()]] if m.name.lower() in index else None
        if inherited is not None and inherited.kind != "method":
            _error(decl, m.line, "method %s hides a property" % m.name)
        rt = m.return_type.lower()
        if rt not in TYPES or rt in ("string", "datetime", "char16", "real32", "real64"):
            _error(decl, m.line, "unsupported return type %s" % m.return_type)
        f = Feature("method", inherited.name if inherited else m.name, cls, 0)
        f.line = m.line
        f.type = rt
        f.flags = _apply_qualifiers(0, m, FEATURE_QUALIFIER_FLAGS) | FLAG["method"]
        seen = set()
        for pdecl in m.params:
            _check_qualifiers(decl, pdecl)
            if pdecl.name.lower() in seen or pdecl.name.lower() == "return_value":
                _error(decl, pdecl.line, "%s: bad parameter name %s" % (m.name, pdecl.name))
            seen.add(pdecl.name.lower())
            p = Feature(None, pdecl.name, cls, 0)
            _typed(decl, pdecl, p)
            # IN defaults to true in CIM; [IN(false)] makes an output-only parameter.
            pf = FLAG["in"] | FLAG[p.kind]
            p.flags = _apply_qualifiers(pf, pdecl, PARAMETER_QUALIFIER_FLAGS)
            f.params.append(p)
        place(f)

    cls.features = features
    cls.locals = local
    cls.own = [f for f, l in zip(features, local) if l]


def _check_references(schema):
    for cls in schema.classes:
        for f in cls.own:
            refs = [f] if f.kind == "reference" else [p for p in f.params if p.kind == "reference"]
            for r in refs:
                if r.ref_class.lower() == ROOT.lower():
                    r.ref_class = ROOT
                    continue
                target = schema.get(r.ref_class)
                if target is None:
                    _error(cls.decl, r.line, "%s refers to unknown class %s" % (r.name, r.ref_class))
                r.ref_class = target.name
            if f.kind == "reference" and cls.superclass is not None:
                inherited = cls.superclass.find(f.name)
                if inherited is None:
                    continue
                if f.ref_class == ROOT:
                    narrows = inherited.ref_class == ROOT
                else:
                    narrows = schema.get(f.ref_class).is_subclass_of(inherited.ref_class)
                if not narrows:
                    _error(cls.decl, f.line, "%s narrows %s to %s, which is not a subclass"
                           % (f.name, inherited.ref_class, f.ref_class))


def build(cim_decls, tavrin_decls):
    """Resolves the DMTF classes and the module's own classes into one Schema.

    The DMTF file may name a superclass after its subclass; the module's own
    file must be in dependency order, as a CIM server's compiler reads it.
    """
    schema = Schema()
    decls = {}
    for d in cim_decls + tavrin_decls:
        if d.name.lower() in decls:
            raise MofError("%s:%d: class %s declared twice" % (d.source, d.line, d.name))
        decls[d.name.lower()] = d
    tavrin_names = {d.name.lower() for d in tavrin_decls}
    done = set()

    def resolve(d, stack):
        low = d.name.lower()
        if low in done:
            return
        if low in stack:
            raise MofError("%s:%d: %s inherits from itself" % (d.source, d.line, d.name))
        cls = Class(d)
        if d.superclass is not None:
            sd = decls.get(d.superclass.lower())
            if sd is None:
                raise MofError("%s:%d: %s: unknown superclass %s" % (d.source, d.line, d.name, d.superclass))
            resolve(sd, stack | {low})
            cls.superclass = schema.get(sd.name)
        _resolve_class(cls, low in tavrin_names)
        schema.classes.append(cls)
        schema.by_name[low] = cls
        done.add(low)

    for d in cim_decls + tavrin_decls:
        resolve(d, frozenset())

    # The module's MOF goes to CIM servers as it is: superclasses and
    # referenced classes of its own must come first.
    position = {d.name.lower(): i for i, d in enumerate(tavrin_decls)}
    for i, d in enumerate(tavrin_decls):
        named = [d.superclass] if d.superclass else []
        for p in d.properties:
            named.append(p.ref_class)
            q = p.qualifier("EmbeddedInstance")
            named.append(q.value if q is not None and isinstance(q.value, str) else None)
        for n in named:
            if n and position.get(n.lower(), -1) >= i:
                raise MofError("%s:%d: %s names %s before its declaration" % (d.source, d.line, d.name, n))

    _check_references(schema)
    return schema
