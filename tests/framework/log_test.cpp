// The log: configuration, levels, line format, files and locking; traces
// and assertions.
#include <gtest/gtest.h>

#include <sys/stat.h>
#include <unistd.h>

#include <cctype>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <set>
#include <string>
#include <thread>
#include <vector>

#include "framework/Assert.h"
#include "framework/File_Lock.h"
#include "framework/Log.h"
#include "framework/Value.h"
#include "tests/framework/test_classes.h"

using namespace CPTA;

namespace {

// Each test gets its own home directory, and the log is closed around it so
// that the configuration is read afresh.
class Log_Test : public testing::Test {
protected:
    void SetUp() override {
        const char* home = getenv("HOME");
        _saved_home = home ? home : "";
        char tmpl[] = "/tmp/tvrn-log-XXXXXX";
        ASSERT_NE(nullptr, mkdtemp(tmpl));
        _home = tmpl;
        setenv("HOME", _home.c_str(), 1);
        close_log();
        log_enable(true);
    }

    void TearDown() override {
        close_log();
        log_enable(true);
        setenv("HOME", _saved_home.c_str(), 1);
        std::filesystem::remove_all(_home);
    }

    void configure(const std::string& text) {
        close_log();
        std::ofstream(_home + "/.cimplerc") << text;
    }

    std::string dir() const { return _home + "/.cimple"; }

    bool exists(const std::string& path) const { return access(path.c_str(), F_OK) == 0; }

    std::vector<std::string> lines() const {
        std::vector<std::string> v;
        std::ifstream is(dir() + "/messages");
        for (std::string line; std::getline(is, line);)
            v.push_back(line);
        return v;
    }

    // Logs one message at each level and returns the level names written.
    std::string written_levels() {
        for (int level = LL_FATAL; level <= LL_DBG; level++)
            TVRN_LOG(Log_Level(level), "level %d", level);
        std::string names;
        for (const std::string& line : lines()) {
            size_t space = line.find(' ', 11);
            size_t colon = line.find(':', space);
            names += line.substr(space + 1, colon - space - 1) + " ";
        }
        return names;
    }

    // Whether a line starts with its "YYYY/MM/DD hh:mm:ss " time stamp.
    static bool stamped(const std::string& line) {
        const std::string shape = "dddd/dd/dd dd:dd:dd ";
        for (size_t i = 0; i < shape.size(); i++) {
            if (i >= line.size() || (shape[i] == 'd' ? !isdigit(static_cast<unsigned char>(line[i]))
                                                     : line[i] != shape[i]))
                return false;
        }
        return true;
    }

    std::string _home;

private:
    std::string _saved_home;
};

}  // namespace

// Without a valid configuration nothing is written; while logging is off,
// every message looks at the configuration again: a file that appears, or is
// rewritten at once with the same size, takes effect at the next message.
TEST_F(Log_Test, AChangedConfigurationIsSeenAtTheNextMessage) {
    unsetenv("HOME");
    TVRN_LOG(LL_FATAL, "no home");
    setenv("HOME", _home.c_str(), 1);
    TVRN_LOG(LL_FATAL, "no configuration yet");
    configure("LOG_LEVEL=VERBOSE\n");
    TVRN_LOG(LL_FATAL, "unknown level");
    TVRN_LOG(LL_FATAL, "unknown level again");
    EXPECT_FALSE(exists(dir()));

    std::ofstream(_home + "/.cimplerc") << "LOG_LEVEL=DBG    \n";  // same size
    TVRN_LOG(LL_DBG, "now configured");
    ASSERT_EQ(1u, lines().size());
    EXPECT_NE(std::string::npos, lines()[0].find("now configured"));
}

TEST_F(Log_Test, ConfigurationLines) {
    const struct {
        std::string config;
        const char* levels;
    } cases[] = {
        {"LOG_LEVEL=dbg\n", "FATAL ERR WARN INFO DBG "},
        {"LOG_LEVEL=WARN\n", "FATAL ERR WARN "},
        {"# LOG_LEVEL=DBG\nLOG_LEVEL=ERR\n", "FATAL ERR "},
        {"#LOG_LEVEL=DBG\n", ""},
        {"log_level=DBG\n", ""},
        {"  LOG_LEVEL=DBG\n", ""},
        {"LOG_LEVELS=DBG\n", ""},
        {"LOG_LEVEL\t =  \tinfo \t \n", "FATAL ERR WARN INFO "},
        {"\n   \n\nLOG_LEVEL=FATAL", "FATAL "},
        {"LOG_LEVEL=INFO\nLOG_LEVEL=DBG\n", "FATAL ERR WARN INFO "},
        {"LOG_LEVEL=VERBOSE\nLOG_LEVEL=DBG\n", ""},
        // Only the first 1023 characters of a line count; the rest is not a
        // line of its own.
        {"#" + std::string(1022, 'x') + "LOG_LEVEL=DBG\nLOG_LEVEL=ERR\n", "FATAL ERR "},
    };
    for (const auto& c : cases) {
        configure(c.config);
        unlink((dir() + "/messages").c_str());
        EXPECT_EQ(c.levels, written_levels()) << c.config;
    }
}

