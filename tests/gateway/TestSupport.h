// Shared helpers of the gateway tests: reading the module's log, loading a
// fake adapter library, and scratch directories.
#ifndef TVRN_TESTS_GATEWAY_TESTSUPPORT_H
#define TVRN_TESTS_GATEWAY_TESTSUPPORT_H

#include <string>
#include <vector>

#include <json/json.h>

#include "tests/gateway/FakeTfaj.h"

namespace gwtest {

// Points HOME at a private directory whose .cimplerc turns logging on at DBG
// (on first use, before anything logs) and reads $HOME/.cimple/messages.
class LogCapture {
public:
    static LogCapture& get();

    // Forget what has been written so far.
    void mark();
    // Look at everything written since the process started.
    void fromStart() { _mark = 0; }
    // Messages written since the last mark, one per line, without the time
    // stamp: "<LEVEL>: <file>(<line>): <message>".
    std::vector<std::string> lines() const;
    // Number of lines since the mark at this level whose message begins with
    // `message`.
    int count(const std::string& level, const std::string& message) const;
    bool has(const std::string& level, const std::string& message) const {
        return count(level, message) > 0;
    }
    // All text since the mark, for failure messages.
    std::string text() const;
    const std::string& home() const { return _home; }

private:
    LogCapture();
    std::string _home;
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

// A fake adapter library loaded by path before the binding looks for
// libdtfaj.so (which then finds it by its soname). Reset on construction.
class FakeLibrary {
public:
    explicit FakeLibrary(const char* path);
    const std::string& path() const { return _path; }
    void* handle() const { return _handle; }

    void reset();
    void on(const char* symbol, const FakeHandler& handler);
    int calls(const char* symbol) const;
    Json::Value lastRequest(const char* symbol) const;
    void setVersion(const char* version);
    void setAdapterCount(unsigned int count);
    FakeLogCB logCallback() const;

private:
    template <typename T>
    T resolve(const char* name) const;
    std::string _path;
    void* _handle;
};

Json::Value parseJson(const std::string& text);

}  // namespace gwtest

#endif
