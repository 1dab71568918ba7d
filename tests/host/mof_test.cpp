// MOF literals and instances as tvrncli prints them.
#include <gtest/gtest.h>

#include "host/mof.h"

using namespace tvrnhost;

namespace {

TEST(MofValue, EveryKindOfScalar) {
    const DateTime when = *DateTime::parse("20240101120000.000000+060");
    struct Case {
        Value value;
        const char* mof;
    } cases[] = {
        {Value::boolean(true), "true"},
        {Value::sint8(-128), "-128"},
        {Value::uint64(18446744073709551615ull), "18446744073709551615"},
        {Value::real32(2.5f), "2.5"},
        {Value::real64(1), "1.0"},
        {Value::char16('A'), "'A'"},
        {Value::char16('\''), "'\\''"},
        {Value::char16(0x263A), "'\\x263A'"},
        {Value::char16(1), "'\\x0001'"},
        {Value::string(""), "\"\""},
        {Value::string("it's \"q\"\\"), "\"it's \\\"q\\\"\\\\\""},
        {Value::string("a\tb\nc\r\f\b"), "\"a\\tb\\nc\\r\\f\\b\""},
        // Four hex digits, so that the 'F' is not taken into the escape.
        {Value::string(std::string("\x01") + "F\x7f"), "\"\\x0001F\\x007F\""},
        {Value::string("caf\xc3\xa9"), "\"caf\xc3\xa9\""},  // UTF-8 unchanged
        {Value::dateTime(when), "\"20240101120000.000000+060\""},
        {Value::reference(ObjectPath::parse("root/t:A.Id=\"1\",N=2")),
         "\"root/t:A.Id=\\\"1\\\",N=2\""},
        {Value::null(Type::Uint16), "NULL"},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.mof);
        EXPECT_EQ(mofValue(c.value), c.mof);
    }
}

TEST(MofValue, ArraysAndEmbeddedInstances) {
    EXPECT_EQ(mofValue(Value::array(Type::Uint16, {})), "{}");
    EXPECT_EQ(mofValue(Value::array(Type::String, {Value::string("a"), Value::null(Type::String),
                                                   Value::string("b,c")})),
              "{\"a\", NULL, \"b,c\"}");

    Instance err("root/t", "CIM_Error");
    err.set("ErrorType", Value::uint16(4)).set("Message", Value::string("say \"no\""));
    err.set("Ignored", Value::null(Type::String));
    // Quoted once as the instance text and again as the string it is in.
    EXPECT_EQ(mofValue(Value::instance(err)),
              "\"instance of CIM_Error { ErrorType = 4; "
              "Message = \\\"say \\\\\\\"no\\\\\\\"\\\"; };\"");
    EXPECT_EQ(mofValue(Value::instance(Instance("root/t", "Empty"))), "\"instance of Empty {};\"");
    EXPECT_EQ(mofValue(Value::array(Type::Instance, {Value::instance(Instance("", "E"))})),
              "{\"instance of E {};\"}");
}

TEST(MofInstance, NonNullPropertiesInTheInstancesOrder) {
    Instance inst(ObjectPath::parse("root/t:Zed.Key=\"k\""));
    inst.set("Zeta", Value::uint32(1))
        .set("Key", Value::string("k"))
        .set("Gone", Value::null(Type::Uint32))
        .set("Alpha", Value::array(Type::Uint16, {Value::uint16(2), Value::uint16(3)}))
        .set("zeta", Value::uint32(9));  // replaces Zeta where it stands
    EXPECT_EQ(mofInstance(inst),
              "instance of Zed {\n"
              "    Zeta = 9;\n"
              "    Key = \"k\";\n"
              "    Alpha = {2, 3};\n"
              "};\n");
    EXPECT_EQ(mofInstance(Instance("root/t", "Nothing")), "instance of Nothing {\n};\n");
}

}  // namespace
