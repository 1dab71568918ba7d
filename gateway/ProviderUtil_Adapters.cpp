// ProviderUtil: adapter look-ups through the adapter library.
#include <atomic>

#include "framework/Log.h"
#include "gateway/CIMProviderTfaj.h"
#include "gateway/GuardedCall.h"
#include "gateway/JsonAccess.h"
#include "gateway/ProviderUtil.h"

namespace CPTA {

namespace {

const size_t kMacLength = 17;  // colon format

std::atomic<ProviderUtil::EthPortDetailsFn> gEthPortDetails{nullptr};

// A boolean member of the adapter's "hbaData"; false when the details fail or
// the member is missing (logged with `missing`), else logged with `found`.
bool adapterFlag(const String& key, const char* member, const char* missing, const char* found) {
    String index = ProviderUtil::getIndexInColonFormat(key);
    Json::Value details;
    if (ProviderUtil::getAdapterDetails(index, details) != 0)
        return false;
    const Json::Value& hba = jsonObject(details, "hbaData");
    if (!jsonHas(hba, member, Json::booleanValue)) {
        TVRN_LOG(LL_ERR, missing, index.c_str());
        return false;
    }
    bool flag = jsonBool(hba, member);
    TVRN_LOG(LL_INFO, found, int(flag));
    return flag;
}

}  // namespace

int ProviderUtil::getNumberOfAdapters(Json::Value& adapters) {
    adapters = libGetAllAdaptersIndexString(Json::Value());
    if (isValidJsonResponse(adapters) && jsonHas(adapters, "indexStrings", Json::arrayValue)) {
        int count = int(jsonArray(adapters, "indexStrings").size());
        TVRN_LOG(LL_INFO, "Number of Adapters: %d", count);
        return count;
    }
    TVRN_LOG(LL_ERR, "libGetAllAdaptersIndexString returns NULL.");
    return -1;
}

String ProviderUtil::getAddrByAdapterId(unsigned int adapterId) {
    Json::Value adapters = libGetAllAdaptersIndexString(Json::Value());
    if (!isValidJsonResponse(adapters) || !jsonHas(adapters, "indexStrings", Json::arrayValue)) {
        TVRN_LOG(LL_ERR, "libGetAllAdaptersIndexString returns NULL.");
        return String();
    }
    const Json::Value& keys = jsonArray(adapters, "indexStrings");
    if (adapterId < 1 || adapterId > keys.size()) {
        TVRN_LOG(LL_INFO, "numOfAdapters = %u. Id = %u", unsigned(keys.size()), adapterId);
        return String();
    }
    return jsonAsString(keys[Json::ArrayIndex(adapterId - 1)]);
}

int ProviderUtil::getAdapterDetails(const String& key, Json::Value& details) {
    String index = getIndexInColonFormat(key);
    Json::Value request(Json::objectValue);
    request[index.size() == kMacLength ? "mac" : "wwn"] = jsonText(index);
    if (!guardedCall(LibCall("libGetHbaByWwn", index), libGetHbaByWwn, request, details))
        return -1;
    if (isValidJsonResponse(details) && jsonHas(details, "hbaData", Json::objectValue) &&
        jsonHas(details, "driver", Json::objectValue))
        return 0;
    TVRN_LOG(LL_ERR, "Unable to get adapater details for %s", index.c_str());
    return -1;
}

String ProviderUtil::getAdapterSerialNumber(const String& key) {
    Json::Value details;
    if (getAdapterDetails(key, details) != 0) {
        TVRN_LOG(LL_ERR, "Unable to get Adapter info for %s", key.c_str());
        return String();
    }
    if (!isValidJsonResponse(details)) {
        TVRN_LOG(LL_ERR, "adapter info is NULL or has errors for %s", key.c_str());
        return String();
    }
    const Json::Value& hba = jsonObject(details, "hbaData");
    String oem = jsonString(hba, "oemSerialNum");
    if (oem.size() == 0)
        return jsonString(hba, "serialNumber");
    String part = jsonString(hba, "partNum");
    if (part.size() > 0 && oem.equal(0, part.c_str(), part.size()))
        return oem.substr(part.size());
    return oem;
}

bool ProviderUtil::checkIfThisAdapterModelPresent(const char* model) {
    if (model == nullptr)
        return false;
    Json::Value adapters;
    int count = getNumberOfAdapters(adapters);
    if (count <= 0) {
        TVRN_LOG(LL_WARN, "No adapters in the system!");
        return false;
    }
    const String wanted(model);
    const Json::Value& keys = jsonArray(adapters, "indexStrings");
    for (int number = 1; number <= count; number++) {
        String key = jsonAsString(keys[Json::ArrayIndex(number - 1)]);
        Json::Value details;
        if (getAdapterDetails(key, details) != 0) {
            TVRN_LOG(LL_INFO, "Unable to get Adapter info %d - %s", number, key.c_str());
            continue;
        }
        if (details.isNull()) {
            TVRN_LOG(LL_ERR, "adapter is NULL for %s", key.c_str());
            continue;
        }
        // An adapter's model matches when the wanted text begins with it; an
        // adapter without a model matches nothing.
        String found = jsonString(jsonObject(details, "hbaData"), "model");
        if (found.size() > 0 && wanted.equali(0, found.c_str(), found.size())) {
            TVRN_LOG(LL_INFO, "Found the Adapter");
            return true;
        }
    }
    return false;
}

bool ProviderUtil::isCNA(const String& key) {
    return adapterFlag(key, "isCNA", "Unable to get CNA info for %s", "isCNA = %d");
}

bool ProviderUtil::hasEthernetPort(const String& key) {
    return adapterFlag(key, "hasEthPort", "Unable to get Ethernet info %s", "ethFlag = %d");
}

String ProviderUtil::getDriverVersion() {
    Json::Value adapters;
    if (getNumberOfAdapters(adapters) <= 0)
        return String();
    String key = jsonAsString(jsonArray(adapters, "indexStrings")[0]);
    Json::Value details;
    if (getAdapterDetails(key, details) != 0)
        return String();
    const Json::Value& driver = jsonObject(details, "driver");
    String version;
    if (jsonHas(driver, "storageDriverVersion", Json::stringValue)) {
        version = jsonString(driver, "storageDriverVersion");
    } else if (jsonHas(driver, "networkDriverVersion", Json::stringValue)) {
        version = jsonString(driver, "networkDriverVersion");
    } else {
        TVRN_LOG(LL_ERR, "Unable to get driver version for %s", key.c_str());
        return String();
    }
    char trimmed[64];
    trimString(version.c_str(), trimmed);
    TVRN_LOG(LL_INFO, "Driver version is %s", trimmed);
    return String(trimmed);
}

int ProviderUtil::getAdapterId(const String& address) {
    if (address.size() == 16)
        return getAdapterIdByNWWN(address);
    if (address.size() == 12)
        return getAdapterIdByMacAddr(address);
    TVRN_LOG(LL_ERR, "The address passed is not MAC or WWN");
    return -1;
}

int ProviderUtil::getAdapterIdByNWWN(const String& wwn) {
    return getAdapterIdByIndexStr(wwn);
}

int ProviderUtil::getAdapterIdByMacAddr(const String& mac) {
    return getAdapterIdByIndexStr(mac);
}

int ProviderUtil::getAdapterIdByIndexStr(const String& address) {
    Json::Value request(Json::objectValue);
    request["indexStr"] = jsonText(getIndexInColonFormat(address));
    Json::Value answer = libGetAdapterId(request);
    if (!isValidJsonResponse(answer) || !jsonHas(answer, "adapterId", Json::uintValue)) {
        TVRN_LOG(LL_ERR, "libGetAdapterId returns NULL.");
        return -1;
    }
    return int(jsonUInt(answer, "adapterId"));
}

void ProviderUtil::setEthPortDetailsHook(EthPortDetailsFn hook) {
    gEthPortDetails.store(hook, std::memory_order_release);
}

String ProviderUtil::getEthDeviceNameByMAC(const String& mac) {
    EthPortDetailsFn details = gEthPortDetails.load(std::memory_order_acquire);
    Json::Value port;
    int rc = -1;
    if (details != nullptr)
        guardedCall(LibCall("getEthPortDetails", mac), [&] { rc = details(mac, port); });
    if (rc == 0) {
        const Json::Value& eth = jsonObject(port, "ethData");
        if (jsonHas(eth, "ethDev", Json::stringValue))
            return jsonString(eth, "ethDev");
    }
    TVRN_LOG(LL_ERR, "Unable to get Eth Device Name for %s", mac.c_str());
    return String();
}

}  // namespace CPTA
