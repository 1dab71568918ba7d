// Ethernet inventory: the Ethernet ports and LAN endpoints of the Ethernet
// functions of converged network adapters.
#ifndef CPTA_INVENTORY_ETHERNETPORTHELPER_H
#define CPTA_INVENTORY_ETHERNETPORTHELPER_H

#include <json/json.h>

#include "framework/Array.h"
#include "framework/Instance.h"
#include "framework/String.h"
#include "gateway/ProviderUtil.h"
#include "inventory/InventoryRecords.h"

namespace CPTA {

class InstanceList;

class EthernetPortHelper {
public:
    static EthernetPortHelper* getEthernetPortHelperObject();

    // The instance walks never throw: a library exception ends the walk with
    // no instances (logged).
    //
    // All instances of class 20 or 34, for all adapters with Ethernet ports.
    Array<Instance*> getInstancesByClass(classId_t classId);
    // The instances of adapter `adapterNumber` (from 1).
    Array<Instance*> getInstancesByAdapterId(int adapterNumber, classId_t classId);
    // The TAVRIN_EthernetPort instances of the adapter that owns the given
    // port or adapter address.
    Array<Instance*> getEthernetPortInstancesByAdapter(const String& portKey);
    // The instances of class 20 or 34 that the walk builds for the one port
    // `mac` (colon-free): only that port and its adapter are asked about.
    Array<Instance*> getInstancesByPort(classId_t classId, const String& mac);

    // The library's record of one Ethernet port; 0 when it carries an object
    // "ethData", else -1. Also serves ProviderUtil::getEthDeviceNameByMAC.
    static int getEthPortDetails(const String& portKey, Json::Value& port);
    // CIM Ethernet port type of a transceiver name (0 when not known).
    static int getPortType(const char* transceiver);

    // Builders: one new instance each (null only when memory runs out).
    Instance* getEthernetPortInstance(const _ethPortInfo& port);
    Instance* getLANEndpointInstance(const _ethPortInfo& port);

private:
    EthernetPortHelper() = default;
    // `onlyPort`: the colon-free MAC of the one port to visit; "" all.
    void walkAdapter(const String& adapterKey, classId_t classId, InstanceList& out,
                     const String& onlyPort = String());
};

}  // namespace CPTA

#endif
