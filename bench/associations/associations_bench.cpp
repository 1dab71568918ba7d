// Each inventory association enumerated as a CIM server asks for it (through
// the embedded host and the CMPI binding into the real module) on two SANs
// that the simulator generates: "small" (2 FC HBAs and a CNA, 2 ports each,
// 32 targets per port of which 4 are tape, 16 LUNs each, 2 remote
// initiators per port) and "large", four times as many adapters and so four
// times every set. An association that pairs by looking its partners up costs
// the same per instance delivered on both; one that scanned its sets for every
// pair would cost 4 to 64 times as much per instance on the large SAN.
//
// Reports per request the instances delivered, the library calls and the time
// per delivered instance (per_instance), and at the end, per association, the
// time per instance on both SANs and their ratio.
//
//   LD_LIBRARY_PATH=build/lib/sim build/bin/associations_bench [benchmark options]
#include <benchmark/benchmark.h>

#include <chrono>
#include <cstdio>
#include <map>
#include <string>
#include <utility>

#include "bench/Bench_Session.h"
#include "simulator/SimControl.h"
#include "tests/e2e/Module_Session.h"

using tvrne2e::Module_Session;

namespace {

const char* const kAssociations[] = {
    "TAVRIN_AdapterElementSoftwareIdentity",
    "TAVRIN_AssociatedAlarm",
    "TAVRIN_ControlledBy",
    "TAVRIN_DeviceSAPImplementation",
    "TAVRIN_ElementStatisticalData",
    "TAVRIN_EthernetPortControlledBy",
    "TAVRIN_EthernetPortRealizes",
    "TAVRIN_EthernetPortSystemDevice",
    "TAVRIN_FCPortSystemDevice",
    "TAVRIN_HostedAccessPoint",
    "TAVRIN_HostedCollection",
    "TAVRIN_HostedDependency",
    "TAVRIN_HostedLANEndpoint",
    "TAVRIN_InstalledSoftwareIdentity",
    "TAVRIN_LANEndpointDeviceSAPImplementation",
    "TAVRIN_MemberOfCollection",
    "TAVRIN_PhysicalConnectorContainer",
    "TAVRIN_PortControllerSystemDevice",
    "TAVRIN_ProductElementComponent",
    "TAVRIN_ProductPhysicalComponent",
    "TAVRIN_Realizes",
    "TAVRIN_StorageResourcesSystemDevice",
    "TAVRIN_SCSIInitiatorTargetLogicalUnitPath",
};

struct San {
    const char* name;
    const char* fixture;
};

const San kSans[] = {
    {"small", R"({"generate": {"fcHbas": 2, "cnas": 1, "portsPerAdapter": 2,
                  "targetsPerPort": 32, "lunsPerTarget": 16, "tapeTargetsPerPort": 4,
                  "initiatorsPerPort": 2}})"},
    {"large", R"({"generate": {"fcHbas": 8, "cnas": 4, "portsPerAdapter": 2,
                  "targetsPerPort": 32, "lunsPerTarget": 16, "tapeTargetsPerPort": 4,
                  "initiatorsPerPort": 2}})"},
};

Module_Session* gSession = nullptr;
const San* gLoaded = nullptr;

// Seconds per delivered instance, by association and SAN.
std::map<std::string, std::map<std::string, std::pair<double, double>>> gResults;

void enumerate(benchmark::State& state, const San* san, const char* association) {
    if (gLoaded != san) {
        if (tvrn_sim_load_fixture_text(san->fixture) != 0) {
            state.SkipWithError(tvrn_sim_last_error());
            return;
        }
        gLoaded = san;
    }
    gSession->resetCounters();
    size_t instances = 0;
    double seconds = 0;
    for (auto _ : state) {
        const auto start = std::chrono::steady_clock::now();
        auto got = gSession->enumerate(association);
        seconds += std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
        if (!got.ok()) {
            state.SkipWithError(got.toString().c_str());
            return;
        }
        instances += got.items.size();
    }
    const double requests = double(state.iterations());
    state.SetItemsProcessed(int64_t(instances));
    state.counters["instances"] = double(instances) / requests;
    state.counters["lib_calls"] = double(gSession->totalCalls()) / requests;
    state.counters["per_instance"] = benchmark::Counter(
        double(instances), benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
    gResults[association][san->name] = {instances ? seconds / double(instances) : 0,
                                        double(instances) / requests};
}

void printSummary() {
    std::printf("\n%-42s %10s %12s %10s %12s %7s\n", "association", "small", "us/instance", "large",
                "us/instance", "ratio");
    for (const auto& a : gResults) {
        auto small = a.second.find("small"), large = a.second.find("large");
        if (small == a.second.end() || large == a.second.end())
            continue;
        const double s = small->second.first * 1e6, l = large->second.first * 1e6;
        std::printf("%-42s %10.0f %12.3f %10.0f %12.3f %7.2f\n", a.first.c_str(),
                    small->second.second, s, large->second.second, l, s > 0 ? l / s : 0);
    }
}

}  // namespace

int main(int argc, char** argv) {
    gSession = tvrnbench::openSession();
    if (gSession == nullptr)
        return 1;
    for (const San& san : kSans)
        for (const char* association : kAssociations)
            benchmark::RegisterBenchmark(
                (std::string("enumerate/") + san.name + "/" + association).c_str(), enumerate, &san,
                association)
                ->Unit(benchmark::kMillisecond);
    return tvrnbench::runAndClose(argc, argv, printSummary);
}
