/*
 * cmpimacs.h - convenience macros over the CMPI function tables, and the
 * stub and factory macros that generate an MI's function table together
 * with its exported <provider>_Create_<Kind>MI entry point.
 *
 * Object macros expand to (o)->ft->slot((o), ...): the object is always
 * passed again as the first argument. "rc" arguments are CMPIStatus pointers
 * and may be NULL.
 */
#ifndef _CMPIMACS_H_
#define _CMPIMACS_H_

#ifndef DOC_ONLY
#include "cmpidt.h"
#include "cmpift.h"
#endif

#ifdef DOC_ONLY
#define CMPI_INLINE
#endif

/* ------------------------------------------------------------------------
 * Status and return
 * ------------------------------------------------------------------------ */

/* Return from the enclosing function with code rc_ and no message. */
#define CMReturn(rc_)                            \
    do {                                         \
        CMPIStatus stat = {(CMPIrc)(rc_), NULL}; \
        return stat;                             \
    } while (0)

/* Return from the enclosing function with code rc_ and message str_. */
#define CMReturnWithString(rc_, str_)              \
    do {                                           \
        CMPIStatus stat = {(CMPIrc)(rc_), (str_)}; \
        return stat;                               \
    } while (0)

/* Return with code rc_ and a message made from chars_ by broker mb_. */
#define CMReturnWithChars(mb_, rc_, chars_)                          \
    do {                                                             \
        CMPIStatus stat = {(CMPIrc)(rc_), NULL};                     \
        if (mb_)                                                     \
            stat.msg = (mb_)->eft->newString((mb_), (chars_), NULL); \
        return stat;                                                 \
    } while (0)

#define CMSetStatus(st_, rcp_)          \
    do {                                \
        if (st_) {                      \
            (st_)->rc = (CMPIrc)(rcp_); \
            (st_)->msg = NULL;          \
        }                               \
    } while (0)

#define CMSetStatusWithString(st_, rcp_, string_) \
    do {                                          \
        if (st_) {                                \
            (st_)->rc = (CMPIrc)(rcp_);           \
            (st_)->msg = (string_);               \
        }                                         \
    } while (0)

#define CMSetStatusWithChars(mb_, st_, rcp_, chars_)                       \
    do {                                                                   \
        if (st_) {                                                         \
            (st_)->rc = (CMPIrc)(rcp_);                                    \
            if (mb_)                                                       \
                (st_)->msg = (mb_)->eft->newString((mb_), (chars_), NULL); \
            else                                                           \
                (st_)->msg = NULL;                                         \
        }                                                                  \
    } while (0)

/* ------------------------------------------------------------------------
 * Tests and generic calls
 * ------------------------------------------------------------------------ */

/* True when o, or its handle, is NULL. */
#define CMIsNullObject(o) ((o) == NULL || *((void**)(o)) == NULL)

/* These take a CMPIData object, not a pointer. */
#define CMIsNullValue(v) ((v.state) & CMPI_nullValue)
#define CMIsKeyValue(v) ((v.state) & CMPI_keyValue)
#define CMIsArray(v) ((v.type) & CMPI_ARRAY)

#define CMClone(o, rc) ((o)->ft->clone((o), (rc)))
#define CMRelease(o) ((o)->ft->release((o)))

/* ------------------------------------------------------------------------
 * Broker encapsulated services
 * ------------------------------------------------------------------------ */

#define CMNewInstance(b, c, rc) ((b)->eft->newInstance((b), (c), (rc)))
#define CMNewObjectPath(b, n, c, rc) ((b)->eft->newObjectPath((b), (n), (c), (rc)))
#define CMNewString(b, s, rc) ((b)->eft->newString((b), (s), (rc)))
#define CMNewArgs(b, rc) ((b)->eft->newArgs((b), (rc)))
#define CMNewArray(b, c, t, rc) ((b)->eft->newArray((b), (c), (t), (rc)))
#define CMNewDateTime(b, rc) ((b)->eft->newDateTime((b), (rc)))
#define CMNewDateTimeFromBinary(b, d, i, rc) ((b)->eft->newDateTimeFromBinary((b), (d), (i), (rc)))
#define CMNewDateTimeFromChars(b, d, rc) ((b)->eft->newDateTimeFromChars((b), (d), (rc)))
#define CMNewSelectExp(b, q, l, p, rc) ((b)->eft->newSelectExp((b), (q), (l), (p), (rc)))
#define CMClassPathIsA(b, p, pn, rc) ((b)->eft->classPathIsA((b), (p), (pn), (rc)))
#define CDToString(b, o, rc) ((b)->eft->toString((b), (void*)(o), (rc)))
#define CDIsOfType(b, o, t, rc) (b)->eft->isOfType((b), (void*)(o), (t), (rc))
#define CDGetType(b, o, rc) ((b)->eft->getType((b), (void*)(o), (rc)))

