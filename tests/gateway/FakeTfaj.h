// Control interface of the fake adapter library used by the gateway tests.
//
// The fake exports every entry point of gateway/EntryPoints.def (one variant
// lacks getCee) under the soname libdtfaj.so. By default a JSON entry point
// answers null, except init_hba_lib, which answers {"result": 0}; a test
// installs its own answer per entry point with fake_tfaj_on. The functions
// below have C linkage so that tests can look them up with dlsym.
#ifndef TVRN_TESTS_GATEWAY_FAKETFAJ_H
#define TVRN_TESTS_GATEWAY_FAKETFAJ_H

#include <functional>

#include <json/json.h>

typedef std::function<Json::Value(const Json::Value&)> FakeHandler;
typedef void (*FakeLogCB)(int level, const char* file, int line, const char* message);

extern "C" {
// Forget handlers, counts and callbacks; version "3.2.1", two adapters.
void fake_tfaj_reset();
// Answer of a JSON entry point (null handler: back to the default).
void fake_tfaj_on(const char* symbol, const FakeHandler* handler);
// Number of calls of any entry point since the last reset.
int fake_tfaj_calls(const char* symbol);
// The request of the last call of a JSON entry point (null when none).
void fake_tfaj_last_request(const char* symbol, Json::Value* request);
// Text returned by get_agt_version (null: no version).
void fake_tfaj_set_version(const char* version);
// Count returned by getNumberOfAdapters.
void fake_tfaj_set_adapter_count(unsigned int count);
// The callback last handed to registerLogMsgCb, or null.
FakeLogCB fake_tfaj_log_callback();
}

#endif
