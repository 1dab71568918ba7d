#!/usr/bin/env python3
"""Asks a running CIM server through wbemcli and the embedded host through
tvrncli the same questions, on the same simulated host, and compares the
answers.

    check.py classes  FILE [--gi]   every class of FILE: enumerations equal,
                                    and with --gi every returned path gets
                                    the same instance back
    check.py requests FILE          every request line of FILE (see below)
    check.py pid LIBRARY            the pid of the one process that has
                                    LIBRARY (a path) loaded; exit 1 when
                                    none or several have

Options before the command: --url (default http://localhost:5988/root/tavrin),
--tvrncli (default build/bin/tvrncli), --module (tvrncli's module; default
/usr/local/lib/cmpi/libtvrnprovider.so, the installed one), --seed-from
NAMESPACE:CLASS (repeatable: the server's own instances of a class the module
asks the server for, such as its object manager, handed to tvrncli as --seed
so that both sides see the same server). tvrncli runs with the environment it
is given, so LD_LIBRARY_PATH must name the same libdtfaj.so as the server's
loader path.

Answers are compared in a normal form: each instance as its sorted list of
non-null properties (names without regard to case, numbers by value,
booleans in lower case, references as class and sorted keys); a property
that is null on one side must be null or absent on the other. tvrncli runs
with --no-class-defaults: its instances hold only what the module sends, so
a class default that shows through on the server where the module leaves a
property unset is a difference. Enumerations compare as sorted lists of
such instances.

Request lines (FILE of `requests`) are tvrncli command lines: ei, ein, gi,
ai, ain, ri, rin (with --assoc, --result-class, --role, --result-role; ei,
gi, ai and ri also after --props P1,P2), cm PATH METHOD [NAME=VALUE]... and
wait CLASS PROP=VALUE [SECONDS] (on the server: ei every half second until
an instance has the value); words are split as a shell would. Several
commands joined by " ; " run in one tvrncli process and one after the other
on the server, and their answers are compared together (what a method
changes, the next command sees). A line starting with "!" must fail on both
sides with the same CIM status code. `let NAME = TEXT` defines $NAME for the
lines below it; "<host>" stands for the Name of TAVRIN_ComputerSystem, "<here>"
for the directory of FILE (where the files a request reads live). Method
arguments are written as tvrncli takes them (a reference as a quoted path,
an array as TYPE[]:{A,B}) and passed to wbemcli in its own form; a string
argument goes with its characters that XML or wbemcli's value lists give a
meaning (& < > " and the comma) as XML character references, since wbemcli
copies the text into the request as it is and splits values at commas.
String outputs of methods that are JSON texts (the management tunnel's
responses) compare as JSON, whatever the layout and the escapes of the
client that printed them. A
line that changes the server's state must put it back, since the next line
starts afresh on the tvrncli side.
"""

import argparse
import concurrent.futures
import difflib
import json
import os
import re
import shlex
import subprocess
import sys
import tempfile
import time

NAMESPACE = "root/tavrin"
MODULE_FILE = "libtvrnprovider.so"


class Failure(Exception):
    pass


# ---------------------------------------------------------------------------
# Normal forms
# ---------------------------------------------------------------------------
def _quoted(text, i):
    """The string starting at text[i] == '"' (backslash escapes) and the
    index after its closing quote."""
    out = []
    i += 1
    while i < len(text):
        c = text[i]
        if c == "\\" and i + 1 < len(text):
            out.append(text[i + 1])
            i += 2
            continue
        if c == '"':
            return "".join(out), i + 1
        out.append(c)
        i += 1
    raise Failure("unterminated string in %r" % text)


def _after_namespace(text):
    at = text.find(NAMESPACE + ":")
    return text[at + len(NAMESPACE) + 1:] if at >= 0 else text


def _scalar(text):
    low = text.lower()
    if low in ("true", "false"):
        return low
    try:
        return str(int(text, 10))
    except ValueError:
        pass
    try:
        return repr(float(text))
    except ValueError:
        return text


