/* Test_Widget: instance and method provider over an in-library table. */
#include "tests/host/testprov_common.h"

#include <stdio.h>
#include <string.h>
#include <strings.h>

static const CMPIBroker* mib; /* written by this file's factories (see tp_init) */

typedef struct {
    int used;
    char id[32];
    CMPIUint32 count;
    CMPIUint16 size;
    CMPIBoolean flags;
    int labelNull;
    char label[32];
    CMPIReal64 ratio;
    CMPIUint64 created; /* microseconds since the epoch */
    int ntags;          /* -1: null array */
    char tags[4][16];
} Widget;

#define MAX_WIDGETS 16
static Widget widgets[MAX_WIDGETS];
static int tableReady;
static CMPIInstance* kept; /* a clone that outlives its request */

/* Called with `ready` 1 by every factory (fills the table once) and with 0
 * by cleanup (the next factory starts afresh). */
void tp_widgetsReset(int ready) {
    static const Widget initial[] = {
        {1, "w1", 1, 10, 1, 0, "first", 0.5, 1700000000000000ULL, 2, {"a", "b"}},
        {1, "w2", 2, 20, 0, 1, "", 1.5, 1700000060000000ULL, -1, {""}},
        {1, "w3", 3, 30, 0, 0, "third", 2.5, 1700000120000000ULL, 0, {""}},
    };
    tp_lock();
    if (!ready) {
        tableReady = 0;
        if (kept)
            CMRelease(kept);
        kept = NULL;
    } else if (!tableReady) {
        memset(widgets, 0, sizeof widgets);
        memcpy(widgets, initial, sizeof initial);
        tableReady = 1;
    }
    tp_unlock();
}

static Widget* findWidget(const char* id) {
    int i;
    for (i = 0; id && i < MAX_WIDGETS; ++i)
        if (widgets[i].used && strcmp(widgets[i].id, id) == 0)
            return &widgets[i];
    return NULL;
}

static CMPIInstance* widgetInstance(const Widget* w, const char* ns, const char** props) {
    static const char* keys[] = {"Id", NULL};
    CMPIInstance* ci = CMNewInstance(tp_broker, tp_widgetPath(w->id, ns), NULL);
    CMPIDateTime* created = CMNewDateTimeFromBinary(tp_broker, w->created, 0, NULL);
    int i;
    if (props)
        CMSetPropertyFilter(ci, props, keys);
    CMSetProperty(ci, "Id", w->id, CMPI_chars);
    CMSetProperty(ci, "Count", &w->count, CMPI_uint32);
    CMSetProperty(ci, "Size", &w->size, CMPI_uint16);
    CMSetProperty(ci, "Flags", &w->flags, CMPI_boolean);
    CMSetProperty(ci, "Ratio", &w->ratio, CMPI_real64);
    CMSetProperty(ci, "Created", &created, CMPI_dateTime);
    if (w->labelNull)
        CMSetProperty(ci, "Label", NULL, CMPI_string);
    else
        CMSetProperty(ci, "Label", w->label, CMPI_chars);
    if (w->ntags < 0) {
        CMSetProperty(ci, "Tags", NULL, CMPI_stringA);
    } else {
        CMPIArray* a = CMNewArray(tp_broker, (CMPICount)w->ntags, CMPI_string, NULL);
        for (i = 0; i < w->ntags; ++i)
            CMSetArrayElementAt(a, (CMPICount)i, w->tags[i], CMPI_chars);
        CMSetProperty(ci, "Tags", &a, CMPI_stringA);
    }
    return ci;
}

/* Copies the properties of `ci` named in `props` (all when NULL) into w. */
static void updateWidget(Widget* w, const CMPIInstance* ci, const char** props) {
    CMPIStatus rc;
    CMPIData d = CMGetProperty(ci, "Count", &rc);
    if (rc.rc == CMPI_RC_OK && tp_listed(props, "Count"))
        w->count = CMIsNullValue(d) ? 0 : d.value.uint32;
    d = CMGetProperty(ci, "Size", &rc);
    if (rc.rc == CMPI_RC_OK && tp_listed(props, "Size"))
        w->size = CMIsNullValue(d) ? 0 : d.value.uint16;
    d = CMGetProperty(ci, "Label", &rc);
    if (rc.rc == CMPI_RC_OK && tp_listed(props, "Label")) {
        w->labelNull = CMIsNullValue(d) != 0;
        if (!w->labelNull)
            snprintf(w->label, sizeof w->label, "%s", CMGetCharsPtr(d.value.string, NULL));
    }
}

TP_CLEANUP(WidgetCleanup, Instance)

static CMPIStatus WidgetEnumInstanceNames(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                          const CMPIResult* rslt, const CMPIObjectPath* op) {
    int i;
    tp_lock();
    for (i = 0; i < MAX_WIDGETS; ++i)
        if (widgets[i].used)
            CMReturnObjectPath(rslt, tp_widgetPath(widgets[i].id, tp_ns(op)));
    tp_unlock();
    CMReturnDone(rslt);
    CMReturn(CMPI_RC_OK);
}

