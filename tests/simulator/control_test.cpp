// The control interface: fixtures, version and init result, fault injection,
// call counters and the call recording.
#include "tests/simulator/SimTestSupport.h"

#include "gateway/HbaAgentError.h"

#include <dlfcn.h>
#include <stdlib.h>
#include <unistd.h>

#include <atomic>
#include <chrono>
#include <cstring>
#include <filesystem>
#include <map>
#include <stdexcept>
#include <thread>
#include <vector>

using namespace simtest;

namespace {

class Control : public SimTest {};

const Json::Value kFcHbaReq = K("wwn", kFcHba);
const Json::Value kHpReq = K("wwn", kHpHba);

// Texts handed out stay valid when the version changes. (The gateway's
// start-up tests use the version and init result controls.)
TEST_F(Control, VersionTextsStayValid) {
    tvrn_sim_set_version("2.9.9");
    const char* held = get_agt_version();
    tvrn_sim_set_version("3.10.0");
    EXPECT_STREQ("2.9.9", held);
    EXPECT_STREQ("3.10.0", get_agt_version());
    EXPECT_TRUE(isError(init_hba_lib(J(R"({"appId": "two"})"))));
}

// Each fault below fires once (times = 1), then the answers are normal again.
// (The gateway's tests meet every kind of fault through the module.)
TEST_F(Control, AnswerFaultsAndMemberPaths) {
    ASSERT_EQ(0, tvrn_sim_set_fault("getHbaByWwn", nullptr, TVRN_SIM_FAULT_ERROR_OBJECT, 77,
                                    "adapter busy", 1));
    Json::Value e = getHbaByWwn(kFcHbaReq);
    EXPECT_EQ(77, e["error"]["code"].asInt());
    EXPECT_EQ("adapter busy", e["error"]["message"].asString());
    EXPECT_FALSE(isError(getHbaByWwn(kFcHbaReq)));

    tvrn_sim_set_fault("getHbaByWwn", nullptr, TVRN_SIM_FAULT_DROP_MEMBER, 0, "hbaData.isCNA", 1);
    Json::Value dropped = getHbaByWwn(kFcHbaReq)["hbaData"];
    EXPECT_FALSE(dropped.isMember("isCNA"));
    EXPECT_TRUE(dropped.isMember("model"));
    tvrn_sim_set_fault("getAllAdaptersIndexString", nullptr, TVRN_SIM_FAULT_WRONG_TYPE, 0,
                       "indexStrings.1", 1);
    Json::Value all = getAllAdaptersIndexString(Json::Value());
    EXPECT_TRUE(all["indexStrings"][0].isString());
    EXPECT_TRUE(all["indexStrings"][1].isInt());
    tvrn_sim_set_fault("getAllRemotePorts", nullptr, TVRN_SIM_FAULT_DROP_MEMBER, 0, "0", 1);
    EXPECT_EQ(3u, getAllRemotePorts(J(std::string("{\"pPortWwn\": \"") + kFcPort0 +
                                      "\", \"lPortWwn\": \"" + kFcPort0 + "\"}"))
                      .size());
    tvrn_sim_set_fault("getPortByWwn", nullptr, TVRN_SIM_FAULT_STD_EXCEPTION, 0, "transport down",
                       1);
    EXPECT_THROW(getPortByWwn(K("wwn", kFcPort0)), std::runtime_error);
}

TEST_F(Control, FaultsByKeyAndCount) {
    tvrn_sim_set_fault("getHbaByWwn", kHpHba, TVRN_SIM_FAULT_NULL_ANSWER, 0, nullptr, 0);
    tvrn_sim_set_fault("getHbaByWwn", nullptr, TVRN_SIM_FAULT_ERROR_OBJECT, 1, "any", 1);
    EXPECT_TRUE(getHbaByWwn(kHpReq).isNull());     // the keyed fault wins
    EXPECT_TRUE(isError(getHbaByWwn(kFcHbaReq)));  // the other fires once
    EXPECT_FALSE(isError(getHbaByWwn(kFcHbaReq)));
    EXPECT_TRUE(getHbaByWwn(K("wwn", "20:00:00:05:1E:5C:6D:70")).isNull());  // any case
    tvrn_sim_clear_faults();
    EXPECT_FALSE(getHbaByWwn(kHpReq).isNull());

    EXPECT_EQ(
        -1, tvrn_sim_set_fault("noSuchEntry", nullptr, TVRN_SIM_FAULT_NULL_ANSWER, 0, nullptr, 0));
    EXPECT_EQ(-1, tvrn_sim_set_fault("getNumberOfAdapters", nullptr, TVRN_SIM_FAULT_NULL_ANSWER, 0,
                                     nullptr, 0));
    EXPECT_EQ(-1, tvrn_sim_set_fault("getHost", nullptr, 99, 0, nullptr, 0));
    EXPECT_EQ(-1, tvrn_sim_set_fault("getHost", nullptr, TVRN_SIM_FAULT_DROP_MEMBER, 0, "", 0));
}

TEST_F(Control, FaultsThatLetTheFirstCallsThrough) {
    // The second reading of the adapter list loses the last adapter, once.
    ASSERT_EQ(0, tvrn_sim_set_fault_after("getAllAdaptersIndexString", nullptr,
                                          TVRN_SIM_FAULT_DROP_MEMBER, 0, "indexStrings.2", 1, 1));
    for (unsigned expected : {3u, 2u, 3u})
        EXPECT_EQ(expected, getAllAdaptersIndexString(Json::Value())["indexStrings"].size());

    // Only matching calls are let through: with a key, other adapters' calls do not count.
    ASSERT_EQ(0, tvrn_sim_set_fault_after("getHbaByWwn", kHpHba, TVRN_SIM_FAULT_NULL_ANSWER, 0,
                                          nullptr, 2, 0));
    EXPECT_FALSE(getHbaByWwn(kHpReq).isNull());
    EXPECT_FALSE(getHbaByWwn(kFcHbaReq).isNull());
    EXPECT_FALSE(getHbaByWwn(kHpReq).isNull());
    EXPECT_TRUE(getHbaByWwn(kHpReq).isNull());  // from the third on, until cleared
    EXPECT_TRUE(getHbaByWwn(kHpReq).isNull());
    tvrn_sim_clear_faults();

    EXPECT_EQ(-1, tvrn_sim_set_fault_after("getHost", nullptr, TVRN_SIM_FAULT_NULL_ANSWER, 0,
                                           nullptr, -1, 0));
    // A fixture says the same with "skip".
    ASSERT_EQ(
        0,
        tvrn_sim_load_fixture_text(
            R"({"faults": [{"entryPoint": "getHost", "kind": "null", "skip": 1, "times": 1}]})"));
    EXPECT_FALSE(getHost(Json::Value()).isNull());
    EXPECT_TRUE(getHost(Json::Value()).isNull());
    EXPECT_FALSE(getHost(Json::Value()).isNull());
    EXPECT_EQ(-1, tvrn_sim_load_fixture_text(
                      R"({"faults": [{"entryPoint": "getHost", "kind": "null", "skip": "1"}]})"));
}

// Loading a fixture replaces the host; a reset returns to the built-in one
// with no faults, counters, recording or changes.
TEST_F(Control, FixturesAndReset) {
    ASSERT_EQ(0, tvrn_sim_load_fixture("variants.json"));
    EXPECT_EQ(5u, getNumberOfAdapters());
    setAdapterState(J(std::string("{\"indexStr\": \"") + kFcHba + "\", \"enableState\": false}"));
    tvrn_sim_set_fault("getHost", nullptr, TVRN_SIM_FAULT_NULL_ANSWER, 0, nullptr, 0);
    tvrn_sim_set_version("2.9.9");
    getRequestID();
    ASSERT_EQ(0, tvrn_sim_reset());
    EXPECT_EQ(0u, tvrn_sim_total_calls());
    EXPECT_STREQ("[]", tvrn_sim_recorded_calls());
    EXPECT_EQ(3u, getNumberOfAdapters());
    EXPECT_TRUE(getHbaByWwn(kFcHbaReq)["hbaData"]["hbaStatus"].asBool());
    EXPECT_FALSE(getHost(Json::Value()).isNull());
    EXPECT_EQ(1, getRequestID());
    EXPECT_STREQ("3.2.1", get_agt_version());

    EXPECT_EQ(0, tvrn_sim_load_fixture("empty"));
    EXPECT_EQ(0u, getAllAdaptersIndexString(Json::Value())["indexStrings"].size());
    // The file the built-in host is made from reads the same.
    EXPECT_EQ(
        0, tvrn_sim_load_fixture((std::string(tvrn_sim_fixture_dir()) + "/default.json").c_str()));
    EXPECT_EQ(3u, getNumberOfAdapters());
    EXPECT_EQ("simhost01", getHost(Json::Value())["result"]["hostName"].asString());
    EXPECT_STREQ("", tvrn_sim_last_error());
}

// A copy of the library in a directory without fixtures still serves the
// built-in host; only fixtures named by file are missing.
TEST(BuiltInHost, NeedsNoFiles) {
    namespace fs = std::filesystem;
    char dir[] = "/tmp/tvrn-sim-copy-XXXXXX";
    ASSERT_NE(nullptr, mkdtemp(dir));
    const fs::path copy = fs::path(dir) / "libdtfaj.so";
    fs::copy_file(TVRN_SIM_LIBRARY, copy);
    void* lib = dlopen(copy.c_str(), RTLD_NOW | RTLD_LOCAL);
    fs::remove_all(dir);
    ASSERT_NE(nullptr, lib) << dlerror();
    auto adapters = reinterpret_cast<unsigned (*)()>(dlsym(lib, "getNumberOfAdapters"));
    auto load = reinterpret_cast<int (*)(const char*)>(dlsym(lib, "tvrn_sim_load_fixture"));
    auto lastError = reinterpret_cast<const char* (*)()>(dlsym(lib, "tvrn_sim_last_error"));
    ASSERT_TRUE(adapters && load && lastError);
    EXPECT_EQ(3u, adapters());
    testing::internal::CaptureStderr();
    EXPECT_EQ(-1, load("variants"));
    testing::internal::GetCapturedStderr();
    EXPECT_NE(std::string::npos, std::string(lastError()).find("cannot open")) << lastError();
    EXPECT_EQ(0u, adapters());
    EXPECT_EQ(0, load("default"));
    EXPECT_EQ(3u, adapters());
    dlclose(lib);
}

TEST_F(Control, DelayFaultHoldsOnlyThatCall) {
    ASSERT_EQ(0, tvrn_sim_set_fault("getHbaByWwn", kHpHba, TVRN_SIM_FAULT_DELAY, 300, nullptr, 1));
    std::atomic<bool> slowDone{false};
    Json::Value slowAnswer;
    std::chrono::steady_clock::duration slowTook{};
    std::thread slow([&] {
        const auto start = std::chrono::steady_clock::now();
        slowAnswer = getHbaByWwn(kHpReq);
        slowTook = std::chrono::steady_clock::now() - start;
        slowDone = true;
    });
    while (tvrn_sim_call_count("getHbaByWwn") == 0)
        std::this_thread::yield();
    // Other calls, even of the same entry point, are answered meanwhile.
    EXPECT_EQ("Tavrin-825", getHbaByWwn(kFcHbaReq)["hbaData"]["model"].asString());
    EXPECT_FALSE(slowDone);
    slow.join();
    EXPECT_GE(slowTook, std::chrono::milliseconds(300));
    EXPECT_EQ("Tavrin-1860", slowAnswer["hbaData"]["model"].asString());  // answered as usual
    const auto start = std::chrono::steady_clock::now();
    getHbaByWwn(kHpReq);  // fired once only
    EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::milliseconds(300));

