// The generated class schema: repository, flags, defaults, method records and
// slot offsets (each class's features in order and each method's parameters
// against the MOF classes are in test_mof_inputs.cpp).
#include <gtest/gtest.h>

#include <cstring>
#include <set>
#include <string>

#include "framework/Instance.h"
#include "schema/Repository.h"
#include "schema/generated/CIM_FCPort.h"
#include "schema/generated/CIM_SoftwareInstallationService.h"
#include "schema/generated/TAVRIN_AlertIndication.h"
#include "schema/generated/TAVRIN_CIMXMLCommunicationMechanism.h"
#include "schema/generated/TAVRIN_ConcreteJob.h"
#include "schema/generated/TAVRIN_FCPort.h"
#include "schema/generated/TAVRIN_LANEndpoint.h"
#include "schema/generated/TAVRIN_LogicalDisk.h"
#include "schema/generated/TAVRIN_PortController.h"
#include "schema/generated/TAVRIN_StorageExtent.h"

using namespace CPTA;

namespace {

const Meta_Class* meta(const char* name) {
    return find_meta_class(&schema_repository, name);
}

bool is_tavrin(const char* name) {
    return std::strncmp(name, "TAVRIN_", 7) == 0;
}

uint32 offset_of(const Meta_Feature* f) {
    return f->flags & FLAG_REFERENCE ? reinterpret_cast<const Meta_Reference*>(f)->offset
                                     : reinterpret_cast<const Meta_Property*>(f)->offset;
}

// Size of the slot a property or reference occupies.
size_t slot_size(const Meta_Feature* f) {
    static const size_t sizes[] = {1, 1, 1, 2, 2, 4, 4, 8, 8, 4, 8, 2, 8, 8};
    if (f->flags & FLAG_REFERENCE)
        return reinterpret_cast<const Meta_Reference*>(f)->subscript
                   ? sizeof(Property<Array<Instance*>>)
                   : sizeof(Instance*);
    auto p = reinterpret_cast<const Meta_Property*>(f);
    return (p->subscript ? sizeof(void*) : sizes[p->type]) + 1;
}

// The slots of a class or method record lie in feature order, inside the
// structure, without overlapping.
void expect_slots_in_order(const char* what, const Meta_Feature* const* features, size_t n,
                           uint32 size) {
    size_t end = sizeof(Instance);
    for (size_t i = 0; i < n; i++) {
        if (features[i]->flags & FLAG_METHOD)
            continue;
        EXPECT_GE(offset_of(features[i]), end) << what << "." << features[i]->name;
        end = offset_of(features[i]) + slot_size(features[i]);
    }
    EXPECT_LE(end, size) << what;
}

// Parameters, each in or out, then the return value.
void expect_method_record(const Meta_Method* m) {
    SCOPED_TRACE(m->name);
    ASSERT_GE(m->num_meta_features, 1u);
    auto rv = reinterpret_cast<const Meta_Property*>(m->meta_features[m->num_meta_features - 1]);
    EXPECT_STREQ(rv->name, "return_value");
    EXPECT_EQ(rv->flags, FLAG_PROPERTY | FLAG_OUT);
    EXPECT_EQ(rv->type, m->return_type);
    for (size_t k = 0; k + 1 < m->num_meta_features; k++)
        EXPECT_TRUE(m->meta_features[k]->flags & (FLAG_IN | FLAG_OUT));
    expect_slots_in_order(m->name, m->meta_features, m->num_meta_features, m->size);
}

// An instance created with defaults, destroyed with the holder.
template <class C>
struct Made {
    C* p = create<C>(true);
    ~Made() { destroy(p); }
    C* operator->() const { return p; }
};

}  // namespace

TEST(Repository, HoldsTheModuleClassesAndTheirCimAncestors) {
    ASSERT_EQ(schema_repository.num_meta_classes, 178u);
    size_t tavrin = 0;
    std::set<std::string> names;
    for (size_t i = 0; i < schema_repository.num_meta_classes; i++) {
        const Meta_Class* mc = schema_repository.meta_classes[i];
        tavrin += is_tavrin(mc->name);
        EXPECT_TRUE(is_tavrin(mc->name) || std::strncmp(mc->name, "CIM_", 4) == 0) << mc->name;
        EXPECT_EQ(mc->meta_repository, &schema_repository) << mc->name;
        EXPECT_TRUE(names.insert(mc->name).second) << mc->name;
    }
    EXPECT_EQ(tavrin, 77u);
    EXPECT_EQ(meta("tavrin_fcport"), &TAVRIN_FCPort::static_meta_class);
    EXPECT_EQ(meta("CIM_FCPORT"), &CIM_FCPort::static_meta_class);
    EXPECT_EQ(meta("TAVRIN_NoSuchClass"), nullptr);
}

