#include <gtest/gtest.h>

#include <stdexcept>

#include "gateway/GuardedCall.h"
#include "tests/gateway/TestSupport.h"

using namespace CPTA;
using gwtest::LogCapture;

namespace {

Json::Value answers(const Json::Value&) { return Json::Value(7); }
Json::Value throwsAgentError(const Json::Value&) { throw HbaAgentError(42, "adapter offline"); }
Json::Value throwsStd(const Json::Value&) { throw std::runtime_error("lib broke"); }
Json::Value throwsInt(const Json::Value&) { throw 17; }

TEST(GuardedCall, ThreeHandlersKeyedMessages) {
    LogCapture& log = LogCapture::get();
    log.mark();
    Json::Value answer;
    EXPECT_TRUE(guardedCall(LibCall("libGetPortByWwn", "k1"), answers, Json::Value(), answer));
    EXPECT_EQ(answer.asInt(), 7);
    EXPECT_TRUE(log.lines().empty());

    const String key("10:00:00:05:33:a0:b1:c2");
    EXPECT_FALSE(guardedCall(LibCall("libGetPortByWwn", key), throwsAgentError, Json::Value(), answer));
    EXPECT_FALSE(guardedCall(LibCall("libGetPortByWwn", key), throwsStd, Json::Value(), answer));
    EXPECT_FALSE(guardedCall(LibCall("libGetPortByWwn", key), throwsInt, Json::Value(), answer));
    EXPECT_EQ(answer.asInt(), 7);  // untouched by the failed calls
    EXPECT_TRUE(log.has("ERR", std::string(key.c_str()) + " - libGetPortByWwn got User exception 42: adapter offline"));
    EXPECT_TRUE(log.has("ERR", std::string(key.c_str()) + " - libGetPortByWwn got std exception: lib broke"));
    EXPECT_TRUE(log.has("ERR", std::string(key.c_str()) + " - libGetPortByWwn got default exception"));
    EXPECT_EQ(log.lines().size(), 3u);
}

TEST(GuardedCall, KeylessAndKeyAtEndWordings) {
    LogCapture& log = LogCapture::get();
    log.mark();
    struct ParamMismatch : HbaAgentError {
        ParamMismatch() : HbaAgentError(-32602, "Invalid params") {}
    };
    EXPECT_FALSE(guardedCall(LibCall("libGetAllRemotePorts"), [] { throw ParamMismatch(); }));
    EXPECT_FALSE(guardedCall(LibCall("libGetAllRemotePorts"), [] { throw std::logic_error("y"); }));
    EXPECT_FALSE(guardedCall(LibCall("libGetAllRemotePorts"), [] { throw 1.5; }));
    const LibCall atEnd("libGetEthPortByEthMac", "00:05:33:aa:bb:cc", LibCall::KEY_AFTER_DEFAULT);
    EXPECT_FALSE(guardedCall(atEnd, [] { throw "text"; }));
    EXPECT_FALSE(guardedCall(atEnd, [] { throw HbaAgentError(9, "z"); }));  // only the default wording moves

    EXPECT_TRUE(log.has("ERR", "libGetAllRemotePorts got User exception -32602: Invalid params"));
    EXPECT_TRUE(log.has("ERR", "libGetAllRemotePorts got std exception: y"));
    EXPECT_TRUE(log.has("ERR", "libGetAllRemotePorts got default exception"));
    EXPECT_TRUE(log.has("ERR", "libGetEthPortByEthMac got default exception for 00:05:33:aa:bb:cc"));
    EXPECT_TRUE(log.has("ERR", "00:05:33:aa:bb:cc - libGetEthPortByEthMac got User exception 9: z"));
}

TEST(GuardedCall, LoggedAtTheCallSite) {
    LogCapture::get().mark();
    const int line = __LINE__ + 1;
    guardedCall(LibCall("libGetVPort"), [] { throw 0; });
    std::vector<std::string> lines = LogCapture::get().lines();
    ASSERT_EQ(lines.size(), 1u);
    EXPECT_NE(lines[0].find("guarded_call_test.cpp(" + std::to_string(line) + "): "), std::string::npos)
        << lines[0];
}

}  // namespace
