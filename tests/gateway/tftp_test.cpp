#include <gtest/gtest.h>

#include <fcntl.h>
#include <unistd.h>

#include <chrono>

#include "gateway/ProviderUtil.h"
#include "gateway/TftpClient.h"
#include "tests/gateway/TestSupport.h"
#include "tests/gateway/TftpTestServer.h"

using namespace CPTA;
using gwtest::LogCapture;
using gwtest::readFile;
using gwtest::ScratchDir;
using gwtest::TftpTestServer;

namespace {

TftpOptions quick() {
    TftpOptions options;
    options.timeoutMs = 150;
    options.retries = 3;
    return options;
}

std::string content(size_t size) {
    std::string s(size, '\0');
    for (size_t i = 0; i < size; i++)
        s[i] = char(i * 13 + i / 7 + size);
    return s;
}

class TftpClient : public ::testing::Test {
protected:
    // Runs the client into a scratch file; its result (error text in `error`).
    int fetch(const char* name, const TftpOptions& options = quick()) {
        int fd = open((dir / "out").c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0600);
        int rc = tftpReceive(server.address().c_str(), name, fd, options, error);
        close(fd);
        return rc;
    }
    std::string received() { return readFile(dir / "out"); }

    TftpTestServer server;
    ScratchDir dir;
    std::string error;
};

TEST(TftpServerText, Forms) {
    std::string host, port;
    EXPECT_TRUE(parseTftpServer("[fe80::1%eth0]:70", host, port));
    EXPECT_EQ(host + "|" + port, "fe80::1%eth0|70");
    EXPECT_TRUE(parseTftpServer("::1", host, port));
    EXPECT_EQ(host + "|" + port, "::1|69");
    for (const char* bad : {"", ":69", "host:0", "host:65536", "[::1", "[::1]x", "a;b", "$(reboot)",
                            "`id`", "a b", "a'b", "-x", "a/b"})
        EXPECT_FALSE(parseTftpServer(bad, host, port)) << bad;
}

// Ordinary transfers are tftpd_test.cpp's; here what only a server of our own
// can provoke.
TEST_F(TftpClient, BlockNumbersWrapBeyond65535Blocks) {
    const std::string data = content(65536 * 512 + 700);
    server.addFile("big.bin", data);
    // 65,537 blocks: the short time-outs of the other cases would fail on a busy machine.
    ASSERT_EQ(fetch("big.bin", TftpOptions()), 0) << error;
    EXPECT_TRUE(received() == data);
}

TEST_F(TftpClient, LostPacketsAreRetriedAndAnotherPortIsRefused) {
    server.addFile("fw.bin", content(2000));
    TftpTestServer::Faults faults;
    faults.ignoreRequests = 2;
    faults.dropBlockOnce = 2;
    faults.strayPacket = true;
    server.setFaults(faults);
    ASSERT_EQ(fetch("fw.bin"), 0) << error;
    EXPECT_TRUE(received() == content(2000));
    EXPECT_EQ(server.requests().size(), 3u);  // the request went out three times
    EXPECT_EQ(server.strayAnswer(), 5);       // "Unknown transfer ID"
}

TEST_F(TftpClient, SilentServerTimesOutAfterTheRetries) {
    TftpTestServer::Faults faults;
    faults.ignoreRequests = 100;
    server.setFaults(faults);
    auto start = std::chrono::steady_clock::now();
    EXPECT_EQ(fetch("fw.bin"), -1);
    auto elapsed = std::chrono::steady_clock::now() - start;
    EXPECT_EQ(error, "timed out waiting for block 1");
    EXPECT_GE(elapsed, std::chrono::milliseconds(150 * 4));
    EXPECT_LT(elapsed, std::chrono::seconds(5));
    EXPECT_EQ(server.requests().size(), 4u);
}

TEST_F(TftpClient, SlowServerIsCutOffAfterTheTotalTime) {
    // Each block comes well within its time-out, the whole file far too late.
    server.addFile("slow.bin", content(20 * 512));
    TftpTestServer::Faults faults;
    faults.blockDelayMs = 100;
    server.setFaults(faults);
    TftpOptions options = quick();
    options.totalMs = 500;
    EXPECT_EQ(fetch("slow.bin", options), -1);
    EXPECT_EQ(error, "not complete after 500 ms");
}

TEST_F(TftpClient, SizeLimit) {
    server.addFile("large.bin", content(3000));
    TftpOptions options = quick();
    options.maxBytes = 1024;
    EXPECT_EQ(fetch("large.bin", options), -1);
    EXPECT_EQ(error, "file larger than 1024 bytes");
    for (int i = 0; i < 100 && server.clientErrors().empty(); i++)
        usleep(10000);
    EXPECT_EQ(server.clientErrors(), std::vector<int>{3});  // the server was told
}

// ---- TftpGetFile: download directory, names, shell safety ----------------------------------

class TftpGetFile : public ::testing::Test {
protected:
    void SetUp() override {
        ProviderUtil::setTftpDownloadDir(downloads.path().c_str());
        ProviderUtil::setTftpOptions(quick());
        LogCapture::get().mark();
    }
    void TearDown() override {
        ProviderUtil::setTftpDownloadDir(".");
        ProviderUtil::setTftpOptions(TftpOptions());
    }
    int get(const std::string& server, const char* file) {
        return ProviderUtil::TftpGetFile(server.c_str(), file);
    }