#ifdef CMPI_VER_85
/* parms is a CMFmtArgsN(...) expansion: the count, then (type, value) pairs. */
#define CMGetMessage(b, id, def, rc, parms) ((b)->eft->getMessage((b), (id), (def), (rc), parms))
#endif

#ifdef CMPI_VER_100
#define CMLogMessage(b, severity, id, text, string) \
    ((b)->eft->logMessage((b), (severity), (id), (text), (string)))
#define CMTraceMessage(b, level, component, text, string) \
    ((b)->eft->trace((b), (level), (component), (text), (string)))
#endif

#ifdef CMPI_VER_200
#define CMNewCMPIError(b, owner, msgID, msg, sev, pc, cimStatusCode, rc) \
    ((b)->eft->newCMPIError((b), (owner), (msgID), (msg), (sev), (pc), (cimStatusCode), (rc)))
#define CMOpenMessageFile(b, mf, mfh) ((b)->eft->openMessageFile((b), (mf), (mfh)))
#define CMCloseMessageFile(b, mfh) ((b)->eft->closeMessageFile((b), (mfh)))
#define CMGetMessage2(b, id, mfh, def, rc, parms) \
    ((b)->eft->getMessage2((b), (id), (mfh), (def), (rc), parms))
#endif

/* Message arguments: a type tag followed by the value. */
#ifdef CMPI_VER_85
#define CMFmtSint(v) CMPI_sint32, ((long int)v)
#define CMFmtUint(v) CMPI_uint32, ((unsigned long int)v)
#define CMFmtSint64(v) CMPI_sint64, ((CMPISint64)v)
#define CMFmtUint64(v) CMPI_uint64, ((CMPIUint64)v)
#define CMFmtReal(v) CMPI_real64, ((double)v)
#define CMFmtBoolean(v) CMPI_boolean, ((int)v)
#define CMFmtChars(v) CMPI_chars, ((char*)v)
#define CMFmtString(v) CMPI_string, ((CMPIString*)v)

#define CMFmtArgs0() 0
#define CMFmtArgs1(v1) 1, v1
#define CMFmtArgs2(v1, v2) 2, v1, v2
#define CMFmtArgs3(v1, v2, v3) 3, v1, v2, v3
#define CMFmtArgs4(v1, v2, v3, v4) 4, v1, v2, v3, v4
#define CMFmtArgs5(v1, v2, v3, v4, v5) 5, v1, v2, v3, v4, v5
#define CMFmtArgs6(v1, v2, v3, v4, v5, v6) 6, v1, v2, v3, v4, v5, v6
#define CMFmtArgs7(v1, v2, v3, v4, v5, v6, v7) 7, v1, v2, v3, v4, v5, v6, v7
#define CMFmtArgs8(v1, v2, v3, v4, v5, v6, v7, v8) 8, v1, v2, v3, v4, v5, v6, v7, v8
#define CMFmtArgs9(v1, v2, v3, v4, v5, v6, v7, v8, v9) 9, v1, v2, v3, v4, v5, v6, v7, v8, v9
#define CMFmtArgs10(v1, v2, v3, v4, v5, v6, v7, v8, v9, v10) \
    10, v1, v2, v3, v4, v5, v6, v7, v8, v9, v10
#endif

/* ------------------------------------------------------------------------
 * Instance
 * ------------------------------------------------------------------------ */

#define CMGetProperty(i, n, rc) ((i)->ft->getProperty((i), (n), (rc)))
#define CMGetPropertyAt(i, num, s, rc) ((i)->ft->getPropertyAt((i), (num), (s), (rc)))
#define CMSetProperty(i, n, v, t) ((i)->ft->setProperty((i), (n), (CMPIValue*)(v), (t)))
#define CMGetPropertyCount(i, rc) ((i)->ft->getPropertyCount((i), (rc)))
#define CMGetObjectPath(i, rc) ((i)->ft->getObjectPath((i), (rc)))
#ifdef CMPI_VER_100
#define CMSetObjectPath(i, obj) ((i)->ft->setObjectPath((i), (obj)))
#endif
#define CMSetPropertyFilter(i, pl, k) ((i)->ft->setPropertyFilter((i), (pl), (k)))
#ifdef CMPI_VER_200
#define CMSetPropertyWithOrigin(i, n, v, t, o) \
    ((i)->ft->setPropertyWithOrigin((i), (n), (CMPIValue*)(v), (t), (o)))
