// tvrncli: its commands run in-process against the test provider (output
// compared verbatim), and the installed program run as a child process.
#include <sys/wait.h>
#include <unistd.h>

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

std::vector<std::string> withModule(std::vector<std::string> args)
{
    args.insert(args.begin(), {"--module", TVRN_TESTPROV_LIB, "--reg", TVRN_TESTPROV_REG, "-n",
                               "root/test"});
    return args;
}

Output runCli(const std::vector<std::string> &args)
{
    std::ostringstream out, err;
    const int st = cli::run(withModule(args), out, err, cli::Defaults{});
    return Output{st, out.str(), err.str()};
}

// Commands against one loaded host, so that changes persist between them.
class CliSession : public HostFixture {
protected:
    Output exec(const std::vector<std::string> &args)
    {
        std::ostringstream out, err;
        const int st = cli::execute(*host, cli::parseInvocation(withModule(args), {}), out, err);
        return Output{st, out.str(), err.str()};
    }
};

TEST(Cli, EnumeratesAndGets)
{
    Output o = runCli({"ein", "Test_Gadget"});
    EXPECT_EQ(o.status, 0) << o.err;
    EXPECT_EQ(o.out, "root/test:Test_Gadget.Name=\"g1\"\nroot/test:Test_Gadget.Name=\"g2\"\n");

    o = runCli({"--props", "Weight", "ei", "Test_Gadget"});
    EXPECT_EQ(o.out,
              "instance root/test:Test_Gadget.Name=\"g1\" {\n"
              "    string Name = \"g1\";\n"
              "    uint32 Weight = 5;\n"
              "}\n"
              "\n"
              "instance root/test:Test_Gadget.Name=\"g2\" {\n"
              "    string Name = \"g2\";\n"
              "    uint32 Weight = 7;\n"
              "}\n");

    o = runCli({"--props", "Size", "gi", "Test_Widget.Id=\"w2\""});
    EXPECT_EQ(o.out,
              "instance root/test:Test_Widget.Id=\"w2\" {\n"
              "    string Id = \"w2\";\n"
              "    uint16 Size = 20;\n"
              "}\n");
}

TEST(Cli, FailuresExitNonZeroWithTheCodeName)
{
    Output o = runCli({"gi", "Test_Widget.Id=\"zz\""});
    EXPECT_EQ(o.status, 1);
    EXPECT_EQ(o.err, "tvrncli: CMPI_RC_ERR_NOT_FOUND: no widget zz\n");
    EXPECT_EQ(o.out, "");

    o = runCli({"ei", "Nope"});
    EXPECT_EQ(o.status, 1);
    EXPECT_EQ(o.err.rfind("tvrncli: CMPI_RC_ERR_INVALID_CLASS", 0), 0u) << o.err;

    struct Usage {
        std::vector<std::string> args;
        const char *message;
    } usage[] = {
        {{"frobnicate"}, "unknown command"},
        {{"gi"}, "wrong number of arguments"},
        {{"gi", "1bad"}, "bad class name"},
        {{"ci", "Test_Widget.Id=\"w9\"", "Size=uint8:300"}, "Size: "},
        {{"ai", "Test_Widget.Id=\"w1\"", "--colour", "red"}, "unknown option --colour"},
        {{"--seed"}, "--seed needs a value"},
    };
    for (const auto &u : usage) {
        SCOPED_TRACE(u.message);
        o = runCli(u.args);
        EXPECT_EQ(o.status, 2);
        EXPECT_NE(o.err.find(u.message), std::string::npos) << o.err;
    }
    std::ostringstream out, err;
    EXPECT_EQ(cli::run({"--module", "/nonexistent/libtvrnprovider.so", "--reg", TVRN_TESTPROV_REG,
                        "ein", "Test_Gadget"},
                       out, err, {}),
              1);
    EXPECT_NE(err.str().find("cannot load /nonexistent/libtvrnprovider.so"), std::string::npos);
}

