/* The ABI table checked by the C compiler, and MI stubs expanded in C. */
#include <stddef.h>

#include <cmpift.h>
#include <cmpimacs.h>

#include "tests/cmpi_abi/abi_layout.h"

#define ABI_SIZE(T, n) _Static_assert(sizeof(T) == (n), "sizeof " #T);
#define ABI_OFFSET(T, m, n) _Static_assert(offsetof(T, m) == (n), "offsetof " #T "." #m);
#define ABI_SLOT(T, m, k) _Static_assert(offsetof(T, m) == 8 * (k), "slot " #T "." #m);
#define ABI_FN(T, m, k, ...) ABI_SLOT(T, m, k)
#define ABI_CONST(name, v) _Static_assert((name) == (v), "value of " #name);
#include "tests/cmpi_abi/abi_table.inc"

/* ---- stub macros: every slot function the stubs name, doing nothing ---- */
#pragma GCC diagnostic ignored "-Wunused-parameter"
#define PROBE(name, ...)                         \
    static CMPIStatus Probe##name(__VA_ARGS__) { \
        CMReturn(CMPI_RC_OK);                    \
    }
#define MI_ARGS(MI) MI *mi, const CMPIContext *ctx, const CMPIResult *rslt, const CMPIObjectPath *op
#define IND_ARGS                                                                          \
    CMPIIndicationMI *mi, const CMPIContext *ctx, const CMPISelectExp *f, const char *cn, \
        const CMPIObjectPath *op

static const CMPIBroker* stubBroker;
static int hookRuns;

PROBE(Cleanup, CMPIInstanceMI* mi, const CMPIContext* ctx, CMPIBoolean t)
PROBE(EnumInstanceNames, MI_ARGS(CMPIInstanceMI))
PROBE(EnumInstances, MI_ARGS(CMPIInstanceMI), const char** p)
PROBE(GetInstance, MI_ARGS(CMPIInstanceMI), const char** p)
PROBE(CreateInstance, MI_ARGS(CMPIInstanceMI), const CMPIInstance* i)
PROBE(ModifyInstance, MI_ARGS(CMPIInstanceMI), const CMPIInstance* i, const char** p)
PROBE(DeleteInstance, MI_ARGS(CMPIInstanceMI))
PROBE(ExecQuery, MI_ARGS(CMPIInstanceMI), const char* q, const char* l)
CMInstanceMIStub(Probe, TvrnProbe, stubBroker, hookRuns++)

    PROBE(MethodCleanup, CMPIMethodMI* mi, const CMPIContext* ctx, CMPIBoolean t)
        PROBE(InvokeMethod, MI_ARGS(CMPIMethodMI), const char* m, const CMPIArgs* in,
              CMPIArgs* out) CMMethodMIStub(Probe, TvrnProbe, stubBroker, CMNoHook)

            PROBE(IndicationCleanup, CMPIIndicationMI* mi, const CMPIContext* ctx,
                  CMPIBoolean t) PROBE(AuthorizeFilter, IND_ARGS, const char* owner)
                PROBE(MustPoll, IND_ARGS) PROBE(ActivateFilter, IND_ARGS, CMPIBoolean first)
                    PROBE(DeActivateFilter, IND_ARGS, CMPIBoolean last)
                        PROBE(EnableIndications, CMPIIndicationMI* mi, const CMPIContext* ctx)
                            PROBE(DisableIndications, CMPIIndicationMI* mi, const CMPIContext* ctx)
                                CMIndicationMIStub(Probe, TvrnProbe, stubBroker, CMNoHook)

                                    struct tvrn_abi_stub_probe
    tvrn_abi_run_c_stubs(const void* broker) {
    struct tvrn_abi_stub_probe probe;
    hookRuns = 0;
    stubBroker = NULL;
    probe.instanceMI = TvrnProbe_Create_InstanceMI((const CMPIBroker*)broker, NULL, NULL);
    probe.indicationMI = TvrnProbe_Create_IndicationMI((const CMPIBroker*)broker, NULL, NULL);
    probe.methodMI = TvrnProbe_Create_MethodMI((const CMPIBroker*)broker, NULL, NULL);
    probe.brokerSeen = stubBroker;
    probe.hookRuns = hookRuns;
    return probe;
}
