#include "tests/gateway/TestSupport.h"

#include <dlfcn.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <stdexcept>

#include "simulator/SimControl.h"

namespace gwtest {

namespace fs = std::filesystem;

namespace {

std::string makeTempDir(const char* prefix) {
    const char* tmp = std::getenv("TMPDIR");
    std::string pattern =
        std::string(tmp != nullptr && *tmp != '\0' ? tmp : "/tmp") + "/" + prefix + "XXXXXX";
    if (mkdtemp(&pattern[0]) == nullptr)
        throw std::runtime_error("mkdtemp failed");
    return pattern;
}

}  // namespace

// ---- LogCapture ---------------------------------------------------------------

LogCapture& LogCapture::get() {
    static LogCapture capture;
    return capture;
}

LogCapture::LogCapture() {
    const std::string home = makeTempDir("tvrn-gw-home-");
    writeFile(home + "/.cimplerc", "LOG_LEVEL=DBG\n");
    setenv("HOME", home.c_str(), 1);
    _file = home + "/.cimple/messages";
    // Removed at exit together with the log, unless TVRN_KEEP_TEST_LOG is set.
    if (std::getenv("TVRN_KEEP_TEST_LOG") != nullptr) {
        std::fprintf(stderr, "log kept in %s\n", _file.c_str());
        return;
    }
    static std::string toRemove;
    toRemove = home;
    std::atexit([] {
        std::error_code ec;
        fs::remove_all(toRemove, ec);
    });
}

void LogCapture::mark() {
    std::error_code ec;
    auto size = fs::file_size(_file, ec);
    _mark = ec ? 0 : (long long)size;
}

std::string LogCapture::text() const {
    const std::string all = readFile(_file);
    return all.substr(std::min<size_t>(size_t(_mark), all.size()));
}

std::vector<std::string> LogCapture::lines() const {
    std::vector<std::string> out;
    std::istringstream in(text());
    for (std::string line; std::getline(in, line);) {
        // "YYYY/MM/DD hh:mm:ss LEVEL: file(line): message"
        if (line.size() > 20)
            out.push_back(line.substr(20));
    }
    return out;
}

int LogCapture::count(const std::string& level, const std::string& text, bool anywhere) const {
    int n = 0;
    for (const std::string& line : lines()) {
        size_t body = line.find("): ");
        if (line.compare(0, level.size() + 2, level + ": ") != 0 || body == std::string::npos)
            continue;
        n += anywhere ? line.find(text, body + 3) != std::string::npos
                      : line.compare(body + 3, text.size(), text) == 0;
    }
    return n;
}

// ---- files ----------------------------------------------------------------------

ScratchDir::ScratchDir() : _path(makeTempDir("tvrn-gw-")) {}

ScratchDir::~ScratchDir() {
    std::error_code ec;
    fs::remove_all(_path, ec);
}

std::vector<std::string> ScratchDir::entries() const {
    std::vector<std::string> names;
    for (const auto& entry : fs::directory_iterator(_path))
        names.push_back(entry.path().filename().string());
    std::sort(names.begin(), names.end());
    return names;
}

std::string readFile(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    std::stringstream s;
    s << in.rdbuf();
    return s.str();
}

void writeFile(const std::string& path, const std::string& content) {
    std::ofstream out(path, std::ios::binary | std::ios::trunc);
    out << content;
}

bool fileExists(const std::string& path) {
    struct stat info;
    return lstat(path.c_str(), &info) == 0;
}

Json::Value parseJson(const std::string& text) {
    Json::CharReaderBuilder builder;
    Json::Value value;
    std::string errors;
    std::istringstream in(text);
    if (!Json::parseFromStream(builder, in, &value, &errors))
        throw std::runtime_error("bad JSON in test: " + errors);
    return value;
}

// ---- SimLibrary -----------------------------------------------------------------

SimLibrary::SimLibrary(const char* path) : _path(path) {
    _handle = dlopen(path, RTLD_NOW | RTLD_GLOBAL);
    if (_handle == nullptr)
        throw std::runtime_error(std::string("cannot load the simulator: ") + dlerror());
}

void* SimLibrary::resolve(const char* name) const {
    void* address = dlsym(_handle, name);
    if (address == nullptr)
        throw std::runtime_error(std::string("the simulator lacks ") + name);
    return address;
}

// The control function `name` of the loaded copy, with its declared type.
#define SIM_CONTROL(name) reinterpret_cast<decltype(&::name)>(resolve(#name))
// Throws with the simulator's reason when `rc` is not 0.
#define SIM_CHECK(rc, what) \
    if ((rc) != 0)          \
        throw std::runtime_error(std::string(what) + SIM_CONTROL(tvrn_sim_last_error)());

void SimLibrary::reset() {
    SIM_CHECK(SIM_CONTROL(tvrn_sim_reset)(), "simulator reset: ")
}
void SimLibrary::loadFixture(const char* nameOrPath) {
    SIM_CHECK(SIM_CONTROL(tvrn_sim_load_fixture)(nameOrPath), "simulator fixture: ")
}
void SimLibrary::loadFixtureText(const std::string& json) {
    SIM_CHECK(SIM_CONTROL(tvrn_sim_load_fixture_text)(json.c_str()), "simulator fixture: ")
}
void SimLibrary::setVersion(const char* version) {
    SIM_CONTROL(tvrn_sim_set_version)(version);
}
void SimLibrary::setInitResult(int result) {
    SIM_CONTROL(tvrn_sim_set_init_result)(result);
}
void SimLibrary::setFault(const char* entry, const char* key, int kind, int code, const char* text,
                          int times) {
    SIM_CHECK(SIM_CONTROL(tvrn_sim_set_fault)(entry, key, kind, code, text, times),
              std::string("simulator refused a fault for ") + entry + ": ")
}
unsigned long long SimLibrary::calls(const char* entry) const {
    return SIM_CONTROL(tvrn_sim_call_count)(entry);
}
unsigned long long SimLibrary::callsAfterFree() const {
    return SIM_CONTROL(tvrn_sim_calls_after_free)();
}
Json::Value SimLibrary::recorded() const {
    return parseJson(SIM_CONTROL(tvrn_sim_recorded_calls)());
}

#undef SIM_CHECK
#undef SIM_CONTROL

std::vector<std::string> SimLibrary::entriesCalled() const {
    std::vector<std::string> names;
    for (const Json::Value& call : recorded())
        names.push_back(call["entry"].asString());
    return names;
}

std::vector<Json::Value> SimLibrary::requests(const char* entry) const {
    std::vector<Json::Value> found;
    for (const Json::Value& call : recorded())
        if (call["entry"].asString() == entry)
            found.push_back(call["request"]);
    return found;
}

Json::Value SimLibrary::lastRequest(const char* entry) const {
    std::vector<Json::Value> found = requests(entry);
    return found.empty() ? Json::Value() : found.back();
}

// ---- fresh processes -------------------------------------------------------------

void inFreshProcess(const std::function<void()>& scenario) {
    LogCapture::get();  // one log for parent and child, removed by the parent
    std::fflush(nullptr);
    pid_t child = fork();
    ASSERT_NE(child, -1) << "fork failed";
    if (child == 0) {
        int rc = 2;
        try {
            scenario();
            rc = ::testing::Test::HasFailure() ? 1 : 0;
        } catch (const std::exception& e) {
            std::fprintf(stderr, "scenario threw: %s\n", e.what());
        } catch (...) {
            std::fprintf(stderr, "scenario threw\n");
        }
        std::fflush(nullptr);
        _exit(rc);  // no exit handlers: they belong to the parent
    }
    int status = 0;
    ASSERT_EQ(waitpid(child, &status, 0), child);
    const bool passed = WIFEXITED(status) && WEXITSTATUS(status) == 0;
    EXPECT_TRUE(passed) << "the scenario failed in its own process (see above); wait status "
                        << status;
}

}  // namespace gwtest
