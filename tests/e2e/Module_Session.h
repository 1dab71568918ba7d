// End-to-end test support: the real module, libtvrnprovider.so, loaded into
// the embedded CMPI host as a CIM server would load it, on top of the
// adapter-library simulator.
//
//   #include "tests/e2e/Module_Session.h"
//
//   TEST(FCPorts, OfTheDefaultHost) {
//       tvrne2e::Module_Session& s = tvrne2e::Module_Session::open();      // "default"
//       ASSERT_TRUE(s.loaded());
//       auto ports = s.enumerate("TAVRIN_FCPort");
//       ASSERT_TRUE(ports.ok()) << ports.toString();
//       EXPECT_EQ(s.mof(ports.items[0]), "// root/tavrin:TAVRIN_FCPort....SystemName=\"<host>\"\n...");
//       EXPECT_EQ(s.logCount("No FC Ports Found!"), 0u);
//       EXPECT_EQ(s.calls("getPortByWwn"), 6u);   // one per FC port
//   }
//
// open(fixture) hands out the one session of the test program. The simulator
// is set to the fixture ("default", "variants", "empty", "large-san" or a path)
// before the module starts up, because the module counts the adapters only
// while it loads. Asking for another fixture or log level unloads the module
// and loads it afresh; asking for the same one keeps the module loaded and
// only puts the simulator back to the fixture's start (state, faults,
// counters and the call recording). Either way the log is marked, so
// logLines() shows what the test caused.
//
// The program runs with a private HOME (removed at exit) whose .cimplerc sets
// the module's LOG_LEVEL. The host string, the Name of TAVRIN_ComputerSystem,
// is printed as "<host>" by mof()/paths()/masked() and may be written as
// "<host>" in paths given to path() and in tvrncli command lines given to cli().
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
    // WARN, INFO or DBG). Fails the calling test (and returns a session
    // without a module) when the module does not load.
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
    const std::string& fixture() const { return _fixture; }
    // The host string of the module: the Name of TAVRIN_ComputerSystem.
    const std::string& hostName() const { return _hostName; }

    // ---- requests (namespace root/tavrin) -----------------------------------
    Result<Instance> enumerate(const std::string& className);
    Result<ObjectPath> enumerateNames(const std::string& className);
    InstanceResult get(const ObjectPath& path);
    Result<Instance> associators(const ObjectPath& path, const std::string& assocClass = "",
                                 const std::string& resultClass = "", const std::string& role = "",
                                 const std::string& resultRole = "");
    Result<ObjectPath> associatorNames(const ObjectPath& path, const std::string& assocClass = "",
                                       const std::string& resultClass = "",
                                       const std::string& role = "",
                                       const std::string& resultRole = "");
    Result<Instance> references(const ObjectPath& path, const std::string& assocClass = "",
                                const std::string& role = "");
    Result<ObjectPath> referenceNames(const ObjectPath& path, const std::string& assocClass = "",
                                      const std::string& role = "");
    MethodResult invoke(const ObjectPath& path, const std::string& method,
                        const PropertyVector& in = {});

    // A path from its text form, "<host>" standing for the host string and
    // the namespace defaulting to root/tavrin.
    ObjectPath path(const std::string& text) const;

    // Runs a tvrncli command line in process (words split at blanks; single
    // quotes group words and are removed, double quotes are kept) and
    // returns what it printed, standard output then standard error, masked.
    // `status` receives its exit status.
    std::string cli(const std::string& commandLine, int* status = nullptr);

    // ---- text with the host string as "<host>" ---------------------------------
    std::string mof(const Instance& instance) const;  // "// path" line and MOF
    std::string mof(const std::vector<Instance>& instances) const;
    std::string paths(const std::vector<ObjectPath>& paths) const;  // one per line
    std::string masked(const std::string& text) const;

    // ---- log -----------------------------------------------------------------
    void markLog();
    // The lines logged since the mark.
    std::vector<std::string> logLines() const;
    // How many of them contain `text`.
    std::size_t logCount(const std::string& text) const;

    // ---- simulator -----------------------------------------------------------
    // Library calls since the last resetCounters() (or open()).
    unsigned long long calls(const std::string& entryPoint) const;
    unsigned long long totalCalls() const;
    void resetCounters();
    // The entry points called since the last clearRecording(), in order.
    std::vector<std::string> recordedEntries() const;
    // The same with the requests, as the simulator's JSON array text.
    std::string recording() const;
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
