#include "inventory/PhysicalAssetHelper.h"

#include "gateway/JsonAccess.h"
#include "gateway/ProviderUtil.h"
#include "inventory/ConnectorTag.h"
#include "inventory/InventoryCommon.h"
#include "inventory/PortHelper.h"
#include "schema/generated/TAVRIN_PhysicalConnector.h"

namespace CPTA {

PhysicalAssetHelper* PhysicalAssetHelper::getPhysicalAssetHelperObject() {
    static PhysicalAssetHelper instance;
    return &instance;
}

Array<Instance*> PhysicalAssetHelper::getInstancesByClass(classId_t classId) {
    return runWalk("PhysicalAssetHelper::getInstancesByClass",
                   [&](InstanceList& out) { walk(classId, out); });
}

Array<Instance*> PhysicalAssetHelper::getInstancesByPosition(classId_t classId,
                                                             unsigned adapterNumber,
                                                             unsigned portPosition) {
    return runWalk("PhysicalAssetHelper::getInstancesByPosition", [&](InstanceList& out) {
        if (adapterNumber > 0)
            walk(classId, out, adapterNumber, portPosition);
    });
}

void PhysicalAssetHelper::walk(classId_t classId, InstanceList& out, unsigned onlyAdapter,
                               unsigned onlyPort) {
    Json::Value adapters;
    const int count = ProviderUtil::getNumberOfAdapters(adapters);
    if (count < 1) {
        TVRN_LOG(LL_WARN, "No adapters in the system. ");
        return;
    }
    PortHelper* ports = PortHelper::getPortHelperObject();
    for (int number = 1; number <= count; number++) {
        if (onlyAdapter != 0 && unsigned(number) != onlyAdapter)
            continue;
        const String key = adapterKeyAt(adapters, number);
        Json::Value details;
        if (ProviderUtil::getAdapterDetails(key, details) != 0) {
            // Only this adapter is lost; the ones after it still have connectors.
            TVRN_LOG(LL_INFO, "Unable to get Adapter info %d - %s", number, key.c_str());
            continue;
        }
        Json::Value portList;
        if (ports->getNumberOfPorts(key, portList) < 1)
            TVRN_LOG(LL_WARN, "There are no ports associated to Adapter id %d", number);
        const Json::Value& portKeys = jsonArray(portList, "indexStrings");
        for (Json::ArrayIndex j = 0; j < portKeys.size(); j++) {
            if (onlyAdapter != 0 && j != onlyPort)
                continue;
            const String portKey = jsonAsString(portKeys[j]);
            Json::Value port;
            if (ports->getPortDetails(portKey, port) != 0)
                continue;
            Json::Value sfp;
            const int rc = ports->getOpticsInfo(portKey, sfp);
            if (rc != 0) {
                TVRN_LOG(LL_WARN, "getOpticsInfo failed for PortIndex =%d Ret = %d", int(j), rc);
                continue;
            }
            if (classId == CID_PHYSICAL_CONNECTOR)
                out.add(getPhysicalConnectorInstance(readOptic(sfp, number, int(j))));
            else
                TVRN_LOG(LL_INFO, "Default case . Other classes ");
        }
    }
}

_sfpInfo PhysicalAssetHelper::readOptic(const Json::Value& sfp, int adapterNumber,
                                        int portPosition) {
    // A member missing or of the wrong type leaves its property empty; the
    // serial number also names the connector, so say which one is lost.
    for (const char* member :
         {"vendorName", "serialNo", "vendorPart", "revision", "speed", "extendedID"})
        if (!sfp.isObject() || !sfp[member].isString())
            TVRN_LOG(LL_WARN, "The optic of adapter %d port %d has no text %s", adapterNumber,
                     portPosition, member);
    _sfpInfo record;
    record.vendorName =
        ProviderUtil::trimString(jsonString(sfp, "vendorName"), _sfpInfo::IDENT_WIDTH);
    record.serialNo = ProviderUtil::trimString(jsonString(sfp, "serialNo"), _sfpInfo::IDENT_WIDTH);
    record.vendorPart =
        ProviderUtil::trimString(jsonString(sfp, "vendorPart"), _sfpInfo::IDENT_WIDTH);
    record.revision =
        ProviderUtil::trimString(jsonString(sfp, "revision"), _sfpInfo::REVISION_WIDTH);
    record.speed = ProviderUtil::firstChars(jsonString(sfp, "speed"), _sfpInfo::SPEED_WIDTH);
    record.extendedId =
        ProviderUtil::firstChars(jsonString(sfp, "extendedID"), _sfpInfo::EXTENDED_ID_WIDTH);
    record.tag = connectorTag(record.serialNo, unsigned(adapterNumber), unsigned(portPosition));
    return record;
}

Instance* PhysicalAssetHelper::getPhysicalConnectorInstance(const _sfpInfo& s) {
    TAVRIN_PhysicalConnector* pc = create<TAVRIN_PhysicalConnector>(true);
    if (pc == nullptr)
        return nullptr;
    pc->CreationClassName.set(String("TAVRIN_PhysicalConnector"));
    pc->Tag.set(s.tag);
    pc->Caption.set(String("TAVRIN_PhysicalConnector"));
    pc->ElementName.set(String("TAVRIN_PhysicalConnector"));
    pc->Description.set(s.speed);
    pc->Manufacturer.set(s.vendorName);
    pc->Model.set(s.extendedId);
    pc->ConnectorDescription.set(s.extendedId);
    pc->SerialNumber.set(s.serialNo);
    pc->PartNumber.set(s.vendorPart);
    pc->Version.set(s.revision);
    pc->ConnectorType.set(arrayOf<uint16>({118}));
    pc->ConnectorGender.set(0);
    pc->ConnectorPinout.set(String("0"));
    pc->NumPhysicalPins.set(0);
    pc->ConnectorLayout.set(1);
    return pc;
}

}  // namespace CPTA
