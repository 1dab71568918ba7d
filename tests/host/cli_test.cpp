// tvrncli: its commands run in-process against the test provider (output
// compared verbatim), and the built program run as a child process.
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <sstream>

#include "host/cli.h"
#include "tests/host/host_fixture.h"

namespace hosttest {
namespace {

struct Output {
    int status;
    std::string out, err;
};

std::vector<std::string> withModule(std::vector<std::string> args) {
    args.insert(args.begin(),
                {"--module", TVRN_TESTPROV_LIB, "--reg", TVRN_TESTPROV_REG, "-n", "root/test"});
    return args;
}

Output runCli(const std::vector<std::string>& args, const cli::Defaults& d = {}) {
    std::ostringstream out, err;
    const int st = cli::run(withModule(args), out, err, d);
    return Output{st, out.str(), err.str()};
}

// Commands against one loaded host, so that changes persist between them.
class CliSession : public HostFixture {
protected:
    Output exec(const std::vector<std::string>& args) {
        std::ostringstream out, err;
        const int st = cli::execute(*host, cli::parseInvocation(withModule(args), {}), out, err);
        return Output{st, out.str(), err.str()};
    }
};

// The module's instances as tvrncli prints them (with --props), its failed
// requests and its method calls' outputs are in the golden files; here the test
// provider's (writes, every kind of literal, principals, seeds and scripts).
TEST(Cli, AModuleThatCannotBeLoadedIsOneFailureLine) {
    std::ostringstream out, err;
    EXPECT_EQ(cli::run({"--module", "/nonexistent/libtvrnprovider.so", "--reg", TVRN_TESTPROV_REG,
                        "ein", "Test_Gadget"},
                       out, err, {}),
              1);
    const std::string line = err.str();
    EXPECT_EQ(line.rfind("tvrncli: CMPI_RC_ERR_FAILED (1): cannot load "
                         "/nonexistent/libtvrnprovider.so",
                         0),
              0u)
        << line;
    EXPECT_EQ(std::count(line.begin(), line.end(), '\n'), 1);
}

TEST(Cli, MisuseExitsWithTwoAndTheCommandsUsage) {
    const std::string pathNote = "PATH: [//host/][namespace:]Class.Key=";
    struct Case {
        std::vector<std::string> args;
        const char* message;
        const char* usage;  // the usage line that follows, if any
    } cases[] = {
        {{"gi", "1bad"}, "tvrncli: malformed object path '1bad': bad class name", "gi PATH"},
        {{"cm", "Test_Widget.Id=", "Echo"}, "tvrncli: malformed object path", "cm PATH METHOD"},
        {{"gi"}, "tvrncli: wrong number of arguments for gi", "gi PATH"},
        {{"classes", "extra"}, "tvrncli: wrong number of arguments for classes", "classes\n"},
        {{"ci", "Test_Widget.Id=\"w9\"", "Size=uint8:300"}, "tvrncli: Size: ", "ci PATH"},
        {{"cm", "Test_Widget.Id=\"w1\"", "Echo", "noequals"},
         "tvrncli: expected NAME=VALUE: noequals",
         "cm PATH"},
        {{"ri", "Test_Widget.Id=\"w1\"", "--result-role", "X"},
         "tvrncli: unknown option --result-role",
         "ri PATH"},
        {{"frobnicate"}, "tvrncli: unknown command 'frobnicate'", nullptr},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.message);
        Output o = runCli(c.args);
        EXPECT_EQ(o.status, 2);
        EXPECT_EQ(o.out, "");
        EXPECT_EQ(o.err.find(c.message), 0u) << o.err;
        if (c.usage) {
            EXPECT_NE(o.err.find(c.usage), std::string::npos) << o.err;
            const bool takesPath = std::string(c.usage).find("PATH") != std::string::npos;
            EXPECT_EQ(o.err.find(pathNote) != std::string::npos, takesPath) << o.err;
        }
    }
    // A misused global option: the message and the whole help text.
    Output o = runCli({"--seed"});
    EXPECT_EQ(o.status, 2);
    EXPECT_EQ(o.err, "tvrncli: --seed needs a value\n" + cli::usage());
}

TEST_F(CliSession, CreateModifyDeleteWithTypedValues) {
    Output o = exec({"ci", "Test_Widget.Id=\"w7\"", "Count=uint32:4", "Label=hello world"});
    ASSERT_EQ(o.status, 0) << o.err;
    EXPECT_EQ(o.out, "root/test:Test_Widget.Id=\"w7\"\n");
    o = exec({"mi", "Test_Widget.Id=\"w7\"", "Label=NULL", "Size=uint16:3"});
    ASSERT_EQ(o.status, 0) << o.err;
    EXPECT_EQ(o.out, "");
    o = exec({"--props", "Count,Label,Size", "gi", "root/test:Test_Widget.Id=\"w7\""});
    EXPECT_EQ(o.out,
              "// root/test:Test_Widget.Id=\"w7\"\n"
              "instance of Test_Widget {\n"
              "    Id = \"w7\";\n"
              "    Count = 4;\n"
              "    Size = 3;\n"
              "};\n");
    EXPECT_EQ(exec({"di", "Test_Widget.Id=\"w7\""}).status, 0);
    EXPECT_EQ(exec({"di", "Test_Widget.Id=\"w7\""}).status, 1);
}

TEST_F(CliSession, MethodCallsPrintTheReturnValueAndOutputs) {
    // Echo returns its inputs as outputs: the MOF literal of each kind.
    Output o =
        exec({"cm", "Test_Widget.Id=\"w1\"", "Echo", "C=char16:'x'", "S=\"a\\\"b\\\\c\\n\"",
              "B=TRUE", "N=NULL", "A={\"x\", NULL}", "T=\"root/test:Test_Gadget.Name=\\\"g2\\\"\"",
              "W=datetime:\"20240101000000.000000+000\""});
    ASSERT_EQ(o.status, 0) << o.err;
    EXPECT_EQ(o.out,
              "ReturnValue = 7;\n"
              "C = 'x';\n"
              "S = \"a\\\"b\\\\c\\n\";\n"
              "B = true;\n"
              "N = NULL;\n"
              "A = {\"x\", NULL};\n"
              "T = \"root/test:Test_Gadget.Name=\\\"g2\\\"\";\n"
              "W = \"20240101000000.000000+000\";\n");

    o = exec({"im", "Test_Widget.Id=\"w1\"", "ReadManager"});  // the former name
    EXPECT_EQ(o.out, "ReturnValue = \"the manager\";\n");
    o = exec({"cm", "Test_Widget.Id=\"w1\"", "NoSuchMethod"});
    EXPECT_EQ(o.status, 1);
    EXPECT_EQ(o.err.rfind("tvrncli: CMPI_RC_ERR_METHOD_NOT_FOUND (17)", 0), 0u) << o.err;
}

TEST(Cli, RequestsRunAsThePrincipalGiven) {
    EXPECT_EQ(runCli({"cm", "Test_Widget.Id=\"w1\"", "WhoAmI"}).out, "ReturnValue = \"root\";\n");
    EXPECT_EQ(runCli({"--principal", "alice", "cm", "Test_Widget.Id=\"w1\"", "WhoAmI"}).out,
              "ReturnValue = \"alice\";\n");
}

TEST_F(CliSession, PrintsIndicationsForTheGivenTime) {
    Output o = exec({"ind", "Test_Alert", "1"});
    ASSERT_EQ(o.status, 0) << o.err;
    const std::string head = "// root/test:Test_Alert\ninstance of Test_Alert {\n";
    int alerts = 0;
    for (size_t at = o.out.find(head); at != std::string::npos; at = o.out.find(head, at + 1))
        ++alerts;
    EXPECT_EQ(alerts, 3) << o.out;
    EXPECT_NE(o.out.find("    Message = \"alert 2\";\n"), std::string::npos) << o.out;
    EXPECT_EQ(host->indications().size(), 3u);
}

TEST(Cli, SeedsTheStoreFromAFile) {
    char name[] = "/tmp/tvrncli_seed_XXXXXX";
    const int fd = mkstemp(name);
    ASSERT_GE(fd, 0);
    close(fd);
    const std::string seed = name;
    std::ofstream(seed) << "# the object manager\n"
                           "instance root/interop:Test_Manager.Name=\"mgr\" {\n"
                           "    string Description = \"seeded\";\n"
                           "    string Name = \"mgr\";\n"
                           "}\n"
                           "instance Test_Local.Id=1 {\n"
                           "    uint8 Id = 1;\n"
                           "}\n";
    Output o = runCli({"--seed", seed, "cm", "Test_Widget.Id=\"w1\"", "ReadManager"});
    EXPECT_EQ(o.out, "ReturnValue = \"seeded\";\n") << o.err;
    o = runCli({"--seed", seed, "ein", "Test_Local"});  // namespace from -n
    EXPECT_EQ(o.out, "root/test:Test_Local.Id=1\n") << o.err;
    std::remove(seed.c_str());
}

TEST(Cli, AScriptRunsItsLinesInOneProcess) {
    char name[] = "/tmp/tvrncli_script_XXXXXX";
    const int fd = mkstemp(name);
    ASSERT_GE(fd, 0);
    close(fd);
    // What one line creates the next sees; quotes and backslashes as in a
    // shell; per-line options; a failing line does not stop the rest.
    std::ofstream(name) << "# a widget made and read back\n"
                           "\n"
                           "ci Test_Widget.Id=\\\"w9\\\" 'Label=two words'\n"
                           "--props Label gi 'Test_Widget.Id=\"w9\"'\n"
                           "di Test_Widget.Id=\\\"nope\\\"\n"
                           "gi 'unclosed\n"
                           "--seed x ein Test_Widget\n"
                           "ein Test_Gadget\n";
    Output o = runCli({"script", name});
    EXPECT_EQ(o.status, 2);
    EXPECT_EQ(o.out,
              "root/test:Test_Widget.Id=\"w9\"\n"
              "// root/test:Test_Widget.Id=\"w9\"\n"
              "instance of Test_Widget {\n"
              "    Id = \"w9\";\n"
              "    Label = \"two words\";\n"
              "};\n"
              "root/test:Test_Gadget.Name=\"g1\"\n"
              "root/test:Test_Gadget.Name=\"g2\"\n");
    const std::string file = name;
    EXPECT_NE(o.err.find("tvrncli: CMPI_RC_ERR_NOT_FOUND (6)"), std::string::npos) << o.err;
    EXPECT_NE(o.err.find(file + ":6: unclosed '"), std::string::npos) << o.err;
    EXPECT_NE(o.err.find(file + ":7: --module, --reg, --seed, --principal and --no-class-defaults"),
              std::string::npos)
        << o.err;
    std::remove(name);
}

Output runProgram(const std::string& args) {
    const std::string cmd = std::string(TVRN_TEST_BUILD_DIR) + "/bin/tvrncli " + args + " 2>&1";
    Output o{-1, "", ""};
    FILE* p = popen(cmd.c_str(), "r");
    if (!p)
        return o;
    char buf[4096];
    size_t n;
    while ((n = fread(buf, 1, sizeof buf, p)) > 0)
        o.out.append(buf, n);
    const int st = pclose(p);
    o.status = WIFEXITED(st) ? WEXITSTATUS(st) : -1;
    return o;
}

size_t lineCount(const std::string& s) {
    return std::count(s.begin(), s.end(), '\n');
}

TEST(CliProgram, RunsAsAChildProcess) {
    Output o = runProgram("help");
    EXPECT_EQ(o.status, 0);
    EXPECT_EQ(o.out.rfind("usage: tvrncli", 0), 0u) << o.out;
    EXPECT_EQ(o.out.find("\n  im "), std::string::npos) << "the alias is not listed";

    o = runProgram(std::string("--module ") + TVRN_TESTPROV_LIB + " --reg " + TVRN_TESTPROV_REG +
                   " -n root/other ein Test_Gadget");
    EXPECT_EQ(o.status, 0) << o.out;
    EXPECT_EQ(o.out, "root/other:Test_Gadget.Name=\"g1\"\nroot/other:Test_Gadget.Name=\"g2\"\n");

    // Libraries are looked for in the lib/ directory beside the program's
    // bin/ (the default module, or with it the test library's location),
    // where the test library is not.
    o = runProgram(std::string("--reg ") + TVRN_TESTPROV_REG + " -n root/test ein Test_Gadget");
    EXPECT_EQ(o.status, 1);
    EXPECT_NE(o.out.find("cannot load " TVRN_TEST_BUILD_DIR "/bin/../lib/lib"), std::string::npos)
        << o.out;
}

TEST(CliProgram, DescribesTheModulesClasses) {
    Output o = runProgram("--module /nonexistent/lib.so classes");
    EXPECT_EQ(o.status, 0) << o.out;
    EXPECT_EQ(lineCount(o.out), 178u);
    EXPECT_NE(o.out.find("\nTAVRIN_FCPort\n"), std::string::npos);

    o = runProgram("--module /nonexistent/lib.so gc tavrin_fcport");
    EXPECT_EQ(o.status, 0) << o.out;
    EXPECT_EQ(o.out.rfind("class TAVRIN_FCPort : CIM_FCPort {\n", 0), 0u) << o.out;
    EXPECT_EQ(lineCount(o.out), 73u + 2);

    o = runProgram("gc TAVRIN_NoSuchClass");
    EXPECT_EQ(o.status, 1);
    EXPECT_EQ(o.out, "tvrncli: CMPI_RC_ERR_INVALID_CLASS (5): no class TAVRIN_NoSuchClass\n");
}

}  // namespace
}  // namespace hosttest
