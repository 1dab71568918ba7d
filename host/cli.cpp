#include "host/cli.h"

#include <unistd.h>

#include <algorithm>
#include <climits>
#include <fstream>
#include <iostream>
#include <map>
#include <sstream>

namespace tvrnhost {
namespace cli {

const char kUsage[] =
    "usage: tvrncli [--module PATH] [--reg FILE] [-n NAMESPACE] [--seed FILE]...\n"
    "               [--props P1,P2,...] [--principal NAME] COMMAND ARGS\n"
    "\n"
    "commands:\n"
    "  ei CLASS                      enumerate instances\n"
    "  ein CLASS                     enumerate instance names\n"
    "  gi PATH                       get an instance\n"
    "  ci PATH [PROP=VALUE]...       create an instance (keys from PATH)\n"
    "  mi PATH [PROP=VALUE]...       modify the listed properties of an instance\n"
    "  di PATH                       delete an instance\n"
    "  ai PATH [--assoc C] [--result-class C] [--role R] [--result-role R]\n"
    "                                associated instances\n"
    "  ain PATH [same options]       associated instance names\n"
    "  ri PATH [--assoc C] [--role R]\n"
    "                                referencing association instances\n"
    "  rin PATH [same options]       referencing association names\n"
    "  im PATH METHOD [ARG=VALUE]... invoke a method; prints the return value and\n"
    "                                the output arguments\n"
    "  ind CLASS [SECONDS]           subscribe and print indications (default 10 s)\n"
    "  help                          this text\n"
    "\n"
    "PATH: [//host/][namespace:]Class.Key=\"value\",Key2=5 (namespace defaults to -n)\n"
    "VALUE: \"text\", 5, -1, 2.5, TRUE, NULL, {1, 2}, or typed as uint16:5,\n"
    "       datetime:\"20240101000000.000000+000\", string[]:{\"a\"}; a bare word is a\n"
    "       string\n"
    "--seed FILE: instances (in the printed text form) for classes that no\n"
    "       provider serves\n";

Defaults defaultsFor(const std::string &exePath)
{
    Defaults d;
    const size_t slash = exePath.rfind('/');
    const std::string dir = slash == std::string::npos ? "." : exePath.substr(0, slash);
    d.module = dir + "/../lib/libtvrnprovider.so";
#ifdef TVRN_DEFAULT_REG
    d.reg = TVRN_DEFAULT_REG;
#endif
    return d;
}

namespace {

std::vector<std::string> splitList(const std::string &s)
{
    std::vector<std::string> r;
    std::stringstream ss(s);
    std::string item;
    while (std::getline(ss, item, ','))
        if (!item.empty())
            r.push_back(item);
    return r;
}

std::string readFile(const std::string &path)
{
    std::ifstream f(path);
    if (!f)
        throw ParseError(path + ": cannot open");
    std::stringstream ss;
    ss << f.rdbuf();
    return ss.str();
}

ObjectPath pathArg(const std::string &text, const std::string &ns)
{
    ObjectPath p = ObjectPath::parse(text);
    if (p.nameSpace().empty())
        p.setNameSpace(ns);
    return p;
}

// Splits a command's arguments into positional ones and --name value options.
struct CommandArgs {
    std::vector<std::string> positional;
    std::map<std::string, std::string> options;
    std::string option(const std::string &name) const
    {
        auto it = options.find(name);
        return it == options.end() ? std::string() : it->second;
    }
};

CommandArgs splitArgs(const std::vector<std::string> &args,
                      const std::vector<std::string> &allowed)
{
    CommandArgs r;
    for (size_t i = 0; i < args.size(); ++i) {
        const std::string &a = args[i];
        if (a.compare(0, 2, "--") != 0) {
            r.positional.push_back(a);
            continue;
        }
        const std::string name = a.substr(2);
        if (std::find(allowed.begin(), allowed.end(), name) == allowed.end())
            throw ParseError("unknown option " + a);
        if (i + 1 >= args.size())
            throw ParseError(a + " needs a value");
        r.options[name] = args[++i];
    }
    return r;
}

void expectCount(const CommandArgs &a, size_t min, size_t max, const std::string &cmd)
{
    if (a.positional.size() < min || a.positional.size() > max)
        throw ParseError("wrong number of arguments for " + cmd + " (see tvrncli help)");
}

int failed(std::ostream &err, const Status &st)
{
    err << "tvrncli: " << st.toString() << "\n";
    return 1;
}

}  // namespace

PropertyVector parseAssignments(const std::vector<std::string> &args)
{
    PropertyVector r;
    for (const auto &a : args) {
        const size_t eq = a.find('=');
        if (eq == std::string::npos || eq == 0)
            throw ParseError("expected NAME=VALUE: " + a);
        const std::string name = a.substr(0, eq);
        if (findProperty(r, name))
            throw ParseError("given twice: " + name);
        try {
            r.push_back(Property{name, parseValue(a.substr(eq + 1))});
        } catch (const ParseError &e) {
            throw ParseError(name + ": " + e.what());
        }
    }
    return r;
}

std::string formatInstances(const std::vector<Instance> &items)
{
    std::string s;
    for (size_t i = 0; i < items.size(); ++i) {
        if (i)
            s += '\n';
        s += items[i].toString();
    }
    return s;
}

std::string formatPaths(const std::vector<ObjectPath> &items)
{
    std::string s;
    for (const auto &p : items)
        s += p.toString() + '\n';
    return s;
}

std::string formatMethodResult(const MethodResult &r)
{
    return declarations(PropertyVector{{"ReturnValue", r.returnValue}}) + declarations(r.out);
}

std::string formatIndication(const Indication &ind)
{
    return "// " + ind.nameSpace + '\n' + ind.instance.toString();
}

Invocation parseInvocation(const std::vector<std::string> &args, const Defaults &d)
{
    Invocation inv;
    inv.module = d.module;
    inv.reg = d.reg;
    inv.nameSpace = d.nameSpace;
    size_t i = 0;
    auto value = [&](const std::string &opt) -> std::string {
        if (i + 1 >= args.size())
            throw ParseError(opt + " needs a value");
        return args[++i];
    };
    for (; i < args.size(); ++i) {
        const std::string &a = args[i];
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

void seedStores(Host &host, const Invocation &inv)
{
    for (const auto &file : inv.seeds) {
        std::vector<Instance> insts;
        try {
            insts = parseInstances(readFile(file));
        } catch (const ParseError &e) {
            throw ParseError(file + ": " + e.what());
        }
        for (auto &inst : insts) {
            const std::string ns =
                inst.path().nameSpace().empty() ? inv.nameSpace : inst.path().nameSpace();
            if (!host.store(ns).add(inst))
                throw ParseError(file + ": duplicate instance " + inst.path().toString());
        }
    }
}

int execute(Host &host, const Invocation &inv, std::ostream &out, std::ostream &err)
{
    const std::string &cmd = inv.command;
    const std::string &ns = inv.nameSpace;
    try {
        if (cmd == "help") {
            out << kUsage;
            return 0;
        }
        if (cmd == "ei" || cmd == "ein") {
            CommandArgs a = splitArgs(inv.args, {});
            expectCount(a, 1, 1, cmd);
            if (cmd == "ei") {
                auto r = host.enumerateInstances(ns, a.positional[0], inv.props);
                if (!r.ok())
                    return failed(err, r);
                out << formatInstances(r.items);
            } else {
                auto r = host.enumerateInstanceNames(ns, a.positional[0]);
                if (!r.ok())
                    return failed(err, r);
                out << formatPaths(r.items);
            }
            return 0;
        }
        if (cmd == "gi" || cmd == "di") {
            CommandArgs a = splitArgs(inv.args, {});
            expectCount(a, 1, 1, cmd);
            const ObjectPath p = pathArg(a.positional[0], ns);
            if (cmd == "di") {
                Status st = host.deleteInstance(p);
                return st.ok() ? 0 : failed(err, st);
            }
            auto r = host.getInstance(p, inv.props);
            if (!r.ok())
                return failed(err, r);
            out << r.instance.toString();
            return 0;
        }
        if (cmd == "ci" || cmd == "mi") {
            CommandArgs a = splitArgs(inv.args, {});
            expectCount(a, 1, SIZE_MAX, cmd);
            const ObjectPath p = pathArg(a.positional[0], ns);
            Instance inst(p);
            for (const auto &k : p.keys())
                inst.set(k.name, k.value);
            const PropertyVector assigned = parseAssignments(
                std::vector<std::string>(a.positional.begin() + 1, a.positional.end()));
            std::vector<std::string> names;
            for (const auto &prop : assigned) {
                inst.set(prop.name, prop.value);
                names.push_back(prop.name);
            }
            if (cmd == "ci") {
                auto r = host.createInstance(inst);
                if (!r.ok())
                    return failed(err, r);
                out << r.path.toString() << '\n';
                return 0;
            }
            Status st = host.modifyInstance(inst, names);
            return st.ok() ? 0 : failed(err, st);
        }
        if (cmd == "ai" || cmd == "ain") {
            CommandArgs a = splitArgs(inv.args, {"assoc", "result-class", "role", "result-role"});
            expectCount(a, 1, 1, cmd);
            const ObjectPath p = pathArg(a.positional[0], ns);
            if (cmd == "ai") {
                auto r = host.associators(p, a.option("assoc"), a.option("result-class"),
                                          a.option("role"), a.option("result-role"), inv.props);
                if (!r.ok())
                    return failed(err, r);
                out << formatInstances(r.items);
            } else {
                auto r = host.associatorNames(p, a.option("assoc"), a.option("result-class"),
                                              a.option("role"), a.option("result-role"));
                if (!r.ok())
                    return failed(err, r);
                out << formatPaths(r.items);
            }
            return 0;
        }
        if (cmd == "ri" || cmd == "rin") {
            CommandArgs a = splitArgs(inv.args, {"assoc", "role"});
            expectCount(a, 1, 1, cmd);
            const ObjectPath p = pathArg(a.positional[0], ns);
            if (cmd == "ri") {
                auto r = host.references(p, a.option("assoc"), a.option("role"), inv.props);
                if (!r.ok())
                    return failed(err, r);
                out << formatInstances(r.items);
            } else {
                auto r = host.referenceNames(p, a.option("assoc"), a.option("role"));
                if (!r.ok())
                    return failed(err, r);
                out << formatPaths(r.items);
            }
            return 0;
        }
        if (cmd == "im") {
            CommandArgs a = splitArgs(inv.args, {});
            expectCount(a, 2, SIZE_MAX, cmd);
            const ObjectPath p = pathArg(a.positional[0], ns);
            const PropertyVector in = parseAssignments(
                std::vector<std::string>(a.positional.begin() + 2, a.positional.end()));
            auto r = host.invokeMethod(p, a.positional[1], in);
            if (!r.ok())
                return failed(err, r);
            out << formatMethodResult(r);
            return 0;
        }
        if (cmd == "ind") {
            CommandArgs a = splitArgs(inv.args, {});
            expectCount(a, 1, 2, cmd);
            double seconds = 10;
            if (a.positional.size() == 2) {
                char *end = nullptr;
                seconds = std::strtod(a.positional[1].c_str(), &end);
                if (!end || *end || seconds < 0)
                    throw ParseError("SECONDS must be a non-negative number");
            }
            host.clearIndications();
            Status st = host.subscribe(ns, a.positional[0]);
            if (!st.ok())
                return failed(err, st);
            const auto deadline =
                std::chrono::steady_clock::now() +
                std::chrono::milliseconds(static_cast<long long>(seconds * 1000));
            size_t printed = 0;
            for (;;) {
                const auto now = std::chrono::steady_clock::now();
                if (now >= deadline)
                    break;
                host.waitForIndications(
                    printed + 1, std::chrono::duration_cast<std::chrono::milliseconds>(deadline - now));
                const auto all = host.indications();
                for (; printed < all.size(); ++printed)
                    out << (printed ? "\n" : "") << formatIndication(all[printed]) << std::flush;
            }
            st = host.unsubscribe(ns, a.positional[0]);
            return st.ok() ? 0 : failed(err, st);
        }
        err << "tvrncli: unknown command '" << cmd << "' (see tvrncli help)\n";
        return 2;
    } catch (const ParseError &e) {
        err << "tvrncli: " << e.what() << "\n";
        return 2;
    }
}

int run(const std::vector<std::string> &args, std::ostream &out, std::ostream &err,
        const Defaults &d)
{
    Invocation inv;
    try {
        inv = parseInvocation(args, d);
    } catch (const ParseError &e) {
        err << "tvrncli: " << e.what() << "\n" << kUsage;
        return 2;
    }
    if (inv.command == "help") {
        out << kUsage;
        return 0;
    }
    Host host;
    Status st = host.load(inv.module, inv.reg);
    if (!st.ok())
        return failed(err, st);
    try {
        seedStores(host, inv);
    } catch (const ParseError &e) {
        err << "tvrncli: " << e.what() << "\n";
        return 2;
    }
    const int rc = execute(host, inv, out, err);
    st = host.unload();
    if (!st.ok() && rc == 0)
        return failed(err, st);
    return rc;
}

int main(int argc, char **argv)
{
    std::string exe = argc > 0 ? argv[0] : "tvrncli";
    char buf[PATH_MAX];
    const ssize_t n = readlink("/proc/self/exe", buf, sizeof buf - 1);
    if (n > 0)
        exe.assign(buf, static_cast<size_t>(n));
    try {
        return run(std::vector<std::string>(argv + 1, argv + argc), std::cout, std::cerr,
                   defaultsFor(exe));
    } catch (const std::exception &e) {
        std::cerr << "tvrncli: " << e.what() << "\n";
        return 1;
    }
}

}  // namespace cli
}  // namespace tvrnhost