static CMPIStatus WidgetEnumInstances(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                      const CMPIResult* rslt, const CMPIObjectPath* op,
                                      const char** props) {
    int i;
    tp_lock();
    for (i = 0; i < MAX_WIDGETS; ++i)
        if (widgets[i].used)
            CMReturnInstance(rslt, widgetInstance(&widgets[i], tp_ns(op), props));
    tp_unlock();
    CMReturnDone(rslt);
    CMReturn(CMPI_RC_OK);
}

static CMPIStatus WidgetGetInstance(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                    const CMPIResult* rslt, const CMPIObjectPath* op,
                                    const char** props) {
    Widget* w;
    char msg[64];
    tp_lock();
    w = findWidget(tp_key(op, "Id"));
    if (w)
        CMReturnInstance(rslt, widgetInstance(w, tp_ns(op), props));
    tp_unlock();
    if (!w) {
        snprintf(msg, sizeof msg, "no widget %s", tp_key(op, "Id") ? tp_key(op, "Id") : "?");
        CMReturnWithChars(tp_broker, CMPI_RC_ERR_NOT_FOUND, msg);
    }
    CMReturnDone(rslt);
    CMReturn(CMPI_RC_OK);
}

static CMPIStatus WidgetCreateInstance(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                       const CMPIResult* rslt, const CMPIObjectPath* op,
                                       const CMPIInstance* ci) {
    const char* id = tp_key(op, "Id");
    CMPIrc rc = CMPI_RC_ERR_FAILED;
    int i;
    if (!id)
        CMReturn(CMPI_RC_ERR_INVALID_PARAMETER);
    tp_lock();
    if (findWidget(id)) {
        rc = CMPI_RC_ERR_ALREADY_EXISTS;
    } else {
        for (i = 0; i < MAX_WIDGETS && rc != CMPI_RC_OK; ++i)
            if (!widgets[i].used) {
                Widget* w = &widgets[i];
                memset(w, 0, sizeof *w);
                w->used = w->labelNull = 1;
                w->ntags = -1;
                snprintf(w->id, sizeof w->id, "%s", id);
                updateWidget(w, ci, NULL);
                rc = CMPI_RC_OK;
            }
    }
    tp_unlock();
    if (rc != CMPI_RC_OK)
        CMReturn(rc);
    CMReturnObjectPath(rslt, tp_widgetPath(id, tp_ns(op)));
    CMReturnDone(rslt);
    CMReturn(CMPI_RC_OK);
}

static CMPIStatus WidgetModifyInstance(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                       const CMPIResult* rslt, const CMPIObjectPath* op,
                                       const CMPIInstance* ci, const char** props) {
    Widget* w;
    tp_lock();
    w = findWidget(tp_key(op, "Id"));
    if (w)
        updateWidget(w, ci, props);
    tp_unlock();
    CMReturnDone(rslt);
    CMReturn(w ? CMPI_RC_OK : CMPI_RC_ERR_NOT_FOUND);
}

static CMPIStatus WidgetDeleteInstance(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                       const CMPIResult* rslt, const CMPIObjectPath* op) {
    Widget* w;
    tp_lock();
    w = findWidget(tp_key(op, "Id"));
    if (w)
        w->used = 0;
    tp_unlock();
    CMReturnDone(rslt);
    CMReturn(w ? CMPI_RC_OK : CMPI_RC_ERR_NOT_FOUND);
}

TP_NOT_SUPPORTED(WidgetExecQuery, CMPIInstanceMI* mi, const CMPIContext* ctx,
                 const CMPIResult* rslt, const CMPIObjectPath* op, const char* query,
                 const char* lang)

CMInstanceMIStub(Widget, Test_Widget_Provider, mib, tp_init(mib))

    /* Methods */

    TP_CLEANUP(WidgetMethodCleanup, Method)

        static CMPIStatus returnValue(const CMPIResult* rslt, const void* value, CMPIType type) {
    CMReturnData(rslt, value, type);
    CMReturnDone(rslt);
    CMReturn(CMPI_RC_OK);
}

/* Returns every input argument unchanged as an output argument. */
static CMPIStatus methodEcho(const CMPIResult* rslt, const CMPIArgs* in, CMPIArgs* out) {
    CMPICount i, n = CMGetArgCount(in, NULL);
    CMPIUint32 count = n;
    for (i = 0; i < n; ++i) {
        CMPIString* name;
        CMPIData d = CMGetArgAt(in, i, &name, NULL);
        CMAddArg(out, CMGetCharsPtr(name, NULL), CMIsNullValue(d) ? NULL : &d.value, d.type);
    }
    return returnValue(rslt, &count, CMPI_uint32);
}

