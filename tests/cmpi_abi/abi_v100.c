/* Layout of a provider built for CMPI 1.00: the 2.0 members are gone. */
#define CMPI_VERSION 100
#include <cmpift.h>

#include "tests/cmpi_abi/abi_layout.h"

#ifdef CMPI_VER_200
#  error "CMPI_VERSION=100 must not select 2.0"
#endif
#if !defined(CMPI_VER_100) || !defined(CMPI_VER_90) || !defined(CMPI_VER_87) || \
    !defined(CMPI_VER_86) || !defined(CMPI_VER_85) || !defined(CMPI_VER_80)
#  error "CMPI_VERSION=100 must select every level up to 1.00"
#endif
#if CMPI_VER_100 != 1
#  error "an explicit CMPI_VERSION defines its own switch as 1"
#endif

#define V100_TABLE(X) \
    X(sizeof(CMPIBroker), 32) \
    X(sizeof(CMPIBrokerFT), 160) \
    X(sizeof(CMPIBrokerEncFT), 136) \
    X(sizeof(CMPIBrokerExtFT), 168) \
    X(sizeof(CMPIResultFT), 56) \
    X(sizeof(CMPIInstanceFT), 80) \
    X(sizeof(CMPIObjectPathFT), 160) \
    X(sizeof(CMPIContextFT), 56) \
    X(sizeof(CMPIData), 24) \
    X(offsetof(CMPIBrokerEncFT, logMessage), 120) \
    X(offsetof(CMPIBrokerEncFT, trace), 128) \
    X(offsetof(CMPIInstanceFT, setObjectPath), 72) \
    X(offsetof(CMPIPredicateFT, evaluateUsingAccessor), 32) \
    X(CMPICurrentVersion, 100)

#define V100_ASSERT(expr, n) _Static_assert((expr) == (n), #expr);
V100_TABLE(V100_ASSERT)

#define V100_ENTRY(expr, n) {#expr, (long long)(expr), (n)},
const struct tvrn_abi_entry tvrn_abi_v100_entries[] = {V100_TABLE(V100_ENTRY)};
const size_t tvrn_abi_v100_count =
    sizeof(tvrn_abi_v100_entries) / sizeof(tvrn_abi_v100_entries[0]);

static const CMPIBroker *v100Broker;
static CMPIStatus V100MethodCleanup(CMPIMethodMI *mi, const CMPIContext *ctx, CMPIBoolean t)
{
    (void)mi, (void)ctx, (void)t;
    CMReturn(CMPI_RC_OK);
}
static CMPIStatus V100InvokeMethod(CMPIMethodMI *mi, const CMPIContext *ctx,
                                   const CMPIResult *rslt, const CMPIObjectPath *op,
                                   const char *m, const CMPIArgs *in, CMPIArgs *out)
{
    (void)mi, (void)ctx, (void)rslt, (void)op, (void)m, (void)in, (void)out;
    CMReturn(CMPI_RC_OK);
}
CMMethodMIStub(V100, TvrnV100, v100Broker, CMNoHook)

int tvrn_abi_v100_stub_mi_version(void)
{
    CMPIMethodMI *mi = TvrnV100_Create_MethodMI(NULL, NULL, NULL);
    return mi->ft->miVersion;
}
