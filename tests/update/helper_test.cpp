// SoftwareUpdateHelper called directly from several threads, as a binding
// that does not serialise a provider's requests would call it: installs that
// overlap on one adapter or on one download name. The library is the
// simulator, bound in this process.
#include <gtest/gtest.h>

#include <chrono>
#include <cstdlib>
#include <string>
#include <thread>

#include "framework/Instance.h"
#include "gateway/CIMProviderTfaj.h"
#include "gateway/ProviderUtil.h"
#include "simulator/SimControl.h"
#include "tests/gateway/BoundSimulator.h"
#include "tests/gateway/Tftpd.h"
#include "update/SoftwareUpdateHelper.h"

using namespace CPTA;
using gwtest::ScratchDir;
using gwtest::writeFile;

namespace {

// Two FC HBAs of the simulator's built-in host.
const char kHba[] = "200000051e0a0b0c";
const char kHbaIndex[] = "20:00:00:05:1e:0a:0b:0c";
const char kOtherHba[] = "200000051e5c6d70";
const char kOtherHbaIndex[] = "20:00:00:05:1e:5c:6d:70";
const uint16 kUpdate = INSTALL_OPTION_UPDATE;

Instance* controller(const char* deviceId) {
    auto* pc = create<TAVRIN_PortController>(true);
    pc->SystemCreationClassName.set(String("TAVRIN_ComputerSystem"));
    pc->SystemName.set(String("testhost"));
    pc->CreationClassName.set(String("TAVRIN_PortController"));
    pc->DeviceID.set(String(deviceId));
    return pc;
}

// Stands in for the dispatcher.
Array<Instance*> controllers(classId_t) {
    Array<Instance*> out;
    out.append(controller(kHba));
    out.append(controller(kOtherHba));
    return out;
}

std::string image(const std::string& version) {
    return "{\"version\": \"" + version + "\"}";
}

std::string firmware(const char* index) {
    Json::Value request(Json::objectValue);
    request["wwn"] = index;
    return libGetHbaByWwn(request)["firmware"]["version"].asString();
}

class OverlappingInstalls : public ::testing::Test {
protected:
    void SetUp() override { sim = &gwtest::boundSimulator(); }
    void TearDown() override { ProviderUtil::setTftpDownloadDir("."); }

    uint32 install(const std::string& uri, const char* adapter) {
        Property<String> uriArgument;
        uriArgument.set(String(uri.c_str()));
        Property<Array<uint16>> options;
        options.set(Array<uint16>(&kUpdate, 1));
        Instance* target = controller(adapter);
        const uint32 result =
            SoftwareUpdateHelper::getSoftwareUpdateHelperInstance()->installFromURI(
                uriArgument, target, options, controllers);
        destroy(target);
        return result;
    }
    // Waits (at most 10 s) until the library has been asked to flash once.
    bool flashing() {
        for (int i = 0; i < 2000 && sim->calls("adapterUpdateFlash") == 0; i++)
            std::this_thread::sleep_for(std::chrono::milliseconds(5));
        return sim->calls("adapterUpdateFlash") > 0;
    }
    // Makes the first flash of `index` read its file only after half a second.
    void slowFlash(const char* index) {
        sim->setFault("adapterUpdateFlash", index, TVRN_SIM_FAULT_DELAY, 500, nullptr, 1);
    }

    gwtest::SimLibrary* sim = nullptr;
    ScratchDir files;
};

TEST_F(OverlappingInstalls, SecondInstallOnABusyAdapterIsRefused) {
    writeFile(files / "first.json", image("7.0.1"));
    writeFile(files / "second.json", image("7.0.2"));
    slowFlash(kHbaIndex);
    uint32 first = INSTALL_FAILED;
    std::thread a([&] { first = install("file://" + files / "first.json", kHba); });
    ASSERT_TRUE(flashing());
    EXPECT_EQ(install("file://" + files / "second.json", kHba), uint32(INSTALL_TARGET_IN_USE));
    a.join();
    EXPECT_EQ(first, uint32(INSTALL_DONE));
    EXPECT_EQ(sim->calls("adapterUpdateFlash"), 1u);
    EXPECT_EQ(firmware(kHbaIndex), "7.0.1");
    // Free again once the first install is over.
    EXPECT_EQ(install("file://" + files / "second.json", kHba), uint32(INSTALL_DONE));
    EXPECT_EQ(firmware(kHbaIndex), "7.0.2");
}

TEST_F(OverlappingInstalls, DownloadsOfOneNameWaitForTheFlashBeforeThem) {
    if (std::getenv("TVRN_TEST_NO_TFTPD") != nullptr)
        GTEST_SKIP() << "TVRN_TEST_NO_TFTPD is set";
    gwtest::Tftpd one, two;
    std::string why;
    ASSERT_TRUE(one.start(why) && two.start(why)) << why;
    one.addFile("fw.json", image("8.0.1"));
    two.addFile("fw.json", image("8.0.2"));
    ProviderUtil::setTftpDownloadDir(files.path().c_str());
    // A download of the same name during this delay would hand the first
    // flash the other image.
    slowFlash(kHbaIndex);
    uint32 first = INSTALL_FAILED, second = INSTALL_FAILED;
    std::thread a([&] { first = install("tftp://" + one.address() + "/fw.json", kHba); });
    ASSERT_TRUE(flashing());
    std::thread b([&] { second = install("tftp://" + two.address() + "/fw.json", kOtherHba); });
    a.join();
    b.join();
    EXPECT_EQ(first, uint32(INSTALL_DONE));
    EXPECT_EQ(second, uint32(INSTALL_DONE));
    EXPECT_EQ(firmware(kHbaIndex), "8.0.1");
    EXPECT_EQ(firmware(kOtherHbaIndex), "8.0.2");
}

}  // namespace