def canon_path(text):
    """A path ([host/]root/tavrin:Class.Key=value,...) as Class.key=value,...
    with keys sorted and lower-cased, references inside in the same form.
    References inside may be quoted (tvrncli) or bare (wbemcli); a bare one
    takes the keys up to the next key that holds a path of its own."""
    rest = _after_namespace(text.strip())
    cls, _, keys = rest.partition(".")
    out, i = [], 0
    while i < len(keys):
        eq = keys.index("=", i)
        name = keys[i:eq].strip().lower()
        i = eq + 1
        if keys.startswith('"', i):
            value, i = _quoted(keys, i)
            value = canon_path(value) if value.startswith(NAMESPACE + ":") else '"%s"' % value
        elif keys.startswith(NAMESPACE + ":", i):
            m = re.compile(r',[A-Za-z_][A-Za-z0-9_]*=%s:' % re.escape(NAMESPACE)).search(keys, i)
            end = m.start() if m else len(keys)
            value, i = canon_path(keys[i:end]), end
        else:
            end = keys.find(",", i)
            end = len(keys) if end < 0 else end
            value, i = _scalar(keys[i:end]), end
        out.append("%s=%s" % (name, value))
        if keys.startswith(",", i):
            i += 1
    return "%s.%s" % (cls.lower(), ",".join(sorted(out)))


_DATETIME = re.compile(r"^\d{14}\.\d{6}[-+:]\d{3}$")


def _elements(text):
    """Elements of a value list: "a","b" / 2,3 / a reference."""
    text = text.strip()
    if text.startswith(NAMESPACE + ":") or re.match(r"^[^\"=,]+/%s:" % re.escape(NAMESPACE), text):
        return ["ref:" + canon_path(text)]
    items, i = [], 0
    while i < len(text):
        if text[i] == '"':
            value, i = _quoted(text, i)
            if value.startswith(NAMESPACE + ":"):
                items.append("ref:" + canon_path(value))
            else:  # wbemcli prints date-times without quotes
                items.append(value if _DATETIME.match(value) else '"%s"' % value)
        else:
            end = text.find(",", i)
            end = len(text) if end < 0 else end
            items.append(_scalar(text[i:end].strip()))
            i = end
        while i < len(text) and text[i] in ", ":
            i += 1
    return items


def _prop(name, elements):
    return "%s=%s" % (name.lower(), ",".join(elements)) if elements else None


def canon_instance(props):
    return "\n".join(sorted(p for p in props if p is not None))


def _mof_value(value):
    if value.startswith("{") and value.endswith("}"):
        value = value[1:-1]
    return [] if value == "NULL" else _elements(value)


def wbemcli_instances(text):
    """Instances printed by wbemcli with -nl: a path line, then -Name=value."""
    instances, props = [], None
    for line in text.splitlines():
        if not line.strip():
            continue
        if line.startswith("-"):
            if props is None:
                raise Failure("property before any instance: %r" % line)
            name, _, value = line[1:].partition("=")
            props.append(_prop(name, _elements(value)))
        else:
            if props is not None:
                instances.append(canon_instance(props))
            props = []
    if props is not None:
        instances.append(canon_instance(props))
    return instances


def seed_instances(text):
    """Instances printed by wbemcli with -nl as tvrncli --seed instances,
    with their string properties."""
    out = []
    for line in text.splitlines():
        if not line.strip():
            continue
        if not line.startswith("-"):
            if out:
                out.append("}")
            out.append("instance %s {" % line[line.index("/") + 1:])
            continue
        name, _, value = line[1:].partition("=")
        if value.startswith('"'):
            text_value, end = _quoted(value, 0)
            if end == len(value):
                escaped = text_value.replace("\\", "\\\\").replace('"', '\\"')
                out.append('    string %s = "%s";' % (name, escaped))
    return out + ["}"] if out else out


def wbemcli_paths(text):
    return ["path " + canon_path(line) for line in text.splitlines() if line.strip()]


def _string(text):
    """A string value; a JSON object or array as its JSON, keys sorted."""
    if text[:1] in ("{", "["):
        try:
            return "json:" + json.dumps(json.loads(text), sort_keys=True)
        except ValueError:
            pass
    return '"%s"' % text


