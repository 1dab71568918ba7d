// The failures a management method reports besides the library's own: thrown
// by value, and answered by the dispatcher as "USERDEFINEDError" objects with
// the code and message below.
#ifndef CPTA_RPC_RPCERRORS_H
#define CPTA_RPC_RPCERRORS_H

#include "gateway/HbaAgentError.h"

namespace CPTA {

// The params hold another number of values than the method takes.
class ErrorParamMismatch : public HbaAgentError {
public:
    ErrorParamMismatch() : HbaAgentError(51, "Mismatch in number of parameters.") {}
};

// A value that must be a JSON array is not one.
class ErrorBadJsonArray : public HbaAgentError {
public:
    ErrorBadJsonArray() : HbaAgentError(54, "Not a JSON array format.") {}
};

// A value that must be a JSON object is not one (or lacks what it must hold).
class ErrorBadJsonObject : public HbaAgentError {
public:
    ErrorBadJsonObject() : HbaAgentError(55, "Not a JSON Object format.") {}
};

}  // namespace CPTA

#endif
