#include "inventory/AdapterHelper.h"

#include <strings.h>

#include "gateway/CIMProviderTfaj.h"
#include "gateway/JsonAccess.h"
#include "gateway/ProviderUtil.h"
#include "inventory/InventoryCommon.h"
#include "schema/generated/TAVRIN_AdapterSoftwareIdentity.h"
#include "schema/generated/TAVRIN_PhysicalPackage.h"
#include "schema/generated/TAVRIN_PortController.h"
#include "schema/generated/TAVRIN_Product.h"

namespace CPTA {

namespace {

const char kVendorCode[] = "TVRN";
const uint32 kInService = 11;
const uint32 kStopped = 10;

const char* productText(const _adapterData& a) {
    return a.isCNA ? "Tavrin CNA" : "Tavrin FC HBA";
}
const char* adapterKind(const _adapterData& a) {
    return a.isCNA ? "Ethernet Adapter" : "Fiber Channel Adapter";
}
// The adapter's colon-free address: its MAC for a CNA, else its WWN.
const String& adapterAddress(const _adapterData& a) {
    return a.isCNA ? a.adapterMac : a.adapterWwn;
}

// "TVRN <kind>", then " <serial>" when there is one.
String adapterTitle(const _adapterData& a) {
    String title(kVendorCode, " ", adapterKind(a));
    if (a.serialNumber.size() > 0) {
        title.append(' ');
        title.append(a.serialNumber);
    }
    return title;
}

bool beginsWithNoCase(const String& text, const char* prefix) {
    return strncasecmp(text.c_str(), prefix, std::char_traits<char>::length(prefix)) == 0;
}

// The fields every adapter gets once one of its drivers is named.
void fillCommonFields(AdapterHelper* helper, const Json::Value& hba, const Json::Value& firmware,
                      _adapterData& record) {
    record.serialNumber = jsonString(hba, "serialNumber");
    helper->fillVPDInfo(hba, &record);
    record.vendorCode = kVendorCode;
    record.firmwareVersion =
        ProviderUtil::trimString(jsonString(firmware, "version"), _adapterData::VERSION_WIDTH);
    record.model = jsonString(hba, "model");
}

// What distinguishes the four kinds of software identity.
struct SoftwareText {
    String instanceId;
    String name;
    String caption;
    String version;
    uint16 classification;
    String softwareId;  // first entry of IdentityInfoValue
};

SoftwareText softwareText(const _adapterData& a, softwareType_t type, bool isNetworkDriver) {
    SoftwareText t;
    t.classification = uint16(type);
    if (type == SOFTWARE_DRIVER) {
        const char* which = isNetworkDriver ? "Network driver" : "Storage driver";
        t.instanceId = isNetworkDriver ? a.networkDriverName : a.storageDriverName;
        t.name = String(which, " ", "for Tavrin adapter");
        t.caption = which;
        t.version = isNetworkDriver ? a.networkDriverVersion : a.storageDriverVersion;
        t.softwareId = t.name;
        return t;
    }
    const bool bios = type == SOFTWARE_BIOS;
    t.instanceId = adapterAddress(a);
    t.instanceId.append(bios ? "_bios" : "_firmware");
    t.name = adapterTitle(a);
    t.name.append(bios ? " BIOS" : " Firmware");
    t.caption = String(bios ? "BIOS for " : "Firmware for ", productText(a));
    t.version = bios ? a.biosVersion : a.firmwareVersion;
    t.softwareId = a.model;
    return t;
}

}  // namespace

AdapterHelper* AdapterHelper::getAdapterHelperInstance() {
    static AdapterHelper instance;
    return &instance;
}

Array<Instance*> AdapterHelper::getInstancesByClass(classId_t classId) {
    return runWalk("AdapterHelper::getInstancesByClass",
                   [&](InstanceList& out) { walk(classId, out, String()); });
}

Array<Instance*> AdapterHelper::getInstancesByAddress(classId_t classId, const String& address) {
    return runWalk("AdapterHelper::getInstancesByAddress",
                   [&](InstanceList& out) { walk(classId, out, address); });
}

Array<Instance*> AdapterHelper::getDriverIdentities(const String& driver) {
    return runWalk("AdapterHelper::getDriverIdentities", [&](InstanceList& out) {
        walk(CID_ADAPTER_SOFTWARE_IDENTITY, out, String(), driver);
    });
}

void AdapterHelper::walk(classId_t classId, InstanceList& out, const String& only,
                         const String& onlyDriver) {
    TVRN_LOG(LL_DBG, "Entering: %s", "getInstancesByClass");
    bool networkDriverReported = false;
    bool storageDriverReported = false;
    bool driverFound = false;
    forEachAdapter("No adapters in the system!", true, [&](int number, const String& key) {
        if (onlyDriver.size() > 0 &&
            (driverFound || (networkDriverReported && storageDriverReported)))
            return;
        if (only.size() > 0 && !ProviderUtil::eraseColonsFromIndex(key).equali(only))
            return;
        _adapterData record;
        Json::Value details;
        if (ProviderUtil::getAdapterDetails(key, details) != 0) {
            TVRN_LOG(LL_INFO, "Unable to get Adapter info %d - %s", number, key.c_str());
            return;
        }
        if (details.isNull()) {
            TVRN_LOG(LL_ERR, "adapter is NULL for %s", key.c_str());
            return;
        }
        const Json::Value& hba = jsonObject(details, "hbaData");
        const Json::Value& driver = jsonObject(details, "driver");
        const Json::Value& firmware = jsonObject(details, "firmware");

        record.isCNA = jsonHas(hba, "hbaMAC", Json::stringValue);
        TVRN_LOG(LL_INFO, "Adapter Type : %s", record.isCNA ? "CNA" : "FC HBA");
        if (jsonUInt(hba, "portCount") == 0) {
            TVRN_LOG(LL_WARN, "There are no ports associated to Adapter id %d - %s", number,
                     key.c_str());
            return;
        }
        record.hostName = HostIdentityScope::hostText();
        if (record.isCNA)
            record.adapterMac = ProviderUtil::eraseColonsFromIndex(jsonString(hba, "hbaMAC"));

        bool commonFilled = false;
        if (jsonHas(driver, "networkDriverName", Json::stringValue)) {
            record.networkDriverName = jsonString(driver, "networkDriverName");
            record.networkDriverVersion = ProviderUtil::trimString(
                jsonString(driver, "networkDriverVersion"), _adapterData::VERSION_WIDTH);
            fillCommonFields(this, hba, firmware, record);
            commonFilled = true;
        }
        if (jsonHas(driver, "storageDriverName", Json::stringValue)) {
            record.adapterWwn = ProviderUtil::eraseColonsFromIndex(jsonString(hba, "wwn"));
            record.storageDriverName = jsonString(driver, "storageDriverName");
            record.storageDriverVersion = ProviderUtil::trimString(
                jsonString(driver, "storageDriverVersion"), _adapterData::VERSION_WIDTH);
            if (!commonFilled)
                fillCommonFields(this, hba, firmware, record);
        }

        switch (classId) {
            case CID_PORT_CONTROLLER:
                record.adapterStatus = jsonBool(hba, "hbaStatus") ? kInService : kStopped;
                out.add(getPortControllerInstance(record));
                break;
            case CID_PHYSICAL_PACKAGE: out.add(getPhysicalPackageInstance(record)); break;
            case CID_PRODUCT: out.add(getProductInstance(record)); break;
            case CID_ADAPTER_SOFTWARE_IDENTITY: {
                if (!networkDriverReported && record.networkDriverName.size() > 0) {
                    out.add(getAdapterSoftwareIdentityInstance(record, SOFTWARE_DRIVER, true));
                    networkDriverReported = true;
                    driverFound = driverFound || record.networkDriverName == onlyDriver;
                }
                if (!storageDriverReported && record.storageDriverName.size() > 0) {
                    out.add(getAdapterSoftwareIdentityInstance(record, SOFTWARE_DRIVER, false));
                    storageDriverReported = true;
                    driverFound = driverFound || record.storageDriverName == onlyDriver;
                }
                if (onlyDriver.size() > 0)
                    break;
                record.biosVersion = ProviderUtil::trimString(jsonString(firmware, "biosVersion"),
                                                              _adapterData::VERSION_WIDTH);
                if (!ProviderUtil::valid_UTF_string(record.biosVersion.c_str()))
                    record.biosVersion.clear();
                Json::Value flash = libGetFlashInfo(keyRequest("indexStr", key));
                if (!ProviderUtil::isValidJsonResponse(flash) ||
                    !jsonHas(flash, "flashStatus", Json::booleanValue))
                    TVRN_LOG(LL_WARN, "Flash state of %s is not available; no BIOS identity",
                             key.c_str());
                else if (jsonBool(flash, "flashStatus"))
                    out.add(getAdapterSoftwareIdentityInstance(record, SOFTWARE_BIOS, false));
                out.add(getAdapterSoftwareIdentityInstance(record, SOFTWARE_FIRMWARE, false));
                break;
            }
            default: TVRN_LOG(LL_INFO, "Default case . Other classes "); break;
        }
    });
    TVRN_LOG(LL_INFO, "Number of instances: %d", int(out.size()));
    TVRN_LOG(LL_DBG, "Returning: %s", "getInstancesByClass");
}

void AdapterHelper::fillVPDInfo(const Json::Value& hbaData, _adapterData* record) {
    if (record == nullptr)
        return;
    const String vendor = jsonString(hbaData, "oem");
    TVRN_LOG(LL_DBG, "Adapter vendor code is :%s", vendor.c_str());
    if (beginsWithNoCase(vendor, "HP") || beginsWithNoCase(vendor, "DELL")) {
        TVRN_LOG(LL_INFO, "%s VPD info doesnt have the FRU details to print.", vendor.c_str());
        record->fruNumber.clear();
    } else {
        record->fruNumber = jsonString(hbaData, "fruNum");
    }
    record->partNumber = jsonString(hbaData, "partNum");
    String oemSerial = jsonString(hbaData, "oemSerialNum");
    if (oemSerial.size() > 0) {
        const String& part = record->partNumber;
        if (oemSerial.equal(0, part.c_str(), part.size()))
            oemSerial.remove(0, part.size());
        record->serialNumber = oemSerial;
    }
    const String uuid = jsonString(hbaData, "uuid");
    if (uuid.size() > 0)
        record->uuid = uuid;
}

// ---- builders ------------------------------------------------------------------

Instance* AdapterHelper::getPortControllerInstance(const _adapterData& a) {
    TAVRIN_PortController* pc = create<TAVRIN_PortController>(true);
    if (pc == nullptr)
        return nullptr;
    const bool stopped = a.adapterStatus == kStopped;
    pc->SystemCreationClassName.set(ProviderUtil::getClassName(CID_COMPUTER_SYSTEM));
    pc->SystemName.set(a.hostName);
    pc->CreationClassName.set(ProviderUtil::getClassName(CID_PORT_CONTROLLER));
    pc->DeviceID.set(adapterAddress(a));
    pc->Name.set(a.serialNumber);
    pc->ElementName.set(a.serialNumber);
    pc->OperationalStatus.set(arrayOf<uint16>({uint16(a.adapterStatus)}));
    pc->StatusDescriptions.set(
        stringsOf({stopped ? "The adapter is disabled" : "The adapter is in service"}));
    pc->EnabledState.set(stopped ? 3 : 2);
    pc->Caption.set(String(productText(a)));
    pc->Description.set(String(productText(a)));
    pc->ControllerType.set(a.isCNA ? 1 : 4);
    if (a.isCNA)
        pc->OtherControllerType.set(String("CNA - FC and Ethernet types"));
    return pc;
}

Instance* AdapterHelper::getPhysicalPackageInstance(const _adapterData& a) {
    TAVRIN_PhysicalPackage* pp = create<TAVRIN_PhysicalPackage>(true);
    if (pp == nullptr)
        return nullptr;
    String tag;
    if (a.uuid.size() > 0) {
        tag = a.uuid;
    } else if (a.isCNA) {
        tag = String("10000000-0000-0000-0000-", a.adapterMac.c_str());
    } else {
        tag = String("10000000-0000-0000-", a.adapterWwn.substr(0, 4).c_str(), "-");
        tag.append(a.adapterWwn.substr(4));
    }
    pp->CreationClassName.set(String("TAVRIN_PhysicalPackage"));
    pp->Tag.set(tag);
    pp->Manufacturer.set(a.vendorCode);
    pp->Caption.set(String(productText(a)));
    pp->ElementName.set(String(productText(a)));
    pp->Description.set(String(productText(a)));
    pp->Name.set(adapterTitle(a));
    pp->Model.set(a.model);
    pp->SerialNumber.set(a.serialNumber);
    pp->PartNumber.set(a.partNumber);
    pp->SKU.set(a.fruNumber);
    pp->PackageType.set(9);
    return pp;
}

Instance* AdapterHelper::getProductInstance(const _adapterData& a) {
    TAVRIN_Product* product = create<TAVRIN_Product>(true);
    if (product == nullptr)
        return nullptr;
    product->Name.set(String("TAVRIN CIM Provider"));
    product->IdentifyingNumber.set(a.serialNumber);
    product->Vendor.set(a.vendorCode);
    product->Version.set(a.firmwareVersion);
    product->ElementName.set(String(productText(a)));
    product->Caption.set(String(productText(a)));
    product->Description.set(String(productText(a)));
    return product;
}

Instance* AdapterHelper::getAdapterSoftwareIdentityInstance(const _adapterData& a,
                                                            softwareType_t type,
                                                            bool isNetworkDriver) {
    TVRN_LOG(LL_INFO, "Software Type is : %s", type == SOFTWARE_DRIVER ? "Driver" : "Firmware");
    TAVRIN_AdapterSoftwareIdentity* si = create<TAVRIN_AdapterSoftwareIdentity>(true);
    if (si == nullptr)
        return nullptr;
    const SoftwareText t = softwareText(a, type, isNetworkDriver);
    si->InstanceID.set(t.instanceId);
    si->Name.set(t.name);
    si->Caption.set(t.caption);
    si->Description.set(t.caption);
    si->ElementName.set(t.caption);
    si->VersionString.set(t.version);
    si->Classifications.set(arrayOf<uint16>({t.classification}));
    si->IdentityInfoType.set(stringsOf({"SoftwareID", "SoftwareStatus"}));
    Array<String> info;
    info.append(t.softwareId);
    info.append(String("Primary"));
    si->IdentityInfoValue.set(info);
    si->Manufacturer.set(a.vendorCode);
    return si;
}

}  // namespace CPTA
