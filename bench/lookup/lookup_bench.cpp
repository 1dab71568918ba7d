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
//   not with its square;
// - by-enumeration/...: the same requests served as they were before the
//   look-up by keys, and still are for a class without it: the whole class
//   enumerated and the instance with the path kept. Measured as a client
//   does it (enumerate, then compare paths), which asks the library exactly
//   what the binding's fallback asks; its time also holds the conversion of
//   every instance for the client, which the fallback does not do, so it is
//   an upper bound of the fallback's.
//
// Reports per request the library calls, and at the end the time of each
// request on both hosts (wall, and CPU of the requesting thread, which the
// module and the simulator run on: the figure to compare on a loaded
// machine), the ratio of the CPU times, and the library calls.
//
//   LD_LIBRARY_PATH=build/lib/sim build/bin/lookup_bench [benchmark options]
#include <benchmark/benchmark.h>

#include <time.h>

#include <chrono>
#include <cstdio>
#include <map>
#include <string>

#include "bench/Bench_Session.h"
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

// Per request: milliseconds of wall time and of this thread's CPU time (the
// module and the simulator run on it), and library calls.
struct Figures {
    double wallMs;
    double cpuMs;
    double calls;
};

// By benchmark and host.
std::map<std::string, std::map<std::string, Figures>> gResults;

double threadCpuSeconds() {
    timespec t{};
    clock_gettime(CLOCK_THREAD_CPUTIME_ID, &t);
    return double(t.tv_sec) + double(t.tv_nsec) * 1e-9;
}

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
    double seconds = 0, cpuSeconds = 0;
    for (auto _ : state) {
        const auto start = std::chrono::steady_clock::now();
        const double cpuStart = threadCpuSeconds();
        const bool ok = request();
        cpuSeconds += threadCpuSeconds() - cpuStart;
        seconds += std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
        if (!ok) {
            state.SkipWithError("the request failed");
            return;
        }
    }
    const double requests = double(state.iterations());
    state.counters["lib_calls"] = double(gSession->totalCalls()) / requests;
    gResults[name][host->name] = {seconds * 1e3 / requests, cpuSeconds * 1e3 / requests,
                                  double(gSession->totalCalls()) / requests};
}

// How a request gets an instance: by its keys, or through the fallback.
enum Way { BY_KEYS, BY_ENUMERATION };

const char* prefix(Way way) {
    return way == BY_KEYS ? "" : "by-enumeration/";
}

// A get of `path` the way asked; false when it found nothing.
bool get(const tvrnhost::ObjectPath& path, Way way) {
    if (way == BY_KEYS)
        return gSession->get(path).ok();
    auto all = gSession->enumerate(path.className());
    for (const tvrnhost::Instance& instance : all.items)
        if (instance.path().identifies(path))
            return true;
    return false;
}

void getLast(benchmark::State& state, const Host* host, const char* className, Way way) {
    if (!load(state, host))
        return;
    auto names = gSession->enumerateNames(className);
    if (!names.ok() || names.items.empty()) {
        state.SkipWithError("no instance to get");
        return;
    }
    const tvrnhost::ObjectPath last = names.items.back();
    measure(state, host, std::string(prefix(way)) + "get/" + className,
            [&] { return get(last, way); });
}

void crawl(benchmark::State& state, const Host* host, const char* className, Way way) {
    if (!load(state, host))
        return;
    size_t paths = 0;
    measure(state, host, std::string(prefix(way)) + "crawl/" + className, [&] {
        auto names = gSession->enumerateNames(className);
        if (!names.ok())
            return false;
        paths = names.items.size();
        for (const tvrnhost::ObjectPath& path : names.items)
            if (!get(path, way))
                return false;
        return true;
    });
    state.counters["paths"] = double(paths);
}

// Per request on both hosts: wall and CPU milliseconds, the ratio of the
// CPU times (large / small), and library calls.
void printSummary() {
    std::printf("\n%-40s %10s %10s %10s %10s %7s %9s %9s\n", "request", "small ms", "large ms",
                "small cpu", "large cpu", "ratio", "calls", "calls");
    for (const auto& r : gResults) {
        auto small = r.second.find("small"), large = r.second.find("large");
        if (small == r.second.end() || large == r.second.end())
            continue;
        const Figures& a = small->second;
        const Figures& b = large->second;
        std::printf("%-40s %10.3f %10.3f %10.3f %10.3f %7.2f %9.0f %9.0f\n", r.first.c_str(),
                    a.wallMs, b.wallMs, a.cpuMs, b.cpuMs, a.cpuMs > 0 ? b.cpuMs / a.cpuMs : 0,
                    a.calls, b.calls);
    }
}

}  // namespace

int main(int argc, char** argv) {
    gSession = tvrnbench::openSession();
    if (gSession == nullptr)
        return 1;
    for (Way way : {BY_KEYS, BY_ENUMERATION})
        for (const Host& host : kHosts) {
            const std::string size = std::string("/") + host.name;
            for (const char* className : {"TAVRIN_StorageExtent", "TAVRIN_FCPort"})
                benchmark::RegisterBenchmark(
                    (std::string(prefix(way)) + "get/" + className + size).c_str(), getLast, &host,
                    className, way)
                    ->Unit(benchmark::kMillisecond);
            // The crawl by enumeration is quadratic: once is enough.
            benchmark::RegisterBenchmark(
                (std::string(prefix(way)) + "crawl/TAVRIN_StorageExtent" + size).c_str(), crawl,
                &host, "TAVRIN_StorageExtent", way)
                ->Unit(benchmark::kMillisecond)
                ->Iterations(way == BY_KEYS ? 3 : 1);
        }
    return tvrnbench::runAndClose(argc, argv, printSummary);
}
