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
using LogCb = void (*)(int, const char*, int, const char*);

void* library() {
    static void* handle = dlopen("libdtfaj.so", RTLD_NOW);
    return handle;
}

template <typename F>
F sym(const char* name) {
    return reinterpret_cast<F>(dlsym(library(), name));
}

// Only the entry points and controls are exported, nothing of the implementation.
TEST(LoadByName, ExportsNothingOfTheImplementation) {
    ASSERT_NE(nullptr, library()) << dlerror();
    EXPECT_EQ(nullptr, dlsym(library(), "_ZN7tvrnsim7Library8instanceEv"));
}

TEST(LoadByName, UnusableFixtureFromTheEnvironment) {
    ASSERT_NE(nullptr, library()) << dlerror();
    testing::internal::CaptureStderr();
    const unsigned count =
        sym<UIntFn>("getNumberOfAdapters")();  // the first call loads the fixture
    const std::string err = testing::internal::GetCapturedStderr();
    EXPECT_EQ(0u, count);
    EXPECT_NE(std::string::npos, err.find("broken.json")) << err;
    EXPECT_NE(std::string::npos, err.find("adapters[0].hbaData.wwn")) << err;

    // The library still works: it initialises, and reports the problem through
    // the log callback once one is registered.
    static std::string logged;
    sym<void (*)(LogCb)>("registerLogMsgCb")([](int level, const char*, int, const char* text) {
        if (level == 4)
            logged += text;
    });
    EXPECT_NE(std::string::npos, logged.find("broken.json"));
    Json::Value req(Json::objectValue);
    req["appId"] = 2;
    EXPECT_EQ(0, sym<JsonFn>("init_hba_lib")(req)["result"].asInt());

    // Bare fixture names resolve next to the library that was loaded.
    EXPECT_EQ(0, sym<int (*)(const char*)>("tvrn_sim_load_fixture")("variants"));
    EXPECT_EQ(5u, sym<UIntFn>("getNumberOfAdapters")());
    // A reset goes back to the host the environment chose.
    testing::internal::CaptureStderr();
    EXPECT_EQ(-1, sym<int (*)()>("tvrn_sim_reset")());
    testing::internal::GetCapturedStderr();
    EXPECT_EQ(0u, sym<UIntFn>("getNumberOfAdapters")());
    sym<void (*)(LogCb)>("registerLogMsgCb")(nullptr);
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
