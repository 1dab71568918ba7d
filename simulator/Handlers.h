// The JSON entry points of the simulated library: one handler per entry point,
// run under the library's state lock.
#ifndef TVRN_SIMULATOR_HANDLERS_H
#define TVRN_SIMULATOR_HANDLERS_H

#include "simulator/EntryTable.h"
#include "simulator/Model.h"

#include <json/json.h>

#include <chrono>
#include <map>
#include <string>
#include <vector>

namespace tvrnsim {

// Codes of the "error" objects the library answers.
enum ErrorCode {
    kBadRequest = 1,    // request of the wrong shape or member type
    kBadKey = 2,        // key not in colon format
    kNotFound = 3,      // no adapter, port, remote port, LUN or request with that key
    kInvalidValue = 4,  // a value out of range or already in use
    kInvalidState = 5,  // operation not possible in the current state
    kInternal = 6,
};

// Raised inside handlers; answered as {"error": {"name", "code", "message"}}.
struct RequestError {
    int code;
    std::string message;
};

Json::Value errorAnswer(int code, const std::string& message);

struct LogLine {
    int level;  // 1 debug, 2 info, 3 warning, 4 error
    const char* file;
    int line;
    std::string text;
};

struct DiagRequest {
    Json::Value tests{Json::arrayValue};    // posted tests: {"function", "request"}
    Json::Value results{Json::arrayValue};  // outcomes, fixed when started
    std::string state = "posted";           // posted, running, completed, cancelled
    bool stopOnError = false;
    std::chrono::steady_clock::time_point started;
    long durationMs = 0;
};

// Everything the handlers may change, guarded by the library's state lock.
struct State {
    Model model;
    int initResult = 0;
    int nextRequestId = 1;
    std::map<std::string, DiagRequest> diagRequests;
};

struct Call {
    State& st;
    const Json::Value& req;
    EntryId id;
    std::vector<LogLine>& logs;

    void log(int level, const char* file, int line, std::string text) {
        logs.push_back(LogLine{level, file, line, std::move(text)});
    }
};

using Handler = Json::Value (*)(Call&);

// The handler of a JSON entry point; null for the other kinds and for the
// event registrations, which the library itself serves.
Handler handlerFor(EntryId id);

}  // namespace tvrnsim

#endif
