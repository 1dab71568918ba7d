// The exception through which the adapter management library (and the
// management RPC handlers) report a failed operation. Thrown by value and
// caught by reference. Shared with the adapter-library simulator, so it keeps
// default visibility: a catch in the module must match a throw in the library.
#ifndef CPTA_GATEWAY_HBAAGENTERROR_H
#define CPTA_GATEWAY_HBAAGENTERROR_H

#include <string>

namespace CPTA {

class __attribute__((visibility("default"))) HbaAgentError {
public:
    HbaAgentError(int code_, const std::string& message_) : code(code_), message(message_) {}

    int code;
    std::string message;
};

}  // namespace CPTA

#endif
