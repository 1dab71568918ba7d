// tvrncli: a command-line client over the embedded host. Parsing, request
// execution and printing live here so that tests can run commands in-process
// and compare the output verbatim.
//
// What it prints:
//   instances    "// <object path>" then the instance in MOF (host/mof.h),
//                a blank line between instances
//   names        one object path per line
//   method call  "ReturnValue = <value>;" then "<Name> = <value>;" per output
//                argument
//   failure      one line on stderr, "tvrncli: CMPI_RC_ERR_NOT_FOUND (6): ...",
//                and exit status 1; usage errors exit with 2
#ifndef TVRN_HOST_CLI_H
#define TVRN_HOST_CLI_H

#include <iosfwd>
#include <optional>
#include <string>
#include <vector>

#include "host/host.h"

namespace tvrnhost {
namespace cli {

// The classes that `classes` and `gc` describe. The host sees providers only
// through CMPI and knows no classes, so the program supplies them.
class ClassCatalog {
public:
    virtual ~ClassCatalog() = default;
    virtual std::vector<std::string> classNames() const = 0;
    // The class declaration in MOF, or nullopt for an unknown class.
    virtual std::optional<std::string> classMof(const std::string& name) const = 0;
    // The classes for the host to serve requests with (HostOptions::classes).
    virtual const ClassRepository* classes() const { return nullptr; }
};

struct Defaults {
    std::string module;  // provider library
    std::string reg;     // registration file
    std::string nameSpace = "root/tavrin";
    const ClassCatalog* catalog = nullptr;
};

// <dir of exe>/../lib/libtvrnprovider.so and the registration file of the
// source tree.
Defaults defaultsFor(const std::string& exePath);

struct Invocation {
    std::string module, reg, nameSpace;
    std::string principal = "root";
    const ClassCatalog* catalog = nullptr;
    bool classDefaults = true;       // --no-class-defaults
    std::vector<std::string> seeds;  // instance files for the stores
    PropertyList props;              // --props A,B
    std::string command;
    std::vector<std::string> args;  // the command's own arguments and options
};

// Parses the global options and the command (throws ParseError on misuse).
Invocation parseInvocation(const std::vector<std::string>& args, const Defaults& d);

// Whether the command talks to the provider library (`gc`, `classes` and
// `help` do not, and run without loading it).
bool usesModule(const std::string& command);

// Seeds the stores from the invocation's --seed files (throws ParseError).
void seedStores(Host& host, const Invocation& inv);

// Runs one command against a loaded host. Returns the exit status: 0, 1 for
// a failed request (one line on `err`), 2 for a usage error (the message and
// the command's usage on `err`).
int execute(Host& host, const Invocation& inv, std::ostream& out, std::ostream& err);

// The whole program: parse, load, seed, execute, unload.
int run(const std::vector<std::string>& args, std::ostream& out, std::ostream& err,
        const Defaults& d);
int main(int argc, char** argv, const ClassCatalog* catalog = nullptr);

// NAME=VALUE arguments (values as for parseValue); throws ParseError.
PropertyVector parseAssignments(const std::vector<std::string>& args);

std::string formatInstance(const Instance& inst);
std::string formatInstances(const std::vector<Instance>& items);
std::string formatPaths(const std::vector<ObjectPath>& items);
std::string formatMethodResult(const MethodResult& r);
// "tvrncli: <code name> (<code>)[: <message>]" on one line.
std::string formatFailure(const Status& st);

// The full help text.
std::string usage();

}  // namespace cli
}  // namespace tvrnhost

#endif
