// The adapter-library simulator bound for this whole test program: loaded
// (with logging on) before the binding runs, and put back to the built-in host
// for each test.
#ifndef TVRN_TESTS_GATEWAY_BOUNDSIMULATOR_H
#define TVRN_TESTS_GATEWAY_BOUNDSIMULATOR_H

#include "gateway/CIMProviderTfaj.h"
#include "tests/gateway/TestSupport.h"

namespace gwtest {

inline SimLibrary& boundSimulator() {
    static SimLibrary& sim = []() -> SimLibrary& {
        LogCapture::get();
        static SimLibrary library(TVRN_SIM_LIBRARY);
        CPTA::setupDLLEntryPoints();
        return library;
    }();
    sim.reset();
    return sim;
}

}  // namespace gwtest

#endif
