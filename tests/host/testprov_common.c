/* Shared state and helpers of the test provider library. */
#include "tests/host/testprov_common.h"

#include <strings.h>

CMPI_EXPORT struct tvrntest_counters tvrntest_counters;
const CMPIBroker* tp_broker;
int tp_forbidUnload;

static CMPI_MUTEX_TYPE mutex;
static int mutexOnce;
static int liveMIs; /* created and not yet cleaned up */

static void makeMutex(void) {
    mutex = tp_broker->xft->newMutex(0);
}

CMPI_MUTEX_TYPE tp_mutex(void) {
    tp_broker->xft->threadOnce(&mutexOnce, makeMutex);
    return mutex;
}

void tp_lock(void) {
    tp_broker->xft->lockMutex(tp_mutex());
}
void tp_unlock(void) {
    tp_broker->xft->unlockMutex(tp_mutex());
}

void tp_init(const CMPIBroker* b) {
    if (!liveMIs)
        tp_broker = b;
    tvrntest_counters.factoryCalls++;
    liveMIs++;
    tp_widgetsReset(1);
}

const char* tp_key(const CMPIObjectPath* op, const char* name) {
    CMPIStatus rc;
    CMPIData d = CMGetKey(op, name, &rc);
    if (rc.rc != CMPI_RC_OK || d.type != CMPI_string || CMIsNullValue(d))
        return NULL;
    return CMGetCharsPtr(d.value.string, NULL);
}

const char* tp_ns(const CMPIObjectPath* op) {
    CMPIString* ns = CMGetNameSpace(op, NULL);
    return ns ? CMGetCharsPtr(ns, NULL) : "";
}

const char* tp_class(const CMPIObjectPath* op) {
    CMPIString* cn = CMGetClassName(op, NULL);
    return cn ? CMGetCharsPtr(cn, NULL) : "";
}

int tp_listed(const char** props, const char* name) {
    if (!props)
        return 1;
    for (; *props; ++props)
        if (strcasecmp(*props, name) == 0)
            return 1;
    return 0;
}

CMPIObjectPath* tp_widgetPath(const char* id, const char* ns) {
    CMPIObjectPath* op = CMNewObjectPath(tp_broker, ns, "Test_Widget", NULL);
    CMAddKey(op, "Id", id, CMPI_chars);
    return op;
}

CMPIObjectPath* tp_gadgetPath(const char* name, const char* ns) {
    CMPIObjectPath* op = CMNewObjectPath(tp_broker, ns, "Test_Gadget", NULL);
    CMAddKey(op, "Name", name, CMPI_chars);
    return op;
}

CMPIStatus tp_cleanup(const CMPIContext* ctx, CMPIBoolean terminating) {
    if (!terminating && tp_forbidUnload)
        CMReturn(CMPI_RC_DO_NOT_UNLOAD);
    tp_alertsStop();
    tp_widgetsReset(0);
    if (--liveMIs == 0) { /* the last MI: nothing uses the mutex any more */
        tp_broker->xft->destroyMutex(mutex);
        mutex = NULL;
        mutexOnce = 0;
        tp_broker = NULL;
    }
    CMReturn(CMPI_RC_OK);
}
