// The provider of TAVRIN_EthernetPortRealizes: each physical connector with
// the Ethernet port at the same position of the same adapter, both read from
// the connector's Tag.
#include "providers/Association_Pairing.h"
#include "providers/generated/TAVRIN_EthernetPortRealizes_Methods.h"

namespace CPTA {

namespace {

constexpr Pairing kConnectors =
    TVRN_PAIRING.fetch(CID_PHYSICAL_CONNECTOR)
        .when_empty(LL_WARN, "No Connector Found")                 // 0
        .fetch_for_each(Source::ETHERNET_PORTS_OF_ADAPTER_NUMBER,  // 1
                        key(connector_adapter_number))
        .for_each(0)
        .as("Antecedent")
        .with_first(1, "Dependent", key(connector_port_position), key("PortNumber"));

}  // namespace

class TAVRIN_EthernetPortRealizes_Provider
    : public Pairing_Provider<TAVRIN_EthernetPortRealizes, kConnectors>,
      public TAVRIN_EthernetPortRealizes_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(EthernetPortRealizes)
