/* Shared parts of the host's test provider library (one source per MI
 * table, since the stub macros give every table the same static name). */
#ifndef TVRN_TESTS_HOST_TESTPROV_COMMON_H
#define TVRN_TESTS_HOST_TESTPROV_COMMON_H

#include <cmpidt.h>
#include <cmpift.h>
#include <cmpimacs.h>

#include "tests/host/testprov.h"

extern CMPI_EXPORT struct tvrntest_counters tvrntest_counters;

/* The broker, set by the first factory while no MI exists. */
extern const CMPIBroker *tp_broker;
/* Set by the ForbidUnload method: non-terminating cleanups refuse. */
extern int tp_forbidUnload;

/* One recursive broker mutex guards all provider state. */
void tp_lock(void);
void tp_unlock(void);
CMPI_MUTEX_TYPE tp_mutex(void);

/* Factory hook of every MI. The stub macros store the broker on each call,
 * so each source has a variable of its own and shared code reads tp_broker,
 * which is written only while no provider thread can be running. */
void tp_init(const CMPIBroker *b);
/* Cleanup of every MI. */
CMPIStatus tp_cleanup(const CMPIContext *ctx, CMPIBoolean terminating);

const char *tp_key(const CMPIObjectPath *op, const char *name);
const char *tp_ns(const CMPIObjectPath *op);
const char *tp_class(const CMPIObjectPath *op);
int tp_listed(const char **props, const char *name);
CMPIObjectPath *tp_widgetPath(const char *id, const char *ns);
CMPIObjectPath *tp_gadgetPath(const char *name, const char *ns);

/* Per-class state kept across requests (widget table, alert thread). */
void tp_widgetsReset(int ready);
void tp_alertsStop(void);

/* Instance operations of read-only classes. */
#define TP_READ_ONLY_INSTANCE_OPS(pfx) \
    static CMPIStatus pfx##CreateInstance(CMPIInstanceMI *mi, const CMPIContext *ctx, \
                                          const CMPIResult *rslt, const CMPIObjectPath *op, \
                                          const CMPIInstance *ci) \
    { \
        (void)mi, (void)ctx, (void)rslt, (void)op, (void)ci; \
        CMReturn(CMPI_RC_ERR_NOT_SUPPORTED); \
    } \
    static CMPIStatus pfx##ModifyInstance(CMPIInstanceMI *mi, const CMPIContext *ctx, \
                                          const CMPIResult *rslt, const CMPIObjectPath *op, \
                                          const CMPIInstance *ci, const char **props) \
    { \
        (void)mi, (void)ctx, (void)rslt, (void)op, (void)ci, (void)props; \
        CMReturn(CMPI_RC_ERR_NOT_SUPPORTED); \
    } \
    static CMPIStatus pfx##DeleteInstance(CMPIInstanceMI *mi, const CMPIContext *ctx, \
                                          const CMPIResult *rslt, const CMPIObjectPath *op) \
    { \
        (void)mi, (void)ctx, (void)rslt, (void)op; \
        CMReturn(CMPI_RC_ERR_NOT_SUPPORTED); \
    } \
    static CMPIStatus pfx##ExecQuery(CMPIInstanceMI *mi, const CMPIContext *ctx, \
                                     const CMPIResult *rslt, const CMPIObjectPath *op, \
                                     const char *q, const char *l) \
    { \
        (void)mi, (void)ctx, (void)rslt, (void)op, (void)q, (void)l; \
        CMReturn(CMPI_RC_ERR_NOT_SUPPORTED); \
    }

#endif
