#include "tests/gateway/TestSupport.h"

#include <dlfcn.h>
#include <sys/stat.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <stdexcept>

namespace gwtest {

namespace fs = std::filesystem;

namespace {

std::string makeTempDir(const char* prefix) {
    const char* tmp = std::getenv("TMPDIR");
    std::string pattern = std::string(tmp != nullptr && *tmp != '\0' ? tmp : "/tmp") + "/" + prefix +
                          "XXXXXX";
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
    _home = makeTempDir("tvrn-gw-home-");
    writeFile(_home + "/.cimplerc", "LOG_LEVEL=DBG\n");
    setenv("HOME", _home.c_str(), 1);
    _file = _home + "/.cimple/messages";
    // Removed at exit together with the log, unless TVRN_KEEP_TEST_LOG is set.
    if (std::getenv("TVRN_KEEP_TEST_LOG") != nullptr) {
        std::fprintf(stderr, "log kept in %s\n", _file.c_str());
        return;
    }
    static std::string toRemove;
    toRemove = _home;
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
    std::ifstream in(_file, std::ios::binary);
    if (!in)
        return std::string();
    in.seekg(_mark);
    std::stringstream s;
    s << in.rdbuf();
    return s.str();
}

std::vector<std::string> LogCapture::lines() const {
    std::vector<std::string> out;
    std::istringstream in(text());
    std::string line;
    while (std::getline(in, line)) {
        // "YYYY/MM/DD hh:mm:ss LEVEL: file(line): message"
        if (line.size() > 20)
            out.push_back(line.substr(20));
    }
    return out;
}

int LogCapture::count(const std::string& level, const std::string& message) const {
    int n = 0;
    for (const std::string& line : lines()) {
        if (line.compare(0, level.size() + 2, level + ": ") != 0)
            continue;
        size_t body = line.find("): ");
        if (body != std::string::npos && line.compare(body + 3, message.size(), message) == 0)
            n++;
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

// ---- FakeLibrary ----------------------------------------------------------------

FakeLibrary::FakeLibrary(const char* path) : _path(path) {
    _handle = dlopen(path, RTLD_NOW | RTLD_GLOBAL);
    if (_handle == nullptr)
        throw std::runtime_error(std::string("cannot load fake library: ") + dlerror());
    reset();
}

template <typename T>
T FakeLibrary::resolve(const char* name) const {
    void* address = dlsym(_handle, name);
    if (address == nullptr)
        throw std::runtime_error(std::string("fake library lacks ") + name);
    return reinterpret_cast<T>(address);
}

void FakeLibrary::reset() { resolve<void (*)()>("fake_tfaj_reset")(); }

void FakeLibrary::on(const char* symbol, const FakeHandler& handler) {
    resolve<void (*)(const char*, const FakeHandler*)>("fake_tfaj_on")(symbol, &handler);
}

int FakeLibrary::calls(const char* symbol) const {
    return resolve<int (*)(const char*)>("fake_tfaj_calls")(symbol);
}

Json::Value FakeLibrary::lastRequest(const char* symbol) const {
    Json::Value request;
    resolve<void (*)(const char*, Json::Value*)>("fake_tfaj_last_request")(symbol, &request);
    return request;
}

void FakeLibrary::setVersion(const char* version) {
    resolve<void (*)(const char*)>("fake_tfaj_set_version")(version);
}

void FakeLibrary::setAdapterCount(unsigned int count) {
    resolve<void (*)(unsigned int)>("fake_tfaj_set_adapter_count")(count);
}

FakeLogCB FakeLibrary::logCallback() const {
    return resolve<FakeLogCB (*)()>("fake_tfaj_log_callback")();
}

}  // namespace gwtest
