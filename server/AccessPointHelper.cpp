#include "server/AccessPointHelper.h"

#include <cstring>
#include <string>

#include "framework/Log.h"
#include "gateway/ProviderUtil.h"
#include "inventory/InventoryCommon.h"
#include "schema/generated/TAVRIN_RemoteServiceAccessPoint.h"

namespace CPTA {

namespace {

const int kHostIsLocalhost = 3;
const uint16 kInfoFormatUrl = 200;

}  // namespace

AccessPointHelper* AccessPointHelper::getAccessPointHelperInstance() {
    static AccessPointHelper instance;
    return &instance;
}

Array<Instance*> AccessPointHelper::getInstancesByClass(classId_t) {
    return runWalk("AccessPointHelper::getInstancesByClass", [&](InstanceList& out) {
        TVRN_LOG(LL_DBG, "Entering: %s", "getInstancesByClass");
        char host[255];
        std::memset(host, 0, sizeof(host));
        if (HostIdentityScope::hostInfo(host, sizeof(host)) == kHostIsLocalhost) {
            TVRN_LOG(LL_WARN, "getHostInfo returned localhost");
        } else {
            _adapterData adapter;
            adapter.hostName = host;
            out.add(getRemoteServiceAccessPointInstance(adapter));
            if (out.size() != 0)
                TVRN_LOG(LL_INFO, "Number of instances: %d", int(out.size()));
        }
        TVRN_LOG(LL_DBG, "Returning: %s", "getInstancesByClass");
    });
}

Instance* AccessPointHelper::getRemoteServiceAccessPointInstance(_adapterData adapter) {
    const int port = ProviderUtil::getAgentPort();
    if (port == 0) {
        TVRN_LOG(LL_WARN, "The MDC Agent is not running so no service available");
        return nullptr;
    }
    auto* sap = create<TAVRIN_RemoteServiceAccessPoint>(true);
    if (sap == nullptr)
        return nullptr;
    setEndpointKeys(sap, "TAVRIN_RemoteServiceAccessPoint", adapter.hostName);
    sap->Name.set(String("MDC Service"));
    sap->ElementName.set(String("Meridel Console Service Access Point"));
    String url("https://", adapter.hostName.c_str(), ":");
    url.append(std::to_string(port).c_str());
    url.append("/index.html");
    sap->AccessInfo.set(url);
    sap->InfoFormat.set(kInfoFormatUrl);
    return sap;
}

}  // namespace CPTA
