// Storage extents, logical disks and tape drives behind remote target ports.
#include "schema/generated/TAVRIN_LogicalDisk.h"
#include "schema/generated/TAVRIN_StorageExtent.h"
#include "schema/generated/TAVRIN_TapeDrive.h"
#include "tests/inventory/InventoryTestSupport.h"

using namespace CPTA;
using namespace invtest;

namespace {

class Targets : public InventoryTest {};

const char kDisk3[] = "100000051e0a0b0c_500507680110f00d_ACME_DISK-X_LUN_3";

template <class T>
T* expectedLun(const char* className, const char* description, const char* deviceId,
               const char* element) {
    T* t = expected<T>();
    t->SystemCreationClassName.set(String("TAVRIN_ComputerSystem"));
    t->SystemName.set(String(kHostAddress));
    t->CreationClassName.set(String(className));
    t->DeviceID.set(String(deviceId));
    t->ElementName.set(String(element));
    t->OtherIdentifyingInfo.set(strings({deviceId}));
    t->IdentifyingDescriptions.set(strings({description}));
    t->OperationalStatus.set(u16s({2}));
    return t;
}

TEST_F(Targets, DiskLunsAsStorageExtentsAndLogicalDisksInFull) {
    Instances extents(hdr(CID_STORAGE_EXTENT));
    Instances disks(hdr(CID_LOGICAL_DISK));
    EXPECT_EQ(extents.size(), 11u);
    EXPECT_EQ(disks.size(), 11u);

    auto* se = expectedLun<TAVRIN_StorageExtent>(
        "TAVRIN_StorageExtent", "It is a unique identification for a Storage Extent", kDisk3, "LUN_3");
    se->Name.set(String("ACME+DISK-X+0001"));
    se->NameFormat.set(7);
    se->NameNamespace.set(7);
    EXPECT_TRUE(sameInstance(se, extents.find(&TAVRIN_StorageExtent::DeviceID, kDisk3)));

    const char* disk0 = "100000051e0a0b0c_500507680110f00d_ACME_DISK-X_LUN_0";
    auto* ld = expectedLun<TAVRIN_LogicalDisk>(
        "TAVRIN_LogicalDisk", "It is a unique identification for a Logical Disk", disk0, "LUN_0");
    ld->Name.set(String("600507680180870c2000000000000000"));
    ld->NameFormat.set(1);
    ld->NameNamespace.set(1);
    EXPECT_TRUE(sameInstance(ld, disks.find(&TAVRIN_LogicalDisk::DeviceID, disk0)));
    // A logical disk without a description has an empty name.
    EXPECT_STREQ(disks.find(&TAVRIN_LogicalDisk::DeviceID, kDisk3)->Name.value.c_str(), "");
}

TEST_F(Targets, StorageExtentNameByKindOfDescription) {
    struct Case {
        std::string deviceId;
        const char* name;
        int format;  // -1: null
        int nameSpace;
    };
    const char* a = "100000051e0a0b0c_500507680110f00d_ACME_DISK-X_LUN_";
    const char* b = "100000051e5c6d70_500601603ba01234_STORCO_ARRAY-9000_LUN_";
    const std::string s(a), t(b);
    const Case cases[] = {
        {s + "0", "600507680180870c2000000000000000", 9, 2},
        {s + "1", "0050768010f00d01", 10, 3},
        {s + "2", "Unable To Fetch", 0, 0},
        {t + "1", "STORCO  ARRAY-9000 SN0B", 1, 1},
        {t + "2", "STORCO+ARRAY-9000+SN0C", 7, 7},
        {t + "4", "STORCO-ARRAY-9000-T10-0004", 11, 4},
        {t + "5", "", -1, -1},
    };
    Instances extents(hdr(CID_STORAGE_EXTENT));
    for (const Case& c : cases) {
        SCOPED_TRACE(c.deviceId);
        auto* se = extents.find(&TAVRIN_StorageExtent::DeviceID, c.deviceId);
        ASSERT_NE(se, nullptr);
        EXPECT_STREQ(se->Name.value.c_str(), c.name);
        EXPECT_EQ(se->NameFormat.null != 0, c.format < 0);
        EXPECT_EQ(se->NameNamespace.null != 0, c.nameSpace < 0);
        if (c.format >= 0) {
            EXPECT_EQ(se->NameFormat.value, c.format);
            EXPECT_EQ(se->NameNamespace.value, c.nameSpace);
        }
    }
    // LUN 3 of the second adapter has no product and is skipped.
    EXPECT_EQ(logged("ERR", "LUN info is NOT available"), 1);
    EXPECT_EQ(logged("ERR", "Default idType. Should not have reached here. "), 1);
}

TEST_F(Targets, TapeAndMediaChangerTargetsGiveTapeDrivesOnly) {
    Instances tapes(hdr(CID_TAPE_DRIVE));
    EXPECT_EQ(tapes.values(&TAVRIN_TapeDrive::DeviceID),
              (std::vector<std::string>{
                  "100000051e0a0b0c_500110a0002b3c01_TAPECO_LTO-8_LUN_0",
                  "100000051e0a0b0c_500110a0002b3c02_TAPECO_TL2000 CHANGER_LUN_0",
                  "100000051e0a0b0c_500110a0002b3c02_TAPECO_TL2000 CHANGER_LUN_1"}));
    const char* changer1 = "100000051e0a0b0c_500110a0002b3c02_TAPECO_TL2000 CHANGER_LUN_1";
    auto* td = expectedLun<TAVRIN_TapeDrive>(
        "TAVRIN_TapeDrive", "It is a unique identification for a Tape Drive", changer1, "LUN_1");
    td->Name.set(String("TAPECO  TL2000 CHANGER  MC0001"));
    EXPECT_TRUE(sameInstance(td, tapes.find(&TAVRIN_TapeDrive::DeviceID, changer1)));
    EXPECT_STREQ(tapes.at<TAVRIN_TapeDrive>(0)->Name.value.c_str(), "TAPECO+LTO-8+TP0001");

    Instances extents(hdr(CID_STORAGE_EXTENT));
    for (const std::string& id : extents.values(&TAVRIN_StorageExtent::DeviceID))
        EXPECT_EQ(id.find("500110a0002b3c0"), std::string::npos) << id;
}

TEST_F(Targets, LunEntriesMissingMembersAreSkippedOneByOne) {
    Json::Value fixture = fixtureJson("default");
    Json::Value& luns = fixture["adapters"][0]["fcPorts"][0]["remotePorts"][0]["lunList"];
    const char* bad[] = {
        R"({"number": 7, "productID": "DISK-X"})",                      // no vendor
        R"({"number": "8", "vendor": "ACME", "productID": "DISK-X"})",  // number as text
        R"({"number": 9, "vendor": "ACME", "productID": 17})",          // product as number
        R"({"number": 10, "vendor": ["ACME"], "productID": "DISK-X"})", // vendor as array
        R"({"number": 11, "vendor": "ACME", "productID": "DISK-X",
            "lunDescription": 5, "productSerialNumber": {"x": 1}})",    // both of the wrong type
    };
    for (const char* text : bad)
        luns.append(gwtest::parseJson(text));
    loadJson(fixture);

    Instances extents(hdr(CID_STORAGE_EXTENT));
    EXPECT_EQ(extents.size(), 12u);  // the 11 of the host and LUN 11
    auto* lun11 = extents.find(&TAVRIN_StorageExtent::ElementName, "LUN_11");
    ASSERT_NE(lun11, nullptr);
    EXPECT_STREQ(lun11->Name.value.c_str(), "Unable To Fetch");
    EXPECT_EQ(logged("ERR", "LUN info is NOT available"), 1 + 4);
}

}  // namespace