#endif

/* ------------------------------------------------------------------------
 * Object path
 * ------------------------------------------------------------------------ */

#define CMSetHostname(p, n) ((p)->ft->setHostname((p), (n)))
#define CMGetHostname(p, rc) ((p)->ft->getHostname((p), (rc)))
#define CMSetNameSpace(p, n) ((p)->ft->setNameSpace((p), (n)))
#define CMGetNameSpace(p, rc) ((p)->ft->getNameSpace((p), (rc)))
#define CMSetClassName(p, n) ((p)->ft->setClassName((p), (n)))
#define CMGetClassName(p, rc) ((p)->ft->getClassName((p), (rc)))
#define CMAddKey(p, n, v, t) ((p)->ft->addKey((p), (n), (CMPIValue*)(v), (t)))
#define CMGetKey(p, n, rc) ((p)->ft->getKey((p), (n), (rc)))
#define CMGetKeyAt(p, i, n, rc) ((p)->ft->getKeyAt((p), (i), (n), (rc)))
#define CMGetKeyCount(p, rc) ((p)->ft->getKeyCount((p), (rc)))
#define CMSetNameSpaceFromObjectPath(p, s) ((p)->ft->setNameSpaceFromObjectPath((p), (s)))
#define CMSetHostAndNameSpaceFromObjectPath(p, s) \
    ((p)->ft->setHostAndNameSpaceFromObjectPath((p), (s)))
#define CMGetClassQualifier(op, qName, rc) ((op)->ft->getClassQualifier((op), (qName), (rc)))
#define CMGetPropertyQualifier(op, pName, qName, rc) \
    ((op)->ft->getPropertyQualifier((op), (pName), (qName), (rc)))
#define CMGetMethodQualifier(op, methodName, qName, rc) \
    ((op)->ft->getMethodQualifier((op), (methodName), (qName), (rc)))
#define CMGetParameterQualifier(op, mName, pName, qName, rc) \
    ((op)->ft->getParameterQualifier((op), (mName), (pName), (qName), (rc)))
#ifdef CMPI_VER_86
#define CMObjectPathToString(p, rc) ((p)->ft->toString((p), (rc)))
#endif

/* ------------------------------------------------------------------------
 * Array, arguments, string, date-time
 * ------------------------------------------------------------------------ */

#define CMGetArrayCount(a, rc) ((a)->ft->getSize((a), (rc)))
#define CMGetArrayType(a, rc) ((a)->ft->getSimpleType((a), (rc)))
#define CMGetArrayElementAt(a, n, rc) ((a)->ft->getElementAt((a), (n), (rc)))
#define CMSetArrayElementAt(a, n, v, t) ((a)->ft->setElementAt((a), (n), (CMPIValue*)(v), (t)))

#define CMAddArg(a, n, v, t) ((a)->ft->addArg((a), (n), (CMPIValue*)(v), (t)))
#define CMGetArg(a, n, rc) ((a)->ft->getArg((a), (n), (rc)))
#define CMGetArgAt(a, p, n, rc) ((a)->ft->getArgAt((a), (p), (n), (rc)))
#define CMGetArgCount(a, rc) ((a)->ft->getArgCount((a), (rc)))

/* CMGetCharPtr takes no status argument. */
#define CMGetCharPtr(st) ((st)->ft->getCharPtr((st), NULL))
#define CMGetCharsPtr(st, rc) ((st)->ft->getCharPtr((st), (rc)))

#define CMGetStringFormat(d, rc) ((d)->ft->getStringFormat((d), (rc)))
#define CMGetBinaryFormat(d, rc) ((d)->ft->getBinaryFormat((d), (rc)))
#define CMIsInterval(d, rc) ((d)->ft->isInterval((d), (rc)))

/* ------------------------------------------------------------------------
 * Error (2.0)
 * ------------------------------------------------------------------------ */