def _wbemcli_output(name, kind, value):
    """One output wbemcli printed as `Name (type): value`: strings with
    backslash and quote escaped, newlines as they are, and the character
    references the server wrote into its XML left as they came (OpenPegasus
    writes line breaks and runs of blanks as &#10; and &#32;)."""
    if kind == "string":
        text = re.sub(r'\\(.)', r"\1", value, flags=re.S)
        text = re.sub(r"&#(x[0-9A-Fa-f]+|[0-9]+);",
                      lambda c: chr(int(c.group(1)[1:], 16) if c.group(1)[0] == "x" else int(c.group(1))),
                      text)
        return _prop(name, [_string(text)])
    return _prop(name, _elements(value))


_WBEMCLI_OUTPUT = re.compile(r"^([A-Za-z_]\w*) \(([a-z0-9]+(?:\[\])?)\): (.*)$")


def wbemcli_method(text, method):
    """`<path> Method: value` then, with -nl, one output a line (a string
    output may go on over several): `Name (type): value` or -Name=value."""
    out, output = [], None
    for line in text.splitlines():
        m = re.search(r" %s: (.*)$" % re.escape(method), line)
        o = _WBEMCLI_OUTPUT.match(line)
        if m or o or line.startswith("-"):
            if output:
                out.append(_wbemcli_output(*output))
            output = None
        if m:
            out.append(_prop("ReturnValue", _elements(m.group(1))))
        elif o:
            output = list(o.groups())
        elif line.startswith("-"):
            name, _, value = line[1:].partition("=")
            out.append(_prop(name, _elements(value)))
        elif output:
            output[2] += "\n" + line
    if output:
        out.append(_wbemcli_output(*output))
    return ["method " + p for p in out if p]


_MOF_ESCAPES = {"n": "\n", "t": "\t", "r": "\r", "b": "\b", "f": "\f"}


def _mof_output(value):
    """A method output as tvrncli prints it: a string (not a reference)
    with its MOF escapes undone, else as a property value."""
    if len(value) < 2 or value[0] != '"' or value[-1] != '"' or value.startswith('"' + NAMESPACE + ":"):
        return _mof_value(value)
    text = re.sub(r"\\(x[0-9A-Fa-f]{4}|.)",
                  lambda e: chr(int(e.group(1)[1:], 16)) if len(e.group(1)) == 5
                  else _MOF_ESCAPES.get(e.group(1), e.group(1)), value[1:-1])
    return [_string(text)]


_MOF_PROP = re.compile(r"^\s+([A-Za-z_]\w*) = (.*);$")
_METHOD_LINE = re.compile(r"^([A-Za-z_]\w*) = (.*);$")


def tvrncli_answers(text):
    """What tvrncli printed, in the forms above: instances ("// path" then
    MOF), paths (one a line), method results (ReturnValue = ...; then the
    outputs), in any sequence."""
    items, props = [], None
    for line in text.splitlines():
        if props is not None:
            if line.startswith("};"):
                items.append(canon_instance(props))
                props = None
                continue
            m = _MOF_PROP.match(line)
            if not m:
                raise Failure("unexpected line in tvrncli output: %r" % line)
            props.append(_prop(m.group(1), _mof_value(m.group(2))))
        elif line.startswith("instance of "):
            props = []
        elif line.startswith("//") or not line.strip():
            continue
        elif _METHOD_LINE.match(line):
            m = _METHOD_LINE.match(line)
            p = _prop(m.group(1), _mof_output(m.group(2)))
            if p:
                items.append("method " + p)
        else:
            items.append("path " + canon_path(line))
    return items


def status_code(text):
    """The CIM status code of a failed request: wbemcli's "Cim: (6) ..." or
    tvrncli's "CMPI_RC_ERR_NOT_FOUND (6)"."""
    m = re.search(r"Cim: \((\d+)\)", text) or re.search(r"CMPI_RC_\w+ \((\d+)\)", text)
    return int(m.group(1)) if m else None


