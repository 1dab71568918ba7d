// The dispatchers: routing, the driver gate, empty hosts, the host identity
// per request and the computer system.
#include <set>

#include "gateway/ProviderInit.h"
#include "inventory/FCHBAManager.h"
#include "inventory/HostIdentityScope.h"
#include "schema/generated/TAVRIN_ComputerSystem.h"
#include "tests/inventory/InventoryTestSupport.h"

using namespace CPTA;
using namespace invtest;

namespace {

const std::set<int> kFCHBAServed = {1, 2, 3, 4, 5, 6, 7, 8, 20, 30, 34, 35, 36};
const std::set<int> kHDRServed = {9, 16, 38};

class Dispatch : public InventoryTest {};

TEST_F(Dispatch, RoutesEveryClassIdOfTheBuiltInHost) {
    for (int id = 0; id <= MAXCLASSID; id++) {
        EXPECT_EQ(Instances(fchba(classId_t(id))).empty(), kFCHBAServed.count(id) == 0) << id;
        EXPECT_EQ(Instances(hdr(classId_t(id))).empty(), kHDRServed.count(id) == 0) << id;
    }
}

TEST_F(Dispatch, ClosedDriverGateAsksTheLibraryNothingButStillNamesTheHost) {
    for (int status : {2, 3}) {
        ProviderInit::driverStatus = status;
        for (int id : kFCHBAServed) {
            SCOPED_TRACE("status " + std::to_string(status) + ", class id " + std::to_string(id));
            gwtest::LogCapture::get().mark();
            tvrn_sim_reset_counters();
            Instances got(fchba(classId_t(id)));
            EXPECT_EQ(tvrn_sim_total_calls(), 0u);
            if (id == CID_COMPUTER_SYSTEM) {
                EXPECT_EQ(got.size(), 1u);
            } else {
                EXPECT_TRUE(got.empty());
                EXPECT_EQ(logged("ERR", "Driver is not installed or there is a tfal mismatch hence "
                                        "no instances returned"), 1);
            }
        }
        tvrn_sim_reset_counters();
        Instances extents(hdr(CID_STORAGE_EXTENT));
        EXPECT_TRUE(extents.empty());
        EXPECT_EQ(tvrn_sim_total_calls(), 0u);
    }
}

TEST_F(Dispatch, DriverStatusOneStillAsksTheLibrary) {
    ProviderInit::driverStatus = 1;
    Instances ports(fchba(CID_FC_PORT));
    EXPECT_EQ(ports.size(), 6u);
}

TEST_F(Dispatch, HostIsResolvedOncePerRequest) {
    for (int id : kFCHBAServed) {
        hostCounters() = HostCounters();
        Instances got(fchba(classId_t(id)));
        // Connectors do not name the host.
        EXPECT_EQ(hostCounters().resolves, id == CID_PHYSICAL_CONNECTOR ? 0 : 1) << "class id " << id;
    }
    for (int id : kHDRServed) {
        hostCounters() = HostCounters();
        Instances got(hdr(classId_t(id)));
        EXPECT_EQ(hostCounters().resolves, 1) << "class id " << id;
    }
    // A request that builds nothing does not look the host up at all.
    ProviderInit::driverStatus = 2;
    hostCounters() = HostCounters();
    Instances none(fchba(CID_FC_PORT));
    EXPECT_EQ(hostCounters().resolves, 0);
}

TEST_F(Dispatch, NestedScopesShareOneResolutionAndTheNextRequestResolvesAgain) {
    {
        HostIdentityScope request;
        Instances controllers(fchba(CID_PORT_CONTROLLER));
        Instances ports(FCHBAManager::getFCHBAManager()->getFCPortInstancesByAdapter(
            "200000051e0a0b0c"));
        Instances hosts(fchba(CID_COMPUTER_SYSTEM));
        EXPECT_EQ(ports.size(), 2u);
        EXPECT_EQ(hostCounters().resolves, 1);
    }
    EXPECT_FALSE(HostIdentityScope::active());
    Instances again(fchba(CID_PORT_CONTROLLER));
    EXPECT_EQ(hostCounters().resolves, 2);
}

TEST_F(Dispatch, ScopeAnswersAsGetHostInfoDoes) {
    struct Case {
        HostMode mode;
        int kind;
        const char* text;
    };
    const Case cases[] = {
        {HostMode::ADDRESS, 0, kHostAddress},
        {HostMode::LOOPBACK_ONLY, 2, "invhost"},
        {HostMode::UNRESOLVABLE, 2, "invhost"},
        {HostMode::NO_NAME, 3, "localhost"},
    };
    for (const Case& c : cases) {
        setHostMode(c.mode);
        char plain[255] = {0}, scoped[255] = {0}, small[5] = {0}, smallPlain[5] = {0};
        const int kind = ProviderUtil::getHostInfo(plain, sizeof(plain));
        ProviderUtil::getHostInfo(smallPlain, sizeof(smallPlain));
        HostIdentityScope scope;
        EXPECT_EQ(HostIdentityScope::hostInfo(scoped, sizeof(scoped)), kind);
        EXPECT_EQ(HostIdentityScope::hostInfo(small, sizeof(small)), kind);
        EXPECT_EQ(kind, c.kind);
        EXPECT_STREQ(scoped, c.text);
        EXPECT_STREQ(plain, c.text);
        EXPECT_STREQ(small, smallPlain);
    }
    // Outside a scope every call looks the host up.
    setHostMode(HostMode::ADDRESS);
    hostCounters() = HostCounters();
    HostIdentityScope::hostText();
    HostIdentityScope::hostText();
    EXPECT_EQ(hostCounters().resolves, 2);
}

// The computer system of the real host is in the golden files; here the
// kinds of host text the fake host can give.
TEST_F(Dispatch, ComputerSystemByKindOfHostText) {
    struct Case {
        HostMode mode;
        const char* name;
        const char* format;
        const char* description;
    };
    const Case cases[] = {
        {HostMode::ADDRESS, kHostAddress, "IP", "Ipv4 Address"},
        {HostMode::LOOPBACK_ONLY, "invhost", "Other", "Fully Qualified Domain Name"},
        {HostMode::NO_NAME, "localhost", "Other", "Fully Qualified Domain Name"},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.name);
        setHostMode(c.mode);
        tvrn_sim_reset_counters();
        Instances hosts(fchba(CID_COMPUTER_SYSTEM));
        EXPECT_EQ(tvrn_sim_total_calls(), 0u);
        auto* cs = hosts.at<TAVRIN_ComputerSystem>(0);
        ASSERT_NE(cs, nullptr);
        EXPECT_STREQ(cs->Name.value.c_str(), c.name);
        EXPECT_STREQ(cs->NameFormat.value.c_str(), c.format);
        EXPECT_EQ(cs->OtherIdentifyingInfo.value, strings({c.name}));
        EXPECT_EQ(cs->IdentifyingDescriptions.value, strings({c.description}));
    }
}

TEST_F(Dispatch, EthernetDeviceNamesReachTheUtilitiesThroughTheInventory) {
    EXPECT_STREQ(ProviderUtil::getEthDeviceNameByMAC("00:05:1e:8a:4b:02").c_str(), "eth3");
    EXPECT_STREQ(ProviderUtil::getEthDeviceNameByMAC("00:05:1e:ff:ff:ff").c_str(), "");
}

}  // namespace
