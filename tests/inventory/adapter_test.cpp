// Adapters: what the golden files' whole instances cannot show (driver order,
// adapters without ports or stopped, text that is not UTF-8, missing members).
#include "schema/generated/TAVRIN_AdapterSoftwareIdentity.h"
#include "schema/generated/TAVRIN_PortController.h"
#include "schema/generated/TAVRIN_Product.h"
#include "tests/inventory/InventoryTestSupport.h"

using namespace CPTA;
using namespace invtest;

namespace {

class Adapters : public InventoryTest {
protected:
    // Adapter 1 of the built-in host with one "hbaData" member changed.
    void loadWithFirstAdapter(const char* member, const Json::Value& value) {
        Json::Value fixture = fixtureJson("default");
        fixture["adapters"][0]["hbaData"][member] = value;
        loadJson(fixture);
    }
    Instances identities() { return Instances(fchba(CID_ADAPTER_SOFTWARE_IDENTITY)); }
};

TEST_F(Adapters, NetworkDriverComesBeforeStorageDriverOnACnaListedFirst) {
    Json::Value fixture = fixtureJson("default");
    Json::Value cna = fixture["adapters"][2];
    fixture["adapters"] = Json::Value(Json::arrayValue);
    fixture["adapters"].append(cna);
    fixture["adapters"].append(
        fixtureJson("variants")["adapters"][4]);  // a second CNA, not flashed
    loadJson(fixture);
    EXPECT_EQ(identities().values(&TAVRIN_AdapterSoftwareIdentity::InstanceID),
              (std::vector<std::string>{"tna", "tvfc", "00051e8a4b00_bios", "00051e8a4b00_firmware",
                                        "00051e9c5d00_firmware"}));
}

TEST_F(Adapters, DellMezzanineHasFirmwareButNoBios) {
    load("variants");
    Instances ids = identities();
    EXPECT_NE(ids.find(&TAVRIN_AdapterSoftwareIdentity::InstanceID, "200000051e7e8f90_firmware"),
              nullptr);
    EXPECT_EQ(ids.find(&TAVRIN_AdapterSoftwareIdentity::InstanceID, "200000051e7e8f90_bios"),
              nullptr);
}

TEST_F(Adapters, AdapterWithoutPortsYieldsNothing) {
    loadWithFirstAdapter("portCount", 0);
    for (classId_t id : {CID_PORT_CONTROLLER, CID_PHYSICAL_PACKAGE, CID_PRODUCT})
        EXPECT_EQ(Instances(fchba(id)).size(), 2u) << "class id " << id;
    EXPECT_EQ(
        identities().find(&TAVRIN_AdapterSoftwareIdentity::InstanceID, "200000051e0a0b0c_firmware"),
        nullptr);
    EXPECT_GE(logged("WARN", "There are no ports associated to Adapter id 1"), 1);
}

TEST_F(Adapters, StoppedAdapterIsReportedDisabled) {
    loadWithFirstAdapter("hbaStatus", false);
    Instances controllers(fchba(CID_PORT_CONTROLLER));
    auto* pc = controllers.at<TAVRIN_PortController>(0);
    ASSERT_NE(pc, nullptr);
    ASSERT_EQ(pc->OperationalStatus.value.size(), 1u);
    EXPECT_EQ(pc->OperationalStatus.value[0], 10);
    EXPECT_EQ(pc->EnabledState.value, 3);
    EXPECT_EQ(pc->StatusDescriptions.value, strings({"The adapter is disabled"}));
}

TEST_F(Adapters, BiosTextThatIsNotUtf8IsDropped) {
    // Bytes that cannot begin a UTF-8 character, written into the fixture text
    // as they are (a JSON writer would replace them).
    Json::Value fixture = fixtureJson("default");
    fixture["adapters"][0]["firmware"]["biosVersion"] = "BIOS-MARK";
    std::string text = Json::writeString(Json::StreamWriterBuilder(), fixture);
    text.replace(text.find("BIOS-MARK"), 9, "\x80\x81");
    sim().loadFixtureText(text);
    Instances ids = identities();
    auto* bios = ids.find(&TAVRIN_AdapterSoftwareIdentity::InstanceID, "200000051e0a0b0c_bios");
    ASSERT_NE(bios, nullptr);
    EXPECT_STREQ(bios->VersionString.value.c_str(), "");
}

TEST_F(Adapters, AdapterWhoseDriverNamesNoDriverStillYieldsEmptyFields) {
    fault("getHbaByWwn", "20:00:00:05:1e:0a:0b:0c", TVRN_SIM_FAULT_DROP_MEMBER,
          "driver.storageDriverName");
    Instances products(fchba(CID_PRODUCT));
    ASSERT_EQ(products.size(), 3u);
    auto* p = products.at<TAVRIN_Product>(0);
    EXPECT_STREQ(p->IdentifyingNumber.value.c_str(), "");
    EXPECT_STREQ(p->Vendor.value.c_str(), "");
    EXPECT_STREQ(p->Version.value.c_str(), "");
}

}  // namespace
