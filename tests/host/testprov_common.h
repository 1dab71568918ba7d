/* Shared parts of the host's test provider library. The stub macros give
 * every MI table of one kind the same static name, so the two instance
 * providers (Test_Widget, Test_Gadget) live in sources of their own. */
#ifndef TVRN_TESTS_HOST_TESTPROV_COMMON_H
#define TVRN_TESTS_HOST_TESTPROV_COMMON_H

#include <cmpidt.h>
#include <cmpift.h>
#include <cmpimacs.h>

#include "tests/host/testprov.h"

/* MI functions take the whole CMPI parameter list and use little of it. */
#pragma GCC diagnostic ignored "-Wunused-parameter"

extern CMPI_EXPORT struct tvrntest_counters tvrntest_counters;

/* The broker, set by the first factory while no MI exists. The stub macros
 * store the broker on each call, so each source has a variable of its own
 * and shared code reads tp_broker, which is written only while no provider
 * thread can be running. */
extern const CMPIBroker* tp_broker;
/* Set by the ForbidUnload method: non-terminating cleanups refuse. */
extern int tp_forbidUnload;

/* One recursive broker mutex guards all provider state. */
void tp_lock(void);
void tp_unlock(void);
CMPI_MUTEX_TYPE tp_mutex(void);

/* Factory hook and cleanup of every MI. */
void tp_init(const CMPIBroker* b);
CMPIStatus tp_cleanup(const CMPIContext* ctx, CMPIBoolean terminating);
#define TP_CLEANUP(name, kind)                                                          \
    static CMPIStatus name(CMPI##kind##MI* mi, const CMPIContext* ctx, CMPIBoolean t) { \
        return tp_cleanup(ctx, t);                                                      \
    }

/* An MI function that no test asks for. */
#define TP_NOT_SUPPORTED(name, ...)          \
    static CMPIStatus name(__VA_ARGS__) {    \
        CMReturn(CMPI_RC_ERR_NOT_SUPPORTED); \
    }

const char* tp_key(const CMPIObjectPath* op, const char* name);
const char* tp_ns(const CMPIObjectPath* op);
const char* tp_class(const CMPIObjectPath* op);
int tp_listed(const char** props, const char* name);
CMPIObjectPath* tp_widgetPath(const char* id, const char* ns);
CMPIObjectPath* tp_gadgetPath(const char* name, const char* ns);

/* Per-class state kept across requests (widget table, alert thread). */
void tp_widgetsReset(int ready);
void tp_alertsStop(void);

#endif
