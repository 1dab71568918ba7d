// The host with a class repository does what a CIM server does with its
// own: class defaults in new instances, superclasses of served classes
// accepted, method arguments converted to the declared parameter types.
#include <map>

#include "tests/host/host_fixture.h"

namespace hosttest {
namespace {

class TestClasses : public ClassRepository {
public:
    TestClasses() {
        add({"Test_Thing",
             "",
             {{"Id", Value::null(Type::String)}, {"Colour", Value::string("red")}},
             {}});
        ClassInfo widget{"Test_Widget", "Test_Thing", classes_["test_thing"].properties, {}};
        widget.properties.push_back({"Label", Value::string("unnamed")});
        widget.properties.push_back({"Count", Value::null(Type::Uint32)});
        widget.methods.push_back({"Echo",
                                  {{"Count", Type::Uint16},
                                   {"When", Type::DateTime},
                                   {"Target", Type::Reference},
                                   {"Codes", Type::Uint8, true},
                                   {"Ratio", Type::Real64}}});
        add(widget);
        add({"Test_Part", "", {{"Name", Value::null(Type::String)}}, {}});
        add({"Test_Gadget", "Test_Part", {{"Name", Value::null(Type::String)}}, {}});
        add({"Test_Link", "", {}, {}});
        add({"Test_WidgetGadget", "Test_Link", {}, {}});
    }
    const ClassInfo* find(std::string_view name) const override {
        auto it = classes_.find(toLower(name));
        return it == classes_.end() ? nullptr : &it->second;
    }

private:
    void add(ClassInfo c) { classes_[toLower(c.name)] = std::move(c); }
    std::map<std::string, ClassInfo> classes_;
};

// The value, or a null string when there is none.
Value valueOf(const Value* v) {
    return v ? *v : Value();
}

class WithClasses : public ::testing::Test {
protected:
    void SetUp() override {
        HostOptions o;
        o.classes = &classes;
        host = std::make_unique<Host>(o);
        Status st = host->load(TVRN_TESTPROV_LIB, TVRN_TESTPROV_REG);
        ASSERT_TRUE(st.ok()) << st.toString();
    }
    void TearDown() override { EXPECT_TRUE(host->unload().ok()); }

    TestClasses classes;
    std::unique_ptr<Host> host;
    const ObjectPath w1 = path("Test_Widget.Id=\"w1\"");
};

TEST_F(WithClasses, NewInstancesStartWithTheClassDefaults) {
    auto r = host->getInstance(w1);
    ASSERT_TRUE(r.ok()) << r.toString();
    EXPECT_EQ(valueOf(r.instance.get("Colour")),
              Value::string("red"));  // never set by the provider
    EXPECT_EQ(valueOf(r.instance.get("Label")), Value::string("first"));
    // The provider sets w2's label null: null it stays.
    auto w2 = host->getInstance(path("Test_Widget.Id=\"w2\""));
    ASSERT_TRUE(w2.ok()) << w2.toString();
    EXPECT_EQ(valueOf(w2.instance.get("Label")), Value::null(Type::String));
}

// Without the defaults, what the provider leaves unset is missing.
TEST_F(WithClasses, NewInstancesCanStartEmpty) {
    HostOptions o;
    o.classes = &classes;
    o.classDefaults = false;
    Host bare(o);
    ASSERT_TRUE(bare.load(TVRN_TESTPROV_LIB, TVRN_TESTPROV_REG).ok());
    auto r = bare.getInstance(w1);
    ASSERT_TRUE(r.ok()) << r.toString();
    EXPECT_EQ(r.instance.get("Colour"), nullptr);
    EXPECT_EQ(valueOf(r.instance.get("Label")), Value::string("first"));
    EXPECT_TRUE(bare.unload().ok());
}

TEST_F(WithClasses, SuperclassesOfServedClassesAreKnown) {
    auto refs = host->references(w1, "Test_Link");
    ASSERT_TRUE(refs.ok()) << refs.toString();
    EXPECT_FALSE(refs.items.empty());
    EXPECT_EQ(host->referenceNames(w1, "Test_Link").items.size(), refs.items.size());
    auto gadgets = host->associators(w1, "Test_Link", "Test_Part");
    ASSERT_TRUE(gadgets.ok()) << gadgets.toString();
    EXPECT_FALSE(gadgets.items.empty());
    auto things = host->enumerateInstanceNames(kNs, "Test_Thing");
    ASSERT_TRUE(things.ok()) << things.toString();
    EXPECT_EQ(things.items.size(), 3u);
    EXPECT_EQ(host->references(w1, "Test_Nothing").rc, CMPI_RC_ERR_INVALID_CLASS);

    // Result classes of associations kept in the store, too.
    Instance owns(
        path("Test_Owns.Owner=\"root/test:Test_Owner.Id=\\\"o\\\"\","
             "Owned=\"root/test:Test_Widget.Id=\\\"w3\\\"\""));
    owns.set("Owner", *owns.path().key("Owner")).set("Owned", *owns.path().key("Owned"));
    ASSERT_TRUE(host->store(kNs).add(owns));
    auto owned = host->associatorNames(path("Test_Owner.Id=\"o\""), "Test_Owns", "Test_Thing");
    ASSERT_TRUE(owned.ok()) << owned.toString();
    EXPECT_EQ(owned.items.size(), 1u);
}

TEST_F(WithClasses, MethodArgumentsTakeTheDeclaredTypes) {
    const PropertyVector in = {
        {"Count", Value::uint64(5)},
        {"When", Value::string("20240229235959.999999-300")},
        {"Target", Value::string("root/test:Test_Gadget.Name=\"g2\"")},
        {"Codes", Value::array(Type::Uint64, {Value::uint64(1), Value::uint64(255)})},
        {"Ratio", Value::sint64(-2)},
        {"Other", Value::uint64(7)},  // not a parameter: as it is
    };
    auto r = host->invokeMethod(w1, "Echo", in);
    ASSERT_TRUE(r.ok()) << r.toString();
    EXPECT_EQ(valueOf(r.outArg("Count")), Value::uint16(5));
    EXPECT_EQ(valueOf(r.outArg("When")),
              Value::dateTime(*DateTime::parse("20240229235959.999999-300")));
    EXPECT_EQ(valueOf(r.outArg("Target")), Value::reference(path("Test_Gadget.Name=\"g2\"")));
    EXPECT_EQ(valueOf(r.outArg("Codes")),
              Value::array(Type::Uint8, {Value::uint8(1), Value::uint8(255)}));
    EXPECT_EQ(valueOf(r.outArg("Ratio")), Value::real64(-2));
    EXPECT_EQ(valueOf(r.outArg("Other")), Value::uint64(7));

    // What does not convert is refused before the provider sees it.
    for (const auto& bad :
         {Property{"Count", Value::uint64(70000)}, Property{"Count", Value::sint64(-1)},
          Property{"Codes", Value::uint64(1)}, Property{"When", Value::string("yesterday")}}) {
        SCOPED_TRACE(bad.name + " = " + bad.value.toString());
        EXPECT_EQ(host->invokeMethod(w1, "Echo", {bad}).rc, CMPI_RC_ERR_INVALID_PARAMETER);
    }
}

}  // namespace
}  // namespace hosttest
