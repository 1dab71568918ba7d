#include "host/cli.h"

#include <cmpidt.h>
#include <unistd.h>

#include <algorithm>
#include <climits>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <iostream>
#include <map>
#include <sstream>
#include <thread>

#include "host/mof.h"

namespace tvrnhost {
namespace cli {

Defaults defaultsFor(const std::string& exePath) {
    Defaults d;
    const size_t slash = exePath.rfind('/');
    const std::string dir = slash == std::string::npos ? "." : exePath.substr(0, slash);
    d.module = dir + "/../lib/libtvrnprovider.so";
#ifdef TVRN_DEFAULT_REG
    d.reg = TVRN_DEFAULT_REG;
#endif
    return d;
}

// ---------------------------------------------------------------------------
// Printing
// ---------------------------------------------------------------------------
std::string formatInstance(const Instance& inst) {
    return "// " + inst.path().toString() + '\n' + mofInstance(inst);
}

std::string formatInstances(const std::vector<Instance>& items) {
    std::string s;
    for (size_t i = 0; i < items.size(); ++i) {
        if (i)
            s += '\n';
        s += formatInstance(items[i]);
    }
    return s;
}

std::string formatPaths(const std::vector<ObjectPath>& items) {
    std::string s;
    for (const auto& p : items)
        s += p.toString() + '\n';
    return s;
}

std::string formatMethodResult(const MethodResult& r) {
    std::string s = "ReturnValue = " + mofValue(r.returnValue) + ";\n";
    for (const auto& arg : r.out)
        s += arg.name + " = " + mofValue(arg.value) + ";\n";
    return s;
}

std::string formatFailure(const Status& st) {
    std::string s = "tvrncli: " + rcName(st.rc) + " (" + std::to_string(st.rc) + ")";
    if (!st.msg.empty()) {
        std::string msg = st.msg;
        std::replace(msg.begin(), msg.end(), '\n', ' ');
        s += ": " + msg;
    }
    return s;
}

// ---------------------------------------------------------------------------
// Commands
// ---------------------------------------------------------------------------
namespace {

// A command's own arguments: positional ones and --name value options.
struct CommandArgs {
    std::vector<std::string> positional;
    std::map<std::string, std::string> options;
    std::string option(const std::string& name) const {
        auto it = options.find(name);
        return it == options.end() ? std::string() : it->second;
    }
    std::vector<std::string> from(size_t i) const {
        return std::vector<std::string>(positional.begin() + static_cast<long>(i),
                                        positional.end());
    }
};

struct Env {
    Host& host;
    const Invocation& inv;
    std::ostream &out, &err;
};

using Handler = int (*)(Env&, const CommandArgs&);

struct Command {
    const char* name;
    const char* synopsis;  // the arguments, as in the help text
    const char* summary;
    std::vector<std::string> options;  // --name VALUE options it accepts
    size_t minArgs, maxArgs;           // positional arguments
    bool usesModule;
    bool hidden;  // an alias left out of the help text
    Handler run;
};

int failed(std::ostream& err, const Status& st) {
    err << formatFailure(st) << '\n';
    return 1;
}

// Prints what a request returned, or its failure.
template <class R, class Print>
int report(Env& e, const R& r, Print print) {
    if (!r.ok())
        return failed(e.err, r);
    e.out << print(r);
    return 0;
}

int reportStatus(Env& e, const Status& st) {
    return st.ok() ? 0 : failed(e.err, st);
}

ObjectPath pathArg(const Env& e, const std::string& text) {
    ObjectPath p;
    try {
        p = ObjectPath::parse(text);
    } catch (const ParseError& x) {
        std::string why = x.what();
        const std::string prefix = "object path: ";
        if (why.compare(0, prefix.size(), prefix) == 0)
            why.erase(0, prefix.size());
        throw ParseError("malformed object path '" + text + "': " + why);
    }
    if (p.nameSpace().empty())
        p.setNameSpace(e.inv.nameSpace);
    return p;
}

const auto printInstances = [](const auto& r) { return formatInstances(r.items); };
const auto printPaths = [](const auto& r) { return formatPaths(r.items); };

int cmdEnumerate(Env& e, const CommandArgs& a) {
    return report(e, e.host.enumerateInstances(e.inv.nameSpace, a.positional[0], e.inv.props),
                  printInstances);
}

int cmdEnumerateNames(Env& e, const CommandArgs& a) {
    return report(e, e.host.enumerateInstanceNames(e.inv.nameSpace, a.positional[0]), printPaths);
}

int cmdGet(Env& e, const CommandArgs& a) {
    return report(e, e.host.getInstance(pathArg(e, a.positional[0]), e.inv.props),
                  [](const InstanceResult& r) { return formatInstance(r.instance); });
}

int cmdDelete(Env& e, const CommandArgs& a) {
    return reportStatus(e, e.host.deleteInstance(pathArg(e, a.positional[0])));
}

// The instance of `ci` and `mi`: keys from the path, then the assignments.
Instance assignedInstance(Env& e, const CommandArgs& a, std::vector<std::string>& names) {
    Instance inst(pathArg(e, a.positional[0]));
    for (const auto& k : inst.path().keys())
        inst.set(k.name, k.value);
    for (auto& prop : parseAssignments(a.from(1))) {
        names.push_back(prop.name);
        inst.set(prop.name, prop.value);
    }
    return inst;
}

int cmdCreate(Env& e, const CommandArgs& a) {
    std::vector<std::string> names;
    return report(e, e.host.createInstance(assignedInstance(e, a, names)),
                  [](const PathResult& r) { return r.path.toString() + '\n'; });
}

int cmdModify(Env& e, const CommandArgs& a) {
    std::vector<std::string> names;
    const Instance inst = assignedInstance(e, a, names);
    return reportStatus(e, e.host.modifyInstance(inst, names));
}

int cmdAssociators(Env& e, const CommandArgs& a) {
    return report(
        e,
        e.host.associators(pathArg(e, a.positional[0]), a.option("assoc"), a.option("result-class"),
                           a.option("role"), a.option("result-role"), e.inv.props),
        printInstances);
}

int cmdAssociatorNames(Env& e, const CommandArgs& a) {
    return report(
        e,
        e.host.associatorNames(pathArg(e, a.positional[0]), a.option("assoc"),
                               a.option("result-class"), a.option("role"), a.option("result-role")),
        printPaths);
}

int cmdReferences(Env& e, const CommandArgs& a) {
    return report(e,
                  e.host.references(pathArg(e, a.positional[0]), a.option("result-class"),
                                    a.option("role"), e.inv.props),
                  printInstances);
}

int cmdReferenceNames(Env& e, const CommandArgs& a) {
    return report(e,
                  e.host.referenceNames(pathArg(e, a.positional[0]), a.option("result-class"),
                                        a.option("role")),
                  printPaths);
}

int cmdCallMethod(Env& e, const CommandArgs& a) {
    const ObjectPath p = pathArg(e, a.positional[0]);
    const PropertyVector in = parseAssignments(a.from(2));
    return report(e, e.host.invokeMethod(p, a.positional[1], in), formatMethodResult);
}

// The indication as printed: only the properties of --props, when given.
Instance shownIndication(const Env& e, Instance inst) {
    if (!e.inv.props)
        return inst;
    std::vector<std::string> drop;
    for (const auto& prop : inst.properties())
        if (std::none_of(e.inv.props->begin(), e.inv.props->end(),
                         [&](const std::string& n) { return equalsIgnoreCase(n, prop.name); }))
            drop.push_back(prop.name);
    for (const auto& name : drop)
        inst.remove(name);
    return inst;
}

size_t countArg(const std::string& text) {
    char* end = nullptr;
    const unsigned long long n = std::strtoull(text.c_str(), &end, 10);
    if (text.empty() || !end || *end || text[0] == '-' || n == 0)
        throw ParseError("--count must be a positive number");
    return size_t(n);
}

// A JSON string holding `text`.
std::string jsonQuoted(const std::string& text) {
    std::string q = "\"";
    for (const char c : text) {
        if (c == '"' || c == '\\') {
            q += '\\';
            q += c;
        } else if (static_cast<unsigned char>(c) < 0x20) {
            char escaped[8];
            std::snprintf(escaped, sizeof escaped, "\\u%04x", unsigned(c));
            q += escaped;
        } else {
            q += c;
        }
    }
    return q + '"';
}

// The management tunnel: a JSON-RPC request for METHOD with PARAMS (JSON
// text, [] when left out) to executeMethod of the module's agent service;
// prints the response.
int cmdRpc(Env& e, const CommandArgs& a) {
    const Result<ObjectPath> agents =
        e.host.enumerateInstanceNames(e.inv.nameSpace, "TAVRIN_AgentService");
    if (!agents.ok())
        return failed(e.err, agents);
    if (agents.items.empty())
        return failed(e.err, Status{CMPI_RC_ERR_NOT_FOUND, "no TAVRIN_AgentService instance"});
    const std::string params = a.positional.size() > 1 ? a.positional[1] : "[]";
    const std::string request =
        "{\"version\": \"1.1\", \"id\": 1, \"method\": " + jsonQuoted(a.positional[0]) +
        ", \"params\": " + params + "}";
    const MethodResult r = e.host.invokeMethod(agents.items.front(), "executeMethod",
                                               {Property{"request", Value::string(request)}});
    if (!r.ok())
        return failed(e.err, r);
    const Value* response = findProperty(r.out, "response");
    if (response == nullptr || response->isNull())
        return failed(e.err, Status{CMPI_RC_ERR_FAILED, "executeMethod gave no response"});
    e.out << response->asString();
    if (response->asString().empty() || response->asString().back() != '\n')
        e.out << '\n';
    return 0;
}

int cmdIndications(Env& e, const CommandArgs& a) {
    double seconds = 10;
    if (a.positional.size() == 2) {
        char* end = nullptr;
        seconds = std::strtod(a.positional[1].c_str(), &end);
        if (!end || *end || seconds < 0)
            throw ParseError("SECONDS must be a non-negative number");
    }
    const size_t count = a.options.count("count") ? countArg(a.option("count")) : SIZE_MAX;
    const std::string &ns = e.inv.nameSpace, &cls = a.positional[0];
    e.host.clearIndications();
    Status st = e.host.subscribe(ns, cls);
    if (!st.ok())
        return failed(e.err, st);
    const auto deadline = std::chrono::steady_clock::now() +
                          std::chrono::milliseconds(static_cast<long long>(seconds * 1000));
    size_t printed = 0;
    while (printed < count) {
        const auto now = std::chrono::steady_clock::now();
        if (now >= deadline)
            break;
        e.host.waitForIndications(
            printed + 1, std::chrono::duration_cast<std::chrono::milliseconds>(deadline - now));
        const auto all = e.host.indications();
        for (; printed < all.size() && printed < count; ++printed)
            e.out << (printed ? "\n" : "")
                  << formatInstance(shownIndication(e, all[printed].instance)) << std::flush;
    }
    const int rc = reportStatus(e, e.host.unsubscribe(ns, cls));
    if (count != SIZE_MAX && printed < count) {
        e.err << "tvrncli: " << printed << " of " << count << " indications arrived within "
              << seconds << " s\n";
        return 1;
    }
    return rc;
}

// Waits until an instance of CLASS has PROP=VALUE (compared as MOF text, so
// JobState=7 matches a uint16 7), enumerating the class every 100 ms, for at
// most SECONDS (default 60). Prints nothing; running out of time fails.
int cmdWait(Env& e, const CommandArgs& a) {
    const std::string& cls = a.positional[0];
    const PropertyVector wanted = parseAssignments({a.positional[1]});
    const std::string value = mofValue(wanted[0].value);
    const std::string limit = a.positional.size() == 3 ? a.positional[2] : "60";
    char* end = nullptr;
    const double seconds = std::strtod(limit.c_str(), &end);
    if (!end || *end || seconds < 0)
        throw ParseError("SECONDS must be a non-negative number");
    const auto deadline = std::chrono::steady_clock::now() +
                          std::chrono::milliseconds(static_cast<long long>(seconds * 1000));
    for (;;) {
        const auto r = e.host.enumerateInstances(e.inv.nameSpace, cls);
        if (!r.ok())
            return failed(e.err, r);
        for (const auto& inst : r.items) {
            const Value* v = inst.get(wanted[0].name);
            if (v != nullptr && mofValue(*v) == value)
                return 0;
        }
        if (std::chrono::steady_clock::now() >= deadline)
            return failed(
                e.err, Status{CMPI_RC_ERR_FAILED,
                              "no " + cls + " with " + a.positional[1] + " after " + limit + " s"});
        std::this_thread::sleep_for(std::chrono::milliseconds(100));
    }
}

const ClassCatalog& catalog(const Env& e) {
    static const struct None : ClassCatalog {
        std::vector<std::string> classNames() const override { return {}; }
        std::optional<std::string> classMof(const std::string&) const override {
            return std::nullopt;
        }
    } none;
    return e.inv.catalog ? *e.inv.catalog : none;
}

int cmdClasses(Env& e, const CommandArgs&) {
    for (const auto& name : catalog(e).classNames())
        e.out << name << '\n';
    return 0;
}

int cmdGetClass(Env& e, const CommandArgs& a) {
    const auto mof = catalog(e).classMof(a.positional[0]);
    if (!mof)
        return failed(e.err, Status{CMPI_RC_ERR_INVALID_CLASS, "no class " + a.positional[0]});
    e.out << *mof;
    return 0;
}

// One line of a script in words: blanks separate, '...' and "..." quote,
// a backslash takes the next character as it is.
std::vector<std::string> splitWords(const std::string& line) {
    std::vector<std::string> words;
    std::string word;
    bool inWord = false;
    char quote = 0;
    for (size_t i = 0; i < line.size(); ++i) {
        const char c = line[i];
        if (c == '\\' && quote != '\'') {
            if (++i >= line.size())
                throw ParseError("a backslash ends the line");
            word += line[i];
            inWord = true;
        } else if (quote) {
            if (c == quote)
                quote = 0;
            else
                word += c;
        } else if (c == '\'' || c == '"') {
            quote = c;
            inWord = true;
        } else if (c == ' ' || c == '\t') {
            if (inWord)
                words.push_back(word);
            word.clear();
            inWord = false;
        } else {
            word += c;
            inWord = true;
        }
    }
    if (quote)
        throw ParseError(std::string("unclosed ") + quote);
    if (inWord)
        words.push_back(word);
    return words;
}

// Runs each line of a script as a command of its own against the host that
// is already loaded, so that what one command changes the next one sees.
// Lines may start with the per-request options -n and --props;
// blank lines and lines starting with '#' are skipped. Every line runs; the
// exit status is the highest of them.
int cmdScript(Env& e, const CommandArgs& a) {
    const std::string& file = a.positional[0];
    std::ifstream f;
    if (file != "-") {
        f.open(file);
        if (!f)
            return failed(e.err, Status{CMPI_RC_ERR_FAILED, file + ": cannot open"});
    }
    std::istream& in = file == "-" ? std::cin : f;
    Defaults d;
    d.module = e.inv.module;
    d.reg = e.inv.reg;
    d.nameSpace = e.inv.nameSpace;
    d.catalog = e.inv.catalog;
    int worst = 0;
    std::string line;
    for (int number = 1; std::getline(in, line); ++number) {
        const size_t first = line.find_first_not_of(" \t\r");
        if (first == std::string::npos || line[first] == '#')
            continue;
        int rc = 2;
        try {
            Invocation inv = parseInvocation(splitWords(line), d);
            if (!inv.props)
                inv.props = e.inv.props;
            if (inv.module != d.module || inv.reg != d.reg || !inv.seeds.empty() ||
                inv.principal != "root" || !inv.classDefaults)
                throw ParseError(
                    "--module, --reg, --seed, --principal and --no-class-defaults are "
                    "options of the whole script");
            if (inv.command == "script")
                throw ParseError("a script cannot run a script");
            rc = execute(e.host, inv, e.out, e.err);
        } catch (const ParseError& x) {
            e.err << "tvrncli: " << file << ":" << number << ": " << x.what() << '\n';
        }
        worst = std::max(worst, rc);
    }
    return worst;
}

int cmdHelp(Env& e, const CommandArgs&) {
    e.out << usage();
    return 0;
}

const std::vector<std::string> kAssocOptions = {"assoc", "result-class", "role", "result-role"};
const std::vector<std::string> kRefOptions = {"result-class", "role"};

const Command kCommands[] = {
    {"ei", "CLASS", "enumerate instances", {}, 1, 1, true, false, cmdEnumerate},
    {"ein", "CLASS", "enumerate instance names", {}, 1, 1, true, false, cmdEnumerateNames},
    {"gi", "PATH", "get an instance", {}, 1, 1, true, false, cmdGet},
    {"ci",
     "PATH [PROP=VALUE]...",
     "create an instance (keys from PATH)",
     {},
     1,
     SIZE_MAX,
     true,
     false,
     cmdCreate},
    {"mi",
     "PATH [PROP=VALUE]...",
     "modify the listed properties of an instance",
     {},
     1,
     SIZE_MAX,
     true,
     false,
     cmdModify},
    {"di", "PATH", "delete an instance", {}, 1, 1, true, false, cmdDelete},
    {"ai", "PATH [--assoc C] [--result-class C] [--role R] [--result-role R]",
     "associated instances", kAssocOptions, 1, 1, true, false, cmdAssociators},
    {"ain", "PATH [same options as ai]", "associated instance names", kAssocOptions, 1, 1, true,
     false, cmdAssociatorNames},
    {"ri", "PATH [--result-class ASSOC] [--role R]", "referencing association instances",
     kRefOptions, 1, 1, true, false, cmdReferences},
    {"rin", "PATH [same options as ri]", "referencing association names", kRefOptions, 1, 1, true,
     false, cmdReferenceNames},
    {"cm",
     "PATH METHOD [ARG=VALUE]...",
     "call a method, print return value and outputs",
     {},
     2,
     SIZE_MAX,
     true,
     false,
     cmdCallMethod},
    {"im", "PATH METHOD [ARG=VALUE]...", "", {}, 2, SIZE_MAX, true, true, cmdCallMethod},
    {"rpc",
     "METHOD [PARAMS]",
     "call a management method (PARAMS: a JSON array), print the response",
     {},
     1,
     2,
     true,
     false,
     cmdRpc},
    {"ind",
     "CLASS [SECONDS] [--count N]",
     "subscribe and print indications for SECONDS (default 10) or until N came",
     {"count"},
     1,
     2,
     true,
     false,
     cmdIndications},
    {"wait",
     "CLASS PROP=VALUE [SECONDS]",
     "wait until an instance of CLASS has PROP=VALUE (default 60 s)",
     {},
     2,
     3,
     true,
     false,
     cmdWait},
    {"gc",
     "CLASS",
     "print a class of the module's class schema as MOF",
     {},
     1,
     1,
     false,
     false,
     cmdGetClass},
    {"classes",
     "",
     "list the classes of the module's class schema",
     {},
     0,
     0,
     false,
     false,
     cmdClasses},
    {"script",
     "FILE",
     "run each line of FILE (- for standard input) as a command, in one process",
     {},
     1,
     1,
     true,
     false,
     cmdScript},
    {"help", "", "this text", {}, 0, 0, false, false, cmdHelp},
};

const Command* findCommand(const std::string& name) {
    for (const auto& c : kCommands)
        if (name == c.name)
            return &c;
    return nullptr;
}

// Notes on the argument kinds, shown with the usage of the commands that
// take them.
const struct {
    const char* word;
    const char* note;
} kNotes[] = {
    {"PATH", "PATH: [//host/][namespace:]Class.Key=\"value\",Key2=5 (namespace defaults to -n)\n"},
    {"VALUE",
     "VALUE: \"text\", 5, -1, 2.5, TRUE, NULL, {1, 2}, or typed as uint16:5,\n"
     "       datetime:\"20240101000000.000000+000\", string[]:{\"a\"}; a bare word is a\n"
     "       string; a reference is a quoted PATH\n"},
};

std::string commandUsage(const Command& c) {
    std::string s = std::string("usage: tvrncli [OPTIONS] ") + c.name;
    if (*c.synopsis)
        s += std::string(" ") + c.synopsis;
    s += '\n';
    for (const auto& n : kNotes)
        if (std::string(c.synopsis).find(n.word) != std::string::npos)
            s += n.note;
    return s;
}

CommandArgs splitArgs(const Command& c, const std::vector<std::string>& args) {
    CommandArgs r;
    for (size_t i = 0; i < args.size(); ++i) {
        const std::string& a = args[i];
        if (a.compare(0, 2, "--") != 0) {
            r.positional.push_back(a);
            continue;
        }
        const std::string name = a.substr(2);
        if (std::find(c.options.begin(), c.options.end(), name) == c.options.end())
            throw ParseError("unknown option " + a);
        if (i + 1 >= args.size())
            throw ParseError(a + " needs a value");
        r.options[name] = args[++i];
    }
    if (r.positional.size() < c.minArgs || r.positional.size() > c.maxArgs)
        throw ParseError(std::string("wrong number of arguments for ") + c.name);
    return r;
}

std::vector<std::string> splitList(const std::string& s) {
    std::vector<std::string> r;
    std::stringstream ss(s);
    std::string item;
    while (std::getline(ss, item, ','))
        if (!item.empty())
            r.push_back(item);
    return r;
}

std::string readFile(const std::string& path) {
    std::ifstream f(path);
    if (!f)
        throw ParseError(path + ": cannot open");
    std::stringstream ss;
    ss << f.rdbuf();
    return ss.str();
}

}  // namespace

std::string usage() {
    std::string s =
        "usage: tvrncli [OPTIONS] COMMAND ARGS\n"
        "\n"
        "options:\n"
        "  --module PATH      provider library (default: lib/libtvrnprovider.so beside bin/)\n"
        "  --reg FILE         registration file\n"
        "  -n NAMESPACE       namespace of requests and of paths without one\n"
        "  --props P1,P2,...  properties to return\n"
        "  --principal NAME   user the requests run as (default: root)\n"
        "  --no-class-defaults\n"
        "                     new instances start empty, not with the class defaults\n"
        "                     (a property the module leaves unset shows as missing)\n"
        "  --seed FILE        instances for classes that no provider serves, typed:\n"
        "                       instance ns:Class.Key=\"v\" {\n"
        "                           string Key = \"v\";\n"
        "                           uint16[] Codes = {2, 3};\n"
        "                       }\n"
        "\n"
        "commands:\n";
    const size_t column = 32;
    for (const auto& c : kCommands) {
        if (c.hidden)
            continue;
        std::string line = std::string("  ") + c.name + (*c.synopsis ? " " : "") + c.synopsis;
        if (line.size() + 2 > column)
            line += '\n' + std::string(column, ' ');
        else
            line.resize(column, ' ');
        s += line + c.summary + '\n';
    }
    s += '\n';
    for (const auto& n : kNotes)
        s += n.note;
    return s;
}

bool usesModule(const std::string& command) {
    const Command* c = findCommand(command);
    return c && c->usesModule;
}

PropertyVector parseAssignments(const std::vector<std::string>& args) {
    PropertyVector r;
    for (const auto& a : args) {
        const size_t eq = a.find('=');
        if (eq == std::string::npos || eq == 0)
            throw ParseError("expected NAME=VALUE: " + a);
        const std::string name = a.substr(0, eq);
        if (findProperty(r, name))
            throw ParseError("given twice: " + name);
        try {
            r.push_back(Property{name, parseValue(a.substr(eq + 1))});
        } catch (const ParseError& e) {
            throw ParseError(name + ": " + e.what());
        }
    }
    return r;
}

Invocation parseInvocation(const std::vector<std::string>& args, const Defaults& d) {
    Invocation inv;
    inv.module = d.module;
    inv.reg = d.reg;
    inv.nameSpace = d.nameSpace;
    inv.catalog = d.catalog;
    size_t i = 0;
    auto value = [&](const std::string& opt) -> std::string {
        if (i + 1 >= args.size())
            throw ParseError(opt + " needs a value");
        return args[++i];
    };
    for (; i < args.size(); ++i) {
        const std::string& a = args[i];
        if (a == "--module")
            inv.module = value(a);
        else if (a == "--reg")
            inv.reg = value(a);
        else if (a == "-n" || a == "--namespace")
            inv.nameSpace = value(a);
        else if (a == "--seed")
            inv.seeds.push_back(value(a));
        else if (a == "--props")
            inv.props = splitList(value(a));
        else if (a == "--principal")
            inv.principal = value(a);
        else if (a == "--no-class-defaults")
            inv.classDefaults = false;
        else if (a == "-h" || a == "--help") {
            inv.command = "help";
            return inv;
        } else if (!a.empty() && a[0] == '-')
            throw ParseError("unknown option " + a);
        else
            break;
    }
    if (i >= args.size())
        throw ParseError("no command given");
    inv.command = args[i];
    inv.args.assign(args.begin() + static_cast<long>(i) + 1, args.end());
    return inv;
}

void seedStores(Host& host, const Invocation& inv) {
    for (const auto& file : inv.seeds) {
        std::vector<Instance> insts;
        try {
            insts = parseInstances(readFile(file));
        } catch (const ParseError& e) {
            throw ParseError(file + ": " + e.what());
        }
        for (auto& inst : insts) {
            const std::string ns =
                inst.path().nameSpace().empty() ? inv.nameSpace : inst.path().nameSpace();
            if (!host.store(ns).add(inst))
                throw ParseError(file + ": duplicate instance " + inst.path().toString());
        }
    }
}

int execute(Host& host, const Invocation& inv, std::ostream& out, std::ostream& err) {
    const Command* c = findCommand(inv.command);
    if (!c) {
        err << "tvrncli: unknown command '" << inv.command << "' (see tvrncli help)\n";
        return 2;
    }
    Env env{host, inv, out, err};
    try {
        return c->run(env, splitArgs(*c, inv.args));
    } catch (const ParseError& e) {
        err << "tvrncli: " << e.what() << '\n' << commandUsage(*c);
        return 2;
    }
}

int run(const std::vector<std::string>& args, std::ostream& out, std::ostream& err,
        const Defaults& d) {
    Invocation inv;
    try {
        inv = parseInvocation(args, d);
    } catch (const ParseError& e) {
        err << "tvrncli: " << e.what() << "\n" << usage();
        return 2;
    }
    HostOptions options;
    options.principal = inv.principal;
    options.classes = inv.catalog ? inv.catalog->classes() : nullptr;
    options.classDefaults = inv.classDefaults;
    Host host(options);
    if (!usesModule(inv.command))
        return execute(host, inv, out, err);
    Status st = host.load(inv.module, inv.reg);
    if (!st.ok())
        return failed(err, st);
    try {
        seedStores(host, inv);
    } catch (const ParseError& e) {
        err << "tvrncli: " << e.what() << "\n";
        return 2;
    }
    const int rc = execute(host, inv, out, err);
    st = host.unload();
    if (!st.ok() && rc == 0)
        return failed(err, st);
    return rc;
}

int main(int argc, char** argv, const ClassCatalog* catalog) {
    std::string exe = argc > 0 ? argv[0] : "tvrncli";
    char buf[PATH_MAX];
    const ssize_t n = readlink("/proc/self/exe", buf, sizeof buf - 1);
    if (n > 0)
        exe.assign(buf, static_cast<size_t>(n));
    Defaults d = defaultsFor(exe);
    d.catalog = catalog;
    try {
        return run(std::vector<std::string>(argv + 1, argv + argc), std::cout, std::cerr, d);
    } catch (const std::exception& e) {
        return failed(std::cerr, Status{CMPI_RC_ERR_FAILED, e.what()});
    }
}

}  // namespace cli
}  // namespace tvrnhost
