#include "inventory/CommonHelper.h"

#include <cstring>

#include "framework/Log.h"
#include "gateway/ProviderUtil.h"
#include "inventory/InventoryCommon.h"
#include "schema/generated/TAVRIN_ComputerSystem.h"

namespace CPTA {

namespace {

const int kHostIsAddress = 0;
const int kHostIsLocalhost = 3;

}  // namespace

CommonHelper* CommonHelper::getCommonHelperObject() {
    static CommonHelper instance;
    return &instance;
}

Array<Instance*> CommonHelper::getComputerSystemInstances(classId_t classId) {
    return runWalk("CommonHelper::getComputerSystemInstances", [&](InstanceList& out) {
        TVRN_LOG(LL_DBG, "Entering: %s", "getComputerSystemInstances");
        TAVRIN_ComputerSystem* cs = create<TAVRIN_ComputerSystem>(true);
        out.add(cs);
        if (cs == nullptr)
            return;
        char host[255];
        std::memset(host, 0, sizeof(host));
        const int kind = HostIdentityScope::hostInfo(host, sizeof(host));
        const String hostText(host);
        cs->Name.set(hostText);
        const bool address = kind == kHostIsAddress;
        cs->NameFormat.set(String(address ? "IP" : "Other"));
        Array<String> info;
        info.append(hostText);
        cs->OtherIdentifyingInfo.set(info);
        cs->IdentifyingDescriptions.set(
            stringsOf({address ? "Ipv4 Address" : "Fully Qualified Domain Name"}));
        if (kind == kHostIsLocalhost)
            TVRN_LOG(LL_WARN,
                     "No host IP / Name  retrived in the function, So function fills "
                     "localhost for host info.");
        cs->CreationClassName.set(ProviderUtil::getClassName(classId));
        const String text("The host with Tavrin's adapters installed.");
        cs->ElementName.set(text);
        cs->Description.set(text);
        cs->Caption.set(text);
        cs->Dedicated.set(arrayOf<uint16>({0, 14}));
        cs->OperationalStatus.set(arrayOf<uint16>({2}));
        cs->StatusDescriptions.set(stringsOf({"The System is in service"}));
        TVRN_LOG(LL_DBG, "Returning: %s", "getComputerSystemInstances");
    });
}

}  // namespace CPTA
