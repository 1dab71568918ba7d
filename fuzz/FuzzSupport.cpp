#include "fuzz/FuzzSupport.h"

#include <stdlib.h>
#include <unistd.h>

#include <cstdio>

#include <vector>

#include "gateway/ProviderUtil.h"

namespace tvrnfuzz {

namespace {

int hostName(char* name, size_t length) {
    std::snprintf(name, length, "%s", "fuzzhost");
    return 0;
}

int domainName(char* name, size_t length) {
    std::snprintf(name, length, "%s", "example.test");
    return 0;
}

bool resolve(const char*, std::vector<std::string>& addresses) {
    addresses = {"10.20.30.40"};
    return true;
}

const CPTA::HostLookup kHost = {hostName, domainName, resolve};

}  // namespace

void privateHome() {
    static const bool done = [] {
        char pattern[] = "/tmp/tvrn-fuzz-XXXXXX";
        if (mkdtemp(pattern) == nullptr)
            return false;
        setenv("HOME", pattern, 1);
        static std::string home = pattern;
        std::atexit([] { rmdir(home.c_str()); });
        return true;
    }();
    (void)done;
}

void fixedHost() {
    CPTA::ProviderUtil::setHostLookup(&kHost);
}

}  // namespace tvrnfuzz
