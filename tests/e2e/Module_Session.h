// End-to-end test support: the real module, libtvrnprovider.so, loaded into
// the embedded CMPI host as a CIM server would load it, on top of the
// adapter-library simulator.
//
// open(fixture) hands out the one session of the test program. The simulator
// is set to the fixture ("default", "variants", "empty", "large-san" or a path)
// before the module starts up, because the module counts the adapters only
// while it loads. Another fixture or log level reloads the module; the same
// one only puts the simulator back to the fixture's start (state, faults,
// counters, recording). Either way the log is marked, so logLines() shows
// what the test caused.
//
// The program runs with a private HOME (removed at exit) whose .cimplerc sets
// the module's LOG_LEVEL. "<host>" stands for the host string (the Name of
// TAVRIN_ComputerSystem) in paths given to path() and in tvrncli command lines
// given to cli(), and replaces it in what cli() prints.
//
// Link the target with tvrn_e2e_support and register it with tvrn_add_test.
#ifndef TVRN_TESTS_E2E_MODULE_SESSION_H
#define TVRN_TESTS_E2E_MODULE_SESSION_H

#include <cstddef>
#include <memory>
#include <string>
#include <vector>

#include "host/host.h"
#include "simulator/SimControl.h"

namespace tvrne2e {

using tvrnhost::Instance;
using tvrnhost::InstanceResult;
using tvrnhost::MethodResult;
using tvrnhost::ObjectPath;
using tvrnhost::PropertyVector;
using tvrnhost::Result;

constexpr const char* kNameSpace = "root/tavrin";
constexpr const char* kHostPlaceholder = "<host>";

class Module_Session {
public:
    // The module loaded on `fixture` with logging at `logLevel` (FATAL, ERR,
    // WARN, INFO or DBG); loaded() is false when it did not load.
    static Module_Session& open(const std::string& fixture = "default",
                                const std::string& logLevel = "DBG");
    // Unloads the module. Done when the tests of the program end; a program
    // that does not run tests (a benchmark) calls it before main() returns.
    static void close();

    ~Module_Session();
    Module_Session(const Module_Session&) = delete;
    Module_Session& operator=(const Module_Session&) = delete;

    bool loaded() const;
    tvrnhost::Host& host();
    const std::string& hostName() const { return _hostName; }

    // Requests in root/tavrin.
    Result<Instance> enumerate(const std::string& className);
    Result<ObjectPath> enumerateNames(const std::string& className);
    InstanceResult get(const ObjectPath& path);
    MethodResult invoke(const ObjectPath& path, const std::string& method,
                        const PropertyVector& in = {});

    // A path from its text form; the namespace defaults to root/tavrin.
    ObjectPath path(const std::string& text) const;

    // Runs a tvrncli command line in process (words split at blanks; single
    // quotes group words and are removed, double quotes are kept) and
    // returns what it printed, standard output then standard error, masked.
    // `status` receives its exit status.
    std::string cli(const std::string& commandLine, int* status = nullptr);
    // `text` with the host string, where it is a whole quoted value, the host
    // of a URL or the host part of a path ("//host/..."), as "<host>".
    std::string masked(const std::string& text) const;

    // The log lines since the mark, and how many of them contain `text`.
    void markLog();
    std::vector<std::string> logLines() const;
    std::size_t logCount(const std::string& text) const;

    // Library calls since resetCounters() (or open()).
    unsigned long long calls(const std::string& entryPoint) const;
    unsigned long long totalCalls() const;
    void resetCounters();
    // The entry points called since clearRecording() (or open()), in order.
    std::vector<std::string> recordedEntries() const;
    void clearRecording();
    // tvrn_sim_set_fault; see simulator/SimControl.h. False when refused.
    bool fault(const std::string& entryPoint, const std::string& key, tvrn_sim_fault_kind kind,
               const std::string& text = "", int times = 0, int code = 7);

private:
    Module_Session();
    bool start(const std::string& fixture, const std::string& logLevel);
    void stop();
    void resetSimulator();

    std::unique_ptr<tvrnhost::Host> _host;
    std::string _fixture, _logLevel, _hostName;
    std::size_t _logMark = 0;
};

}  // namespace tvrne2e

#endif
