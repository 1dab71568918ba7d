// The management tunnel's cost per request.
//
//   executeMethod/*   a JSON-RPC request through the embedded host, the CMPI
//                     binding and the real module to the simulator and back
//                     (items_per_second: requests per second);
//   dispatcher/*      JsonRpcManager::process in this process, with the
//                     library's entry point answering a constant: parsing,
//                     look-up, the request built, the response written; what
//                     the tunnel adds to a library call.
//
//   LD_LIBRARY_PATH=build/lib/sim build/bin/rpc_bench [benchmark options]
#include <benchmark/benchmark.h>

#include <cstdio>
#include <string>

#include "bench/Bench_Session.h"
#include "gateway/CIMProviderTfaj.h"
#include "rpc/JsonRpcManager.h"
#include "tests/rpc/Agent_Service.h"

using tvrne2e::Module_Session;

namespace {

Module_Session* gSession = nullptr;

const char kServerTime[] = R"({"version": "1.1", "id": 1, "method": "discovery.getServerTime"})";
const char kHbaByWwn[] = R"({"version": "1.1", "id": 2, "method": "discovery.getHbaByWwn",)"
                         R"( "params": ["20:00:00:05:1e:0a:0b:0c"]})";
const char kUnknown[] = R"({"version": "1.1", "id": 3, "method": "discovery.nothing"})";

void roundTrip(benchmark::State& state, const char* request) {
    const tvrnhost::ObjectPath agent = tvrne2e::agentService(*gSession);
    const std::string text = request;
    for (auto _ : state) {
        if (tvrne2e::responseOf(tvrne2e::executeMethod(*gSession, agent, &text))[0] != '{') {
            state.SkipWithError("executeMethod failed");
            return;
        }
    }
    state.SetItemsProcessed(state.iterations());
}

Json::Value constantAnswer(const Json::Value&) {
    static const Json::Value answer = [] {
        Json::Value a(Json::objectValue);
        a["serverTime"] = 1700000000;
        return a;
    }();
    return answer;
}

void dispatcher(benchmark::State& state, const char* request) {
    CPTA::libGetServerTime = constantAnswer;
    CPTA::libGetHbaByWwn = constantAnswer;
    const CPTA::JsonRpcManager* rpc = CPTA::JsonRpcManager::instance();
    const std::string text = request;
    for (auto _ : state) {
        CPTA::JsonRpcManager::response r;
        rpc->process(text, r);
        benchmark::DoNotOptimize(r.body.data());
    }
    state.SetItemsProcessed(state.iterations());
}

}  // namespace

int main(int argc, char** argv) {
    gSession = tvrnbench::openSession();
    if (gSession == nullptr)
        return 1;
    for (const auto& b :
         {std::make_pair("getServerTime", kServerTime), std::make_pair("getHbaByWwn", kHbaByWwn),
          std::make_pair("unknownMethod", kUnknown)}) {
        benchmark::RegisterBenchmark((std::string("executeMethod/") + b.first).c_str(), roundTrip,
                                     b.second)
            ->Unit(benchmark::kMicrosecond);
        benchmark::RegisterBenchmark((std::string("dispatcher/") + b.first).c_str(), dispatcher,
                                     b.second)
            ->Unit(benchmark::kMicrosecond);
    }
    return tvrnbench::runAndClose(argc, argv);
}
