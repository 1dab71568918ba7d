// Text forms of host values (object paths, instances, value literals),
// date-time conversions and registration files.
#include <gtest/gtest.h>

#include "host/registration.h"
#include "host/value.h"

using namespace tvrnhost;

namespace {

TEST(ObjectPathText, ParsesEveryFormAndPrintsKeysSorted) {
    struct Case {
        const char *in, *host, *ns, *cls, *printed;
        size_t keys;
    } cases[] = {
        {"//h1/root/tavrin:TAVRIN_FCPort.SystemName=\"s\",DeviceID=\"10\"", "h1", "root/tavrin",
         "TAVRIN_FCPort", "//h1/root/tavrin:TAVRIN_FCPort.DeviceID=\"10\",SystemName=\"s\"", 2},
        {"root/test:Test_Widget.Id=\"w:1\"", "", "root/test", "Test_Widget",
         "root/test:Test_Widget.Id=\"w:1\"", 1},
        {"Test_Widget.Id=\"a.b=c\"", "", "", "Test_Widget", "Test_Widget.Id=\"a.b=c\"", 1},
        {"  CIM_Class  ", "", "", "CIM_Class", "CIM_Class", 0},
        {"X.N=5,M=-3,B=true,R=2.5,Q=\"say \\\"hi\\\"\"", "", "", "X",
         "X.B=TRUE,M=-3,N=5,Q=\"say \\\"hi\\\"\",R=2.5", 5},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.in);
        ObjectPath p = ObjectPath::parse(c.in);
        EXPECT_EQ(p.host(), c.host);
        EXPECT_EQ(p.nameSpace(), c.ns);
        EXPECT_EQ(p.className(), c.cls);
        EXPECT_EQ(p.keys().size(), c.keys);
        EXPECT_EQ(p.toString(), c.printed);
        EXPECT_EQ(ObjectPath::parse(p.toString()), p);  // round trip
    }
}

TEST(ObjectPathText, KeyTypesAndReferenceKeys) {
    ObjectPath p = ObjectPath::parse(
        "root/t:Assoc.Antecedent=\"root/t:A.Id=\\\"1\\\"\",Name=\"plain\",N=7,S=-7,On=FALSE");
    ASSERT_TRUE(p.key("antecedent"));  // case-insensitive look-up
    EXPECT_EQ(p.key("Antecedent")->type(), Type::Reference);
    EXPECT_EQ(p.key("Antecedent")->asReference().toString(), "root/t:A.Id=\"1\"");
    EXPECT_EQ(p.key("Name")->type(), Type::String);
    EXPECT_EQ(*p.key("N"), Value::uint64(7));
    EXPECT_EQ(*p.key("S"), Value::sint64(-7));
    EXPECT_EQ(*p.key("On"), Value::boolean(false));
    EXPECT_EQ(ObjectPath::parse(p.toString()), p);
}

TEST(ObjectPathText, RejectsMalformedPaths) {
    for (const char* bad : {"", "//host", "//host/Class.K=1", ":C", "root:1Class", "C.K",
                            "C.K=", "C.K=bare", "C.K=\"open", "C.K=1,K=2", "C.K=1 junk"}) {
        SCOPED_TRACE(bad);
        EXPECT_THROW(ObjectPath::parse(bad), ParseError);
    }
}

TEST(ObjectPathEquality, IdentifiesComparesIntegerKeysByValue) {
    ObjectPath a("root/t", "C");
    a.addKey("N", Value::uint16(5));
    ObjectPath b("", "c");
    b.addKey("n", Value::uint64(5));
    EXPECT_NE(a, b);               // exact: types and namespaces differ
    EXPECT_TRUE(a.identifies(b));  // same object
    b.addKey("n", Value::sint64(-5));
    EXPECT_FALSE(a.identifies(b));
    ObjectPath c("root/other", "C");
    c.addKey("N", Value::uint8(5));
    EXPECT_FALSE(a.identifies(c));  // both namespaces given and different
}

