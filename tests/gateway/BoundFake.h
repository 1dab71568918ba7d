// The fake adapter library of this test program, loaded (with logging on)
// before the binding runs. TVRN_FAKE_TFAJ is the fake's path.
#ifndef TVRN_TESTS_GATEWAY_BOUNDFAKE_H
#define TVRN_TESTS_GATEWAY_BOUNDFAKE_H

#include "gateway/CIMProviderTfaj.h"
#include "tests/gateway/TestSupport.h"

namespace gwtest {

inline FakeLibrary& boundFake() {
    static FakeLibrary& fake = [&]() -> FakeLibrary& {
        LogCapture::get();
        static FakeLibrary library(TVRN_FAKE_TFAJ);
        CPTA::setupDLLEntryPoints();
        return library;
    }();
    fake.reset();
    return fake;
}

}  // namespace gwtest

#endif
