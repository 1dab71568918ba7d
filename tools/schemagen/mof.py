"""Reader for the subset of MOF that the class schema is written in.

Understands class declarations with qualifier lists, properties (scalar and
array, with default values), references, and methods with parameters.
Comments and #pragma lines are skipped. Anything else is an error that names
the file and line.
"""

import re


class MofError(Exception):
    pass


class Qualifier:
    def __init__(self, name, value, line):
        self.name = name
        self.value = value  # True when given without a value
        self.line = line


class Qualified:
    def __init__(self, qualifiers, line):
        self.qualifiers = {}
        self.line = line
        for q in qualifiers:
            key = q.name.lower()
            if key in self.qualifiers:
                raise MofError("line %d: qualifier %s given twice" % (q.line, q.name))
            self.qualifiers[key] = q

    def qualifier(self, name):
        return self.qualifiers.get(name.lower())

    def has(self, name):
        q = self.qualifier(name)
        return q is not None and q.value is not False


class PropertyDecl(Qualified):
    """A property, a reference (ref_class set) or a method parameter."""

    def __init__(self, qualifiers, line, type_name, ref_class, name, subscript, default):
        Qualified.__init__(self, qualifiers, line)
        self.type_name = type_name  # CIM type name; None for a reference
        self.ref_class = ref_class  # referenced class name for a REF
        self.name = name
        self.subscript = subscript  # 0 scalar, -1 variable array, N fixed array
        self.default = default      # parsed value or None


class MethodDecl(Qualified):
    def __init__(self, qualifiers, line, return_type, name, params):
        Qualified.__init__(self, qualifiers, line)
        self.return_type = return_type
        self.name = name
        self.params = params


class ClassDecl(Qualified):
    def __init__(self, qualifiers, line, name, superclass, source):
        Qualified.__init__(self, qualifiers, line)
        self.name = name
        self.superclass = superclass
        self.properties = []
        self.methods = []
        self.source = source


_TOKEN = re.compile(r'''
    (?P<ws>[ \t\r\n]+)
  | (?P<comment>//[^\n]*|/\*.*?\*/)
  | (?P<pragma>\#[^\n]*)
  | (?P<string>"(?:[^"\\\n]|\\.)*")
  | (?P<char>'(?:[^'\\\n]|\\.)')
  | (?P<number>[+-]?(?:0[xX][0-9a-fA-F]+|[0-9]+\.[0-9]*(?:[eE][+-]?[0-9]+)?|\.[0-9]+(?:[eE][+-]?[0-9]+)?|[0-9]+))
  | (?P<ident>[A-Za-z_][A-Za-z0-9_]*)
  | (?P<punct>[\[\](){},;:=])
''', re.X | re.S)

_ESCAPES = {'n': '\n', 't': '\t', 'r': '\r', 'b': '\b', 'f': '\f',
            '"': '"', "'": "'", '\\': '\\'}


def _unescape(text):
    out, i = [], 0
    while i < len(text):
        c = text[i]
        if c == '\\':
            i += 1
            e = text[i]
            if e in _ESCAPES:
                out.append(_ESCAPES[e])
            elif e in 'xX':
                j = i + 1
                while j < len(text) and j < i + 5 and text[j] in '0123456789abcdefABCDEF':
                    j += 1
                out.append(chr(int(text[i + 1:j], 16)))
                i = j - 1
            else:
                raise MofError("bad escape \\%s" % e)
        else:
            out.append(c)
        i += 1
    return ''.join(out)


def _tokens(text, source):
    pos, line = 0, 1
    while pos < len(text):
        m = _TOKEN.match(text, pos)
        if not m:
            raise MofError("%s:%d: unexpected character %r" % (source, line, text[pos]))
        kind = m.lastgroup
        value = m.group(kind)
        if kind not in ('ws', 'comment', 'pragma'):
            yield kind, value, line
        line += value.count('\n')
        pos = m.end()
    yield 'eof', None, line