TEST_F(CliSession, CreateModifyDeleteWithTypedValues)
{
    Output o = exec({"ci", "Test_Widget.Id=\"w7\"", "Count=uint32:4", "Label=hello world"});
    ASSERT_EQ(o.status, 0) << o.err;
    EXPECT_EQ(o.out, "root/test:Test_Widget.Id=\"w7\"\n");
    o = exec({"mi", "Test_Widget.Id=\"w7\"", "Label=NULL", "Size=uint16:3"});
    ASSERT_EQ(o.status, 0) << o.err;
    o = exec({"--props", "Count,Label,Size", "gi", "root/test:Test_Widget.Id=\"w7\""});
    EXPECT_EQ(o.out,
              "instance root/test:Test_Widget.Id=\"w7\" {\n"
              "    uint32 Count = 4;\n"
              "    string Id = \"w7\";\n"
              "    string Label = NULL;\n"
              "    uint16 Size = 3;\n"
              "}\n");
    EXPECT_EQ(exec({"di", "Test_Widget.Id=\"w7\""}).status, 0);
    EXPECT_EQ(exec({"di", "Test_Widget.Id=\"w7\""}).status, 1);
}

TEST_F(CliSession, AssociationsAndMethods)
{
    Output o = exec({"ain", "Test_Gadget.Name=\"g1\"", "--result-class", "Test_Widget", "--role",
                     "Gadget"});
    EXPECT_EQ(o.out, "root/test:Test_Widget.Id=\"w1\"\nroot/test:Test_Widget.Id=\"w2\"\n");
    o = exec({"rin", "Test_Widget.Id=\"w2\"", "--assoc", "Test_WidgetGadget"});
    EXPECT_EQ(o.out,
              "root/test:Test_WidgetGadget.Gadget=\"root/test:Test_Gadget.Name=\\\"g1\\\"\","
              "Widget=\"root/test:Test_Widget.Id=\\\"w2\\\"\"\n");
    o = exec({"--props", "Weight", "ai", "Test_Widget.Id=\"w2\""});
    EXPECT_EQ(o.out,
              "instance root/test:Test_Gadget.Name=\"g1\" {\n"
              "    string Name = \"g1\";\n"
              "    uint32 Weight = 5;\n"
              "}\n");

    o = exec({"im", "Test_Widget.Id=\"w1\"", "Describe",
              "Target=\"root/test:Test_Gadget.Name=\\\"g2\\\"\"",
              "When=datetime:\"20240101000000.000000+000\"", "Values=uint16[]:{1,2,3}"});
    ASSERT_EQ(o.status, 0) << o.err;
    EXPECT_EQ(o.out,
              "string ReturnValue = \"Test_Gadget keys=1 when=20240101000000.000000+000 "
              "interval=0 sum=6\";\n"
              "uint16[] Doubled = {2, 4, 6};\n"
              "datetime Later = \"20240101000001.000000+000\";\n"
              "ref Target = \"root/test:Test_Gadget.Name=\\\"g2\\\"\";\n");
    o = exec({"im", "Test_Widget.Id=\"w1\"", "ReadManager"});
    EXPECT_EQ(o.out, "string ReturnValue = \"the manager\";\n");
}

TEST_F(CliSession, PrintsIndicationsForTheGivenTime)
{
    Output o = exec({"ind", "Test_Alert", "1"});
    ASSERT_EQ(o.status, 0) << o.err;
    std::istringstream lines(o.out);
    std::string line;
    int headers = 0;
    while (std::getline(lines, line))
        headers += line == "// root/test";
    EXPECT_EQ(headers, 3) << o.out;
    EXPECT_EQ(parseInstances(o.out).size(), 3u);  // the output reads back
    EXPECT_TRUE(host->indications().size() == 3);
}

TEST(Cli, SeedsTheStoreFromAFile)
{
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
    Output o = runCli({"--seed", seed, "im", "Test_Widget.Id=\"w1\"", "ReadManager"});
    EXPECT_EQ(o.out, "string ReturnValue = \"seeded\";\n") << o.err;
    o = runCli({"--seed", seed, "ein", "Test_Local"});  // namespace from -n
    EXPECT_EQ(o.out, "root/test:Test_Local.Id=1\n") << o.err;
    std::remove(seed.c_str());
}

Output runProgram(const std::string &args)
{
    const std::string cmd = std::string(TVRN_TEST_BUILD_DIR) + "/bin/tvrncli " + args + " 2>&1";
    Output o{-1, "", ""};
    FILE *p = popen(cmd.c_str(), "r");
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

TEST(CliProgram, RunsAsAChildProcess)
{
    Output o = runProgram("help");
    EXPECT_EQ(o.status, 0);
    EXPECT_EQ(o.out.rfind("usage: tvrncli", 0), 0u) << o.out;

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

}  // namespace
}  // namespace hosttest
