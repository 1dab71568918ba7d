"""Provider glue generated from the class schema: the provider list, the
per-class method members and invoke tables, and the registration files that
tell a CIM server which provider serves which class.
"""

from model import FLAG
from emit_schema import BANNER, CPP_TYPES, record_name, value_type

MODULE = "tvrnprovider_Module"
LOCATION = "tvrnprovider"
NAMESPACE = "root/tavrin"
PREFIX = "TAVRIN_"
VENDOR = "Tavrin"
VERSION = "1.0.0"


class Provider:
    def __init__(self, cls):
        self.cls = cls
        self.short = cls.name[len(PREFIX):]
        self.name = cls.name + "_Provider"
        self.indication = bool(cls.flags & FLAG["indication"])
        self.association = bool(cls.flags & FLAG["association"])
        self.instance = not self.indication

    @property
    def kinds(self):
        k = []
        if self.instance:
            k.append("instance")
        k.append("method")
        if self.association:
            k.append("association")
        if self.indication:
            k.append("indication")
        return k


def module_classes(schema):
    return [c for c in schema.classes if c.name.startswith(PREFIX)]


def providers(schema):
    """One provider per module class, in the order of the module's MOF.

    A class from which other module classes derive is only their common base:
    its instances are served by the providers of the subclasses.
    """
    own = module_classes(schema)
    bases = {c.superclass.name for c in own if c.superclass is not None}
    return [Provider(c) for c in own if c.name not in bases]


def providers_def(provs):
    out = [BANNER.rstrip("\n"),
           "//",
           "// One row per provider, in registration order:",
           "//   TVRN_PROVIDER(short class name, has instance MI, is association, is indication)",
           "// Every provider also has a method MI."]
    for p in provs:
        out.append("TVRN_PROVIDER(%s, %d, %d, %d)"
                   % (p.short, int(p.instance), int(p.association), int(p.indication)))
    return "\n".join(out) + "\n"


def _is_output(p):
    return bool(p.flags & FLAG["out"])


def param_type(p):
    """Type of a parameter of a provider's method member."""
    if p.kind == "reference" and not p.is_array:
        return p.ref_class + "*&" if _is_output(p) else "const %s*" % p.ref_class
    t = "Property<%s>" % value_type(p)
    return t + "&" if _is_output(p) else "const %s&" % t


def methods_header(cls):
    name = cls.name
    methods = cls.methods
    guard = "CPTA_PROVIDERS_GENERATED_%s_METHODS_H" % name.upper()
    out = [BANNER.rstrip("\n"), "#ifndef " + guard, "#define " + guard, ""]
    if methods:
        out.append("#include <strings.h>")
        out.append("")
    out.append('#include "cmpi/Provider_Status.h"')
    includes = {name} | {m.owner.name for m in methods}
    for inc in sorted(includes):
        out.append('#include "schema/generated/%s.h"' % inc)
    out += ["", "namespace CPTA {", ""]

    if methods:
        out.append("// Default members for the extrinsic methods of %s." % name)
        out.append("// A provider derives from this structure and hides the members it implements.")
    else:
        out.append("// %s has no extrinsic methods; providers derive from this" % name)
        out.append("// structure all the same.")
    out.append("struct %s_Methods {" % name)
    for i, m in enumerate(methods):
        if i:
            out.append("")
        rv = "Property<%s>&" % CPP_TYPES[m.type]
        args = ["const %s*" % name] + [param_type(p) for p in m.params] + [rv]
        out.append("    Invoke_Method_Status %s(" % m.name)
        out.append("        " + ",\n        ".join(args) + ")")
        out.append("    {")
        out.append("        return INVOKE_METHOD_UNSUPPORTED;")
        out.append("    }")
    out.append("};")
    out.append("")

    if not methods:
        out.append("template <class P>")
        out.append("int %s_invoke_method(P*, const %s*, Instance*)" % (name, name))
        out.append("{")
        out.append("    return -1;")
        out.append("}")
    else:
        out.append("// Calls the provider's member for the method that a parameter record")
        out.append("// belongs to, with one argument per parameter slot.")
        out.append("template <class P>")
        out.append("struct %s_Method_Thunks {" % name)
        for i, m in enumerate(methods):
            if i:
                out.append("")
            rec = record_name(m)
            out.append("    static int %s(P* provider, const %s* self, Instance* record)" % (m.name, name))
            out.append("    {")
            out.append("        %s* r = static_cast<%s*>(record);" % (rec, rec))
            args = ["self"] + ["r->%s" % p.name for p in m.params] + ["r->return_value"]
            out.append("        return provider->%s(%s);" % (m.name, ", ".join(args)))
            out.append("    }")
        out.append("};")
        out.append("")
        out.append("// Invokes the method named by the record's meta data (compared without")
        out.append("// regard to case); -1 when the class has no such method.")
        out.append("template <class P>")
        out.append("int %s_invoke_method(P* provider, const %s* self, Instance* record)"
                   % (name, name))
        out.append("{")
        out.append("    typedef %s_Method_Thunks<P> T;" % name)
        out.append("    static const struct {")
        out.append("        const char* name;")
        out.append("        int (*thunk)(P*, const %s*, Instance*);" % name)
        out.append("    } methods[] = {")
        for m in methods:
            out.append('        { "%s", &T::%s },' % (m.name, m.name))
        out.append("    };")
        out.append("    for (const auto& m : methods) {")
        out.append("        if (strcasecmp(m.name, record->meta_class->name) == 0)")
        out.append("            return m.thunk(provider, self, record);")
        out.append("    }")
        out.append("    return -1;")
        out.append("}")
    out += ["", "}  // namespace CPTA", "", "#endif", ""]
    return "\n".join(out)


