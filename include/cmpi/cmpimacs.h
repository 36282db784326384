/*
 * cmpimacs.h - the C convenience layer over the CMPI function tables.
 *
 * Each macro forwards to one slot of a function table, so provider code reads
 * CMGetProperty(inst, "Name", &rc) instead of
 * inst->ft->getProperty(inst, "Name", &rc). The macros work from C and C++.
 * The MI stub macros at the end generate a provider's function table and its
 * exported factory from a set of functions named after a common prefix.
 */
#ifndef CMPIMACS_H
#define CMPIMACS_H

#include "cmpift.h"

#if defined(__cplusplus)
extern "C" {
#endif

/* ---------------------------------------------------------------------- */
/* Status                                                                 */
/* ---------------------------------------------------------------------- */

/* Builds a status; used by the CMReturn... macros. */
static inline CMPIStatus cmpi_macro_status(CMPIrc rc, CMPIString* msg)
{
    CMPIStatus st;
    st.rc = rc;
    st.msg = msg;
    return st;
}

/* Fills *st when st is not NULL; used by the CMSetStatus... macros. */
static inline void cmpi_macro_set_status(CMPIStatus* st, CMPIrc rc, CMPIString* msg)
{
    if (st != NULL) {
        st->rc = rc;
        st->msg = msg;
    }
}

/* Like cmpi_macro_set_status, with the message made from chars by the broker. */
static inline void cmpi_macro_set_status_chars(const CMPIBroker* mb, CMPIStatus* st, CMPIrc rc,
                                               const char* chars)
{
    if (st != NULL) {
        st->rc = rc;
        st->msg = (mb != NULL && chars != NULL) ? mb->eft->newString(mb, chars, NULL) : NULL;
    }
}

/* Sets the status behind pointer st (ignored when st is NULL). */
#define CMSetStatus(st, rcp) cmpi_macro_set_status((st), (CMPIrc)(rcp), NULL)
#define CMSetStatusWithString(st, rcp, string) \
    cmpi_macro_set_status((st), (CMPIrc)(rcp), (string))
#define CMSetStatusWithChars(mb, st, rcp, chars) \
    cmpi_macro_set_status_chars((mb), (st), (CMPIrc)(rcp), (chars))

/* Return a status from the enclosing function. */
#define CMReturn(rc) return cmpi_macro_status((CMPIrc)(rc), NULL)
#define CMReturnWithString(rc, str) return cmpi_macro_status((CMPIrc)(rc), (str))
#define CMReturnWithChars(mb, rc, chars) \
    return cmpi_macro_status((CMPIrc)(rc), (mb)->eft->newString((mb), (chars), NULL))

/* ---------------------------------------------------------------------- */
/* Objects and values                                                     */
/* ---------------------------------------------------------------------- */

/* True when o is NULL or its hdl is NULL (valid objects never have a NULL hdl). */
#define CMIsNullObject(o) ((o) == NULL || *((void* const*)(o)) == NULL)
#define CMIsNullValue(v) (((v).state & CMPI_nullValue) != 0)
#define CMIsKeyValue(v) (((v).state & CMPI_keyValue) != 0)
#define CMIsArray(v) (((v).type & CMPI_ARRAY) != 0)

#define CMClone(o, rc) ((o)->ft->clone((o), (rc)))
#define CMRelease(o) ((o)->ft->release((o)))

/* The characters of a CMPIString: its hdl is the NUL-terminated buffer. */
#define CMGetCharPtr(s) ((char*)(s)->hdl)
/* Same through the function table. */
#define CMGetCharsPtr(st, rc) ((st)->ft->getCharPtr((st), (rc)))

/* ---------------------------------------------------------------------- */
/* Broker: encapsulated-object factories and services                     */
/* ---------------------------------------------------------------------- */

#define CMNewInstance(b, c, rc) ((b)->eft->newInstance((b), (c), (rc)))
#define CMNewObjectPath(b, n, c, rc) ((b)->eft->newObjectPath((b), (n), (c), (rc)))
#define CMNewString(b, s, rc) ((b)->eft->newString((b), (s), (rc)))
#define CMNewArgs(b, rc) ((b)->eft->newArgs((b), (rc)))
#define CMNewArray(b, c, t, rc) ((b)->eft->newArray((b), (c), (t), (rc)))
#define CMNewDateTime(b, rc) ((b)->eft->newDateTime((b), (rc)))
#define CMNewDateTimeFromBinary(b, d, i, rc) \
    ((b)->eft->newDateTimeFromBinary((b), (d), (i), (rc)))
#define CMNewDateTimeFromChars(b, d, rc) ((b)->eft->newDateTimeFromChars((b), (d), (rc)))
#define CMNewSelectExp(b, q, l, p, rc) ((b)->eft->newSelectExp((b), (q), (l), (p), (rc)))
#define CMClassPathIsA(b, p, pn, rc) ((b)->eft->classPathIsA((b), (p), (pn), (rc)))
#define CDToString(b, o, rc) ((b)->eft->toString((b), (const void*)(o), (rc)))
#define CDIsOfType(b, o, t, rc) ((b)->eft->isOfType((b), (const void*)(o), (t), (rc)))
#define CDGetType(b, o, rc) ((b)->eft->getType((b), (const void*)(o), (rc)))
#define CMLogMessage(b, severity, id, text, string) \
    ((b)->eft->logMessage((b), (severity), (id), (text), (string)))
#define CMTraceMessage(b, level, component, text, string) \
    ((b)->eft->trace((b), (level), (component), (text), (string)))

/*
 * Message insert arguments for CMGetMessage / CMGetMessage2: `parms` is one
 * of CMFmtArgs0() .. CMFmtArgs10(...), each argument one CMFmt... item. On
 * the variable argument list each item is a type code (int) followed by the
 * value: sint32 as long, uint32 as unsigned long, sint64 as long long,
 * uint64 as unsigned long long, real64 as double, boolean as int, chars as
 * char*, string as CMPIString*.
 */
#define CMFmtSint(v) CMPI_sint32, ((long int)(v))
#define CMFmtUint(v) CMPI_uint32, ((unsigned long int)(v))
#define CMFmtSint64(v) CMPI_sint64, ((long long int)(v))
#define CMFmtUint64(v) CMPI_uint64, ((unsigned long long int)(v))
#define CMFmtReal(v) CMPI_real64, ((double)(v))
#define CMFmtBoolean(v) CMPI_boolean, ((int)(v))
#define CMFmtChars(v) CMPI_chars, ((const char*)(v))
#define CMFmtString(v) CMPI_string, ((CMPIString*)(v))

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

#define CMGetMessage(b, id, def, rc, parms) ((b)->eft->getMessage((b), (id), (def), (rc), parms))

#if defined(CMPI_VER_200)
#define CMNewCMPIError(b, owner, msgID, msg, sev, pc, cimStatusCode, rc) \
    ((b)->eft->newCMPIError((b), (owner), (msgID), (msg), (sev), (pc), (cimStatusCode), (rc)))
#define CMOpenMessageFile(b, mf, mfh) ((b)->eft->openMessageFile((b), (mf), (mfh)))
#define CMCloseMessageFile(b, mfh) ((b)->eft->closeMessageFile((b), (mfh)))
#define CMGetMessage2(b, id, mfh, def, rc, parms) \
    ((b)->eft->getMessage2((b), (id), (mfh), (def), (rc), parms))
#endif

/* ---------------------------------------------------------------------- */
/* Broker: up-calls and thread attach                                     */
/* ---------------------------------------------------------------------- */

#define CBGetBrokerCapabilities(b) ((b)->bft->brokerCapabilities)
#define CBGetClassification(b) ((b)->bft->brokerCapabilities)
#define CBBrokerVersion(b) ((b)->bft->brokerVersion)
#define CBBrokerName(b) ((b)->bft->brokerName)

#define CBPrepareAttachThread(b, c) ((b)->bft->prepareAttachThread((b), (c)))
#define CBAttachThread(b, c) ((b)->bft->attachThread((b), (c)))
#define CBDetachThread(b, c) ((b)->bft->detachThread((b), (c)))
#define CBDeliverIndication(b, c, n, i) ((b)->bft->deliverIndication((b), (c), (n), (i)))

#define CBEnumInstanceNames(b, c, p, rc) ((b)->bft->enumerateInstanceNames((b), (c), (p), (rc)))
#define CBEnumInstances(b, c, p, pr, rc) \
    ((b)->bft->enumerateInstances((b), (c), (p), (pr), (rc)))
#define CBGetInstance(b, c, p, pr, rc) ((b)->bft->getInstance((b), (c), (p), (pr), (rc)))
#define CBCreateInstance(b, c, p, i, rc) ((b)->bft->createInstance((b), (c), (p), (i), (rc)))
#define CBModifyInstance(b, c, p, i, pr) ((b)->bft->modifyInstance((b), (c), (p), (i), (pr)))
#define CBDeleteInstance(b, c, p) ((b)->bft->deleteInstance((b), (c), (p)))
#define CBExecQuery(b, c, p, q, l, rc) ((b)->bft->execQuery((b), (c), (p), (q), (l), (rc)))
#define CBAssociators(b, c, p, acl, rcl, r, rr, pr, rc) \
    ((b)->bft->associators((b), (c), (p), (acl), (rcl), (r), (rr), (pr), (rc)))
#define CBAssociatorNames(b, c, p, acl, rcl, r, rr, rc) \
    ((b)->bft->associatorNames((b), (c), (p), (acl), (rcl), (r), (rr), (rc)))
#define CBReferences(b, c, p, rcl, r, pr, rc) \
    ((b)->bft->references((b), (c), (p), (rcl), (r), (pr), (rc)))
#define CBReferenceNames(b, c, p, rcl, r, rc) \
    ((b)->bft->referenceNames((b), (c), (p), (rcl), (r), (rc)))
#define CBInvokeMethod(b, c, p, m, ai, ao, rc) \
    ((b)->bft->invokeMethod((b), (c), (p), (m), (ai), (ao), (rc)))
#define CBSetProperty(b, c, p, n, v, t) ((b)->bft->setProperty((b), (c), (p), (n), (v), (t)))
#define CBGetProperty(b, c, p, n, rc) ((b)->bft->getProperty((b), (c), (p), (n), (rc)))

/* ---------------------------------------------------------------------- */
/* Instance                                                               */
/* ---------------------------------------------------------------------- */

#define CMGetProperty(i, n, rc) ((i)->ft->getProperty((i), (n), (rc)))
#define CMGetPropertyAt(i, num, s, rc) ((i)->ft->getPropertyAt((i), (num), (s), (rc)))
#define CMGetPropertyCount(i, rc) ((i)->ft->getPropertyCount((i), (rc)))
#define CMSetProperty(i, n, v, t) ((i)->ft->setProperty((i), (n), (const CMPIValue*)(v), (t)))
#define CMGetObjectPath(i, rc) ((i)->ft->getObjectPath((i), (rc)))
#define CMSetPropertyFilter(i, pl, k) ((i)->ft->setPropertyFilter((i), (pl), (k)))
#define CMSetObjectPath(i, op) ((i)->ft->setObjectPath((i), (op)))
#if defined(CMPI_VER_200)
#define CMSetPropertyWithOrigin(i, n, v, t, o) \
    ((i)->ft->setPropertyWithOrigin((i), (n), (const CMPIValue*)(v), (t), (o)))
#endif

/* ---------------------------------------------------------------------- */
/* Object path                                                            */
/* ---------------------------------------------------------------------- */

#define CMSetNameSpace(p, n) ((p)->ft->setNameSpace((p), (n)))
#define CMGetNameSpace(p, rc) ((p)->ft->getNameSpace((p), (rc)))
#define CMSetHostname(p, n) ((p)->ft->setHostname((p), (n)))
#define CMGetHostname(p, rc) ((p)->ft->getHostname((p), (rc)))
#define CMSetClassName(p, n) ((p)->ft->setClassName((p), (n)))
#define CMGetClassName(p, rc) ((p)->ft->getClassName((p), (rc)))
#define CMAddKey(p, n, v, t) ((p)->ft->addKey((p), (n), (const CMPIValue*)(v), (t)))
#define CMGetKey(p, n, rc) ((p)->ft->getKey((p), (n), (rc)))
#define CMGetKeyAt(p, i, n, rc) ((p)->ft->getKeyAt((p), (i), (n), (rc)))
#define CMGetKeyCount(p, rc) ((p)->ft->getKeyCount((p), (rc)))
#define CMSetNameSpaceFromObjectPath(p, s) ((p)->ft->setNameSpaceFromObjectPath((p), (s)))
#define CMSetHostAndNameSpaceFromObjectPath(p, s) \
    ((p)->ft->setHostAndNameSpaceFromObjectPath((p), (s)))
#define CMGetClassQualifier(p, q, rc) ((p)->ft->getClassQualifier((p), (q), (rc)))
#define CMGetPropertyQualifier(p, pn, q, rc) \
    ((p)->ft->getPropertyQualifier((p), (pn), (q), (rc)))
#define CMGetMethodQualifier(p, m, q, rc) ((p)->ft->getMethodQualifier((p), (m), (q), (rc)))
#define CMGetParameterQualifier(p, m, pn, q, rc) \
    ((p)->ft->getParameterQualifier((p), (m), (pn), (q), (rc)))
#define CMObjectPathToString(p, rc) ((p)->ft->toString((p), (rc)))

/* ---------------------------------------------------------------------- */
/* Array, arguments, enumeration, date-time                               */
/* ---------------------------------------------------------------------- */

#define CMGetArrayCount(a, rc) ((a)->ft->getSize((a), (rc)))
#define CMGetArrayType(a, rc) ((a)->ft->getSimpleType((a), (rc)))
#define CMGetArrayElementAt(a, n, rc) ((a)->ft->getElementAt((a), (n), (rc)))
#define CMSetArrayElementAt(a, n, v, t) \
    ((a)->ft->setElementAt((a), (n), (const CMPIValue*)(v), (t)))

#define CMAddArg(a, n, v, t) ((a)->ft->addArg((a), (n), (const CMPIValue*)(v), (t)))
#define CMGetArg(a, n, rc) ((a)->ft->getArg((a), (n), (rc)))
#define CMGetArgAt(a, p, n, rc) ((a)->ft->getArgAt((a), (p), (n), (rc)))
#define CMGetArgCount(a, rc) ((a)->ft->getArgCount((a), (rc)))

#define CMGetNext(e, rc) ((e)->ft->getNext((e), (rc)))
#define CMHasNext(e, rc) ((e)->ft->hasNext((e), (rc)))
#define CMToArray(e, rc) ((e)->ft->toArray((e), (rc)))

#define CMGetBinaryFormat(d, rc) ((d)->ft->getBinaryFormat((d), (rc)))
#define CMGetStringFormat(d, rc) ((d)->ft->getStringFormat((d), (rc)))
#define CMIsInterval(d, rc) ((d)->ft->isInterval((d), (rc)))

/* ---------------------------------------------------------------------- */
/* Result                                                                 */
/* ---------------------------------------------------------------------- */

#define CMReturnData(r, v, t) ((r)->ft->returnData((r), (const CMPIValue*)(v), (t)))
#define CMReturnInstance(r, i) ((r)->ft->returnInstance((r), (i)))
#define CMReturnObjectPath(r, o) ((r)->ft->returnObjectPath((r), (o)))
#define CMReturnDone(r) ((r)->ft->returnDone((r)))
#if defined(CMPI_VER_200)
#define CMReturnError(r, e) ((r)->ft->returnError((r), (e)))
#endif

/* ---------------------------------------------------------------------- */
/* Context                                                                */
/* ---------------------------------------------------------------------- */

#define CMGetContextEntry(c, n, rc) ((c)->ft->getEntry((c), (n), (rc)))
#define CMGetContextEntryAt(c, p, n, rc) ((c)->ft->getEntryAt((c), (p), (n), (rc)))
#define CMGetContextEntryCount(c, rc) ((c)->ft->getEntryCount((c), (rc)))
#define CMAddContextEntry(c, n, v, t) ((c)->ft->addEntry((c), (n), (const CMPIValue*)(v), (t)))

/*
 * True when ctx comes from this project's embedded host, i.e. its function
 * table is a CMPIContextFTExt. Only then may CMReleaseThreadMemory be used.
 */
static inline CMPIBoolean CMHasHostExtensions(const CMPIContext* ctx)
{
    CMPIStatus st = {CMPI_RC_OK, NULL};
    CMPIData d;
    if (ctx == NULL || ctx->ft == NULL) {
        return 0;
    }
    d = ctx->ft->getEntry(ctx, CMPI_ORV_HostExtensions, &st);
    return (CMPIBoolean)(st.rc == CMPI_RC_OK && d.type == CMPI_uint32 &&
                         (d.state & CMPI_nullValue) == 0 && d.value.uint32 >= 1);
}

/* The extended table behind a context of the embedded host. */
#define CMContextFTExt(c) ((const CMPIContextFTExt*)(const void*)((c)->ft))
/* Frees what the embedded host allocated for this thread so far. */
#define CMReleaseThreadMemory(c) (CMContextFTExt(c)->releaseThreadMemory((c)))

/* ---------------------------------------------------------------------- */
/* Query: select expression, condition, sub-condition, predicate          */
/* ---------------------------------------------------------------------- */

#define CMGetSelExpString(s, rc) ((s)->ft->getString((s), (rc)))
#define CMEvaluateSelExp(s, i, rc) ((s)->ft->evaluate((s), (i), (rc)))
#define CMEvaluateSelExpUsingAccessor(s, a, p, rc) \
    ((s)->ft->evaluateUsingAccessor((s), (a), (p), (rc)))
#define CMGetDoc(s, rc) ((s)->ft->getDOC((s), (rc)))
#define CMGetCod(s, rc) ((s)->ft->getCOD((s), (rc)))

#define CMGetSubCondCountAndType(c, t, rc) ((c)->ft->getCountAndType((c), (t), (rc)))
#define CMGetSubCondAt(c, p, rc) ((c)->ft->getSubCondAt((c), (p), (rc)))

#define CMGetPredicateCount(s, rc) ((s)->ft->getCount((s), (rc)))
#define CMGetPredicateAt(s, p, rc) ((s)->ft->getPredicateAt((s), (p), (rc)))
#define CMGetPredicate(s, n, rc) ((s)->ft->getPredicate((s), (n), (rc)))

#define CMGetPredicateData(p, t, o, n, v) ((p)->ft->getData((p), (t), (o), (n), (v)))
#define CMEvaluatePredicateUsingAccessor(p, a, parm, rc) \
    ((p)->ft->evaluateUsingAccessor((p), (a), (parm), (rc)))

#if defined(CMPI_VER_200)
/* ---------------------------------------------------------------------- */
/* Extended error                                                         */
/* ---------------------------------------------------------------------- */

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
#define CMSetOtherErrorType(e, ot) ((e)->ft->setOtherErrorType((e), (ot)))
#define CMSetProbableCauseDescription(e, pcd) ((e)->ft->setProbableCauseDescription((e), (pcd)))
#define CMSetRecommendedActions(e, ra) ((e)->ft->setRecommendedActions((e), (ra)))
#define CMSetErrorSource(e, es) ((e)->ft->setErrorSource((e), (es)))
#define CMSetErrorSourceFormat(e, esf) ((e)->ft->setErrorSourceFormat((e), (esf)))
#define CMSetOtherErrorSourceFormat(e, oesf) ((e)->ft->setOtherErrorSourceFormat((e), (oesf)))
#define CMSetCIMStatusCodeDescription(e, scd) ((e)->ft->setCIMStatusCodeDescription((e), (scd)))
#define CMSetMessageArguments(e, values) ((e)->ft->setMessageArguments((e), (values)))
#endif

/* ---------------------------------------------------------------------- */
/* MI stubs: function table plus exported factory                         */
/* ---------------------------------------------------------------------- */

/*
 * CM<Type>MIStub(pfx, pn, mbvar, hook) defines a static function table whose
 * slots are the functions pfx##Cleanup, pfx##EnumInstanceNames, ... (names
 * below), a static MI object, and the exported factory pn##_Create_<Type>MI.
 * The factory stores the broker in mbvar, sets *rc to OK, runs hook (which
 * may use the parameters brkr, ctx and rc) and returns the same MI object on
 * every call. Use CMNoHook when there is nothing to run.
 */
#define CMNoHook

#define CMPI_MI_FACTORY_(Type, pn, mbvar, hook, miObject)                                   \
    CMPI_EXTERN_C CMPI##Type* pn##_Create_##Type(const CMPIBroker* brkr,                    \
                                                 const CMPIContext* ctx, CMPIStatus* rc)    \
    {                                                                                       \
        (void)ctx;                                                                          \
        mbvar = brkr;                                                                       \
        cmpi_macro_set_status(rc, CMPI_RC_OK, NULL);                                        \
        hook;                                                                               \
        return &(miObject);                                                                 \
    }

