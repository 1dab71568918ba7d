// What the fuzz targets share: a fixed host for the module's host look-ups
// (no resolver calls while fuzzing), a private HOME without a log
// configuration (so nothing logs), and a check that stops the run on an
// input that broke a rule the target states.
#ifndef TVRN_FUZZ_FUZZSUPPORT_H
#define TVRN_FUZZ_FUZZSUPPORT_H

#include <cstdio>
#include <cstdlib>
#include <string>

namespace tvrnfuzz {

// Points HOME at an empty directory of its own (once per process).
void privateHome();

// The module's host look-ups answer "fuzzhost" at 10.20.30.40 (once per process).
void fixedHost();

// Aborts (the fuzzer keeps the input) when `condition` is false.
inline void require(bool condition, const char* rule) {
    if (!condition) {
        std::fprintf(stderr, "fuzz rule broken: %s\n", rule);
        std::abort();
    }
}

}  // namespace tvrnfuzz

#endif
