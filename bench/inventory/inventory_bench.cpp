// Enumeration of each inventory class through its dispatcher on the
// simulator's large-SAN host (12 adapters, 2 ports each, 64 targets per port
// with 16 LUNs). Reports instances per second, and per request the library
// calls and host look-ups made.
//
//   inventory_bench [--fixture=<name or path>] [--log-level=<level>] [benchmark options]
//
// Logging is off by default (a private home without .cimplerc); --log-level
// writes a .cimplerc with that level there (FATAL: configured, nothing written).
#include <benchmark/benchmark.h>

#include <stdlib.h>
#include <unistd.h>

#include <cstdio>
#include <cstring>
#include <string>
#include <vector>

#include "framework/Log.h"
#include "gateway/ProviderInit.h"
#include "gateway/ProviderUtil.h"
#include "inventory/FCHBAManager.h"
#include "inventory/InventoryCommon.h"
#include "simulator/SimControl.h"

using namespace CPTA;

namespace {

struct ClassCase {
    classId_t id;
    bool hdr;
};

const ClassCase kClasses[] = {
    {CID_COMPUTER_SYSTEM, false},
    {CID_PORT_CONTROLLER, false},
    {CID_FC_PORT, false},
    {CID_SCSI_PROTOCOL_ENDPOINT, false},
    {CID_FC_PORT_STATISTICS, false},
    {CID_PHYSICAL_PACKAGE, false},
    {CID_PRODUCT, false},
    {CID_ADAPTER_SOFTWARE_IDENTITY, false},
    {CID_ETHERNET_PORT, false},
    {CID_LOGICAL_PORT_GROUP, false},
    {CID_LAN_ENDPOINT, false},
    {CID_PHYSICAL_CONNECTOR, false},
    {CID_ALARM_DEVICE, false},
    {CID_STORAGE_EXTENT, true},
    {CID_TAPE_DRIVE, true},
    {CID_LOGICAL_DISK, true},
};

int gHostLookups = 0;
int countingHostName(char* name, size_t length) {
    gHostLookups++;
    return ::gethostname(name, length);
}
int systemDomainName(char* name, size_t length) {
    return ::getdomainname(name, length);
}
bool fixedAddress(const char*, std::vector<std::string>& addresses) {
    addresses = {"192.0.2.10"};
    return true;
}
// The host is named without the system resolver, whose speed is not ours.
const HostLookup kHost = {countingHostName, systemDomainName, fixedAddress};

void enumerate(benchmark::State& state, ClassCase c) {
    size_t instances = 0;
    const unsigned long long callsBefore = tvrn_sim_total_calls();
    gHostLookups = 0;
    for (auto _ : state) {
        Array<Instance*> got = c.hdr ? HDRManager::getHDRManager()->getInstances(c.id)
                                     : FCHBAManager::getFCHBAManager()->getInstances(c.id);
        instances += got.size();
        destroyInstances(got);
    }
    const double requests = double(state.iterations());
    state.SetItemsProcessed(int64_t(instances));
    state.counters["instances"] = double(instances) / requests;
    state.counters["lib_calls"] = double(tvrn_sim_total_calls() - callsBefore) / requests;
    state.counters["host_lookups"] = double(gHostLookups) / requests;
}

}  // namespace

int main(int argc, char** argv) {
    std::string fixture = "large-san";
    std::string logLevel;
    std::vector<char*> args;
    for (int i = 0; i < argc; i++) {
        if (std::strncmp(argv[i], "--fixture=", 10) == 0)
            fixture = argv[i] + 10;
        else if (std::strncmp(argv[i], "--log-level=", 12) == 0)
            logLevel = argv[i] + 12;
        else
            args.push_back(argv[i]);
    }
    int count = int(args.size());

    // A private home directory: no developer's .cimplerc applies.
    char home[] = "/tmp/tvrn-inv-bench-XXXXXX";
    if (mkdtemp(home) == nullptr) {
        std::perror("mkdtemp");
        return 1;
    }
    setenv("HOME", home, 1);
    const std::string rc = std::string(home) + "/.cimplerc";
    if (!logLevel.empty()) {
        if (FILE* f = std::fopen(rc.c_str(), "w")) {
            std::fprintf(f, "LOG_LEVEL=%s\n", logLevel.c_str());
            std::fclose(f);
        }
    }

    static ProviderInit init;  // binds the simulator linked into this program
    if (tvrn_sim_load_fixture(fixture.c_str()) != 0) {
        std::fprintf(stderr, "fixture %s: %s\n", fixture.c_str(), tvrn_sim_last_error());
        return 1;
    }
    ProviderUtil::setHostLookup(&kHost);

    for (const ClassCase& c : kClasses) {
        std::string name = "getInstances/" + std::string(ProviderUtil::getClassName(c.id).c_str());
        benchmark::RegisterBenchmark(name.c_str(), enumerate, c)->Unit(benchmark::kMillisecond);
    }
    benchmark::Initialize(&count, args.data());
    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
    close_log();
    for (const char* name : {"/.cimplerc", "/.cimple/messages", "/.cimple/messages.lock"})
        unlink((std::string(home) + name).c_str());
    rmdir((std::string(home) + "/.cimple").c_str());
    rmdir(home);
    return 0;
}
