// The exported symbols of libdtfaj.so: the 117 library entry points, with the
// plain names the module resolves, and the tvrn_sim_ control interface.
#include "simulator/Library.h"
#include "simulator/SimControl.h"

#include <string>

using tvrnsim::EntryId;
using tvrnsim::Library;

#define SIM_API extern "C" __attribute__((visibility("default")))

namespace {

// The entry points that take no JSON request.
int intQuery(EntryId id) {
    Library& lib = Library::instance();
    lib.note(id);
    if (lib.calledAfterFree(id))
        return -1;
    switch (id) {
        case tvrnsim::EP_getRequestID: return lib.nextRequestId();
        case tvrnsim::EP_free_hba_lib: return lib.freeLibrary();
        default: return -1;
    }
}

unsigned int uintQuery(EntryId id) {
    Library& lib = Library::instance();
    lib.note(id);
    if (lib.calledAfterFree(id))
        return 0xFFFFu;
    return id == tvrnsim::EP_getNumberOfAdapters ? lib.adapterCount() : 0xFFFFu;
}

const char* stringQuery(EntryId id) {
    Library& lib = Library::instance();
    lib.note(id);
    lib.calledAfterFree(id);
    return id == tvrnsim::EP_get_agt_version ? lib.version() : nullptr;
}

void eventCallback(EntryId id, void (*cb)(const char*)) {
    Library& lib = Library::instance();
    lib.note(id);
    lib.calledAfterFree(id);
    lib.setEventCallback(cb);
}

void logCallback(EntryId id, void (*cb)(int, const char*, int, const char*)) {
    Library& lib = Library::instance();
    lib.note(id);
    // Taken out of order, the callback is still set: a withdrawal is always
    // honoured, so that the library never calls into an unloaded module.
    lib.calledAfterFree(id, cb == nullptr);
    lib.setLogCallback(cb);
}

// The delivery thread must be gone before the code it runs is unmapped.
__attribute__((destructor)) void stopOnUnload() {
    if (Library* lib = Library::existing())
        lib->shutdown();
}

// Texts handed out by the control interface, one slot per function and thread.
template <int Slot>
const char* keep(std::string text) {
    thread_local std::string held;
    held = std::move(text);
    return held.c_str();
}

}  // namespace

#define SIM_JSON(symbol)                                                    \
    SIM_API Json::Value symbol(const Json::Value& request) {                \
        return Library::instance().callJson(tvrnsim::EP_##symbol, request); \
    }
#define SIM_INT_QUERY(symbol)                  \
    SIM_API int symbol() {                     \
        return intQuery(tvrnsim::EP_##symbol); \
    }
#define SIM_UINT_QUERY(symbol)                  \
    SIM_API unsigned int symbol() {             \
        return uintQuery(tvrnsim::EP_##symbol); \
    }
#define SIM_STRING_QUERY(symbol)                  \
    SIM_API const char* symbol() {                \
        return stringQuery(tvrnsim::EP_##symbol); \
    }
#define SIM_EVENT_CB(symbol)                       \
    SIM_API void symbol(void (*cb)(const char*)) { \
        eventCallback(tvrnsim::EP_##symbol, cb);   \
    }
#define SIM_LOG_CB(symbol)                                                \
    SIM_API void symbol(void (*cb)(int, const char*, int, const char*)) { \
        logCallback(tvrnsim::EP_##symbol, cb);                            \
    }

#define ENTRY_POINT(kind, symbol, pointer) SIM_##kind(symbol)
#include "gateway/EntryPoints.def"
#undef ENTRY_POINT

// ---------------------------------------------------------------------------
// Control interface

SIM_API int tvrn_sim_load_fixture(const char* nameOrPath) {
    return Library::instance().loadFixture(nameOrPath);
}

SIM_API int tvrn_sim_load_fixture_text(const char* jsonText) {
    return Library::instance().loadFixtureText(jsonText ? jsonText : "", "fixture text");
}

SIM_API int tvrn_sim_reset(void) {
    return Library::instance().reset();
}

SIM_API const char* tvrn_sim_last_error(void) {
    return keep<0>(Library::instance().lastError());
}

SIM_API const char* tvrn_sim_fixture_dir(void) {
    return keep<1>(Library::fixtureDir());
}

SIM_API void tvrn_sim_set_version(const char* text) {
    Library::instance().setVersion(text);
}

SIM_API void tvrn_sim_set_init_result(int result) {
    Library::instance().setInitResult(result);
}

SIM_API int tvrn_sim_set_fault(const char* entryPoint, const char* key, int kind, int code,
                               const char* text, int times) {
    return Library::instance().setFault(entryPoint, key, kind, code, text, times);
}

SIM_API int tvrn_sim_set_fault_after(const char* entryPoint, const char* key, int kind, int code,
                                     const char* text, int skip, int times) {
    return Library::instance().setFault(entryPoint, key, kind, code, text, times, skip);
}

SIM_API void tvrn_sim_clear_faults(void) {
    Library::instance().clearFaults();
}

SIM_API unsigned long long tvrn_sim_call_count(const char* entryPoint) {
    return Library::instance().callCount(entryPoint);
}

SIM_API unsigned long long tvrn_sim_total_calls(void) {
    return Library::instance().totalCalls();
}

SIM_API unsigned long long tvrn_sim_calls_after_free(void) {
    return Library::instance().callsAfterFree();
}

SIM_API void tvrn_sim_reset_counters(void) {
    Library::instance().resetCounters();
}

SIM_API const char* tvrn_sim_recorded_calls(void) {
    return keep<2>(Library::instance().recordedCalls());
}

SIM_API unsigned long long tvrn_sim_recorded_dropped(void) {
    return Library::instance().recordedDropped();
}

SIM_API void tvrn_sim_clear_recording(void) {
    Library::instance().clearRecording();
}

SIM_API int tvrn_sim_emit_event(const char* text) {
    if (!text)
        return -1;
    return Library::instance().events().emit(text) ? 1 : 0;
}

SIM_API int tvrn_sim_wait_events(int timeoutMs) {
    return Library::instance().events().waitDelivered(timeoutMs) ? 0 : -1;
}

SIM_API unsigned long long tvrn_sim_events_delivered(void) {
    return Library::instance().events().delivered();
}
