// The simulator loaded by its plain name, as the module loads it; the fixture
// named by the environment is unusable.
#include "simulator/SimControl.h"

#include <dlfcn.h>
#include <gtest/gtest.h>
#include <json/json.h>

#include <string>

namespace {

using JsonFn = Json::Value (*)(const Json::Value&);
using UIntFn = unsigned int (*)();

void* library() {
    static void* handle = dlopen("libdtfaj.so", RTLD_NOW);
    return handle;
}

template <typename F>
F sym(const char* name) {
    return reinterpret_cast<F>(dlsym(library(), name));
}

TEST(LoadByName, ExportsExactlyTheEntryPointsAndControls) {
    ASSERT_NE(nullptr, library()) << dlerror();
    int found = 0;
#define ENTRY_POINT(kind, symbol, pointer) \
    EXPECT_NE(nullptr, dlsym(library(), #symbol)) << #symbol; \
    ++found;
#include "gateway/EntryPoints.def"
#undef ENTRY_POINT
    EXPECT_EQ(117, found);
    for (const char* c : {"tvrn_sim_load_fixture", "tvrn_sim_load_fixture_text", "tvrn_sim_reset", "tvrn_sim_last_error",
                          "tvrn_sim_fixture_dir", "tvrn_sim_set_version", "tvrn_sim_set_init_result",
                          "tvrn_sim_set_fault", "tvrn_sim_clear_faults", "tvrn_sim_call_count", "tvrn_sim_total_calls",
                          "tvrn_sim_reset_counters", "tvrn_sim_recorded_calls", "tvrn_sim_recorded_dropped",
                          "tvrn_sim_clear_recording", "tvrn_sim_emit_event", "tvrn_sim_wait_events",
                          "tvrn_sim_events_delivered"})
        EXPECT_NE(nullptr, dlsym(library(), c)) << c;
    EXPECT_EQ(nullptr, dlsym(library(), "_ZN7tvrnsim7Library8instanceEv"));
    EXPECT_EQ(nullptr, dlsym(library(), "_ZN7tvrnsim13errorAnswerEiRKNSt7__cxx1112basic_stringIcSt11char_traitsIcESaIcEEE"));
    // A second open by name finds the same copy.
    void* again = dlopen("libdtfaj.so", RTLD_NOW | RTLD_NOLOAD);
    EXPECT_EQ(library(), again);
    if (again) dlclose(again);
}

TEST(LoadByName, UnusableFixtureFromTheEnvironment) {
    ASSERT_NE(nullptr, library()) << dlerror();
    testing::internal::CaptureStderr();
    const unsigned count = sym<UIntFn>("getNumberOfAdapters")();  // the first call loads the fixture
    const std::string err = testing::internal::GetCapturedStderr();
    EXPECT_EQ(0u, count);
    EXPECT_NE(std::string::npos, err.find("broken.json")) << err;
    EXPECT_NE(std::string::npos, err.find("adapters[0].hbaData.wwn")) << err;
    const std::string last = sym<const char* (*)()>("tvrn_sim_last_error")();
    EXPECT_NE(std::string::npos, last.find("colon format")) << last;

    // The library still works: it initialises, answers no adapters, and
    // reports the problem through the log callback once one is registered.
    static std::string logged;
    sym<void (*)(void (*)(int, const char*, int, const char*))>("registerLogMsgCb")(
        [](int level, const char*, int, const char* text) {
            if (level == 4) logged += text;
        });
    EXPECT_NE(std::string::npos, logged.find("broken.json"));
    Json::Value init = sym<JsonFn>("init_hba_lib")(Json::Value(Json::objectValue));
    EXPECT_TRUE(init.isMember("error"));  // no "appId"
    Json::Value req(Json::objectValue);
    req["appId"] = 2;
    EXPECT_EQ(0, sym<JsonFn>("init_hba_lib")(req)["result"].asInt());
    EXPECT_EQ(0u, sym<JsonFn>("getAllAdaptersIndexString")(Json::Value())["indexStrings"].size());

    // Bare fixture names resolve next to the library that was loaded.
    EXPECT_EQ(0, sym<int (*)(const char*)>("tvrn_sim_load_fixture")("variants"));
    EXPECT_EQ(5u, sym<UIntFn>("getNumberOfAdapters")());
    // A reset goes back to the host the environment chose.
    testing::internal::CaptureStderr();
    EXPECT_EQ(-1, sym<int (*)()>("tvrn_sim_reset")());
    testing::internal::GetCapturedStderr();
    EXPECT_EQ(0u, sym<UIntFn>("getNumberOfAdapters")());
    sym<void (*)(void (*)(int, const char*, int, const char*))>("registerLogMsgCb")(nullptr);
}

// A variant built without getCee exports everything else.
TEST(LoadByName, VariantLacksTheOmittedEntryPoint) {
    void* variant = dlopen(TVRN_SIM_NO_GETCEE, RTLD_NOW | RTLD_LOCAL);
    ASSERT_NE(nullptr, variant) << dlerror();
    EXPECT_EQ(nullptr, dlsym(variant, "getCee"));
    int found = 0;
#define ENTRY_POINT(kind, symbol, pointer) found += dlsym(variant, #symbol) != nullptr;
#include "gateway/EntryPoints.def"
#undef ENTRY_POINT
    EXPECT_EQ(116, found);
    EXPECT_NE(nullptr, dlsym(variant, "tvrn_sim_recorded_calls"));
    dlclose(variant);
}

// The event thread is still running when the process ends; the library stops it.
TEST(LoadByName, EventThreadRunningAtExit) {
    ASSERT_NE(nullptr, library());
    sym<JsonFn>("register_for_events")(Json::Value(Json::objectValue));
    sym<void (*)(void (*)(const char*))>("registerEventProcessingCb")([](const char*) {});
    EXPECT_EQ(1, sym<int (*)(const char*)>("tvrn_sim_emit_event")("x"));
    EXPECT_EQ(0, sym<int (*)(int)>("tvrn_sim_wait_events")(5000));
}

}  // namespace
