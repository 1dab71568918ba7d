/* The read-only Test_Gadget, the Test_WidgetGadget association between
 * widgets and gadgets, and Test_Alert indications sent from a thread of the
 * provider's own. */
#include "tests/host/testprov_common.h"

#include <stdio.h>
#include <string.h>
#include <strings.h>

static const CMPIBroker* mib; /* written by this file's factories (see tp_init) */

static const struct {
    const char* name;
    CMPIUint32 weight;
} gadgets[] = {{"g1", 5}, {"g2", 7}};
#define NGADGETS (sizeof gadgets / sizeof gadgets[0])

static CMPIInstance* gadgetInstance(size_t i, const char* ns, const char** props) {
    static const char* keys[] = {"Name", NULL};
    CMPIInstance* ci = CMNewInstance(tp_broker, tp_gadgetPath(gadgets[i].name, ns), NULL);
    if (props)
        CMSetPropertyFilter(ci, props, keys);
    CMSetProperty(ci, "Name", gadgets[i].name, CMPI_chars);
    CMSetProperty(ci, "Weight", &gadgets[i].weight, CMPI_uint32);
    return ci;
}

TP_CLEANUP(GadgetCleanup, Instance)

static CMPIStatus GadgetEnumInstanceNames(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                          const CMPIResult* rslt, const CMPIObjectPath* op) {
    size_t i;
    for (i = 0; i < NGADGETS; ++i)
        CMReturnObjectPath(rslt, tp_gadgetPath(gadgets[i].name, tp_ns(op)));
    CMReturnDone(rslt);
    CMReturn(CMPI_RC_OK);
}

static CMPIStatus GadgetEnumInstances(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                      const CMPIResult* rslt, const CMPIObjectPath* op,
                                      const char** props) {
    size_t i;
    for (i = 0; i < NGADGETS; ++i)
        CMReturnInstance(rslt, gadgetInstance(i, tp_ns(op), props));
    CMReturnDone(rslt);
    CMReturn(CMPI_RC_OK);
}

static CMPIStatus GadgetGetInstance(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                    const CMPIResult* rslt, const CMPIObjectPath* op,
                                    const char** props) {
    const char* name = tp_key(op, "Name");
    size_t i;
    for (i = 0; name && i < NGADGETS; ++i)
        if (strcmp(gadgets[i].name, name) == 0) {
            CMReturnInstance(rslt, gadgetInstance(i, tp_ns(op), props));
            CMReturnDone(rslt);
            CMReturn(CMPI_RC_OK);
        }
    CMReturn(CMPI_RC_ERR_NOT_FOUND);
}

TP_NOT_SUPPORTED(GadgetCreateInstance, CMPIInstanceMI* mi, const CMPIContext* ctx,
                 const CMPIResult* rslt, const CMPIObjectPath* op, const CMPIInstance* ci)

TP_NOT_SUPPORTED(GadgetModifyInstance, CMPIInstanceMI* mi, const CMPIContext* ctx,
                 const CMPIResult* rslt, const CMPIObjectPath* op, const CMPIInstance* ci,
                 const char** props)

TP_NOT_SUPPORTED(GadgetDeleteInstance, CMPIInstanceMI* mi, const CMPIContext* ctx,
                 const CMPIResult* rslt, const CMPIObjectPath* op)

TP_NOT_SUPPORTED(GadgetExecQuery, CMPIInstanceMI* mi, const CMPIContext* ctx,
                 const CMPIResult* rslt, const CMPIObjectPath* op, const char* query,
                 const char* lang)

CMInstanceMIStub(Gadget, Test_Gadget_Provider, mib, tp_init(mib))

    /* Test_WidgetGadget */

    static const struct {
    const char *widget, *gadget;
} links[] = {{"w1", "g1"}, {"w1", "g2"}, {"w2", "g1"}};
#define NLINKS (sizeof links / sizeof links[0])

static CMPIObjectPath* linkPath(size_t i, const char* ns) {
    CMPIObjectPath* op = CMNewObjectPath(tp_broker, ns, "Test_WidgetGadget", NULL);
    CMPIObjectPath* w = tp_widgetPath(links[i].widget, ns);
    CMPIObjectPath* g = tp_gadgetPath(links[i].gadget, ns);
    CMAddKey(op, "Widget", &w, CMPI_ref);
    CMAddKey(op, "Gadget", &g, CMPI_ref);
    return op;
}

