// Fills a dispatcher with every management method (ProviderDiscoveryMethods).
#ifndef CPTA_RPC_METHODREGISTRATION_H
#define CPTA_RPC_METHODREGISTRATION_H

namespace CPTA {

class JsonRpcManager;

class MethodRegistration {
public:
    // Called once, by JsonRpcManager::instance(), on the dispatcher it is
    // building.
    static void registerMethods(JsonRpcManager& rpc);
};

}  // namespace CPTA

#endif
