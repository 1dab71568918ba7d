// A burst of adapter events, all sent by the library at once, translated by
// the real module and delivered to the embedded host as a CIM server would
// get them. Reports delivered indications per second (items_per_second) and
// per burst the indications delivered and dropped (dropped ones leave gaps in
// the sequence numbers; the module logs their count at WARN), and the peak
// resident memory of the process.
//
//   LD_LIBRARY_PATH=build/lib/sim build/bin/alerts_bench [--log-level=<level>]
//       [benchmark options]
//
// The module logs at FATAL unless --log-level says otherwise (WARN writes two
// lines per event, and the drop counts).
#include <benchmark/benchmark.h>

#include <sys/resource.h>

#include <algorithm>
#include <chrono>
#include <climits>
#include <cstdio>
#include <cstring>
#include <string>
#include <vector>

#include "bench/Bench_Session.h"
#include "tests/e2e/Module_Session.h"

using tvrne2e::Module_Session;

namespace {

const char kClass[] = "TAVRIN_AlertIndication";
const char kEvent[] =
    R"({"eventCategory": 2, "eventId": 11, "eventSeverity": 2,)"
    R"( "portIndexString": "100000051e0a0b0c", "basePortWWN": "10:00:00:05:1e:0a:0b:0c",)"
    R"( "eventIdValue": "TFA_PORT_LINKDOWN", "eventMsg": "Base port lost connection"})";

Module_Session* gSession = nullptr;

double peakMegabytes() {
    rusage usage{};
    getrusage(RUSAGE_SELF, &usage);
    return double(usage.ru_maxrss) / 1024.0;
}

// Takes what the host received; true once the indication numbered `last`
// came. Counts them in `delivered`.
bool collect(tvrnhost::Host& host, long long last, size_t& delivered, long long& newest) {
    host.waitForIndications(1, std::chrono::milliseconds(100));
    for (const tvrnhost::Indication& i : host.takeIndications()) {
        delivered++;
        if (const tvrnhost::Value* n = i.instance.get("SequenceNumber"))
            newest = std::max(newest, static_cast<long long>(n->asSint()));
    }
    return newest >= last;
}

void burst(benchmark::State& state) {
    const size_t events = size_t(state.range(0));
    tvrnhost::Host& host = gSession->host();
    if (!host.subscribe(tvrne2e::kNameSpace, kClass).ok()) {
        state.SkipWithError("the subscription failed");
        return;
    }
    size_t deliveredTotal = 0, producedTotal = 0;
    for (auto _ : state) {
        // Where the numbering stands: one event, both of its indications.
        size_t seen = 0;
        long long base = 0;
        tvrn_sim_emit_event(kEvent);
        const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(30);
        while (seen < 2 && std::chrono::steady_clock::now() < deadline)
            collect(host, LLONG_MAX, seen, base);
        if (seen < 2) {
            state.SkipWithError("no indication arrived");
            break;
        }

        const auto start = std::chrono::steady_clock::now();
        for (size_t n = 0; n < events; n++)
            tvrn_sim_emit_event(kEvent);
        const long long last = base + 2 * static_cast<long long>(events);
        size_t delivered = 0;
        long long newest = base;
        const auto give_up = start + std::chrono::seconds(300);
        while (!collect(host, last, delivered, newest))
            if (std::chrono::steady_clock::now() > give_up) {
                state.SkipWithError("the burst was not delivered");
                break;
            }
        state.SetIterationTime(
            std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count());
        deliveredTotal += delivered;
        producedTotal += 2 * events;
    }
    host.unsubscribe(tvrne2e::kNameSpace, kClass);
    const double bursts = double(state.iterations());
    state.SetItemsProcessed(int64_t(deliveredTotal));
    state.counters["delivered"] = double(deliveredTotal) / bursts;
    state.counters["dropped"] = double(producedTotal - deliveredTotal) / bursts;
    state.counters["peak_MB"] = peakMegabytes();
}

}  // namespace

int main(int argc, char** argv) {
    // --log-level=LEVEL is ours, the rest the benchmark library's.
    std::string logLevel = "FATAL";
    std::vector<char*> args;
    for (int i = 0; i < argc; i++) {
        if (std::strncmp(argv[i], "--log-level=", 12) == 0)
            logLevel = argv[i] + 12;
        else
            args.push_back(argv[i]);
    }
    int count = int(args.size());
    gSession = tvrnbench::openSession("default", logLevel);
    if (gSession == nullptr)
        return 1;
    benchmark::RegisterBenchmark("burst", burst)
        ->Arg(1000)
        ->Arg(100000)
        ->UseManualTime()
        ->Iterations(3)
        ->Unit(benchmark::kMillisecond);
    return tvrnbench::runAndClose(count, args.data());
}