static CMPIInstance* linkInstance(size_t i, const char* ns, const char** props) {
    static const char* keys[] = {"Widget", "Gadget", NULL};
    CMPIInstance* ci = CMNewInstance(tp_broker, linkPath(i, ns), NULL);
    CMPIObjectPath* w = tp_widgetPath(links[i].widget, ns);
    CMPIObjectPath* g = tp_gadgetPath(links[i].gadget, ns);
    CMPIUint8 strength = (CMPIUint8)(i + 1);
    if (props)
        CMSetPropertyFilter(ci, props, keys);
    CMSetProperty(ci, "Widget", &w, CMPI_ref);
    CMSetProperty(ci, "Gadget", &g, CMPI_ref);
    CMSetProperty(ci, "Strength", &strength, CMPI_uint8);
    return ci;
}

/* The other end of link i, or NULL when the link does not refer to the
 * source in the role asked for (any role when NULL). */
static CMPIObjectPath* otherEnd(size_t i, const CMPIObjectPath* src, const char* role) {
    const char *cls = tp_class(src), *ns = tp_ns(src);
    int isWidget = strcasecmp(cls, "Test_Widget") == 0;
    const char* key = tp_key(src, isWidget ? "Id" : "Name");
    if (!isWidget && strcasecmp(cls, "Test_Gadget") != 0)
        return NULL;
    if (!key || strcmp(key, isWidget ? links[i].widget : links[i].gadget) != 0)
        return NULL;
    if (role && strcasecmp(role, isWidget ? "Widget" : "Gadget") != 0)
        return NULL;
    return isWidget ? tp_gadgetPath(links[i].gadget, ns) : tp_widgetPath(links[i].widget, ns);
}

TP_CLEANUP(LinkAssociationCleanup, Association)

static CMPIStatus LinkAssociators(CMPIAssociationMI* mi, const CMPIContext* ctx,
                                  const CMPIResult* rslt, const CMPIObjectPath* op,
                                  const char* assocClass, const char* resultClass, const char* role,
                                  const char* resultRole, const char** props) {
    size_t i;
    for (i = 0; i < NLINKS; ++i) {
        CMPIObjectPath* other = otherEnd(i, op, role);
        CMPIStatus rc;
        CMPIInstance* ci;
        if (!other)
            continue;
        /* The full instance comes from the provider of the other end. */
        ci = CBGetInstance(tp_broker, ctx, other, props, &rc);
        if (!ci)
            return rc;
        CMReturnInstance(rslt, ci);
    }
    CMReturnDone(rslt);
    CMReturn(CMPI_RC_OK);
}

TP_NOT_SUPPORTED(LinkAssociatorNames, CMPIAssociationMI* mi, const CMPIContext* ctx,
                 const CMPIResult* rslt, const CMPIObjectPath* op, const char* assocClass,
                 const char* resultClass, const char* role, const char* resultRole)

static CMPIStatus LinkReferences(CMPIAssociationMI* mi, const CMPIContext* ctx,
                                 const CMPIResult* rslt, const CMPIObjectPath* op,
                                 const char* resultClass, const char* role, const char** props) {
    size_t i;
    for (i = 0; i < NLINKS; ++i)
        if (otherEnd(i, op, role))
            CMReturnInstance(rslt, linkInstance(i, tp_ns(op), props));
    CMReturnDone(rslt);
    CMReturn(CMPI_RC_OK);
}

static CMPIStatus LinkReferenceNames(CMPIAssociationMI* mi, const CMPIContext* ctx,
                                     const CMPIResult* rslt, const CMPIObjectPath* op,
                                     const char* resultClass, const char* role) {
    size_t i;
    for (i = 0; i < NLINKS; ++i)
        if (otherEnd(i, op, role))
            CMReturnObjectPath(rslt, linkPath(i, tp_ns(op)));
    CMReturnDone(rslt);
    CMReturn(CMPI_RC_OK);
}

