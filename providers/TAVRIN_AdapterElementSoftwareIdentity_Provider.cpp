// The provider of TAVRIN_AdapterElementSoftwareIdentity: each port controller
// with the software it runs. The InstanceID of an identity begins with a token
// (its text up to the first "_"): a firmware or BIOS identity names the
// address of its adapter, and goes with that adapter's controller only; a
// driver identity names the driver, and goes with every controller, except
// that the network driver is not one of an FC HBA's.
#include "providers/Association_Pairing.h"
#include "providers/generated/TAVRIN_AdapterElementSoftwareIdentity_Methods.h"
#include "schema/generated/TAVRIN_AdapterSoftwareIdentity.h"
#include "schema/generated/TAVRIN_PortController.h"

namespace CPTA {

namespace {

const uint16 kDriverSoftware = 2;  // Classifications
const uint16 kFcHba = 4;           // ControllerType

// The keys under which the driver identities are found. They cannot be taken
// for an adapter address.
const char kAnyDriver[] = "*driver";
const char kNetworkDriver[] = "*network-driver";

bool is_driver(const TAVRIN_AdapterSoftwareIdentity* identity) {
    const Array<uint16>& kinds = identity->Classifications.value;
    return !identity->Classifications.null && kinds.find(kDriverSoftware) != size_t(-1);
}

void identity_keys(Key_Sink& keys, const Instance* instance) {
    const auto* identity = static_cast<const TAVRIN_AdapterSoftwareIdentity*>(instance);
    const String& id = identity->InstanceID.value;
    size_t begin = 0;
    while (begin < id.size() && id[begin] == '_')
        begin++;
    size_t end = begin;
    while (end < id.size() && id[end] != '_')
        end++;
    if (identity->InstanceID.null || begin == end) {
        TVRN_LOG(LL_INFO, "No MAC or NWWN returned from strtok function");
        return;
    }
    if (!is_driver(identity)) {
        keys.add(id.c_str() + begin, end - begin);
        return;
    }
    // The network driver is known by its name "tna", or, whatever it is
    // called, by being the one the inventory describes as the network driver.
    const bool network =
        (end - begin == 3 && id.equali(begin, "tna", 3)) ||
        (!identity->ElementName.null && identity->ElementName.value.equal("Network driver"));
    keys.add(network ? kNetworkDriver : kAnyDriver);
}

void controller_keys(Key_Sink& keys, const Instance* instance) {
    const auto* controller = static_cast<const TAVRIN_PortController*>(instance);
    if (!controller->DeviceID.null)
        keys.add(controller->DeviceID.value);
    keys.add(kAnyDriver);
    if (controller->ControllerType.null || controller->ControllerType.value != kFcHba)
        keys.add(kNetworkDriver);
}

constexpr Pairing kSoftware =
    TVRN_PAIRING
        .fetch(CID_ADAPTER_SOFTWARE_IDENTITY)  // 0
        .fetch(CID_PORT_CONTROLLER)            // 1
        .announce(LL_DBG, "Building and returning association instances.")
        .for_each(1)
        .as("Dependent")
        .with_all(0, "Antecedent", key(controller_keys), key(identity_keys));

constexpr Object_Scopes kScopes =
    Object_Scopes().from(CID_ADAPTER_SOFTWARE_IDENTITY, Narrowing::OBJECT, Narrowing::ADAPTER);

}  // namespace

class TAVRIN_AdapterElementSoftwareIdentity_Provider
    : public Keyed_Pairing_Provider<TAVRIN_AdapterElementSoftwareIdentity, kSoftware, kScopes>,
      public TAVRIN_AdapterElementSoftwareIdentity_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(AdapterElementSoftwareIdentity)
