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

// The server profile and the firmware update fill their routes from above
// the inventory (FCHBAManager::fillRoute) and are not linked here.
const std::set<int> kFCHBAServed = {1, 2, 3, 4, 5, 6, 7, 8, 20, 30, 34, 35, 36};
const std::set<int> kHDRServed = {9, 16, 38};

class Dispatch : public InventoryTest {};

TEST_F(Dispatch, RoutesEveryClassIdOfTheBuiltInHost) {
    for (int id = 0; id <= MAXCLASSID; id++) {
        EXPECT_EQ(Instances(fchba(classId_t(id))).empty(), kFCHBAServed.count(id) == 0) << id;
        EXPECT_EQ(Instances(hdr(classId_t(id))).empty(), kHDRServed.count(id) == 0) << id;
    }
}

// Status 1 still asks the library; 2 and 3 ask it nothing but still name the host.
TEST_F(Dispatch, DriverGate) {
    ProviderInit::driverStatus = 1;
    EXPECT_EQ(Instances(fchba(CID_FC_PORT)).size(), 6u);
    for (int status : {2, 3}) {
        ProviderInit::driverStatus = status;
        for (int id : kFCHBAServed) {
            SCOPED_TRACE("status " + std::to_string(status) + ", class id " + std::to_string(id));
            gwtest::LogCapture::get().mark();
            tvrn_sim_reset_counters();
            Instances got(fchba(classId_t(id)));
            EXPECT_EQ(tvrn_sim_total_calls(), 0u);
            EXPECT_EQ(got.size(), id == CID_COMPUTER_SYSTEM ? 1u : 0u);
            EXPECT_EQ(logged("ERR",
                             "Driver is not installed or there is a tfal mismatch hence "
                             "no instances returned"),
                      id == CID_COMPUTER_SYSTEM ? 0 : 1);
        }
        tvrn_sim_reset_counters();
        EXPECT_TRUE(Instances(hdr(CID_STORAGE_EXTENT)).empty());
        EXPECT_EQ(tvrn_sim_total_calls(), 0u);
    }
}

TEST_F(Dispatch, HostIsResolvedOncePerRequest) {
    for (int id : kFCHBAServed) {
        hostResolves() = 0;
        Instances got(fchba(classId_t(id)));
        // Connectors do not name the host.
        EXPECT_EQ(hostResolves(), id == CID_PHYSICAL_CONNECTOR ? 0 : 1) << "class id " << id;
    }
    for (int id : kHDRServed) {
        hostResolves() = 0;
        Instances got(hdr(classId_t(id)));
        EXPECT_EQ(hostResolves(), 1) << "class id " << id;
    }
    // A request that builds nothing does not look the host up at all.
    ProviderInit::driverStatus = 2;
    hostResolves() = 0;
    Instances none(fchba(CID_FC_PORT));
    EXPECT_EQ(hostResolves(), 0);
}

TEST_F(Dispatch, NestedScopesShareOneResolutionAndTheNextRequestResolvesAgain) {
    {
        HostIdentityScope request;
        Instances controllers(fchba(CID_PORT_CONTROLLER));
        Instances ports(
            FCHBAManager::getFCHBAManager()->getFCPortInstancesByAdapter("200000051e0a0b0c"));
        Instances hosts(fchba(CID_COMPUTER_SYSTEM));
        EXPECT_EQ(ports.size(), 2u);
        EXPECT_EQ(hostResolves(), 1);
    }
    EXPECT_FALSE(HostIdentityScope::active());
    Instances again(fchba(CID_PORT_CONTROLLER));
    EXPECT_EQ(hostResolves(), 2);
    // Outside a scope every call looks the host up.
    HostIdentityScope::hostText();
    HostIdentityScope::hostText();
    EXPECT_EQ(hostResolves(), 4);
}

// By kind of host text: the scope answers as getHostInfo does (also into a
// buffer too small), and the computer system names the host by it without
// asking the library. The real host's computer system is in the golden files.
TEST_F(Dispatch, HostTextAndComputerSystemByKindOfHost) {
    struct Case {
        HostMode mode;
        int kind;
        const char* text;
        const char* format;
        const char* description;
    } cases[] = {
        {HostMode::ADDRESS, 0, kHostAddress, "IP", "Ipv4 Address"},
        {HostMode::LOOPBACK_ONLY, 2, "invhost", "Other", "Fully Qualified Domain Name"},
        {HostMode::UNRESOLVABLE, 2, "invhost", "Other", "Fully Qualified Domain Name"},
        {HostMode::NO_NAME, 3, "localhost", "Other", "Fully Qualified Domain Name"},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.text);
        setHostMode(c.mode);
        char plain[255] = {0}, scoped[255] = {0}, small[5] = {0}, smallPlain[5] = {0};
        EXPECT_EQ(ProviderUtil::getHostInfo(plain, sizeof(plain)), c.kind);
        ProviderUtil::getHostInfo(smallPlain, sizeof(smallPlain));
        {
            HostIdentityScope scope;
            EXPECT_EQ(HostIdentityScope::hostInfo(scoped, sizeof(scoped)), c.kind);
            EXPECT_EQ(HostIdentityScope::hostInfo(small, sizeof(small)), c.kind);
        }
        EXPECT_STREQ(scoped, c.text);
        EXPECT_STREQ(plain, c.text);
        EXPECT_STREQ(small, smallPlain);

        tvrn_sim_reset_counters();
        Instances hosts(fchba(CID_COMPUTER_SYSTEM));
        EXPECT_EQ(tvrn_sim_total_calls(), 0u);
        auto* cs = hosts.at<TAVRIN_ComputerSystem>(0);
        ASSERT_NE(cs, nullptr);
        EXPECT_STREQ(cs->Name.value.c_str(), c.text);
        EXPECT_STREQ(cs->NameFormat.value.c_str(), c.format);
        EXPECT_EQ(cs->OtherIdentifyingInfo.value, strings({c.text}));
        EXPECT_EQ(cs->IdentifyingDescriptions.value, strings({c.description}));
    }
}

TEST_F(Dispatch, EthernetDeviceNamesReachTheUtilitiesThroughTheInventory) {
    EXPECT_STREQ(ProviderUtil::getEthDeviceNameByMAC("00:05:1e:8a:4b:02").c_str(), "eth3");
    EXPECT_STREQ(ProviderUtil::getEthDeviceNameByMAC("00:05:1e:ff:ff:ff").c_str(), "");
}

}  // namespace
