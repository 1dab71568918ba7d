/* The ABI table checked by the C compiler, at compile time and as data for
 * the run-time comparison with the C++ view; plus MI stubs expanded in C. */
#include <cmpift.h>
#include <cmpimacs.h>

#include "tests/cmpi_abi/abi_layout.h"

#define ABI_SIZE(T, n) _Static_assert(sizeof(T) == (n), "sizeof " #T);
#define ABI_OFFSET(T, m, n) _Static_assert(offsetof(T, m) == (n), "offsetof " #T "." #m);
#define ABI_SLOT(T, m, k) _Static_assert(offsetof(T, m) == 8 * (k), "slot " #T "." #m);
#define ABI_CONST(name, v) _Static_assert((name) == (v), "value of " #name);
#include "tests/cmpi_abi/abi_table.inc"
#undef ABI_SIZE
#undef ABI_OFFSET
#undef ABI_SLOT
#undef ABI_CONST

#define ABI_SIZE(T, n) {"sizeof " #T, (long long)sizeof(T), (n)},
#define ABI_OFFSET(T, m, n) {"offsetof " #T "." #m, (long long)offsetof(T, m), (n)},
#define ABI_SLOT(T, m, k) {"offsetof " #T "." #m, (long long)offsetof(T, m), 8 * (k)},
#define ABI_CONST(name, v) {#name, (long long)(name), (v)},
const struct tvrn_abi_entry tvrn_abi_c_entries[] = {
#include "tests/cmpi_abi/abi_table.inc"
};
const size_t tvrn_abi_c_count = sizeof(tvrn_abi_c_entries) / sizeof(tvrn_abi_c_entries[0]);

/* ---- stub macros ---- */

static const CMPIBroker *stubBroker;
static int hookRuns;

#define UNUSED4 (void)mi, (void)ctx, (void)rslt, (void)op
static CMPIStatus ProbeCleanup(CMPIInstanceMI *mi, const CMPIContext *ctx, CMPIBoolean t)
{
    (void)mi, (void)ctx, (void)t;
    CMReturn(CMPI_RC_OK);
}
static CMPIStatus ProbeEnumInstanceNames(CMPIInstanceMI *mi, const CMPIContext *ctx,
                                         const CMPIResult *rslt, const CMPIObjectPath *op)
{
    UNUSED4;
    CMReturn(CMPI_RC_OK);
}
static CMPIStatus ProbeEnumInstances(CMPIInstanceMI *mi, const CMPIContext *ctx,
                                     const CMPIResult *rslt, const CMPIObjectPath *op,
                                     const char **p)
{
    UNUSED4, (void)p;
    CMReturn(CMPI_RC_OK);
}
static CMPIStatus ProbeGetInstance(CMPIInstanceMI *mi, const CMPIContext *ctx,
                                   const CMPIResult *rslt, const CMPIObjectPath *op,
                                   const char **p)
{
    UNUSED4, (void)p;
    CMReturn(CMPI_RC_OK);
}
static CMPIStatus ProbeCreateInstance(CMPIInstanceMI *mi, const CMPIContext *ctx,
                                      const CMPIResult *rslt, const CMPIObjectPath *op,
                                      const CMPIInstance *i)
{
    UNUSED4, (void)i;
    CMReturn(CMPI_RC_OK);
}
static CMPIStatus ProbeModifyInstance(CMPIInstanceMI *mi, const CMPIContext *ctx,
                                      const CMPIResult *rslt, const CMPIObjectPath *op,
                                      const CMPIInstance *i, const char **p)
{
    UNUSED4, (void)i, (void)p;
    CMReturn(CMPI_RC_OK);
}
static CMPIStatus ProbeDeleteInstance(CMPIInstanceMI *mi, const CMPIContext *ctx,
                                      const CMPIResult *rslt, const CMPIObjectPath *op)
{
    UNUSED4;
    CMReturn(CMPI_RC_OK);
}
static CMPIStatus ProbeExecQuery(CMPIInstanceMI *mi, const CMPIContext *ctx,
                                 const CMPIResult *rslt, const CMPIObjectPath *op,
                                 const char *q, const char *l)
{
    UNUSED4, (void)q, (void)l;
    CMReturn(CMPI_RC_ERR_NOT_SUPPORTED);
}
CMInstanceMIStub(Probe, TvrnProbe, stubBroker, hookRuns++)

