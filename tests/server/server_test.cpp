// The server profile through the embedded host, on a host without the adapter
// library: the classes need none. And the rules of the server layer that no
// request can reach with the fixed profile tables.
#include <dlfcn.h>
#include <gtest/gtest.h>

#include <map>
#include <string>
#include <vector>

#include "framework/Instance.h"
#include "gateway/ProviderInit.h"
#include "gateway/ProviderUtil.h"
#include "host/host.h"
#include "inventory/FCHBAManager.h"
#include "inventory/InventoryCommon.h"
#include "server/ProfileAssociations.h"
#include "server/ServerManager.h"
#include "tests/cmpi/test_support.h"
#include "tests/server/ServerProfileCounts.h"

using namespace tvrnhost;
using tvrntest::Log_Watch;

namespace {

const char kNs[] = "root/tavrin";

const std::map<std::string, size_t>& kClasses = tvrntest::serverProfileCounts();

// What each class answers, instance by instance.
std::map<std::string, std::vector<std::string>> answers(Host& host) {
    std::map<std::string, std::vector<std::string>> all;
    for (const auto& c : kClasses) {
        Result<Instance> r = host.enumerateInstances(kNs, c.first);
        EXPECT_TRUE(r.ok()) << c.first << ": " << r.toString();
        for (const Instance& instance : r.items)
            all[c.first].push_back(instance.toString());
    }
    return all;
}

class ServerProfile : public ::testing::Test {
protected:
    void SetUp() override {
        if (CPTA::ProviderUtil::getAgentPort() != 0)
            GTEST_SKIP() << "an mdcagent process is running on this host";
        host.reset(new Host);
        Status st = host->load(TVRN_MODULE, TVRN_MODULE_REG);
        ASSERT_TRUE(st.ok()) << st.toString();
    }
    std::unique_ptr<Host> host;
};

TEST_F(ServerProfile, AnswersTheSameWithoutTheAdapterLibrary) {
    ASSERT_TRUE(host->enumerateInstances(kNs, "TAVRIN_PortController").items.empty());
    const auto without = answers(*host);
    for (const auto& c : kClasses)
        EXPECT_EQ(without.count(c.first) ? without.at(c.first).size() : 0, c.second) << c.first;
    ASSERT_TRUE(host->unload().ok());

    // The simulator, by path: the module's next start finds it by its name.
    void* library = dlopen(TVRN_SIM_LIBRARY, RTLD_NOW | RTLD_GLOBAL);
    ASSERT_NE(library, nullptr) << dlerror();
    host.reset(new Host);
    ASSERT_TRUE(host->load(TVRN_MODULE, TVRN_MODULE_REG).ok());
    ASSERT_FALSE(host->enumerateInstances(kNs, "TAVRIN_PortController").items.empty());
    EXPECT_EQ(answers(*host), without);
    host->unload();
    host.reset();
    dlclose(library);
}

TEST_F(ServerProfile, OneObjectManagerPerRequestNamedAlsoWhenTheServerHasNone) {
    // The server answers, but has no object manager.
    host->store("root/PG_InterOp").defineClass("CIM_ObjectManager");
    Log_Watch log;
    Result<Instance> r = host->enumerateInstances(kNs, "TAVRIN_NamespaceInManager");
    ASSERT_TRUE(r.ok() && r.items.size() == 1) << r.toString();
    EXPECT_EQ(log.count("Asking the CIM server for its object manager"), 1u);
    const std::string manager = r.items[0].get("Antecedent")->toString();
    EXPECT_NE(manager.find("Name=\\\"CIM Server\\\""), std::string::npos) << manager;
    const std::string ns = r.items[0].get("Dependent")->toString();
    EXPECT_NE(ns.find("ObjectManagerName=\\\"CIM Server\\\""), std::string::npos) << ns;
}

TEST_F(ServerProfile, NoAgentNoAccessPointAndNoFailure) {
    Log_Watch log;
    for (const char* c :
         {"TAVRIN_RemoteServiceAccessPoint", "TAVRIN_RemoteServiceHostedAccessPoint"}) {
        Result<Instance> r = host->enumerateInstances(kNs, c);
        EXPECT_TRUE(r.ok() && r.items.empty()) << c << ": " << r.toString();
    }
    EXPECT_EQ(log.count("WARN: AccessPointHelper.cpp"), 2u) << log.text();
    EXPECT_EQ(log.count("The MDC Agent is not running so no service available"), 2u);
    EXPECT_EQ(log.count("WARN: TAVRIN_RemoteServiceAccessPoint_Provider.cpp"), 1u);
    EXPECT_EQ(log.count("WARN: TAVRIN_RemoteServiceHostedAccessPoint_Provider.cpp"), 1u);
    EXPECT_EQ(log.count("Warning: No service is available"), 2u);
}

// ---- the server layer itself -------------------------------------------------

using CPTA::Array;
using CPTA::ServerManager;

TEST(ServerManager, SubProfilesByProfileNameInAnyCase) {
    const struct {
        const char* profile;
        std::vector<std::string> subProfiles;
    } cases[] = {
        {"storage hba", {"FCoE Initiator Ports"}},
        {"SERVER", {"Profile Registration"}},
        {"Host Discovered Resources", {}},
        {"FC HBA",
         {"FC Initiator Ports", "Software Update", "Software Inventory", "Access Points",
          "Physical Asset", "Ethernet Port", "Diagnostics Profile", "Host LAN Network Port"}},
    };
    for (const auto& c : cases) {
        Array<CPTA::String> found =
            ServerManager::getServerManager()->getSubProfilesOfProfile(c.profile);
        std::vector<std::string> names;
        for (size_t i = 0; i < found.size(); i++)
            names.push_back(found[i].c_str());
        EXPECT_EQ(names, c.subProfiles) << c.profile;
    }
}

TEST(ServerManager, AnswersWhateverTheDriverGateSays) {
    const int status = CPTA::ProviderInit::driverStatus;
    CPTA::ProviderInit::driverStatus = 2;  // the driver is not installed
    Log_Watch log;
    EXPECT_EQ(CPTA::FCHBAManager::getFCHBAManager()->getInstances(CPTA::CID_PORT_CONTROLLER).size(),
              0u);
    EXPECT_TRUE(log.has("Driver is not installed"));
    for (CPTA::classId_t id : {CPTA::CID_REGISTERED_PROFILE, CPTA::CID_NAMESPACE,
                               CPTA::CID_PROFILE_SOFTWARE_IDENTITY, CPTA::CID_AGENT_SERVICE}) {
        Array<CPTA::Instance*> direct = ServerManager::getServerManager()->getInstances(id);
        Array<CPTA::Instance*> routed = CPTA::FCHBAManager::getFCHBAManager()->getInstances(id);
        EXPECT_NE(direct.size(), 0u) << id;
        EXPECT_EQ(routed.size(), direct.size()) << id;
        CPTA::destroyInstances(direct);
        CPTA::destroyInstances(routed);
    }
    CPTA::ProviderInit::driverStatus = status;
}

TEST(ProfileAssociations, ConformanceFailsBeforeAnythingIsPaired) {
    ServerManager* server = ServerManager::getServerManager();
    Array<CPTA::Instance*> profiles = server->getInstances(CPTA::CID_REGISTERED_PROFILE);
    Array<CPTA::Instance*> subProfiles = server->getInstances(CPTA::CID_REGISTERED_SUB_PROFILE);
    ASSERT_EQ(profiles.size(), 5u);
    const CPTA::Instance* element = subProfiles[0];  // stands for the host and the manager
    std::vector<CPTA::Profile_Pair> pairs;
    EXPECT_TRUE(CPTA::planConformance(profiles, subProfiles, element, element, pairs));
    EXPECT_EQ(pairs.size(), 18u);

    // Without the SMI-S profile (the first) nothing is paired, the host's
    // profiles included.
    Log_Watch log;
    CPTA::destroy(profiles[0]);
    profiles.remove(0);
    pairs.clear();
    EXPECT_FALSE(CPTA::planConformance(profiles, subProfiles, element, element, pairs));
    EXPECT_TRUE(pairs.empty());
    EXPECT_TRUE(log.has("ERR: ProfileAssociations.cpp"));

    CPTA::destroyInstances(profiles);
    CPTA::destroyInstances(subProfiles);
}

}  // namespace
