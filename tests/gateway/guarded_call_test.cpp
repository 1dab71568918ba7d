#include <gtest/gtest.h>

#include <functional>
#include <stdexcept>

#include "gateway/GuardedCall.h"
#include "tests/gateway/TestSupport.h"

using namespace CPTA;
using gwtest::LogCapture;

namespace {

Json::Value answers(const Json::Value&) {
    return Json::Value(7);
}
Json::Value throws(const Json::Value&) {
    throw 0;
}

TEST(GuardedCall, AnswerPassesThroughAndFailureIsLoggedAtTheCallSite) {
    LogCapture::get().mark();
    Json::Value answer;
    EXPECT_TRUE(guardedCall(LibCall("libGetPortByWwn", "k1"), answers, Json::Value(), answer));
    EXPECT_EQ(answer.asInt(), 7);
    EXPECT_TRUE(LogCapture::get().lines().empty());
    const int line = __LINE__ + 1;
    const bool ok = guardedCall(LibCall("libGetVPort"), throws, Json::Value(), answer);
    EXPECT_FALSE(ok);
    EXPECT_EQ(answer.asInt(), 7);  // left alone
    std::vector<std::string> lines = LogCapture::get().lines();
    ASSERT_EQ(lines.size(), 1u);
    EXPECT_NE(lines[0].find("guarded_call_test.cpp(" + std::to_string(line) + "): "),
              std::string::npos)
        << lines[0];
}

// Each kind of exception is caught and logged once at ERR with its own
// wording; a key leads the message unless the call puts it after the default
// wording.
TEST(GuardedCall, EveryExceptionIsCaughtWithItsWording) {
    const LibCall keyed("libGetPortByWwn", "10:00:00:05:33:a0:b1:c2");
    const LibCall keyless("libGetAllRemotePorts");
    const LibCall atEnd("libGetEthPortByEthMac", "00:05:33:aa:bb:cc", LibCall::KEY_AFTER_DEFAULT);
    const struct {
        const LibCall& call;
        std::function<void()> body;
        const char* logged;
    } cases[] = {
        {keyed, [] { throw HbaAgentError(42, "adapter offline"); },
         "10:00:00:05:33:a0:b1:c2 - libGetPortByWwn got User exception 42: adapter offline"},
        {keyed, [] { throw std::runtime_error("lib broke"); },
         "10:00:00:05:33:a0:b1:c2 - libGetPortByWwn got std exception: lib broke"},
        {keyless, [] { throw 1.5; }, "libGetAllRemotePorts got default exception"},
        {atEnd, [] { throw "text"; },
         "libGetEthPortByEthMac got default exception for 00:05:33:aa:bb:cc"},
        {atEnd, [] { throw HbaAgentError(9, "z"); },  // only the default wording moves
         "00:05:33:aa:bb:cc - libGetEthPortByEthMac got User exception 9: z"},
    };
    for (const auto& c : cases) {
        LogCapture::get().mark();
        EXPECT_FALSE(guardedCall(c.call, c.body));
        EXPECT_EQ(LogCapture::get().lines().size(), 1u) << c.logged;
        EXPECT_TRUE(LogCapture::get().has("ERR", c.logged)) << LogCapture::get().text();
    }
}

}  // namespace