# ---------------------------------------------------------------------------
# Running the two clients
# ---------------------------------------------------------------------------
class Clients:
    def __init__(self, args):
        self.url = args.url
        self.tvrncli = args.tvrncli
        self.module = args.module
        self.seed_from = args.seed_from
        self.seed_dir = None
        self.host = None

    def _run(self, argv, input_text=None):
        p = subprocess.run(argv, input=input_text, capture_output=True, text=True)
        return p.returncode, p.stdout, p.stderr

    def wbemcli(self, op, target, options=(), tail=()):
        argv = ["wbemcli", op] + list(options) + ["%s:%s" % (self.url, target)] + list(tail)
        return self._run(argv)

    def seed(self):
        """A --seed file with the server's instances of the --seed-from
        classes (their string properties, all the module reads of them)."""
        if self.seed_dir is None:
            self.seed_dir = tempfile.TemporaryDirectory(prefix="check-seed-")
            server = self.url[: self.url.rindex("/" + NAMESPACE)]
            mof = []
            for target in self.seed_from:
                rc, out, err = self._run(["wbemcli", "ei", "-nl", "%s/%s" % (server, target)])
                if rc != 0:
                    raise Failure("the server gives no %s: %s" % (target, err.strip()))
                mof += seed_instances(out)
            with open(os.path.join(self.seed_dir.name, "seed.mof"), "w") as f:
                f.write("\n".join(mof))
        return os.path.join(self.seed_dir.name, "seed.mof")

    def cli(self, lines):
        """tvrncli commands (word lists) in one process."""
        base = [self.tvrncli, "--module", self.module, "--no-class-defaults"]
        if self.seed_from:
            base += ["--seed", self.seed()]
        if len(lines) == 1:
            return self._run(base + lines[0])
        script = "\n".join(" ".join(shlex.quote(w) for w in words) for words in lines) + "\n"
        return self._run(base + ["script", "-"], script)

    def host_name(self):
        if self.host is None:
            rc, out, err = self.cli([["ei", "TAVRIN_ComputerSystem"]])
            m = re.search(r'^\s+Name = "(.*)";$', out, re.M)
            if rc != 0 or not m:
                raise Failure("tvrncli gives no computer system: %s" % err.strip())
            self.host = m.group(1)
        return self.host


# What each command asks the server, and how its answer is read.
_WBEM_OPTIONS = {"--assoc": "-ac", "--result-class": "-arc", "--role": "-ar", "--result-role": "-arr"}
_INSTANCES = {"ei", "gi", "ai", "ri"}
_NAMES = {"ein", "ain", "rin"}


def _split_options(words):
    positional, options = [], []
    i = 0
    while i < len(words):
        w = words[i]
        if w in _WBEM_OPTIONS:
            if i + 1 >= len(words):
                raise Failure("%s needs a value" % w)
            options += [_WBEM_OPTIONS[w], words[i + 1]]
            i += 2
        elif w.startswith("--"):
            raise Failure("option %s has no wbemcli form" % w)
        else:
            positional.append(w)
            i += 1
    return positional, options


_TYPED = re.compile(r"^[a-z]+[0-9]*(\[\])?:(.*)$")
_PATH = re.compile(r"^[A-Za-z_]\w*\.[A-Za-z_]\w*=")


def wbemcli_argument(arg):
    """A method argument as tvrncli takes it (NAME=VALUE, VALUE typed as
    TYPE:V or TYPE[]:{A,B}, a reference as a quoted path) as wbemcli takes
    it: arrays as A,B, references as a bare path (wbemcli types the
    arguments from the class)."""
    name, _, value = arg.partition("=")
    m = _TYPED.match(value)
    if m:
        value = m.group(2)
        if m.group(1) and value.startswith("{") and value.endswith("}"):
            value = value[1:-1]
    elif value.startswith('"'):
        text, end = _quoted(value, 0)
        if end == len(value):
            value = text if _PATH.match(text) else '"%s"' % re.sub(
                r'[&<>",]', lambda c: "&#%d;" % ord(c.group(0)), text)
    return "%s=%s" % (name, value)


