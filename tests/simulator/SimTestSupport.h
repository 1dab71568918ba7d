// Shared declarations for the simulator tests: the library's entry points as
// the module sees them, and small helpers around them.
#ifndef TVRN_TESTS_SIMULATOR_SIMTESTSUPPORT_H
#define TVRN_TESTS_SIMULATOR_SIMTESTSUPPORT_H

#include "simulator/SimControl.h"

#include <gtest/gtest.h>
#include <json/json.h>

#include <string>

#define SIM_DECL_JSON(s) Json::Value s(const Json::Value&);
#define SIM_DECL_INT_QUERY(s) int s();
#define SIM_DECL_UINT_QUERY(s) unsigned int s();
#define SIM_DECL_STRING_QUERY(s) const char* s();
#define SIM_DECL_EVENT_CB(s) void s(void (*)(const char*));
#define SIM_DECL_LOG_CB(s) void s(void (*)(int, const char*, int, const char*));
extern "C" {
#define ENTRY_POINT(kind, symbol, pointer) SIM_DECL_##kind(symbol)
#include "gateway/EntryPoints.def"
#undef ENTRY_POINT
}

namespace simtest {

// A JSON value from text (test data only).
inline Json::Value J(const std::string& text) {
    Json::Value v;
    Json::CharReaderBuilder b;
    std::string errs;
    std::unique_ptr<Json::CharReader> r(b.newCharReader());
    if (!r->parse(text.data(), text.data() + text.size(), &v, &errs))
        ADD_FAILURE() << "bad test JSON: " << errs;
    return v;
}

// {"<member>": "<key>"}
inline Json::Value K(const char* member, const std::string& key) {
    Json::Value v(Json::objectValue);
    v[member] = key;
    return v;
}

inline bool isError(const Json::Value& v) {
    return v.isObject() && v.isMember("error");
}

// Keys of the built-in host (fixtures/default.json).
constexpr const char* kFcHba = "20:00:00:05:1e:0a:0b:0c";    // adapter 1, Tavrin-825
constexpr const char* kFcPort0 = "10:00:00:05:1e:0a:0b:0c";  // its port 0: four remote ports
constexpr const char* kFcPort1 = "10:00:00:05:1e:0a:0b:0d";  // its port 1: link down, beacon on
constexpr const char* kVport = "24:00:00:05:1e:0a:0b:0c";    // virtual port on port 0
constexpr const char* kDisk = "50:05:07:68:01:10:f0:0d";     // disk target, LUNs 0-3
constexpr const char* kTape = "50:01:10:a0:00:2b:3c:01";
constexpr const char* kHpHba = "20:00:00:05:1e:5c:6d:70";  // adapter 2, HP OEM Tavrin-1860
constexpr const char* kCna = "00:05:1e:8a:4b:00";          // adapter 3, Tavrin-1020
constexpr const char* kFcoePort0 = "10:00:00:05:1e:8a:4b:01";
constexpr const char* kEth0 = "00:05:1e:8a:4b:01";
constexpr const char* kEth1 = "00:05:1e:8a:4b:02";

// A key that only variants.json has (besides all of the above).
constexpr const char* kDellHba = "20:00:00:05:1e:7e:8f:90";  // adapter 3, mezzanine Tavrin-K7M

// Every test starts from the built-in host with no faults, zero counters and
// nothing recorded.
class SimTest : public ::testing::Test {
protected:
    void SetUp() override { ASSERT_EQ(0, tvrn_sim_reset()) << tvrn_sim_last_error(); }
};

}  // namespace simtest

#endif
