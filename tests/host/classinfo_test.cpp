// Classes as tvrncli's `gc` prints them: the module's repository and a class
// made here with a feature of every kind. The whole catalog is read through
// the built program in cli_test.cpp.
#include <gtest/gtest.h>

#include <algorithm>

#include "framework/Meta_Lookup.h"
#include "host/classinfo.h"
#include "schema/Repository.h"

using namespace CPTA;
using namespace tvrnhost;

namespace {

TEST(RepositoryClasses, AnAssociationWithItsQualifiers) {
    const Meta_Class* mc = find_meta_class(&schema_repository, "CIM_Component");
    ASSERT_NE(mc, nullptr);
    EXPECT_EQ(classinfo::classMof(*mc),
              "[Abstract, Aggregation, Association]\n"
              "class CIM_Component {\n"
              "    [Aggregate, Key] CIM_ManagedElement REF GroupComponent;\n"
              "    [Key] CIM_ManagedElement REF PartComponent;\n"
              "};\n");
}

// A root class with a feature of every kind and a default of every storage
// form, and a subclass of it.
const Meta_Value_Scalar<const char*> kText = {"say \"hi\""};
const Meta_Value_Scalar<const char*> kWait = {"00000000000500.000000:000"};
const Meta_Value_Scalar<boolean> kOn = {true};
const Meta_Value_Scalar<char16> kLetter = {char16('x')};
const Meta_Value_Scalar<real32> kRatio = {0.25f};
const Meta_Value_Scalar<sint8> kLow = {-3};
const Meta_Value_Scalar<uint64> kHigh = {18446744073709551615ull};
const uint16 kCodes[] = {2, 3, 5};
const Meta_Value_Array<uint16> kCodesDefault = {kCodes, 3};
const char* const kNames[] = {"a", "b"};
const Meta_Value_Array<const char*> kNamesDefault = {kNames, 2};
const char* const kTimes[] = {"20240101000000.000000+000"};
const Meta_Value_Array<const char*> kTimesDefault = {kTimes, 1};
const Meta_Value_Array<uint8> kNoBytes = {nullptr, 0};

Meta_Property property(uint32 flags, const char* name, uint16 type, sint16 subscript,
                       const void* value = nullptr) {
    return {0,
            FLAG_PROPERTY | flags,
            name,
            nullptr,
            0,
            type,
            subscript,
            0,
            static_cast<const Meta_Value*>(value)};
}

extern const Meta_Class kRoot;

template <class T>
const Meta_Feature* feature(const T& record) {
    return reinterpret_cast<const Meta_Feature*>(&record);
}

const Meta_Property kId = property(FLAG_KEY | FLAG_REQUIRED, "Id", STRING, 0);
const Meta_Property kTextP = property(0, "Text", STRING, 0, &kText);
const Meta_Property kWaitP = property(0, "Wait", DATETIME, 0, &kWait);
const Meta_Property kOnP = property(0, "On", BOOLEAN, 0, &kOn);
const Meta_Property kLetterP = property(0, "Letter", CHAR16, 0, &kLetter);
const Meta_Property kRatioP = property(FLAG_GAUGE, "Ratio", REAL32, 0, &kRatio);
const Meta_Property kLowP = property(0, "Low", SINT8, 0, &kLow);
const Meta_Property kHighP = property(FLAG_COUNTER, "High", UINT64, 0, &kHigh);
const Meta_Property kCodesP = property(FLAG_WRITE, "Codes", UINT16, -1, &kCodesDefault);
const Meta_Property kNamesP = property(0, "Names", STRING, -1, &kNamesDefault);
const Meta_Property kTimesP = property(0, "Times", DATETIME, -1, &kTimesDefault);
const Meta_Property kBytesP = property(FLAG_OCTETSTRING, "Bytes", UINT8, 4, &kNoBytes);
const Meta_Reference kPayload = {
    0, FLAG_REFERENCE | FLAG_EMBEDDED_OBJECT, "Payload", nullptr, 0, 0, nullptr, 0};
const Meta_Reference kParent = {0, FLAG_REFERENCE, "Parent", nullptr, 0, 0, &kRoot, 0};

const Meta_Property kMode = property(FLAG_IN | FLAG_REQUIRED, "Mode", STRING, 0);
const Meta_Reference kResult = {0, FLAG_REFERENCE | FLAG_OUT, "Result", nullptr, 0, 0, &kRoot, 0};
const Meta_Reference kInto = {
    0, FLAG_REFERENCE | FLAG_IN | FLAG_EMBEDDED_INSTANCE, "Into", nullptr, 0, -1, &kRoot, 0};
const Meta_Property kCounts = property(FLAG_IN | FLAG_OUT, "Counts", UINT64, -1);
const Meta_Property kReturn = property(FLAG_OUT, "return_value", SINT32, 0);
const Meta_Feature* const kRunParams[] = {feature(kMode), feature(kResult), feature(kInto),
                                          feature(kCounts), feature(kReturn)};
const Meta_Method kRun = {
    0, FLAG_METHOD | FLAG_EXPERIMENTAL | FLAG_STATIC, "Run", nullptr, 0, kRunParams, 5, 0, SINT32};
const Meta_Feature* const kNoParams[] = {feature(kReturn)};
const Meta_Method kStop = {0, FLAG_METHOD, "Stop", nullptr, 0, kNoParams, 1, 0, SINT32};

const Meta_Feature* const kRootFeatures[] = {
    feature(kId),      feature(kTextP),  feature(kWaitP),  feature(kOnP),
    feature(kLetterP), feature(kRatioP), feature(kLowP),   feature(kHighP),
    feature(kCodesP),  feature(kNamesP), feature(kTimesP), feature(kBytesP),
    feature(kPayload), feature(kParent), feature(kRun),    feature(kStop),
};

extern const Meta_Repository kRepository;
const Meta_Class kRoot = {0,           FLAG_CLASS | FLAG_ABSTRACT | FLAG_INDICATION,
                          "Test_Root", nullptr,
                          0,           kRootFeatures,
                          16,          0,
                          nullptr,     nullptr,
                          1,           &kRepository};
const Meta_Class kLeaf = {0, FLAG_CLASS, "Test_Leaf", nullptr, 0, nullptr,
                          0, 0,          nullptr,     &kRoot,  0, &kRepository};
const Meta_Class* const kClasses[] = {&kRoot, &kLeaf};
const Meta_Repository kRepository = {kClasses, 2};

TEST(ClassMof, EveryKindOfFeatureAndDefault) {
    EXPECT_EQ(classinfo::classMof(kRoot),
              "[Abstract, Indication]\n"
              "class Test_Root {\n"
              "    [Key, Required] string Id;\n"
              "    string Text = \"say \\\"hi\\\"\";\n"
              "    datetime Wait = \"00000000000500.000000:000\";\n"
              "    boolean On = true;\n"
              "    char16 Letter = 'x';\n"
              "    [Gauge] real32 Ratio = 0.25;\n"
              "    sint8 Low = -3;\n"
              "    [Counter] uint64 High = 18446744073709551615;\n"
              "    [Write] uint16 Codes[] = {2, 3, 5};\n"
              "    string Names[] = {\"a\", \"b\"};\n"
              "    datetime Times[] = {\"20240101000000.000000+000\"};\n"
              "    [OctetString] uint8 Bytes[4] = {};\n"
              "    [EmbeddedObject] string Payload;\n"
              "    Test_Root REF Parent;\n"
              "    [Experimental, Static] sint32 Run([In, Required] string Mode, "
              "[In (false), Out] Test_Root REF Result, "
              "[In, EmbeddedInstance (\"Test_Root\")] string Into[], "
              "[In, Out] uint64 Counts[]);\n"
              "    sint32 Stop();\n"
              "};\n");
    EXPECT_EQ(classinfo::classMof(kLeaf), "class Test_Leaf : Test_Root {\n};\n");
}

TEST(ClassMof, CatalogLooksClassesUpWithoutRegardToCase) {
    const classinfo::RepositoryCatalog catalog(kRepository);
    EXPECT_EQ(catalog.classNames(), (std::vector<std::string>{"Test_Root", "Test_Leaf"}));
    EXPECT_EQ(catalog.classMof("test_leaf"), classinfo::classMof(kLeaf));
    EXPECT_EQ(catalog.classMof("Test_Other"), std::nullopt);
    EXPECT_EQ(catalog.classMof(""), std::nullopt);
}

// What the host serves requests with: properties in order with their
// defaults, superclass, typed input parameters.
TEST(RepositoryClasses, AsTheHostTakesThem) {
    const ClassInfo* extent = classinfo::moduleCatalog().classes()->find("tavrin_storageextent");
    ASSERT_NE(extent, nullptr);
    EXPECT_EQ(extent->superclass, "CIM_StorageExtent");
    EXPECT_EQ(extent->properties.front().name, "InstanceID");
    EXPECT_EQ(*findProperty(extent->properties, "NameFormat"), tvrnhost::Value::uint16(12));
    EXPECT_EQ(*findProperty(extent->properties, "Name"),
              tvrnhost::Value::null(tvrnhost::Type::String));
    EXPECT_EQ(*findProperty(extent->properties, "OperationalStatus"),
              tvrnhost::Value::null(tvrnhost::Type::Uint16, true));
    const ClassInfo* alarm = classinfo::moduleCatalog().classes()->find("TAVRIN_AlarmDevice");
    ASSERT_NE(alarm, nullptr);
    const auto set = std::find_if(alarm->methods.begin(), alarm->methods.end(),
                                  [](const MethodInfo& m) { return m.name == "SetAlarmState"; });
    ASSERT_NE(set, alarm->methods.end());
    ASSERT_EQ(set->parameters.size(), 1u);
    EXPECT_EQ(set->parameters[0].name, "RequestedAlarmState");
    EXPECT_EQ(set->parameters[0].type, tvrnhost::Type::Uint16);
}

}  // namespace