    EXPECT_EQ(-1, tvrn_sim_set_fault("getHost", nullptr, TVRN_SIM_FAULT_DELAY, -1, nullptr, 0));
    EXPECT_EQ(-1,
              tvrn_sim_load_fixture_text(
                  R"({"faults": [{"entryPoint": "getHost", "kind": "delay", "code": 700000}]})"));
}

// Counters and the recording see every call, faulted ones too, and are cleared separately.
TEST_F(Control, CountsAndRecordsEveryCallInOrder) {
    getHbaByWwn(kFcHbaReq);
    getNumberOfAdapters();
    tvrn_sim_set_fault("getHost", nullptr, TVRN_SIM_FAULT_NON_STANDARD, 1, nullptr, 0);
    EXPECT_THROW(getHost(J(R"({"list": [1, "two", null], "flag": true})")), int);
    registerLogMsgCb(nullptr);
    const Json::Value expected = J(std::string(R"([
        {"entry": "getHbaByWwn", "request": {"wwn": ")") +
                                   kFcHba + R"("}},
        {"entry": "getNumberOfAdapters", "request": null},
        {"entry": "getHost", "request": {"list": [1, "two", null], "flag": true}},
        {"entry": "registerLogMsgCb", "request": null}])");
    EXPECT_EQ(expected, J(tvrn_sim_recorded_calls()));
    EXPECT_EQ(nullptr, std::strchr(tvrn_sim_recorded_calls(), '\n'));  // compact
    EXPECT_EQ(1u, tvrn_sim_call_count("getHost"));
    EXPECT_EQ(0u, tvrn_sim_call_count("noSuchEntry"));
    EXPECT_EQ(4u, tvrn_sim_total_calls());
    tvrn_sim_reset_counters();
    EXPECT_EQ(0u, tvrn_sim_total_calls());
    EXPECT_EQ(4u, J(tvrn_sim_recorded_calls()).size());
    tvrn_sim_clear_recording();
    EXPECT_STREQ("[]", tvrn_sim_recorded_calls());
}

