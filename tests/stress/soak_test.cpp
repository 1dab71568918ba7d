// A shorter soak than bench/soak's: mixed requests, one after the other,
// through the real module in the embedded host (tests/e2e/Request_Mix.h);
// after a warm-up the resident memory must stay within 1 MiB (the program runs
// with one malloc arena and no cache of thread stacks: CMakeLists.txt). Under the
// sanitizers resident memory says nothing (their allocators keep freed memory
// in quarantine), so the requests run and are checked there, without the
// bound; LeakSanitizer then shows a leak at exit.
#include <gtest/gtest.h>

#include <cstdio>

#include "tests/e2e/Module_Session.h"
#include "tests/e2e/Request_Mix.h"

using namespace tvrne2e;

namespace {

#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
constexpr bool kSanitized = true;
#elif defined(__has_feature)
#if __has_feature(address_sanitizer) || __has_feature(thread_sanitizer)
constexpr bool kSanitized = true;
#else
constexpr bool kSanitized = false;
#endif
#else
constexpr bool kSanitized = false;
#endif

constexpr std::size_t kWarmUp = 1000, kRequests = 3000;
constexpr long long kBound = 1 << 20;

TEST(Soak, ResidentMemoryStaysWithinOneMebibyte) {
    Module_Session& session = Module_Session::open("default", "ERR");
    ASSERT_TRUE(session.loaded());
    Request_Mix mix(session);
    const Soak_Figures f = soak(mix, kWarmUp, kRequests);
    EXPECT_EQ(f.failures, 0u) << "first: " << f.firstFailure;
    std::printf("%zu requests: resident %zu KiB after the warm-up, %zu KiB at the end\n",
                f.requests, f.residentWarm / 1024, f.residentEnd / 1024);
    if (!kSanitized) {
        EXPECT_LT(f.growth(), kBound);
    }
}

}  // namespace
