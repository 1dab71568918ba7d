// The pairing engine on sets written here: how partners are matched (first
// or all, with or without case, by position), and what no association of the
// module can be made to do (a host that is not exactly one, a rule that
// names a reference its class does not have).
#include <gtest/gtest.h>

#include <map>
#include <string>
#include <vector>

#include "framework/Slot.h"
#include "providers/Pairing_Engine.h"
#include "schema/generated/TAVRIN_ComputerSystem.h"
#include "schema/generated/TAVRIN_ElementStatisticalData.h"
#include "schema/generated/TAVRIN_FCPort.h"
#include "schema/generated/TAVRIN_FCPortStatistics.h"
#include "schema/generated/TAVRIN_FCPortSystemDevice.h"
#include "schema/generated/TAVRIN_PhysicalPackage.h"
#include "schema/generated/TAVRIN_PortController.h"
#include "schema/generated/TAVRIN_Realizes.h"

using namespace CPTA;

namespace {

// Class ids of the sets.
enum { HOSTS = 1, CONTROLLERS = 2, PORTS = 3, STATISTICS = 5, PACKAGES = 6, NOTHING = 37 };

// Request-wide sets by class id; each fetch hands out copies (a null stays null).
class Sets : public Pairing_Sources {
public:
    ~Sets() {
        for (auto& set : _sets)
            for (Instance* instance : set.second)
                destroy(instance);
    }

    template <class C>
    C* add(int id) {
        C* instance = create<C>(true);
        _sets[id].push_back(instance);
        _classes[id] = &C::static_meta_class;
        return instance;
    }
    void addGap(int id) { _sets[id].push_back(nullptr); }

