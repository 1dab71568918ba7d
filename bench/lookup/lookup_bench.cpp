// Requests about one object, as a CIM client makes them, through the
// embedded host and the CMPI binding into the real module, on two hosts that
// the simulator generates: "small" (2 FC HBAs and a CNA, 2 ports each, 4
// targets per port of which one is tape, 4 LUNs each, one remote initiator per
// port) and "large", the same adapters with 8 times the targets and so 8 times
// the LUNs.
//
// - get/<class>: get-instance of the last path that enumerating the names of
//   the class gives (a storage extent, an FC port); its cost should not
//   depend on how many other objects the host has;
// - crawl/TAVRIN_StorageExtent: the names of every storage extent, then a
//   get-instance of each; its cost should grow with the number of extents,
//   not with its square.
//
// Reports per request the library calls, and at the end the time of each
// request on both hosts and their ratio.
//
//   LD_LIBRARY_PATH=build/lib/sim build/bin/lookup_bench [benchmark options]
#include <benchmark/benchmark.h>

#include <chrono>
#include <cstdio>
#include <map>
#include <string>

#include "simulator/SimControl.h"
#include "tests/e2e/Module_Session.h"

using tvrne2e::Module_Session;

namespace {

struct Host {
    const char* name;
    const char* fixture;
};

const Host kHosts[] = {
    {"small", R"({"generate": {"fcHbas": 2, "cnas": 1, "portsPerAdapter": 2,
                  "targetsPerPort": 4, "lunsPerTarget": 4, "tapeTargetsPerPort": 1,
                  "initiatorsPerPort": 1}})"},
    {"large", R"({"generate": {"fcHbas": 2, "cnas": 1, "portsPerAdapter": 2,
                  "targetsPerPort": 32, "lunsPerTarget": 4, "tapeTargetsPerPort": 8,
                  "initiatorsPerPort": 1}})"},
};

Module_Session* gSession = nullptr;
const Host* gLoaded = nullptr;

// Milliseconds per request, by benchmark and host.
std::map<std::string, std::map<std::string, double>> gResults;

bool load(benchmark::State& state, const Host* host) {
    if (gLoaded != host) {
        if (tvrn_sim_load_fixture_text(host->fixture) != 0) {
            state.SkipWithError(tvrn_sim_last_error());
            return false;
        }
        gLoaded = host;
    }
    return true;
}

// Runs `request` (false when it failed) for the benchmark's iterations.
template <class Request>
void measure(benchmark::State& state, const Host* host, const std::string& name, Request request) {
    gSession->resetCounters();
    double seconds = 0;
    for (auto _ : state) {
        const auto start = std::chrono::steady_clock::now();
        const bool ok = request();
        seconds += std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
        if (!ok) {
            state.SkipWithError("the request failed");
            return;
        }
    }
    const double requests = double(state.iterations());
    state.counters["lib_calls"] = double(gSession->totalCalls()) / requests;
    gResults[name][host->name] = seconds * 1e3 / requests;
}

void getLast(benchmark::State& state, const Host* host, const char* className) {
    if (!load(state, host))
        return;
    auto names = gSession->enumerateNames(className);
    if (!names.ok() || names.items.empty()) {
        state.SkipWithError("no instance to get");
        return;
    }
    const tvrnhost::ObjectPath last = names.items.back();
    measure(state, host, std::string("get/") + className, [&] { return gSession->get(last).ok(); });
}

void crawl(benchmark::State& state, const Host* host, const char* className) {
    if (!load(state, host))
        return;
    size_t paths = 0;
    measure(state, host, std::string("crawl/") + className, [&] {
        auto names = gSession->enumerateNames(className);
        if (!names.ok())
            return false;
        paths = names.items.size();
        for (const tvrnhost::ObjectPath& path : names.items)
            if (!gSession->get(path).ok())
                return false;
        return true;
    });
    state.counters["paths"] = double(paths);
}

void printSummary() {
    std::printf("\n%-36s %12s %12s %7s\n", "request", "small ms", "large ms", "ratio");
    for (const auto& r : gResults) {
        auto small = r.second.find("small"), large = r.second.find("large");
        if (small == r.second.end() || large == r.second.end())
            continue;
        std::printf("%-36s %12.3f %12.3f %7.2f\n", r.first.c_str(), small->second, large->second,
                    small->second > 0 ? large->second / small->second : 0);
    }
}

}  // namespace

int main(int argc, char** argv) {
    gSession = &Module_Session::open("default", "FATAL");
    if (!gSession->loaded()) {
        std::fprintf(stderr, "the module did not load\n");
        return 1;
    }
    for (const Host& host : kHosts) {
        const std::string size = std::string("/") + host.name;
        for (const char* className : {"TAVRIN_StorageExtent", "TAVRIN_FCPort"})
            benchmark::RegisterBenchmark((std::string("get/") + className + size).c_str(), getLast,
                                         &host, className)
                ->Unit(benchmark::kMillisecond);
        benchmark::RegisterBenchmark(("crawl/TAVRIN_StorageExtent" + size).c_str(), crawl, &host,
                                     "TAVRIN_StorageExtent")
            ->Unit(benchmark::kMillisecond)
            ->Iterations(3);
    }
    benchmark::Initialize(&argc, argv);
    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
    printSummary();
    Module_Session::close();
    return 0;
}
