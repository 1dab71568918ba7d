// Costs of the value types and of log calls.
#include <benchmark/benchmark.h>

#include <stdlib.h>
#include <unistd.h>

#include <fstream>
#include <string>

#include "framework/Array.h"
#include "framework/Datetime.h"
#include "framework/Instance.h"
#include "framework/Log.h"
#include "framework/String.h"
#include "schema/generated/TAVRIN_FCPort.h"

using namespace CPTA;

static void BM_StringCopy(benchmark::State& state) {
    String s("a string that is shared by every copy");
    for (auto _ : state) {
        String copy(s);
        benchmark::DoNotOptimize(copy.c_str());
    }
}
BENCHMARK(BM_StringCopy);

static void BM_StringAppendChar(benchmark::State& state) {
    for (auto _ : state) {
        String s;
        for (int i = 0; i < state.range(0); i++)
            s.append('x');
        benchmark::DoNotOptimize(s.c_str());
    }
    state.SetItemsProcessed(state.iterations() * state.range(0));
}
BENCHMARK(BM_StringAppendChar)->Arg(64)->Arg(4096);

static void BM_ArrayAppend(benchmark::State& state) {
    for (auto _ : state) {
        Array<uint32> a;
        for (uint32 i = 0; i < uint32(state.range(0)); i++)
            a.append(i);
        benchmark::DoNotOptimize(a.data());
    }
    state.SetItemsProcessed(state.iterations() * state.range(0));
}
BENCHMARK(BM_ArrayAppend)->Arg(64)->Arg(4096);

static void BM_ArrayAppendString(benchmark::State& state) {
    const String element("10000000c9a0b1c2");
    for (auto _ : state) {
        Array<String> a;
        for (int i = 0; i < state.range(0); i++)
            a.append(element);
        benchmark::DoNotOptimize(a.data());
    }
    state.SetItemsProcessed(state.iterations() * state.range(0));
}
BENCHMARK(BM_ArrayAppendString)->Arg(64)->Arg(4096);

// TAVRIN_FCPort has 73 features: the widest class the inventory builds.
static TAVRIN_FCPort* filled_port() {
    TAVRIN_FCPort* port = create<TAVRIN_FCPort>(true);
    port->SystemCreationClassName.set("TAVRIN_ComputerSystem");
    port->SystemName.set("192.168.10.21");
    port->CreationClassName.set("TAVRIN_FCPort");
    port->DeviceID.set("100000051e0a0b0c");
    port->Name.set("200000051e0a0b0c:100000051e0a0b0c");
    port->ElementName.set("200000051e0a0b0c:100000051e0a0b0c");
    port->OperationalStatus.set(Array<uint16>());
    port->OperationalStatus.value.append(2);
    port->Speed.set(8000000000ULL);
    return port;
}

static void BM_InstanceCreateDestroy(benchmark::State& state) {
    for (auto _ : state) {
        TAVRIN_FCPort* port = create<TAVRIN_FCPort>(true);
        benchmark::DoNotOptimize(port);
        destroy(port);
    }
}
BENCHMARK(BM_InstanceCreateDestroy);

static void BM_InstanceCloneDestroy(benchmark::State& state) {
    TAVRIN_FCPort* port = filled_port();
    for (auto _ : state) {
        TAVRIN_FCPort* copy = clone(port);
        benchmark::DoNotOptimize(copy);
        destroy(copy);
    }
    destroy(port);
}
BENCHMARK(BM_InstanceCloneDestroy);

static void BM_DatetimeParse(benchmark::State& state) {
    Datetime d;
    for (auto _ : state)
        benchmark::DoNotOptimize(d.set("20240131235959.123456+060"));
}
BENCHMARK(BM_DatetimeParse);

static void BM_DatetimePrint(benchmark::State& state) {
    Datetime d("20240131235959.123456+060");
    char buffer[32];
    for (auto _ : state) {
        d.ascii(buffer, false);
        benchmark::DoNotOptimize(buffer);
    }
}
BENCHMARK(BM_DatetimePrint);

// A message above the configured level, with logging configured and without.
static void log_bench(benchmark::State& state, const char* config) {
    char home[] = "/tmp/tvrn-bench-XXXXXX";
    if (!mkdtemp(home)) {
        state.SkipWithError("mkdtemp failed");
        return;
    }
    const char* saved = getenv("HOME");
    std::string saved_home = saved ? saved : "";
    setenv("HOME", home, 1);
    if (config)
        std::ofstream(std::string(home) + "/.cimplerc") << config;
    close_log();
    for (auto _ : state)
        TVRN_LOG(LL_DBG, "Entering: %s", "bench");
    close_log();
    setenv("HOME", saved_home.c_str(), 1);
    std::string cmd = std::string("rm -rf ") + home;
    if (system(cmd.c_str()) != 0)
        state.SkipWithError("cleanup failed");
}

static void BM_LogFiltered(benchmark::State& state) {
    log_bench(state, "LOG_LEVEL=ERR\n");
}
BENCHMARK(BM_LogFiltered);

static void BM_LogUnconfigured(benchmark::State& state) {
    log_bench(state, nullptr);
}
BENCHMARK(BM_LogUnconfigured);

BENCHMARK_MAIN();
