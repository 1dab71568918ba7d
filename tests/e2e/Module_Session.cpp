#include "tests/e2e/Module_Session.h"

#include <stdlib.h>

#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <sstream>
#include <stdexcept>

#include <gtest/gtest.h>
#include <json/json.h>

#include "host/classinfo.h"
#include "host/cli.h"

namespace tvrne2e {

namespace {

// The session outlives main(): once the program exits, the host can no longer
// unload the module (its per-thread state is gone), so the module is unloaded
// when the tests end, or by close().
Module_Session*& theSession() {
    static Module_Session* session = nullptr;
    return session;
}

class Unload_After_Tests : public ::testing::Environment {
public:
    void TearDown() override { Module_Session::close(); }
};

::testing::Environment* const unloadAfterTests =
    ::testing::AddGlobalTestEnvironment(new Unload_After_Tests);

// The program's HOME: made once, removed at exit.
const std::string& home() {
    static const std::string dir = [] {
        char pattern[] = "/tmp/tvrn-e2e-XXXXXX";
        if (mkdtemp(pattern) == nullptr)
            throw std::runtime_error("mkdtemp failed");
        setenv("HOME", pattern, 1);
        std::string made = pattern;
        std::atexit([] {
            std::error_code ignored;
            std::filesystem::remove_all(getenv("HOME"), ignored);
        });
        return made;
    }();
    return dir;
}

std::string logFile() {
    return home() + "/.cimple/messages";
}

std::size_t logSize() {
    std::ifstream is(logFile(), std::ios::ate);
    return is ? std::size_t(is.tellg()) : 0;
}

// Words of a command line: blanks separate; '...' groups and is removed;
// "..." groups and is kept, with \" inside (paths carry their key values in
// double quotes).
std::vector<std::string> words(const std::string& line) {
    std::vector<std::string> out;
    std::string word;
    bool inWord = false;
    char quote = 0;
    bool escaped = false;
    for (char c : line) {
        if (quote != 0) {
            const bool closes = c == quote && !escaped;
            escaped = quote == '"' && c == '\\' && !escaped;
            if (closes)
                quote = 0;
            if (!(closes && c == '\''))
                word += c;
            continue;
        }
        if (c == ' ' || c == '\t') {
            if (inWord)
                out.push_back(word);
            word.clear();
            inWord = false;
            continue;
        }
        inWord = true;
        if (c == '\'' || c == '"')
            quote = c;
        if (c != '\'')
            word += c;
    }
    if (inWord)
        out.push_back(word);
    return out;
}

std::string replaceAll(std::string text, const std::string& from, const std::string& to) {
    if (from.empty())
        return text;
    for (std::size_t at = text.find(from); at != std::string::npos;
         at = text.find(from, at + to.size()))
        text.replace(at, from.size(), to);
    return text;
}

}  // namespace

Module_Session& Module_Session::open(const std::string& fixture, const std::string& logLevel) {
    Module_Session*& session = theSession();
    if (session == nullptr) {
        home();
        session = new Module_Session;
    }
    if (session->loaded() && session->_fixture == fixture && session->_logLevel == logLevel) {
        session->resetSimulator();
    } else {
        session->stop();
        if (!session->start(fixture, logLevel))
            std::cerr << "Module_Session: the module did not load on fixture " << fixture << "\n";
    }
    session->markLog();
    return *session;
}

void Module_Session::close() {
    if (theSession())
        theSession()->stop();
}

Module_Session::Module_Session() = default;

Module_Session::~Module_Session() {
    stop();
}

bool Module_Session::start(const std::string& fixture, const std::string& logLevel) {
    _fixture = fixture;
    _logLevel = logLevel;
    std::ofstream(home() + "/.cimplerc") << "LOG_LEVEL=" << logLevel << "\n";
    if (tvrn_sim_load_fixture(fixture.c_str()) != 0) {
        std::cerr << "Module_Session: fixture " << fixture << ": " << tvrn_sim_last_error() << "\n";
        return false;
    }
    // The module's classes, as a server has them from its repository.
    tvrnhost::HostOptions options;
    options.classes = tvrnhost::classinfo::moduleCatalog().classes();
    _host.reset(new tvrnhost::Host(options));
    tvrnhost::Status st = _host->load(TVRN_MODULE, TVRN_MODULE_REG);
    if (!st.ok()) {
        std::cerr << "Module_Session: " << st.toString() << "\n";
        _host.reset();
        return false;
    }
    Result<Instance> systems = _host->enumerateInstances(kNameSpace, "TAVRIN_ComputerSystem");
    const tvrnhost::Value* name =
        systems.ok() && systems.items.size() == 1 ? systems.items[0].get("Name") : nullptr;
    _hostName = name != nullptr && !name->isNull() ? name->asString() : std::string();
    resetCounters();
    clearRecording();
    return true;
}

void Module_Session::stop() {
    if (!_host)
        return;
    _host->unload();
    _host.reset();
    _hostName.clear();
}

void Module_Session::resetSimulator() {
    tvrn_sim_load_fixture(_fixture.c_str());
    resetCounters();
    clearRecording();
}

bool Module_Session::loaded() const {
    return _host != nullptr;
}

tvrnhost::Host& Module_Session::host() {
    if (!_host)
        throw std::logic_error("Module_Session: the module is not loaded");
    return *_host;
}

Result<Instance> Module_Session::enumerate(const std::string& className) {
    return host().enumerateInstances(kNameSpace, className);
}

Result<ObjectPath> Module_Session::enumerateNames(const std::string& className) {
    return host().enumerateInstanceNames(kNameSpace, className);
}

InstanceResult Module_Session::get(const ObjectPath& path) {
    return host().getInstance(path);
}

MethodResult Module_Session::invoke(const ObjectPath& path, const std::string& method,
                                    const PropertyVector& in) {
    return host().invokeMethod(path, method, in);
}

ObjectPath Module_Session::path(const std::string& text) const {
    ObjectPath p = ObjectPath::parse(replaceAll(text, kHostPlaceholder, _hostName));
    if (p.nameSpace().empty())
        p.setNameSpace(kNameSpace);
    return p;
}

std::string Module_Session::cli(const std::string& commandLine, int* status) {
    tvrnhost::cli::Defaults defaults;
    defaults.module = TVRN_MODULE;
    defaults.reg = TVRN_MODULE_REG;
    std::ostringstream out, err;
    int rc = 2;
    try {
        tvrnhost::cli::Invocation inv = tvrnhost::cli::parseInvocation(
            words(replaceAll(commandLine, kHostPlaceholder, _hostName)), defaults);
        rc = tvrnhost::cli::execute(host(), inv, out, err);
    } catch (const std::exception& e) {
        err << "tvrncli: " << e.what() << "\n";
    }
    if (status != nullptr)
        *status = rc;
    return masked(out.str() + err.str());
}

std::string Module_Session::masked(const std::string& text) const {
    if (_hostName.empty())
        return text;
    // Only whole quoted values: "host" in MOF and in paths, \"host\" in a
    // path quoted inside a reference value; the host of a URL, //host:, and
    // the host part of a path written as text, //host/.
    std::string out;
    std::size_t from = 0;
    for (std::size_t at = text.find(_hostName); at != std::string::npos;
         at = text.find(_hostName, at + 1)) {
        const std::size_t end = at + _hostName.size();
        const bool opens = at > 0 && text[at - 1] == '"';
        const bool closes = end < text.size() && (text[end] == '"' || text[end] == '\\');
        const bool url = at > 1 && text.compare(at - 2, 2, "//") == 0 && end < text.size() &&
                         (text[end] == ':' || text[end] == '/');
        if (!(opens && closes) && !url)
            continue;
        out.append(text, from, at - from);
        out += kHostPlaceholder;
        from = end;
    }
    out.append(text, from, std::string::npos);
    return out;
}

void Module_Session::markLog() {
    _logMark = logSize();
}

std::vector<std::string> Module_Session::logLines() const {
    std::ifstream is(logFile());
    is.seekg(std::streamoff(_logMark));
    std::vector<std::string> lines;
    std::string line;
    while (std::getline(is, line))
        lines.push_back(line);
    return lines;
}

std::size_t Module_Session::logCount(const std::string& text) const {
    const std::vector<std::string> lines = logLines();
    return std::size_t(std::count_if(lines.begin(), lines.end(), [&](const std::string& line) {
        return line.find(text) != std::string::npos;
    }));
}

unsigned long long Module_Session::calls(const std::string& entryPoint) const {
    return tvrn_sim_call_count(entryPoint.c_str());
}

unsigned long long Module_Session::totalCalls() const {
    return tvrn_sim_total_calls();
}

void Module_Session::resetCounters() {
    tvrn_sim_reset_counters();
}

std::vector<std::string> Module_Session::recordedEntries() const {
    Json::Value calls;
    Json::CharReaderBuilder builder;
    std::istringstream is(tvrn_sim_recorded_calls());
    std::string errors;
    std::vector<std::string> entries;
    if (Json::parseFromStream(builder, is, &calls, &errors) && calls.isArray())
        for (const Json::Value& call : calls)
            entries.push_back(call["entry"].asString());
    return entries;
}

void Module_Session::clearRecording() {
    tvrn_sim_clear_recording();
}

bool Module_Session::fault(const std::string& entryPoint, const std::string& key,
                           tvrn_sim_fault_kind kind, const std::string& text, int times, int code) {
    return tvrn_sim_set_fault(entryPoint.c_str(), key.empty() ? nullptr : key.c_str(), int(kind),
                              code, text.empty() ? nullptr : text.c_str(), times) == 0;
}

}  // namespace tvrne2e