TEST(InstanceText, PrintsSortedTypedDeclarationsAndParsesThemBack) {
    Instance embedded(ObjectPath("", "CIM_Error"));
    embedded.set("Message", Value::string("m"));
    Instance i(ObjectPath::parse("root/t:Test_Widget.Id=\"w1\""));
    i.set("Id", Value::string("w1"))
        .set("Size", Value::uint16(10))
        .set("Tags", Value::array(Type::String, {Value::string("a"), Value::null(Type::String)}))
        .set("Created", Value::dateTime(*DateTime::parse("20231114221320.000000+000")))
        .set("Owner", Value::reference(ObjectPath::parse("root/t:Test_Gadget.Name=\"g1\"")))
        .set("Label", Value::null(Type::String))
        .set("Ratio", Value::real64(0.5))
        .set("Grade", Value::char16('A'))
        .set("Err", Value::instance(embedded));
    const std::string expected =
        "instance root/t:Test_Widget.Id=\"w1\" {\n"
        "    datetime Created = \"20231114221320.000000+000\";\n"
        "    instance Err = instance CIM_Error {\n"
        "        string Message = \"m\";\n"
        "    };\n"
        "    char16 Grade = 'A';\n"
        "    string Id = \"w1\";\n"
        "    string Label = NULL;\n"
        "    ref Owner = \"root/t:Test_Gadget.Name=\\\"g1\\\"\";\n"
        "    real64 Ratio = 0.5;\n"
        "    uint16 Size = 10;\n"
        "    string[] Tags = {\"a\", NULL};\n"
        "}\n";
    EXPECT_EQ(i.toString(), expected);
    auto parsed = parseInstances("# comment\n" + expected + "\n// another\n" + expected);
    ASSERT_EQ(parsed.size(), 2u);
    EXPECT_EQ(parsed[0], i);
    EXPECT_EQ(parsed[1], i);
}

TEST(InstanceText, ReportsTheLineOfAnError) {
    try {
        parseInstances("instance C.K=1 {\n  uint8 A = 300;\n}\n");
        FAIL() << "accepted an out-of-range uint8";
    } catch (const ParseError& e) {
        EXPECT_NE(std::string(e.what()).find("line 2"), std::string::npos) << e.what();
    }
    EXPECT_THROW(parseInstances("instance C {\n  weird X = 1;\n}"), ParseError);
    EXPECT_THROW(parseInstances("instance C {\n  string X = \"a\";\n  string x = \"b\";\n}"),
                 ParseError);
}

TEST(ValueLiterals, GuessedAndExplicitTypes) {
    struct Case {
        const char* text;
        Value expected;
    } cases[] = {
        {"5", Value::uint64(5)},
        {"-5", Value::sint64(-5)},
        {"0x10", Value::uint64(16)},
        {"2.5", Value::real64(2.5)},
        {"true", Value::boolean(true)},
        {"NULL", Value()},
        {"\"text\"", Value::string("text")},
        {"bare words stay text", Value::string("bare words stay text")},
        {"uint16:7", Value::uint16(7)},
        {"sint8:-128", Value::sint8(-128)},
        {"uint16[]:{1, 2}", Value::array(Type::Uint16, {Value::uint16(1), Value::uint16(2)})},
        {"{1, 2}", Value::array(Type::Uint64, {Value::uint64(1), Value::uint64(2)})},
        {"{}", Value::array(Type::String, {})},
        {"datetime:\"00000001020304.000005:000\"",
         Value::dateTime(*DateTime::parse("00000001020304.000005:000"))},
        {"\"Test_Gadget.Name=\\\"g1\\\"\"",
         Value::reference(ObjectPath::parse("Test_Gadget.Name=\"g1\""))},
        {"char16:'\\u00e9'", Value::char16(0xe9)},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.text);
        EXPECT_EQ(parseValue(c.text), c.expected);
    }
    for (const char* bad : {"uint8:256", "uint16:-1", "sint8:128", "{1, \"a\"}", "boolean:2",
                            "datetime:\"2024\"", "\"open"}) {
        SCOPED_TRACE(bad);
        EXPECT_THROW(parseValue(bad), ParseError);
    }
}

