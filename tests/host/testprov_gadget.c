/* Test_Gadget: a read-only instance provider. */
#include "tests/host/testprov_common.h"

#include <stdio.h>
#include <string.h>
#include <strings.h>

/* Written by this file's factories (see tp_init). */
static const CMPIBroker *mib;

/* ------------------------------------------------------------------------
 * Test_Gadget: read-only instance provider
 * ------------------------------------------------------------------------ */

static const struct {
    const char *name;
    CMPIUint32 weight;
} gadgets[] = {{"g1", 5}, {"g2", 7}};
#define NGADGETS (sizeof gadgets / sizeof gadgets[0])

static CMPIInstance *gadgetInstance(size_t i, const char *ns, const char **props)
{
    static const char *keys[] = {"Name", NULL};
    CMPIInstance *ci = CMNewInstance(tp_broker, tp_gadgetPath(gadgets[i].name, ns), NULL);
    if (props)
        CMSetPropertyFilter(ci, props, keys);
    CMSetProperty(ci, "Name", gadgets[i].name, CMPI_chars);
    CMSetProperty(ci, "Weight", &gadgets[i].weight, CMPI_uint32);
    return ci;
}

static CMPIStatus GadgetCleanup(CMPIInstanceMI *mi, const CMPIContext *ctx, CMPIBoolean t)
{
    (void)mi;
    return tp_cleanup(ctx, t);
}

static CMPIStatus GadgetEnumInstanceNames(CMPIInstanceMI *mi, const CMPIContext *ctx,
                                          const CMPIResult *rslt, const CMPIObjectPath *op)
{
    size_t i;
    (void)mi, (void)ctx;
    for (i = 0; i < NGADGETS; ++i)
        CMReturnObjectPath(rslt, tp_gadgetPath(gadgets[i].name, tp_ns(op)));
    CMReturnDone(rslt);
    CMReturn(CMPI_RC_OK);
}

static CMPIStatus GadgetEnumInstances(CMPIInstanceMI *mi, const CMPIContext *ctx,
                                      const CMPIResult *rslt, const CMPIObjectPath *op,
                                      const char **props)
{
    size_t i;
    (void)mi, (void)ctx;
    for (i = 0; i < NGADGETS; ++i)
        CMReturnInstance(rslt, gadgetInstance(i, tp_ns(op), props));
    CMReturnDone(rslt);
    CMReturn(CMPI_RC_OK);
}

static CMPIStatus GadgetGetInstance(CMPIInstanceMI *mi, const CMPIContext *ctx,
                                    const CMPIResult *rslt, const CMPIObjectPath *op,
                                    const char **props)
{
    const char *name = tp_key(op, "Name");
    size_t i;
    (void)mi, (void)ctx;
    for (i = 0; name && i < NGADGETS; ++i)
        if (strcmp(gadgets[i].name, name) == 0) {
            CMReturnInstance(rslt, gadgetInstance(i, tp_ns(op), props));
            CMReturnDone(rslt);
            CMReturn(CMPI_RC_OK);
        }
    CMReturn(CMPI_RC_ERR_NOT_FOUND);
}

TP_READ_ONLY_INSTANCE_OPS(Gadget)
CMInstanceMIStub(Gadget, Test_Gadget_Provider, mib, tp_init(mib))

