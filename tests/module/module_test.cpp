// libtvrnprovider.so as a CIM server sees it: its exported symbols, its
// registration list and the answers of its providers through the embedded
// host (the MI life cycle is the binding's, tested with tests/cmpi's module).
#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <map>
#include <set>
#include <string>
#include <vector>

#include <cmpidt.h>
#include <cmpift.h>

#include "cmpi/Registration.h"
#include "framework/Meta.h"
#include "framework/String.h"
#include "host/host.h"
#include "tests/cmpi/test_support.h"
#include "tests/server/ServerProfileCounts.h"

using namespace tvrnhost;

namespace {

const char* const NS = "root/tavrin";

// The program runs on the simulator's host without adapters, however it is
// started (the module opens the simulator by the loader's search path, which
// ctest sets; without it there is no adapter library and no adapter either).
struct Empty_Host {
    Empty_Host() { setenv("TVRN_SIM_FIXTURE", "empty", 1); }
} empty_host;

// One row of the provider table.
struct Row {
    std::string name;  // short class name
    bool instance, association, indication;
};

std::vector<Row> provider_table() {
    std::ifstream is(TVRN_PROVIDERS_DEF);
    std::vector<Row> rows;
    std::string line;
    while (std::getline(is, line)) {
        char name[128];
        int instance, association, indication;
        if (sscanf(line.c_str(), "TVRN_PROVIDER(%127[A-Za-z0-9_], %d, %d, %d)", name, &instance,
                   &association, &indication) == 4)
            rows.push_back({name, instance == 1, association == 1, indication == 1});
    }
    return rows;
}

// The meta class of every provider's class, by class name, read through
// the module's own registration list.
class Registrations {
public:
    Registrations() : _handle(dlopen(TVRN_MODULE, RTLD_NOW | RTLD_LOCAL)) {
        if (!_handle)
            return;
        auto module = reinterpret_cast<CPTA::Registration* (*)()>(dlsym(_handle, "cimple_module"));
        for (CPTA::Registration* r = module ? module() : nullptr; r; r = r->next)
            list.push_back(r);
    }
    ~Registrations() {
        if (_handle)
            dlclose(_handle);
    }

    static int call(CPTA::Registration* r, int op, void* a0 = nullptr, void* a1 = nullptr) {
        return r->proc(r, op, a0, a1, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr);
    }

