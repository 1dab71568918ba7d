// A scriptable stand-in for the adapter library (see FakeTfaj.h).
#include "tests/gateway/FakeTfaj.h"

#include <map>
#include <mutex>
#include <string>

namespace {

struct State {
    std::mutex mutex;
    std::map<std::string, FakeHandler> handlers;
    std::map<std::string, int> calls;
    std::map<std::string, Json::Value> requests;
    std::string version = "3.2.1";
    bool hasVersion = true;
    unsigned int adapters = 2;
    FakeLogCB logCallback = nullptr;
    void (*eventCallback)(const char*) = nullptr;
};

State& state() {
    static State s;
    return s;
}

void count(const char* symbol) {
    std::lock_guard<std::mutex> lock(state().mutex);
    state().calls[symbol]++;
}

Json::Value dispatch(const char* symbol, const Json::Value& request) {
    FakeHandler handler;
    {
        std::lock_guard<std::mutex> lock(state().mutex);
        state().calls[symbol]++;
        state().requests[symbol] = request;
        auto it = state().handlers.find(symbol);
        if (it != state().handlers.end())
            handler = it->second;
    }
    if (handler)
        return handler(request);
    if (std::string(symbol) == "init_hba_lib") {
        Json::Value answer(Json::objectValue);
        answer["result"] = 0;
        return answer;
    }
    return Json::Value();
}

}  // namespace

// The entry points, generated from the shared table.
#define FAKE_JSON(symbol) \
    extern "C" Json::Value symbol(const Json::Value& request) { return dispatch(#symbol, request); }
#define FAKE_INT_QUERY(symbol) \
    extern "C" int symbol() {  \
        count(#symbol);        \
        return 0;              \
    }
#define FAKE_UINT_QUERY(symbol)                           \
    extern "C" unsigned int symbol() {                    \
        count(#symbol);                                   \
        std::lock_guard<std::mutex> lock(state().mutex);  \
        return state().adapters;                          \
    }
#define FAKE_STRING_QUERY(symbol)                                         \
    extern "C" const char* symbol() {                                     \
        count(#symbol);                                                   \
        std::lock_guard<std::mutex> lock(state().mutex);                  \
        return state().hasVersion ? state().version.c_str() : nullptr;    \
    }
#define FAKE_EVENT_CB(symbol)                             \
    extern "C" void symbol(void (*callback)(const char*)) { \
        count(#symbol);                                   \
        std::lock_guard<std::mutex> lock(state().mutex);  \
        state().eventCallback = callback;                 \
    }
#define FAKE_LOG_CB(symbol)                               \
    extern "C" void symbol(FakeLogCB callback) {          \
        count(#symbol);                                   \
        std::lock_guard<std::mutex> lock(state().mutex);  \
        state().logCallback = callback;                   \
    }
#define ENTRY_POINT(kind, symbol, pointer) FAKE_##kind(symbol)
#include "gateway/EntryPoints.def"
#undef ENTRY_POINT

extern "C" {

void fake_tfaj_reset() {
    std::lock_guard<std::mutex> lock(state().mutex);
    State& s = state();
    s.handlers.clear();
    s.calls.clear();
    s.requests.clear();
    s.version = "3.2.1";
    s.hasVersion = true;
    s.adapters = 2;
    s.logCallback = nullptr;
    s.eventCallback = nullptr;
}

void fake_tfaj_on(const char* symbol, const FakeHandler* handler) {
    std::lock_guard<std::mutex> lock(state().mutex);
    if (handler != nullptr && *handler)
        state().handlers[symbol] = *handler;
    else
        state().handlers.erase(symbol);
}

int fake_tfaj_calls(const char* symbol) {
    std::lock_guard<std::mutex> lock(state().mutex);
    auto it = state().calls.find(symbol);
    return it != state().calls.end() ? it->second : 0;
}

void fake_tfaj_last_request(const char* symbol, Json::Value* request) {
    std::lock_guard<std::mutex> lock(state().mutex);
    auto it = state().requests.find(symbol);
    *request = it != state().requests.end() ? it->second : Json::Value();
}

void fake_tfaj_set_version(const char* version) {
    std::lock_guard<std::mutex> lock(state().mutex);
    state().hasVersion = version != nullptr;
    state().version = version != nullptr ? version : "";
}

void fake_tfaj_set_adapter_count(unsigned int count) {
    std::lock_guard<std::mutex> lock(state().mutex);
    state().adapters = count;
}

FakeLogCB fake_tfaj_log_callback() {
    std::lock_guard<std::mutex> lock(state().mutex);
    return state().logCallback;
}

}  // extern "C"
