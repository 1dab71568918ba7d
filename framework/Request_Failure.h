// Failures that a request must report although the code that met them could
// not return them.
//
// The inventory walks keep every library exception inside the module (no
// exception may cross the C boundary), so the walk that met one returns what
// it can: nothing. Its caller cannot tell that from "no such objects", yet the
// data of the request is lost. The walk therefore notes the failure here, and
// the CMPI entry frame, which opens a Request_Failure_Scope around every
// request, ends a request that noted one with CMPI_RC_ERR_FAILED and the
// note's text, whatever the provider answered.
//
// Scopes nest (an up-call served by the module opens its own); a note goes to
// the innermost scope of the calling thread and the first note of a scope is
// kept. Outside any scope (diagnostic worker threads, tests of the helpers) a
// note does nothing.
#ifndef CPTA_FRAMEWORK_REQUEST_FAILURE_H
#define CPTA_FRAMEWORK_REQUEST_FAILURE_H

#include "framework/String.h"

namespace CPTA {

class Request_Failure_Scope {
public:
    Request_Failure_Scope() noexcept;
    ~Request_Failure_Scope();

    Request_Failure_Scope(const Request_Failure_Scope&) = delete;
    Request_Failure_Scope& operator=(const Request_Failure_Scope&) = delete;

    bool failed() const { return _failed; }
    // The text of the first note ("" when none).
    const String& message() const { return _message; }

private:
    friend void note_request_failure(const char* message) noexcept;

    Request_Failure_Scope* _outer;
    bool _failed;
    String _message;
};

// Notes that the calling thread's request lost data and must fail.
void note_request_failure(const char* message) noexcept;

}  // namespace CPTA

#endif
