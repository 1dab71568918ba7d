#include "inventory/EthernetPortHelper.h"

#include <cstdint>
#include <cstring>

#include "gateway/CIMProviderTfaj.h"
#include "gateway/GuardedCall.h"
#include "gateway/JsonAccess.h"
#include "inventory/InventoryCommon.h"
#include "schema/generated/TAVRIN_EthernetPort.h"
#include "schema/generated/TAVRIN_LANEndpoint.h"

namespace CPTA {

namespace {

struct TransceiverType {
    const char* name;
    int portType;
};

const TransceiverType kTransceiverTypes[] = {
    {"10G_BASE-SR", 105},
    {"10G_BASE-LR", 108},
    {"10G_BASE-LRM", 108},
};

// CIM HealthState of a port's CIM operational status.
uint16 healthStateOf(uint32 portState) {
    switch (portState) {
        case 8:
        case 11: return 5;
        case 9:
        case 10:
        case 13: return 10;
        case 6: return 15;
        default: return 0;
    }
}

}  // namespace

EthernetPortHelper* EthernetPortHelper::getEthernetPortHelperObject() {
    static EthernetPortHelper instance;
    return &instance;
}

Array<Instance*> EthernetPortHelper::getInstancesByClass(classId_t classId) {
    return runWalk("EthernetPortHelper::getInstancesByClass", [&](InstanceList& out) {
        forEachAdapter("No adapters in the system. ", false, [&](int, const String& key) {
            if (!ProviderUtil::hasEthernetPort(key)) {
                TVRN_LOG(LL_INFO, "No Ethernet ports found for Adapter - %s", key.c_str());
                return;
            }
            // The list in hand already names the adapter: no second look-up.
            walkAdapter(key, classId, out);
        });
    });
}

Array<Instance*> EthernetPortHelper::getInstancesByAdapterId(int adapterNumber, classId_t classId) {
    return runWalk("EthernetPortHelper::getInstancesByAdapterId", [&](InstanceList& out) {
        walkAdapter(ProviderUtil::getAddrByAdapterId(unsigned(adapterNumber)), classId, out);
    });
}

Array<Instance*> EthernetPortHelper::getEthernetPortInstancesByAdapter(const String& portKey) {
    return runWalk("EthernetPortHelper::getEthernetPortInstancesByAdapter", [&](InstanceList& out) {
        TVRN_LOG(LL_DBG, "getEthernetPortInstancesByMacAddress invoked with MAC Address = %s",
                 portKey.c_str());
        Json::Value answer = libGetAdapterIdByPort(
            keyRequest("indexStr", ProviderUtil::getIndexInColonFormat(portKey)));
        const Json::Value* id = jsonMember(answer, "adapterId");
        if (!ProviderUtil::isValidJsonResponse(answer) || id == nullptr ||
            !(id->isUInt() || id->isInt())) {
            TVRN_LOG(LL_ERR, "libGetAdapterIdByPort returns NULL.");
            return;
        }
        // Read as an unsigned number and taken as a signed one.
        const int adapterId = int(id->isUInt() ? id->asUInt() : unsigned(id->asInt()));
        if (adapterId <= 0) {
            TVRN_LOG(LL_WARN, "Adapter not found in the system.");
            return;
        }
        walkAdapter(ProviderUtil::getAddrByAdapterId(unsigned(adapterId)), CID_ETHERNET_PORT, out);
    });
}

Array<Instance*> EthernetPortHelper::getInstancesByPort(classId_t classId, const String& mac) {
    return runWalk("EthernetPortHelper::getInstancesByPort", [&](InstanceList& out) {
        // As the walk of all adapters: the key from the adapter list, and
        // only an adapter with Ethernet ports.
        const String key = owningAdapterKey(mac);
        if (key.size() > 0 && ProviderUtil::hasEthernetPort(key))
            walkAdapter(key, classId, out, mac);
    });
}

void EthernetPortHelper::walkAdapter(const String& adapterKey, classId_t classId, InstanceList& out,
                                     const String& onlyPort) {
    Json::Value ports;
    guardedCall(LibCall("libGetEthPhyPortIndicesByAdapter", adapterKey),
                libGetEthPhyPortIndicesByAdapter, keyRequest("indexStr", adapterKey), ports);
    if (!ProviderUtil::isValidJsonResponse(ports) ||
        !jsonHas(ports, "indexStrings", Json::arrayValue)) {
        TVRN_LOG(LL_ERR, "libGetEthPhyPortIndicesByAdapter returns NULL.");
        return;
    }
    const Json::Value& keys = jsonArray(ports, "indexStrings");
    for (Json::ArrayIndex i = 0; i < keys.size(); i++) {
        const String portKey = jsonAsString(keys[i]);
        if (onlyPort.size() > 0 && !ProviderUtil::eraseColonsFromIndex(portKey).equali(onlyPort))
            continue;
        Json::Value details;
        if (getEthPortDetails(portKey, details) != 0) {
            TVRN_LOG(LL_ERR, "Unable to get Eth port data for %s", portKey.c_str());
            continue;
        }
        const Json::Value& eth = jsonObject(details, "ethData");
        _ethPortInfo record;
        record.portNumber = sint32(i);
        record.macId = ProviderUtil::eraseColonsFromIndex(portKey);
        record.permanentMac = record.macId;
        record.hostName = HostIdentityScope::hostText();
        record.deviceName = jsonString(eth, "ethDev");
        record.portState = jsonUInt(eth, "ethPortStateMOFValue");
        record.mtu = jsonUInt(eth, "mtu");

        switch (classId) {
            case CID_ETHERNET_PORT: {
                Json::Value sfp;
                guardedCall(LibCall("libGetOpticsSFP", portKey), libGetOpticsSFP,
                            keyRequest("indexStr", portKey), sfp);
                if (!ProviderUtil::isValidJsonResponse(sfp) ||
                    !jsonHas(sfp, "transceiver", Json::stringValue))
                    TVRN_LOG(LL_ERR, "Unable to get SFP info for %s", portKey.c_str());
                else
                    record.portType = getPortType(jsonString(sfp, "transceiver").c_str());
                out.add(getEthernetPortInstance(record));
                break;
            }
            case CID_LAN_ENDPOINT: out.add(getLANEndpointInstance(record)); break;
            default: TVRN_LOG(LL_INFO, "Unhandled class support"); break;
        }
    }
}

int EthernetPortHelper::getEthPortDetails(const String& portKey, Json::Value& port) {
    if (!guardedCall(LibCall("libGetEthPortByEthMac", portKey, LibCall::KEY_AFTER_DEFAULT),
                     libGetEthPortByEthMac,
                     keyRequest("mac", ProviderUtil::getIndexInColonFormat(portKey)), port))
        return -1;
    if (!ProviderUtil::isValidJsonResponse(port) || !jsonHas(port, "ethData", Json::objectValue)) {
        TVRN_LOG(LL_ERR, "Ethernet Port Info is NOT available");
        return -1;
    }
    return 0;
}

int EthernetPortHelper::getPortType(const char* transceiver) {
    if (transceiver == nullptr)
        return 0;
    for (const TransceiverType& t : kTransceiverTypes)
        if (std::strcmp(t.name, transceiver) == 0)
            return t.portType;
    return 0;
}

Instance* EthernetPortHelper::getEthernetPortInstance(const _ethPortInfo& p) {
    TAVRIN_EthernetPort* port = create<TAVRIN_EthernetPort>(true);
    if (port == nullptr)
        return nullptr;
    setDeviceKeys(port, "TAVRIN_EthernetPort", p.hostName, p.macId);
    port->PermanentAddress.set(p.permanentMac);
    Array<String> addresses;
    addresses.append(p.permanentMac);
    port->NetworkAddresses.set(addresses);
    port->ElementName.set(p.deviceName);
    port->OperationalStatus.set(arrayOf<uint16>({uint16(p.portState)}));
    port->PortType.set(uint16(p.portType));
    port->LinkTechnology.set(2);
    port->Capabilities.set(arrayOf<uint16>({0}));
    port->EnabledCapabilities.set(arrayOf<uint16>({0}));
    port->PortNumber.set(uint16(p.portNumber));
    return port;
}

Instance* EthernetPortHelper::getLANEndpointInstance(const _ethPortInfo& p) {
    TAVRIN_LANEndpoint* ep = create<TAVRIN_LANEndpoint>(true);
    if (ep == nullptr)
        return nullptr;
    setEndpointKeys(ep, "TAVRIN_LANEndpoint", p.hostName);
    ep->Name.set(p.deviceName);
    ep->ElementName.set(p.deviceName);
    ep->Description.set(p.deviceName);
    ep->LANID.set(p.deviceName);
    ep->NameFormat.set(String(p.deviceName.c_str(), "_", "ETHERNET"));
    ep->MACAddress.set(p.macId);
    ep->ProtocolIFType.set(1);
    // MTU in bits; an MTU beyond what the property holds is not reported.
    ep->MaxDataSize.set(p.mtu <= UINT32_MAX / 8 ? p.mtu * 8 : 0);
    ep->HealthState.set(healthStateOf(p.portState));
    ep->EnabledState.set(enabledStateOf(p.portState));
    return ep;
}

}  // namespace CPTA
