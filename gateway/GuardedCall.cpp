#include "gateway/GuardedCall.h"

#include <cstring>

#include "framework/Log.h"

namespace CPTA {

namespace {

// __builtin_FILE() gives the path the compiler was handed; log the file name.
const char* baseName(const char* path) {
    if (path == nullptr)
        return "";
    const char* slash = std::strrchr(path, '/');
    return slash != nullptr ? slash + 1 : path;
}

}  // namespace

void LibCall::userException(const HbaAgentError& e) const noexcept {
    const char* file = baseName(_file);
    if (_hasKey)
        log(LL_ERR, file, _line, "%s - %s got User exception %d: %s", _key.c_str(), _pointer,
            e.code, e.message.c_str());
    else
        log(LL_ERR, file, _line, "%s got User exception %d: %s", _pointer, e.code,
            e.message.c_str());
}

void LibCall::stdException(const std::exception& e) const noexcept {
    const char* file = baseName(_file);
    const char* what = e.what();
    if (what == nullptr)
        what = "";
    if (_hasKey)
        log(LL_ERR, file, _line, "%s - %s got std exception: %s", _key.c_str(), _pointer, what);
    else
        log(LL_ERR, file, _line, "%s got std exception: %s", _pointer, what);
}

void LibCall::defaultException() const noexcept {
    const char* file = baseName(_file);
    if (!_hasKey)
        log(LL_ERR, file, _line, "%s got default exception", _pointer);
    else if (_wording == KEY_AFTER_DEFAULT)
        log(LL_ERR, file, _line, "%s got default exception for %s", _pointer, _key.c_str());
    else
        log(LL_ERR, file, _line, "%s - %s got default exception", _key.c_str(), _pointer);
}

}  // namespace CPTA
