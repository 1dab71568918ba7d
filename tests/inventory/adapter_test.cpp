// Adapter inventory: port controllers, physical packages, products and
// software identities of FC HBAs, OEM adapters, CNAs and mezzanine cards.
#include "schema/generated/TAVRIN_AdapterSoftwareIdentity.h"
#include "schema/generated/TAVRIN_PhysicalPackage.h"
#include "schema/generated/TAVRIN_PortController.h"
#include "schema/generated/TAVRIN_Product.h"
#include "tests/inventory/InventoryTestSupport.h"

using namespace CPTA;
using namespace invtest;

namespace {

class Adapters : public InventoryTest {};

// What differs between the adapters whose instances are compared in full.
struct AdapterFacts {
    const char* address;  // DeviceID
    bool cna;
    const char* serial;
    const char* model;
    const char* part;
    const char* sku;
    const char* tag;
    const char* firmware;
};

const AdapterFacts kFcHba = {"200000051e0a0b0c", false, "TVR825A0001", "Tavrin-825", "PN-825-02",
                             "FRU825X2", "10000000-0000-0000-2000-00051e0a0b0c", "3.2.1.0"};
const AdapterFacts kHpOem = {"200000051e5c6d70", false, "8C1234XYZ", "Tavrin-1860", "AJ764A", "",
                             "5f3c9e2a1b4d4e6f8a9b0c1d2e3f4a5b", "3.2.0.5"};
const AdapterFacts kCna = {"00051e8a4b00", true, "TVR1020C0007", "Tavrin-1020", "PN-1020-02",
                           "FRU1020X2", "a1b2c3d4e5f60718293a4b5c6d7e8f90", "3.2.1.0"};
// OEM serial that does not begin with the part number; DELL VPD has no FRU.
const AdapterFacts kDellMezz = {"200000051e7e8f90", false, "CN7M2011AB", "Tavrin-K7M", "0T4X9K", "",
                                "10000000-0000-0000-2000-00051e7e8f90", "3.1.0.2"};

const char* product(const AdapterFacts& a) { return a.cna ? "Tavrin CNA" : "Tavrin FC HBA"; }
std::string title(const AdapterFacts& a) {
    return std::string("TVRN ") + (a.cna ? "Ethernet Adapter " : "Fiber Channel Adapter ") + a.serial;
}

Instance* expectedController(const AdapterFacts& a) {
    TAVRIN_PortController* pc = expected<TAVRIN_PortController>();
    pc->SystemCreationClassName.set(String("TAVRIN_ComputerSystem"));
    pc->SystemName.set(String(kHostAddress));
    pc->CreationClassName.set(String("TAVRIN_PortController"));
    pc->DeviceID.set(String(a.address));
    pc->Name.set(String(a.serial));
    pc->ElementName.set(String(a.serial));
    pc->OperationalStatus.set(u16s({11}));
    pc->StatusDescriptions.set(strings({"The adapter is in service"}));
    pc->EnabledState.set(2);
    pc->Caption.set(String(product(a)));
    pc->Description.set(String(product(a)));
    pc->ControllerType.set(a.cna ? 1 : 4);
    if (a.cna)
        pc->OtherControllerType.set(String("CNA - FC and Ethernet types"));
    return pc;
}

Instance* expectedPackage(const AdapterFacts& a) {
    TAVRIN_PhysicalPackage* pp = expected<TAVRIN_PhysicalPackage>();
    pp->CreationClassName.set(String("TAVRIN_PhysicalPackage"));
    pp->Tag.set(String(a.tag));
    pp->Manufacturer.set(String("TVRN"));
    pp->Caption.set(String(product(a)));
    pp->ElementName.set(String(product(a)));
    pp->Description.set(String(product(a)));
    pp->Name.set(String(title(a).c_str()));
    pp->Model.set(String(a.model));
    pp->SerialNumber.set(String(a.serial));
    pp->PartNumber.set(String(a.part));
    pp->SKU.set(String(a.sku));
    pp->PackageType.set(9);
    return pp;
}

Instance* expectedProduct(const AdapterFacts& a) {
    TAVRIN_Product* p = expected<TAVRIN_Product>();
    p->Name.set(String("TAVRIN CIM Provider"));
    p->IdentifyingNumber.set(String(a.serial));
    p->Vendor.set(String("TVRN"));
    p->Version.set(String(a.firmware));
    p->ElementName.set(String(product(a)));
    p->Caption.set(String(product(a)));
    p->Description.set(String(product(a)));
    return p;
}

Instance* expectedIdentity(const char* id, const std::string& name, const std::string& caption,
                           const char* version, uint16 kind, const std::string& softwareId) {
    TAVRIN_AdapterSoftwareIdentity* si = expected<TAVRIN_AdapterSoftwareIdentity>();
    si->InstanceID.set(String(id));
    si->Name.set(String(name.c_str()));
    si->Caption.set(String(caption.c_str()));
    si->Description.set(String(caption.c_str()));
    si->ElementName.set(String(caption.c_str()));
    si->VersionString.set(String(version));
    si->Classifications.set(u16s({kind}));
    si->IdentityInfoType.set(strings({"SoftwareID", "SoftwareStatus"}));
    si->IdentityInfoValue.set(strings({softwareId.c_str(), "Primary"}));
    si->Manufacturer.set(String("TVRN"));
    return si;
}

TEST_F(Adapters, EveryAdapterKindInFull) {
    Instances controllers(fchba(CID_PORT_CONTROLLER));
    Instances packages(fchba(CID_PHYSICAL_PACKAGE));
    Instances products(fchba(CID_PRODUCT));
    ASSERT_EQ(controllers.size(), 3u);
    ASSERT_EQ(packages.size(), 3u);
    ASSERT_EQ(products.size(), 3u);
    const AdapterFacts* order[] = {&kFcHba, &kHpOem, &kCna};
    for (size_t i = 0; i < 3; i++) {
        SCOPED_TRACE(order[i]->address);
        EXPECT_TRUE(sameInstance(expectedController(*order[i]), controllers[i]));
        EXPECT_TRUE(sameInstance(expectedPackage(*order[i]), packages[i]));
        EXPECT_TRUE(sameInstance(expectedProduct(*order[i]), products[i]));
    }
    EXPECT_GE(logged("INFO", "HP VPD info doesnt have the FRU details to print."), 1);
}

TEST_F(Adapters, SoftwareIdentitiesDriversOncePerEnumerationThenBiosAndFirmware) {
    Instances ids(fchba(CID_ADAPTER_SOFTWARE_IDENTITY));
    EXPECT_EQ(ids.values(&TAVRIN_AdapterSoftwareIdentity::InstanceID),
              (std::vector<std::string>{"tvfc", "200000051e0a0b0c_bios", "200000051e0a0b0c_firmware",
                                        "200000051e5c6d70_bios", "200000051e5c6d70_firmware", "tna",
                                        "00051e8a4b00_bios", "00051e8a4b00_firmware"}));
    auto id = [&](const char* instanceId) {
        return ids.find(&TAVRIN_AdapterSoftwareIdentity::InstanceID, instanceId);
    };
    EXPECT_TRUE(sameInstance(expectedIdentity("tna", "Network driver for Tavrin adapter",
                                              "Network driver", "3.2.1.0", 2,
                                              "Network driver for Tavrin adapter"),
                             id("tna")));
    EXPECT_TRUE(sameInstance(expectedIdentity("tvfc", "Storage driver for Tavrin adapter",
                                              "Storage driver", "3.2.1.0", 2,
                                              "Storage driver for Tavrin adapter"),
                             id("tvfc")));
    EXPECT_TRUE(sameInstance(expectedIdentity("00051e8a4b00_firmware", title(kCna) + " Firmware",
                                              "Firmware for Tavrin CNA", "3.2.1.0", 10, kCna.model),
                             id("00051e8a4b00_firmware")));
    EXPECT_TRUE(sameInstance(expectedIdentity("200000051e5c6d70_bios", title(kHpOem) + " BIOS",
                                              "BIOS for Tavrin FC HBA", "3.2.0.1", 32770,
                                              kHpOem.model),
                             id("200000051e5c6d70_bios")));
}

TEST_F(Adapters, NetworkDriverComesBeforeStorageDriverOnACnaListedFirst) {
    Json::Value fixture = fixtureJson("default");
    Json::Value cna = fixture["adapters"][2];
    fixture["adapters"] = Json::Value(Json::arrayValue);
    fixture["adapters"].append(cna);
    fixture["adapters"].append(fixtureJson("variants")["adapters"][4]);  // a second CNA, not flashed
    loadJson(fixture);
    Instances ids(fchba(CID_ADAPTER_SOFTWARE_IDENTITY));
    EXPECT_EQ(ids.values(&TAVRIN_AdapterSoftwareIdentity::InstanceID),
              (std::vector<std::string>{"tna", "tvfc", "00051e8a4b00_bios", "00051e8a4b00_firmware",
                                        "00051e9c5d00_firmware"}));
}

TEST_F(Adapters, DellMezzanineInFullWithoutBios) {
    load("variants");
    Instances controllers(fchba(CID_PORT_CONTROLLER));
    Instances packages(fchba(CID_PHYSICAL_PACKAGE));
    Instances products(fchba(CID_PRODUCT));
    EXPECT_TRUE(sameInstance(expectedController(kDellMezz), controllers[2]));
    EXPECT_TRUE(sameInstance(expectedPackage(kDellMezz), packages[2]));
    EXPECT_TRUE(sameInstance(expectedProduct(kDellMezz), products[2]));
    // Once per enumeration.
    EXPECT_EQ(logged("INFO", "DELL VPD info doesnt have the FRU details to print."), 3);

    Instances ids(fchba(CID_ADAPTER_SOFTWARE_IDENTITY));
    EXPECT_TRUE(sameInstance(
        expectedIdentity("200000051e7e8f90_firmware", title(kDellMezz) + " Firmware",
                         "Firmware for Tavrin FC HBA", "3.1.0.2", 10, kDellMezz.model),
        ids.find(&TAVRIN_AdapterSoftwareIdentity::InstanceID, "200000051e7e8f90_firmware")));
    EXPECT_EQ(ids.find(&TAVRIN_AdapterSoftwareIdentity::InstanceID, "200000051e7e8f90_bios"), nullptr);
}

// Adapter 1 of the built-in host with changed "hbaData" members.
Json::Value hostWithFirstAdapter(const char* member, const Json::Value& value) {
    Json::Value fixture = fixtureJson("default");
    fixture["adapters"][0]["hbaData"][member] = value;
    return fixture;
}

TEST_F(Adapters, AdapterWithoutPortsYieldsNothing) {
    loadJson(hostWithFirstAdapter("portCount", 0));
    for (classId_t id : {CID_PORT_CONTROLLER, CID_PHYSICAL_PACKAGE, CID_PRODUCT}) {
        Instances got(fchba(id));
        EXPECT_EQ(got.size(), 2u) << "class id " << id;
    }
    Instances ids(fchba(CID_ADAPTER_SOFTWARE_IDENTITY));
    EXPECT_EQ(ids.find(&TAVRIN_AdapterSoftwareIdentity::InstanceID, "200000051e0a0b0c_firmware"),
              nullptr);
    EXPECT_GE(logged("WARN", "There are no ports associated to Adapter id 1"), 1);
}

TEST_F(Adapters, StoppedAdapterIsReportedDisabled) {
    loadJson(hostWithFirstAdapter("hbaStatus", false));
    Instances controllers(fchba(CID_PORT_CONTROLLER));
    auto* pc = controllers.at<TAVRIN_PortController>(0);
    ASSERT_NE(pc, nullptr);
    EXPECT_EQ(pc->OperationalStatus.value, u16s({10}));
    EXPECT_EQ(pc->EnabledState.value, 3);
    EXPECT_EQ(pc->StatusDescriptions.value, strings({"The adapter is disabled"}));
}

TEST_F(Adapters, BiosTextThatIsNotUtf8IsDropped) {
    // Bytes that cannot begin a UTF-8 character, written into the fixture text
    // as they are (a JSON writer would replace them).
    Json::Value fixture = fixtureJson("default");
    fixture["adapters"][0]["firmware"]["biosVersion"] = "BIOS-MARK";
    Json::StreamWriterBuilder writer;
    std::string text = Json::writeString(writer, fixture);
    text.replace(text.find("BIOS-MARK"), 9, "\x80\x81");
    loadText(text);
    Instances ids(fchba(CID_ADAPTER_SOFTWARE_IDENTITY));
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
