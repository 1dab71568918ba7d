// Ethernet ports, LAN endpoints and physical connectors.
#include "inventory/EthernetPortHelper.h"
#include "inventory/FCHBAManager.h"
#include "schema/generated/TAVRIN_EthernetPort.h"
#include "schema/generated/TAVRIN_LANEndpoint.h"
#include "schema/generated/TAVRIN_PhysicalConnector.h"
#include "tests/inventory/InventoryTestSupport.h"

using namespace CPTA;
using namespace invtest;

namespace {

class Ethernet : public InventoryTest {};

struct EthFacts {
    const char* mac;
    const char* device;
    uint16 state;
    uint16 portType;
    uint16 number;
    uint32 maxDataSize;
    uint16 health;
    uint16 enabled;
};

const EthFacts kEth2 = {"00051e8a4b01", "eth2", 2, 105, 0, 12000, 0, 1};
const EthFacts kEth3 = {"00051e8a4b02", "eth3", 2, 108, 1, 72000, 0, 1};
// Second CNA of the variants: unknown 1000BASE-T optic, no MTU, link down.
const EthFacts kEth4 = {"00051e9c5d01", "eth4", 13, 0, 0, 0, 10, 6};

Instance* expectedEthernetPort(const EthFacts& e) {
    TAVRIN_EthernetPort* port = expected<TAVRIN_EthernetPort>();
    port->SystemCreationClassName.set(String("TAVRIN_ComputerSystem"));
    port->SystemName.set(String(kHostAddress));
    port->CreationClassName.set(String("TAVRIN_EthernetPort"));
    port->DeviceID.set(String(e.mac));
    port->PermanentAddress.set(String(e.mac));
    port->NetworkAddresses.set(strings({e.mac}));
    port->ElementName.set(String(e.device));
    port->OperationalStatus.set(u16s({e.state}));
    port->PortType.set(e.portType);
    port->LinkTechnology.set(2);
    port->Capabilities.set(u16s({0}));
    port->EnabledCapabilities.set(u16s({0}));
    port->PortNumber.set(e.number);
    return port;
}

Instance* expectedEndpoint(const EthFacts& e) {
    TAVRIN_LANEndpoint* ep = expected<TAVRIN_LANEndpoint>();
    ep->SystemCreationClassName.set(String("TAVRIN_ComputerSystem"));
    ep->SystemName.set(String(kHostAddress));
    ep->CreationClassName.set(String("TAVRIN_LANEndpoint"));
    ep->Name.set(String(e.device));
    ep->ElementName.set(String(e.device));
    ep->Description.set(String(e.device));
    ep->LANID.set(String(e.device));
    ep->NameFormat.set(String(e.device, "_ETHERNET"));
    ep->MACAddress.set(String(e.mac));
    ep->ProtocolIFType.set(1);
    ep->MaxDataSize.set(e.maxDataSize);
    ep->HealthState.set(e.health);
    ep->EnabledState.set(e.enabled);
    return ep;
}

TEST_F(Ethernet, PortsAndEndpointsOfCnasInFull) {
    load("variants");
    Instances ports(fchba(CID_ETHERNET_PORT));
    Instances endpoints(fchba(CID_LAN_ENDPOINT));
    ASSERT_EQ(ports.size(), 3u);
    ASSERT_EQ(endpoints.size(), 3u);
    const EthFacts* order[] = {&kEth2, &kEth3, &kEth4};
    for (size_t i = 0; i < 3; i++) {
        SCOPED_TRACE(order[i]->device);
        EXPECT_TRUE(sameInstance(expectedEthernetPort(*order[i]), ports[i]));
        EXPECT_TRUE(sameInstance(expectedEndpoint(*order[i]), endpoints[i]));
    }
    for (const char* fc : {"20:00:00:05:1e:0a:0b:0c", "20:00:00:05:1e:5c:6d:70", "20:00:00:05:1e:7e:8f:90"})
        EXPECT_EQ(logged("INFO", std::string("No Ethernet ports found for Adapter - ") + fc), 2) << fc;
}

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

class Connectors : public InventoryTest {};

TEST_F(Connectors, OneConnectorPerPortWithAnOptic) {
    Instances got(fchba(CID_PHYSICAL_CONNECTOR));
    EXPECT_EQ(got.values(&TAVRIN_PhysicalConnector::Tag),
              (std::vector<std::string>{"UW1234_1_0", "UW1235_1_1", "UW5560_2_0", "UX2001_3_0",
                                        "UX2002_3_1"}));
    EXPECT_EQ(logged("WARN", "getOpticsInfo failed for PortIndex =1 Ret = -1"), 1);

    TAVRIN_PhysicalConnector* pc = expected<TAVRIN_PhysicalConnector>();
    pc->CreationClassName.set(String("TAVRIN_PhysicalConnector"));
    pc->Tag.set(String("UW1234_1_0"));
    pc->Caption.set(String("TAVRIN_PhysicalConnector"));
    pc->ElementName.set(String("TAVRIN_PhysicalConnector"));
    pc->Description.set(String("16 Gbps"));
    pc->Manufacturer.set(String("OPTICO"));
    pc->Model.set(String("SFP+"));
    pc->ConnectorDescription.set(String("SFP+"));
    pc->SerialNumber.set(String("UW1234"));
    pc->PartNumber.set(String("OPT-16G-SW"));
    pc->Version.set(String("A"));
    pc->ConnectorType.set(u16s({118}));
    pc->ConnectorGender.set(0);
    pc->ConnectorPinout.set(String("0"));
    pc->NumPhysicalPins.set(0);
    pc->ConnectorLayout.set(1);
    EXPECT_TRUE(sameInstance(pc, got[0]));
}

TEST_F(Connectors, AnAdapterThatCannotBeReadCostsOnlyItsOwnConnectors) {
    fault("getHbaByWwn", "20:00:00:05:1e:0a:0b:0c", TVRN_SIM_FAULT_ERROR_OBJECT);
    Instances got(fchba(CID_PHYSICAL_CONNECTOR));
    EXPECT_EQ(got.values(&TAVRIN_PhysicalConnector::Tag),
              (std::vector<std::string>{"UW5560_2_0", "UX2001_3_0", "UX2002_3_1"}));
    EXPECT_EQ(logged("INFO", "Unable to get Adapter info 1 - 20:00:00:05:1e:0a:0b:0c"), 1);
}

}  // namespace