#ifdef CMPI_VER_200
#define CMGetErrorType(e, rc) ((e)->ft->getErrorType((e), (rc)))
#define CMGetOtherErrorType(e, rc) ((e)->ft->getOtherErrorType((e), (rc)))
#define CMGetOwningEntity(e, rc) ((e)->ft->getOwningEntity((e), (rc)))
#define CMGetMessageID(e, rc) ((e)->ft->getMessageID((e), (rc)))
#define CMGetErrorMessage(e, rc) ((e)->ft->getMessage((e), (rc)))
#define CMGetPerceivedSeverity(e, rc) ((e)->ft->getPerceivedSeverity((e), (rc)))
#define CMGetProbableCause(e, rc) ((e)->ft->getProbableCause((e), (rc)))
#define CMGetProbableCauseDescription(e, rc) ((e)->ft->getProbableCauseDescription((e), (rc)))
#define CMGetRecommendedActions(e, rc) ((e)->ft->getRecommendedActions((e), (rc)))
#define CMGetErrorSource(e, rc) ((e)->ft->getErrorSource((e), (rc)))
#define CMGetErrorSourceFormat(e, rc) ((e)->ft->getErrorSourceFormat((e), (rc)))
#define CMGetOtherErrorSourceFormat(e, rc) ((e)->ft->getOtherErrorSourceFormat((e), (rc)))
#define CMGetCIMStatusCode(e, rc) ((e)->ft->getCIMStatusCode((e), (rc)))
#define CMGetCIMStatusCodeDescription(e, rc) ((e)->ft->getCIMStatusCodeDescription((e), (rc)))
#define CMGetMessageArguments(e, rc) ((e)->ft->getMessageArguments((e), (rc)))
#define CMSetErrorType(e, et) ((e)->ft->setErrorType((e), (et)))
#define CMSetOtherErrorType(e, oet) ((e)->ft->setOtherErrorType((e), (oet)))
#define CMSetProbableCauseDescription(e, pcd) ((e)->ft->setProbableCauseDescription((e), (pcd)))
#define CMSetRecommendedActions(e, ra) ((e)->ft->setRecommendedActions((e), (ra)))
#define CMSetErrorSource(e, es) ((e)->ft->setErrorSource((e), (es)))
#define CMSetErrorSourceFormat(e, esf) ((e)->ft->setErrorSourceFormat((e), (esf)))
#define CMSetOtherErrorSourceFormat(e, oesf) ((e)->ft->setOtherErrorSourceFormat((e), (oesf)))
#define CMSetCIMStatusCodeDescription(e, cd) ((e)->ft->setCIMStatusCodeDescription((e), (cd)))
#define CMSetMessageArguments(e, ma) ((e)->ft->setMessageArguments((e), (ma)))
#endif

/* ------------------------------------------------------------------------
 * Enumeration, result, context
 * ------------------------------------------------------------------------ */

#define CMGetNext(n, rc) ((n)->ft->getNext((n), (rc)))
#define CMHasNext(n, rc) ((n)->ft->hasNext((n), (rc)))
#define CMToArray(n, rc) ((n)->ft->toArray((n), (rc)))

/* These only call the result slot; they do not return from the caller. */
#define CMReturnData(r, v, t) ((r)->ft->returnData((r), (CMPIValue*)(v), (t)))
#define CMReturnInstance(r, i) ((r)->ft->returnInstance((r), (i)))
#define CMReturnObjectPath(r, o) ((r)->ft->returnObjectPath((r), (o)))
#define CMReturnDone(r) ((r)->ft->returnDone((r)))
#ifdef CMPI_VER_200
#define CMReturnError(r, e) ((r)->ft->returnError((r), (e)))
#endif

#define CMGetContextEntry(c, n, rc) ((c)->ft->getEntry((c), (n), (rc)))
#define CMGetContextEntryAt(c, p, n, rc) ((c)->ft->getEntryAt((c), (p), (n), (rc)))
#define CMGetContextEntryCount(c, rc) ((c)->ft->getEntryCount((c), (rc)))
#define CMAddContextEntry(c, n, v, t) ((c)->ft->addEntry((c), (n), (CMPIValue*)(v), (t)))

/* ------------------------------------------------------------------------
 * Query objects
 * ------------------------------------------------------------------------ */