TEST(ValueEquality, TypeNullnessAndWidthMatter) {
    EXPECT_NE(Value::uint16(1), Value::uint32(1));
    EXPECT_NE(Value::null(Type::Uint8), Value::uint8(0));
    EXPECT_NE(Value::null(Type::Uint8), Value::null(Type::Uint8, true));
    EXPECT_EQ(Value::sint8(-1).asSint(), -1);
    EXPECT_EQ(Value::integer(Type::Uint8, 0x1ff).asUint(), 0xffu);  // truncated to width
    EXPECT_EQ(Value::real32(0.1f).toString(), "0.1");
}

TEST(DateTimeConversion, BinaryAndTextAgree) {
    struct Case {
        const char* text;
        std::uint64_t usec;
    } cases[] = {
        {"19700101000000.000000+000", 0},
        {"20231114221320.123456+000", 1700000000123456ULL},
        {"20231114231320.123456+060", 1700000000123456ULL},  // one hour east of UTC
        {"20231114211320.123456-060", 1700000000123456ULL},
        {"00000001020304.000005:000", ((((1ULL * 24 + 2) * 60 + 3) * 60) + 4) * 1000000 + 5},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.text);
        auto dt = DateTime::parse(c.text);
        ASSERT_TRUE(dt);
        EXPECT_EQ(dt->toBinary(), c.usec);
    }
    EXPECT_EQ(DateTime::fromBinary(1700000000123456ULL, false).text(), "20231114221320.123456+000");
    EXPECT_EQ(DateTime::fromBinary(93784000005ULL, true).text(), "00000001020304.000005:000");
    for (const char* bad :
         {"2023111422132.123456+000", "20231114221320.123456*000", "20231114221320-123456+000",
          "20231314221320.000000+000", "00000001020304.000000:001", "2023111422132a.000000+000",
          "20230229000000.000000+000", "21000229000000.000000+000", "20230631000000.000000+000"}) {
        SCOPED_TRACE(bad);
        EXPECT_FALSE(DateTime::parse(bad));
    }
}

// The test library's registration file, read by every host test, has the
// usual forms; here the others.
TEST(RegistrationFile, ParsesBlocksTypesAndNamespaces) {
    auto regs = parseRegistrations(
        "# providers\n"
        "\n"
        "[C]\n"
        "provider: P\n"
        "location: l\n"
        "type: association, instance\n"
        "namespace: n1 n2\n"
        "namespace: n3\n");
    ASSERT_EQ(regs.size(), 1u);
    EXPECT_EQ(regs[0].provider, "P");
    EXPECT_EQ(regs[0].kinds, kInstanceMI | kAssociationMI);
    EXPECT_EQ(regs[0].namespaces, (std::vector<std::string>{"n1", "n2", "n3"}));
    EXPECT_EQ(regs[0].line, 3);
}

TEST(RegistrationFile, RejectsIncompleteOrUnknownEntries) {
    const char* bad[] = {
        "provider: P\n",                                    // before any block
        "[C]\nprovider: P\nlocation: l\ntype: instance\n",  // no namespace
        "[C]\nprovider: P\nlocation: l\nnamespace: n\n",    // no type
        "[C]\nprovider: P\nlocation: l\ntype: instanse\nnamespace: n\n",
        "[C]\nprovider: P\nlocation: l\ntype: instance\nnamespace: n\ncolour: red\n",
        "[C\nprovider: P\n",
    };
    for (const char* text : bad) {
        SCOPED_TRACE(text);
        EXPECT_THROW(parseRegistrations(text), ParseError);
    }
}

}  // namespace