    ScratchDir downloads, outside;
    TftpTestServer server;
};

// Downloads that succeed are tftpd_test.cpp's.
TEST_F(TftpGetFile, FailureRemovesTheOldCopyAndIsLogged) {
    EXPECT_STREQ(ProviderUtil::tftpLocalPath("images/fw.bin").c_str(),
                 (downloads / "fw.bin").c_str());
    gwtest::writeFile(downloads / "fw.bin", "old copy");
    EXPECT_EQ(get(server.address(), "images/fw.bin"), -1);
    EXPECT_EQ(server.requests(), std::vector<std::string>{"images/fw.bin|octet"});
    EXPECT_TRUE(downloads.entries().empty());
    EXPECT_TRUE(LogCapture::get().has("ERR", "TFTP get of images/fw.bin from " + server.address() +
                                                 " failed: server error 1: File not found"));
    ProviderUtil::setTftpDownloadDir(".");
    EXPECT_STREQ(ProviderUtil::tftpLocalPath("sub/fw.bin").c_str(), "fw.bin");
}

TEST_F(TftpGetFile, NamesThatLeaveTheDirectoryAreRefusedBeforeAnythingHappens) {
    gwtest::writeFile(outside / "victim", "keep me");
    const std::string up = "../" + outside.path().substr(outside.path().rfind('/') + 1) + "/victim";
    for (const std::string& name :
         {up, outside / "victim", std::string("a/../../victim"), std::string(".."),
          std::string("dir/"), std::string(""), std::string("line\nbreak")}) {
        EXPECT_STREQ(ProviderUtil::tftpLocalPath(name.c_str()).c_str(), "") << name;
        EXPECT_EQ(get(server.address(), name.c_str()), -1) << name;
    }
    EXPECT_EQ(get(server.address(), nullptr), -1);
    EXPECT_EQ(readFile(outside / "victim"), "keep me");
    EXPECT_TRUE(server.requests().empty());
    EXPECT_TRUE(downloads.entries().empty());
    EXPECT_TRUE(LogCapture::get().has("ERR", "TFTP file name refused: line?break"));
}

TEST_F(TftpGetFile, ShellSyntaxRunsNothing) {
    // A shell would create this file in the working directory or beside the marker.
    const std::string name = "tvrn-ran-" + std::to_string(getpid());
    const std::string marker = outside / name;
    for (const std::string& bad : {"127.0.0.1;touch " + marker, "$(touch " + marker + ")",
                                   "`touch " + marker + "`", "127.0.0.1' && touch '" + marker})
        EXPECT_EQ(get(bad, "fw.bin"), -1) << bad;
    // A file name is just a name: sent as it is and saved under exactly that name.
    const std::string odd = "fw;touch " + name + ";$(touch " + name + ")`touch " + name + "`'\"";
    server.addFile(odd, "payload");
    EXPECT_EQ(get(server.address(), odd.c_str()), 0);
    EXPECT_EQ(readFile(downloads / odd), "payload");
    EXPECT_FALSE(gwtest::fileExists(marker));
    EXPECT_FALSE(gwtest::fileExists(name));
    EXPECT_FALSE(gwtest::fileExists(downloads / name));
}

}  // namespace
