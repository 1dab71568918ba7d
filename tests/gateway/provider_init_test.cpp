#include <gtest/gtest.h>

#include "gateway/ProviderInit.h"
#include "gateway/ProviderUtil.h"
#include "tests/gateway/BoundFake.h"

using namespace CPTA;
using gwtest::LogCapture;
using gwtest::parseJson;

namespace {

class ProviderInitTest : public ::testing::Test {
protected:
    void SetUp() override {
        fake = &gwtest::boundFake();
        start();
    }
    void TearDown() override { ProviderInit::driverStatus = 1; }
    // Forget earlier results, so that each start-up visibly records its own.
    void start() {
        ProviderInit::driverStatus = -7;
        LogCapture::get().mark();
    }
    void initAnswers(const std::string& json) {
        Json::Value answer = json.empty() ? Json::Value() : parseJson(json);
        fake->on("init_hba_lib", [answer](const Json::Value&) { return answer; });
    }
    bool logged(const char* level, const std::string& text) { return LogCapture::get().has(level, text); }

    gwtest::FakeLibrary* fake = nullptr;
};

TEST(LogCallbackVersion, ThreeCharacterComparisons) {
    EXPECT_TRUE(ProviderInit::acceptsLogCallback("3.2.1"));
    for (const char* version : {"2.9.9", "3.10.0", "4.0.5", "3.2", "", static_cast<const char*>(nullptr)})
        EXPECT_FALSE(ProviderInit::acceptsLogCallback(version)) << (version ? version : "null");
}

TEST_F(ProviderInitTest, FullStartAndTheLibraryLoggingThroughUs) {
    {
        ProviderInit init;
        EXPECT_EQ(ProviderInit::getDriverStatus(), 0);
        EXPECT_EQ(fake->lastRequest("init_hba_lib"), parseJson(R"({"appId": 2})"));
        EXPECT_TRUE(fake->lastRequest("init_hba_lib")["appId"].isInt());
        ASSERT_EQ(fake->logCallback(), &ProviderUtil::logMsg);
        fake->logCallback()(4, "hal.c", 9, "link down");
        EXPECT_EQ(fake->calls("free_hba_lib"), 0);
    }
    EXPECT_EQ(fake->calls("free_hba_lib"), 1);
    EXPECT_TRUE(logged("DBG", "Inside ProviderInit Constructor."));
    EXPECT_TRUE(logged("INFO", "TFAJ Library version: 3.2.1"));
    EXPECT_TRUE(logged("DBG", "Adapter Count = 2"));
    EXPECT_TRUE(logged("ERR", "hal.c:9 link down"));
    EXPECT_TRUE(logged("DBG", "Inside ProviderInit Destructor."));
}

TEST_F(ProviderInitTest, OlderOrUnknownVersionGetsNoCallback) {
    fake->setVersion("2.9.9");
    { ProviderInit init; }
    EXPECT_TRUE(logged("INFO", "TFAJ Library version: 2.9.9"));
    EXPECT_EQ(ProviderInit::driverStatus, 0);
    fake->setVersion(nullptr);
    { ProviderInit init; }
    EXPECT_TRUE(logged("INFO", "TFAJ Library version: Unknown"));
    EXPECT_EQ(fake->calls("registerLogMsgCb"), 0);
}

TEST_F(ProviderInitTest, FailedInitialisationNeverAsksForAdapters) {
    const std::pair<const char*, const char*> cases[] = {
        {R"({"result": 5})", "libInitHbaLib is failed - 5 "},
        {"", "libInitHbaLib returns NULL response or has error"},
        {R"({"error": {"code": 3}})", "libInitHbaLib returns NULL response or has error"},
        {R"({"result": "0"})", "libInitHbaLib is failed - -1 "},  // of the wrong type
        {"[0]", "libInitHbaLib is failed - -1 "},                 // not an object at all
    };
    for (const auto& c : cases) {
        start();
        initAnswers(c.first);
        { ProviderInit init; }
        EXPECT_EQ(ProviderInit::driverStatus, 1) << c.first;
        EXPECT_EQ(LogCapture::get().count("ERR", c.second), 1) << c.first;
    }
    EXPECT_EQ(fake->calls("getNumberOfAdapters"), 0);
    EXPECT_TRUE(ProviderUtil::getDriverStatus());  // status 1 still lets requests through
    ProviderInit::driverStatus = 3;
    EXPECT_FALSE(ProviderUtil::getDriverStatus());
}

TEST_F(ProviderInitTest, LibraryExceptionsOrNoAdaptersGiveStatusOne) {
    fake->on("init_hba_lib", [](const Json::Value&) -> Json::Value { throw HbaAgentError(19, "no driver"); });
    EXPECT_NO_THROW({ ProviderInit init; });
    EXPECT_EQ(ProviderInit::driverStatus, 1);
    EXPECT_TRUE(logged("ERR", "libInitHbaLib got User exception 19: no driver"));

    start();
    fake->reset();
    fake->setAdapterCount(0);
    { ProviderInit init; }
    EXPECT_EQ(ProviderInit::driverStatus, 1);
    EXPECT_TRUE(logged("DBG", "Adapter Count = 0"));
}

}  // namespace
