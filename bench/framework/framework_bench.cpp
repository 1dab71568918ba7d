// Costs of the value types and of log calls.
#include <benchmark/benchmark.h>

#include <stdlib.h>
#include <unistd.h>

#include <fstream>
#include <string>

#include "framework/Array.h"
#include "framework/Datetime.h"
#include "framework/Log.h"
#include "framework/String.h"

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

static void BM_DatetimeParse(benchmark::State& state) {
    Datetime d;
    for (auto _ : state)
        benchmark::DoNotOptimize(d.set("20240131235959.123456+060"));
}
BENCHMARK(BM_DatetimeParse);

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
