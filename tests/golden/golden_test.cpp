// Golden files: tvrncli requests against the real module and the answers they
// must give, one test per *.golden file of this directory. A file's head
// (before the first "$ " line) holds '#' comments and "fixture: <name>" (the
// simulator fixture, "default" when not given). Each "$ " line is a tvrncli
// command line without "tvrncli" ('...' quotes words, "<host>" stands for the
// host string); the lines up to the next "$ " line are what it prints, stdout
// then stderr; "<golden>" in a command stands for this directory, where the
// files a request reads live. The requests of a file run in order on a module
// freshly set to the fixture, so a method call is seen by the requests after
// it. To add a case, add a "$ " line and run with TVRN_GOLDEN_UPDATE=1 to
// write the answers, then read them.
//
// The head may also hold "seed: <file>" (instances in tvrncli's --seed form,
// path relative to the source tree, which the CIM server holds during the
// file's requests), "agent: running" (a process named mdcagent, the host
// management agent, runs during the file's requests) and "mask: <Property>..."
// (properties whose values, such as times, change from run to run: printed as
// "<masked>").
#include <gtest/gtest.h>
#include <signal.h>
#include <spawn.h>
#include <stdlib.h>
#include <sys/wait.h>

#include <algorithm>
#include <cctype>
#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <memory>
#include <sstream>
#include <string>
#include <thread>
#include <vector>

#include "tests/e2e/Module_Session.h"

extern char** environ;

