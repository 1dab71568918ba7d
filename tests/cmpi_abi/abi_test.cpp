// ABI checks of the CMPI header set as seen by the C++ compiler (abi_c.c makes
// the same checks in C), plus the behaviour of the irregular macros.
#include <cmpimacs.h>  // alone must bring in the whole set

#include <gtest/gtest.h>

#include <cstddef>
#include <string_view>
#include <type_traits>

#include "tests/cmpi_abi/abi_layout.h"

// Compile time: the table, as in abi_c.c, with the slot signatures. The short
// names of the signature parameters:
using B = const CMPIBroker*;
using C = const CMPIContext*;
using OP = const CMPIObjectPath*;
using P = CMPIObjectPath*;
using R = const CMPIResult*;
using I = const CMPIInstance*;
using A = const CMPIArgs*;
using E = const CMPIError*;
using V = const CMPIValue*;
using S = const char*;
using PL = const char**;
using ST = CMPIStatus*;
using CI = CMPIIndicationMI*;
using SE = const CMPISelectExp*;
#define ABI_SIZE(T, n) static_assert(sizeof(T) == (n), "sizeof " #T);
#define ABI_OFFSET(T, m, n) static_assert(offsetof(T, m) == (n), "offsetof " #T "." #m);
#define ABI_SLOT(T, m, k) static_assert(offsetof(T, m) == 8 * (k), "slot " #T "." #m);
#define ABI_FN(T, m, k, Ret, ...) \
    ABI_SLOT(T, m, k)             \
    static_assert(std::is_same<decltype(T::m), Ret(*) __VA_ARGS__>::value, "signature " #T "." #m);
#define ABI_CONST(name, v) static_assert((name) == (v), "value of " #name);
#include "tests/cmpi_abi/abi_table.inc"
static_assert(std::is_same<CMPIAccessor, CMPIData(const char*, void*)>::value,
              "CMPIAccessor is a function type");

// Switches of the default build and names that must not exist.
#if !defined(CMPI_VER_200) || !defined(CMPI_VER_100) || !defined(CMPI_VER_90) || \
    !defined(CMPI_VER_87) || !defined(CMPI_VER_86) || !defined(CMPI_VER_85) ||   \
    !defined(CMPI_VER_80)
#error "the default build is CMPI 2.0 with every lower level"
#endif
#if defined(CMPI_MORE) || defined(CMPI_classA) || defined(CMPI_argsA) || defined(CMPI_filterA) || \
    defined(CMPI_enumerationA) || defined(CMPI_ptrA) || defined(CMPI_INLINE)
#error "name defined that the interface does not have"
#endif
#if !defined(_CMPIPL_H_) || !defined(_CMPIOS_H_) || !defined(_CMPIDT_H_) || !defined(_CMPIFT_H_)
#error "cmpimacs.h must bring in the whole header set"
#endif

// Context entry names are their own names.
#define ENTRY_NAME(n) static_assert(std::string_view(n) == #n, #n)
ENTRY_NAME(CMPIPrincipal);
ENTRY_NAME(CMPIInvocationFlags);
ENTRY_NAME(CMPIInitNameSpace);
ENTRY_NAME(CMPIRole);
ENTRY_NAME(CMPIAcceptLanguage);
ENTRY_NAME(CMPIContentLanguage);

// Run time: the stub macros and the macros that are easy to get subtly wrong.
namespace {
TEST(CmpiAbi, CStubsBuildVersionedTablesAndRunTheHook) {
    int fakeBroker = 0;
    tvrn_abi_stub_probe p = tvrn_abi_run_c_stubs(&fakeBroker);
    EXPECT_EQ(p.brokerSeen, &fakeBroker);
    EXPECT_EQ(p.hookRuns, 1);

    auto* inst = static_cast<const CMPIInstanceMI*>(p.instanceMI);
    ASSERT_NE(inst, nullptr);
    EXPECT_EQ(inst->hdl, nullptr);
    EXPECT_EQ(inst->ft->ftVersion, 200);
    EXPECT_EQ(inst->ft->miVersion, 200);
    EXPECT_STREQ(inst->ft->miName, "instanceTvrnProbe");
    EXPECT_NE(inst->ft->modifyInstance, nullptr);
    auto* ind = static_cast<const CMPIIndicationMI*>(p.indicationMI);
    EXPECT_STREQ(ind->ft->miName, "IndicationTvrnProbe");
    EXPECT_NE(ind->ft->enableIndications, nullptr);
    EXPECT_NE(ind->ft->disableIndications, nullptr);
    EXPECT_STREQ(static_cast<const CMPIMethodMI*>(p.methodMI)->ft->miName, "methodTvrnProbe");
    // A provider built for 1.00 gets 1.00 tables.
    EXPECT_EQ(tvrn_abi_v100_stub_mi_version(), 100);
}

const char* seen[2];

CMPIEnumeration* recExecQuery(B, C, OP, const char* query, const char* lang, ST) {
    seen[0] = query, seen[1] = lang;
    return nullptr;
}
CMPIEnumeration* recReferences(B, C, OP, const char* resultClass, const char* role, PL, ST) {
    seen[0] = resultClass, seen[1] = role;
    return nullptr;
}
const char* recGetCharPtr(const CMPIString*, CMPIStatus* rc) {
    seen[0] = rc == nullptr ? "null-rc" : "rc";
    return "text";
}
CMPIStatus recReturnDone(const CMPIResult*) {
    return CMPIStatus{CMPI_RC_ERR_FAILED, nullptr};
}

CMPIStatus returnsThroughCMReturnWithChars() {
    const CMPIBroker* none = nullptr;
    CMReturnWithChars(none, CMPI_RC_ERR_NOT_FOUND, "ignored");
}

int afterReturnData(const CMPIResult* r) {
    CMReturnDone(r);  // an expression: execution goes on
    return 7;
}

TEST(CmpiAbi, MacrosPassArgumentsByPosition) {
    CMPIBrokerFT bft{};
    bft.execQuery = recExecQuery;
    bft.references = recReferences;
    CMPIBroker broker{};
    broker.bft = &bft;
    const CMPIBroker* b = &broker;

    CBExecQuery(b, nullptr, nullptr, "fourth", "fifth", nullptr);
    EXPECT_STREQ(seen[0], "fourth");  // goes to `query`
    EXPECT_STREQ(seen[1], "fifth");
    CBReferences(b, nullptr, nullptr, "CIM_Assoc", "Role", nullptr, nullptr);
    EXPECT_STREQ(seen[0], "CIM_Assoc");  // the 4th argument is resultClass
    EXPECT_STREQ(seen[1], "Role");
}

TEST(CmpiAbi, StatusAndResultMacros) {
    CMPIStringFT sft{};
    sft.getCharPtr = recGetCharPtr;
    CMPIString s{reinterpret_cast<void*>(1), &sft};
    EXPECT_STREQ(CMGetCharPtr(&s), "text");
    EXPECT_STREQ(seen[0], "null-rc");

    CMPIStatus st = returnsThroughCMReturnWithChars();
    EXPECT_EQ(st.rc, CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(st.msg, nullptr);

    CMPIStatus set{CMPI_RC_OK, reinterpret_cast<CMPIString*>(&s)};
    CMSetStatus(&set, CMPI_RC_ERR_ACCESS_DENIED);
    EXPECT_EQ(set.rc, CMPI_RC_ERR_ACCESS_DENIED);
    EXPECT_EQ(set.msg, nullptr);
    CMPIStatus* none = nullptr;
    CMSetStatus(none, CMPI_RC_ERR_FAILED);  // tolerated

    CMPIResultFT rft{};
    rft.returnDone = recReturnDone;
    CMPIResult r{nullptr, &rft};
    EXPECT_EQ(afterReturnData(&r), 7);

    EXPECT_TRUE(CMIsNullObject(static_cast<CMPIResult*>(nullptr)));
    EXPECT_TRUE(CMIsNullObject(&r));  // null handle
    EXPECT_FALSE(CMIsNullObject(&s));

    CMPIData d{};
    d.type = CMPI_uint16A;
    d.state = CMPI_nullValue | CMPI_keyValue;
    EXPECT_TRUE(CMIsArray(d));
    EXPECT_TRUE(CMIsNullValue(d));
    EXPECT_TRUE(CMIsKeyValue(d));
}

}  // namespace
