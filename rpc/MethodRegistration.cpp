#include "rpc/MethodRegistration.h"

#include "rpc/ProviderDiscoveryMethods.h"

namespace CPTA {

void MethodRegistration::registerMethods(JsonRpcManager& rpc) {
    ProviderDiscoveryMethods::registerMethods(rpc);
}

}  // namespace CPTA