CMAssociationMIStub(Link, Test_WidgetGadget_Provider, mib, tp_init(mib))
/* Test_Alert */

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
static void deliverAlert(const CMPIContext* ctx) {
    int i;
    ++seq;
    for (i = 0; i < MAX_NS; ++i) {
        CMPIObjectPath* op;
        CMPIInstance* ci;
        CMPIDateTime* now;
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
static CMPI_THREAD_RETURN CMPI_THREAD_CDECL alertMain(void* arg) {
    const CMPIContext* ctx = (const CMPIContext*)arg;
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

void tp_alertsStop(void) {
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

TP_CLEANUP(AlertIndicationCleanup, Indication)

static CMPIStatus AlertAuthorizeFilter(CMPIIndicationMI* mi, const CMPIContext* ctx,
                                       const CMPISelectExp* filter, const char* cls,
                                       const CMPIObjectPath* op, const char* owner) {
    tvrntest_counters.authorizeCalls++;
    CMReturn(strcasecmp(cls, "Test_Alert") == 0 ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_CLASS);
}

TP_NOT_SUPPORTED(AlertMustPoll, CMPIIndicationMI* mi, const CMPIContext* ctx,
                 const CMPISelectExp* filter, const char* cls, const CMPIObjectPath* op)

static CMPIStatus AlertActivateFilter(CMPIIndicationMI* mi, const CMPIContext* ctx,
                                      const CMPISelectExp* filter, const char* cls,
                                      const CMPIObjectPath* op, CMPIBoolean first) {
    const char* ns = tp_ns(op);
    int i, slot = -1;
    if (!CMEvaluateSelExp(filter, NULL, NULL))
        CMReturn(CMPI_RC_ERR_INVALID_QUERY);
    tp_lock();
    tvrntest_counters.activateCalls++;
    tvrntest_counters.firstActivations += first ? 1 : 0;
    for (i = 0; i < MAX_NS; ++i) /* the namespace's slot, else the first free one */
        if (activeNs[i].count ? strcmp(activeNs[i].ns, ns) == 0 : slot < 0)
            slot = i;
    if (slot >= 0 && activeNs[slot].count++ == 0)
        snprintf(activeNs[slot].ns, sizeof activeNs[slot].ns, "%s", ns);
    ++bursts;
    if (alertRunning)
        tp_broker->xft->signalCondition(alertCond);
    tp_unlock();
    CMReturn(slot >= 0 ? CMPI_RC_OK : CMPI_RC_ERR_FAILED);
}

static CMPIStatus AlertDeActivateFilter(CMPIIndicationMI* mi, const CMPIContext* ctx,
                                        const CMPISelectExp* filter, const char* cls,
                                        const CMPIObjectPath* op, CMPIBoolean last) {
    const char* ns = tp_ns(op);
    int i;
    tp_lock();
    tvrntest_counters.deactivateCalls++;
    tvrntest_counters.lastDeactivations += last ? 1 : 0;
    for (i = 0; i < MAX_NS; ++i)
        if (activeNs[i].count && strcmp(activeNs[i].ns, ns) == 0)
            activeNs[i].count--;
    tp_unlock();
    CMReturn(CMPI_RC_OK);
}

static CMPIStatus AlertEnableIndications(CMPIIndicationMI* mi, const CMPIContext* ctx) {
    CMPIContext* threadCtx = CBPrepareAttachThread(tp_broker, ctx);
    tp_lock();
    tvrntest_counters.enableCalls++;
    alertStop = 0;
    alertCond = tp_broker->xft->newCondition(0);
    alertThread = tp_broker->xft->newThread(alertMain, threadCtx, 0);
    alertRunning = alertThread != NULL;
    tp_unlock();
    CMReturn(alertRunning ? CMPI_RC_OK : CMPI_RC_ERR_FAILED);
}

static CMPIStatus AlertDisableIndications(CMPIIndicationMI* mi, const CMPIContext* ctx) {
    tvrntest_counters.disableCalls++;
    tp_alertsStop();
    CMReturn(CMPI_RC_OK);
}

CMIndicationMIStub(Alert, Test_Alert_Provider, mib, tp_init(mib))
