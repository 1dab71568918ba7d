// The CMPI binding driven through the embedded host with the test module:
// instance requests and their result codes, the get and association
// fallbacks, methods, indications, unloading and threads.
#include <gtest/gtest.h>

#include <pthread.h>

#include <chrono>
#include <functional>
#include <future>
#include <map>
#include <set>
#include <thread>

#include <cmpidt.h>
#include <cmpift.h>

#include "host/host.h"
#include "tests/cmpi/test_support.h"

using namespace tvrnhost;
using tvrntest::Loaded_Module;
using tvrntest::Log_Watch;

namespace {

const char* const NS = "root/test";

ObjectPath gadget_path(const std::string& name, Value port = Value::uint16(80),
                       Value index = Value::uint32(5)) {
    ObjectPath p(NS, "TVRNTEST_Gadget");
    p.addKey("Name", Value::string(name));
    p.addKey("Port", port);
    p.addKey("Index", index);
    return p;
}

ObjectPath owner_path(const std::string& id) {
    ObjectPath p(NS, "TVRNTEST_Owner");
    p.addKey("Id", Value::string(id));
    return p;
}

Instance gadget(const std::string& name, const std::string& label) {
    Instance i(gadget_path(name));
    for (const auto& k : i.path().keys())
        i.set(k.name, k.value);
    i.set("Label", Value::string(label));
    return i;
}

Instance owner(const std::string& id, const std::string& name) {
    Instance i(owner_path(id));
    i.set("Id", Value::string(id));
    i.set("Name", Value::string(name));
    return i;
}

std::set<std::string> ids_of(const std::vector<ObjectPath>& paths, const char* key) {
    std::set<std::string> ids;
    for (const auto& p : paths)
        if (const Value* v = p.key(key))
            ids.insert(v->asString());
    return ids;
}

class Dispatch : public ::testing::Test {
protected:
    void SetUp() override {
        ASSERT_TRUE(host.load(TVRN_TEST_MODULE, TVRN_TEST_REG).ok());
        control("reset");
    }

    void TearDown() override { EXPECT_TRUE(host.unload().ok()); }

    long control(const char* command, long value = 0) {
        Loaded_Module module(TVRN_TEST_MODULE);
        auto f = module.symbol<long (*)(const char*, long)>("tvrntest_control");
        return f ? f(command, value) : -100;
    }

    // An MI made directly by the module's factory (without a status to fill).
    template <class MI>
    MI* make_mi(const char* factory_name) {
        Loaded_Module module(TVRN_TEST_MODULE);
        auto f = module.symbol<MI* (*)(const CMPIBroker*, const CMPIContext*, CMPIStatus*)>(
            factory_name);
        return f ? f(host.broker(), nullptr, nullptr) : nullptr;
    }

    std::string text(const char* what) {
        Loaded_Module module(TVRN_TEST_MODULE);
        auto f = module.symbol<const char* (*)(const char*)>("tvrntest_text");
        return f ? f(what) : "";
    }

    MethodResult configure(uint32_t level) {
        return host.invokeMethod(gadget_path("g1"), "Configure", {{"Level", Value::uint32(level)}});
    }

    void seed_links() {
        ASSERT_TRUE(host.createInstance(gadget("g1", "one")).ok());
        ASSERT_TRUE(host.createInstance(gadget("g2", "two")).ok());
        ASSERT_TRUE(host.store(NS).add(owner("o1", "first owner")));
        ASSERT_TRUE(host.store(NS).add(owner("o2", "second owner")));
        link("g1", "o1", Value::string("n1"));
        link("g1", "o2", Value::string("n2"));
        link("g2", "o1", Value::null(Type::String));
    }

    void link(const std::string& g, const std::string& o, Value note) {
        Instance l(NS, "TVRNTEST_Link");
        l.setKey("Left", Value::reference(gadget_path(g)));
        l.setKey("Right", Value::reference(owner_path(o)));
        l.set("Note", note);
        ASSERT_TRUE(host.createInstance(l).ok());
    }