// After free_hba_lib only a new start is in order: anything else is counted
// and refused until init_hba_lib; taking the log callback back still works.
TEST_F(Control, CallsAfterFreeAreCountedUntilTheNextStart) {
    EXPECT_EQ(0, free_hba_lib());
    EXPECT_TRUE(isError(getHbaByWwn(kFcHbaReq)));
    registerLogMsgCb(nullptr);
    EXPECT_EQ(2u, tvrn_sim_calls_after_free());
    EXPECT_NE(nullptr, get_agt_version());
    EXPECT_EQ(0, init_hba_lib(J(R"({"appId": 2})"))["result"].asInt());
    EXPECT_EQ("Tavrin-825", getHbaByWwn(kFcHbaReq)["hbaData"]["model"].asString());
    EXPECT_EQ(2u, tvrn_sim_calls_after_free());
    tvrn_sim_reset();
    EXPECT_EQ(0u, tvrn_sim_calls_after_free());
}

TEST_F(Control, RecordingKeepsTheLatestCalls) {
    getHbaByWwn(kFcHbaReq);
    for (int i = 0; i < 100000; ++i)
        getNumberOfAdapters();
    EXPECT_EQ(1u, tvrn_sim_recorded_dropped());
    const Json::Value calls = J(tvrn_sim_recorded_calls());
    ASSERT_EQ(100000u, calls.size());
    EXPECT_EQ("getNumberOfAdapters", calls[0]["entry"].asString());
    tvrn_sim_clear_recording();
    EXPECT_EQ(0u, tvrn_sim_recorded_dropped());
}

