// The guarded library call.
//
// A call into the adapter library may throw HbaAgentError, a std::exception or
// anything else. Code that reads one adapter, port or optic (and the
// diagnostic threads) runs the call through guardedCall, which catches all
// three, logs one ERR line naming the entry point and the object asked about,
// and reports failure; no exception leaves it.
//
//   Json::Value answer;
//   if (!guardedCall(LibCall("libGetHbaByWwn", key), libGetHbaByWwn, request, answer))
//       return -1;
//
//   if (!guardedCall(LibCall("libStartTests"), [&] { answer = libStartTests(request); }))
//       return -1;
//
// Log lines (with a key K; without one the leading "K - " is dropped):
//   "K - libX got User exception <code>: <message>"
//   "K - libX got std exception: <what>"
//   "K - libX got default exception"    or, with KEY_AFTER_DEFAULT,
//   "libX got default exception for K"
// The line is attributed to the source file and line that built the LibCall.
#ifndef CPTA_GATEWAY_GUARDEDCALL_H
#define CPTA_GATEWAY_GUARDEDCALL_H

#include <exception>
#include <utility>

#include <json/json.h>

#include "framework/String.h"
#include "gateway/CIMProviderTfaj.h"
#include "gateway/HbaAgentError.h"

namespace CPTA {

// Names one guarded call for its failure messages.
class LibCall {
public:
    enum Wording {
        KEY_FIRST,          // "K - libX got default exception"
        KEY_AFTER_DEFAULT,  // "libX got default exception for K"
    };

    // A call about no particular object. (The trailing parameters record the
    // caller's position for the log line; leave them to their defaults.)
    explicit LibCall(const char* pointer, int line = __builtin_LINE(),
                     const char* file = __builtin_FILE())
        : _pointer(pointer), _hasKey(false), _wording(KEY_FIRST), _file(file), _line(line) {}

    // A call about the object named by `key` (a WWN, MAC or index string).
    LibCall(const char* pointer, const String& key, Wording wording = KEY_FIRST,
            int line = __builtin_LINE(), const char* file = __builtin_FILE())
        : _pointer(pointer),
          _key(key),
          _hasKey(true),
          _wording(wording),
          _file(file),
          _line(line) {}

    LibCall(const char* pointer, const char* key, Wording wording = KEY_FIRST,
            int line = __builtin_LINE(), const char* file = __builtin_FILE())
        : LibCall(pointer, String(key), wording, line, file) {}

    // The three failure reports.
    void userException(const HbaAgentError& e) const noexcept;
    void stdException(const std::exception& e) const noexcept;
    void defaultException() const noexcept;

private:
    const char* _pointer;
    String _key;
    bool _hasKey;
    Wording _wording;
    const char* _file;
    int _line;
};

// Runs fn(); true when it returned, false (after logging) when it threw.
template <typename Fn>
bool guardedCall(const LibCall& call, Fn&& fn) noexcept {
    try {
        std::forward<Fn>(fn)();
        return true;
    } catch (const HbaAgentError& e) {
        call.userException(e);
    } catch (const std::exception& e) {
        call.stdException(e);
    } catch (...) {
        call.defaultException();
    }
    return false;
}

// The common case: answer = fp(request). On failure `answer` is left as it was.
inline bool guardedCall(const LibCall& call, JsonReqFP fp, const Json::Value& request,
                        Json::Value& answer) noexcept {
    return guardedCall(call, [&] { answer = fp(request); });
}

}  // namespace CPTA

#endif
