// The provider glue generated with the schema: the provider list and the
// method members and invoke tables.
#include <gtest/gtest.h>

#include <string>

#include "framework/Instance.h"
#include "providers/generated/TAVRIN_AlarmDevice_Methods.h"
#include "providers/generated/TAVRIN_HBASoftwareInstallationService_Methods.h"
#include "schema/Repository.h"
#include "schema/generated/CIM_ConcreteJob.h"
#include "schema/generated/TAVRIN_ConcreteJob.h"
#include "tests/schema/glue_table.h"

using namespace CPTA;

namespace {

struct Row {
    const char* name;
    int instance, association, indication;
};

const Row rows[] = {
#define TVRN_PROVIDER(NAME, INSTANCE, ASSOCIATION, INDICATION) \
    {#NAME, INSTANCE, ASSOCIATION, INDICATION},
#include "providers/generated/Providers.def"
#undef TVRN_PROVIDER
};

// A method record whose meta data carries another name.
struct Renamed {
    Meta_Method meta;
    Instance* record;

    Renamed(const Meta_Method* m, const char* name) : meta(*m), record(create(m)) {
        meta.name = name;
        record->meta_class = reinterpret_cast<const Meta_Class*>(&meta);
    }
    ~Renamed() { destroy(record); }
};

struct Alarm_Provider : TAVRIN_AlarmDevice_Methods {
    uint16 requested = 0;
    Invoke_Method_Status SetAlarmState(const TAVRIN_AlarmDevice*,
                                       const Property<uint16>& RequestedAlarmState,
                                       Property<uint32>& return_value) {
        requested = RequestedAlarmState.value;
        return_value.set(0);
        return INVOKE_METHOD_OK;
    }
};

struct Install_Provider : TAVRIN_HBASoftwareInstallationService_Methods {
    Invoke_Method_Status InstallFromURI(const TAVRIN_HBASoftwareInstallationService*,
                                        CIM_ConcreteJob*& Job, const Property<String>& URI,
                                        const CIM_ManagedElement*, const Property<Array<uint16>>&,
                                        const Property<Array<String>>&,
                                        Property<uint32>& return_value) {
        TAVRIN_ConcreteJob* job = create<TAVRIN_ConcreteJob>(true);
        job->Name.set(URI.value);
        Job = reinterpret_cast<CIM_ConcreteJob*>(job);
        return_value.set(4096);
        return INVOKE_METHOD_OK;
    }
};

}  // namespace

// The module's test checks the rows against its registrations (names, counts,
// association flags); here the rest of each row against its class.
TEST(ProviderList, RowsAgreeWithTheirClasses) {
    for (const Row& r : rows) {
        std::string name = std::string("TAVRIN_") + r.name;
        const Meta_Class* mc = find_meta_class(&schema_repository, name.c_str());
        ASSERT_NE(mc, nullptr) << name;
        EXPECT_EQ(r.indication, (mc->flags & FLAG_INDICATION) ? 1 : 0) << name;
        EXPECT_NE(r.instance, r.indication) << name;
        EXPECT_NE(name, "TAVRIN_DiagnosticTest");  // the tests' common base has none
    }
}

// Every method of every module class reaches the default member, which
// declines; a name the class does not have is refused.
TEST(MethodGlue, EveryMethodReachesItsDefaultMember) {
    ASSERT_EQ(glue_table_size, 77u);
    for (size_t i = 0; i < glue_table_size; i++) {
        const Meta_Class* mc = glue_table[i].meta_class;
        SCOPED_TRACE(mc->name);
        Instance* self = create(mc, false);
        for (size_t j = 0; j < mc->num_meta_features; j++) {
            if (!(mc->meta_features[j]->flags & FLAG_METHOD))
                continue;
            auto m = reinterpret_cast<const Meta_Method*>(mc->meta_features[j]);
            Instance* record = create(m);
            EXPECT_EQ(glue_table[i].invoke(self, record), INVOKE_METHOD_UNSUPPORTED) << m->name;
            destroy(record);
            Renamed unknown(m, "NoSuchMethod");
            EXPECT_EQ(glue_table[i].invoke(self, unknown.record), -1);
        }
        destroy(self);
    }
}

TEST(MethodGlue, ProviderMembersReceiveTheParameterSlots) {
    auto self = create<TAVRIN_AlarmDevice>(false);
    Alarm_Provider alarm;
    auto set_state = &CIM_AlarmDevice_SetAlarmState_method::static_meta_class;
    // Method names are compared without regard to case.
    Renamed lower(set_state, "setalarmstate");
    auto record = static_cast<CIM_AlarmDevice_SetAlarmState_method*>(lower.record);
    record->RequestedAlarmState.set(3);
    EXPECT_EQ(TAVRIN_AlarmDevice_invoke_method(&alarm, self, record), INVOKE_METHOD_OK);
    EXPECT_EQ(alarm.requested, 3);
    EXPECT_FALSE(record->return_value.null);
    EXPECT_EQ(record->return_value.value, 0u);
    // Members the provider does not hide keep declining.
    Instance* reset = create(&CIM_LogicalDevice_Reset_method::static_meta_class);
    EXPECT_EQ(TAVRIN_AlarmDevice_invoke_method(&alarm, self, reset), INVOKE_METHOD_UNSUPPORTED);
    destroy(reset);
    destroy(self);

    auto service = create<TAVRIN_HBASoftwareInstallationService>(false);
    Install_Provider install;
    auto install_rec = static_cast<CIM_SoftwareInstallationService_InstallFromURI_method*>(
        create(&CIM_SoftwareInstallationService_InstallFromURI_method::static_meta_class));
    install_rec->URI.set("tftp://host/fw.bin");
    EXPECT_EQ(TAVRIN_HBASoftwareInstallationService_invoke_method(&install, service, install_rec),
              INVOKE_METHOD_OK);
    ASSERT_NE(install_rec->Job, nullptr);
    EXPECT_EQ(install_rec->Job->meta_class, &TAVRIN_ConcreteJob::static_meta_class);
    EXPECT_STREQ(install_rec->Job->Name.value.c_str(), "tftp://host/fw.bin");
    EXPECT_EQ(install_rec->return_value.value, 4096u);
    destroy(install_rec);  // releases the job too
    destroy(service);
}