TEST_F(Control, RecordingFromManyThreads) {
    std::vector<std::thread> threads;
    for (const char* key : {kFcHba, kHpHba, kCna})
        threads.emplace_back([key] {
            for (int i = 0; i < 500; ++i)
                getAdapterId(K("indexStr", key));
        });
    for (std::thread& t : threads)
        t.join();
    std::map<std::string, int> perKey;
    for (const Json::Value& c : J(tvrn_sim_recorded_calls()))
        perKey[c["request"]["indexStr"].asString()]++;
    EXPECT_EQ((std::map<std::string, int>{{kFcHba, 500}, {kHpHba, 500}, {kCna, 500}}), perKey);
    EXPECT_EQ(1500u, tvrn_sim_total_calls());
}

// A fixture that cannot be used leaves a host without adapters and says why.
TEST_F(Control, BadFixturesGiveClearErrors) {
    struct Case {
        const char* text;
        const char* says;
    };
    const Case cases[] = {
        {"{ not json", "not valid JSON"},
        {"[]", "must be a JSON object"},
        {R"({"adapters": [{"hbaData": {"model": "X"}}]})", "adapters[0].hbaData"},
        {R"({"adapters": [{"hbaData": {"model": "X", "wwn": "1000000051e0a0b0c"}}]})",
         "adapters[0].hbaData.wwn"},
        {R"({"adapters": [{"hbaData": {"model": "X", "wwn": "10:00:00:05:1e:0a:0b:0c"}, "fcPorts": [{"port": {"wwn": "10:00:00:05:1e:0a:0b:0c"}}]}, {"hbaData": {"model": "Y", "wwn": "10:00:00:05:1e:0a:0b:0c"}}]})",
         "duplicate"},
        {R"({"adapters": [{"hbaData": {"model": "X", "wwn": "10:00:00:05:1e:0a:0b:0c"}, "ethPorts": [{"ethData": {"mac": "00:05:1e:00:00:01"}}]}]})",
         "CNA"},
        {R"({"generate": {"fcHbas": -1}})", "generate.fcHbas"},
        {R"({"generate": {"cnas": 18446744073709551615}})", "generate.cnas"},
        {R"({"generate": {"fcHbas": 4096, "targetsPerPort": 65535, "lunsPerTarget": 16384}})",
         "ports, remote ports and LUNs in all"},
        {R"({"diagnosticDurationMs": 9223372036854775808})", "diagnosticDurationMs"},
        {R"({"faults": [{"entryPoint": "getHost", "kind": "explode"}]})", "faults[0]"},
        {R"({"faults": [{"entryPoint": "getHost", "kind": "null", "code": 10000000000}]})",
         "faults[0]"},
        {R"({"faults": [{"entryPoint": "getHost", "kind": "null", "times": 1e12}]})", "faults[0]"},
        {R"({"version": 3})", "version"},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.text);
        testing::internal::CaptureStderr();
        EXPECT_EQ(-1, tvrn_sim_load_fixture_text(c.text));
        const std::string err = testing::internal::GetCapturedStderr();
        EXPECT_NE(std::string::npos, std::string(tvrn_sim_last_error()).find(c.says))
            << tvrn_sim_last_error();
        EXPECT_NE(std::string::npos, err.find(c.says)) << err;
        EXPECT_EQ(0u, getNumberOfAdapters());
        EXPECT_EQ(0, init_hba_lib(J(R"({"appId": 2})"))["result"].asInt());
    }
    testing::internal::CaptureStderr();
    EXPECT_EQ(-1, tvrn_sim_load_fixture("/nonexistent/fixture.json"));
    EXPECT_NE(std::string::npos,
              testing::internal::GetCapturedStderr().find("/nonexistent/fixture.json"));
    EXPECT_NE(std::string::npos, std::string(tvrn_sim_last_error()).find("cannot open"));
}

