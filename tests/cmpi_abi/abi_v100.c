/* Layout of a provider built for CMPI 1.00: the 2.0 members are gone. */
#define CMPI_VERSION 100
#include <stddef.h>

#include <cmpift.h>

#include "tests/cmpi_abi/abi_layout.h"

#ifdef CMPI_VER_200
#error "CMPI_VERSION=100 must not select 2.0"
#endif
#if !defined(CMPI_VER_100) || !defined(CMPI_VER_90) || !defined(CMPI_VER_87) || \
    !defined(CMPI_VER_86) || !defined(CMPI_VER_85) || !defined(CMPI_VER_80)
#error "CMPI_VERSION=100 must select every level up to 1.00"
#endif
#if CMPI_VER_100 != 1
#error "an explicit CMPI_VERSION defines its own switch as 1"
#endif

#define V100(expr, n) _Static_assert((expr) == (n), #expr);
V100(sizeof(CMPIBroker), 32)
V100(sizeof(CMPIBrokerFT), 160)
V100(sizeof(CMPIBrokerEncFT), 136)
V100(sizeof(CMPIBrokerExtFT), 168)
V100(sizeof(CMPIResultFT), 56)
V100(sizeof(CMPIInstanceFT), 80)
V100(sizeof(CMPIObjectPathFT), 160)
V100(sizeof(CMPIContextFT), 56)
V100(sizeof(CMPIData), 24)
V100(offsetof(CMPIBrokerEncFT, logMessage), 120)
V100(offsetof(CMPIBrokerEncFT, trace), 128)
V100(offsetof(CMPIInstanceFT, setObjectPath), 72)
V100(offsetof(CMPIPredicateFT, evaluateUsingAccessor), 32)
V100(CMPICurrentVersion, 100)

#pragma GCC diagnostic ignored "-Wunused-parameter"
static const CMPIBroker* v100Broker;
static CMPIStatus V100MethodCleanup(CMPIMethodMI* mi, const CMPIContext* ctx, CMPIBoolean t) {
    CMReturn(CMPI_RC_OK);
}
static CMPIStatus V100InvokeMethod(CMPIMethodMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                                   const CMPIObjectPath* op, const char* m, const CMPIArgs* in,
                                   CMPIArgs* out) {
    CMReturn(CMPI_RC_OK);
}
CMMethodMIStub(V100, TvrnV100, v100Broker, CMNoHook)

    int tvrn_abi_v100_stub_mi_version(void) {
    return TvrnV100_Create_MethodMI(NULL, NULL, NULL)->ft->miVersion;
}