static CMPIStatus ProbeMethodCleanup(CMPIMethodMI *mi, const CMPIContext *ctx, CMPIBoolean t)
{
    (void)mi, (void)ctx, (void)t;
    CMReturn(CMPI_RC_OK);
}
static CMPIStatus ProbeInvokeMethod(CMPIMethodMI *mi, const CMPIContext *ctx,
                                    const CMPIResult *rslt, const CMPIObjectPath *op,
                                    const char *m, const CMPIArgs *in, CMPIArgs *out)
{
    UNUSED4, (void)m, (void)in, (void)out;
    CMReturn(CMPI_RC_OK);
}
CMMethodMIStub(Probe, TvrnProbe, stubBroker, CMNoHook)

static CMPIStatus ProbeIndicationCleanup(CMPIIndicationMI *mi, const CMPIContext *ctx,
                                         CMPIBoolean t)
{
    (void)mi, (void)ctx, (void)t;
    CMReturn(CMPI_RC_OK);
}
static CMPIStatus ProbeAuthorizeFilter(CMPIIndicationMI *mi, const CMPIContext *ctx,
                                       const CMPISelectExp *f, const char *cn,
                                       const CMPIObjectPath *op, const char *owner)
{
    (void)mi, (void)ctx, (void)f, (void)cn, (void)op, (void)owner;
    CMReturn(CMPI_RC_OK);
}
static CMPIStatus ProbeMustPoll(CMPIIndicationMI *mi, const CMPIContext *ctx,
                                const CMPISelectExp *f, const char *cn, const CMPIObjectPath *op)
{
    (void)mi, (void)ctx, (void)f, (void)cn, (void)op;
    CMReturn(CMPI_RC_OK);
}
static CMPIStatus ProbeActivateFilter(CMPIIndicationMI *mi, const CMPIContext *ctx,
                                      const CMPISelectExp *f, const char *cn,
                                      const CMPIObjectPath *op, CMPIBoolean first)
{
    (void)mi, (void)ctx, (void)f, (void)cn, (void)op, (void)first;
    CMReturn(CMPI_RC_OK);
}
static CMPIStatus ProbeDeActivateFilter(CMPIIndicationMI *mi, const CMPIContext *ctx,
                                        const CMPISelectExp *f, const char *cn,
                                        const CMPIObjectPath *op, CMPIBoolean last)
{
    (void)mi, (void)ctx, (void)f, (void)cn, (void)op, (void)last;
    CMReturn(CMPI_RC_OK);
}
static CMPIStatus ProbeEnableIndications(CMPIIndicationMI *mi, const CMPIContext *ctx)
{
    (void)mi, (void)ctx;
    CMReturn(CMPI_RC_OK);
}
static CMPIStatus ProbeDisableIndications(CMPIIndicationMI *mi, const CMPIContext *ctx)
{
    (void)mi, (void)ctx;
    CMReturn(CMPI_RC_OK);
}
CMIndicationMIStub(Probe, TvrnProbe, stubBroker, CMNoHook)

struct tvrn_abi_stub_probe tvrn_abi_run_c_stubs(const void *broker)
{
    struct tvrn_abi_stub_probe probe;
    CMPIStatus st = {CMPI_RC_OK, NULL};
    hookRuns = 0;
    stubBroker = NULL;
    probe.instanceMI = TvrnProbe_Create_InstanceMI((const CMPIBroker *)broker, NULL, &st);
    probe.indicationMI = TvrnProbe_Create_IndicationMI((const CMPIBroker *)broker, NULL, &st);
    probe.methodMI = TvrnProbe_Create_MethodMI((const CMPIBroker *)broker, NULL, &st);
    probe.brokerSeen = stubBroker;
    probe.hookRuns = hookRuns;
    return probe;
}