TEST_F(Control, FixtureVersionFaultsAndDefaults) {
    ASSERT_EQ(0, tvrn_sim_load_fixture_text(R"({
        "version": null, "initResult": 5,
        "faults": [{"entryPoint": "getPortByWwn", "kind": "hbaAgentError", "code": 3, "text": "gone", "key": "10:00:00:05:1e:00:00:01"}],
        "adapters": [{"hbaData": {"model": "Tavrin-825", "wwn": "20:00:00:05:1e:00:00:01"},
                      "fcPorts": [{"port": {"wwn": "10:00:00:05:1e:00:00:01"}}, {"port": {"wwn": "10:00:00:05:1e:00:00:02"}}]}]})"))
        << tvrn_sim_last_error();
    EXPECT_EQ(nullptr, get_agt_version());
    EXPECT_EQ(5, init_hba_lib(J(R"({"appId": 2})"))["result"].asInt());
    EXPECT_THROW(getPortByWwn(K("wwn", "10:00:00:05:1e:00:00:01")), CPTA::HbaAgentError);
    // A minimal adapter gets every member the inventory reads.
    Json::Value port = getPortByWwn(K("wwn", "10:00:00:05:1e:00:00:02"));
    for (const char* m :
         {"nodeWwn", "operatingSpeed", "supportedPortSpeeds", "portStatusValue", "beaconState"})
        EXPECT_TRUE(port.isMember(m)) << m;
    Json::Value d = getHbaByWwn(K("wwn", "20:00:00:05:1e:00:00:01"));
    EXPECT_EQ(2, d["hbaData"]["portCount"].asInt());
    EXPECT_TRUE(d["driver"].isMember("storageDriverName"));
    EXPECT_FALSE(d["driver"].isMember("networkDriverName"));
}

TEST_F(Control, GeneratedSan) {
    ASSERT_EQ(0, tvrn_sim_load_fixture("large-san")) << tvrn_sim_last_error();
    ASSERT_EQ(12u, getNumberOfAdapters());
    // Every port of every FC adapter sees the same generated fabric.
    const std::string a = getAllAdaptersIndexString(Json::Value())["indexStrings"][0].asString();
    const Json::Value ports = getFcPhyPortIndicesByAdapter(K("indexStr", a))["indexStrings"];
    ASSERT_EQ(2u, ports.size());
    const std::string pl = "{\"pPortWwn\": \"" + ports[1].asString() + "\", \"lPortWwn\": \"" +
                           ports[1].asString() + "\"";
    std::map<std::string, int> types;
    const Json::Value remote = getAllRemotePorts(J(pl + "}"));
    for (const Json::Value& r : remote) {
        Json::Value full = getCompleteRemotePort(
            J(pl + ", \"rPortWwn\": \"" + r["remotePortWwn"].asString() + "\"}"));
        types[full["deviceData"]["isTarget"].asBool() ? full["deviceData"]["type"].asString()
                                                      : "initiator"]++;
        types["lun"] += full["lunList"].size();
    }
    EXPECT_EQ(
        (std::map<std::string, int>{{"Disk", 60}, {"Tape", 4}, {"initiator", 2}, {"lun", 64 * 16}}),
        types);
    // Scaled from parameters given as text.
    ASSERT_EQ(0, tvrn_sim_load_fixture_text(
                     R"({"generate": {"fcHbas": 300, "cnas": 1, "portsPerAdapter": 1}})"));
    EXPECT_EQ(301u, getNumberOfAdapters());
}

}  // namespace
