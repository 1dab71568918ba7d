// The host driven through the test provider library: routing, conversions,
// re-entrant up-calls, release rules, indications and the cleanup sequence.
#include <algorithm>

#include "tests/host/host_fixture.h"

namespace hosttest {
namespace {

using Requests = HostFixture;

TEST_F(Requests, EnumeratesInstancesWithTypedProperties) {
    auto r = host->enumerateInstances(kNs, "Test_Widget");
    ASSERT_TRUE(r.ok()) << r.toString();
    ASSERT_EQ(r.items.size(), 3u);
    EXPECT_EQ(r.items[0].toString(),
              "instance root/test:Test_Widget.Id=\"w1\" {\n"
              "    uint32 Count = 1;\n"
              "    datetime Created = \"20231114221320.000000+000\";\n"
              "    boolean Flags = TRUE;\n"
              "    string Id = \"w1\";\n"
              "    string Label = \"first\";\n"
              "    real64 Ratio = 0.5;\n"
              "    uint16 Size = 10;\n"
              "    string[] Tags = {\"a\", \"b\"};\n"
              "}\n");
    EXPECT_EQ(*r.items[1].get("Tags"), Value::null(Type::String, true));
    EXPECT_EQ(*r.items[1].get("Label"), Value::null(Type::String));
    EXPECT_EQ(*r.items[2].get("Tags"), Value::array(Type::String, {}));
}

TEST_F(Requests, PropertyListFiltersEverythingButKeys) {
    auto r = host->enumerateInstances(kNs, "Test_Widget", std::vector<std::string>{"size"});
    ASSERT_TRUE(r.ok());
    for (const auto& i : r.items) {
        EXPECT_EQ(i.properties().size(), 2u) << i;
        EXPECT_TRUE(i.get("Id") && i.get("Size"));
    }
    auto g = host->getInstance(path("Test_Widget.Id=\"w2\""), std::vector<std::string>{});
    ASSERT_TRUE(g.ok());
    EXPECT_EQ(g.instance.properties().size(), 1u) << g.instance;
}

TEST_F(Requests, NamesGetAndNotFound) {
    auto n = host->enumerateInstanceNames(kNs, "Test_Widget");
    ASSERT_TRUE(n.ok());
    ASSERT_EQ(n.items.size(), 3u);
    EXPECT_EQ(n.items[2], path("Test_Widget.Id=\"w3\""));
    auto g = host->getInstance(path("Test_Widget.Id=\"w3\""));
    ASSERT_TRUE(g.ok());
    EXPECT_EQ(*g.instance.get("Size"), Value::uint16(30));
    auto missing = host->getInstance(path("Test_Widget.Id=\"zz\""));
    EXPECT_EQ(missing.rc, CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(missing.msg, "no widget zz");
}

TEST_F(Requests, ReferencesCarryReferenceKeys) {
    auto r = host->references(path("Test_Gadget.Name=\"g1\""), "Test_WidgetGadget", "Gadget");
    ASSERT_TRUE(r.ok()) << r.toString();
    ASSERT_EQ(r.items.size(), 2u);
    const Instance& link = r.items[0];
    EXPECT_EQ(link.path().key("Widget")->type(), Type::Reference);
    EXPECT_EQ(*link.get("Gadget"), Value::reference(path("Test_Gadget.Name=\"g1\"")));
    EXPECT_EQ(*link.get("Strength"), Value::uint8(1));

    auto names = host->referenceNames(path("Test_Widget.Id=\"w2\""));
    ASSERT_TRUE(names.ok());
    ASSERT_EQ(names.items.size(), 1u);
    EXPECT_EQ(*names.items[0].key("Widget"), Value::reference(path("Test_Widget.Id=\"w2\"")));
}

TEST_F(Requests, MethodArgumentsRoundTripEveryKindOfValue) {
    const PropertyVector in = {
        {"Text", Value::string("hello")},
        {"Codes", Value::array(Type::Uint16, {Value::uint16(1), Value::uint16(65535)})},
        {"When", Value::dateTime(*DateTime::parse("20240229235959.999999-300"))},
        {"Target", Value::reference(path("Test_Gadget.Name=\"g2\""))},
        {"Missing", Value::null(Type::Sint32)},
        {"Flag", Value::boolean(true)},
        {"Small", Value::sint8(-8)},
        {"Names", Value::array(Type::String, {Value::string("x"), Value::null(Type::String)})},
        {"Refs", Value::array(Type::Reference, {Value::reference(path("Test_Widget.Id=\"w1\""))})},
        {"Letter", Value::char16(0x263A)},
        {"Real", Value::real32(1.25f)},
    };
    auto r = host->invokeMethod(path("Test_Widget.Id=\"w1\""), "Echo", in);
    ASSERT_TRUE(r.ok()) << r.toString();
    EXPECT_EQ(r.returnValue, Value::uint32(static_cast<std::uint32_t>(in.size())));
    ASSERT_EQ(r.out.size(), in.size());
    for (const auto& p : in) {
        SCOPED_TRACE(p.name);
        ASSERT_TRUE(r.outArg(p.name));
        EXPECT_EQ(*r.outArg(p.name), p.value);
    }
}

TEST_F(Requests, UpCallsSeeContextStoresAndOtherProviders) {
    const ObjectPath w1 = path("Test_Widget.Id=\"w1\"");
    EXPECT_EQ(host->invokeMethod(w1, "WhoAmI").returnValue, Value::string("tester"));
    EXPECT_EQ(host->invokeMethod(w1, "ReadManager").returnValue, Value::string("the manager"));
    EXPECT_EQ(host->invokeMethod(w1, "CountGadgets").returnValue, Value::uint32(2));

    host->store("root/interop").clear();
    auto gone = host->invokeMethod(w1, "ReadManager");
    EXPECT_EQ(gone.rc, CMPI_RC_ERR_INVALID_CLASS) << gone.toString();
    host->store("root/interop").defineClass("Test_Manager");
    EXPECT_EQ(host->invokeMethod(w1, "ReadManager").rc, CMPI_RC_ERR_NOT_FOUND);
}

TEST_F(Requests, FailuresReportCodeAndMessage) {
    const ObjectPath w1 = path("Test_Widget.Id=\"w1\"");
    auto denied = host->invokeMethod(w1, "Fail");
    EXPECT_EQ(denied.toString(), "CMPI_RC_ERR_ACCESS_DENIED: denied by test");
    EXPECT_EQ(host->invokeMethod(w1, "NoSuchMethod").rc, CMPI_RC_ERR_METHOD_NOT_FOUND);
    EXPECT_EQ(host->invokeMethod(path("Test_Gadget.Name=\"g1\""), "Echo").rc,
              CMPI_RC_ERR_NOT_SUPPORTED);  // no method provider for the class
    EXPECT_EQ(host->enumerateInstances(kNs, "Test_Unknown").toString(),
              "CMPI_RC_ERR_INVALID_CLASS: class Test_Unknown is not served in root/test");
    EXPECT_EQ(host->subscribe(kNs, "Test_Widget").rc, CMPI_RC_ERR_NOT_SUPPORTED);
    EXPECT_EQ(host->subscribe(kNs, "Test_Nothing").rc, CMPI_RC_ERR_INVALID_CLASS);
    EXPECT_EQ(host->getInstance(path("root/none:Test_Widget.Id=\"w1\"")).rc,
              CMPI_RC_ERR_INVALID_NAMESPACE);
    auto missing = host->enumerateInstances(kNs, "Test_Missing");
    EXPECT_EQ(missing.rc, CMPI_RC_ERR_FAILED);
    EXPECT_NE(missing.msg.find("Test_Missing_Provider_Create_InstanceMI"), std::string::npos);
}

TEST_F(Requests, ClassesInSeveralNamespacesAndSubclasses) {
    auto other = host->enumerateInstanceNames("root/other", "Test_Gadget");
    ASSERT_TRUE(other.ok());
    EXPECT_EQ(other.items[0].nameSpace(), "root/other");
    EXPECT_EQ(host->enumerateInstances("root/other", "Test_Widget").rc, CMPI_RC_ERR_INVALID_CLASS);

    // A superclass enumeration reaches subclasses served by providers and
    // subclasses kept in the store.
    host->addSubclass("Test_Widget", "Test_Thing");
    host->addSubclass("Test_Gadget", "Test_Thing");
    host->addSubclass("Test_Stored", "Test_Thing");
    Instance stored(path("Test_Stored.Key=1"));
    stored.set("Key", Value::uint32(1));
    ASSERT_TRUE(host->store(kNs).add(stored));
    auto all = host->enumerateInstanceNames(kNs, "Test_Thing");
    ASSERT_TRUE(all.ok()) << all.toString();
    EXPECT_EQ(all.items.size(), 6u);
    EXPECT_TRUE(host->getInstance(path("Test_Stored.Key=1")).ok());
}

TEST_F(Requests, StoreAssociationsAreTraversed) {
    Instance owner(path("Test_Owner.Id=\"o\""));
    owner.set("Id", Value::string("o"));
    Instance link(
        path("Test_Owns.Owner=\"root/test:Test_Owner.Id=\\\"o\\\"\","
             "Owned=\"root/test:Test_Widget.Id=\\\"w3\\\"\""));
    link.set("Owner", *link.path().key("Owner")).set("Owned", *link.path().key("Owned"));
    ASSERT_TRUE(host->store(kNs).add(owner));
    ASSERT_TRUE(host->store(kNs).add(link));
    auto a = host->associators(path("Test_Owner.Id=\"o\""), "Test_Owns");
    ASSERT_TRUE(a.ok()) << a.toString();
    ASSERT_EQ(a.items.size(), 1u);  // the widget, fetched from its provider
    EXPECT_EQ(*a.items[0].get("Size"), Value::uint16(30));
    EXPECT_EQ(
        host->referenceNames(path("Test_Widget.Id=\"w3\""), "Test_Owns", "Owned").items.size(), 1u);
    EXPECT_TRUE(
        host->references(path("Test_Widget.Id=\"w3\""), "Test_Owns", "Owner").items.empty());
}

using ReleaseRules = HostFixture;

TEST_F(ReleaseRules, RequestObjectsAreFreedWhenTheRequestEndsClonesOutliveIt) {
    const ObjectPath w1 = path("Test_Widget.Id=\"w1\"");
    ASSERT_TRUE(host->enumerateInstances(kNs, "Test_Widget").ok());  // MIs created
    const size_t before = Host::liveObjects();
    auto r = host->invokeMethod(w1, "Scratch");
    ASSERT_TRUE(r.ok()) << r.toString();
    EXPECT_EQ(r.returnValue, Value::string("left for the broker"));
    EXPECT_TRUE(host->associators(w1).ok());
    EXPECT_TRUE(host->invokeMethod(w1, "CountGadgets").ok());
    EXPECT_TRUE(host->invokeMethod(w1, "ReadManager").ok());
    EXPECT_EQ(Host::liveObjects(), before);

    ASSERT_TRUE(host->invokeMethod(w1, "KeepClone").ok());
    EXPECT_EQ(Host::liveObjects(), before + 1);
    auto used = host->invokeMethod(w1, "UseClone");  // reads it in a later request
    ASSERT_TRUE(used.ok());
    EXPECT_EQ(used.returnValue, Value::string("kept across requests"));
    EXPECT_EQ(Host::liveObjects(), before);
}

using Indications = HostFixture;

size_t countIn(const std::vector<Indication>& inds, const std::string& ns) {
    return static_cast<size_t>(std::count_if(
        inds.begin(), inds.end(), [&](const Indication& i) { return i.nameSpace == ns; }));
}

TEST_F(Indications, DeliveredFromAnAttachedProviderThreadToActiveNamespaces) {
    using namespace std::chrono_literals;
    ASSERT_TRUE(host->subscribe(kNs, "Test_Alert").ok());
    ASSERT_TRUE(host->waitForIndications(3, 10s));
    ASSERT_TRUE(host->subscribe("root/other", "Test_Alert").ok());
    ASSERT_TRUE(host->waitForIndications(9, 10s));  // a burst of 3 to both namespaces

    auto inds = host->indications();
    EXPECT_EQ(countIn(inds, kNs), 6u);
    EXPECT_EQ(countIn(inds, "root/other"), 3u);
    const Instance& first = inds[0].instance;
    EXPECT_EQ(first.className(), "Test_Alert");
    EXPECT_EQ(*first.get("Seq"), Value::uint32(1));
    EXPECT_EQ(*first.get("Message"), Value::string("alert 1"));
    EXPECT_EQ(first.get("Time")->type(), Type::DateTime);

    ASSERT_TRUE(host->unsubscribe(kNs, "Test_Alert").ok());
    ASSERT_TRUE(host->unsubscribe("root/other", "Test_Alert").ok());
    EXPECT_EQ(host->unsubscribe("root/other", "Test_Alert").rc, CMPI_RC_ERR_NOT_FOUND);
    const tvrntest_counters c = counters();
    EXPECT_EQ(c.authorizeCalls, 2);
    EXPECT_EQ(c.activateCalls, 2);
    EXPECT_EQ(c.firstActivations, 1);
    EXPECT_EQ(c.deactivateCalls, 2);
    EXPECT_EQ(c.lastDeactivations, 1);
    EXPECT_EQ(c.enableCalls, 1);
    EXPECT_EQ(c.disableCalls, 1);
    EXPECT_EQ(c.threadsAttached, 1);
    EXPECT_EQ(c.threadsDetached, 1);
}

TEST_F(Indications, UnloadEndsActiveSubscriptions) {
    ASSERT_TRUE(host->subscribe(kNs, "Test_Alert").ok());
    ASSERT_TRUE(host->waitForIndications(3, std::chrono::seconds(10)));
    // TearDown unloads with the subscription still active: the provider's
    // thread must be stopped before the library goes away.
}

using Lifecycle = HostFixture;

TEST_F(Lifecycle, NonTerminatingCleanupHonoursDoNotUnload) {
    const ObjectPath w1 = path("Test_Widget.Id=\"w1\"");
    ASSERT_TRUE(host->invokeMethod(w1, "ForbidUnload").ok());
    ASSERT_TRUE(host->enumerateInstances(kNs, "Test_Widget").ok());
    const int factories = counters().factoryCalls;
    EXPECT_EQ(factories, 2);  // the method MI and the instance MI

    auto refused = host->cleanup(false);
    ASSERT_EQ(refused.size(), 2u);
    for (const auto& r : refused)
        EXPECT_EQ(r.rc, CMPI_RC_DO_NOT_UNLOAD) << r.provider << " " << r.kind;
    ASSERT_TRUE(host->invokeMethod(w1, "AllowUnload").ok());  // same MIs still in use
    EXPECT_EQ(counters().factoryCalls, factories);

    auto agreed = host->cleanup(false);
    ASSERT_EQ(agreed.size(), 2u);
    EXPECT_EQ(agreed[0].kind, "method");  // reverse order of creation
    EXPECT_EQ(agreed[1].kind, "instance");
    for (const auto& r : agreed)
        EXPECT_EQ(r.rc, CMPI_RC_OK);
    EXPECT_TRUE(host->cleanup(false).empty());

    // The next request creates the MI again, with a fresh table.
    ASSERT_TRUE(host->deleteInstance(w1).ok());
    ASSERT_TRUE(host->cleanup(true).size() == 1);
    EXPECT_TRUE(host->getInstance(w1).ok());
    EXPECT_EQ(counters().factoryCalls, factories + 2);
}

TEST_F(Lifecycle, UnloadClosesTheLibraryAndLoadStartsAgain) {
    ASSERT_TRUE(host->enumerateInstances(kNs, "Test_Gadget").ok());
    ASSERT_TRUE(host->unload().ok());
    EXPECT_FALSE(host->loaded());
    EXPECT_EQ(dlopen(TVRN_TESTPROV_LIB, RTLD_NOW | RTLD_NOLOAD), nullptr);
    EXPECT_EQ(host->enumerateInstances(kNs, "Test_Gadget").rc, CMPI_RC_ERR_INVALID_NAMESPACE);
    ASSERT_TRUE(host->load(TVRN_TESTPROV_LIB, TVRN_TESTPROV_REG).ok());
    EXPECT_EQ(host->registrations().size(), 5u);
    EXPECT_TRUE(host->enumerateInstances(kNs, "Test_Gadget").ok());
}

TEST(HostLoad, ReportsMissingFiles) {
    Host h;
    Status st = h.load("/nonexistent/libx.so", TVRN_TESTPROV_REG);
    EXPECT_EQ(st.rc, CMPI_RC_ERR_FAILED);
    EXPECT_NE(st.msg.find("/nonexistent/libx.so"), std::string::npos);
    st = h.load(TVRN_TESTPROV_LIB, "/nonexistent.reg");
    EXPECT_EQ(st.rc, CMPI_RC_ERR_FAILED);
    EXPECT_NE(st.msg.find("cannot open"), std::string::npos);
}

TEST(HostLoad, KeepMappedLeavesTheLibraryLoaded) {
    HostOptions o;
    o.keepMapped = true;
    {
        Host h(o);
        ASSERT_TRUE(h.load(TVRN_TESTPROV_LIB, TVRN_TESTPROV_REG).ok());
        ASSERT_TRUE(h.unload().ok());
    }
    void* handle = dlopen(TVRN_TESTPROV_LIB, RTLD_NOW | RTLD_NOLOAD);
    EXPECT_NE(handle, nullptr);
    if (handle) {
        dlclose(handle);  // ours
        dlclose(handle);  // the one the host kept
    }
}

}  // namespace
}  // namespace hosttest