    Array<Instance*> fetch(Source, int id, const Meta_Class*& expected) override {
        expected = _classes[id];
        Array<Instance*> out;
        for (Instance* instance : _sets[id])
            out.append(instance ? clone(instance) : nullptr);
        return out;
    }
    Array<Instance*> fetch_for(Source, const String&, const Meta_Class*&) override {
        return Array<Instance*>();
    }
    String adapter_serial_number(unsigned) override { return String(); }

private:
    std::map<int, std::vector<Instance*>> _sets;
    std::map<int, const Meta_Class*> _classes;
};

std::string text(const Instance* instance, const char* property) {
    const Property<String>* p = text_property(instance, property);
    return p == nullptr || p->null ? "?" : p->value.c_str();
}

// An end of the associations, named by a text property of the instance there.
struct End {
    const char* role;
    const char* property;
};

// The associations of class A a rule delivers, each as "<end 0>><end 1>";
// {"failed"} when the rule fails.
template <class A>
std::vector<std::string> pairs(const Pairing& rule, Sets& sets, End first, End second) {
    std::vector<Instance*> delivered;
    Enum_Instances_Status status = enumerate_pairs(
        rule, &A::static_meta_class, sets,
        [](Instance* a, void* out) { static_cast<std::vector<Instance*>*>(out)->push_back(a); },
        &delivered);
    auto end = [](const Instance* a, End e) {
        const Meta_Reference* mr = find_reference(a->meta_class, e.role);
        return text(reference_in(slot_of(a, mr->offset)), e.property);
    };
    std::vector<std::string> out;
    for (Instance* a : delivered) {
        out.push_back(end(a, first) + ">" + end(a, second));
        destroy(a);
    }
    return status == ENUM_INSTANCES_OK ? out : std::vector<std::string>{"failed"};
}

// ---- matching by key ------------------------------------------------------------

// Each FC port (by DeviceID) with the statistics whose InstanceID is its
// DeviceID; a statistics instance is named by its ElementName (its place).
constexpr Pairing kFirst = TVRN_PAIRING.fetch(PORTS)
                               .fetch(STATISTICS)
                               .for_each(0)
                               .as("ManagedElement")
                               .with_first(1, "Stats", key("DeviceID"), key("InstanceID"));
constexpr Pairing kAll = TVRN_PAIRING.fetch(PORTS)
                             .fetch(STATISTICS)
                             .for_each(0)
                             .as("ManagedElement")
                             .with_all(1, "Stats", key("DeviceID"), key("InstanceID"));
constexpr Pairing kFirstExact = kFirst.exact();
constexpr Pairing kAllExact = kAll.exact();

struct Match_Case {
    const char* name;
    const Pairing& rule;
    std::vector<std::string> expected;
};

TEST(Pairing, PartnersByKeyFirstOrAllWithOrWithoutCase) {
    Sets sets;
    for (const char* id : {"A", "b", "C"})
        sets.add<TAVRIN_FCPort>(PORTS)->DeviceID.set(String(id));
    const char* ids[] = {"a", "A", "B", "x", "A"};
    for (int i = 0; i < 5; i++) {
        TAVRIN_FCPortStatistics* s = sets.add<TAVRIN_FCPortStatistics>(STATISTICS);
        s->InstanceID.set(String(ids[i]));
        s->ElementName.set(String(("s" + std::to_string(i)).c_str()));
    }
    const Match_Case cases[] = {
        {"first, any case", kFirst, {"A>s0", "b>s2"}},
        {"all, any case", kAll, {"A>s0", "A>s1", "A>s4", "b>s2"}},
        {"first, exact", kFirstExact, {"A>s1"}},
        {"all, exact", kAllExact, {"A>s1", "A>s4"}},
    };
    for (const Match_Case& c : cases)
        EXPECT_EQ(pairs<TAVRIN_ElementStatisticalData>(c.rule, sets, {"ManagedElement", "DeviceID"},
                                                       {"Stats", "ElementName"}),
                  c.expected)
            << c.name;
}

// Each controller (ElementName) with the package at its own position when
// the package's SerialNumber is the same text; a skipped package keeps its
// place, and no other package is tried.
constexpr Pairing kByPosition =
    TVRN_PAIRING.fetch(CONTROLLERS)
        .fetch(PACKAGES)
        .for_each(0)
        .as("Dependent")
        .at_same_position(1, "Antecedent", key("ElementName"), key("SerialNumber"));

TEST(Pairing, ByPositionAcrossAGap) {
    Sets sets;
    for (const char* serial : {"S1", "S2", "S3"})
        sets.add<TAVRIN_PortController>(CONTROLLERS)->ElementName.set(String(serial));
    sets.add<TAVRIN_PhysicalPackage>(PACKAGES)->SerialNumber.set(String("s1"));
    sets.addGap(PACKAGES);
    sets.add<TAVRIN_PhysicalPackage>(PACKAGES)->SerialNumber.set(String("S3"));
    sets.add<TAVRIN_PhysicalPackage>(PACKAGES)->SerialNumber.set(String("S2"));
    EXPECT_EQ(pairs<TAVRIN_Realizes>(kByPosition, sets, {"Dependent", "ElementName"},
                                     {"Antecedent", "SerialNumber"}),
              (std::vector<std::string>{"S1>s1", "S3>S3"}));
}

// ---- checks and roles -----------------------------------------------------------

// The host with every FC port, the "host" being the instances of `hosts`.
constexpr Pairing hostsOf(int hosts) {
    return TVRN_PAIRING.fetch(hosts)
        .when_not_one(LL_ERR, "Error: Invalid mapping information")
        .fetch(PORTS)
        .for_each(0)
        .as("GroupComponent")
        .with_every(1, "PartComponent");
}
constexpr Pairing kOneHost = hostsOf(HOSTS);
constexpr Pairing kThreeHosts = hostsOf(PORTS);
constexpr Pairing kNoHost = hostsOf(NOTHING);
constexpr Pairing kNoSuchRole = TVRN_PAIRING.host_with_every(PORTS, "GroupComponent", "Member",
                                                             "Error: Invalid mapping information");

const End kHost{"GroupComponent", "Name"}, kPort{"PartComponent", "DeviceID"};

TEST(Pairing, TheHostMustBeExactlyOneAndEachRoleAReference) {
    Sets sets;
    sets.add<TAVRIN_ComputerSystem>(HOSTS)->Name.set(String("h"));
    for (const char* id : {"p1", "p2", "p3"})
        sets.add<TAVRIN_FCPort>(PORTS)->DeviceID.set(String(id));
    EXPECT_EQ(pairs<TAVRIN_FCPortSystemDevice>(kOneHost, sets, kHost, kPort),
              (std::vector<std::string>{"h>p1", "h>p2", "h>p3"}));
    const std::vector<std::string> failed{"failed"};
    EXPECT_EQ(pairs<TAVRIN_FCPortSystemDevice>(kThreeHosts, sets, kHost, kPort), failed);
    EXPECT_EQ(pairs<TAVRIN_FCPortSystemDevice>(kNoHost, sets, kHost, kPort), failed);
    EXPECT_EQ(pairs<TAVRIN_FCPortSystemDevice>(kNoSuchRole, sets, kHost, kPort), failed);
}

}  // namespace
