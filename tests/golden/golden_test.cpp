// Golden files: tvrncli requests against the real module and the answers they
// must give, side by side. One test per *.golden file of this directory.
//
//   # What this file shows (comment lines start with '#').
//   fixture: variants
//
//   $ ei TAVRIN_FCPort
//   // root/tavrin:TAVRIN_FCPort.CreationClassName="TAVRIN_FCPort",...,SystemName="<host>"
//   instance of TAVRIN_FCPort {
//   ...
//   };
//
//   $ gi TAVRIN_FCPort.CreationClassName="TAVRIN_FCPort",DeviceID="1",SystemCreationClassName="TAVRIN_ComputerSystem",SystemName="<host>"
//   tvrncli: CMPI_RC_ERR_NOT_FOUND (6)
//
// Everything before the first "$ " line is the file's head: comments and
// "fixture: <name>" (the simulator fixture; "default" when not given). Each
// "$ " line is a tvrncli command line (without "tvrncli"; '...' quotes words,
// "<host>" stands for the host string); the lines up to the next "$ " line
// are what it prints, standard output then standard error, with the host
// string shown as "<host>". The requests of a file run in order on a module
// freshly set to the fixture, so a method call is seen by the requests after
// it.
//
// To add a case, add a "$ " line (or a file) and run with
// TVRN_GOLDEN_UPDATE=1 to write the answers, then read them:
//   TVRN_GOLDEN_UPDATE=1 ctest --test-dir build -R golden_test
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
    int line = 0;
    std::string command;
    std::string expected;
};

struct Golden_File {
    std::string head;
    std::string fixture = "default";
    std::vector<Golden_Case> cases;
};

std::string withoutTrailingNewlines(std::string text) {
    while (!text.empty() && text.back() == '\n')
        text.pop_back();
    return text;
}

Golden_File readGolden(const std::string& path) {
    std::ifstream is(path);
    Golden_File file;
    std::string line;
    for (int number = 1; std::getline(is, line); number++) {
        if (line.compare(0, 2, "$ ") == 0) {
            file.cases.push_back({number, line.substr(2), ""});
        } else if (!file.cases.empty()) {
            file.cases.back().expected += line + "\n";
        } else {
            file.head += line + "\n";
            if (line.compare(0, 8, "fixture:") == 0) {
                std::istringstream words(line.substr(8));
                words >> file.fixture;
            }
        }
    }
    for (Golden_Case& c : file.cases)
        c.expected = withoutTrailingNewlines(c.expected);
    return file;
}

void writeGolden(const std::string& path, const Golden_File& file,
                 const std::vector<std::string>& answers) {
    std::ofstream os(path);
    const std::string head = withoutTrailingNewlines(file.head);
    if (!head.empty())
        os << head << "\n\n";
    for (size_t i = 0; i < file.cases.size(); i++) {
        if (i > 0)
            os << "\n";
        os << "$ " << file.cases[i].command << "\n";
        if (!answers[i].empty())
            os << answers[i] << "\n";
    }
}

std::vector<std::string> goldenFiles() {
    std::vector<std::string> files;
    for (const auto& entry : std::filesystem::directory_iterator(TVRN_GOLDEN_DIR))
        if (entry.path().extension() == ".golden")
            files.push_back(entry.path().string());
    std::sort(files.begin(), files.end());
    return files;
}

bool updating() {
    const char* flag = std::getenv("TVRN_GOLDEN_UPDATE");
    return flag != nullptr && *flag != '\0' && std::string(flag) != "0";
}

class Golden : public ::testing::TestWithParam<std::string> {};

TEST_P(Golden, File) {
    const std::string& path = GetParam();
    const Golden_File file = readGolden(path);
    ASSERT_FALSE(file.cases.empty()) << path << ": no \"$ \" line";
    tvrne2e::Module_Session& session = tvrne2e::Module_Session::open(file.fixture);
    ASSERT_TRUE(session.loaded());

    std::vector<std::string> answers;
    for (const Golden_Case& c : file.cases) {
        answers.push_back(withoutTrailingNewlines(session.cli(c.command)));
        if (!updating()) {
            EXPECT_EQ(c.expected, answers.back()) << path << ":" << c.line << ": $ " << c.command;
        }
    }
    if (updating())
        writeGolden(path, file, answers);
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
