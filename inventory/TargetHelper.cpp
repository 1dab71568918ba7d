#include "inventory/TargetHelper.h"

#include <cstdio>

#include "gateway/CIMProviderTfaj.h"
#include "gateway/GuardedCall.h"
#include "gateway/JsonAccess.h"
#include "gateway/ProviderUtil.h"
#include "inventory/InventoryCommon.h"
#include "schema/generated/TAVRIN_LogicalDisk.h"
#include "schema/generated/TAVRIN_StorageExtent.h"
#include "schema/generated/TAVRIN_TapeDrive.h"

namespace CPTA {

namespace {

// How a LUN is named, by the kind of identifier its description holds.
struct LunNaming {
    uint32 idType;
    enum { COMPOSED, DESCRIPTION, UNKNOWN } source;
    uint16 nameFormat;
    uint16 nameNamespace;
};

const uint32 kIdTypeSerial = 0;  // no description; named by vendor, product and serial
const uint32 kIdTypeNone = 10;   // neither description nor serial

const LunNaming kLunNamings[] = {
    {kIdTypeSerial, LunNaming::COMPOSED, 7, 7}, {1, LunNaming::DESCRIPTION, 11, 4},
    {2, LunNaming::DESCRIPTION, 10, 3},         {3, LunNaming::DESCRIPTION, 9, 2},
    {8, LunNaming::DESCRIPTION, 1, 1},          {kIdTypeNone, LunNaming::UNKNOWN, 0, 0},
};

const LunNaming* namingOf(uint32 idType) {
    for (const LunNaming& n : kLunNamings)
        if (n.idType == idType)
            return &n;
    return nullptr;
}

// The LUN's Name; null naming when the kind of identifier is not known.
String lunName(const _hbaLunInfo& lun, const LunNaming* naming) {
    if (naming == nullptr)
        return String();
    switch (naming->source) {
        case LunNaming::COMPOSED: {
            String name = ProviderUtil::trimString(lun.vendor, _hbaLunInfo::VENDOR_WIDTH + 1);
            name.append('+');
            name.append(ProviderUtil::trimString(lun.productId, _hbaLunInfo::PRODUCT_ID_WIDTH + 1));
            name.append('+');
            name.append(
                ProviderUtil::trimString(lun.productSerialNumber, _hbaLunInfo::SERIAL_WIDTH + 1));
            return name;
        }
        case LunNaming::DESCRIPTION: return lun.lunDescription;
        case LunNaming::UNKNOWN: break;
    }
    return String("Unable To Fetch");
}

// The properties all three classes share.
template <class C>
C* newLunInstance(const char* className, const char* description, const _hbaPortInfo& port,
                  const _hbaLunInfo& lun) {
    C* instance = create<C>(true);
    if (instance == nullptr)
        return nullptr;
    char element[32];
    std::snprintf(element, sizeof(element), "LUN_%u", unsigned(lun.lunNumber));
    String deviceId(port.portId.c_str(), "_", lun.remotePortWwn.c_str());
    deviceId.append('_');
    deviceId.append(ProviderUtil::trimString(lun.vendor, _hbaLunInfo::VENDOR_WIDTH + 1));
    deviceId.append('_');
    deviceId.append(ProviderUtil::trimString(lun.productId, _hbaLunInfo::PRODUCT_ID_WIDTH + 1));
    deviceId.append('_');
    deviceId.append(element);
    setDeviceKeys(instance, className, port.hostName, deviceId);
    instance->ElementName.set(String(element));
    Array<String> ids;
    ids.append(deviceId);
    instance->OtherIdentifyingInfo.set(ids);
    instance->IdentifyingDescriptions.set(stringsOf({description}));
    instance->OperationalStatus.set(arrayOf<uint16>({2}));
    return instance;
}

}  // namespace

TargetHelper* TargetHelper::getTargetHelperObject() {
    static TargetHelper instance;
    return &instance;
}

bool TargetHelper::readLun(const Json::Value& u, const String& remotePortWwn, _hbaLunInfo& lun) {
    lun = _hbaLunInfo();
    lun.remotePortWwn = ProviderUtil::eraseColonsFromIndex(remotePortWwn);
    if (!jsonHas(u, "vendor", Json::stringValue) || !jsonHas(u, "number", Json::uintValue) ||
        !jsonHas(u, "productID", Json::stringValue)) {
        TVRN_LOG(LL_ERR, "LUN info is NOT available");
        return false;
    }
    lun.lunNumber = jsonUInt(u, "number");
    lun.vendor = ProviderUtil::firstChars(jsonString(u, "vendor"), _hbaLunInfo::VENDOR_WIDTH);
    lun.productId =
        ProviderUtil::firstChars(jsonString(u, "productID"), _hbaLunInfo::PRODUCT_ID_WIDTH);
    lun.lunDescIdType = jsonUInt(u, "lunDescIdType");
    if (jsonHas(u, "lunDescription", Json::stringValue)) {
        lun.lunDescription = ProviderUtil::firstChars(jsonString(u, "lunDescription"),
                                                      _hbaLunInfo::DESCRIPTION_WIDTH);
    } else if (jsonHas(u, "productSerialNumber", Json::stringValue)) {
        lun.productSerialNumber = ProviderUtil::firstChars(jsonString(u, "productSerialNumber"),
                                                           _hbaLunInfo::SERIAL_WIDTH);
        lun.lunDescIdType = kIdTypeSerial;
    } else {
        lun.lunDescIdType = kIdTypeNone;
    }
    return true;
}

Array<Instance*> TargetHelper::getTargetInstances(const _hbaPortInfo& port, classId_t classId,
                                                  const PortScope& scope) {
    return runWalk("TargetHelper::getTargetInstances", [&](InstanceList& out) {
        TVRN_LOG(LL_DBG, "Entering: %s", "getTargetInstances");
        Json::Value request, remotePorts;
        if (!listRemotePorts(port.portId, scope.namedRemote(), request, remotePorts))
            return;
        TVRN_LOG(LL_DBG, "libGetAllRemotePorts. Number of rports -  %d", int(remotePorts.size()));

        for (Json::ArrayIndex k = 0; k < remotePorts.size(); k++) {
            String remoteWwn = jsonString(remotePorts[k], "remotePortWwn");
            if (!scope.admitsRemote(ProviderUtil::eraseColonsFromIndex(remoteWwn)))
                continue;
            request["rPortWwn"] = jsonText(remoteWwn);
            Json::Value answer;
            guardedCall(LibCall("libGetCompleteRemotePort"), libGetCompleteRemotePort, request,
                        answer);
            // Without its device data the remote port cannot be told from
            // one that is no target: a broken answer.
            if (!ProviderUtil::isValidJsonResponse(answer) ||
                !jsonHas(answer, "deviceData", Json::objectValue)) {
                TVRN_LOG(LL_ERR, "libGetCompleteRemotePort response is null or has error");
                continue;
            }
            remoteWwn = remotePortWwn(remotePorts[k], answer);
            TVRN_LOG(LL_DBG, "Loop for the rport index =   %d", int(k));
            const Json::Value& device = jsonObject(answer, "deviceData");
            if (!jsonBool(device, "isTarget")) {
                TVRN_LOG(LL_DBG, "Nothing to do since the its not a Target Rport.");
                continue;
            }
            const String type = jsonString(device, "type");
            TVRN_LOG(LL_DBG, "Device type = %s", type.c_str());
            const bool tape = type == "Tape" || type == "Media Changer";
            const bool wanted = tape ? classId == CID_TAPE_DRIVE
                                     : classId == CID_STORAGE_EXTENT || classId == CID_LOGICAL_DISK;
            if (!wanted) {
                TVRN_LOG(LL_INFO, "Continue with next rport. Looking for another device type ");
                continue;
            }
            TVRN_LOG(LL_DBG, "rPortWwns[%d]=%s", int(k), remoteWwn.c_str());
            if (!jsonHas(answer, "lunList", Json::arrayValue)) {
                TVRN_LOG(LL_ERR, "No LUN Info is available for Rport %s.", remoteWwn.c_str());
                continue;
            }
            const Json::Value& luns = jsonArray(answer, "lunList");
            TVRN_LOG(LL_DBG, "Number of Luns = %d.", int(luns.size()));
            for (const Json::Value& element : luns) {
                _hbaLunInfo lun;
                if (!readLun(element, remoteWwn, lun))
                    continue;
                if (tape)
                    out.add(getTapeDriveInstance(port, lun));
                else if (classId == CID_STORAGE_EXTENT)
                    out.add(getStorageExtentInstance(port, lun));
                else
                    out.add(getLogicalDiskInstance(port, lun));
            }
        }
        TVRN_LOG(LL_DBG, "Returning: %s", "getTargetInstances");
    });
}

Instance* TargetHelper::getStorageExtentInstance(const _hbaPortInfo& port, const _hbaLunInfo& lun) {
    TAVRIN_StorageExtent* extent = newLunInstance<TAVRIN_StorageExtent>(
        "TAVRIN_StorageExtent", "It is a unique identification for a Storage Extent", port, lun);
    if (extent == nullptr)
        return nullptr;
    const LunNaming* naming = namingOf(lun.lunDescIdType);
    extent->Name.set(lunName(lun, naming));
    if (naming != nullptr) {
        extent->NameFormat.set(naming->nameFormat);
        extent->NameNamespace.set(naming->nameNamespace);
    } else {
        TVRN_LOG(LL_ERR, "Default idType. Should not have reached here. ");
        extent->NameFormat.clear();
        extent->NameNamespace.clear();
    }
    TVRN_LOG(LL_DBG, "Returned instance of StorageExtent for port WWN= %s", port.portId.c_str());
    return extent;
}

Instance* TargetHelper::getTapeDriveInstance(const _hbaPortInfo& port, const _hbaLunInfo& lun) {
    TAVRIN_TapeDrive* tape = newLunInstance<TAVRIN_TapeDrive>(
        "TAVRIN_TapeDrive", "It is a unique identification for a Tape Drive", port, lun);
    if (tape == nullptr)
        return nullptr;
    const LunNaming* naming = namingOf(lun.lunDescIdType);
    if (naming == nullptr)
        TVRN_LOG(LL_ERR, "Default case for lunInfo.idType. Should not have reached here. ");
    tape->Name.set(lunName(lun, naming));
    TVRN_LOG(LL_DBG, "Returned instance of TapeDrive for port WWN= %s", port.portId.c_str());
    return tape;
}

Instance* TargetHelper::getLogicalDiskInstance(const _hbaPortInfo& port, const _hbaLunInfo& lun) {
    TAVRIN_LogicalDisk* disk = newLunInstance<TAVRIN_LogicalDisk>(
        "TAVRIN_LogicalDisk", "It is a unique identification for a Logical Disk", port, lun);
    if (disk == nullptr)
        return nullptr;
    disk->Name.set(lun.lunDescription);
    disk->NameFormat.set(1);
    disk->NameNamespace.set(1);
    TVRN_LOG(LL_DBG, "Returned instance of logicalDisk for port WWN= %s", port.portId.c_str());
    return disk;
}

}  // namespace CPTA
