// The pairing of the association providers on sets written here: the engine
// on rules of its own (first or all matches, with or without case, by
// position, count checks, roles), and the rules of the providers themselves,
// whose sources are compiled in and whose requests run on these sets.
#include <gtest/gtest.h>

#include <map>
#include <string>
#include <vector>

#include "framework/Slot.h"
#include "gateway/ClassId.h"
#include "providers/Association_Pairing.h"
#include "schema/generated/TAVRIN_AlarmDevice.h"
#include "schema/generated/TAVRIN_ComputerSystem.h"
#include "schema/generated/TAVRIN_ElementStatisticalData.h"
#include "schema/generated/TAVRIN_EthernetPort.h"
#include "schema/generated/TAVRIN_FCPort.h"
#include "schema/generated/TAVRIN_FCPortStatistics.h"
#include "schema/generated/TAVRIN_FCPortSystemDevice.h"
#include "schema/generated/TAVRIN_LANEndpoint.h"
#include "schema/generated/TAVRIN_LogicalPortGroup.h"
#include "schema/generated/TAVRIN_PhysicalPackage.h"
#include "schema/generated/TAVRIN_PortController.h"
#include "schema/generated/TAVRIN_Product.h"
#include "schema/generated/TAVRIN_Realizes.h"
#include "schema/generated/TAVRIN_SCSIProtocolEndpoint.h"

using namespace CPTA;

namespace CPTA {
TVRN_DECLARE_PROC(TAVRIN_AssociatedAlarm_Provider);
TVRN_DECLARE_PROC(TAVRIN_DeviceSAPImplementation_Provider);
TVRN_DECLARE_PROC(TAVRIN_ElementStatisticalData_Provider);
TVRN_DECLARE_PROC(TAVRIN_LANEndpointDeviceSAPImplementation_Provider);
TVRN_DECLARE_PROC(TAVRIN_MemberOfCollection_Provider);
TVRN_DECLARE_PROC(TAVRIN_ProductElementComponent_Provider);
TVRN_DECLARE_PROC(TAVRIN_ProductPhysicalComponent_Provider);
TVRN_DECLARE_PROC(TAVRIN_Realizes_Provider);
}  // namespace CPTA

namespace {

void setText(Instance* instance, const char* property, const char* value) {
    const Property<String>* p = text_property(instance, property);
    const_cast<Property<String>*>(p)->set(String(value));
}

std::string text(const Instance* instance, const char* property) {
    const Property<String>* p = text_property(instance, property);
    return p == nullptr || p->null ? "?" : p->value.c_str();
}

// Request-wide sets by class id; each fetch hands out copies (a null stays
// null). Every instance is named by its Caption: its place in the set.
class Sets : public Pairing_Sources {
public:
    ~Sets() {
        for (auto& set : _sets)
            for (Instance* instance : set.second)
                destroy(instance);
    }