namespace {

std::string readFile(const std::string& path) {
    std::ifstream is(path);
    std::stringstream text;
    text << is.rdbuf();
    return text.str();
}

// The instances of seed files, held by the host's stores while it lives.
class Seeds {
public:
    Seeds(tvrnhost::Host& host, const std::vector<std::string>& files) : _host(host) {
        for (const std::string& file : files)
            for (tvrnhost::Instance& instance :
                 tvrnhost::parseInstances(readFile(std::string(TVRN_SOURCE_DIR) + "/" + file))) {
                tvrnhost::ObjectPath path = instance.path();
                if (path.nameSpace().empty())
                    path.setNameSpace(tvrne2e::kNameSpace);
                if (_host.store(path.nameSpace()).add(instance))
                    _paths.push_back(path);
            }
    }
    ~Seeds() {
        for (const tvrnhost::ObjectPath& path : _paths)
            _host.store(path.nameSpace()).remove(path);
    }

private:
    tvrnhost::Host& _host;
    std::vector<tvrnhost::ObjectPath> _paths;
};

// A harmless program (sleep) running under the host management agent's
// name while this lives.
class Agent {
public:
    Agent() {
        char pattern[] = "/tmp/tvrn-agent-XXXXXX";
        if (mkdtemp(pattern) == nullptr)
            return;
        _dir = pattern;
        const std::string program = _dir + "/mdcagent";
        std::filesystem::copy_file("/bin/sleep", program);
        char name[] = "mdcagent", seconds[] = "600";
        char* argv[] = {name, seconds, nullptr};
        if (posix_spawn(&_pid, program.c_str(), nullptr, nullptr, argv, environ) != 0) {
            _pid = 0;
            return;
        }
        // Named once it has started the program.
        const std::string comm = "/proc/" + std::to_string(_pid) + "/comm";
        for (int i = 0; i < 200 && readFile(comm) != "mdcagent\n"; i++)
            std::this_thread::sleep_for(std::chrono::milliseconds(10));
    }
    ~Agent() {
        if (_pid > 0) {
            kill(_pid, SIGKILL);
            waitpid(_pid, nullptr, 0);
        }
        std::error_code ignored;
        if (!_dir.empty())
            std::filesystem::remove_all(_dir, ignored);
    }
    Agent(const Agent&) = delete;
    Agent& operator=(const Agent&) = delete;

private:
    pid_t _pid = 0;
    std::string _dir;
};

struct Golden_Case {
    int line;
    std::string command, expected;
};

std::string withoutTrailingNewlines(std::string text) {
    while (!text.empty() && text.back() == '\n')
        text.pop_back();
    return text;
}

// The command line with "<golden>" replaced by this directory.
std::string expanded(std::string command) {
    const std::string placeholder = "<golden>", dir = TVRN_GOLDEN_DIR;
    for (size_t at = command.find(placeholder); at != std::string::npos;
         at = command.find(placeholder, at + dir.size()))
        command.replace(at, placeholder.size(), dir);
    return command;
}

// `answer` with the value of every MOF line "    <Property> = ...;" of a
// masked property replaced.
std::string maskedProperties(const std::string& answer, const std::vector<std::string>& masked) {
    std::istringstream is(answer);
    std::string out, line;
    while (std::getline(is, line)) {
        for (const std::string& property : masked) {
            const std::string head = "    " + property + " = ";
            if (line.compare(0, head.size(), head) == 0)
                line = head + "<masked>;";
        }
        out += line + "\n";
    }
    return out;
}

std::vector<std::string> goldenFiles() {
    std::vector<std::string> files;
    for (const auto& entry : std::filesystem::directory_iterator(TVRN_GOLDEN_DIR))
        if (entry.path().extension() == ".golden")
            files.push_back(entry.path().string());
    std::sort(files.begin(), files.end());
    return files;
}

class Golden : public ::testing::TestWithParam<std::string> {};

TEST_P(Golden, File) {
    const std::string& path = GetParam();
    std::ifstream is(path);
    std::string head, fixture = "default", line, agent;
    std::vector<std::string> seeds, masked;
    std::vector<Golden_Case> cases;
    for (int number = 1; std::getline(is, line); number++) {
        if (line.compare(0, 2, "$ ") == 0) {
            cases.push_back({number, line.substr(2), ""});
        } else if (!cases.empty()) {
            cases.back().expected += line + "\n";
        } else {
            head += line + "\n";
            std::istringstream words(line);
            std::string word, value;
            words >> word >> value;
            if (word == "fixture:")
                fixture = value;
            else if (word == "seed:")
                seeds.push_back(value);
            else if (word == "agent:")
                agent = value;
            else if (word == "mask:")
                for (masked.push_back(value); words >> value;)
                    masked.push_back(value);
        }
    }
    ASSERT_FALSE(cases.empty()) << path << ": no \"$ \" line";
    // A freshly loaded module: what a file's methods leave (diagnostic jobs
    // and records) is not seen by the next.
    tvrne2e::Module_Session::close();
    tvrne2e::Module_Session& session = tvrne2e::Module_Session::open(fixture);
    ASSERT_TRUE(session.loaded());
    Seeds seeded(session.host(), seeds);
    std::unique_ptr<Agent> running(agent == "running" ? new Agent : nullptr);
    auto answer = [&](const std::string& command) {
        return withoutTrailingNewlines(maskedProperties(session.cli(expanded(command)), masked));
    };

    const char* update = std::getenv("TVRN_GOLDEN_UPDATE");
    if (update == nullptr || *update == '\0' || std::string(update) == "0") {
        for (const Golden_Case& c : cases)
            EXPECT_EQ(withoutTrailingNewlines(c.expected), answer(c.command))
                << path << ":" << c.line << ": $ " << c.command;
        return;
    }
    std::ofstream os(path);
    if (!withoutTrailingNewlines(head).empty())
        os << withoutTrailingNewlines(head) << "\n\n";
    for (size_t i = 0; i < cases.size(); i++) {
        const std::string printed = answer(cases[i].command);
        os << (i > 0 ? "\n" : "") << "$ " << cases[i].command << "\n"
           << printed << (printed.empty() ? "" : "\n");
    }
}

std::string testName(const ::testing::TestParamInfo<std::string>& info) {
    std::string name = std::filesystem::path(info.param).stem().string();
    for (char& c : name)
        if (!isalnum(static_cast<unsigned char>(c)))
            c = '_';
    return name;
}

INSTANTIATE_TEST_SUITE_P(Files, Golden, ::testing::ValuesIn(goldenFiles()), testName);

}  // namespace
