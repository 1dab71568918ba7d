#include <gtest/gtest.h>

#include <dlfcn.h>

#include "gateway/CIMProviderTfaj.h"
#include "tests/gateway/BoundFake.h"

using namespace CPTA;
using gwtest::LogCapture;

namespace {

TEST(Binding, EveryEntryPointResolvesIntoTheLibraryOnce) {
    gwtest::FakeLibrary& fake = gwtest::boundFake();
    setupDLLEntryPoints();  // a second call changes nothing
    EXPECT_TRUE(gTfajLibLoaded);
    EXPECT_EQ(libHandle, fake.handle());
    int bound = 0;
#define ENTRY_POINT(kind, symbol, pointer)                                               \
    {                                                                                    \
        Dl_info info;                                                                    \
        ASSERT_NE(dladdr(reinterpret_cast<const void*>(pointer), &info), 0) << #symbol; \
        EXPECT_EQ(fake.path(), info.dli_fname) << #symbol;                               \
        EXPECT_STREQ(info.dli_sname, #symbol);                                           \
        bound++;                                                                         \
    }
#include "gateway/EntryPoints.def"
#undef ENTRY_POINT
    EXPECT_EQ(bound, 117);
    EXPECT_EQ(kEntryPointCount, 117);

    LogCapture& log = LogCapture::get();
    log.fromStart();
    EXPECT_EQ(log.count("DBG", "inside setupDLLEntryPoints"), 1);
    EXPECT_EQ(log.count("DBG", "Error in loading library"), 0);
    for (const std::string& line : log.lines())
        EXPECT_EQ(line.find(" not found. "), std::string::npos) << line;
}

TEST(Binding, CallsReachTheLibrary) {
    gwtest::FakeLibrary& fake = gwtest::boundFake();
    fake.on("getPortByWwn", [](const Json::Value& request) { return request["wwn"]; });
    Json::Value request(Json::objectValue);
    request["wwn"] = "10:00:00:05:33:a0:b1:c2";
    EXPECT_EQ(libGetPortByWwn(request).asString(), "10:00:00:05:33:a0:b1:c2");
    EXPECT_EQ(libGetNumOfAdapters(), 2u);
    EXPECT_STREQ(libGetAgtVersion(), "3.2.1");
    EXPECT_EQ(fake.calls("getPortByWwn") + fake.calls("getNumberOfAdapters") + fake.calls("get_agt_version"), 3);
}

}  // namespace
