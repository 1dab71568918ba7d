/* Test_WidgetGadget: association provider. */
#include "tests/host/testprov_common.h"

#include <stdio.h>
#include <string.h>
#include <strings.h>

/* Written by this file's factories (see tp_init). */
static const CMPIBroker *mib;

/* ------------------------------------------------------------------------
 * Test_WidgetGadget: association provider
 * ------------------------------------------------------------------------ */

static const struct {
    const char *widget, *gadget;
} links[] = {{"w1", "g1"}, {"w1", "g2"}, {"w2", "g1"}};
#define NLINKS (sizeof links / sizeof links[0])

static CMPIObjectPath *linkPath(size_t i, const char *ns)
{
    CMPIObjectPath *op = CMNewObjectPath(tp_broker, ns, "Test_WidgetGadget", NULL);
    CMPIObjectPath *w = tp_widgetPath(links[i].widget, ns);
    CMPIObjectPath *g = tp_gadgetPath(links[i].gadget, ns);
    CMAddKey(op, "Widget", &w, CMPI_ref);
    CMAddKey(op, "Gadget", &g, CMPI_ref);
    return op;
}

static CMPIInstance *linkInstance(size_t i, const char *ns, const char **props)
{
    CMPIObjectPath *op = linkPath(i, ns);
    CMPIInstance *ci = CMNewInstance(tp_broker, op, NULL);
    CMPIObjectPath *w = tp_widgetPath(links[i].widget, ns);
    CMPIObjectPath *g = tp_gadgetPath(links[i].gadget, ns);
    CMPIUint8 strength = (CMPIUint8)(i + 1);
    static const char *keys[] = {"Widget", "Gadget", NULL};
    if (props)
        CMSetPropertyFilter(ci, props, keys);
    CMSetProperty(ci, "Widget", &w, CMPI_ref);
    CMSetProperty(ci, "Gadget", &g, CMPI_ref);
    CMSetProperty(ci, "Strength", &strength, CMPI_uint8);
    return ci;
}

/* The role the source plays in a link and the other end's path, or 0 when
 * link i does not refer to the source in the requested role. */
static int otherEnd(size_t i, const CMPIObjectPath *src, const char *role,
                    const char *resultRole, const char *resultClass, CMPIObjectPath **other)
{
    const char *cls = tp_class(src);
    const char *ns = tp_ns(src);
    int isWidget = strcasecmp(cls, "Test_Widget") == 0;
    const char *key = tp_key(src, isWidget ? "Id" : "Name");
    const char *mine = isWidget ? links[i].widget : links[i].gadget;
    if (!isWidget && strcasecmp(cls, "Test_Gadget") != 0)
        return 0;
    if (!key || strcmp(key, mine) != 0)
        return 0;
    if (role && strcasecmp(role, isWidget ? "Widget" : "Gadget") != 0)
        return 0;
    if (resultRole && strcasecmp(resultRole, isWidget ? "Gadget" : "Widget") != 0)
        return 0;
    *other = isWidget ? tp_gadgetPath(links[i].gadget, ns) : tp_widgetPath(links[i].widget, ns);
    if (resultClass && !CMClassPathIsA(tp_broker, *other, resultClass, NULL))
        return 0;
    return 1;
}

static CMPIStatus LinkAssociationCleanup(CMPIAssociationMI *mi, const CMPIContext *ctx,
                                         CMPIBoolean t)
{
    (void)mi;
    return tp_cleanup(ctx, t);
}

static CMPIStatus LinkAssociators(CMPIAssociationMI *mi, const CMPIContext *ctx,
                                  const CMPIResult *rslt, const CMPIObjectPath *op,
                                  const char *assocClass, const char *resultClass,
                                  const char *role, const char *resultRole, const char **props)
{
    size_t i;
    (void)mi, (void)assocClass;
    for (i = 0; i < NLINKS; ++i) {
        CMPIObjectPath *other;
        CMPIStatus rc;
        CMPIInstance *ci;
        if (!otherEnd(i, op, role, resultRole, resultClass, &other))
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

/* Not asked for by the tests. */
static CMPIStatus LinkAssociatorNames(CMPIAssociationMI *mi, const CMPIContext *ctx,
                                      const CMPIResult *rslt, const CMPIObjectPath *op,
                                      const char *assocClass, const char *resultClass,
                                      const char *role, const char *resultRole)
{
    (void)mi, (void)ctx, (void)rslt, (void)op, (void)assocClass, (void)resultClass, (void)role,
        (void)resultRole;
    CMReturn(CMPI_RC_ERR_NOT_SUPPORTED);
}

static CMPIStatus LinkReferences(CMPIAssociationMI *mi, const CMPIContext *ctx,
                                 const CMPIResult *rslt, const CMPIObjectPath *op,
                                 const char *resultClass, const char *role, const char **props)
{
    size_t i;
    (void)mi, (void)ctx, (void)resultClass;
    for (i = 0; i < NLINKS; ++i) {
        CMPIObjectPath *other;
        if (otherEnd(i, op, role, NULL, NULL, &other))
            CMReturnInstance(rslt, linkInstance(i, tp_ns(op), props));
    }
    CMReturnDone(rslt);
    CMReturn(CMPI_RC_OK);
}

static CMPIStatus LinkReferenceNames(CMPIAssociationMI *mi, const CMPIContext *ctx,
                                     const CMPIResult *rslt, const CMPIObjectPath *op,
                                     const char *resultClass, const char *role)
{
    size_t i;
    (void)mi, (void)ctx, (void)resultClass;
    for (i = 0; i < NLINKS; ++i) {
        CMPIObjectPath *other;
        if (otherEnd(i, op, role, NULL, NULL, &other))
            CMReturnObjectPath(rslt, linkPath(i, tp_ns(op)));
    }
    CMReturnDone(rslt);
    CMReturn(CMPI_RC_OK);
}

CMAssociationMIStub(Link, Test_WidgetGadget_Provider, mib, tp_init(mib))
