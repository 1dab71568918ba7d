// Ethernet ports and physical connectors: transceiver types, look-ups by
// adapter and faults (whole instances are in the golden files).
#include "inventory/EthernetPortHelper.h"
#include "inventory/FCHBAManager.h"
#include "schema/generated/TAVRIN_EthernetPort.h"
#include "schema/generated/TAVRIN_PhysicalConnector.h"
#include "tests/inventory/InventoryTestSupport.h"

using namespace CPTA;
using namespace invtest;

namespace {

class Ethernet : public InventoryTest {};

TEST_F(Ethernet, PortTypeOfTransceiverNames) {
    const std::pair<const char*, int> cases[] = {
        {"10G_BASE-SR", 105}, {"10G_BASE-LR", 108}, {"10G_BASE-LRM", 108},
        {"10G_BASE-SR ", 0},  {"10g_base-sr", 0},   {"", 0},
        {"1000BASE-T", 0},
    };
    for (const auto& c : cases)
        EXPECT_EQ(EthernetPortHelper::getPortType(c.first), c.second) << c.first;
    EXPECT_EQ(EthernetPortHelper::getPortType(nullptr), 0);
}

TEST_F(Ethernet, PortWithoutOpticKeepsTypeZero) {
    fault("getOpticsSFP", "00:05:1e:8a:4b:01", TVRN_SIM_FAULT_DROP_MEMBER, "transceiver");
    Instances ports(fchba(CID_ETHERNET_PORT));
    ASSERT_EQ(ports.size(), 2u);
    EXPECT_EQ(ports.at<TAVRIN_EthernetPort>(0)->PortType.value, 0);
    EXPECT_EQ(ports.at<TAVRIN_EthernetPort>(1)->PortType.value, 108);
    EXPECT_EQ(logged("ERR", "Unable to get SFP info for 00:05:1e:8a:4b:01"), 1);
}

TEST_F(Ethernet, PortsOfTheAdapterOwningAPort) {
    FCHBAManager* manager = FCHBAManager::getFCHBAManager();
    for (const char* key : {"00051e8a4b02", "00:05:1e:8a:4b:01", "100000051e8a4b01"}) {
        Instances got(manager->getEthernetPortInstancesByAdapter(key));
        EXPECT_EQ(got.values(&TAVRIN_EthernetPort::DeviceID),
                  (std::vector<std::string>{"00051e8a4b01", "00051e8a4b02"}))
            << key;
    }
    Instances none(manager->getEthernetPortInstancesByAdapter("00051effffff"));
    EXPECT_TRUE(none.empty());
    EXPECT_EQ(logged("WARN", "Adapter not found in the system."), 1);
}

TEST_F(Ethernet, AnAdapterThatCannotBeReadCostsOnlyItsOwnConnectors) {
    fault("getHbaByWwn", "20:00:00:05:1e:0a:0b:0c", TVRN_SIM_FAULT_ERROR_OBJECT);
    Instances got(fchba(CID_PHYSICAL_CONNECTOR));
    EXPECT_EQ(got.values(&TAVRIN_PhysicalConnector::Tag),
              (std::vector<std::string>{"UW5560_2_0", "UX2001_3_0", "UX2002_3_1"}));
    EXPECT_EQ(logged("INFO", "Unable to get Adapter info 1 - 20:00:00:05:1e:0a:0b:0c"), 1);
}

}  // namespace
