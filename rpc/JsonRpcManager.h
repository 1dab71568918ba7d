// The JSON-RPC 1.1 dispatcher behind TAVRIN_AgentService.executeMethod.
//
// A request is a JSON object {"version": ..., "id": ..., "method": "<name>",
// "params": [...]}. process() parses it, runs the method registered under the
// name and writes the response object, styled (indented, one member per line):
//
//   "version"  always "1.1"
//   "id"       a copy of the request's "id", when it has one
//   "result"   what the method produced, when it succeeded
//   "error"    {"name", "code", "message"} otherwise:
//                "JSONRPCError"     105   "Procedure not found" (no such method)
//                "USERDEFINEDError" code  message  (an HbaAgentError: the
//                                   library's own, or 51, 54, 55 of RpcErrors.h)
//                "JSONRPCError"     200   what() of any other std::exception
//                "UnCaughtError"    5000  "Unknown error that was not caught"
//              or the "error" member of a result object (the library's
//              failure answer), moved out of the result.
//
// Text that is not JSON (or nests deeper than kMaxNesting) is answered with
// status 500 and the text kParseFailure followed by the parser's messages
// instead of a JSON response. A request that is JSON but not an object is
// answered with error 55. Nothing throws out of process().
//
// The one dispatcher is built completely, with every method, by the first
// instance() call; concurrent first callers wait for it. Afterwards its
// table is only read, so any number of threads may call process() at once.
#ifndef CPTA_RPC_JSONRPCMANAGER_H
#define CPTA_RPC_JSONRPCMANAGER_H

#include <functional>
#include <map>
#include <string>
#include <vector>

#include <json/json.h>

#include "framework/Property.h"
#include "framework/String.h"

namespace CPTA {

class JsonRpcManager {
public:
    // Fills `result` from `params`; reports failure by throwing.
    typedef std::function<void(const Json::Value& params, Json::Value& result)> Handler;

    struct response {
        std::string body;
        int status = 0;  // 200: a JSON response; 500: the request could not be parsed
    };

    static constexpr int kMaxNesting = 64;
    static const char kParseFailure[];

    static JsonRpcManager* instance();

    // Stores `handler` under `name`, replacing one stored before. Only for
    // filling a dispatcher before it is published. With `secret` the params
    // of its requests and the results of its responses are never logged.
    void _registerMethod(const std::string& name, Handler handler, bool secret = false);

    // The registered names in byte order.
    std::vector<std::string> getMethods() const;

    void process(const std::string& request, response& out) const noexcept;

    // The extrinsic method: the response text for one request text (an absent
    // request counts as empty text). Logs the request and the response at DBG,
    // with secrets masked.
    static String executeMethod(const Property<String>& request) noexcept;

    // Whether the request text names a method registered as secret.
    bool isSecret(const std::string& request) const;

    // The text of a request or response as it may be logged: compact, with
    // the values of secret-looking members masked, and with `secret` (a
    // request or response of a secret method) its "params" and "result"
    // masked whole; text that is not JSON is described, not quoted.
    std::string loggable(const std::string& text, bool secret) const;

private:
    struct Method {
        Handler handler;
        bool secret;
    };

    JsonRpcManager() = default;
    const Method* find(const Json::Value* name) const;
    void dispatch(const Json::Value& request, Json::Value& reply) const;

    std::map<std::string, Method> _methods;
};

}  // namespace CPTA

#endif
