/* Test_Alert: indications delivered from a thread of the provider. */
#include "tests/host/testprov_common.h"

#include <stdio.h>
#include <string.h>
#include <strings.h>

/* Written by this file's factories (see tp_init). */
static const CMPIBroker *mib;

/* ------------------------------------------------------------------------
 * Test_Alert: indications from a thread of the provider's own
 * ------------------------------------------------------------------------ */

#define MAX_NS 4
static struct {
    char ns[64];
    int count;
} activeNs[MAX_NS];
static CMPI_THREAD_TYPE alertThread;
static CMPI_COND_TYPE alertCond;
static int alertRunning, alertStop;
static int bursts; /* bursts of alerts still to deliver */
static const CMPIUint32 kBurst = 3;
static CMPIUint32 seq;

/* One alert to every namespace with an active filter. */
static void deliverAlert(const CMPIContext *ctx)
{
    int i;
    ++seq;
    for (i = 0; i < MAX_NS; ++i) {
        CMPIObjectPath *op;
        CMPIInstance *ci;
        CMPIDateTime *now;
        char msg[32];
        if (!activeNs[i].count)
            continue;
        op = CMNewObjectPath(tp_broker, activeNs[i].ns, "Test_Alert", NULL);
        ci = CMNewInstance(tp_broker, op, NULL);
        now = CMNewDateTime(tp_broker, NULL);
        snprintf(msg, sizeof msg, "alert %u", (unsigned)seq);
        CMSetProperty(ci, "Seq", &seq, CMPI_uint32);
        CMSetProperty(ci, "Message", msg, CMPI_chars);
        CMSetProperty(ci, "Time", &now, CMPI_dateTime);
        CBDeliverIndication(tp_broker, ctx, activeNs[i].ns, ci);
    }
}

/* Delivers a burst of alerts after every filter activation until told to
 * stop. Runs attached to the broker with the context prepared for it. */
static CMPI_THREAD_RETURN CMPI_THREAD_CDECL alertMain(void *arg)
{
    const CMPIContext *ctx = (const CMPIContext *)arg;
    CMPIUint32 i;
    CBAttachThread(tp_broker, ctx);
    tp_lock();
    tvrntest_counters.threadsAttached++;
    while (!alertStop) {
        if (bursts > 0) {
            --bursts;
            for (i = 0; i < kBurst; ++i)
                deliverAlert(ctx);
        } else {
            tp_broker->xft->condWait(alertCond, tp_mutex());
        }
    }
    tvrntest_counters.threadsDetached++;
    tp_unlock();
    CBDetachThread(tp_broker, ctx);
    return NULL;
}

void tp_alertsStop(void)
{
    tp_lock();
    if (!alertRunning) {
        tp_unlock();
        return;
    }
    alertStop = 1;
    tp_broker->xft->signalCondition(alertCond);
    tp_unlock();
    tp_broker->xft->joinThread(alertThread, NULL);
    tp_lock();
    alertRunning = 0;
    bursts = 0;
    tp_broker->xft->destroyCondition(alertCond);
    alertCond = NULL;
    tp_unlock();
}

static CMPIStatus AlertIndicationCleanup(CMPIIndicationMI *mi, const CMPIContext *ctx,
                                         CMPIBoolean t)
{
    (void)mi;
    return tp_cleanup(ctx, t);
}

static CMPIStatus AlertAuthorizeFilter(CMPIIndicationMI *mi, const CMPIContext *ctx,
                                       const CMPISelectExp *filter, const char *cls,
                                       const CMPIObjectPath *op, const char *owner)
{
    (void)mi, (void)ctx, (void)filter, (void)op, (void)owner;
    tvrntest_counters.authorizeCalls++;
    if (strcasecmp(cls, "Test_Alert") != 0)
        CMReturn(CMPI_RC_ERR_INVALID_CLASS);
    CMReturn(CMPI_RC_OK);
}

static CMPIStatus AlertMustPoll(CMPIIndicationMI *mi, const CMPIContext *ctx,
                                const CMPISelectExp *filter, const char *cls,
                                const CMPIObjectPath *op)
{
    (void)mi, (void)ctx, (void)filter, (void)cls, (void)op;
    CMReturn(CMPI_RC_ERR_NOT_SUPPORTED);
}

static void scheduleBurst(void)
{
    tp_lock();
    ++bursts;
    if (alertRunning)
        tp_broker->xft->signalCondition(alertCond);
    tp_unlock();
}

static CMPIStatus AlertActivateFilter(CMPIIndicationMI *mi, const CMPIContext *ctx,
                                      const CMPISelectExp *filter, const char *cls,
                                      const CMPIObjectPath *op, CMPIBoolean first)
{
    const char *ns = tp_ns(op);
    int i, freeSlot = -1;
    (void)mi, (void)ctx, (void)cls;
    if (!CMEvaluateSelExp(filter, NULL, NULL))
        CMReturn(CMPI_RC_ERR_INVALID_QUERY);
    tp_lock();
    tvrntest_counters.activateCalls++;
    tvrntest_counters.firstActivations += first ? 1 : 0;
    for (i = 0; i < MAX_NS; ++i) {
        if (activeNs[i].count && strcmp(activeNs[i].ns, ns) == 0) {
            activeNs[i].count++;
            tp_unlock();
            scheduleBurst();
            CMReturn(CMPI_RC_OK);
        }
        if (!activeNs[i].count && freeSlot < 0)
            freeSlot = i;
    }
    if (freeSlot >= 0) {
        snprintf(activeNs[freeSlot].ns, sizeof activeNs[freeSlot].ns, "%s", ns);
        activeNs[freeSlot].count = 1;
    }
    tp_unlock();
    scheduleBurst();
    CMReturn(freeSlot >= 0 ? CMPI_RC_OK : CMPI_RC_ERR_FAILED);
}

static CMPIStatus AlertDeActivateFilter(CMPIIndicationMI *mi, const CMPIContext *ctx,
                                        const CMPISelectExp *filter, const char *cls,
                                        const CMPIObjectPath *op, CMPIBoolean last)
{
    const char *ns = tp_ns(op);
    int i;
    (void)mi, (void)ctx, (void)filter, (void)cls;
    tp_lock();
    tvrntest_counters.deactivateCalls++;
    tvrntest_counters.lastDeactivations += last ? 1 : 0;
    for (i = 0; i < MAX_NS; ++i)
        if (activeNs[i].count && strcmp(activeNs[i].ns, ns) == 0)
            activeNs[i].count--;
    tp_unlock();
    CMReturn(CMPI_RC_OK);
}

static CMPIStatus AlertEnableIndications(CMPIIndicationMI *mi, const CMPIContext *ctx)
{
    CMPIContext *threadCtx = CBPrepareAttachThread(tp_broker, ctx);
    (void)mi;
    tp_lock();
    tvrntest_counters.enableCalls++;
    alertStop = 0;
    alertCond = tp_broker->xft->newCondition(0);
    alertThread = tp_broker->xft->newThread(alertMain, threadCtx, 0);
    alertRunning = alertThread != NULL;
    tp_unlock();
    CMReturn(alertRunning ? CMPI_RC_OK : CMPI_RC_ERR_FAILED);
}

static CMPIStatus AlertDisableIndications(CMPIIndicationMI *mi, const CMPIContext *ctx)
{
    (void)mi, (void)ctx;
    tvrntest_counters.disableCalls++;
    tp_alertsStop();
    CMReturn(CMPI_RC_OK);
}

CMIndicationMIStub(Alert, Test_Alert_Provider, mib, tp_init(mib))