#define CMGetSelExpString(s, rc) ((s)->ft->getString((s), (rc)))
#define CMEvaluateSelExp(s, i, r) ((s)->ft->evaluate((s), (i), (r)))
#ifdef CMPI_VER_87
#define CMEvaluateSelExpUsingAccessor(s, i, p, r) \
    ((s)->ft->evaluateUsingAccessor((s), (i), (p), (r)))
#endif
#define CMGetDoc(s, rc) ((s)->ft->getDOC((s), (rc)))
#define CMGetCod(s, rc) ((s)->ft->getCOD((s), (rc)))

#define CMGetSubCondCountAndType(c, t, rc) ((c)->ft->getCountAndType((c), (t), (rc)))
#define CMGetSubCondAt(c, p, rc) ((c)->ft->getSubCondAt((c), (p), (rc)))

#define CMGetPredicateCount(s, rc) ((s)->ft->getCount((s), (rc)))
#define CMGetPredicateAt(s, p, rc) ((s)->ft->getPredicateAt((s), (p), (rc)))
#define CMGetPredicate(s, n, rc) ((s)->ft->getPredicate((s), (n), (rc)))

#define CMGetPredicateData(p, t, o, n, v) ((p)->ft->getData((p), (t), (o), (n), (v)))
#if defined(CMPI_VER_87) && !defined(CMPI_VER_100)
#define CMEvaluatePredicate(p, v, t, rc) ((p)->ft->evaluate((p), (CMPIValue*)(v), (t), (rc)))
#endif
#ifdef CMPI_VER_100
#define CMEvaluatePredicateUsingAccessor(p, a, parm, rc) \
    ((p)->ft->evaluateUsingAccessor((p), (a), (parm), (rc)))
#endif

/* ------------------------------------------------------------------------
 * Broker up-calls
 * ------------------------------------------------------------------------ */

#define CBGetBrokerCapabilities(b) ((b)->bft->brokerCapabilities)
#define CBBrokerVersion(b) ((b)->bft->brokerVersion)
#define CBBrokerName(b) ((b)->bft->brokerName)

#define CBPrepareAttachThread(b, c) ((b)->bft->prepareAttachThread((b), (c)))
#define CBAttachThread(b, c) ((b)->bft->attachThread((b), (c)))
#define CBDetachThread(b, c) ((b)->bft->detachThread((b), (c)))

#define CBDeliverIndication(b, c, n, i) ((b)->bft->deliverIndication((b), (c), (n), (i)))

#define CBEnumInstanceNames(b, c, p, rc) ((b)->bft->enumerateInstanceNames((b), (c), (p), (rc)))
#define CBEnumInstances(b, c, p, pr, rc) ((b)->bft->enumerateInstances((b), (c), (p), (pr), (rc)))
#define CBGetInstance(b, c, p, pr, rc) ((b)->bft->getInstance((b), (c), (p), (pr), (rc)))
#define CBCreateInstance(b, c, p, i, rc) ((b)->bft->createInstance((b), (c), (p), (i), (rc)))
#ifdef CMPI_VER_100
#define CBModifyInstance(b, c, p, i, pr) ((b)->bft->modifyInstance((b), (c), (p), (i), (pr)))
#else
#ifdef CMPI_VER_90
#define CBSetInstance(b, c, p, i, pr) ((b)->bft->setInstance((b), (c), (p), (i), (pr)))
#else
#define CBSetInstance(b, c, p, i) ((b)->bft->setInstance((b), (c), (p), (i), NULL))
#endif
#endif
#define CBDeleteInstance(b, c, p) ((b)->bft->deleteInstance((b), (c), (p)))
#define CBExecQuery(b, c, p, l, q, rc) ((b)->bft->execQuery((b), (c), (p), (l), (q), (rc)))
#define CBAssociators(b, c, p, acl, rcl, r, rr, pr, rc) \
    ((b)->bft->associators((b), (c), (p), (acl), (rcl), (r), (rr), (pr), (rc)))
#define CBAssociatorNames(b, c, p, acl, rcl, r, rr, rc) \
    ((b)->bft->associatorNames((b), (c), (p), (acl), (rcl), (r), (rr), (rc)))
#define CBReferences(b, c, p, acl, r, pr, rc) \
    ((b)->bft->references((b), (c), (p), (acl), (r), (pr), (rc)))
#define CBReferenceNames(b, c, p, acl, r, rc) \
    ((b)->bft->referenceNames((b), (c), (p), (acl), (r), (rc)))
