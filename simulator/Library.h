// The simulated adapter management library: one process-wide object holding
// the host state, the injected faults, the call counters and recording, and
// the event hub.
#ifndef TVRN_SIMULATOR_LIBRARY_H
#define TVRN_SIMULATOR_LIBRARY_H

#include "simulator/EntryTable.h"
#include "simulator/Events.h"
#include "simulator/Handlers.h"

#include <json/json.h>

#include <atomic>
#include <cstdint>
#include <deque>
#include <mutex>
#include <set>
#include <string>
#include <vector>

namespace tvrnsim {

using LogCallback = void (*)(int level, const char* file, int line, const char* message);

struct Fault {
    int entry;
    std::string key;  // lower case; empty: every request
    int kind;
    int code;
    std::string text;
    int remaining;  // > 0: fires that many more times; otherwise until cleared
    int skip = 0;   // matching calls still to be answered as usual before it fires
};

class Library {
public:
    // Created on first use and never destroyed: the module may call in from its
    // own static destructors after this library's have run.
    static Library& instance();
    // The object if it was created, else null (used at unload).
    static Library* existing();

    // Entry points. Every call is first noted (counted and recorded); callJson
    // does that itself.
    void note(EntryId id, const Json::Value* request = nullptr);
    // Whether a call of `id` comes after free_hba_lib without a new start:
    // counted and reported on stderr. Only the start-up calls (get_agt_version,
    // registering a log callback, init_hba_lib) are in order then.
    bool calledAfterFree(EntryId id, bool withdrawsCallback = false);
    Json::Value callJson(EntryId id, const Json::Value& request);
    int nextRequestId();
    int freeLibrary();
    unsigned adapterCount();
    const char* version();
    void setEventCallback(EventCallback cb);
    void setLogCallback(LogCallback cb);

    // Control.
    int loadFixture(const char* nameOrPath);
    int loadFixtureText(const std::string& text, const std::string& source);
    // Back to the start-up host, with counters, recording and queues cleared.
    int reset();
    std::string lastError();
    static std::string fixtureDir();
    void setVersion(const char* text);
    void setInitResult(int result);
    int setFault(const char* entryPoint, const char* key, int kind, int code, const char* text,
                 int times, int skip = 0);
    void clearFaults();
    std::uint64_t callCount(const char* entryPoint);
    std::uint64_t callsAfterFree() { return callsAfterFree_.load(); }
    std::uint64_t totalCalls();
    void resetCounters();
    // The recorded calls as a JSON array text, and how many did not fit.
    std::string recordedCalls();
    std::uint64_t recordedDropped();
    void clearRecording();
    EventHub& events() { return events_; }
    void shutdown();

private:
    Library() = default;
    bool takeFault(EntryId id, const Json::Value& request, Fault& out);
    Json::Value registerForEvents(const Json::Value& request);
    Json::Value unregisterForEvents(const Json::Value& request);
    void log(std::vector<LogLine> lines);
    const char* intern(const std::string& text);
    void fail(const std::string& source, const std::string& why);

    std::mutex mu_;  // guards everything below but the counters and the event hub
    State state_;
    std::vector<Fault> faults_;
    const char* version_ = nullptr;
    std::set<std::string> versions_;  // every text version_ has pointed at stays alive
    std::string lastError_;
    std::vector<LogLine> pendingLogs_;  // said before a log callback was registered
    std::atomic<LogCallback> logCb_{nullptr};
    EventHub events_;
    std::atomic<std::uint64_t> counters_[EP_COUNT] = {};
    std::atomic<bool> freed_{false};  // free_hba_lib called, init_hba_lib not since
    std::atomic<std::uint64_t> callsAfterFree_{0};

    struct RecordedCall {
        EntryId id;
        Json::Value request;  // null for entry points without a JSON request
    };
    std::mutex recordMu_;  // guards the recording only, so that it never waits for a handler
    std::deque<RecordedCall> recorded_;
    std::uint64_t recordDropped_ = 0;
};

// Changes an answer as a drop-member or wrong-type fault says. The path is
// dot-separated; a numeric part indexes an array.
void applyMemberFault(Json::Value& answer, const std::string& path, bool drop);

}  // namespace tvrnsim

#endif