def ask_server(clients, words):
    """(status code, answer) of one command asked through wbemcli: code 0
    and the answer in normal form, or the CIM status code and the message."""
    props = []
    if words[0] == "--props":
        props, words = [words[1]], words[2:]
    op = words[0]
    positional, options = _split_options(words[1:])
    if props and op not in _INSTANCES:
        raise Failure("--props only before ei, gi, ai and ri: %s" % " ".join(words))
    if op in _INSTANCES:
        rc, out, err = clients.wbemcli(op, positional[0], ["-nl"] + options, props)
        read = wbemcli_instances
    elif op == "wait":
        return wait_on_server(clients, *positional)
    elif op in _NAMES:
        rc, out, err = clients.wbemcli(op, positional[0], options)
        read = wbemcli_paths
    elif op == "cm":
        method, args = positional[1], [wbemcli_argument(a) for a in positional[2:]]
        # wbemcli reads a reference's keys up to the end of the text.
        paths = [a for a in args if _PATH.match(a.partition("=")[2])]
        if len(paths) > 1:
            raise Failure("wbemcli takes one reference argument, last: %s" % " ".join(words))
        args = [a for a in args if a not in paths] + paths
        call = method + ("." + ",".join(args) if args else "")
        rc, out, err = clients.wbemcli("cm", positional[0], ["-nl"], [call])
        read = lambda text: wbemcli_method(text, method)  # noqa: E731
    else:
        raise Failure("no wbemcli form for %s" % op)
    code = status_code(err)
    if code is not None or rc != 0:
        return (code if code is not None else -1), err.strip()
    return 0, read(out)


def wait_on_server(clients, cls, assignment, seconds="60"):
    """wait CLASS PROP=VALUE [SECONDS] on the server: (0, []) once an
    instance of CLASS has the value, else a failure as tvrncli's."""
    name, _, value = assignment.partition("=")
    wanted = _prop(name, _elements(value))
    deadline = time.monotonic() + float(seconds)
    while True:
        rc, out, err = clients.wbemcli("ei", cls, ["-nl"], [name])
        if rc != 0:
            return (status_code(err) or -1), err.strip()
        if any(wanted in instance.split("\n") for instance in wbemcli_instances(out)):
            return 0, []
        if time.monotonic() >= deadline:
            return 1, "no %s with %s after %s s" % (cls, assignment, seconds)
        time.sleep(0.5)


def ask_embedded(clients, lines):
    """The same for commands run in one tvrncli process."""
    rc, out, err = clients.cli(lines)
    if rc != 0:
        code = status_code(err)
        return (code if code is not None else -1), err.strip()
    return 0, tvrncli_answers(out)


def compare(what, server, embedded):
    if server == embedded:
        return True
    diff = difflib.unified_diff(_lines(embedded), _lines(server), "tvrncli", "server", lineterm="", n=1)
    print("DIFFERS: %s\n%s" % (what, "\n".join(list(diff)[:80])))
    return False


def _lines(answer):
    if isinstance(answer, tuple):
        return ["status %s: %s" % answer]
    out = []
    for item in answer:
        out += item.split("\n") + [""]
    return out


# ---------------------------------------------------------------------------
# Commands
# ---------------------------------------------------------------------------
def read_list(path):
    with open(path) as f:
        for number, line in enumerate(f, 1):
            line = line.strip()
            if line and not line.startswith("#"):
                yield number, line