    Host host;
};

TEST_F(Dispatch, InstancesGoThroughCreateGetModifyAndDelete) {
    Instance g = gadget("g1", "first");
    g.set("Tags", Value::array(Type::String, {Value::string("a"), Value::string("b")}));
    g.set("Ratio", Value::real64(2.5));
    g.set("When", Value::dateTime(*DateTime::parse("20240131235959.123456+060")));
    g.set("Owner", Value::reference(owner_path("o1")));

    PathResult created = host.createInstance(g);
    ASSERT_TRUE(created.ok()) << created.toString();
    EXPECT_TRUE(created.path.identifies(gadget_path("g1")));
    EXPECT_EQ(host.createInstance(g).rc, CMPI_RC_ERR_ALREADY_EXISTS);

    InstanceResult got = host.getInstance(gadget_path("g1"));
    ASSERT_TRUE(got.ok()) << got.toString();
    for (const char* name : {"Name", "Port", "Index", "Label", "Tags", "Ratio", "When"}) {
        ASSERT_TRUE(got.instance.get(name)) << name;
        EXPECT_EQ(*got.instance.get(name), *g.get(name)) << name;
    }
    ASSERT_TRUE(got.instance.get("Owner"));
    EXPECT_TRUE(got.instance.get("Owner")->asReference().identifies(owner_path("o1")));

    Result<ObjectPath> names = host.enumerateInstanceNames(NS, "TVRNTEST_Gadget");
    ASSERT_EQ(names.items.size(), 1u);
    EXPECT_TRUE(names.items[0].identifies(gadget_path("g1")));

    // Only the listed property changes.
    Instance change = gadget("g1", "changed");
    change.set("Ratio", Value::real64(9));
    ASSERT_TRUE(host.modifyInstance(change, std::vector<std::string>{"Label"}).ok());
    got = host.getInstance(gadget_path("g1"));
    EXPECT_EQ(got.instance.get("Label")->asString(), "changed");
    EXPECT_EQ(got.instance.get("Ratio")->asReal(), 2.5);
    EXPECT_EQ(host.modifyInstance(gadget("gone", "x")).rc, CMPI_RC_ERR_NOT_FOUND);

    EXPECT_TRUE(host.deleteInstance(gadget_path("g1")).ok());
    EXPECT_EQ(host.deleteInstance(gadget_path("g1")).rc, CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(host.getInstance(gadget_path("g1")).rc, CMPI_RC_ERR_NOT_FOUND);
}

// Association requests the provider does not answer itself fall back on
// the association's enumeration, and report its failure.
TEST_F(Dispatch, ProviderStatusesBecomeCmpiCodes) {
    seed_links();
    const ObjectPath g1 = gadget_path("g1");
    const std::map<std::string, std::function<int()>> request = {
        {"get", [&] { return host.getInstance(g1).rc; }},
        {"enum", [&] { return host.enumerateInstances(NS, "TVRNTEST_Gadget").rc; }},
        {"names", [&] { return host.enumerateInstanceNames(NS, "TVRNTEST_Gadget").rc; }},
        {"create", [&] { return host.createInstance(gadget("g3", "y")).rc; }},
        {"delete", [&] { return host.deleteInstance(g1).rc; }},
        {"modify", [&] { return host.modifyInstance(gadget("g1", "z")).rc; }},
        {"invoke", [&] { return host.invokeMethod(g1, "Configure").rc; }},
        {"associator_names", [&] { return host.associatorNames(g1, "TVRNTEST_Link").rc; }},
        {"associators", [&] { return host.associators(g1, "TVRNTEST_Link").rc; }},
        {"references", [&] { return host.references(g1, "TVRNTEST_Link").rc; }},
        {"reference_names", [&] { return host.referenceNames(g1, "TVRNTEST_Link").rc; }},
    };
    const struct {
        const char* force;
        long status;
        const char* request;
        int rc;
    } cases[] = {
        {"get", 60, "get", CMPI_RC_ERR_NOT_FOUND},
        {"get", 63, "get", CMPI_RC_ERR_ACCESS_DENIED},
        {"enum", 71, "enum", CMPI_RC_ERR_ACCESS_DENIED},
        {"enum", 71, "names", CMPI_RC_ERR_ACCESS_DENIED},
        {"create", 81, "create", CMPI_RC_ERR_NOT_SUPPORTED},
        {"create", 82, "create", CMPI_RC_ERR_INVALID_PARAMETER},
        {"delete", 90, "delete", CMPI_RC_ERR_NOT_FOUND},
        {"modify", 102, "modify", CMPI_RC_ERR_INVALID_PARAMETER},
        {"modify", 104, "modify", CMPI_RC_ERR_FAILED},
        {"invoke", 131, "invoke", CMPI_RC_ERR_NOT_SUPPORTED},
        {"invoke", 132, "invoke", CMPI_RC_ERR_ACCESS_DENIED},
        {"associator_names", 112, "associator_names", CMPI_RC_ERR_FAILED},
        {"associator_names", 0, "associator_names", CMPI_RC_OK},
        {"associators", 170, "associators", CMPI_RC_ERR_FAILED},
        {"associators", 172, "associators", CMPI_RC_ERR_ACCESS_DENIED},
        {"references", 122, "references", CMPI_RC_ERR_ACCESS_DENIED},
        {"link.enum", 71, "associator_names", CMPI_RC_ERR_ACCESS_DENIED},
        {"link.enum", 71, "reference_names", CMPI_RC_ERR_ACCESS_DENIED},
        {"link.enum", 70, "associators", CMPI_RC_ERR_FAILED},
    };
    for (const auto& c : cases) {
        control((std::string("force:") + c.force).c_str(), c.status);
        EXPECT_EQ(request.at(c.request)(), c.rc) << c.request << " " << c.status;
        control((std::string("force:") + c.force).c_str(), -1);
    }
}

TEST_F(Dispatch, GetRunsTheEnumerationAndMatchesRepairedIntegerKeys) {
    ASSERT_TRUE(host.createInstance(gadget("g1", "one")).ok());
    ASSERT_TRUE(host.createInstance(gadget("g2", "two")).ok());

    // Servers hand integer keys over as 64-bit integers.
    InstanceResult got = host.getInstance(gadget_path("g2", Value::uint64(80), Value::sint64(5)));
    ASSERT_TRUE(got.ok()) << got.toString();
    EXPECT_EQ(got.instance.get("Label")->asString(), "two");
    got = host.getInstance(gadget_path("g2", Value::sint64(80), Value::uint64(5)));
    EXPECT_TRUE(got.ok()) << got.toString();

    EXPECT_EQ(host.getInstance(gadget_path("g2", Value::uint16(81))).rc, CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(host.getInstance(gadget_path("g3")).rc, CMPI_RC_ERR_NOT_FOUND);

    // A failed enumeration finds nothing, even when it delivered a match.
    control("force:enum", 70);
    EXPECT_EQ(host.getInstance(gadget_path("g2")).rc, CMPI_RC_ERR_NOT_FOUND);
}

TEST_F(Dispatch, ModelsSayWhichPropertiesAreWanted) {
    ASSERT_TRUE(host.createInstance(gadget("g1", "one")).ok());

    ASSERT_TRUE(host.enumerateInstanceNames(NS, "TVRNTEST_Gadget").ok());
    EXPECT_EQ(text("model"), "");

    Result<Instance> all =
        host.enumerateInstances(NS, "TVRNTEST_Gadget", std::vector<std::string>{"Label"});
    EXPECT_EQ(text("model"), "Label");
    ASSERT_EQ(all.items.size(), 1u);
    EXPECT_TRUE(all.items[0].get("Label"));

    ASSERT_TRUE(host.getInstance(gadget_path("g1")).ok());
    EXPECT_EQ(text("model"), "Name,Port,Index,Label,When,Tags,Ratio,Flag,Initial");

    InstanceResult got = host.getInstance(gadget_path("g1"), std::vector<std::string>{"Label"});
    EXPECT_EQ(text("model"), "Name,Port,Index,Label");
    EXPECT_TRUE(got.instance.get("Label"));
    EXPECT_FALSE(got.instance.get("Owner"));
}

TEST_F(Dispatch, RequestsForClassesOutsideTheProvidersLineAreRefused) {
    Instance special(ObjectPath(NS, "TVRNTEST_Special_Gadget"));
    special.setKey("Name", Value::string("s1"));
    special.setKey("Port", Value::uint16(1));
    special.setKey("Index", Value::uint32(2));
    special.set("Extra", Value::string("more"));
    ASSERT_TRUE(host.createInstance(special).ok());
    EXPECT_NE(text("created").find("TVRNTEST_Special_Gadget"), std::string::npos);
    EXPECT_NE(text("created").find("string Extra = \"more\";"), std::string::npos);

    long enums = control("count:enum");
    EXPECT_EQ(host.enumerateInstances("root/wrong", "TVRNTEST_Owner").rc,
              CMPI_RC_ERR_INVALID_CLASS);
    EXPECT_EQ(host.enumerateInstances("root/wrong", "TVRNTEST_Unknown").rc, CMPI_RC_ERR_FAILED);
    EXPECT_EQ(host.getInstance(ObjectPath("root/wrong", "TVRNTEST_Unknown")).rc,
              CMPI_RC_ERR_FAILED);
    EXPECT_EQ(host.invokeMethod(ObjectPath("root/wrong", "TVRNTEST_Unknown"), "Configure").rc,
              CMPI_RC_ERR_FAILED);
    EXPECT_EQ(control("count:enum"), enums);
}

TEST_F(Dispatch, BadFeaturesAreLoggedAndLeftOut) {
    Log_Watch log;
    Instance g = gadget("g1", "kept");
    g.set("Label", Value::null(Type::String));
    g.set("Ratio", Value::real64(1.5));
    g.set("Bogus", Value::string("ignored"));
    g.set("When", Value::string("not a date"));
    g.set("Owner", Value::reference(gadget_path("g0")));  // a gadget is no owner
    Instance detail(owner_path("d1"));
    detail.set("Id", Value::string("d1"));
    detail.set("Name", Value::string("embedded"));
    g.set("Detail", Value::instance(detail));
    ASSERT_TRUE(host.createInstance(g).ok());

    const std::string created = text("created");
    EXPECT_NE(created.find("string Label = NULL;"), std::string::npos) << created;
    EXPECT_NE(created.find("real64 Ratio = 1.5"), std::string::npos) << created;
    EXPECT_NE(created.find("datetime When = NULL;"), std::string::npos) << created;
    EXPECT_NE(created.find("TVRNTEST_Owner Owner = NULL;"), std::string::npos) << created;
    EXPECT_NE(created.find("string Name = \"embedded\";"), std::string::npos) << created;

    EXPECT_TRUE(log.has("WARN: Container.cpp")) << log.text();
    EXPECT_TRUE(log.has("unknown feature: TVRNTEST_Gadget.Bogus")) << log.text();
    EXPECT_TRUE(log.has("type mismatch on When: string/datetime")) << log.text();
    EXPECT_TRUE(log.has("failed to assign instance of TVRNTEST_Gadget to TVRNTEST_Owner.Owner"))
        << log.text();

    // The embedded instance goes back out as one.
    InstanceResult got = host.getInstance(gadget_path("g1"));
    ASSERT_TRUE(got.instance.get("Detail"));
    ASSERT_EQ(got.instance.get("Detail")->type(), Type::Instance);
    EXPECT_EQ(got.instance.get("Detail")->asInstance().get("Name")->asString(), "embedded");
    EXPECT_FALSE(got.instance.get("Label"));
}

TEST_F(Dispatch, MethodsTakeArgumentsAndGiveBackOutputsAndTheReturnValue) {
    ASSERT_TRUE(host.createInstance(gadget("g1", "x")).ok());
    MethodResult r = host.invokeMethod(
        gadget_path("g1"), "configure",
        {{"Level", Value::uint32(5)},
         {"Targets", Value::array(Type::Reference, {Value::reference(owner_path("o1")),
                                                    Value::reference(owner_path("o2"))})}});
    ASSERT_TRUE(r.ok() && r.outArg("Report")) << r.toString();
    EXPECT_EQ(r.returnValue, Value::uint32(7));
    EXPECT_EQ(r.outArg("Report")->asString(), "level=5 targets=2 null=0 user=root");
    ASSERT_TRUE(r.outArg("Result"));
    EXPECT_TRUE(r.outArg("Result")->asReference().identifies(owner_path("result")));
    EXPECT_FALSE(r.outArg("return_value"));
    EXPECT_EQ(r.out.size(), 2u);

    // An empty array of references that arrives as a boolean.
    r = host.invokeMethod(gadget_path("g1"), "Configure", {{"Targets", Value::boolean(true)}});
    ASSERT_TRUE(r.ok()) << r.toString();
    EXPECT_EQ(r.outArg("Report")->asString(), "level=0 targets=0 null=1 user=root");

    // Calls back into the server from within a request.
    ASSERT_TRUE(host.store(NS).add(owner("o1", "first owner")));
    ASSERT_TRUE(host.store(NS).add(owner("o2", "second owner")));
    r = configure(97);
    ASSERT_TRUE(r.ok()) << r.toString();
    EXPECT_EQ(r.outArg("Report")->asString(),
              "owners=2 create=0 modify=0 get=renamed delete=0 invoke=0 return=7 "
              "inner=level=5 targets=0 null=1 user=root result=result");
    EXPECT_FALSE(host.store(NS).find(owner_path("made")));

    r = host.invokeMethod(gadget_path("g1"), "Nope");
    EXPECT_EQ(r.rc, CMPI_RC_ERR_METHOD_NOT_FOUND);
    EXPECT_EQ(r.msg, "Nope");
    EXPECT_EQ(host.invokeMethod(ObjectPath(NS, "TVRNTEST_Link"), "Configure").rc,
              CMPI_RC_ERR_METHOD_NOT_FOUND);
}

TEST_F(Dispatch, AssociatorNamesFollowTheEnumeratedAssociations) {
    seed_links();
    auto names = [&](const ObjectPath& p, const char* result_class, const char* role,
                     const char* result_role) {
        auto r = host.associatorNames(p, "TVRNTEST_Link", result_class, role, result_role);
        EXPECT_TRUE(r.ok()) << r.toString();
        return r.items;
    };
    EXPECT_EQ(ids_of(names(gadget_path("g1"), "", "Left", "Right"), "Id"),
              (std::set<std::string>{"o1", "o2"}));
    EXPECT_TRUE(names(gadget_path("g1"), "", "Right", "").empty());
    EXPECT_TRUE(names(gadget_path("g1"), "TVRNTEST_Gadget", "", "").empty());
    EXPECT_EQ(ids_of(names(owner_path("o1"), "TVRNTEST_Gadget", "", "Left"), "Name"),
              (std::set<std::string>{"g1", "g2"}));
    EXPECT_TRUE(names(owner_path("o9"), "", "", "").empty());

    // The other ends carry the keys the association holds, in the request's
    // name space.
    auto ends = names(owner_path("o1"), "", "", "");
    ASSERT_EQ(ends.size(), 2u);
    EXPECT_EQ(ends[0].nameSpace(), NS);
    EXPECT_EQ(ends[0].key("Port")->asUint(), 80u);

    EXPECT_EQ(host.associatorNames(ObjectPath(NS, "CIM_Nothing"), "TVRNTEST_Link").rc,
              CMPI_RC_ERR_INVALID_CLASS);
}

TEST_F(Dispatch, AssociatorsAskTheServerForTheFullInstances) {
    seed_links();
    Result<Instance> r = host.associators(gadget_path("g1"), "TVRNTEST_Link", "", "", "",
                                          std::vector<std::string>{"Name"});
    ASSERT_EQ(r.items.size(), 2u) << r.toString();
    for (const Instance& i : r.items) {
        ASSERT_TRUE(i.get("Name"));
        EXPECT_NE(i.get("Name")->asString().find("owner"), std::string::npos);
    }

    // Gadgets come from their own provider (get through its enumeration).
    r = host.associators(owner_path("o1"), "TVRNTEST_Link");
    ASSERT_TRUE(r.ok()) << r.toString();
    std::set<std::string> labels;
    for (const Instance& i : r.items)
        labels.insert(i.get("Label")->asString());
    EXPECT_EQ(labels, (std::set<std::string>{"one", "two"}));

    r = host.associators(ObjectPath(NS, "CIM_Nothing"), "TVRNTEST_Link");
    EXPECT_TRUE(r.ok() && r.items.empty());
}

TEST_F(Dispatch, ReferencesAreTheAssociationsThatHoldTheSource) {
    seed_links();
    EXPECT_EQ(host.references(gadget_path("g1"), "TVRNTEST_Link", "Left").items.size(), 2u);
    EXPECT_TRUE(host.references(gadget_path("g1"), "TVRNTEST_Link", "Right").items.empty());
    EXPECT_EQ(host.referenceNames(owner_path("o1"), "TVRNTEST_Link").items.size(), 2u);

    // Without a property list every property comes back as it is: a null
    // note stays null.
    Result<Instance> r = host.references(gadget_path("g2"), "TVRNTEST_Link");
    ASSERT_EQ(r.items.size(), 1u);
    EXPECT_FALSE(r.items[0].get("Note"));
    ASSERT_TRUE(r.items[0].get("Left"));

    r = host.references(owner_path("o2"), "TVRNTEST_Link", "", std::vector<std::string>{"Note"});
    ASSERT_EQ(r.items.size(), 1u);
    ASSERT_TRUE(r.items[0].get("Note"));
    EXPECT_EQ(r.items[0].get("Note")->asString(), "n2");
}

TEST_F(Dispatch, OneAdapterServesEveryMiOfAProvider) {
    ASSERT_TRUE(host.createInstance(gadget("g1", "x")).ok());
    ASSERT_TRUE(host.invokeMethod(gadget_path("g1"), "Configure").ok());
    EXPECT_EQ(control("count:load"), 1);

    int store_reports = 0;
    for (const auto& c : host.cleanup(false)) {
        if (c.provider == "Test_Store_Provider") {
            store_reports++;
            EXPECT_EQ(c.rc, CMPI_RC_OK);
        }
    }
    EXPECT_EQ(store_reports, 2);
    EXPECT_EQ(control("count:unload"), 1);  // when the last of the two MIs goes

    // The next request starts over with a new provider.
    ASSERT_TRUE(host.enumerateInstances(NS, "TVRNTEST_Gadget").ok());
    EXPECT_EQ(control("count:load"), 2);
}

TEST_F(Dispatch, AProviderWithWorkLeftRefusesToBeUnloaded) {
    ASSERT_TRUE(host.createInstance(gadget("g1", "x")).ok());
    ASSERT_TRUE(configure(99).ok());
    for (const auto& c : host.cleanup(false)) {
        if (c.provider == "Test_Store_Provider") {
            EXPECT_EQ(c.rc, CMPI_RC_DO_NOT_UNLOAD);
        }
    }
    EXPECT_EQ(control("count:unload"), 0);

    // Still served by the same provider.
    EXPECT_EQ(host.enumerateInstances(NS, "TVRNTEST_Gadget").items.size(), 1u);
    EXPECT_EQ(control("count:load"), 1);

    ASSERT_TRUE(configure(98).ok());
    host.cleanup(false);
    EXPECT_EQ(control("count:unload"), 1);

    // A terminating cleanup unloads whatever the provider says.
    ASSERT_TRUE(configure(99).ok());
    host.cleanup(true);
    EXPECT_EQ(control("count:unload"), 2);
}

class Indications : public Dispatch {
protected:
    void SetUp() override {
        Dispatch::SetUp();
        Instance manager(ObjectPath("root/PG_InterOp", "CIM_ObjectManager"));
        manager.setKey("SystemCreationClassName", Value::string("CIM_ComputerSystem"));
        manager.setKey("SystemName", Value::string("host"));
        manager.setKey("CreationClassName", Value::string("CIM_ObjectManager"));
        manager.setKey("Name", Value::string("manager"));
        manager.set("ElementName", Value::string("Seeded Manager"));
        ASSERT_TRUE(host.store("root/PG_InterOp").add(manager));
    }

    // Asks the provider's thread for one indication and returns the name
    // spaces it reached.
    std::multiset<std::string> deliver_one() {
        host.clearIndications();
        long before = control("count:delivered");
        EXPECT_EQ(control("deliver", 1), 0);
        for (int i = 0; i < 500 && control("count:delivered") == before; i++)
            std::this_thread::sleep_for(std::chrono::milliseconds(10));
        EXPECT_EQ(control("count:delivered"), before + 1);
        std::multiset<std::string> spaces;
        for (const Indication& i : host.indications()) {
            spaces.insert(i.nameSpace);
            EXPECT_EQ(i.instance.className(), "TAVRIN_AlertIndication");
            const Value* message = i.instance.get("Message");
            EXPECT_TRUE(message && message->asString() == "Seeded Manager");
        }
        return spaces;
    }
};

TEST_F(Indications, FiltersCountPerNameSpaceAndTheThreadCallsBack) {
    ASSERT_TRUE(host.subscribe("root/test", "TAVRIN_AlertIndication").ok());
    ASSERT_TRUE(host.subscribe("root/test", "TAVRIN_AlertIndication").ok());
    ASSERT_TRUE(host.subscribe("root/other", "TAVRIN_AlertIndication").ok());
    EXPECT_EQ(control("count:enable"), 1);

    EXPECT_EQ(deliver_one(), (std::multiset<std::string>{"root/other", "root/test"}));
    ASSERT_TRUE(host.unsubscribe("root/test", "TAVRIN_AlertIndication").ok());
    EXPECT_EQ(deliver_one(), (std::multiset<std::string>{"root/other", "root/test"}));
    ASSERT_TRUE(host.unsubscribe("root/test", "TAVRIN_AlertIndication").ok());
    EXPECT_EQ(deliver_one(), (std::multiset<std::string>{"root/other"}));

    ASSERT_TRUE(host.unsubscribe("root/other", "TAVRIN_AlertIndication").ok());
    EXPECT_EQ(control("count:disable"), 1);
}

TEST_F(Indications, EnablingTwiceAsksTheProviderOnce) {
    CMPIIndicationMI* mi = make_mi<CMPIIndicationMI>("Test_Alert_Create_IndicationMI");
    ASSERT_TRUE(mi);

    EXPECT_EQ(mi->ft->enableIndications(mi, nullptr).rc, CMPI_RC_OK);
    EXPECT_EQ(mi->ft->enableIndications(mi, nullptr).rc, CMPI_RC_OK);
    EXPECT_EQ(control("count:enable"), 1);
    EXPECT_EQ(mi->ft->disableIndications(mi, nullptr).rc, CMPI_RC_OK);
    EXPECT_EQ(mi->ft->disableIndications(mi, nullptr).rc, CMPI_RC_OK);
    EXPECT_EQ(control("count:disable"), 1);

    // A provider that fails to enable is asked again next time.
    control("force:enable", 140);
    EXPECT_EQ(mi->ft->enableIndications(mi, nullptr).rc, CMPI_RC_ERR_FAILED);
    control("force:enable", -1);
    EXPECT_EQ(mi->ft->enableIndications(mi, nullptr).rc, CMPI_RC_OK);
    EXPECT_EQ(control("count:enable"), 3);

    EXPECT_EQ(mi->ft->cleanup(mi, nullptr, 1).rc, CMPI_RC_OK);
    // Stopped by the cleanup, then once more by the provider's own unload.
    EXPECT_EQ(control("count:disable"), 3);

    // The MI is dead now.
    EXPECT_EQ(mi->ft->enableIndications(mi, nullptr).rc, CMPI_RC_ERR_FAILED);
}

// The server's last cleanup of a provider that does not stop its own
// indications: the binding stops them before the adapter goes.
TEST_F(Indications, CleanupStopsIndicationsTheProviderLeftRunning) {
    control("flood", 100);
    ASSERT_TRUE(host.subscribe("root/test", "TAVRIN_AlertIndication").ok());
    ASSERT_TRUE(host.waitForIndications(5, std::chrono::seconds(20)));
    control("force:unload", 0);
    host.cleanup(true);
    EXPECT_EQ(control("count:disable"), 1);
    control("force:unload", -1);
}

// A delivery thread that cannot start leaves nothing of the server's behind.
TEST_F(Indications, AThreadThatCannotStartReleasesItsContext) {
    CMPIIndicationMI* mi = make_mi<CMPIIndicationMI>("Test_Alert_Create_IndicationMI");
    ASSERT_TRUE(mi);
    const size_t live = Host::liveObjects();
    // Threads that ask for more stack than the address space holds cannot start.
    pthread_attr_t defaults, huge;
    ASSERT_EQ(pthread_getattr_default_np(&defaults), 0);
    pthread_attr_init(&huge);
    pthread_attr_setstacksize(&huge, size_t(1) << 46);
    ASSERT_EQ(pthread_setattr_default_np(&huge), 0);
    const CMPIrc rc = mi->ft->enableIndications(mi, nullptr).rc;
    pthread_setattr_default_np(&defaults);
    pthread_attr_destroy(&huge);
    pthread_attr_destroy(&defaults);
    EXPECT_EQ(rc, CMPI_RC_ERR_FAILED);
    EXPECT_EQ(Host::liveObjects(), live);
    EXPECT_EQ(mi->ft->cleanup(mi, nullptr, 1).rc, CMPI_RC_OK);
}

TEST_F(Indications, DisablingWhileTheThreadDeliversDoesNotHang) {
    control("flood", 0);
    ASSERT_TRUE(host.subscribe("root/test", "TAVRIN_AlertIndication").ok());
    ASSERT_TRUE(host.waitForIndications(20, std::chrono::seconds(20)));

    auto done = std::async(std::launch::async, [&] {
        return host.unsubscribe("root/test", "TAVRIN_AlertIndication").ok();
    });
    if (done.wait_for(std::chrono::seconds(30)) != std::future_status::ready) {
        ADD_FAILURE() << "disableIndications is stuck";
        std::_Exit(1);
    }
    EXPECT_TRUE(done.get());
    EXPECT_EQ(control("count:disable"), 1);
}

TEST_F(Indications, OnlyThreadsWithAContextCallBack) {
    ASSERT_TRUE(host.store(NS).add(owner("o1", "first owner")));
    EXPECT_EQ(control("orphan"), 0);
}

TEST_F(Indications, RequestsOnManyThreadsWhileTheProviderDelivers) {
    control("flood", 200);
    ASSERT_TRUE(host.subscribe("root/test", "TAVRIN_AlertIndication").ok());
    std::vector<std::thread> threads;
    std::atomic<int> failures(0);
    for (int t = 0; t < 4; t++) {
        threads.emplace_back([&, t] {
            for (int i = 0; i < 20; i++) {
                std::string name = "t" + std::to_string(t) + "-" + std::to_string(i);
                failures += !host.createInstance(gadget(name, "x")).ok();
                failures += !host.getInstance(gadget_path(name)).ok();
                failures += !host.enumerateInstanceNames(NS, "TVRNTEST_Gadget").ok();
                failures += !host.invokeMethod(gadget_path(name), "Configure").ok();
            }
        });
    }
    for (auto& t : threads)
        t.join();
    EXPECT_EQ(failures.load(), 0);
    EXPECT_EQ(host.enumerateInstances(NS, "TVRNTEST_Gadget").items.size(), 80u);
    EXPECT_TRUE(host.unsubscribe("root/test", "TAVRIN_AlertIndication").ok());
}

TEST_F(Dispatch, BadRequestsFailCleanly) {
    CMPIInstanceMI* mi = make_mi<CMPIInstanceMI>("Test_Store_Provider_Create_InstanceMI");
    ASSERT_TRUE(mi);
    const CMPIBroker* broker = host.broker();
    CMPIObjectPath* gadget = CMNewObjectPath(broker, NS, "TVRNTEST_Gadget", nullptr);

    EXPECT_EQ(mi->ft->enumerateInstances(mi, nullptr, nullptr, nullptr, nullptr).rc,
              CMPI_RC_ERR_FAILED);
    EXPECT_EQ(mi->ft->getInstance(mi, nullptr, nullptr, nullptr, nullptr).rc, CMPI_RC_ERR_FAILED);
    EXPECT_EQ(mi->ft->createInstance(mi, nullptr, nullptr, gadget, nullptr).rc, CMPI_RC_ERR_FAILED);
    EXPECT_EQ(mi->ft->modifyInstance(mi, nullptr, nullptr, gadget, nullptr, nullptr).rc,
              CMPI_RC_ERR_FAILED);
    EXPECT_EQ(mi->ft->deleteInstance(mi, nullptr, nullptr, nullptr).rc, CMPI_RC_ERR_FAILED);
    EXPECT_EQ(mi->ft->execQuery(mi, nullptr, nullptr, gadget, "select * from x", "WQL").rc,
              CMPI_RC_ERR_NOT_SUPPORTED);
    EXPECT_EQ(mi->ft->enumerateInstances(nullptr, nullptr, nullptr, gadget, nullptr).rc,
              CMPI_RC_ERR_FAILED);
    EXPECT_EQ(control("count:enum"), 0);

    EXPECT_EQ(mi->ft->cleanup(mi, nullptr, 1).rc, CMPI_RC_OK);
    EXPECT_EQ(mi->ft->cleanup(mi, nullptr, 1).rc, CMPI_RC_OK);  // already gone
    EXPECT_EQ(mi->ft->enumerateInstances(mi, nullptr, nullptr, gadget, nullptr).rc,
              CMPI_RC_ERR_FAILED);
    CMRelease(gadget);
}

}  // namespace