#define CMInstanceMIStub(pfx, pn, mbvar, hook)                                              \
    static CMPIInstanceMIFT pn##_InstanceMIFT_ = {                                          \
        CMPICurrentVersion, CMPICurrentVersion, "instance" #pn,                             \
        pfx##Cleanup, pfx##EnumInstanceNames, pfx##EnumInstances, pfx##GetInstance,         \
        pfx##CreateInstance, pfx##ModifyInstance, pfx##DeleteInstance, pfx##ExecQuery};     \
    static CMPIInstanceMI pn##_InstanceMI_ = {NULL, &pn##_InstanceMIFT_};                   \
    CMPI_MI_FACTORY_(InstanceMI, pn, mbvar, hook, pn##_InstanceMI_)

#define CMAssociationMIStub(pfx, pn, mbvar, hook)                                           \
    static CMPIAssociationMIFT pn##_AssociationMIFT_ = {                                    \
        CMPICurrentVersion, CMPICurrentVersion, "association" #pn,                          \
        pfx##AssociationCleanup, pfx##Associators, pfx##AssociatorNames, pfx##References,   \
        pfx##ReferenceNames};                                                               \
    static CMPIAssociationMI pn##_AssociationMI_ = {NULL, &pn##_AssociationMIFT_};          \
    CMPI_MI_FACTORY_(AssociationMI, pn, mbvar, hook, pn##_AssociationMI_)

#define CMMethodMIStub(pfx, pn, mbvar, hook)                                                \
    static CMPIMethodMIFT pn##_MethodMIFT_ = {                                              \
        CMPICurrentVersion, CMPICurrentVersion, "method" #pn,                               \
        pfx##MethodCleanup, pfx##InvokeMethod};                                             \
    static CMPIMethodMI pn##_MethodMI_ = {NULL, &pn##_MethodMIFT_};                         \
    CMPI_MI_FACTORY_(MethodMI, pn, mbvar, hook, pn##_MethodMI_)

#if defined(CMPI_VER_200)
#define CMPI_PROPERTY_ORIGIN_SLOT_(pfx) , pfx##SetPropertyWithOrigin
#else
#define CMPI_PROPERTY_ORIGIN_SLOT_(pfx)
#endif

#define CMPropertyMIStub(pfx, pn, mbvar, hook)                                              \
    static CMPIPropertyMIFT pn##_PropertyMIFT_ = {                                          \
        CMPICurrentVersion, CMPICurrentVersion, "property" #pn,                             \
        pfx##PropertyCleanup, pfx##SetProperty,                                             \
        pfx##GetProperty CMPI_PROPERTY_ORIGIN_SLOT_(pfx)};                                  \
    static CMPIPropertyMI pn##_PropertyMI_ = {NULL, &pn##_PropertyMIFT_};                   \
    CMPI_MI_FACTORY_(PropertyMI, pn, mbvar, hook, pn##_PropertyMI_)

#define CMIndicationMIStub(pfx, pn, mbvar, hook)                                            \
    static CMPIIndicationMIFT pn##_IndicationMIFT_ = {                                      \
        CMPICurrentVersion, CMPICurrentVersion, "Indication" #pn,                           \
        pfx##IndicationCleanup, pfx##AuthorizeFilter, pfx##MustPoll, pfx##ActivateFilter,   \
        pfx##DeActivateFilter, pfx##EnableIndications, pfx##DisableIndications};            \
    static CMPIIndicationMI pn##_IndicationMI_ = {NULL, &pn##_IndicationMIFT_};             \
    CMPI_MI_FACTORY_(IndicationMI, pn, mbvar, hook, pn##_IndicationMI_)

#if defined(__cplusplus)
}
#endif

#endif /* CMPIMACS_H */
