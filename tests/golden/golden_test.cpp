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
#include <gtest/gtest.h>

#include <algorithm>
#include <cctype>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <string>
#include <vector>

#include "tests/e2e/Module_Session.h"

namespace {

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
    std::string head, fixture = "default", line;
    std::vector<Golden_Case> cases;
    for (int number = 1; std::getline(is, line); number++) {
        if (line.compare(0, 2, "$ ") == 0) {
            cases.push_back({number, line.substr(2), ""});
        } else if (!cases.empty()) {
            cases.back().expected += line + "\n";
        } else {
            head += line + "\n";
            if (line.compare(0, 8, "fixture:") == 0)
                std::istringstream(line.substr(8)) >> fixture;
        }
    }
    ASSERT_FALSE(cases.empty()) << path << ": no \"$ \" line";
    tvrne2e::Module_Session& session = tvrne2e::Module_Session::open(fixture);
    ASSERT_TRUE(session.loaded());

    const char* update = std::getenv("TVRN_GOLDEN_UPDATE");
    if (update == nullptr || *update == '\0' || std::string(update) == "0") {
        for (const Golden_Case& c : cases)
            EXPECT_EQ(withoutTrailingNewlines(c.expected),
                      withoutTrailingNewlines(session.cli(expanded(c.command))))
                << path << ":" << c.line << ": $ " << c.command;
        return;
    }
    std::ofstream os(path);
    if (!withoutTrailingNewlines(head).empty())
        os << withoutTrailingNewlines(head) << "\n\n";
    for (size_t i = 0; i < cases.size(); i++) {
        const std::string answer = withoutTrailingNewlines(session.cli(expanded(cases[i].command)));
        os << (i > 0 ? "\n" : "") << "$ " << cases[i].command << "\n"
           << answer << (answer.empty() ? "" : "\n");
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
