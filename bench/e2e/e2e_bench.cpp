// Each inventory class enumerated as a CIM server asks for it: through the
// embedded host and the CMPI binding into the real module, on the
// simulator's large-SAN host (8 FC HBAs and 4 CNAs, 2 ports each, 64 targets
// per port with 16 LUNs). Reports instances per second (items_per_second),
// and per request the instances delivered and the library calls made.
//
//   LD_LIBRARY_PATH=build/lib/sim build/bin/e2e_bench [--fixture=<name or path>]
//       [--log-level=<level>] [benchmark options]
//
// The module logs at FATAL unless --log-level says otherwise (DBG writes a
// line per instance built).
#include <benchmark/benchmark.h>

#include <cstdio>
#include <map>
#include <string>
#include <vector>

#include "bench/Bench_Session.h"
#include "tests/e2e/Module_Session.h"

using tvrne2e::Module_Session;

namespace {

const char* const kClasses[] = {
    "TAVRIN_ComputerSystem",   "TAVRIN_PortController",
    "TAVRIN_FCPort",           "TAVRIN_SCSIProtocolEndpoint",
    "TAVRIN_FCPortStatistics", "TAVRIN_PhysicalPackage",
    "TAVRIN_Product",          "TAVRIN_AdapterSoftwareIdentity",
    "TAVRIN_StorageExtent",    "TAVRIN_TapeDrive",
    "TAVRIN_EthernetPort",     "TAVRIN_LogicalPortGroup",
    "TAVRIN_LANEndpoint",      "TAVRIN_PhysicalConnector",
    "TAVRIN_AlarmDevice",      "TAVRIN_LogicalDisk",
};

Module_Session* gSession = nullptr;

// Runs `request` (the number of instances it got, or -1 when it failed) for
// the benchmark's iterations.
template <class Request>
void measure(benchmark::State& state, Request request) {
    size_t instances = 0;
    gSession->resetCounters();
    for (auto _ : state) {
        const long got = request();
        if (got < 0) {
            state.SkipWithError("the request failed");
            return;
        }
        instances += size_t(got);
    }
    const double requests = double(state.iterations());
    state.SetItemsProcessed(int64_t(instances));
    state.counters["instances"] = double(instances) / requests;
    state.counters["lib_calls"] = double(gSession->totalCalls()) / requests;
}

void enumerate(benchmark::State& state, const char* className) {
    measure(state, [&] {
        auto got = gSession->enumerate(className);
        return got.ok() ? long(got.items.size()) : -1L;
    });
}

// A get-instance costs the enumeration of the whole class.
void getFCPort(benchmark::State& state) {
    auto ports = gSession->enumerateNames("TAVRIN_FCPort");
    if (!ports.ok() || ports.items.empty()) {
        state.SkipWithError("no FC port");
        return;
    }
    const tvrnhost::ObjectPath last = ports.items.back();
    measure(state, [&] { return gSession->get(last).ok() ? 1L : -1L; });
}

}  // namespace

int main(int argc, char** argv) {
    // --fixture=NAME and --log-level=LEVEL are ours, the rest the benchmark library's.
    std::map<std::string, std::string> options = {{"--fixture=", "large-san"},
                                                  {"--log-level=", "FATAL"}};
    std::vector<char*> args = tvrnbench::takeOptions(argc, argv, options);
    const std::string& fixture = options["--fixture="];
    int count = int(args.size());

    gSession = tvrnbench::openSession(fixture, options["--log-level="]);
    if (gSession == nullptr)
        return 1;
    for (const char* className : kClasses)
        benchmark::RegisterBenchmark((std::string("enumerate/") + className).c_str(), enumerate,
                                     className)
            ->Unit(benchmark::kMillisecond);
    benchmark::RegisterBenchmark("get/TAVRIN_FCPort", getFCPort)->Unit(benchmark::kMillisecond);
    return tvrnbench::runAndClose(count, args.data());
}
