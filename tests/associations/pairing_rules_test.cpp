// The pairing of the association providers, run on rules written here for
// what no association of the module can be made to do: a host that is not
// exactly one (the host instance never depends on the library), and a rule
// that names a reference its class does not have.
#include <gtest/gtest.h>

#include <vector>

#include "providers/Association_Pairing.h"
#include "schema/generated/TAVRIN_FCPortSystemDevice.h"
#include "tests/inventory/InventoryTestSupport.h"

using namespace CPTA;

namespace {

class PairingRules : public invtest::InventoryTest {
protected:
    // The associations a rule delivers (destroyed again), or -1 for a failure.
    static int run(const Pairing& rule) {
        std::vector<Instance*> delivered;
        Enum_Instances_Status status = enumerate_pairs(
            rule, &TAVRIN_FCPortSystemDevice::static_meta_class,
            [](Instance* a, void* out) { static_cast<std::vector<Instance*>*>(out)->push_back(a); },
            &delivered);
        for (Instance* a : delivered)
            destroy(a);
        return status == ENUM_INSTANCES_OK ? int(delivered.size()) : -1;
    }
};

// The host with every FC port, the "host" being the instances of `hosts`.
constexpr Pairing hostsOf(classId_t hosts) {
    return TVRN_PAIRING.fetch(hosts)
        .when_not_one(LL_ERR, "Error: Invalid mapping information")
        .fetch(CID_FC_PORT)
        .for_each(0)
        .as("GroupComponent")
        .with_every(1, "PartComponent");
}
constexpr Pairing kOneHost = hostsOf(CID_COMPUTER_SYSTEM);
constexpr Pairing kSixHosts = hostsOf(CID_FC_PORT);
constexpr Pairing kNoHost = hostsOf(CID_AGENT_SERVICE);
constexpr Pairing kNoSuchRole = TVRN_PAIRING.host_with_every(
    CID_FC_PORT, "GroupComponent", "Member", "Error: Invalid mapping information");

TEST_F(PairingRules, TheHostMustBeExactlyOne) {
    EXPECT_EQ(run(kOneHost), 6);
    EXPECT_EQ(logged("ERR", "Error: Invalid mapping information"), 0);
    EXPECT_EQ(run(kSixHosts), -1);
    EXPECT_EQ(run(kNoHost), -1);
    EXPECT_EQ(logged("ERR", "Error: Invalid mapping information"), 2);
    // No association is built once a check has failed.
    EXPECT_EQ(logged("DBG", "Building and returning association instances"), 1);
}

TEST_F(PairingRules, AReferenceTheClassDoesNotHave) {
    EXPECT_EQ(run(kNoSuchRole), -1);
    EXPECT_EQ(logged("ERR", "TAVRIN_FCPortSystemDevice has no reference Member"), 1);
}

}  // namespace
