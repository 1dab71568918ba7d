#include <gtest/gtest.h>

#include <signal.h>
#include <spawn.h>
#include <sys/stat.h>
#include <sys/wait.h>

#include <chrono>
#include <filesystem>
#include <stdexcept>
#include <thread>

#include "gateway/ProviderUtil.h"
#include "tests/gateway/TestSupport.h"

extern char** environ;

using namespace CPTA;
using gwtest::LogCapture;
using gwtest::ScratchDir;
using gwtest::writeFile;

namespace {

TEST(LogCallback, LevelsMapAndTheTextIsNotAFormat) {
    LogCapture& log = LogCapture::get();
    log.mark();
    const char* const levels[] = {"DBG", "DBG", "INFO", "WARN", "ERR", "INFO", "DBG"};
    for (int level = 0; level <= 6; level++)
        ProviderUtil::logMsg(level, "lib.c", level, "text %s %n");
    for (int level = 0; level <= 6; level++)
        EXPECT_TRUE(log.has(levels[level], "lib.c:" + std::to_string(level) + " text %s %n"))
            << level;

    ProviderUtil::logMsg(4, std::string(40, 'f').c_str(), 123456, "message");  // location cut to 31
    EXPECT_TRUE(log.has("ERR", std::string(31, 'f') + "message"));
    ProviderUtil::logMsg(4, nullptr, 7, nullptr);
    EXPECT_TRUE(log.has("ERR", ":7 "));
}

TEST(SmallHelpers, TrimAndUtf8Lead) {
    char out[16];
    ProviderUtil::trimString("   a b\t  ", out);
    EXPECT_STREQ(out, "a b\t");  // only spaces are blanks
    char small[5];
    ProviderUtil::trimString("  123456789  ", small);
    EXPECT_STREQ(small, "1234");
    ProviderUtil::trimString(nullptr, out);
    EXPECT_STREQ(out, "");

    for (const char* good : {"\x7f", "\xc2\xa9", "\xf4"})
        EXPECT_TRUE(ProviderUtil::valid_UTF_string(good)) << good;
    for (const char* bad : {"\x80", "\xc1", "\xf5", static_cast<const char*>(nullptr)})
        EXPECT_FALSE(ProviderUtil::valid_UTF_string(bad));
}

void fakeProcess(const ScratchDir& root, const std::string& pid, const std::string& comm,
                 char state) {
    std::filesystem::create_directories(root / pid);
    writeFile(root / pid + "/comm", comm + "\n");
    writeFile(root / pid + "/stat", pid + " (" + comm + ") " + state + " 1 1 1 0 -1\n");
}

TEST(AgentDetection, ProcessTableRules) {
    ScratchDir proc;
    fakeProcess(proc, "20", "notmdcagent", 'S');
    fakeProcess(proc, "21", "mdcagentd", 'S');
    fakeProcess(proc, "22", "mdcagent", 'Z');    // a zombie is not running
    fakeProcess(proc, "self", "mdcagent", 'S');  // not a process directory
    EXPECT_FALSE(ProviderUtil::isProcessRunning("mdcagent", proc.path().c_str()));
    fakeProcess(proc, "23", "mdcagent", 'S');
    EXPECT_TRUE(ProviderUtil::isProcessRunning("mdcagent", proc.path().c_str()));
    EXPECT_FALSE(ProviderUtil::isProcessRunning("mdcagent", (proc / "absent").c_str()));
}

int agentPortWithin(int wanted) {
    int port = -1;
    for (int i = 0; i < 200 && (port = ProviderUtil::getAgentPort()) != wanted; i++)
        std::this_thread::sleep_for(std::chrono::milliseconds(10));
    return port;
}

TEST(AgentDetection, RealProcessNamedMdcagent) {
    if (ProviderUtil::getAgentPort() != 0)
        GTEST_SKIP() << "an mdcagent process is already running on this host";
    ScratchDir dir;
    const std::string agent = dir / "mdcagent";
    std::filesystem::copy_file("/bin/sleep", agent);
    chmod(agent.c_str(), 0755);
    char arg0[] = "mdcagent", arg1[] = "30";
    char* argv[] = {arg0, arg1, nullptr};
    pid_t pid;
    ASSERT_EQ(posix_spawn(&pid, agent.c_str(), nullptr, nullptr, argv, environ), 0);
    EXPECT_EQ(agentPortWithin(34568), 34568);
    kill(pid, SIGKILL);
    waitpid(pid, nullptr, 0);
    EXPECT_EQ(agentPortWithin(0), 0);
}

int portRecord(const String& key, Json::Value& port) {
    if (key.equal("throw"))
        throw std::runtime_error("inventory broke");
    port = gwtest::parseJson(key.equal("num") ? R"({"ethData": {"ethDev": 4}})"
                                              : R"({"ethData": {"ethDev": "eth4"}})");
    return key.equal("missing") ? -1 : 0;
}

TEST(EthDeviceName, ThroughTheInventoryHook) {
    LogCapture& log = LogCapture::get();
    log.mark();
    EXPECT_STREQ(ProviderUtil::getEthDeviceNameByMAC("00:05:33:aa:bb:cc").c_str(),
                 "");  // no hook yet
    EXPECT_TRUE(log.has("ERR", "Unable to get Eth Device Name for 00:05:33:aa:bb:cc"));

    ProviderUtil::setEthPortDetailsHook(portRecord);
    EXPECT_STREQ(ProviderUtil::getEthDeviceNameByMAC("00:05:33:aa:bb:cc").c_str(), "eth4");
    for (const char* failing : {"missing", "num", "throw"})
        EXPECT_STREQ(ProviderUtil::getEthDeviceNameByMAC(failing).c_str(), "") << failing;
    EXPECT_TRUE(log.has("ERR", "throw - getEthPortDetails got std exception: inventory broke"));
    ProviderUtil::setEthPortDetailsHook(nullptr);
}

}  // namespace