class _Parser:
    def __init__(self, text, source):
        self.source = source
        self.toks = list(_tokens(text, source))
        self.i = 0

    def peek(self, ahead=0):
        return self.toks[min(self.i + ahead, len(self.toks) - 1)]

    def next(self):
        tok = self.toks[self.i]
        self.i += 1
        return tok

    def error(self, message, line=None):
        if line is None:
            line = self.peek()[2]
        raise MofError("%s:%d: %s" % (self.source, line, message))

    def accept(self, value):
        kind, v, _ = self.peek()
        if kind in ('punct', 'ident') and (v == value or (kind == 'ident' and v.lower() == value.lower())):
            self.i += 1
            return True
        return False

    def expect(self, value):
        if not self.accept(value):
            self.error("expected %r, found %r" % (value, self.peek()[1]))

    def ident(self):
        kind, v, _ = self.next()
        if kind != 'ident':
            self.i -= 1
            self.error("expected a name, found %r" % (v,))
        return v

    def value(self):
        kind, v, line = self.next()
        if kind == 'string':
            parts = [_unescape(v[1:-1])]
            while self.peek()[0] == 'string':
                parts.append(_unescape(self.next()[1][1:-1]))
            return ''.join(parts)
        if kind == 'char':
            return ('char16', _unescape(v[1:-1]))
        if kind == 'number':
            if re.match(r'^[+-]?0[xX]', v):
                return int(v, 16)
            if re.match(r'^[+-]?[0-9]+$', v):
                return int(v, 10)
            return float(v)
        if kind == 'ident':
            low = v.lower()
            if low == 'true':
                return True
            if low == 'false':
                return False
            if low == 'null':
                return None
        if kind == 'punct' and v == '{':
            items = []
            if not self.accept('}'):
                while True:
                    items.append(self.value())
                    if self.accept('}'):
                        break
                    self.expect(',')
            return items
        self.error("expected a value, found %r" % (v,), line)

    def qualifiers(self):
        result = []
        if not self.accept('['):
            return result
        while True:
            line = self.peek()[2]
            name = self.ident()
            value = True
            if self.accept('('):
                value = self.value()
                self.expect(')')
            elif self.peek()[1] == '{':
                value = self.value()
            if self.accept(':'):  # flavors are accepted and ignored
                self.ident()
                while self.peek()[0] == 'ident':
                    self.ident()
            result.append(Qualifier(name, value, line))
            if self.accept(']'):
                return result
            self.expect(',')

    def subscript(self):
        if not self.accept('['):
            return 0
        if self.accept(']'):
            return -1
        kind, v, line = self.next()
        if kind != 'number' or not v.isdigit() or int(v) <= 0:
            self.error("bad array size %r" % (v,), line)
        self.expect(']')
        return int(v)

    def typed_name(self):
        """type name  |  Class REF name"""
        type_name = self.ident()
        ref_class = None
        if self.accept('REF'):
            ref_class, type_name = type_name, None
        name = self.ident()
        return type_name, ref_class, name

    def parameter(self):
        quals = self.qualifiers()
        line = self.peek()[2]
        type_name, ref_class, name = self.typed_name()
        return PropertyDecl(quals, line, type_name, ref_class, name, self.subscript(), None)

    def feature(self, cls):
        quals = self.qualifiers()
        line = self.peek()[2]
        type_name, ref_class, name = self.typed_name()
        if self.accept('('):
            if ref_class is not None:
                self.error("a method cannot return a reference", line)
            params = []
            if not self.accept(')'):
                while True:
                    params.append(self.parameter())
                    if self.accept(')'):
                        break
                    self.expect(',')
            self.expect(';')
            cls.methods.append(MethodDecl(quals, line, type_name, name, params))
            return
        subscript = self.subscript()
        default = None
        if self.accept('='):
            default = self.value()
        self.expect(';')
        cls.properties.append(PropertyDecl(quals, line, type_name, ref_class, name, subscript, default))

    def class_decl(self):
        quals = self.qualifiers()
        line = self.peek()[2]
        if not self.accept('class'):
            self.error("expected a class declaration")
        name = self.ident()
        superclass = self.ident() if self.accept(':') else None
        cls = ClassDecl(quals, line, name, superclass, self.source)
        self.expect('{')
        while not self.accept('}'):
            self.feature(cls)
        self.expect(';')
        return cls

    def parse(self):
        classes = []
        while self.peek()[0] != 'eof':
            classes.append(self.class_decl())
        return classes


def parse(text, source):
    """Returns the class declarations of a MOF text, in file order."""
    return _Parser(text, source).parse()


def parse_file(path):
    with open(path, encoding='utf-8') as f:
        return parse(f.read(), path)
