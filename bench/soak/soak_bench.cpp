// A soak: mixed requests (tests/e2e/Request_Mix.h: every class enumerated in
// turn, gets, associators and references, executeMethod, RunDiagnostic,
// alert indications switched on and off around an event, InstallFromURI,
// SetAlarmState), one after the other in one process, through the embedded
// host into the real module on the simulator's built-in host. After a
// warm-up, reports the requests per second (items_per_second), the resident
// memory after the warm-up and at the end (KiB, with the allocator's free
// memory handed back first) and its growth, which should stay under 1 MiB,
// and the requests whose answers were not sound (failures, 0).
//
//   LD_LIBRARY_PATH=build/lib/sim build/bin/soak_bench [--requests=N]
//       [--warm-up=N] [--log-level=<level>] [benchmark options]
//
// 20,000 requests after 2,000 of warm-up unless told otherwise; the module
// logs at FATAL unless --log-level says otherwise.
#include <benchmark/benchmark.h>

#include <stdlib.h>

#include <cstdio>
#include <map>
#include <string>
#include <vector>

#include "bench/Bench_Session.h"
#include "tests/e2e/Module_Session.h"
#include "tests/e2e/Request_Mix.h"

using namespace tvrne2e;

namespace {

// One iteration: the whole soak, timed without its warm-up.
void soakRun(benchmark::State& state, Request_Mix* mix, std::size_t warmUp, std::size_t requests) {
    Soak_Figures f;
    for (auto _ : state) {
        f = soak(*mix, warmUp, requests);
        state.SetIterationTime(f.seconds);
    }
    state.SetItemsProcessed(int64_t(f.requests));
    state.counters["requests"] = double(f.requests);
    state.counters["rss_warm_KiB"] = double(f.residentWarm / 1024);
    state.counters["rss_end_KiB"] = double(f.residentEnd / 1024);
    state.counters["growth_KiB"] = double(f.growth()) / 1024;
    state.counters["failures"] = double(f.failures);
    if (f.failures != 0)
        std::fprintf(stderr, "first failure: %s\n", f.firstFailure.c_str());
}

}  // namespace

int main(int argc, char** argv) {
    // --requests=, --warm-up= and --log-level= are ours, the rest the benchmark library's.
    std::map<std::string, std::string> options = {
        {"--requests=", "20000"}, {"--warm-up=", "2000"}, {"--log-level=", "FATAL"}};
    std::vector<char*> args = tvrnbench::takeOptions(argc, argv, options);
    int count = int(args.size());
    // The loopback runs do not pause for the link to settle.
    setenv("TVRN_DIAG_PAUSE_MS", "0", 1);

    Module_Session& session = Module_Session::open("default", options["--log-level="]);
    if (!session.loaded()) {
        std::fprintf(stderr, "the module did not load\n");
        return 1;
    }
    {
        Request_Mix mix(session);
        benchmark::RegisterBenchmark("soak", soakRun, &mix,
                                     std::size_t(std::stoul(options["--warm-up="])),
                                     std::size_t(std::stoul(options["--requests="])))
            ->Iterations(1)
            ->UseManualTime()
            ->Unit(benchmark::kMillisecond);
        benchmark::Initialize(&count, args.data());
        benchmark::RunSpecifiedBenchmarks();
        benchmark::Shutdown();
    }
    Module_Session::close();
    return 0;
}
