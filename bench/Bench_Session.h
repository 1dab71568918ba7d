// What the benchmarks that go through the embedded host share: the module
// opened on a fixture, and the run of the registered benchmarks.
#ifndef TVRN_BENCH_BENCH_SESSION_H
#define TVRN_BENCH_BENCH_SESSION_H

#include <benchmark/benchmark.h>

#include <algorithm>
#include <cstdio>
#include <cstring>
#include <map>
#include <string>
#include <vector>

#include "tests/e2e/Module_Session.h"

namespace tvrnbench {

// Takes the program's own "--name=value" options out of the command line:
// each found in `options` (keyed by "--name=", holding its default) gets its
// value; what is left, with the program name first, is for the benchmark
// library.
inline std::vector<char*> takeOptions(int argc, char** argv,
                                      std::map<std::string, std::string>& options) {
    std::vector<char*> rest;
    for (int i = 0; i < argc; i++) {
        auto option = std::find_if(options.begin(), options.end(), [&](const auto& o) {
            return std::strncmp(argv[i], o.first.c_str(), o.first.size()) == 0;
        });
        if (option != options.end())
            option->second = argv[i] + option->first.size();
        else
            rest.push_back(argv[i]);
    }
    return rest;
}

// The module loaded in the embedded host on `fixture`, logging at
// `logLevel`; null (reported on stderr) when it did not load.
inline tvrne2e::Module_Session* openSession(const std::string& fixture = "default",
                                            const std::string& logLevel = "FATAL") {
    tvrne2e::Module_Session& session = tvrne2e::Module_Session::open(fixture, logLevel);
    if (!session.loaded()) {
        std::fprintf(stderr, "the module did not load on fixture %s\n", fixture.c_str());
        return nullptr;
    }
    return &session;
}

// Runs the registered benchmarks with the benchmark library's arguments,
// then `after` (when given), and closes the session; main's exit status.
inline int runAndClose(int argc, char** argv, void (*after)() = nullptr) {
    benchmark::Initialize(&argc, argv);
    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
    if (after != nullptr)
        after();
    tvrne2e::Module_Session::close();
    return 0;
}

}  // namespace tvrnbench

#endif
