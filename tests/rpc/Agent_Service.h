// executeMethod of the module's agent service, for the tunnel's end-to-end
// tests and benchmark.
#ifndef TVRN_TESTS_RPC_AGENT_SERVICE_H
#define TVRN_TESTS_RPC_AGENT_SERVICE_H

#include <string>

#include "tests/e2e/Module_Session.h"

namespace tvrne2e {

// The agent service as a client finds it: its one instance; an empty path
// when there is none.
inline ObjectPath agentService(Module_Session& s) {
    const Result<ObjectPath> names = s.enumerateNames("TAVRIN_AgentService");
    return names.ok() && names.items.size() == 1 ? names.items.front() : ObjectPath();
}

// executeMethod with `request` (none when null) on the agent service.
inline MethodResult executeMethod(Module_Session& s, const ObjectPath& agent,
                                  const std::string* request) {
    PropertyVector in;
    if (request != nullptr)
        in.push_back(tvrnhost::Property{"request", tvrnhost::Value::string(*request)});
    return s.invoke(agent, "executeMethod", in);
}

// The "response" text of a call, or what went wrong.
inline std::string responseOf(const MethodResult& r) {
    const tvrnhost::Value* response = tvrnhost::findProperty(r.out, "response");
    if (!r.ok() || response == nullptr || response->isNull())
        return "<no response: " + r.toString() + ">";
    return response->asString();
}

}  // namespace tvrne2e

#endif