// What test_mof_inputs.cpp cannot see: class flags, inherited features shared
// with the superclass, references that point into this repository and only
// narrow, method records, and the slots in order inside the structure.
TEST(Repository, EveryClassIsConsistentWithItsSuperclass) {
    for (size_t i = 0; i < schema_repository.num_meta_classes; i++) {
        const Meta_Class* mc = schema_repository.meta_classes[i];
        SCOPED_TRACE(mc->name);
        const Meta_Class* sup = mc->super_meta_class;
        bool assoc = mc->flags & FLAG_ASSOCIATION;
        EXPECT_NE(assoc, bool(mc->flags & FLAG_CLASS));
        EXPECT_TRUE(assoc || !(mc->flags & FLAG_AGGREGATION));
        if (sup) {
            EXPECT_EQ(meta(sup->name), sup);
        }
        // Module classes take their superclass's flags, but not Abstract.
        if (sup && is_tavrin(mc->name)) {
            EXPECT_EQ(mc->flags & ~FLAG_EXPERIMENTAL,
                      sup->flags & ~(FLAG_ABSTRACT | FLAG_EXPERIMENTAL));
        }
        size_t inherited = sup ? sup->num_meta_features : 0;
        ASSERT_GE(mc->num_meta_features, inherited);
        for (size_t j = 0; j < mc->num_meta_features; j++) {
            const Meta_Feature* f = mc->meta_features[j];
            if (j < inherited && !mc->locals[j]) {
                EXPECT_EQ(f, sup->meta_features[j]) << f->name;
                continue;  // checked with the superclass
            }
            if (f->flags & FLAG_METHOD)
                expect_method_record(reinterpret_cast<const Meta_Method*>(f));
            if (!(f->flags & FLAG_REFERENCE))
                continue;
            auto r = reinterpret_cast<const Meta_Reference*>(f);
            ASSERT_NE(r->meta_class, nullptr);
            if (r->meta_class != &Instance::static_meta_class) {
                EXPECT_EQ(meta(r->meta_class->name), r->meta_class) << f->name;
            }
            if (j < inherited && (sup->meta_features[j]->flags & FLAG_REFERENCE)) {
                auto old = reinterpret_cast<const Meta_Reference*>(sup->meta_features[j]);
                EXPECT_TRUE(is_subclass(old->meta_class, r->meta_class)) << f->name;
            }
        }
        expect_slots_in_order(mc->name, mc->meta_features, mc->num_meta_features, mc->size);
    }
}

TEST(ClassSchema, QualifiersBecomeFlags) {
    const Meta_Class* port = &TAVRIN_FCPort::static_meta_class;
    EXPECT_EQ(find_property(port, "Generation")->type, UINT64);
    EXPECT_EQ(find_property(port, "PowerOnHours")->flags, FLAG_PROPERTY | FLAG_COUNTER);
    EXPECT_EQ(find_property(port, "LocationIndicator")->flags,
              FLAG_PROPERTY | FLAG_EXPERIMENTAL | FLAG_WRITE);
    EXPECT_EQ(find_property(port, "OperationalStatus")->subscript, -1);
    EXPECT_EQ(meta("TAVRIN_HostedAccessPoint")->flags, FLAG_ASSOCIATION);
    EXPECT_EQ(meta("TAVRIN_MemberOfCollection")->flags, FLAG_ASSOCIATION | FLAG_AGGREGATION);
    EXPECT_EQ(meta("TAVRIN_ProductElementComponent")->flags,
              FLAG_ASSOCIATION | FLAG_AGGREGATION | FLAG_COMPOSITION | FLAG_EXPERIMENTAL);
    EXPECT_EQ(find_reference(meta("TAVRIN_MemberOfCollection"), "Collection")->flags,
              FLAG_REFERENCE | FLAG_KEY | FLAG_AGGREGATE);
    EXPECT_EQ(find_reference(meta("TAVRIN_FCPortSystemDevice"), "PartComponent")->flags,
              FLAG_REFERENCE | FLAG_KEY | FLAG_WEAK);
    EXPECT_EQ(TAVRIN_AlertIndication::static_meta_class.flags, FLAG_CLASS | FLAG_INDICATION);
    EXPECT_EQ(find_method(meta("CIM_Capabilities"), "CreateGoalSettings")->flags,
              FLAG_METHOD | FLAG_EXPERIMENTAL);
}

