// TftpGetFile against a real TFTP server (in.tftpd) on loopback.
#include <gtest/gtest.h>

#include <unistd.h>

#include <cstdlib>

#include "gateway/ProviderUtil.h"
#include "tests/gateway/TestSupport.h"
#include "tests/gateway/Tftpd.h"

using namespace CPTA;
using gwtest::readFile;
using gwtest::ScratchDir;

namespace {

std::string content(size_t size) {
    std::string s(size, '\0');
    for (size_t i = 0; i < size; i++)
        s[i] = char(i * 31 + i / 509 + (i >> 11));
    return s;
}

class RealTftpServer : public ::testing::Test {
protected:
    void SetUp() override {
        if (std::getenv("TVRN_TEST_NO_TFTPD") != nullptr)
            GTEST_SKIP() << "TVRN_TEST_NO_TFTPD is set";
        std::string why;
        ASSERT_TRUE(server.start(why)) << why;
        ProviderUtil::setTftpDownloadDir(downloads.path().c_str());
    }
    void TearDown() override { ProviderUtil::setTftpDownloadDir("."); }
    int get(const std::string& file) {
        return ProviderUtil::TftpGetFile(server.address().c_str(), file.c_str());
    }

    gwtest::Tftpd server;
    ScratchDir downloads;
};

TEST_F(RealTftpServer, DownloadsAreByteIdentical) {
    // Around the block size, an exact multiple (ends with an empty block), and
    // a few hundred KiB that are not.
    for (size_t size : {0, 511, 512, 513, 300001}) {
        const std::string name = "fw-" + std::to_string(size) + ".bin";
        server.addFile(name, content(size));
        ASSERT_EQ(get(name), 0) << size;
        EXPECT_TRUE(readFile(downloads / name) == content(size)) << size << ": contents differ";
    }
    // A name with a directory is fetched as it is and saved under its last part.
    server.addFile("images/v3/fw.img", content(4321));
    ASSERT_EQ(get("images/v3/fw.img"), 0);
    EXPECT_TRUE(readFile(downloads / "fw.img") == content(4321));
    EXPECT_EQ(get("absent.bin"), -1);
}

// Run where a shell would create X and Y.
TEST_F(RealTftpServer, HostileFileNameRunsNothingAndWritesNothingElse) {
    ScratchDir work;
    char previous[4096];
    ASSERT_NE(getcwd(previous, sizeof previous), nullptr);
    ASSERT_EQ(chdir(work.path().c_str()), 0);
    const std::string name = "fw;touch X$(touch Y)";
    server.addFile(name, "payload");
    EXPECT_EQ(get(name), 0);
    EXPECT_EQ(readFile(downloads / name), "payload");
    EXPECT_EQ(downloads.entries(), std::vector<std::string>{name});
    EXPECT_EQ(work.entries(), std::vector<std::string>{});
    EXPECT_EQ(server.dir().entries(), std::vector<std::string>{name});
    ASSERT_EQ(chdir(previous), 0);
}

}  // namespace
