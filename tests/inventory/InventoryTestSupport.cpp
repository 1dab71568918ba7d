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
    hostResolves()++;
    if (gMode == HostMode::ADDRESS)
        addresses = {"127.0.1.1", kHostAddress};
    else if (gMode == HostMode::LOOPBACK_ONLY)
        addresses = {"127.0.0.1"};
    return gMode == HostMode::ADDRESS || gMode == HostMode::LOOPBACK_ONLY;
}

const HostLookup kFakeHost = {fakeHostName, fakeDomainName, fakeResolve};

}  // namespace

int& hostResolves() {
    static int resolves = 0;
    return resolves;
}

void setHostMode(HostMode mode) {
    gMode = mode;
}

Instances::~Instances() {
    destroyInstances(_items);
}

void InventoryTest::SetUp() {
    _sim = &gwtest::boundSimulator();  // back to the built-in host
    static ProviderInit init;          // the provider start-up, once per program
    ProviderInit::driverStatus = 0;
    gMode = HostMode::ADDRESS;
    ProviderUtil::setHostLookup(&kFakeHost);
    hostResolves() = 0;
    gwtest::LogCapture::get().mark();
}

void InventoryTest::TearDown() {
    ProviderInit::driverStatus = 0;
}

void InventoryTest::loadJson(const Json::Value& fixture) {
    Json::StreamWriterBuilder writer;
    writer["indentation"] = "";
    _sim->loadFixtureText(Json::writeString(writer, fixture));
}

Json::Value fixtureJson(const char* name) {
    return gwtest::parseJson(
        gwtest::readFile(std::string(TVRN_SIM_FIXTURES) + "/" + name + ".json"));
}

Array<Instance*> InventoryTest::fchba(classId_t id) {
    return FCHBAManager::getFCHBAManager()->getInstances(id);
}

Array<Instance*> InventoryTest::hdr(classId_t id) {
    return HDRManager::getHDRManager()->getInstances(id);
}

}  // namespace invtest