#define CBInvokeMethod(b, c, p, m, ai, ao, rc) \
    ((b)->bft->invokeMethod((b), (c), (p), (m), (ai), (ao), (rc)))
#define CBSetProperty(b, c, p, n, v, t) \
    ((b)->bft->setProperty((b), (c), (p), (n), (CMPIValue*)(v), (t)))
#define CBGetProperty(b, c, p, n, rc) (b)->bft->getProperty((b), (c), (p), (n), (rc))

/* ------------------------------------------------------------------------
 * MI stubs (plain C)
 *
 * Each stub defines the MI's function table from functions named with the
 * prefix pfx, and the exported factory pn##_Create_<Kind>MI, which stores
 * the broker in the lvalue `broker`, runs `hook` and returns a static MI.
 * ------------------------------------------------------------------------ */

#define CMNoHook

#ifdef CMPI_VER_100
#define CMInstanceMIStubChange(pfx) pfx##ModifyInstance
#else
#define CMInstanceMIStubChange(pfx) pfx##SetInstance
#endif

#define CMInstanceMIStub(pfx, pn, broker, hook)                                                    \
    static CMPIInstanceMIFT instMIFT__ = {                                                         \
        CMPICurrentVersion,          CMPICurrentVersion,  "instance" #pn,   pfx##Cleanup,          \
        pfx##EnumInstanceNames,      pfx##EnumInstances,  pfx##GetInstance, pfx##CreateInstance,   \
        CMInstanceMIStubChange(pfx), pfx##DeleteInstance, pfx##ExecQuery,                          \
    };                                                                                             \
    CMPI_EXTERN_C CMPIInstanceMI* pn##_Create_InstanceMI(const CMPIBroker* brkr,                   \
                                                         const CMPIContext* ctx, CMPIStatus* rc) { \
        static CMPIInstanceMI mi = {NULL, &instMIFT__};                                            \
        (void)ctx;                                                                                 \
        (void)rc;                                                                                  \
        broker = brkr;                                                                             \
        hook;                                                                                      \
        return &mi;                                                                                \
    }

#define CMAssociationMIStub(pfx, pn, broker, hook)                                            \
    static CMPIAssociationMIFT assocMIFT__ = {                                                \
        CMPICurrentVersion, CMPICurrentVersion,   "association" #pn, pfx##AssociationCleanup, \
        pfx##Associators,   pfx##AssociatorNames, pfx##References,   pfx##ReferenceNames,     \
    };                                                                                        \
    CMPI_EXTERN_C CMPIAssociationMI* pn##_Create_AssociationMI(                               \
        const CMPIBroker* brkr, const CMPIContext* ctx, CMPIStatus* rc) {                     \
        static CMPIAssociationMI mi = {NULL, &assocMIFT__};                                   \
        (void)ctx;                                                                            \
        (void)rc;                                                                             \
        broker = brkr;                                                                        \
        hook;                                                                                 \
        return &mi;                                                                           \
    }

#define CMMethodMIStub(pfx, pn, broker, hook)                                                  \
    static CMPIMethodMIFT methMIFT__ =                                                         \
        {                                                                                      \
            CMPICurrentVersion, CMPICurrentVersion, "method" #pn,                              \
            pfx##MethodCleanup, pfx##InvokeMethod,                                             \
    };                                                                                         \
    CMPI_EXTERN_C CMPIMethodMI* pn##_Create_MethodMI(const CMPIBroker* brkr,                   \
                                                     const CMPIContext* ctx, CMPIStatus* rc) { \
        static CMPIMethodMI mi = {NULL, &methMIFT__};                                          \
        (void)ctx;                                                                             \
        (void)rc;                                                                              \
        broker = brkr;                                                                         \
        hook;                                                                                  \
        return &mi;                                                                            \
    }

#define CMPropertyMIStub(pfx, pn, broker, hook)                                                    \
    static CMPIPropertyMIFT propMIFT__ = {                                                         \
        CMPICurrentVersion,   CMPICurrentVersion, "property" #pn,                                  \
        pfx##PropertyCleanup, pfx##SetProperty,   pfx##GetProperty,                                \
    };                                                                                             \
    CMPI_EXTERN_C CMPIPropertyMI* pn##_Create_PropertyMI(const CMPIBroker* brkr,                   \
                                                         const CMPIContext* ctx, CMPIStatus* rc) { \
        static CMPIPropertyMI mi = {NULL, &propMIFT__};                                            \
        (void)ctx;                                                                                 \
        (void)rc;                                                                                  \
        broker = brkr;                                                                             \
        hook;                                                                                      \
        return &mi;                                                                                \
    }

