#include "tests/inventory/InventoryTestSupport.h"

#include <cstring>
#include <vector>

#include "gateway/CIMProviderTfaj.h"
#include "gateway/ProviderInit.h"
#include "inventory/FCHBAManager.h"
#include "inventory/InventoryCommon.h"
#include "tests/gateway/BoundSimulator.h"

using namespace CPTA;

namespace invtest {

const char kHostAddress[] = "10.20.30.40";

namespace {

HostMode gMode = HostMode::ADDRESS;

int fakeHostName(char* name, size_t length) {
    if (gMode == HostMode::NO_NAME)
        return -1;
    strlcpy(name, "invhost", length);
    return 0;
}

int fakeDomainName(char* name, size_t length) {
    strlcpy(name, "example.test", length);
    return 0;
}

bool fakeResolve(const char*, std::vector<std::string>& addresses) {
    hostCounters().resolves++;
    switch (gMode) {
    case HostMode::ADDRESS:
        addresses = {"127.0.1.1", kHostAddress};
        return true;
    case HostMode::LOOPBACK_ONLY:
        addresses = {"127.0.0.1"};
        return true;
    default:
        return false;
    }
}

const HostLookup kFakeHost = {fakeHostName, fakeDomainName, fakeResolve};

// The provider start-up, once per program, against the simulator.
void startProvider() {
    static bool started = [] {
        gwtest::boundSimulator();
        static ProviderInit init;
        return true;
    }();
    (void)started;
}

}  // namespace

HostCounters& hostCounters() {
    static HostCounters counters;
    return counters;
}

void setHostMode(HostMode mode) { gMode = mode; }

Instances::~Instances() { destroyInstances(_items); }

void InventoryTest::SetUp() {
    startProvider();
    _sim = &gwtest::boundSimulator();  // back to the built-in host
    ProviderInit::driverStatus = 0;
    gMode = HostMode::ADDRESS;
    ProviderUtil::setHostLookup(&kFakeHost);
    hostCounters() = HostCounters();
    gwtest::LogCapture::get().mark();
}

void InventoryTest::TearDown() {
    ProviderInit::driverStatus = 0;
    gMode = HostMode::ADDRESS;
}

void InventoryTest::loadJson(const Json::Value& fixture) {
    Json::StreamWriterBuilder writer;
    writer["indentation"] = "";
    _sim->loadFixtureText(Json::writeString(writer, fixture));
}

Json::Value fixtureJson(const char* name) {
    return gwtest::parseJson(gwtest::readFile(std::string(TVRN_SIM_FIXTURES) + "/" + name + ".json"));
}

Array<Instance*> InventoryTest::fchba(classId_t id) {
    return FCHBAManager::getFCHBAManager()->getInstances(id);
}

Array<Instance*> InventoryTest::hdr(classId_t id) {
    return HDRManager::getHDRManager()->getInstances(id);
}

}  // namespace invtest