TEST_F(Log_Test, LineFormat) {
    configure("LOG_LEVEL=DBG\n");
    TVRN_LOG(LL_WARN, "hello %d %s", 42, "world");
    int line = __LINE__ - 1;
    std::vector<std::string> v = lines();
    ASSERT_EQ(1u, v.size());
    EXPECT_TRUE(stamped(v[0])) << v[0];
    EXPECT_EQ("WARN: log_test.cpp(" + std::to_string(line) + "): hello 42 world", v[0].substr(20));

    log(LL_ERR, "named.cpp", 7, "%s", "");
    EXPECT_EQ("ERR: named.cpp(7): ", lines()[1].substr(20));
    EXPECT_TRUE(exists(dir() + "/messages.lock"));

    // A trailing newline is not doubled.
    TVRN_LOG(LL_INFO, "one\n");
    TVRN_LOG(LL_INFO, "two");
    EXPECT_EQ(4u, lines().size());
}

TEST_F(Log_Test, SetLevelByName) {
    configure("LOG_LEVEL=ERR\n");
    EXPECT_EQ("FATAL ERR ", written_levels());
    EXPECT_EQ(0, log_set_level("info"));
    EXPECT_EQ(-1, log_set_level("verbose"));  // the level stays at INFO
    TVRN_LOG(LL_INFO, "info");
    TVRN_LOG(LL_DBG, "debug");
    ASSERT_EQ(3u, lines().size());

    // A restart reads the configured level again.
    close_log();
    TVRN_LOG(LL_INFO, "after restart");
    EXPECT_EQ(3u, lines().size());
}

TEST_F(Log_Test, ConversionWarningsFollowTheEnabledFlag) {
    configure("LOG_LEVEL=WARN\n");
    EXPECT_EQ(-1, log_enable(true));  // already enabled
    Instance* b = create(&Test_Base::static_meta_class, false);
    Value v;
    v.set_value(String("x"));
    EXPECT_EQ(-1, v.get(b, find_feature(b->meta_class, "Number")));
    EXPECT_EQ(0, log_enable(false));
    EXPECT_EQ(-1, v.get(b, find_feature(b->meta_class, "Number")));
    EXPECT_EQ(0, log_enable(true));
    destroy(b);

    std::vector<std::string> v_lines = lines();
    ASSERT_EQ(1u, v_lines.size());
    EXPECT_EQ("type mismatch: Test_Base.Number", v_lines[0].substr(v_lines[0].rfind("): ") + 3));
}

TEST_F(Log_Test, ConcurrentMessagesStayWhole) {
    configure("LOG_LEVEL=DBG\n");
    std::vector<std::thread> threads;
    for (int t = 0; t < 4; t++) {
        threads.emplace_back([t] {
            for (int i = 0; i < 200; i++)
                TVRN_LOG(LL_DBG, "thread %d message %d %s", t, i, std::string(100, 'z').c_str());
        });
    }
    for (auto& th : threads)
        th.join();
    std::vector<std::string> v = lines();
    ASSERT_EQ(800u, v.size());
    std::set<std::pair<int, int>> seen;
    for (const std::string& line : v) {
        int t = -1, i = -1, end = 0;
        char z[128] = "";
        ASSERT_TRUE(stamped(line)) << line;
        sscanf(line.c_str() + 20, "DBG: log_test.cpp(%*d): thread %d message %d %127s%n", &t, &i, z,
               &end);
        ASSERT_TRUE(std::string(z) == std::string(100, 'z') && line[20 + end] == 0) << line;
        seen.insert({t, i});
    }
    EXPECT_EQ(800u, seen.size());
}

TEST_F(Log_Test, FileLock) {
    File_Lock bad((_home + "/missing/dir/lock").c_str());
    EXPECT_EQ(-1, bad.lock());
    EXPECT_EQ(-1, bad.unlock());

    File_Lock lock((_home + "/lock").c_str());
    EXPECT_EQ(0, lock.lock());
    EXPECT_EQ(0, lock.unlock());
    struct stat st;
    ASSERT_EQ(0, stat((_home + "/lock").c_str(), &st));
    EXPECT_EQ(0600u, st.st_mode & 0777);
}

TEST(Trace, WritesToStandardError) {
    testing::internal::CaptureStderr();
    __cimple_trace("file.cpp", 12, "func");
    EXPECT_EQ("TRACE: file.cpp(12): func\n", testing::internal::GetCapturedStderr());
}

TEST(Assert, PrintsTheConditionAndAborts) {
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    EXPECT_DEATH(__cimple_assert("file.cpp", 7, "func", "x == 1"),
                 "file\\.cpp\\(7\\): func\\(\\): assert: x == 1");
    int x = 2;
    EXPECT_DEATH(CPTA_ASSERT(x == 1), "assert: x == 1");
}