def check_classes(clients, path, get_each):
    classes = [cls for _, cls in read_list(path)]
    if clients.seed_from:
        clients.seed()  # once, before the threads

    def ask(cls):
        server = ask_server(clients, ["ei", cls])
        embedded = ask_embedded(clients, [["ei", cls]])
        return server, embedded, clients.wbemcli("ein", cls) if get_each else None

    def get(name):
        return clients._run(["wbemcli", "gi", "-nl", "http://" + name])

    # One client process a question: several at a time, which the server
    # answers side by side; the answers are compared in the list's order.
    ok, count, gets = True, 0, []
    with concurrent.futures.ThreadPoolExecutor(max_workers=4) as pool:
        for cls, ((code, server), (ecode, embedded), names) in zip(classes, pool.map(ask, classes)):
            if code or ecode:
                ok = compare("ei %s" % cls, (code, server), (ecode, embedded)) and ok
                continue
            ok = compare("ei %s" % cls, sorted(server), sorted(embedded)) and ok
            count += len(server)
            if not get_each:
                continue
            rc, out, err = names
            paths = [line for line in out.splitlines() if line.strip()]
            if rc != 0 or len(paths) != len(server):
                print("DIFFERS: ein %s gives %d paths for %d instances: %s"
                      % (cls, len(paths), len(server), err.strip()))
                ok = False
            gets += [(name, server) for name in paths]
        for (name, server), (rc, out, err) in zip(gets, pool.map(get, [g[0] for g in gets])):
            got = wbemcli_instances(out) if rc == 0 else []
            if len(got) != 1 or got[0] not in server:
                print("DIFFERS: gi %s: %s" % (name, err.strip() or "\n".join(got)))
                ok = False
    print("classes: %d instances compared%s" % (count, ", each one also by gi" if get_each else ""))
    return ok


def check_requests(clients, path):
    ok, count, variables = True, 0, {}
    for number, line in read_list(path):
        m = re.match(r"^let\s+(\w+)\s*=\s*(.*)$", line)
        if m:
            variables[m.group(1)] = m.group(2)
            continue
        text = re.sub(r"\$(\w+)", lambda v: variables[v.group(1)], line)
        text = text.replace("<host>", clients.host_name())
        text = text.replace("<here>", os.path.dirname(os.path.abspath(path)))
        must_fail = text.startswith("!")
        commands = [shlex.split(part) for part in text.lstrip("!").split(" ; ")]
        what = "%s:%d: %s" % (os.path.basename(path), number, line)
        ecode, embedded = ask_embedded(clients, commands)
        scode, answers = 0, []
        for words in commands:
            code, answer = ask_server(clients, words)
            if code:
                scode, answers = code, answer
                break
            answers += answer
        count += 1
        if must_fail:
            if not (scode > 0 and scode == ecode):
                print("DIFFERS: %s\n  must fail alike: server %s (%s), tvrncli %s (%s)"
                      % (what, scode, answers, ecode, embedded))
                ok = False
        elif scode or ecode:
            ok = compare(what, (scode, answers), (ecode, embedded)) and ok
        else:
            ok = compare(what, sorted(answers), sorted(embedded)) and ok
    print("requests: %d compared" % count)
    return ok


def module_pids(library):
    pids = []
    for entry in os.listdir("/proc"):
        if not entry.isdigit():
            continue
        try:
            with open("/proc/%s/maps" % entry) as f:
                if library in f.read():
                    pids.append(int(entry))
        except OSError:
            pass
    return pids


def main(argv):
    ap = argparse.ArgumentParser(description=__doc__.split("\n\n")[0])
    ap.add_argument("--url", default="http://localhost:5988/" + NAMESPACE)
    ap.add_argument("--tvrncli", default="build/bin/tvrncli")
    ap.add_argument("--module", default="/usr/local/lib/cmpi/" + MODULE_FILE)
    ap.add_argument("--seed-from", action="append", default=[], metavar="NAMESPACE:CLASS")
    sub = ap.add_subparsers(dest="command", required=True)
    c = sub.add_parser("classes")
    c.add_argument("file")
    c.add_argument("--gi", action="store_true")
    r = sub.add_parser("requests")
    r.add_argument("file")
    sub.add_parser("pid").add_argument("library")
    args = ap.parse_args(argv)
    clients = Clients(args)
    try:
        if args.command == "pid":
            pids = module_pids(os.path.realpath(args.library))
            if len(pids) != 1:
                print("processes with %s loaded: %s" % (args.library, pids or "none"), file=sys.stderr)
                return 1
            print(pids[0])
            return 0
        if args.command == "classes":
            return 0 if check_classes(clients, args.file, args.gi) else 1
        return 0 if check_requests(clients, args.file) else 1
    except (Failure, OSError) as e:
        print("check: %s" % e, file=sys.stderr)
        return 2


if __name__ == "__main__":
    sys.exit(main(sys.argv[1:]))