def reg_file(provs):
    out = ["# Generated by tools/schemagen from the class schema. Do not edit.",
           "# Providers of the %s module, one section per class." % LOCATION, ""]
    for p in provs:
        out.append("[%s]" % p.cls.name)
        out.append("   provider: %s" % p.name)
        out.append("   location: %s" % LOCATION)
        out.append("   type: %s" % " ".join(p.kinds))
        out.append("   namespace: %s" % NAMESPACE)
        out.append("")
    return "\n".join(out)


PROVIDER_TYPES = {"instance": 2, "association": 3, "indication": 4, "method": 5}


def registration_mof(provs):
    out = ["// Generated by tools/schemagen from the class schema. Do not edit.",
           "//",
           "// Registration of the %s module and its providers, for CIM servers that" % LOCATION,
           "// keep provider registrations as instances in their interop namespace.",
           "",
           "instance of PG_ProviderModule",
           "{",
           '    Name = "%s";' % MODULE,
           '    Location = "%s";' % LOCATION,
           '    Vendor = "%s";' % VENDOR,
           '    Version = "%s";' % VERSION,
           '    InterfaceType = "CMPI";',
           '    InterfaceVersion = "2.0.0";',
           "};",
           ""]
    for p in provs:
        types = sorted(PROVIDER_TYPES[k] for k in p.kinds)
        out += ["instance of PG_Provider",
                "{",
                '    Name = "%s";' % p.name,
                '    ProviderModuleName = "%s";' % MODULE,
                "};",
                "",
                "instance of PG_ProviderCapabilities",
                "{",
                '    ProviderModuleName = "%s";' % MODULE,
                '    ProviderName = "%s";' % p.name,
                '    CapabilityID = "%s";' % p.cls.name,
                '    ClassName = "%s";' % p.cls.name,
                '    Namespaces = { "%s" };' % NAMESPACE,
                "    ProviderType = { %s };" % ", ".join(str(t) for t in types),
                "    SupportedProperties = NULL;",
                "    SupportedMethods = NULL;",
                "};",
                ""]
    return "\n".join(out)


def files(schema):
    provs = providers(schema)
    result = {"providers/generated/Providers.def": providers_def(provs),
              "schema/generated/tvrnprovider.reg": reg_file(provs),
              "schema/generated/tvrnprovider-registration.mof": registration_mof(provs)}
    for cls in module_classes(schema):
        result["providers/generated/%s_Methods.h" % cls.name] = methods_header(cls)
    return result
