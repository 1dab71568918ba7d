// Helpers for the tests that load provider modules into the embedded host: a
// private HOME with logging on (set before any module logs), the messages
// logged since a mark, and functions a loaded module exports.
#ifndef TVRN_TESTS_CMPI_TEST_SUPPORT_H
#define TVRN_TESTS_CMPI_TEST_SUPPORT_H

#include <dlfcn.h>
#include <stdlib.h>
#include <unistd.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <stdexcept>
#include <string>
#include <vector>

namespace tvrntest {

// The HOME of the test process, with LOG_LEVEL=DBG; removed at exit.
inline const std::string& log_home() {
    static char dir[] = "/tmp/tvrn-cmpi-test-XXXXXX";
    static const std::string home = [] {
        if (!mkdtemp(dir))
            throw std::runtime_error("mkdtemp failed");
        std::ofstream(std::string(dir) + "/.cimplerc") << "LOG_LEVEL=DBG\n";
        setenv("HOME", dir, 1);
        std::atexit([] {
            std::error_code ignored;
            std::filesystem::remove_all(dir, ignored);
        });
        return std::string(dir);
    }();
    return home;
}

[[maybe_unused]] static const std::string& _log_home_setup = log_home();  // before modules load

// The lines logged from the moment of construction (or of mark()).
class Log_Watch {
public:
    Log_Watch() { mark(); }

    void mark() { _start = _size(); }

    std::vector<std::string> lines() const {
        std::ifstream is(_path());
        is.seekg(std::streamoff(_start));
        std::vector<std::string> result;
        for (std::string line; std::getline(is, line);)
            result.push_back(line);
        return result;
    }

    // Number of lines that contain text.
    size_t count(const std::string& text) const {
        size_t n = 0;
        for (const auto& l : lines())
            n += l.find(text) != std::string::npos;
        return n;
    }

    bool has(const std::string& text) const { return count(text) > 0; }

    std::string text() const {
        std::string all;
        for (const auto& l : lines())
            all += l + "\n";
        return all;
    }

private:
    static std::string _path() { return log_home() + "/.cimple/messages"; }
    static size_t _size() {
        std::ifstream is(_path(), std::ios::ate);
        return is ? size_t(is.tellg()) : 0;
    }

    size_t _start = 0;
};

// A symbol of a module that is already loaded (by the host); the handle is
// held only while the symbol is used.
class Loaded_Module {
public:
    explicit Loaded_Module(const std::string& path)
        : _handle(dlopen(path.c_str(), RTLD_NOW | RTLD_NOLOAD)) {}
    ~Loaded_Module() {
        if (_handle)
            dlclose(_handle);
    }
    Loaded_Module(const Loaded_Module&) = delete;
    Loaded_Module& operator=(const Loaded_Module&) = delete;

    template <class F>
    F symbol(const char* name) const {
        return _handle ? reinterpret_cast<F>(dlsym(_handle, name)) : nullptr;
    }

private:
    void* _handle;
};

}  // namespace tvrntest

#endif
