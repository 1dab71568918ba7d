// ProviderUtil: the host's identity, as keys and object paths name it.
#include <arpa/inet.h>
#include <netdb.h>
#include <netinet/in.h>
#include <sys/utsname.h>
#include <unistd.h>

#include <atomic>
#include <cerrno>
#include <cstring>

#include "framework/Log.h"
#include "gateway/ProviderUtil.h"

namespace CPTA {

namespace {

const size_t kHostBufferSize = 255;

int systemHostName(char* name, size_t length) {
    return ::gethostname(name, length);
}

int systemDomainName(char* name, size_t length) {
    return ::getdomainname(name, length);
}

bool systemResolveIPv4(const char* name, std::vector<std::string>& addresses) {
    addrinfo hints{};
    hints.ai_family = AF_INET;
    hints.ai_socktype = SOCK_STREAM;  // one entry per address
    addrinfo* found = nullptr;
    if (::getaddrinfo(name, nullptr, &hints, &found) != 0)
        return false;
    for (addrinfo* ai = found; ai != nullptr; ai = ai->ai_next) {
        if (ai->ai_family != AF_INET || ai->ai_addrlen < sizeof(sockaddr_in))
            continue;
        char text[INET_ADDRSTRLEN] = {0};
        const sockaddr_in* sin = reinterpret_cast<const sockaddr_in*>(ai->ai_addr);
        if (::inet_ntop(AF_INET, &sin->sin_addr, text, sizeof(text)) != nullptr)
            addresses.push_back(text);
    }
    ::freeaddrinfo(found);
    return true;
}

const HostLookup kSystemLookup = {systemHostName, systemDomainName, systemResolveIPv4};
std::atomic<const HostLookup*> gHostLookup{nullptr};

const HostLookup& hostLookup() {
    const HostLookup* lookup = gHostLookup.load(std::memory_order_acquire);
    return lookup != nullptr ? *lookup : kSystemLookup;
}

// Reads the host name into a 256-byte buffer, always terminated.
bool readHostName(char (&name)[256]) {
    std::memset(name, 0, sizeof(name));
    if (hostLookup().hostName(name, sizeof(name) - 1) != 0)
        return false;
    name[sizeof(name) - 1] = '\0';
    return true;
}

void copyOut(char* hostString, size_t length, const char* text) {
    if (hostString != nullptr && length > 0)
        strlcpy(hostString, text, length);
}

}  // namespace

void ProviderUtil::setHostLookup(const HostLookup* lookup) {
    gHostLookup.store(lookup, std::memory_order_release);
}

int ProviderUtil::getHostInfo(char* hostString, size_t length) {
    char name[256];
    if (!readHostName(name)) {
        copyOut(hostString, length, "localhost");
        TVRN_LOG(LL_INFO, "gethostname() FAILED. hostString will be filled with localhost");
        return 3;
    }

    std::vector<std::string> addresses;
    if (!hostLookup().resolveIPv4(name, addresses) || addresses.empty()) {
        copyOut(hostString, length, name);
        TVRN_LOG(LL_INFO,
                 "gethostbyname() FAILED. hostString will have hostname instead of ipAddress");
        return 2;
    }
    for (const std::string& address : addresses) {
        if (address.compare(0, 3, "127") != 0) {
            copyOut(hostString, length, address.c_str());
            return 0;
        }
    }

    // Only loopback addresses: name the host by its name.
    copyOut(hostString, length, name);
    if (!readHostName(name)) {
        TVRN_LOG(LL_INFO, "gethostname() failed");
        return 2;
    }
    char domain[256] = {0};
    if (hostLookup().domainName(domain, sizeof(domain) - 1) != 0) {
        TVRN_LOG(LL_INFO, "getdomainname() failed");
        return 2;
    }
    copyOut(hostString, length, name);
    TVRN_LOG(LL_INFO, "gethostbyname() FAILED. hostString will have hostname instead of ipAddress");
    return 2;
}

String ProviderUtil::getHostName() {
    struct utsname info;
    String name;
    if (::uname(&info) != 0) {
        TVRN_LOG(LL_ERR, "uname() returned error = %d", errno);
        name = "localhost";
    } else {
        name = info.nodename;
    }
    TVRN_LOG(LL_INFO, "Host Name: %s", name.c_str());
    return name;
}

String ProviderUtil::updateNamespacePath(const String& className) {
    char host[kHostBufferSize];
    std::memset(host, 0, sizeof(host));
    getHostInfo(host, sizeof(host));
    return namespacePath(host, className);
}

String ProviderUtil::namespacePath(const char* host, const String& className) {
    String path("//", host, "/");
    path.append(NAMESPACE);
    path.append(':');
    path.append(className);
    return path;
}

}  // namespace CPTA
