#include <gtest/gtest.h>

#include "gateway/CIMProviderTfaj.h"
#include "gateway/ProviderInit.h"
#include "gateway/ProviderUtil.h"
#include "tests/gateway/TestSupport.h"

using namespace CPTA;
using gwtest::LogCapture;

namespace {

TEST(NoLibrary, StartsWithFallbacksAndFindsNothing) {
    LogCapture& log = LogCapture::get();
    ProviderInit::driverStatus = -1;
    {
        ProviderInit init;
        EXPECT_EQ(libHandle, nullptr);
        EXPECT_EQ(ProviderInit::getDriverStatus(), 1);
        EXPECT_TRUE(
            log.has("DBG", "Error in loading library: libdtfaj.so: cannot open shared object file"))
            << log.text();
        EXPECT_TRUE(log.has("INFO", "TFAJ Library version: NOT Loaded"));
        EXPECT_TRUE(log.has("ERR", "libInitHbaLib returns NULL response or has error"));

        int fallbacks = 0;
#define ENTRY_POINT(kind, symbol, pointer) fallbacks += pointer == TVRN_EP_DEFAULT_##kind;
#include "gateway/EntryPoints.def"
#undef ENTRY_POINT
        EXPECT_EQ(fallbacks, kEntryPointCount);
        EXPECT_TRUE(libGetPortByWwn(Json::Value(Json::objectValue)).isNull());
        EXPECT_EQ(libGetRequestID(), -1);
        EXPECT_EQ(libGetNumOfAdapters(), 65535u);
        EXPECT_EQ(libGetAgtVersion(), nullptr);
        libRegisterEventProcessingCb(nullptr);

        Json::Value list;
        EXPECT_EQ(ProviderUtil::getNumberOfAdapters(list), -1);
        EXPECT_STREQ(ProviderUtil::getAdapterSerialNumber("1000000533a0b1c2").c_str(), "");
        EXPECT_STREQ(ProviderUtil::getDriverVersion().c_str(), "");
        log.mark();
    }
    EXPECT_TRUE(log.has("DBG", "Inside ProviderInit Destructor."));
}

}  // namespace
