// The provider of TAVRIN_PhysicalConnectorContainer: each physical connector
// with the physical package of its adapter, found by the adapter's serial
// number (asked of the library once per adapter and request).
#include "providers/Association_Pairing.h"
#include "providers/generated/TAVRIN_PhysicalConnectorContainer_Methods.h"

namespace CPTA {

namespace {

void adapter_serial_number(Key_Sink& keys, const Instance* connector) {
    unsigned adapter = 0, position = 0;
    if (!parse_connector_tag(connector, adapter, position))
        return;
    String serial = keys.sources().adapter_serial_number(adapter);
    // An adapter that could not be read identifies no package.
    if (serial.size() != 0)
        keys.add(serial);
}

constexpr Pairing kPackages =
    TVRN_PAIRING.fetch(CID_PHYSICAL_CONNECTOR)
        .when_empty(LL_WARN, "No Connectors retrieved\n")  // 0
        .fetch(CID_PHYSICAL_PACKAGE)
        .when_empty(LL_WARN, "No PhysicalPackage retrieved\n")  // 1
        .for_each(0)
        .as("PartComponent")
        .with_all(1, "GroupComponent", key(adapter_serial_number), key("SerialNumber"))
        .exact();

}  // namespace

class TAVRIN_PhysicalConnectorContainer_Provider
    : public Pairing_Provider<TAVRIN_PhysicalConnectorContainer, kPackages>,
      public TAVRIN_PhysicalConnectorContainer_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(PhysicalConnectorContainer)
