#include "inventory/HostIdentityScope.h"

#include <cstring>

#include "gateway/ProviderUtil.h"

namespace CPTA {

namespace {

// Large enough for any answer of getHostInfo (a host name is at most 255
// bytes), so a cached answer can be handed out to a buffer of any size with
// the same cut-off getHostInfo itself would apply.
const size_t kHostTextSize = 256;

struct ThreadHost {
    unsigned depth = 0;
    bool resolved = false;
    int kind = 0;
    char text[kHostTextSize] = {0};
};

thread_local ThreadHost tHost;

}  // namespace

HostIdentityScope::HostIdentityScope() noexcept {
    tHost.depth++;
}

HostIdentityScope::~HostIdentityScope() {
    if (--tHost.depth == 0) {
        tHost.resolved = false;
        tHost.text[0] = '\0';
    }
}

bool HostIdentityScope::active() {
    return tHost.depth > 0;
}

int HostIdentityScope::hostInfo(char* hostString, size_t length) {
    if (tHost.depth == 0)
        return ProviderUtil::getHostInfo(hostString, length);
    if (!tHost.resolved) {
        std::memset(tHost.text, 0, sizeof(tHost.text));
        tHost.kind = ProviderUtil::getHostInfo(tHost.text, sizeof(tHost.text));
        tHost.text[sizeof(tHost.text) - 1] = '\0';
        tHost.resolved = true;
    }
    if (hostString != nullptr && length > 0)
        strlcpy(hostString, tHost.text, length);
    return tHost.kind;
}

String HostIdentityScope::hostText() {
    // The same 255-byte buffer every SystemName has always been read into.
    char host[255];
    std::memset(host, 0, sizeof(host));
    hostInfo(host, sizeof(host));
    return String(host);
}

}  // namespace CPTA