#define EXPECT_SLOT(obj, meta_slot, member)                       \
    EXPECT_EQ(reinterpret_cast<char*>(obj) + (meta_slot)->offset, \
              reinterpret_cast<char*>(&(obj)->member))

TEST(ClassSchema, OffsetsInTheMetaDataMatchTheStructures) {
    const Meta_Class* mc = &TAVRIN_FCPort::static_meta_class;
    Made<TAVRIN_FCPort> port;
    EXPECT_SLOT(port.p, find_property(mc, "DeviceID"), DeviceID);
    EXPECT_SLOT(port.p, find_property(mc, "PortDiscriminator"), PortDiscriminator);
    EXPECT_EQ(mc->size, sizeof(TAVRIN_FCPort));
    Made<TAVRIN_ConcreteJob> job;
    EXPECT_SLOT(job.p, find_reference(job->meta_class, "JobOutParameters"), JobOutParameters);

    auto uri = &CIM_SoftwareInstallationService_InstallFromURI_method::static_meta_class;
    auto rec = static_cast<CIM_SoftwareInstallationService_InstallFromURI_method*>(create(uri));
    ASSERT_NE(rec, nullptr);
    EXPECT_SLOT(rec, reinterpret_cast<const Meta_Property*>(find_parameter(uri, "URI")), URI);
    EXPECT_SLOT(rec, find_reference(uri, "Target"), Target);
    destroy(rec);
}

#define EXPECT_DEFAULT(p, v) EXPECT_TRUE(!(p).null && (p).value == (v)) << #p

TEST(ClassSchema, InstancesCreatedWithDefaultsHoldTheSchemaDefaults) {
    Made<TAVRIN_FCPort> port;
    EXPECT_DEFAULT(port->EnabledState, 5);
    EXPECT_DEFAULT(port->RequestedState, 12);
    EXPECT_DEFAULT(port->EnabledDefault, 2);
    EXPECT_DEFAULT(port->TransitioningToState, 12);
    EXPECT_DEFAULT(port->PortAvailability, 2);
    EXPECT_TRUE(port->Caption.null && port->DeviceID.null);
    Made<TAVRIN_PortController> controller;
    EXPECT_DEFAULT(controller->ControllerType, 4);
    Made<TAVRIN_LogicalDisk> disk;
    EXPECT_DEFAULT(disk->NameFormat, 12);
    EXPECT_DEFAULT(disk->NameNamespace, 8);
    EXPECT_DEFAULT(disk->ThinlyProvisioned, false);
    Made<TAVRIN_StorageExtent> extent;
    EXPECT_DEFAULT(extent->NameFormat, 12);
    EXPECT_TRUE(extent->NameNamespace.null);
    Made<TAVRIN_ConcreteJob> job;
    EXPECT_FALSE(job->TimeBeforeRemoval.null);
    EXPECT_TRUE(job->TimeBeforeRemoval.value.is_interval());
    EXPECT_EQ(job->TimeBeforeRemoval.value.usec(), 5 * Datetime::MIN);
    EXPECT_DEFAULT(job->JobRunTimes, 1u);
    Made<TAVRIN_CIMXMLCommunicationMechanism> mech;
    EXPECT_DEFAULT(mech->CommunicationMechanism, 2);
    Made<TAVRIN_LANEndpoint> lan;
    EXPECT_DEFAULT(lan->RequestedState, 12);
    // Redeclared in the alert class, the schema's default is kept.
    Made<TAVRIN_AlertIndication> alert;
    EXPECT_DEFAULT(alert->AlertingElementFormat, 0);
    EXPECT_TRUE(alert->Category.null);
}