#ifdef CMPI_VER_86
#define CMIndicationMIStubExtensions(pfx) pfx##EnableIndications, pfx##DisableIndications,
#else
#define CMIndicationMIStubExtensions(pfx)
#endif

#define CMIndicationMIStub(pfx, pn, broker, hook)                                          \
    static CMPIIndicationMIFT indMIFT__ = {                                                \
        CMPICurrentVersion,     CMPICurrentVersion,    "Indication" #pn,                   \
        pfx##IndicationCleanup, pfx##AuthorizeFilter,  pfx##MustPoll,                      \
        pfx##ActivateFilter,    pfx##DeActivateFilter, CMIndicationMIStubExtensions(pfx)}; \
    CMPI_EXTERN_C CMPIIndicationMI* pn##_Create_IndicationMI(                              \
        const CMPIBroker* brkr, const CMPIContext* ctx, CMPIStatus* rc) {                  \
        static CMPIIndicationMI mi = {NULL, &indMIFT__};                                   \
        (void)ctx;                                                                         \
        (void)rc;                                                                          \
        broker = brkr;                                                                     \
        hook;                                                                              \
        return &mi;                                                                        \
    }

/* ------------------------------------------------------------------------
 * MI factories (C++)
 *
 * These build an MI around a provider class `cn` written against a separate
 * C++ wrapper layer, which is not part of these headers. That layer must
 * declare:
 *   - CmpiProviderBase: per-provider holder with getBaseMI(), setBaseMI(),
 *     incUseCount();
 *   - CmpiBaseMI: base of all provider classes, with a virtual
 *     initialize(const CmpiContext&) returning CmpiStatus (rc(), msg()),
 *     setProviderBase() and the static driveBaseCleanup;
 *   - CmpiBroker, CmpiContext: wrappers constructed from the C handles;
 *   - CmpiInstanceMI, CmpiAssociationMI, CmpiMethodMI, CmpiPropertyMI and
 *     CmpiIndicationMI with static drive<Operation> functions whose
 *     signatures match the slots of the corresponding MI table.
 * ------------------------------------------------------------------------ */

#define CMProviderBase(pn) CmpiProviderBase base##pn;

#define CMMIFactoryBody__(cn, pn, miType, ftVar)                     \
    static miType mi;                                                \
    mi.ft = &ftVar;                                                  \
    try {                                                            \
        CmpiContext ctx((CMPIContext*)ctxp);                         \
        CmpiBaseMI* provider = base##pn.getBaseMI();                 \
        if (provider == 0) {                                         \
            provider = new cn(CmpiBroker((CMPIBroker*)broker), ctx); \
            provider->setProviderBase(&base##pn);                    \
            CmpiStatus st = provider->initialize(ctx);               \
            if (st.rc() != CMPI_RC_OK) {                             \
                delete provider;                                     \
                if (rc) {                                            \
                    rc->rc = st.rc();                                \
                    rc->msg = CMNewString(broker, st.msg(), NULL);   \
                }                                                    \
                return NULL;                                         \
            }                                                        \
            base##pn.setBaseMI(provider);                            \
        }                                                            \
        mi.hdl = provider;                                           \
    } catch (...) {                                                  \
        if (rc) {                                                    \
            rc->rc = CMPI_RC_ERR_FAILED;                             \
            rc->msg = NULL;                                          \
        }                                                            \
        return NULL;                                                 \
    }                                                                \
    base##pn.incUseCount();                                          \
    return &mi;

#define CMInstanceMIFactory(cn, pn)                                          \
    CMPI_EXTERN_C CMPIInstanceMI* pn##_Create_InstanceMI(                    \
        const CMPIBroker* broker, const CMPIContext* ctxp, CMPIStatus* rc) { \
        static CMPIInstanceMIFT instMIFT = {                                 \
            CMPICurrentVersion,                                              \
            CMPICurrentVersion,                                              \
            "instance" #pn,                                                  \
            (CMPIStatus(*)(CMPIInstanceMI*, const CMPIContext*,              \
                           CMPIBoolean))CmpiBaseMI::driveBaseCleanup,        \
            CmpiInstanceMI::driveEnumInstanceNames,                          \
            CmpiInstanceMI::driveEnumInstances,                              \
            CmpiInstanceMI::driveGetInstance,                                \
            CmpiInstanceMI::driveCreateInstance,                             \
            CmpiInstanceMI::driveSetInstance,                                \
            CmpiInstanceMI::driveDeleteInstance,                             \
            CmpiInstanceMI::driveExecQuery};                                 \
        CMMIFactoryBody__(cn, pn, CMPIInstanceMI, instMIFT)                  \
    }

