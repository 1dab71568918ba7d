// tvrncli: a command-line client over the embedded host. Parsing, request
// execution and printing live here so that tests can run commands in-process
// and compare the output with golden files.
#ifndef TVRN_HOST_CLI_H
#define TVRN_HOST_CLI_H

#include <iosfwd>
#include <string>
#include <vector>

#include "host/host.h"

namespace tvrnhost {
namespace cli {

struct Defaults {
    std::string module;  // provider library
    std::string reg;     // registration file
    std::string nameSpace = "root/tavrin";
};

// <dir of exe>/../lib/libtvrnprovider.so and the registration file of the
// source tree.
Defaults defaultsFor(const std::string &exePath);

struct Invocation {
    std::string module, reg, nameSpace;
    std::vector<std::string> seeds;  // instance files for the stores
    PropertyList props;              // --props A,B
    std::string command;
    std::vector<std::string> args;   // the command's own arguments and options
};

// Parses the global options and the command (throws ParseError on misuse).
Invocation parseInvocation(const std::vector<std::string> &args, const Defaults &d);

// Seeds the stores from the invocation's --seed files (throws ParseError).
void seedStores(Host &host, const Invocation &inv);

// Runs one command against a loaded host. Returns the exit status: 0, 1 for
// a failed request (message on `err`), 2 for a usage error.
int execute(Host &host, const Invocation &inv, std::ostream &out, std::ostream &err);

// The whole program: parse, load, seed, execute, unload.
int run(const std::vector<std::string> &args, std::ostream &out, std::ostream &err,
        const Defaults &d);
int main(int argc, char **argv);

// NAME=VALUE arguments (values as for parseValue); throws ParseError.
PropertyVector parseAssignments(const std::vector<std::string> &args);

std::string formatInstances(const std::vector<Instance> &items);
std::string formatPaths(const std::vector<ObjectPath> &items);
std::string formatMethodResult(const MethodResult &r);
std::string formatIndication(const Indication &ind);

extern const char kUsage[];

}  // namespace cli
}  // namespace tvrnhost

#endif
