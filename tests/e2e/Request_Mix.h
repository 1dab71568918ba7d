// A mix of the requests a CIM server passes to the module, for the
// concurrency stress test, the soak test and the soak benchmark: every
// class enumerated in turn, gets, associators and references, the tunnel's
// executeMethod, RunDiagnostic, alert indications switched on and off around
// an event the simulator sends, InstallFromURI of a file:// image and
// SetAlarmState. Each request checks its answer.
//
// The mix learns the classes and one instance path per class from the
// loaded module when it is made, before any request has run (the diagnostic
// jobs and records, which come and go, are not among the paths). run() may
// be called from several threads at once; the session must stay loaded
// while they run (unload and load again between calls). The program runs
// with TVRN_DIAG_PAUSE_MS=0, so that the loopback runs do not pause.
#ifndef TVRN_TESTS_E2E_REQUEST_MIX_H
#define TVRN_TESTS_E2E_REQUEST_MIX_H

#include <atomic>
#include <cstddef>
#include <map>
#include <string>
#include <vector>

#include "tests/e2e/Module_Session.h"

namespace tvrne2e {

class Request_Mix {
public:
    // Throws std::runtime_error when the module does not answer as it must
    // at the start (no adapters, a class that does not enumerate).
    explicit Request_Mix(Module_Session& session);
    ~Request_Mix();
    Request_Mix(const Request_Mix&) = delete;
    Request_Mix& operator=(const Request_Mix&) = delete;

    // The kinds of request, in the order run() takes them.
    std::size_t kinds() const;
    const char* kindName(std::size_t request) const;
    // Runs request number `request` (of kind request % kinds()): "" when
    // its answer is sound, else what was wrong.
    std::string run(std::size_t request);
    // Indications received are kept by the host: a single-threaded caller
    // drops them now and then; a threaded one takes them between rounds.
    // "" when every one taken is an alert of the event sent.
    std::string takeIndications();

    const std::vector<std::string>& classes() const { return _classes; }

private:
    // The requests; each rotates through its targets with its own count of turns.
    struct Step {
        const char* name;
        std::string (Request_Mix::*request)(std::size_t turn);
    };
    static constexpr std::size_t kSteps = 9;
    static const Step kStepTable[kSteps];

    std::string enumerate(std::size_t turn);
    std::string get(std::size_t turn);
    std::string associators(std::size_t turn);
    std::string references(std::size_t turn);
    std::string related(std::size_t turn, bool references);
    std::string executeMethod(std::size_t turn);
    std::string runDiagnostic(std::size_t turn);
    std::string indications(std::size_t turn);
    std::string install(std::size_t turn);
    std::string setAlarmState(std::size_t turn);

    Module_Session& _session;
    std::string _imageDir;
    std::vector<std::string> _images;            // of each adapter
    std::vector<std::string> _classes;           // with an instance provider
    std::map<std::string, std::size_t> _counts;  // instances at the start, of fixed classes
    std::vector<ObjectPath> _paths;              // one instance of each class that has one
    std::vector<ObjectPath> _adapters, _alarms;
    ObjectPath _agent, _installService;
    std::vector<ObjectPath> _objects;                   // of the classes that are no associations
    std::vector<std::size_t> _associated, _references;  // of each object, at the start
    std::atomic<std::size_t> _turns[kSteps] = {};
};

// The process's resident memory in bytes, after handing the allocator's free
// memory back to the system (so that what it keeps cached for reuse is not
// counted as growth).
std::size_t residentBytes();

// One soak: `warmUp` requests of the mix, then `requests` more, one after
// the other, and the resident memory after each part.
struct Soak_Figures {
    std::size_t requests = 0;  // after the warm-up
    std::size_t residentWarm = 0, residentEnd = 0;
    double seconds = 0;  // of the requests after the warm-up
    std::size_t failures = 0;
    std::string firstFailure;  // "" when none
    long long growth() const { return (long long)residentEnd - (long long)residentWarm; }
};
Soak_Figures soak(Request_Mix& mix, std::size_t warmUp, std::size_t requests);

}  // namespace tvrne2e

#endif
