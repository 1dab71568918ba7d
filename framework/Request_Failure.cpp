#include "framework/Request_Failure.h"

namespace CPTA {

namespace {

thread_local Request_Failure_Scope* tCurrent = nullptr;

}  // namespace

Request_Failure_Scope::Request_Failure_Scope() noexcept : _outer(tCurrent), _failed(false) {
    tCurrent = this;
}

Request_Failure_Scope::~Request_Failure_Scope() {
    tCurrent = _outer;
}

void note_request_failure(const char* message) noexcept {
    Request_Failure_Scope* scope = tCurrent;
    if (scope == nullptr || scope->_failed)
        return;
    scope->_failed = true;
    try {
        scope->_message = String(message != nullptr ? message : "");
    } catch (...) {
        // Out of memory: the request still fails, without its text.
    }
}

}  // namespace CPTA
