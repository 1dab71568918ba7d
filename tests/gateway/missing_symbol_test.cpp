#include <gtest/gtest.h>

#include <dlfcn.h>

#include "gateway/CIMProviderTfaj.h"
#include "gateway/ProviderInit.h"
#include "tests/gateway/BoundFake.h"

using namespace CPTA;

namespace {

TEST(MissingEntryPoint, OnlyThatOneFallsBack) {
    gwtest::FakeLibrary& fake = gwtest::boundFake();
    ASSERT_TRUE(gTfajLibLoaded);
    gwtest::LogCapture& log = gwtest::LogCapture::get();
    log.fromStart();
    EXPECT_EQ(log.count("ERR", "getCee not found. "), 1) << log.text();
    int notFound = 0;
    for (const std::string& line : log.lines())
        notFound += line.find(" not found. ") != std::string::npos;
    EXPECT_EQ(notFound, 1);

    EXPECT_TRUE(libGetCee == default_JsonReqFP);  // never an empty pointer
    EXPECT_TRUE(libGetCee(Json::Value()).isNull());
    int fromLibrary = 0;
#define ENTRY_POINT(kind, symbol, pointer)                                                    \
    {                                                                                         \
        Dl_info info;                                                                         \
        fromLibrary += dladdr(reinterpret_cast<const void*>(pointer), &info) != 0 &&         \
                       fake.path() == info.dli_fname;                                         \
    }
#include "gateway/EntryPoints.def"
#undef ENTRY_POINT
    EXPECT_EQ(fromLibrary, 116);

    { ProviderInit init; }
    EXPECT_EQ(ProviderInit::driverStatus, 0);
}

}  // namespace
