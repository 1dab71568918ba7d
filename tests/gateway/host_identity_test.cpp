#include <gtest/gtest.h>

#include <atomic>
#include <cstring>
#include <thread>

#include "gateway/ProviderUtil.h"

using namespace CPTA;

namespace {

// A scripted host for the look-up seam.
bool nameFails, domainFails, resolves;
std::vector<std::string> addresses;

int fakeHostName(char* buffer, size_t length) {
    return nameFails ? -1 : (CPTA::strlcpy(buffer, "node7", length), 0);
}
int fakeDomainName(char* buffer, size_t length) {
    return domainFails ? -1 : (CPTA::strlcpy(buffer, "(none)", length), 0);
}
bool fakeResolve(const char*, std::vector<std::string>& out) {
    out = addresses;
    return resolves;
}
const HostLookup kFakeHost = {fakeHostName, fakeDomainName, fakeResolve};

class HostIdentity : public ::testing::Test {
protected:
    void SetUp() override {
        nameFails = domainFails = false;
        resolves = true;
        addresses.clear();
        ProviderUtil::setHostLookup(&kFakeHost);
    }
    void TearDown() override { ProviderUtil::setHostLookup(nullptr); }

    // The host text and kind; checks that nothing is written past `length`.
    std::pair<int, std::string> info(size_t length = 255) {
        std::vector<char> buffer(length + 1, 'Z');
        int rc = ProviderUtil::getHostInfo(buffer.data(), length);
        EXPECT_EQ(buffer[length], 'Z');
        return {rc, buffer.data()};
    }
};

TEST_F(HostIdentity, FirstNonLoopbackAddressWins) {
    addresses = {"127.0.0.1", "10.0.0.5", "10.0.0.6"};
    EXPECT_EQ(info(), std::make_pair(0, std::string("10.0.0.5")));
    EXPECT_EQ(info(8), std::make_pair(0, std::string("10.0.0.")));
    EXPECT_STREQ(ProviderUtil::updateNamespacePath("TAVRIN_FCPort").c_str(),
                 "//10.0.0.5/root/tavrin:TAVRIN_FCPort");
}

// Loopback addresses only, no resolution, or no domain: the host name; no
// host name: "localhost".
TEST_F(HostIdentity, FallsBackToTheHostNameThenLocalhost) {
    addresses = {"127.0.0.1", "127.0.1.1"};
    EXPECT_EQ(info(), std::make_pair(2, std::string("node7")));
    domainFails = true;
    resolves = false;
    EXPECT_EQ(info(), std::make_pair(2, std::string("node7")));
    nameFails = true;
    EXPECT_EQ(info(), std::make_pair(3, std::string("localhost")));
}

// With the system resolver, every thread sees what a lone caller sees.
TEST(HostIdentitySystem, ConcurrentCallersAgree) {
    char expected[255] = {0};
    const int expectedRc = ProviderUtil::getHostInfo(expected, sizeof(expected));
    EXPECT_GT(std::strlen(expected), 0u);
    std::vector<std::thread> threads;
    std::atomic<int> mismatches{0};
    for (int t = 0; t < 8; t++)
        threads.emplace_back([&] {
            for (int i = 0; i < 50; i++) {
                char buffer[255] = {0};
                int rc = ProviderUtil::getHostInfo(buffer, sizeof(buffer));
                mismatches += rc != expectedRc || std::strcmp(buffer, expected) != 0;
            }
        });
    for (std::thread& t : threads)
        t.join();
    EXPECT_EQ(mismatches, 0);
}

}  // namespace
