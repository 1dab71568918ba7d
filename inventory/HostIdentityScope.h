// The host's identity, resolved once per request.
//
// Every instance the inventory builds carries the host text of
// ProviderUtil::getHostInfo in its SystemName (or Name) key. Resolving it
// means a host-name read and a resolver look-up, which would otherwise be
// repeated for every adapter, port and LUN of a request. A request therefore
// opens a HostIdentityScope on its thread (the dispatchers do, and so may a
// provider that asks several dispatchers in one request); inside it the first
// hostInfo() resolves the host and later calls reuse the answer. Scopes nest:
// an inner scope joins the outer one, and the answer is forgotten when the
// outermost scope closes, so the next request resolves afresh.
//
// Outside any scope hostInfo() is exactly ProviderUtil::getHostInfo.
#ifndef CPTA_INVENTORY_HOSTIDENTITYSCOPE_H
#define CPTA_INVENTORY_HOSTIDENTITYSCOPE_H

#include <cstddef>

#include "framework/String.h"

namespace CPTA {

class HostIdentityScope {
public:
    HostIdentityScope() noexcept;
    ~HostIdentityScope();

    HostIdentityScope(const HostIdentityScope&) = delete;
    HostIdentityScope& operator=(const HostIdentityScope&) = delete;

    // As ProviderUtil::getHostInfo: fills hostString (at most `length` bytes,
    // NUL included) and returns 0 (an address), 2 (the host name) or 3
    // ("localhost").
    static int hostInfo(char* hostString, size_t length);
    // The host text alone.
    static String hostText();
    // Whether the calling thread is inside a scope.
    static bool active();
};

}  // namespace CPTA

#endif
