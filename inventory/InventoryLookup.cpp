#include "inventory/InventoryLookup.h"

#include <cctype>
#include <iterator>

#include "framework/Log.h"
#include "framework/Meta_Lookup.h"
#include "framework/Slot.h"
#include "inventory/AdapterHelper.h"
#include "inventory/ConnectorTag.h"
#include "inventory/EthernetPortHelper.h"
#include "inventory/InventoryCommon.h"
#include "inventory/PhysicalAssetHelper.h"
#include "inventory/PortHelper.h"

namespace CPTA {

namespace {

const size_t kWwnDigits = 16;
const size_t kMacDigits = 12;

// The value of the text key `name` of the instance; false when it has none.
bool keyText(const Instance* keys, const char* name, String& text) {
    const Meta_Property* mp = find_property(keys->meta_class, name);
    if (mp == nullptr || mp->type != STRING || mp->subscript != 0)
        return false;
    const Property<String>& p =
        *reinterpret_cast<const Property<String>*>(slot_of(keys, mp->offset));
    if (p.null)
        return false;
    text = p.value;
    return true;
}

// Whether the text is `digits` hexadecimal digits: a colon-free WWN or MAC.
bool isAddress(const String& text, size_t digits) {
    if (text.size() != digits)
        return false;
    for (size_t i = 0; i < text.size(); i++)
        if (!std::isxdigit(static_cast<unsigned char>(text[i])))
            return false;
    return true;
}

// Splits `text` at its first `count` underscores: the parts before them.
bool leadingParts(const String& text, String* parts, size_t count) {
    size_t begin = 0;
    for (size_t i = 0; i < count; i++) {
        size_t end = begin;
        while (end < text.size() && text[end] != '_')
            end++;
        if (end == text.size())
            return false;
        parts[i] = text.substr(begin, end - begin);
        begin = end + 1;
    }
    return true;
}

// One way of looking up: from the text of the class's naming key, what to
// build; false when this key cannot be looked up.
typedef bool (*Lookup)(classId_t classId, const String& key, Array<Instance*>& found);

// FC port, statistics, alarm device: named by the port's WWN.
bool byLocalPort(classId_t classId, const String& wwn, Array<Instance*>& found) {
    if (!isAddress(wwn, kWwnDigits))
        return true;
    PortScope scope;
    scope.port = wwn;
    scope.remotes = PortScope::NO_REMOTES;
    found = PortHelper::getPortHelperObject()->getInstancesByPort(classId, scope);
    return true;
}

// SCSI protocol endpoint: the port's WWN, or that, "_" and a target's WWN.
bool byEndpointName(classId_t classId, const String& name, Array<Instance*>& found) {
    PortScope scope;
    scope.port = name;
    scope.remotes = PortScope::NO_REMOTES;
    if (name.size() > kWwnDigits) {
        String parts[1];
        if (!leadingParts(name, parts, 1))
            return true;
        scope.port = parts[0];
        scope.remote = name.substr(kWwnDigits + 1);
        scope.remotes = PortScope::ONE_REMOTE;
        if (!isAddress(scope.remote, kWwnDigits))
            return true;
    }
    if (!isAddress(scope.port, kWwnDigits))
        return true;
    found = PortHelper::getPortHelperObject()->getInstancesByPort(classId, scope);
    return true;
}

// Storage extent, tape drive, logical disk: the local port's WWN, "_", the
// target's WWN, "_", and what names the LUN.
bool byLun(classId_t classId, const String& deviceId, Array<Instance*>& found) {
    String parts[2];
    if (!leadingParts(deviceId, parts, 2) || !isAddress(parts[0], kWwnDigits) ||
        !isAddress(parts[1], kWwnDigits))
        return true;
    PortScope scope;
    scope.port = parts[0];
    scope.remote = parts[1];
    scope.remotes = PortScope::ONE_REMOTE;
    found = PortHelper::getPortHelperObject()->getInstancesByPort(classId, scope);
    return true;
}

// Port controller: the adapter's WWN, or its MAC for a CNA.
bool byAdapter(classId_t classId, const String& address, Array<Instance*>& found) {
    if (address.size() == 0)
        return false;  // an adapter without a storage driver has an empty one
    if (isAddress(address, kWwnDigits) || isAddress(address, kMacDigits))
        found = AdapterHelper::getAdapterHelperInstance()->getInstancesByAddress(classId, address);
    return true;
}

// Firmware and BIOS identities: the adapter's address and "_firmware" or
// "_bios". A driver's identity is named by the driver alone.
bool byAdapterSoftware(classId_t classId, const String& instanceId, Array<Instance*>& found) {
    String parts[1];
    if (leadingParts(instanceId, parts, 1)) {
        const String kind = instanceId.substr(parts[0].size() + 1);
        if (kind == "firmware" || kind == "bios")
            return byAdapter(classId, parts[0], found);
    }
    if (instanceId.size() > 0)  // no driver is reported without a name
        found = AdapterHelper::getAdapterHelperInstance()->getDriverIdentities(instanceId);
    return true;
}

// Physical connector: the optic's serial number, the adapter's number and
// the port's position.
bool byConnectorTag(classId_t classId, const String& tag, Array<Instance*>& found) {
    unsigned adapterNumber = 0, portPosition = 0;
    if (parseConnectorTag(tag, adapterNumber, portPosition))
        found = PhysicalAssetHelper::getPhysicalAssetHelperObject()->getInstancesByPosition(
            classId, adapterNumber, portPosition);
    return true;
}

// Ethernet port: its MAC.
bool byEthernetPort(classId_t classId, const String& mac, Array<Instance*>& found) {
    if (isAddress(mac, kMacDigits))
        found = EthernetPortHelper::getEthernetPortHelperObject()->getInstancesByPort(classId, mac);
    return true;
}

struct LookupRow {
    classId_t classId;
    const char* key;  // the key that names the object
    bool onThisHost;  // whether the class has the host in SystemName
    Lookup lookup;
};

const LookupRow kLookups[] = {
    {CID_PORT_CONTROLLER, "DeviceID", true, byAdapter},
    {CID_FC_PORT, "DeviceID", true, byLocalPort},
    {CID_SCSI_PROTOCOL_ENDPOINT, "Name", true, byEndpointName},
    {CID_FC_PORT_STATISTICS, "InstanceID", false, byLocalPort},
    {CID_ADAPTER_SOFTWARE_IDENTITY, "InstanceID", false, byAdapterSoftware},
    {CID_STORAGE_EXTENT, "DeviceID", true, byLun},
    {CID_TAPE_DRIVE, "DeviceID", true, byLun},
    {CID_ETHERNET_PORT, "DeviceID", true, byEthernetPort},
    {CID_ALARM_DEVICE, "DeviceID", true, byLocalPort},
    {CID_LOGICAL_DISK, "DeviceID", true, byLun},
    {CID_PHYSICAL_CONNECTOR, "Tag", false, byConnectorTag},
};

}  // namespace

bool lookupInventory(classId_t classId, const Instance* keys, Array<Instance*>& found) {
    found.clear();
    const LookupRow* row = nullptr;
    for (const LookupRow& r : kLookups)
        if (r.classId == classId)
            row = &r;
    String key;
    if (row == nullptr || keys == nullptr || !keyText(keys, row->key, key))
        return false;
    try {
        HostIdentityScope scope;
        TVRN_LOG(LL_DBG, "Looking up %s %s", ProviderUtil::getClassName(classId).c_str(),
                 key.c_str());
        // As the walks: nothing is asked while the driver is not usable.
        if (!ProviderUtil::getDriverStatus())
            return true;
        String system;
        if (row->onThisHost &&
            (!keyText(keys, "SystemName", system) || system != HostIdentityScope::hostText()))
            return true;
        return row->lookup(classId, key, found);
    } catch (...) {
        // Only memory can run out here; the walks keep library exceptions.
        destroyInstances(found);
        TVRN_LOG(LL_ERR, "lookupInventory got default exception");
        return true;
    }
}

}  // namespace CPTA
