// ABI checks of the CMPI header set as seen by the C++ compiler (abi_c.c makes
// the same checks in C), plus the behaviour of the irregular macros.
#include <cmpimacs.h>  // alone must bring in the whole set

#include <gtest/gtest.h>

#include <cstddef>
#include <type_traits>

#include "tests/cmpi_abi/abi_layout.h"

// ---------------------------------------------------------------------------
// Compile time: the table, as in abi_c.c.
// ---------------------------------------------------------------------------
#define ABI_SIZE(T, n) static_assert(sizeof(T) == (n), "sizeof " #T);
#define ABI_OFFSET(T, m, n) static_assert(offsetof(T, m) == (n), "offsetof " #T "." #m);
#define ABI_SLOT(T, m, k) static_assert(offsetof(T, m) == 8 * (k), "slot " #T "." #m);
#define ABI_CONST(name, v) static_assert((name) == (v), "value of " #name);
#include "tests/cmpi_abi/abi_table.inc"

// Switches of the default build and names that must not exist.
#if !defined(CMPI_VER_200) || !defined(CMPI_VER_100) || !defined(CMPI_VER_90) || \
    !defined(CMPI_VER_87) || !defined(CMPI_VER_86) || !defined(CMPI_VER_85) || \
    !defined(CMPI_VER_80)
#error "the default build is CMPI 2.0 with every lower level"
#endif
#if defined(CMPI_MORE) || defined(CMPI_classA) || defined(CMPI_argsA) || \
    defined(CMPI_filterA) || defined(CMPI_enumerationA) || defined(CMPI_ptrA) || \
    defined(CMPI_INLINE)
#error "name defined that the interface does not have"
#endif
#if !defined(_CMPIPL_H_) || !defined(_CMPIOS_H_) || !defined(_CMPIDT_H_) || !defined(_CMPIFT_H_)
#error "cmpimacs.h must bring in the whole header set"
#endif

