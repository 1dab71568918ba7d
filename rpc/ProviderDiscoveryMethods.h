// The management methods behind the JSON-RPC tunnel: 123 names, grouped by
// prefix ("discovery." reads, "configuration." changes and resets,
// "diagnostics." tests), each turning the positional "params" array into one
// request object for an entry point of the adapter management library and
// handing back the library's answer as the call's result.
//
// One table row per name states the parameter shape, the entry point and the
// request members; code stands only where a method does more than one call
// (look-ups over all adapters, several targets, aliases, port resets) or
// checks what the table cannot say. Failures are thrown: ErrorParamMismatch
// (51) for a wrong number of params, ErrorBadJsonArray (54) /
// ErrorBadJsonObject (55) for a param of the wrong JSON type, a
// std::runtime_error when the library gives no answer, and whatever the
// library throws. A library answer that is an object with an "error" member
// becomes the result, and the dispatcher reports that member.
#ifndef CPTA_RPC_PROVIDERDISCOVERYMETHODS_H
#define CPTA_RPC_PROVIDERDISCOVERYMETHODS_H

#include <cstddef>

#include "rpc/JsonRpcManager.h"

namespace CPTA {

class ProviderDiscoveryMethods {
public:
    // Registers every method, in table order.
    static void registerMethods(JsonRpcManager& rpc);

    // The namespace in which the CIM server keeps the hypervisor's computer
    // system, which names the host's maker when the library cannot.
    static const char kHypervisorNameSpace[];
};

}  // namespace CPTA

#endif