    std::vector<CPTA::Registration*> list;

private:
    void* _handle;
};

// A path of the class with a value for each of its string keys.
ObjectPath keyed_path(const CPTA::Meta_Class* mc) {
    ObjectPath p(NS, mc->name);
    for (size_t i = 0; i < mc->num_meta_features; i++) {
        const CPTA::Meta_Feature* mf = mc->meta_features[i];
        if ((mf->flags & CPTA::FLAG_KEY) && (mf->flags & CPTA::FLAG_PROPERTY))
            p.addKey(mf->name, Value::string("none"));
    }
    return p;
}

std::vector<std::string> methods_of(const CPTA::Meta_Class* mc) {
    std::vector<std::string> names;
    for (size_t i = 0; i < mc->num_meta_features; i++)
        if (mc->meta_features[i]->flags & CPTA::FLAG_METHOD)
            names.push_back(mc->meta_features[i]->name);
    return names;
}

TEST(Module, ExportsOnlyTheRegistrationListAndTheMiFactories) {
    std::set<std::string> expected = {"cimple_module"};
    for (const Row& r : provider_table()) {
        std::vector<std::string> kinds = {"Method"};
        if (r.instance)
            kinds.push_back("Instance");
        if (r.association)
            kinds.push_back("Association");
        if (r.indication)
            kinds.push_back("Indication");
        for (const auto& k : kinds) {
            expected.insert("TAVRIN_" + r.name + "_Provider_Create_" + k + "MI");
            expected.insert("TAVRIN_" + r.name + "_Create_" + k + "MI");
        }
    }

    FILE* nm = popen("nm -D --defined-only " TVRN_MODULE, "r");
    ASSERT_TRUE(nm);
    std::set<std::string> exported;
    char line[512];
    while (fgets(line, sizeof(line), nm)) {
        char address[64], kind[8], name[400];
        if (sscanf(line, "%63s %7s %399s", address, kind, name) == 3)
            exported.insert(name);
    }
    ASSERT_EQ(pclose(nm), 0);
    EXPECT_EQ(exported, expected);
}

TEST(Module, RegistersEveryProviderOnceInTableOrder) {
    std::vector<Row> rows = provider_table();
    ASSERT_EQ(rows.size(), 76u);
    Registrations regs;
    ASSERT_EQ(regs.list.size(), rows.size());

    // The list starts with the last registration.
    for (size_t i = 0; i < rows.size(); i++) {
        const Row& row = rows[rows.size() - 1 - i];
        CPTA::Registration* r = regs.list[i];
        SCOPED_TRACE(row.name);
        EXPECT_STREQ(r->module_name, "tvrnprovider_Module");
        EXPECT_EQ(r->provider_name, "TAVRIN_" + row.name + "_Provider");
        ASSERT_TRUE(r->meta_class);
        EXPECT_EQ(r->meta_class->name, "TAVRIN_" + row.name);
        EXPECT_EQ((r->meta_class->flags & CPTA::FLAG_ASSOCIATION) != 0, row.association);

        // Meta class, repository, load and unload are reached through the
        // binding by EveryProviderAnswersWithoutAdapters.
        void* provider = nullptr;
        ASSERT_EQ(Registrations::call(r, CPTA::OPERATION_CREATE_PROVIDER, &provider), 0);
        ASSERT_TRUE(provider);
        // Operations the provider does not have (111 and 121: unsupported).
        CPTA::String empty;
        EXPECT_EQ(r->proc(r, CPTA::OPERATION_ENUM_ASSOCIATOR_NAMES, provider, nullptr, &empty,
                          &empty, &empty, nullptr, nullptr, nullptr),
                  row.association ? 111 : -1);
        EXPECT_EQ(r->proc(r, CPTA::OPERATION_ENUM_REFERENCES, provider, nullptr, nullptr, &empty,
                          nullptr, nullptr, nullptr, nullptr),
                  row.association ? 121 : -1);
        EXPECT_EQ(Registrations::call(r, CPTA::OPERATION_DISABLE_INDICATIONS, provider),
                  row.indication ? 0 : -1);
        EXPECT_EQ(Registrations::call(r, 17, provider), -1);
        EXPECT_EQ(Registrations::call(r, CPTA::OPERATION_DESTROY_PROVIDER, provider), 0);
    }
}

// On the host without adapters: nothing to enumerate but the host itself,
// the server profile and the firmware update service (with the associations
// between them), nothing to change, no method but SetAlarmState,
// InstallFromURI, RunDiagnostic (which answer through their return value)
// and the management tunnel's executeMethod.
const std::set<std::string> kOnePerHost = {
    "TAVRIN_ComputerSystem", "TAVRIN_HBASoftwareInstallationService",
    "TAVRIN_HBASoftwareInstallationServiceCapabilities",
    "TAVRIN_HBASoftwareInstallationServiceElementCapabilities",
    "TAVRIN_HBASoftwareInstallationServiceHostedService"};

TEST(Module, EveryProviderAnswersWithoutAdapters) {
    Host host;
    ASSERT_TRUE(host.load(TVRN_MODULE, TVRN_MODULE_REG).ok());
    Registrations regs;
    std::map<std::string, const CPTA::Meta_Class*> classes;
    for (CPTA::Registration* r : regs.list)
        classes[r->meta_class->name] = r->meta_class;

    int instance_classes = 0, association_classes = 0, methods = 0;
    for (const Registration& reg : host.registrations()) {
        SCOPED_TRACE(reg.className);
        const CPTA::Meta_Class* mc = classes.at(reg.className);
        ObjectPath path = keyed_path(mc);
        if (reg.kinds & kInstanceMI) {
            instance_classes++;
            const auto profile = tvrntest::serverProfileCounts().find(reg.className);
            const size_t expected = profile != tvrntest::serverProfileCounts().end()
                                        ? profile->second
                                        : kOnePerHost.count(reg.className);
            Result<Instance> all = host.enumerateInstances(NS, reg.className);
            EXPECT_TRUE(all.ok()) << all.toString();
            EXPECT_EQ(all.items.size(), expected);
            Result<ObjectPath> names = host.enumerateInstanceNames(NS, reg.className);
            EXPECT_TRUE(names.ok()) << names.toString();
            EXPECT_EQ(names.items.size(), expected);
            EXPECT_EQ(host.getInstance(path).rc, CMPI_RC_ERR_NOT_FOUND);
            Instance i(path);
            EXPECT_EQ(host.createInstance(i).rc, CMPI_RC_ERR_NOT_SUPPORTED);
            EXPECT_EQ(host.modifyInstance(i).rc, CMPI_RC_ERR_NOT_SUPPORTED);
            EXPECT_EQ(host.deleteInstance(path).rc, CMPI_RC_ERR_NOT_SUPPORTED);
        }
        if (reg.kinds & kAssociationMI) {
            association_classes++;
            ObjectPath source = keyed_path(classes.at("TAVRIN_ComputerSystem"));
            auto names = host.associatorNames(source, reg.className);
            EXPECT_TRUE(names.ok() && names.items.empty()) << names.toString();
            auto refs = host.references(source, reg.className);
            EXPECT_TRUE(refs.ok() && refs.items.empty()) << refs.toString();
            auto ends = host.associators(source, reg.className);
            EXPECT_TRUE(ends.ok() && ends.items.empty()) << ends.toString();
        }
        for (const std::string& method : methods_of(mc)) {
            methods++;
            const bool served =
                (reg.className == "TAVRIN_AlarmDevice" && method == "SetAlarmState") ||
                (reg.className == "TAVRIN_HBASoftwareInstallationService" &&
                 method == "InstallFromURI") ||
                method == "RunDiagnostic" ||
                (reg.className == "TAVRIN_AgentService" && method == "executeMethod");
            EXPECT_EQ(host.invokeMethod(path, method).rc,
                      served ? CMPI_RC_OK : CMPI_RC_ERR_NOT_SUPPORTED)
                << method;
        }
        MethodResult unknown = host.invokeMethod(path, "NoSuchMethod");
        EXPECT_EQ(unknown.rc, CMPI_RC_ERR_METHOD_NOT_FOUND);
    }
    EXPECT_EQ(instance_classes, 75);
    EXPECT_EQ(association_classes, 41);
    EXPECT_GT(methods, 0);

    EXPECT_TRUE(host.subscribe(NS, "TAVRIN_AlertIndication").ok());
    EXPECT_TRUE(host.unsubscribe(NS, "TAVRIN_AlertIndication").ok());
    EXPECT_TRUE(host.unload().ok());
}

TEST(Module, ClassesAreCheckedAgainstTheProvidersClass) {
    // Classes routed to the FC port provider that it does not serve as such.
    std::string reg = tvrntest::log_home() + "/routing.reg";
    {
        std::ofstream os(reg);
        for (const char* c : {"No_Such_Class", "CIM_FCPort", "TAVRIN_PortController"})
            os << "[" << c << "]\n   provider: TAVRIN_FCPort_Provider\n   location: tvrnprovider\n"
               << "   type: instance method\n   namespace: root/tavrin\n\n";
    }
    Host host;
    ASSERT_TRUE(host.load(TVRN_MODULE, reg).ok());
    EXPECT_EQ(host.enumerateInstances(NS, "No_Such_Class").rc, CMPI_RC_ERR_FAILED);
    EXPECT_TRUE(host.enumerateInstances(NS, "CIM_FCPort").ok());
    EXPECT_EQ(host.enumerateInstances(NS, "TAVRIN_PortController").rc, CMPI_RC_ERR_INVALID_CLASS);
    EXPECT_EQ(host.invokeMethod(ObjectPath(NS, "TAVRIN_PortController"), "Reset").rc,
              CMPI_RC_ERR_INVALID_CLASS);
    EXPECT_TRUE(host.unload().ok());
}

}  // namespace
