#include "inventory/InventoryCommon.h"

#include <cstdio>
#include <vector>

#include "framework/Request_Failure.h"
#include "gateway/CIMProviderTfaj.h"
#include "gateway/GuardedCall.h"
#include "gateway/JsonAccess.h"
#include "gateway/ProviderUtil.h"

namespace CPTA {

void destroyInstances(Array<Instance*>& instances) {
    for (size_t i = 0; i < instances.size(); i++)
        destroy(instances[i]);
    instances.clear();
}

void InstanceList::add(Instance* instance) {
    if (instance == nullptr)
        return;
    try {
        _items.append(instance);
    } catch (...) {
        destroy(instance);
        throw;
    }
}

void InstanceList::take(Array<Instance*>& instances) {
    try {
        _items.append(instances.data(), instances.size());
    } catch (...) {
        destroyInstances(instances);
        throw;
    }
    instances.clear();
}

Array<Instance*> InstanceList::release() {
    Array<Instance*> out;
    out.swap(_items);
    return out;
}

void logWalkException(const char* operation, const HbaAgentError* user,
                      const std::exception* stdError) {
    // The walk's data is lost: the request must fail, with the text logged.
    char text[512];
    if (user != nullptr)
        std::snprintf(text, sizeof text, "%s ended by User exception %d: %s", operation, user->code,
                      user->message.c_str());
    else if (stdError != nullptr)
        std::snprintf(text, sizeof text, "%s ended by std exception: %s", operation,
                      stdError->what());
    else
        std::snprintf(text, sizeof text, "%s ended by default exception", operation);
    TVRN_LOG(LL_ERR, "%s", text);
    note_request_failure(text);
}

uint16 enabledStateOf(long long portState) {
    switch (portState) {
        case 8: return 9;
        case 9: return 4;
        case 10: return 3;
        case 11: return 2;
        case 13: return 6;
        default: return 1;
    }
}

int listAdapters(Json::Value& answer, bool logCount) {
    answer = libGetAllAdaptersIndexString(Json::Value());
    if (!ProviderUtil::isValidJsonResponse(answer) ||
        !jsonHas(answer, "indexStrings", Json::arrayValue)) {
        TVRN_LOG(LL_ERR, "libGetAllAdaptersIndexString returns NULL.");
        return -1;
    }
    int count = int(jsonArray(answer, "indexStrings").size());
    if (logCount)
        TVRN_LOG(LL_INFO, "Number of Adapters: %d", count);
    return count;
}

String adapterKeyAt(const Json::Value& answer, int number) {
    const Json::Value& keys = jsonArray(answer, "indexStrings");
    if (number < 1 || Json::ArrayIndex(number) > keys.size())
        return String();
    return jsonAsString(keys[Json::ArrayIndex(number - 1)]);
}

String owningAdapterKey(const String& portKey) {
    Json::Value answer;
    if (!guardedCall(LibCall("libGetAdapterIdByPort", portKey), libGetAdapterIdByPort,
                     keyRequest("indexStr", ProviderUtil::getIndexInColonFormat(portKey)), answer))
        return String();
    const Json::Value* id = jsonMember(answer, "adapterId");
    if (!ProviderUtil::isValidJsonResponse(answer) || id == nullptr || !id->isUInt()) {
        TVRN_LOG(LL_ERR, "libGetAdapterIdByPort returns NULL.");
        return String();
    }
    if (id->asUInt() == 0)
        return String();
    Json::Value adapters;
    if (listAdapters(adapters, false) < int(id->asUInt()))
        return String();
    return adapterKeyAt(adapters, int(id->asUInt()));
}

namespace {

// A request about the remote ports of the local port `portId`.
Json::Value remotePortRequest(const String& portId) {
    const Json::Value colonId = jsonText(ProviderUtil::getIndexInColonFormat(portId));
    Json::Value request(Json::objectValue);
    request["pPortWwn"] = colonId;
    request["lPortWwn"] = colonId;
    return request;
}

}  // namespace

bool listRemotePorts(const String& portId, Json::Value& request, Json::Value& remotePorts) {
    request = remotePortRequest(portId);
    guardedCall(LibCall("libGetAllRemotePorts"), libGetAllRemotePorts, request, remotePorts);
    if (!ProviderUtil::isValidJsonResponse(remotePorts) || !remotePorts.isArray()) {
        TVRN_LOG(LL_ERR, "libGetAllRemotePorts returns NULL.");
        return false;
    }
    return true;
}

bool listRemotePorts(const String& portId, const String& remoteWwn, Json::Value& request,
                     Json::Value& remotePorts) {
    if (remoteWwn.size() == 0)
        return listRemotePorts(portId, request, remotePorts);
    request = remotePortRequest(portId);
    remotePorts = Json::Value(Json::arrayValue);
    Json::Value named(Json::objectValue);
    named["remotePortWwn"] = jsonText(ProviderUtil::getIndexInColonFormat(remoteWwn));
    named["named"] = true;
    remotePorts.append(named);
    return true;
}

String remotePortWwn(const Json::Value& listed, const Json::Value& record) {
    const String asListed = jsonString(listed, "remotePortWwn");
    if (!jsonHas(listed, "named", Json::booleanValue) ||
        !jsonHas(record, "remotePortWwn", Json::stringValue))
        return asListed;
    const String asRecorded = jsonString(record, "remotePortWwn");
    return ProviderUtil::eraseColonsFromIndex(asRecorded)
                   .equali(ProviderUtil::eraseColonsFromIndex(asListed))
               ? asRecorded
               : asListed;
}

}  // namespace CPTA