/* Up-call: an instance that the host keeps in its store. */
static CMPIStatus methodReadManager(const CMPIContext* ctx, const CMPIResult* rslt) {
    CMPIStatus rc;
    CMPIObjectPath* op = CMNewObjectPath(tp_broker, "root/interop", "Test_Manager", NULL);
    CMPIInstance* ci;
    CMPIData d;
    CMAddKey(op, "Name", "mgr", CMPI_chars);
    ci = CBGetInstance(tp_broker, ctx, op, NULL, &rc);
    if (!ci)
        return rc;
    d = CMGetProperty(ci, "Description", NULL);
    return returnValue(rslt, &d.value, d.type);
}

/* Up-call: another provider's class, served re-entrantly. */
static CMPIStatus methodCountGadgets(const CMPIContext* ctx, const CMPIResult* rslt,
                                     const CMPIObjectPath* self) {
    CMPIStatus rc;
    CMPIObjectPath* op = CMNewObjectPath(tp_broker, tp_ns(self), "Test_Gadget", NULL);
    CMPIEnumeration* en = CBEnumInstances(tp_broker, ctx, op, NULL, &rc);
    CMPIUint32 n = 0;
    if (!en)
        return rc;
    while (CMHasNext(en, NULL)) {
        CMPIData d = CMGetNext(en, NULL);
        if (d.type == CMPI_instance && CMGetPropertyCount(d.value.inst, NULL) > 0)
            ++n;
    }
    CMRelease(en);
    return returnValue(rslt, &n, CMPI_uint32);
}

/* Makes objects and leaves them to the broker's end-of-request cleanup. */
static CMPIStatus methodScratch(const CMPIResult* rslt) {
    int i;
    char* mem;
    CMPIGcStat* mark;
    for (i = 0; i < 10; ++i)
        CMNewString(tp_broker, "scratch", NULL);
    CMNewArray(tp_broker, 3, CMPI_instance, NULL);
    CMNewArgs(tp_broker, NULL);
    mem = (char*)tp_broker->mft->cmpiMalloc(tp_broker, 64);
    strcpy(mem, "left for the broker");
    mark = tp_broker->mft->mark(tp_broker, NULL);
    CMNewString(tp_broker, "released with the mark", NULL);
    tp_broker->mft->cmpiStrDup(tp_broker, "also released");
    tp_broker->mft->release(tp_broker, mark);
    return returnValue(rslt, mem, CMPI_chars);
}

static CMPIStatus WidgetInvokeMethod(CMPIMethodMI* mi, const CMPIContext* ctx,
                                     const CMPIResult* rslt, const CMPIObjectPath* op,
                                     const char* method, const CMPIArgs* in, CMPIArgs* out) {
    if (strcasecmp(method, "Echo") == 0)
        return methodEcho(rslt, in, out);
    if (strcasecmp(method, "WhoAmI") == 0) {
        CMPIData d = CMGetContextEntry(ctx, CMPIPrincipal, NULL);
        return returnValue(rslt, &d.value, d.type);
    }
    if (strcasecmp(method, "ReadManager") == 0)
        return methodReadManager(ctx, rslt);
    if (strcasecmp(method, "CountGadgets") == 0)
        return methodCountGadgets(ctx, rslt, op);
    if (strcasecmp(method, "Scratch") == 0)
        return methodScratch(rslt);
    if (strcasecmp(method, "KeepClone") == 0) {
        CMPIInstance* ci = CMNewInstance(tp_broker, tp_widgetPath("kept", tp_ns(op)), NULL);
        CMSetProperty(ci, "Label", "kept across requests", CMPI_chars);
        tp_lock();
        if (kept)
            CMRelease(kept);
        kept = CMClone(ci, NULL);
        tp_unlock();
        CMReturn(CMPI_RC_OK);
    }
    if (strcasecmp(method, "UseClone") == 0) {
        CMPIStatus st = {CMPI_RC_ERR_NOT_FOUND, NULL};
        tp_lock();
        if (kept) {
            CMPIData d = CMGetProperty(kept, "Label", NULL);
            st = returnValue(rslt, &d.value, d.type);
            CMRelease(kept); /* the result holds a copy */
            kept = NULL;
        }
        tp_unlock();
        return st;
    }
    if (strcasecmp(method, "ForbidUnload") == 0 || strcasecmp(method, "AllowUnload") == 0) {
        tp_forbidUnload = strcasecmp(method, "ForbidUnload") == 0;
        CMReturn(CMPI_RC_OK);
    }
    if (strcasecmp(method, "Fail") == 0)
        CMReturnWithChars(tp_broker, CMPI_RC_ERR_ACCESS_DENIED, "denied by test");
    CMReturnWithChars(tp_broker, CMPI_RC_ERR_METHOD_NOT_FOUND, method);
}

CMMethodMIStub(Widget, Test_Widget_Provider, mib, tp_init(mib))
