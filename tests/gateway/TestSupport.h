// Shared helpers of the gateway tests: reading the module's log, loading the
// adapter-library simulator, fresh processes, and scratch directories.
#ifndef TVRN_TESTS_GATEWAY_TESTSUPPORT_H
#define TVRN_TESTS_GATEWAY_TESTSUPPORT_H

#include <functional>
#include <string>
#include <vector>

#include <json/json.h>

namespace gwtest {

// Points HOME at a private directory whose .cimplerc turns logging on at DBG
// (on first use, before anything logs) and reads $HOME/.cimple/messages.
class LogCapture {
public:
    static LogCapture& get();

    // Forget what has been written so far.
    void mark();
    // Messages written since the last mark, one per line, without the time
    // stamp: "<LEVEL>: <file>(<line>): <message>".
    std::vector<std::string> lines() const;
    // Number of lines since the mark at this level whose message begins with
    // (or, with `anywhere`, contains) `text`.
    int count(const std::string& level, const std::string& text, bool anywhere = false) const;
    bool has(const std::string& level, const std::string& message) const {
        return count(level, message) > 0;
    }
    // All text since the mark, for failure messages.
    std::string text() const;

private:
    LogCapture();
    std::string _file;
    long long _mark = 0;
};

// A fresh directory under TMPDIR, removed with everything in it on destruction.
class ScratchDir {
public:
    ScratchDir();
    ~ScratchDir();
    ScratchDir(const ScratchDir&) = delete;
    ScratchDir& operator=(const ScratchDir&) = delete;
    const std::string& path() const { return _path; }
    std::string operator/(const std::string& name) const { return _path + "/" + name; }
    // Names of the entries in the directory, sorted.
    std::vector<std::string> entries() const;

private:
    std::string _path;
};

std::string readFile(const std::string& path);
void writeFile(const std::string& path, const std::string& content);
bool fileExists(const std::string& path);

// The adapter-library simulator (TVRN_SIM_LIBRARY, or a variant of it) loaded
// by path before the binding looks for libdtfaj.so, which then finds this copy
// by its soname. Wraps the simulator's control interface.
class SimLibrary {
public:
    explicit SimLibrary(const char* path);
    const std::string& path() const { return _path; }
    void* handle() const { return _handle; }

    // Back to the built-in host: no faults, counters and recording cleared.
    void reset();
    void loadFixture(const char* nameOrPath);
    void loadFixtureText(const std::string& json);
    void setVersion(const char* version);
    void setInitResult(int result);
    void setFault(const char* entry, const char* key, int kind, int code = 0,
                  const char* text = nullptr, int times = 0);
    unsigned long long calls(const char* entry) const;
    // Calls out of order after free_hba_lib (tvrn_sim_calls_after_free).
    unsigned long long callsAfterFree() const;
    // The recorded calls: entry point names in order, and the requests of one
    // entry point in order.
    std::vector<std::string> entriesCalled() const;
    std::vector<Json::Value> requests(const char* entry) const;
    Json::Value lastRequest(const char* entry) const;

private:
    void* resolve(const char* name) const;
    Json::Value recorded() const;
    std::string _path;
    void* _handle;
};

// Runs `scenario` in a child process and fails the current test when the
// scenario fails there (its failures are printed by the child). The adapter
// library is bound once per process, so a scenario that starts the library as
// a freshly loaded module does needs a process of its own.
void inFreshProcess(const std::function<void()>& scenario);

Json::Value parseJson(const std::string& text);

}  // namespace gwtest

#endif
