// InstallFromURI of the firmware update service, through the embedded host on
// the adapter-library simulator: what is refused, and images from a real TFTP
// server. An install from a file, the service's instances and associations
// are in tests/golden/software_update.golden; installs that overlap are
// helper_test.cpp's.
#include <gtest/gtest.h>

#include <sys/stat.h>
#include <unistd.h>

#include <cstdlib>
#include <string>
#include <vector>

#include "tests/e2e/Module_Session.h"
#include "tests/gateway/TestSupport.h"
#include "tests/gateway/Tftpd.h"

using namespace tvrne2e;
using gwtest::readFile;
using gwtest::ScratchDir;
using gwtest::writeFile;
using tvrnhost::Type;
using tvrnhost::Value;

namespace {

const char kService[] =
    "TAVRIN_HBASoftwareInstallationService.CreationClassName="
    "\"TAVRIN_HBASoftwareInstallationService\",Name=\"Tavrin Adapter Software Update "
    "Service\",SystemCreationClassName=\"TAVRIN_ComputerSystem\",SystemName=\"<host>\"";

// An FC HBA of the simulator's built-in host, and the firmware it starts with.
const char kHba[] = "200000051e0a0b0c";
const char kFirmwareAtStart[] = "3.2.1.0";

const unsigned kDone = 0, kFailed = 2;

// An image that the simulator flashes as `version` (or refuses with a
// non-zero `status`), padded with blanks to `size` bytes.
std::string image(const std::string& version, size_t size = 0, int status = 0) {
    std::string s =
        "{\"version\": \"" + version + "\", \"status\": " + std::to_string(status) + "}";
    for (size_t i = 0; s.size() < size; i++)
        s.push_back(" \n\t\r"[i % 4]);
    return s;
}

unsigned install(Module_Session& s, const std::string& uri, const std::string& adapter = kHba,
                 const std::vector<std::uint16_t>& options = {5}) {
    std::vector<Value> optionValues;
    for (std::uint16_t o : options)
        optionValues.push_back(Value::uint16(o));
    const std::string target =
        "TAVRIN_PortController.CreationClassName=\"TAVRIN_PortController\",DeviceID=\"" + adapter +
        "\",SystemCreationClassName=\"TAVRIN_ComputerSystem\",SystemName=\"<host>\"";
    MethodResult r = s.invoke(s.path(kService), "InstallFromURI",
                              {{"URI", Value::string(uri)},
                               {"Target", Value::reference(s.path(target))},
                               {"InstallOptions", Value::array(Type::Uint16, optionValues)}});
    EXPECT_TRUE(r.ok()) << r.toString();
    return unsigned(r.returnValue.asUint());
}

std::string firmware(Module_Session& s, const std::string& adapter) {
    InstanceResult r =
        s.get(s.path("TAVRIN_AdapterSoftwareIdentity.InstanceID=\"" + adapter + "_firmware\""));
    const Value* v = r.ok() ? r.instance.get("VersionString") : nullptr;
    return v == nullptr || v->isNull() ? "NULL" : v->asString();
}

// The module fetches into its download directory, the process's working
// directory: each TFTP test runs in a scratch directory of its own.
class InDirectory {
public:
    explicit InDirectory(const std::string& dir) {
        char previous[4096];
        _previous = getcwd(previous, sizeof previous) != nullptr ? previous : "/";
        EXPECT_EQ(chdir(dir.c_str()), 0) << dir;
    }
    ~InDirectory() { EXPECT_EQ(chdir(_previous.c_str()), 0); }

private:
    std::string _previous;
};

class Install : public ::testing::Test {
protected:
    void SetUp() override { ASSERT_TRUE(session.loaded()); }
    // A real TFTP server (in.tftpd) on loopback.
    void startServer(gwtest::Tftpd& server) {
        if (std::getenv("TVRN_TEST_NO_TFTPD") != nullptr)
            GTEST_SKIP() << "TVRN_TEST_NO_TFTPD is set";
        std::string why;
        ASSERT_TRUE(server.start(why)) << why;
    }

    Module_Session& session = Module_Session::open();
    ScratchDir files;
};

TEST_F(Install, RefusedRequestsFlashNothing) {
    writeFile(files / "fw.json", image("9.1.0"));
    writeFile(files / "refused.json", image("9.1.0", 0, 5));
    ASSERT_EQ(mkdir((files / "images.d").c_str(), 0755), 0);
    const std::string good = "file://" + files / "fw.json";
    struct Case {
        const char* what;
        std::string uri;
        std::string adapter;
        std::vector<std::uint16_t> options;
        unsigned long long flashes;
    } cases[] = {
        {"missing file", "file://" + files / "absent.json", kHba, {5}, 0},
        {"directory", "file://" + files / "images.d", kHba, {5}, 0},
        {"device", "file:///dev/null", kHba, {5}, 0},
        {"scheme in capitals", "FILE://" + files / "fw.json", kHba, {5}, 0},
        {"http", "http://127.0.0.1/fw.json", kHba, {5}, 0},
        {"unknown option", good, kHba, {3}, 0},
        {"no option", good, kHba, {}, 0},
        {"one-character TFTP server", "tftp://a/fw.json", kHba, {5}, 0},
        {"empty TFTP path", "tftp://127.0.0.1/", kHba, {5}, 0},
        {"unknown target", good, "200000051e0a0bff", {4}, 0},
        {"flash answers failure", "file://" + files / "refused.json", kHba, {4}, 1},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.what);
        session.resetCounters();
        EXPECT_EQ(install(session, c.uri, c.adapter, c.options), kFailed);
        EXPECT_EQ(session.calls("adapterUpdateFlash"), c.flashes);
        EXPECT_EQ(firmware(session, kHba), kFirmwareAtStart);
    }
}

// The image is fetched into the download directory under the last part of
// its name, and that copy, byte for byte the served file, is what is flashed.
// Names a shell would act on (creating X and Y) run nothing and write nothing
// elsewhere.
TEST_F(Install, TftpImageIsTheServedFileAndHostileNamesRunNothing) {
    gwtest::Tftpd server;
    startServer(server);
    const std::string name = "fw;touch X$(touch Y).json";
    const std::string served = image("9.2.0", 3000);  // several blocks, the last one short
    server.addFile("images/" + name, served);
    server.addFile("escape.json", image("9.4.0"));
    InDirectory downloads(files.path());
    session.resetCounters();
    EXPECT_EQ(install(session, "tftp://" + server.address() + ";touch X$(touch Y)/escape.json"),
              kFailed);
    EXPECT_EQ(install(session, "tftp://" + server.address() + "/../escape.json"), kFailed);
    EXPECT_EQ(session.calls("adapterUpdateFlash"), 0u);
    EXPECT_FALSE(gwtest::fileExists(files / "../escape.json"));
    EXPECT_EQ(install(session, "tftp://" + server.address() + "/images/" + name), kDone);
    EXPECT_EQ(firmware(session, kHba), "9.2.0");
    EXPECT_EQ(files.entries(), std::vector<std::string>{name});
    EXPECT_TRUE(readFile(files / name) == served);
}

}  // namespace