    // One instance of the class per key, the key in `property`; null keys are gaps.
    void add(int id, const Meta_Class* meta_class, const char* property,
             std::vector<const char*> keys) {
        _classes[id] = meta_class;
        for (const char* key : keys) {
            Instance* instance = nullptr;
            if (key != nullptr) {
                instance = create(meta_class, true);
                setText(instance, property, key);
                setText(instance, "Caption", std::to_string(_sets[id].size()).c_str());
            }
            _sets[id].push_back(instance);
        }
    }

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

// The sets the providers' requests run on (see enumerate_inventory_pairs).
Sets* gSets = nullptr;

void collect(Instance* association, void* out) {
    static_cast<std::vector<Instance*>*>(out)->push_back(association);
}

// The associations delivered, each as "<Caption of one end>><Caption of the
// other>"; {"failed"} when the request fails.
std::vector<std::string> named(Enum_Instances_Status status, std::vector<Instance*>& delivered,
                               const char* first, const char* second) {
    auto end = [](const Instance* a, const char* role) {
        const Meta_Reference* mr = find_reference(a->meta_class, role);
        return text(reference_in(slot_of(a, mr->offset)), "Caption");
    };
    std::vector<std::string> out;
    for (Instance* a : delivered) {
        out.push_back(end(a, first) + ">" + end(a, second));
        destroy(a);
    }
    return status == ENUM_INSTANCES_OK ? out : std::vector<std::string>{"failed"};
}

template <class A>
std::vector<std::string> pairs(const Pairing& rule, Sets& sets, const char* first,
                               const char* second) {
    std::vector<Instance*> delivered;
    Enum_Instances_Status status =
        enumerate_pairs(rule, &A::static_meta_class, sets, collect, &delivered);
    return named(status, delivered, first, second);
}

// ---- the engine ------------------------------------------------------------------

// Each FC port with the statistics whose InstanceID is its DeviceID.
constexpr Pairing kFirst = TVRN_PAIRING.fetch(CID_FC_PORT)
                               .fetch(CID_FC_PORT_STATISTICS)
                               .for_each(0)
                               .as("ManagedElement")
                               .with_first(1, "Stats", key("DeviceID"), key("InstanceID"));
constexpr Pairing kAll = TVRN_PAIRING.fetch(CID_FC_PORT)
                             .fetch(CID_FC_PORT_STATISTICS)
                             .for_each(0)
                             .as("ManagedElement")
                             .with_all(1, "Stats", key("DeviceID"), key("InstanceID"));
constexpr Pairing kFirstExact = kFirst.exact();
constexpr Pairing kAllExact = kAll.exact();

TEST(Pairing, PartnersByKeyFirstOrAllWithOrWithoutCase) {
    Sets sets;
    sets.add(CID_FC_PORT, &TAVRIN_FCPort::static_meta_class, "DeviceID", {"A", "b", "C"});
    sets.add(CID_FC_PORT_STATISTICS, &TAVRIN_FCPortStatistics::static_meta_class, "InstanceID",
             {"a", "A", "B", "x", "A"});
    const struct {
        const char* name;
        const Pairing& rule;
        std::vector<std::string> expected;
    } cases[] = {
        {"first, any case", kFirst, {"0>0", "1>2"}},
        {"all, any case", kAll, {"0>0", "0>1", "0>4", "1>2"}},
        {"first, exact", kFirstExact, {"0>1"}},
        {"all, exact", kAllExact, {"0>1", "0>4"}},
    };
    for (const auto& c : cases)
        EXPECT_EQ(pairs<TAVRIN_ElementStatisticalData>(c.rule, sets, "ManagedElement", "Stats"),
                  c.expected)
            << c.name;
}

// Each controller with the package at its own position, when the package's
// SerialNumber is its ElementName: a skipped package keeps its place, and no
// other package is tried.
constexpr Pairing kByPosition =
    TVRN_PAIRING.fetch(CID_PORT_CONTROLLER)
        .fetch(CID_PHYSICAL_PACKAGE)
        .for_each(0)
        .as("Dependent")
        .at_same_position(1, "Antecedent", key("ElementName"), key("SerialNumber"));

TEST(Pairing, ByPositionAcrossAGap) {
    Sets sets;
    sets.add(CID_PORT_CONTROLLER, &TAVRIN_PortController::static_meta_class, "ElementName",
             {"S1", "S2", "S3"});
    sets.add(CID_PHYSICAL_PACKAGE, &TAVRIN_PhysicalPackage::static_meta_class, "SerialNumber",
             {"s1", nullptr, "S3", "S2"});
    EXPECT_EQ(pairs<TAVRIN_Realizes>(kByPosition, sets, "Dependent", "Antecedent"),
              (std::vector<std::string>{"0>0", "2>2"}));
}

// The host with every FC port, the "host" being the instances of `hosts`.
constexpr Pairing hostsOf(int hosts) {
    return TVRN_PAIRING.fetch(hosts)
        .when_not_one(LL_ERR, "Error: Invalid mapping information")
        .fetch(CID_FC_PORT)
        .for_each(0)
        .as("GroupComponent")
        .with_every(1, "PartComponent");
}

TEST(Pairing, CountChecksAndUnknownRolesFailTheRequest) {
    Sets sets;
    sets.add(CID_COMPUTER_SYSTEM, &TAVRIN_ComputerSystem::static_meta_class, "Name", {"h"});
    sets.add(CID_FC_PORT, &TAVRIN_FCPort::static_meta_class, "DeviceID", {"p1", "p2", "p3"});
    constexpr Pairing kOneHost = hostsOf(CID_COMPUTER_SYSTEM);
    constexpr Pairing kThreeHosts = hostsOf(CID_FC_PORT);
    constexpr Pairing kNoHost = hostsOf(CID_AGENT_SERVICE);
    constexpr Pairing kNoSuchRole = TVRN_PAIRING.host_with_every(
        CID_FC_PORT, "GroupComponent", "Member", "Error: Invalid mapping information");
    auto run = [&](const Pairing& rule) {
        return pairs<TAVRIN_FCPortSystemDevice>(rule, sets, "GroupComponent", "PartComponent");
    };
    EXPECT_EQ(run(kOneHost), (std::vector<std::string>{"0>0", "0>1", "0>2"}));
    const std::vector<std::string> failed{"failed"};
    EXPECT_EQ(run(kThreeHosts), failed);
    EXPECT_EQ(run(kNoHost), failed);
    EXPECT_EQ(run(kNoSuchRole), failed);
    // A set of two classes, the second without instances.
    constexpr Pairing kPortsAndEndpoints =
        TVRN_PAIRING.fetch(CID_COMPUTER_SYSTEM)
            .fetch(CID_FC_PORT, CID_SCSI_PROTOCOL_ENDPOINT)
            .when_any_empty(LL_ERR, "Invalid number of instances returned.")
            .for_each(0)
            .as("GroupComponent")
            .with_every(1, "PartComponent");
    EXPECT_EQ(run(kPortsAndEndpoints), failed);
}

// ---- the providers' rules ----------------------------------------------------------

struct Set_Data {
    int id;
    const Meta_Class* meta_class;
    const char* key;
    std::vector<const char*> keys;
};

struct Provider_Case {
    const char* provider;
    Provider_Proc proc;
    const char* walked_role;
    Set_Data walked;
    const char* partner_role;
    Set_Data partners;
    std::vector<std::string> expected;  // "<walked>><partner>", by place
};

#define TVRN_CLASS(C) &TAVRIN_##C::static_meta_class
const std::vector<const char*> kTwoPorts = {"p1", "p2"};

const Provider_Case kProviderCases[] = {
    // First match, keys compared without case.
    {"DeviceSAPImplementation",
     TAVRIN_DeviceSAPImplementation_Provider_proc,
     "Antecedent",
     {CID_FC_PORT, TVRN_CLASS(FCPort), "DeviceID", kTwoPorts},
     "Dependent",
     {CID_SCSI_PROTOCOL_ENDPOINT, TVRN_CLASS(SCSIProtocolEndpoint), "Name", {"P1", "p1", "x"}},
     {"0>0"}},
    {"LANEndpointDeviceSAPImplementation",
     TAVRIN_LANEndpointDeviceSAPImplementation_Provider_proc,
     "Antecedent",
     {CID_ETHERNET_PORT, TVRN_CLASS(EthernetPort), "DeviceID", kTwoPorts},
     "Dependent",
     {CID_LAN_ENDPOINT, TVRN_CLASS(LANEndpoint), "MACAddress", {"P1", "p1"}},
     {"0>0"}},
    {"MemberOfCollection",
     TAVRIN_MemberOfCollection_Provider_proc,
     "Member",
     {CID_FC_PORT, TVRN_CLASS(FCPort), "DeviceID", kTwoPorts},
     "Collection",
     {CID_LOGICAL_PORT_GROUP, TVRN_CLASS(LogicalPortGroup), "Name", {"P1", "p1"}},
     {"0>0"}},
    {"ProductElementComponent",
     TAVRIN_ProductElementComponent_Provider_proc,
     "PartComponent",
     {CID_PORT_CONTROLLER, TVRN_CLASS(PortController), "Name", kTwoPorts},
     "GroupComponent",
     {CID_PRODUCT, TVRN_CLASS(Product), "IdentifyingNumber", {"P1", "p1"}},
     {"0>0"}},
    {"ProductPhysicalComponent",
     TAVRIN_ProductPhysicalComponent_Provider_proc,
     "PartComponent",
     {CID_PHYSICAL_PACKAGE, TVRN_CLASS(PhysicalPackage), "SerialNumber", kTwoPorts},
     "GroupComponent",
     {CID_PRODUCT, TVRN_CLASS(Product), "IdentifyingNumber", {"P1", "p1"}},
     {"0>0"}},
    // All matches, without case.
    {"ElementStatisticalData",
     TAVRIN_ElementStatisticalData_Provider_proc,
     "ManagedElement",
     {CID_FC_PORT, TVRN_CLASS(FCPort), "DeviceID", kTwoPorts},
     "Stats",
     {CID_FC_PORT_STATISTICS, TVRN_CLASS(FCPortStatistics), "InstanceID", {"P1", "p1", "x"}},
     {"0>0", "0>1"}},
    {"AssociatedAlarm",
     TAVRIN_AssociatedAlarm_Provider_proc,
     "Dependent",
     {CID_FC_PORT, TVRN_CLASS(FCPort), "DeviceID", kTwoPorts},
     "Antecedent",
     {CID_ALARM_DEVICE, TVRN_CLASS(AlarmDevice), "DeviceID", {"P1", "p1"}},
     {"0>0", "0>1"}},
    // By position only.
    {"Realizes",
     TAVRIN_Realizes_Provider_proc,
     "Dependent",
     {CID_PORT_CONTROLLER, TVRN_CLASS(PortController), "ElementName", {"S1", "S2", "S3"}},
     "Antecedent",
     {CID_PHYSICAL_PACKAGE, TVRN_CLASS(PhysicalPackage), "SerialNumber", {"s1", "S3", "S2"}},
     {"0>0"}},
};

TEST(Pairing, EachProviderMatchesAsItsRuleSays) {
    for (const Provider_Case& c : kProviderCases) {
        SCOPED_TRACE(c.provider);
        Sets sets;
        for (const Set_Data* s : {&c.walked, &c.partners})
            sets.add(s->id, s->meta_class, s->key, s->keys);
        gSets = &sets;
        void* provider = nullptr;
        ASSERT_EQ(c.proc(nullptr, OPERATION_CREATE_PROVIDER, &provider, nullptr, nullptr, nullptr,
                         nullptr, nullptr, nullptr, nullptr),
                  0);
        std::vector<Instance*> delivered;
        Enum_Instances_Proc gather = [](Instance* a, Enum_Instances_Status, void* out) {
            if (a != nullptr)
                static_cast<std::vector<Instance*>*>(out)->push_back(a);
            return true;
        };
        int status =
            c.proc(nullptr, OPERATION_ENUM_INSTANCES, provider, nullptr,
                   reinterpret_cast<void*>(gather), &delivered, nullptr, nullptr, nullptr, nullptr);
        c.proc(nullptr, OPERATION_DESTROY_PROVIDER, provider, nullptr, nullptr, nullptr, nullptr,
               nullptr, nullptr, nullptr);
        EXPECT_EQ(named(Enum_Instances_Status(status), delivered, c.walked_role, c.partner_role),
                  c.expected);
    }
}

}  // namespace

// What the module runs on the inventory's sets, the providers compiled in
// here run on the sets of the case.
Enum_Instances_Status CPTA::enumerate_inventory_pairs(const Pairing& rule,
                                                      const Meta_Class* association,
                                                      Association_Sink sink, void* target,
                                                      Pairing_Fetcher*) noexcept {
    return enumerate_pairs(rule, association, *gSets, sink, target);
}

// Requests from one object are not made here.
Enum_Associator_Names_Status CPTA::scoped_associator_names(
    const Pairing&, const Meta_Class*, Pairing_Fetcher&, const Instance*, const String&,
    const String&, const String&, Enum_Associator_Names_Handler<Instance>*) noexcept {
    return ENUM_ASSOCIATOR_NAMES_FAILED;
}

Enum_References_Status CPTA::scoped_references(const Pairing&, const Meta_Class*, Pairing_Fetcher&,
                                               const Instance*, const String&,
                                               bool (*)(Instance*, void*), void*) noexcept {
    return ENUM_REFERENCES_FAILED;
}

CPTA::Object_Scope::Object_Scope(const Pairing& rule, const Object_Scopes&, const Instance*)
    : _rule(rule) {}

CPTA::Object_Scope::~Object_Scope() {}

Array<Instance*> CPTA::Object_Scope::fetch(classId_t) {
    return Array<Instance*>();
}