#define CMAssociationMIFactory(cn, pn)                                       \
    CMPI_EXTERN_C CMPIAssociationMI* pn##_Create_AssociationMI(              \
        const CMPIBroker* broker, const CMPIContext* ctxp, CMPIStatus* rc) { \
        static CMPIAssociationMIFT assocMIFT = {                             \
            CMPICurrentVersion,                                              \
            CMPICurrentVersion,                                              \
            "association" #pn,                                               \
            (CMPIStatus(*)(CMPIAssociationMI*, const CMPIContext*,           \
                           CMPIBoolean))CmpiBaseMI::driveBaseCleanup,        \
            CmpiAssociationMI::driveAssociators,                             \
            CmpiAssociationMI::driveAssociatorNames,                         \
            CmpiAssociationMI::driveReferences,                              \
            CmpiAssociationMI::driveReferenceNames};                         \
        CMMIFactoryBody__(cn, pn, CMPIAssociationMI, assocMIFT)              \
    }

#define CMMethodMIFactory(cn, pn)                                                               \
    CMPI_EXTERN_C CMPIMethodMI* pn##_Create_MethodMI(const CMPIBroker* broker,                  \
                                                     const CMPIContext* ctxp, CMPIStatus* rc) { \
        static CMPIMethodMIFT methMIFT = {                                                      \
            CMPICurrentVersion, CMPICurrentVersion, "method" #pn,                               \
            (CMPIStatus(*)(CMPIMethodMI*, const CMPIContext*,                                   \
                           CMPIBoolean))CmpiBaseMI::driveBaseCleanup,                           \
            CmpiMethodMI::driveInvokeMethod};                                                   \
        CMMIFactoryBody__(cn, pn, CMPIMethodMI, methMIFT)                                       \
    }

#define CMPropertyMIFactory(cn, pn)                                          \
    CMPI_EXTERN_C CMPIPropertyMI* pn##_Create_PropertyMI(                    \
        const CMPIBroker* broker, const CMPIContext* ctxp, CMPIStatus* rc) { \
        static CMPIPropertyMIFT propMIFT = {                                 \
            CMPICurrentVersion,                                              \
            CMPICurrentVersion,                                              \
            "property" #pn,                                                  \
            (CMPIStatus(*)(CMPIPropertyMI*, const CMPIContext*,              \
                           CMPIBoolean))CmpiBaseMI::driveBaseCleanup,        \
            CmpiPropertyMI::driveSetProperty,                                \
            CmpiPropertyMI::driveGetProperty};                               \
        CMMIFactoryBody__(cn, pn, CMPIPropertyMI, propMIFT)                  \
    }

#ifdef CMPI_VER_86
#define CMIndicationMIFactoryExtensions \
    CmpiIndicationMI::driveEnableIndications, CmpiIndicationMI::driveDisableIndications
#else
#define CMIndicationMIFactoryExtensions
#endif

#define CMIndicationMIFactory(cn, pn)                                        \
    CMPI_EXTERN_C CMPIIndicationMI* pn##_Create_IndicationMI(                \
        const CMPIBroker* broker, const CMPIContext* ctxp, CMPIStatus* rc) { \
        static CMPIIndicationMIFT indMIFT = {                                \
            CMPICurrentVersion,                                              \
            CMPICurrentVersion,                                              \
            "indication" #pn,                                                \
            (CMPIStatus(*)(CMPIIndicationMI*, const CMPIContext*,            \
                           CMPIBoolean))CmpiBaseMI::driveBaseCleanup,        \
            CmpiIndicationMI::driveAuthorizeFilter,                          \
            CmpiIndicationMI::driveMustPoll,                                 \
            CmpiIndicationMI::driveActivateFilter,                           \
            CmpiIndicationMI::driveDeActivateFilter,                         \
            CMIndicationMIFactoryExtensions};                                \
        CMMIFactoryBody__(cn, pn, CMPIIndicationMI, indMIFT)                 \
    }

#endif /* _CMPIMACS_H_ */