// Slot signatures: return and parameter types of every function slot.
#define SIG(T, m, R, ...) \
    static_assert(std::is_same<decltype(T::m), R(*) __VA_ARGS__>::value, "signature " #T "." #m);
using B = const CMPIBroker *;
using C = const CMPIContext *;
using OP = const CMPIObjectPath *;
using ST = CMPIStatus *;
using PL = const char **;
SIG(CMPIBrokerFT, prepareAttachThread, CMPIContext *, (B, C))
SIG(CMPIBrokerFT, attachThread, CMPIStatus, (B, C))
SIG(CMPIBrokerFT, detachThread, CMPIStatus, (B, C))
SIG(CMPIBrokerFT, deliverIndication, CMPIStatus, (B, C, const char *, const CMPIInstance *))
SIG(CMPIBrokerFT, enumerateInstanceNames, CMPIEnumeration *, (B, C, OP, ST))
SIG(CMPIBrokerFT, getInstance, CMPIInstance *, (B, C, OP, PL, ST))
SIG(CMPIBrokerFT, createInstance, CMPIObjectPath *, (B, C, OP, const CMPIInstance *, ST))
SIG(CMPIBrokerFT, modifyInstance, CMPIStatus, (B, C, OP, const CMPIInstance *, PL))
SIG(CMPIBrokerFT, deleteInstance, CMPIStatus, (B, C, OP))
SIG(CMPIBrokerFT, execQuery, CMPIEnumeration *, (B, C, OP, const char *, const char *, ST))
SIG(CMPIBrokerFT, enumerateInstances, CMPIEnumeration *, (B, C, OP, PL, ST))
SIG(CMPIBrokerFT, associators, CMPIEnumeration *,
    (B, C, OP, const char *, const char *, const char *, const char *, PL, ST))
SIG(CMPIBrokerFT, associatorNames, CMPIEnumeration *,
    (B, C, OP, const char *, const char *, const char *, const char *, ST))
SIG(CMPIBrokerFT, references, CMPIEnumeration *, (B, C, OP, const char *, const char *, PL, ST))
SIG(CMPIBrokerFT, referenceNames, CMPIEnumeration *, (B, C, OP, const char *, const char *, ST))
SIG(CMPIBrokerFT, invokeMethod, CMPIData,
    (B, C, OP, const char *, const CMPIArgs *, CMPIArgs *, ST))
SIG(CMPIBrokerFT, setProperty, CMPIStatus, (B, C, OP, const char *, const CMPIValue *, CMPIType))
SIG(CMPIBrokerFT, getProperty, CMPIData, (B, C, OP, const char *, ST))

SIG(CMPIBrokerEncFT, newInstance, CMPIInstance *, (B, OP, ST))
SIG(CMPIBrokerEncFT, newObjectPath, CMPIObjectPath *, (B, const char *, const char *, ST))
SIG(CMPIBrokerEncFT, newArgs, CMPIArgs *, (B, ST))
SIG(CMPIBrokerEncFT, newString, CMPIString *, (B, const char *, ST))
SIG(CMPIBrokerEncFT, newArray, CMPIArray *, (B, CMPICount, CMPIType, ST))
SIG(CMPIBrokerEncFT, newDateTime, CMPIDateTime *, (B, ST))
SIG(CMPIBrokerEncFT, newDateTimeFromBinary, CMPIDateTime *, (B, CMPIUint64, CMPIBoolean, ST))
SIG(CMPIBrokerEncFT, newDateTimeFromChars, CMPIDateTime *, (B, const char *, ST))
SIG(CMPIBrokerEncFT, newSelectExp, CMPISelectExp *,
    (B, const char *, const char *, CMPIArray **, ST))
SIG(CMPIBrokerEncFT, classPathIsA, CMPIBoolean, (B, OP, const char *, ST))
SIG(CMPIBrokerEncFT, toString, CMPIString *, (B, const void *, ST))
SIG(CMPIBrokerEncFT, isOfType, CMPIBoolean, (B, const void *, const char *, ST))
SIG(CMPIBrokerEncFT, getType, CMPIString *, (B, const void *, ST))
SIG(CMPIBrokerEncFT, getMessage, CMPIString *,
    (B, const char *, const char *, ST, CMPICount, ...))
SIG(CMPIBrokerEncFT, logMessage, CMPIStatus,
    (B, CMPISeverity, const char *, const char *, const CMPIString *))
SIG(CMPIBrokerEncFT, trace, CMPIStatus,
    (B, CMPILevel, const char *, const char *, const CMPIString *))
SIG(CMPIBrokerEncFT, newCMPIError, CMPIError *,
    (B, const char *, const char *, const char *, CMPIErrorSeverity, CMPIErrorProbableCause,
     CMPIrc, ST))
SIG(CMPIBrokerEncFT, openMessageFile, CMPIStatus, (B, const char *, CMPIMsgFileHandle *))
SIG(CMPIBrokerEncFT, closeMessageFile, CMPIStatus, (B, CMPIMsgFileHandle))
SIG(CMPIBrokerEncFT, getMessage2, CMPIString *,
    (B, const char *, CMPIMsgFileHandle, const char *, ST, CMPICount, ...))

SIG(CMPIBrokerExtFT, resolveFileName, char *, (const char *))
SIG(CMPIBrokerExtFT, newThread, void *, (void *(*)(void *), void *, int))
SIG(CMPIBrokerExtFT, joinThread, int, (void *, void **))
SIG(CMPIBrokerExtFT, exitThread, int, (void *))
SIG(CMPIBrokerExtFT, cancelThread, int, (void *))
SIG(CMPIBrokerExtFT, threadSleep, int, (CMPIUint32))
SIG(CMPIBrokerExtFT, threadOnce, int, (int *, void (*)(void)))
SIG(CMPIBrokerExtFT, createThreadKey, int, (unsigned int *, void (*)(void *)))
SIG(CMPIBrokerExtFT, destroyThreadKey, int, (unsigned int))
SIG(CMPIBrokerExtFT, getThreadSpecific, void *, (unsigned int))
SIG(CMPIBrokerExtFT, setThreadSpecific, int, (unsigned int, void *))
SIG(CMPIBrokerExtFT, newMutex, void *, (int))
SIG(CMPIBrokerExtFT, destroyMutex, void, (void *))
SIG(CMPIBrokerExtFT, lockMutex, void, (void *))
SIG(CMPIBrokerExtFT, unlockMutex, void, (void *))
SIG(CMPIBrokerExtFT, newCondition, void *, (int))
SIG(CMPIBrokerExtFT, destroyCondition, void, (void *))
SIG(CMPIBrokerExtFT, condWait, int, (void *, void *))
SIG(CMPIBrokerExtFT, timedCondWait, int, (void *, void *, struct timespec *))
SIG(CMPIBrokerExtFT, signalCondition, int, (void *))

SIG(CMPIBrokerMemFT, mark, CMPIGcStat *, (B, ST))
SIG(CMPIBrokerMemFT, release, CMPIStatus, (B, const CMPIGcStat *))
SIG(CMPIBrokerMemFT, cmpiMalloc, void *, (B, size_t))
SIG(CMPIBrokerMemFT, cmpiCalloc, void *, (B, size_t, size_t))
SIG(CMPIBrokerMemFT, cmpiRealloc, void *, (B, void *, size_t))
SIG(CMPIBrokerMemFT, cmpiStrDup, char *, (B, const char *))
SIG(CMPIBrokerMemFT, cmpiFree, void, (B, void *))
SIG(CMPIBrokerMemFT, freeInstance, void, (B, CMPIInstance *))
SIG(CMPIBrokerMemFT, freeObjectPath, void, (B, CMPIObjectPath *))
SIG(CMPIBrokerMemFT, freeArgs, void, (B, CMPIArgs *))
SIG(CMPIBrokerMemFT, freeString, void, (B, CMPIString *))
SIG(CMPIBrokerMemFT, freeArray, void, (B, CMPIArray *))
SIG(CMPIBrokerMemFT, freeDateTime, void, (B, CMPIDateTime *))
SIG(CMPIBrokerMemFT, freeSelectExp, void, (B, CMPISelectExp *))

// release/clone pairs of every encapsulated type follow one pattern.
#define SIG_RELEASE_CLONE(T) \
    SIG(T##FT, release, CMPIStatus, (T *)) SIG(T##FT, clone, T *, (const T *, ST))
SIG_RELEASE_CLONE(CMPIContext)
SIG_RELEASE_CLONE(CMPIResult)
SIG_RELEASE_CLONE(CMPIString)
SIG_RELEASE_CLONE(CMPIArray)
SIG_RELEASE_CLONE(CMPIInstance)
SIG_RELEASE_CLONE(CMPIObjectPath)
SIG_RELEASE_CLONE(CMPIArgs)
SIG_RELEASE_CLONE(CMPIEnumeration)
SIG_RELEASE_CLONE(CMPIDateTime)
SIG_RELEASE_CLONE(CMPIError)
SIG_RELEASE_CLONE(CMPISelectExp)
SIG_RELEASE_CLONE(CMPISelectCond)
SIG_RELEASE_CLONE(CMPISubCond)
SIG_RELEASE_CLONE(CMPIPredicate)

SIG(CMPIContextFT, getEntry, CMPIData, (C, const char *, ST))
SIG(CMPIContextFT, getEntryAt, CMPIData, (C, CMPICount, CMPIString **, ST))
SIG(CMPIContextFT, getEntryCount, CMPICount, (C, ST))
SIG(CMPIContextFT, addEntry, CMPIStatus, (C, const char *, const CMPIValue *, CMPIType))

using R = const CMPIResult *;
SIG(CMPIResultFT, returnData, CMPIStatus, (R, const CMPIValue *, CMPIType))
SIG(CMPIResultFT, returnInstance, CMPIStatus, (R, const CMPIInstance *))
SIG(CMPIResultFT, returnObjectPath, CMPIStatus, (R, OP))
SIG(CMPIResultFT, returnDone, CMPIStatus, (R))
SIG(CMPIResultFT, returnError, CMPIStatus, (R, const CMPIError *))

SIG(CMPIStringFT, getCharPtr, const char *, (const CMPIString *, ST))
SIG(CMPIArrayFT, getSize, CMPICount, (const CMPIArray *, ST))
SIG(CMPIArrayFT, getSimpleType, CMPIType, (const CMPIArray *, ST))
SIG(CMPIArrayFT, getElementAt, CMPIData, (const CMPIArray *, CMPICount, ST))
SIG(CMPIArrayFT, setElementAt, CMPIStatus, (CMPIArray *, CMPICount, const CMPIValue *, CMPIType))

using I = const CMPIInstance *;
SIG(CMPIInstanceFT, getProperty, CMPIData, (I, const char *, ST))
SIG(CMPIInstanceFT, getPropertyAt, CMPIData, (I, CMPICount, CMPIString **, ST))
SIG(CMPIInstanceFT, getPropertyCount, CMPICount, (I, ST))
SIG(CMPIInstanceFT, setProperty, CMPIStatus, (I, const char *, const CMPIValue *, CMPIType))
SIG(CMPIInstanceFT, getObjectPath, CMPIObjectPath *, (I, ST))
SIG(CMPIInstanceFT, setPropertyFilter, CMPIStatus, (CMPIInstance *, PL, PL))
SIG(CMPIInstanceFT, setObjectPath, CMPIStatus, (CMPIInstance *, OP))
SIG(CMPIInstanceFT, setPropertyWithOrigin, CMPIStatus,
    (I, const char *, const CMPIValue *, CMPIType, const char *))

using P = CMPIObjectPath *;
SIG(CMPIObjectPathFT, setNameSpace, CMPIStatus, (P, const char *))
SIG(CMPIObjectPathFT, getNameSpace, CMPIString *, (OP, ST))
SIG(CMPIObjectPathFT, setHostname, CMPIStatus, (P, const char *))
SIG(CMPIObjectPathFT, getHostname, CMPIString *, (OP, ST))
SIG(CMPIObjectPathFT, setClassName, CMPIStatus, (P, const char *))
SIG(CMPIObjectPathFT, getClassName, CMPIString *, (OP, ST))
SIG(CMPIObjectPathFT, addKey, CMPIStatus, (P, const char *, const CMPIValue *, CMPIType))
SIG(CMPIObjectPathFT, getKey, CMPIData, (OP, const char *, ST))
SIG(CMPIObjectPathFT, getKeyAt, CMPIData, (OP, CMPICount, CMPIString **, ST))
SIG(CMPIObjectPathFT, getKeyCount, CMPICount, (OP, ST))
SIG(CMPIObjectPathFT, setNameSpaceFromObjectPath, CMPIStatus, (P, OP))
SIG(CMPIObjectPathFT, setHostAndNameSpaceFromObjectPath, CMPIStatus, (P, OP))
SIG(CMPIObjectPathFT, getClassQualifier, CMPIData, (OP, const char *, ST))
SIG(CMPIObjectPathFT, getPropertyQualifier, CMPIData, (OP, const char *, const char *, ST))
SIG(CMPIObjectPathFT, getMethodQualifier, CMPIData, (OP, const char *, const char *, ST))
SIG(CMPIObjectPathFT, getParameterQualifier, CMPIData,
    (OP, const char *, const char *, const char *, ST))
SIG(CMPIObjectPathFT, toString, CMPIString *, (OP, ST))

using A = const CMPIArgs *;
SIG(CMPIArgsFT, addArg, CMPIStatus, (A, const char *, const CMPIValue *, CMPIType))
SIG(CMPIArgsFT, getArg, CMPIData, (A, const char *, ST))
SIG(CMPIArgsFT, getArgAt, CMPIData, (A, CMPICount, CMPIString **, ST))
SIG(CMPIArgsFT, getArgCount, CMPICount, (A, ST))

SIG(CMPIEnumerationFT, getNext, CMPIData, (const CMPIEnumeration *, ST))
SIG(CMPIEnumerationFT, hasNext, CMPIBoolean, (const CMPIEnumeration *, ST))
SIG(CMPIEnumerationFT, toArray, CMPIArray *, (const CMPIEnumeration *, ST))

SIG(CMPIDateTimeFT, getBinaryFormat, CMPIUint64, (const CMPIDateTime *, ST))
SIG(CMPIDateTimeFT, getStringFormat, CMPIString *, (const CMPIDateTime *, ST))
SIG(CMPIDateTimeFT, isInterval, CMPIBoolean, (const CMPIDateTime *, ST))

using E = const CMPIError *;
SIG(CMPIErrorFT, getErrorType, CMPIErrorType, (E, ST))
SIG(CMPIErrorFT, getPerceivedSeverity, CMPIErrorSeverity, (E, ST))
SIG(CMPIErrorFT, getProbableCause, CMPIErrorProbableCause, (E, ST))
SIG(CMPIErrorFT, getRecommendedActions, CMPIArray *, (E, ST))
SIG(CMPIErrorFT, getErrorSourceFormat, CMPIErrorSrcFormat, (E, ST))
SIG(CMPIErrorFT, getCIMStatusCode, CMPIrc, (E, ST))
SIG(CMPIErrorFT, getMessageArguments, CMPIArray *, (E, ST))
SIG(CMPIErrorFT, setErrorType, CMPIStatus, (CMPIError *, CMPIErrorType))
SIG(CMPIErrorFT, setRecommendedActions, CMPIStatus, (CMPIError *, const CMPIArray *))
SIG(CMPIErrorFT, setErrorSourceFormat, CMPIStatus, (CMPIError *, CMPIErrorSrcFormat))
SIG(CMPIErrorFT, setMessageArguments, CMPIStatus, (CMPIError *, CMPIArray *))

SIG(CMPISelectExpFT, evaluate, CMPIBoolean, (const CMPISelectExp *, I, ST))
SIG(CMPISelectExpFT, getString, CMPIString *, (const CMPISelectExp *, ST))
SIG(CMPISelectExpFT, getDOC, CMPISelectCond *, (const CMPISelectExp *, ST))
SIG(CMPISelectExpFT, evaluateUsingAccessor, CMPIBoolean,
    (const CMPISelectExp *, CMPIAccessor *, void *, ST))
SIG(CMPISelectCondFT, getCountAndType, CMPICount, (const CMPISelectCond *, int *, ST))
SIG(CMPISubCondFT, getPredicate, CMPIPredicate *, (const CMPISubCond *, const char *, ST))
SIG(CMPIPredicateFT, getData, CMPIStatus,
    (const CMPIPredicate *, CMPIType *, CMPIPredOp *, CMPIString **, CMPIString **))
SIG(CMPIPredicateFT, evaluateUsingAccessor, CMPIBoolean,
    (const CMPIPredicate *, CMPIAccessor *, void *, ST))
static_assert(std::is_same<CMPIAccessor, CMPIData(const char *, void *)>::value,
              "CMPIAccessor is a function type");

SIG(CMPIInstanceMIFT, cleanup, CMPIStatus, (CMPIInstanceMI *, C, CMPIBoolean))
SIG(CMPIInstanceMIFT, enumerateInstanceNames, CMPIStatus, (CMPIInstanceMI *, C, R, OP))
SIG(CMPIInstanceMIFT, enumerateInstances, CMPIStatus, (CMPIInstanceMI *, C, R, OP, PL))
SIG(CMPIInstanceMIFT, getInstance, CMPIStatus, (CMPIInstanceMI *, C, R, OP, PL))
SIG(CMPIInstanceMIFT, createInstance, CMPIStatus, (CMPIInstanceMI *, C, R, OP, I))
SIG(CMPIInstanceMIFT, modifyInstance, CMPIStatus, (CMPIInstanceMI *, C, R, OP, I, PL))
SIG(CMPIInstanceMIFT, deleteInstance, CMPIStatus, (CMPIInstanceMI *, C, R, OP))
SIG(CMPIInstanceMIFT, execQuery, CMPIStatus,
    (CMPIInstanceMI *, C, R, OP, const char *, const char *))
SIG(CMPIAssociationMIFT, associators, CMPIStatus,
    (CMPIAssociationMI *, C, R, OP, const char *, const char *, const char *, const char *, PL))
SIG(CMPIAssociationMIFT, associatorNames, CMPIStatus,
    (CMPIAssociationMI *, C, R, OP, const char *, const char *, const char *, const char *))
SIG(CMPIAssociationMIFT, references, CMPIStatus,
    (CMPIAssociationMI *, C, R, OP, const char *, const char *, PL))
SIG(CMPIAssociationMIFT, referenceNames, CMPIStatus,
    (CMPIAssociationMI *, C, R, OP, const char *, const char *))
SIG(CMPIMethodMIFT, invokeMethod, CMPIStatus,
    (CMPIMethodMI *, C, R, OP, const char *, A, CMPIArgs *))
SIG(CMPIPropertyMIFT, setProperty, CMPIStatus,
    (CMPIPropertyMI *, C, R, OP, const char *, CMPIData))
SIG(CMPIPropertyMIFT, getProperty, CMPIStatus, (CMPIPropertyMI *, C, R, OP, const char *))
using CI = CMPIIndicationMI *;
using SE = const CMPISelectExp *;
SIG(CMPIIndicationMIFT, authorizeFilter, CMPIStatus, (CI, C, SE, const char *, OP, const char *))
SIG(CMPIIndicationMIFT, mustPoll, CMPIStatus, (CI, C, SE, const char *, OP))
SIG(CMPIIndicationMIFT, activateFilter, CMPIStatus, (CI, C, SE, const char *, OP, CMPIBoolean))
SIG(CMPIIndicationMIFT, deActivateFilter, CMPIStatus,
    (CI, C, SE, const char *, OP, CMPIBoolean))
SIG(CMPIIndicationMIFT, enableIndications, CMPIStatus, (CI, C))
SIG(CMPIIndicationMIFT, disableIndications, CMPIStatus, (CI, C))

// ---------------------------------------------------------------------------
// Run time
// ---------------------------------------------------------------------------
namespace {

TEST(CmpiAbi, ContextEntryNamesAreTheirOwnNames)
{
    EXPECT_STREQ(CMPIPrincipal, "CMPIPrincipal");
    EXPECT_STREQ(CMPIInvocationFlags, "CMPIInvocationFlags");
    EXPECT_STREQ(CMPIInitNameSpace, "CMPIInitNameSpace");
    EXPECT_STREQ(CMPIRole, "CMPIRole");
    EXPECT_STREQ(CMPIAcceptLanguage, "CMPIAcceptLanguage");
    EXPECT_STREQ(CMPIContentLanguage, "CMPIContentLanguage");
}

TEST(CmpiAbi, CStubsBuildVersionedTablesAndRunTheHook)
{
    int fakeBroker = 0;
    tvrn_abi_stub_probe p = tvrn_abi_run_c_stubs(&fakeBroker);
    EXPECT_EQ(p.brokerSeen, &fakeBroker);
    EXPECT_EQ(p.hookRuns, 1);

    auto *inst = static_cast<const CMPIInstanceMI *>(p.instanceMI);
    ASSERT_NE(inst, nullptr);
    EXPECT_EQ(inst->hdl, nullptr);
    EXPECT_EQ(inst->ft->ftVersion, 200);
    EXPECT_EQ(inst->ft->miVersion, 200);
    EXPECT_STREQ(inst->ft->miName, "instanceTvrnProbe");
    EXPECT_NE(inst->ft->modifyInstance, nullptr);
    auto *ind = static_cast<const CMPIIndicationMI *>(p.indicationMI);
    EXPECT_STREQ(ind->ft->miName, "IndicationTvrnProbe");
    EXPECT_NE(ind->ft->enableIndications, nullptr);
    EXPECT_NE(ind->ft->disableIndications, nullptr);
    EXPECT_STREQ(static_cast<const CMPIMethodMI *>(p.methodMI)->ft->miName, "methodTvrnProbe");
    // A provider built for 1.00 gets 1.00 tables.
    EXPECT_EQ(tvrn_abi_v100_stub_mi_version(), 100);
}

// --- macros that are easy to get subtly wrong -----------------------------

const char *seen[2];

CMPIEnumeration *recExecQuery(B, C, OP, const char *query, const char *lang, ST)
{
    seen[0] = query, seen[1] = lang;
    return nullptr;
}
CMPIEnumeration *recReferences(B, C, OP, const char *resultClass, const char *role, PL, ST)
{
    seen[0] = resultClass, seen[1] = role;
    return nullptr;
}
const char *recGetCharPtr(const CMPIString *, CMPIStatus *rc)
{
    seen[0] = rc == nullptr ? "null-rc" : "rc";
    return "text";
}
CMPIStatus recReturnDone(const CMPIResult *) { return CMPIStatus{CMPI_RC_ERR_FAILED, nullptr}; }

CMPIStatus returnsThroughCMReturnWithChars()
{
    const CMPIBroker *none = nullptr;
    CMReturnWithChars(none, CMPI_RC_ERR_NOT_FOUND, "ignored");
}

int afterReturnData(const CMPIResult *r)
{
    CMReturnDone(r);  // an expression: execution goes on
    return 7;
}

TEST(CmpiAbi, MacrosPassArgumentsByPosition)
{
    CMPIBrokerFT bft{};
    bft.execQuery = recExecQuery;
    bft.references = recReferences;
    CMPIBroker broker{};
    broker.bft = &bft;
    const CMPIBroker *b = &broker;

    CBExecQuery(b, nullptr, nullptr, "fourth", "fifth", nullptr);
    EXPECT_STREQ(seen[0], "fourth");  // goes to `query`
    EXPECT_STREQ(seen[1], "fifth");
    CBReferences(b, nullptr, nullptr, "CIM_Assoc", "Role", nullptr, nullptr);
    EXPECT_STREQ(seen[0], "CIM_Assoc");  // the 4th argument is resultClass
    EXPECT_STREQ(seen[1], "Role");
}

TEST(CmpiAbi, StatusAndResultMacros)
{
    CMPIStringFT sft{};
    sft.getCharPtr = recGetCharPtr;
    CMPIString s{reinterpret_cast<void *>(1), &sft};
    EXPECT_STREQ(CMGetCharPtr(&s), "text");
    EXPECT_STREQ(seen[0], "null-rc");

    CMPIStatus st = returnsThroughCMReturnWithChars();
    EXPECT_EQ(st.rc, CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(st.msg, nullptr);

    CMPIStatus set{CMPI_RC_OK, reinterpret_cast<CMPIString *>(&s)};
    CMSetStatus(&set, CMPI_RC_ERR_ACCESS_DENIED);
    EXPECT_EQ(set.rc, CMPI_RC_ERR_ACCESS_DENIED);
    EXPECT_EQ(set.msg, nullptr);
    CMPIStatus *none = nullptr;
    CMSetStatus(none, CMPI_RC_ERR_FAILED);  // tolerated

    CMPIResultFT rft{};
    rft.returnDone = recReturnDone;
    CMPIResult r{nullptr, &rft};
    EXPECT_EQ(afterReturnData(&r), 7);

    EXPECT_TRUE(CMIsNullObject(static_cast<CMPIResult *>(nullptr)));
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
