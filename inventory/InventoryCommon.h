// What the inventory helpers share: an owning list of built instances, the
// shield that keeps library exceptions inside a walk, the CIM key and state
// rules common to several classes, and the adapter list. (Text and address
// helpers are ProviderUtil's, JSON helpers gateway/JsonAccess.h's.)
#ifndef CPTA_INVENTORY_INVENTORYCOMMON_H
#define CPTA_INVENTORY_INVENTORYCOMMON_H

#include <cstddef>
#include <exception>
#include <initializer_list>
#include <utility>

#include <json/json.h>

#include "framework/Array.h"
#include "framework/Instance.h"
#include "framework/Log.h"
#include "framework/String.h"
#include "gateway/HbaAgentError.h"
#include "inventory/HostIdentityScope.h"

namespace CPTA {

// Destroys every instance of the array and empties it.
void destroyInstances(Array<Instance*>& instances);

// The instances built so far by one walk. Whatever has not been released is
// destroyed with the list, so a walk that ends early (an exception) leaks
// nothing.
class InstanceList {
public:
    InstanceList() = default;
    ~InstanceList() { destroyInstances(_items); }
    InstanceList(const InstanceList&) = delete;
    InstanceList& operator=(const InstanceList&) = delete;

    // Takes over one instance; null (a builder that ran out of memory) is ignored.
    void add(Instance* instance);
    // Takes over every instance of `instances`, which is left empty.
    void take(Array<Instance*>& instances);
    size_t size() const { return _items.size(); }
    // Hands the instances to the caller.
    Array<Instance*> release();

private:
    Array<Instance*> _items;
};

// Runs one walk of the inventory: opens the request's host scope, lets `fill`
// add instances to a list and returns them. Library calls that are not
// guarded may throw; the exception ends the walk here: it is logged with the
// operation's name, whatever was built is destroyed, the result is empty and
// the request is noted as failed (framework/Request_Failure.h), so that the
// client gets CMPI_RC_ERR_FAILED with the logged text rather than a short
// answer.
void logWalkException(const char* operation, const HbaAgentError* user,
                      const std::exception* stdError);

template <class Fill>
Array<Instance*> runWalk(const char* operation, Fill&& fill) noexcept {
    HostIdentityScope scope;
    try {
        InstanceList list;
        std::forward<Fill>(fill)(list);
        return list.release();
    } catch (const HbaAgentError& e) {
        logWalkException(operation, &e, nullptr);
    } catch (const std::exception& e) {
        logWalkException(operation, nullptr, &e);
    } catch (...) {
        logWalkException(operation, nullptr, nullptr);
    }
    return Array<Instance*>();
}

// ---- values ---------------------------------------------------------------------

template <class T>
Array<T> arrayOf(std::initializer_list<T> values) {
    return Array<T>(values.begin(), values.size());
}

inline Array<String> stringsOf(std::initializer_list<const char*> values) {
    Array<String> out;
    for (const char* v : values)
        out.append(String(v));
    return out;
}

// CIM EnabledState of a port's CIM operational status.
uint16 enabledStateOf(long long portState);

// The keys of a device of this host: SystemCreationClassName, SystemName,
// CreationClassName and DeviceID.
template <class C>
void setDeviceKeys(C* instance, const char* className, const String& hostName,
                   const String& deviceId) {
    instance->SystemCreationClassName.set(String("TAVRIN_ComputerSystem"));
    instance->SystemName.set(hostName);
    instance->CreationClassName.set(String(className));
    instance->DeviceID.set(deviceId);
}

// The system keys of an endpoint of this host (its Name is set apart).
template <class C>
void setEndpointKeys(C* instance, const char* className, const String& hostName) {
    instance->SystemCreationClassName.set(String("TAVRIN_ComputerSystem"));
    instance->SystemName.set(hostName);
    instance->CreationClassName.set(String(className));
}

// ---- the adapter list ---------------------------------------------------------

// Asks the library for the adapters (a plain call: an exception reaches the
// caller). Returns the number of adapters, logging "Number of Adapters: %d"
// when asked to, or -1 after "libGetAllAdaptersIndexString returns NULL.";
// `answer` keeps the list.
int listAdapters(Json::Value& answer, bool logCount);
// Key of adapter `number` (from 1) of such a list; "" when the entry is not text.
String adapterKeyAt(const Json::Value& answer, int number);

// The key, as the adapter list gives it, of the adapter that owns the port
// `portKey` (WWN or MAC, with or without colons): one question about the port
// and one reading of the list. "" when no adapter owns it or the library
// cannot say. The question about the port is a guarded call; the list is read
// as listAdapters reads it.
String owningAdapterKey(const String& portKey);

// Calls visit(number, key) for every adapter of the library's list, in
// adapter order; an empty list logs `noAdapters` (WARN).
template <class Visit>
void forEachAdapter(const char* noAdapters, bool logCount, Visit&& visit) {
    Json::Value adapters;
    const int count = listAdapters(adapters, logCount);
    if (count == 0)
        TVRN_LOG(LL_WARN, "%s", noAdapters);
    for (int number = 1; number <= count; number++)
        visit(number, adapterKeyAt(adapters, number));
}

// ---- remote ports ---------------------------------------------------------------

// Asks for the remote ports seen through the local port `portId` (colon-free)
// and leaves in `request` the request that names them, ready for a
// "rPortWwn". False (after "libGetAllRemotePorts returns NULL.") when the
// answer is not a list.
bool listRemotePorts(const String& portId, Json::Value& request, Json::Value& remotePorts);
// The same when only the remote port `remoteWwn` (colon-free; "" every one)
// is wanted: the list then names just that port, without asking the library,
// which is asked about it next anyway.
bool listRemotePorts(const String& portId, const String& remoteWwn, Json::Value& request,
                     Json::Value& remotePorts);
// The WWN of a remote port as the list spelled it, or, for a port named
// alone, as the library's complete record of it spells it (when it does).
String remotePortWwn(const Json::Value& listed, const Json::Value& record);

}  // namespace CPTA

#endif
