// A host with the test provider library loaded, shared by the host tests.
#ifndef TVRN_TESTS_HOST_FIXTURE_H
#define TVRN_TESTS_HOST_FIXTURE_H

#include <cmpidt.h>
#include <dlfcn.h>
#include <gtest/gtest.h>

#include <memory>

#include "host/host.h"
#include "tests/host/testprov.h"

namespace hosttest {

using namespace tvrnhost;

inline const char* kNs = "root/test";

inline ObjectPath path(const std::string& text) {
    ObjectPath p = ObjectPath::parse(text);
    if (p.nameSpace().empty())
        p.setNameSpace(kNs);
    return p;
}

class HostFixture : public ::testing::Test {
protected:
    void SetUp() override {
        HostOptions o;
        o.principal = "tester";
        host = std::make_unique<Host>(o);
        Status st = host->load(TVRN_TESTPROV_LIB, TVRN_TESTPROV_REG);
        ASSERT_TRUE(st.ok()) << st.toString();
        Instance mgr(ObjectPath::parse("root/interop:Test_Manager.Name=\"mgr\""));
        mgr.set("Name", Value::string("mgr")).set("Description", Value::string("the manager"));
        ASSERT_TRUE(host->store("root/interop").add(mgr));
    }

    void TearDown() override {
        if (host) {
            EXPECT_TRUE(host->unload().ok());
        }
        host.reset();
    }

    // What the provider library counted so far (while it is loaded).
    static tvrntest_counters counters() {
        tvrntest_counters c{};
        void* h = dlopen(TVRN_TESTPROV_LIB, RTLD_NOW | RTLD_NOLOAD);
        if (!h)
            return c;
        if (auto* p = static_cast<tvrntest_counters*>(dlsym(h, "tvrntest_counters")))
            c = *p;
        dlclose(h);
        return c;
    }

    std::unique_ptr<Host> host;
};

}  // namespace hosttest

#endif
