/* cmpimacs.h: the CMPI 2.0 convenience macros — status and return helpers, factory and accessor
 * shorthands over the function tables, broker up-calls and the MI factory stubs. */
#ifndef _CMPIMACS_H_
#define _CMPIMACS_H_

#include "cmpift.h"

/* ---- status ------------------------------------------------------------ */
/* Plain blocks, as provider code writes these with or without a trailing ';'. */
#define CMReturn(rc) \
    { CMPIStatus stat_ = { (CMPIrc)(rc), NULL }; return stat_; }

#define CMReturnWithString(rc, str) \
    { CMPIStatus stat_ = { (CMPIrc)(rc), (str) }; return stat_; }

#define CMReturnWithChars(b, rc, chars) \
    { CMPIStatus stat_ = { (CMPIrc)(rc), NULL }; \
      stat_.msg = (b)->eft->newString((b), (chars), NULL); return stat_; }

#define CMSetStatus(st, rcp) \
    { if (st) { (st)->rc = (CMPIrc)(rcp); (st)->msg = NULL; } }

#define CMSetStatusWithString(st, rcp, string) \
    { if (st) { (st)->rc = (CMPIrc)(rcp); (st)->msg = (string); } }

#define CMSetStatusWithChars(mb, st, rcp, chars) \
    { if (st) { (st)->rc = (CMPIrc)(rcp); \
      (st)->msg = (mb)->eft->newString((mb), (chars), NULL); } }

/* ---- tests ------------------------------------------------------------- */
#define CMIsNullObject(obj) ((obj) == NULL || *((void* const*)(obj)) == NULL)
#define CMIsNullValue(val)  (((val).state & CMPI_nullValue) != 0)
#define CMIsKeyValue(val)   (((val).state & CMPI_keyValue) != 0)
#define CMIsArray(val)      (((val).type & CMPI_ARRAY) != 0)

/* ---- generic object operations ---------------------------------------- */
#define CMClone(obj, rc) ((obj)->ft->clone((obj), (rc)))
#define CMRelease(obj)   ((obj)->ft->release((obj)))

/* ---- broker encapsulated-object factory ------------------------------- */
#define CMNewInstance(b, op, rc)          ((b)->eft->newInstance((b), (op), (rc)))
#define CMNewObjectPath(b, ns, cn, rc)    ((b)->eft->newObjectPath((b), (ns), (cn), (rc)))
#define CMNewString(b, data, rc)          ((b)->eft->newString((b), (data), (rc)))
#define CMNewArgs(b, rc)                  ((b)->eft->newArgs((b), (rc)))
#define CMNewArray(b, size, type, rc)     ((b)->eft->newArray((b), (size), (type), (rc)))
#define CMNewDateTime(b, rc)              ((b)->eft->newDateTime((b), (rc)))
#define CMNewDateTimeFromBinary(b, bin, interval, rc) \
    ((b)->eft->newDateTimeFromBinary((b), (bin), (interval), (rc)))
#define CMNewDateTimeFromChars(b, chars, rc) \
    ((b)->eft->newDateTimeFromChars((b), (chars), (rc)))
#define CMNewSelectExp(b, query, lang, projection, rc) \
    ((b)->eft->newSelectExp((b), (query), (lang), (projection), (rc)))
#define CMNewCMPIError(b, owner, msgID, msg, sev, pc, cimStatusCode, rc) \
    ((b)->eft->newCMPIError((b), (owner), (msgID), (msg), (sev), (pc), (cimStatusCode), (rc)))
#define CMClassPathIsA(b, op, type, rc)   ((b)->eft->classPathIsA((b), (op), (type), (rc)))
#define CDToString(b, obj, rc)            ((b)->eft->toString((b), (const void*)(obj), (rc)))
#define CDIsOfType(b, obj, type, rc)      ((b)->eft->isOfType((b), (const void*)(obj), (type), (rc)))
#define CDGetType(b, obj, rc)             ((b)->eft->getType((b), (const void*)(obj), (rc)))
#define CMLogMessage(b, severity, id, text, string) \
    ((b)->eft->logMessage((b), (severity), (id), (text), (string)))
#define CMTraceMessage(b, level, component, text, string) \
    ((b)->eft->trace((b), (level), (component), (text), (string)))
#define CMOpenMessageFile(b, msgFile, msgFileHandle) \
    ((b)->eft->openMessageFile((b), (msgFile), (msgFileHandle)))
#define CMCloseMessageFile(b, msgFileHandle) \
    ((b)->eft->closeMessageFile((b), (msgFileHandle)))

/* Message-insert argument lists: CMGetMessage(b, id, def, rc, CMFmtArgs2(...)). */
#define CMFmtSint(v)    CMPI_sint32, ((long int)(v))
#define CMFmtUint(v)    CMPI_uint32, ((unsigned long int)(v))
#define CMFmtSint64(v)  CMPI_sint64, ((long long int)(v))
#define CMFmtUint64(v)  CMPI_uint64, ((unsigned long long int)(v))
#define CMFmtReal(v)    CMPI_real64, ((double)(v))
#define CMFmtBoolean(v) CMPI_boolean, ((int)(v))
#define CMFmtChars(v)   CMPI_chars, ((char*)(v))
#define CMFmtString(v)  CMPI_string, ((CMPIString*)(v))
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
#define CMGetMessage(b, id, def, rc, parms) \
    ((b)->eft->getMessage((b), (id), (def), (rc), parms))
#define CMGetMessage2(b, id, msgFileHandle, def, rc, parms) \
    ((b)->eft->getMessage2((b), (id), (msgFileHandle), (def), (rc), parms))

/* ---- CMPIString -------------------------------------------------------- */
/* The broker keeps the characters behind hdl, which this shorthand relies on. */
#define CMGetCharPtr(st)         ((char*)(st)->hdl)
#define CMGetCharsPtr(st, rc)    ((st)->ft->getCharPtr((st), (rc)))

/* ---- CMPIArray --------------------------------------------------------- */
#define CMGetArraySize(ar, rc)          ((ar)->ft->getSize((ar), (rc)))
#define CMGetArrayType(ar, rc)          ((ar)->ft->getSimpleType((ar), (rc)))
#define CMGetArrayElementAt(ar, n, rc)  ((ar)->ft->getElementAt((ar), (n), (rc)))
#define CMSetArrayElementAt(ar, n, v, t) \
    ((ar)->ft->setElementAt((ar), (n), (const CMPIValue*)(v), (t)))

/* ---- CMPIEnumeration --------------------------------------------------- */
#define CMGetNext(en, rc) ((en)->ft->getNext((en), (rc)))
#define CMHasNext(en, rc) ((en)->ft->hasNext((en), (rc)))
#define CMToArray(en, rc) ((en)->ft->toArray((en), (rc)))

/* ---- CMPIInstance ------------------------------------------------------ */
/* Value arguments (setProperty, addKey, addArg, setElementAt, returnData, addEntry) point at a
 * variable of the named type, e.g. &u16 for CMPI_uint16 or &str for CMPI_string. CMPI_chars is
 * the exception CIMOMs make: the value pointer is the C string itself,
 * CMSetProperty(ci, "Name", "text", CMPI_chars). A NULL value sets a NULL of that type. */
#define CMGetProperty(inst, name, rc)          ((inst)->ft->getProperty((inst), (name), (rc)))
#define CMGetPropertyAt(inst, num, name, rc)   ((inst)->ft->getPropertyAt((inst), (num), (name), (rc)))
#define CMSetProperty(inst, name, value, type) \
    ((inst)->ft->setProperty((inst), (name), (const CMPIValue*)(value), (type)))
#define CMGetPropertyCount(inst, rc)           ((inst)->ft->getPropertyCount((inst), (rc)))
#define CMGetObjectPath(inst, rc)              ((inst)->ft->getObjectPath((inst), (rc)))
#define CMSetObjectPath(inst, op)              ((inst)->ft->setObjectPath((inst), (op)))
#define CMSetPropertyFilter(inst, props, keys) \
    ((inst)->ft->setPropertyFilter((inst), (props), (keys)))
#define CMSetPropertyWithOrigin(inst, name, value, type, origin) \
    ((inst)->ft->setPropertyWithOrigin((inst), (name), (const CMPIValue*)(value), (type), (origin)))

/* ---- CMPIObjectPath ---------------------------------------------------- */
#define CMSetHostname(op, hn)             ((op)->ft->setHostname((op), (hn)))
#define CMGetHostname(op, rc)             ((op)->ft->getHostname((op), (rc)))
#define CMSetNameSpace(op, ns)            ((op)->ft->setNameSpace((op), (ns)))
#define CMGetNameSpace(op, rc)            ((op)->ft->getNameSpace((op), (rc)))
#define CMSetClassName(op, cn)            ((op)->ft->setClassName((op), (cn)))
#define CMGetClassName(op, rc)            ((op)->ft->getClassName((op), (rc)))
#define CMAddKey(op, name, value, type) \
    ((op)->ft->addKey((op), (name), (const CMPIValue*)(value), (type)))
#define CMGetKey(op, name, rc)            ((op)->ft->getKey((op), (name), (rc)))
#define CMGetKeyAt(op, index, name, rc)   ((op)->ft->getKeyAt((op), (index), (name), (rc)))
#define CMGetKeyCount(op, rc)             ((op)->ft->getKeyCount((op), (rc)))
#define CMSetNameSpaceFromObjectPath(op, src) \
    ((op)->ft->setNameSpaceFromObjectPath((op), (src)))
#define CMSetHostAndNameSpaceFromObjectPath(op, src) \
    ((op)->ft->setHostAndNameSpaceFromObjectPath((op), (src)))
#define CMGetClassQualifier(op, qName, rc) \
    ((op)->ft->getClassQualifier((op), (qName), (rc)))
#define CMGetPropertyQualifier(op, pName, qName, rc) \
    ((op)->ft->getPropertyQualifier((op), (pName), (qName), (rc)))
#define CMGetMethodQualifier(op, methodName, qName, rc) \
    ((op)->ft->getMethodQualifier((op), (methodName), (qName), (rc)))
#define CMGetParameterQualifier(op, mName, pName, qName, rc) \
    ((op)->ft->getParameterQualifier((op), (mName), (pName), (qName), (rc)))
#define CMObjectPathToString(op, rc)      ((op)->ft->toString((op), (rc)))

/* ---- CMPIArgs ---------------------------------------------------------- */
#define CMAddArg(as, name, value, type) \
    ((as)->ft->addArg((as), (name), (const CMPIValue*)(value), (type)))
#define CMGetArg(as, name, rc)            ((as)->ft->getArg((as), (name), (rc)))
#define CMGetArgAt(as, index, name, rc)   ((as)->ft->getArgAt((as), (index), (name), (rc)))
#define CMGetArgCount(as, rc)             ((as)->ft->getArgCount((as), (rc)))

/* ---- CMPIDateTime ------------------------------------------------------ */
#define CMGetBinaryFormat(dt, rc) ((dt)->ft->getBinaryFormat((dt), (rc)))
#define CMGetStringFormat(dt, rc) ((dt)->ft->getStringFormat((dt), (rc)))
#define CMIsInterval(dt, rc)      ((dt)->ft->isInterval((dt), (rc)))

/* ---- CMPIContext ------------------------------------------------------- */
#define CMGetContextEntry(ctx, name, rc)          ((ctx)->ft->getEntry((ctx), (name), (rc)))
#define CMGetContextEntryAt(ctx, index, name, rc) ((ctx)->ft->getEntryAt((ctx), (index), (name), (rc)))
#define CMGetContextEntryCount(ctx, rc)           ((ctx)->ft->getEntryCount((ctx), (rc)))
#define CMAddContextEntry(ctx, name, value, type) \
    ((ctx)->ft->addEntry((ctx), (name), (const CMPIValue*)(value), (type)))

/* ---- CMPIResult -------------------------------------------------------- */
#define CMReturnData(rslt, value, type) \
    ((rslt)->ft->returnData((rslt), (const CMPIValue*)(value), (type)))
#define CMReturnInstance(rslt, inst)   ((rslt)->ft->returnInstance((rslt), (inst)))
#define CMReturnObjectPath(rslt, ref)  ((rslt)->ft->returnObjectPath((rslt), (ref)))
#define CMReturnDone(rslt)             ((rslt)->ft->returnDone((rslt)))
#define CMReturnError(rslt, er)        ((rslt)->ft->returnError((rslt), (er)))

/* ---- queries ----------------------------------------------------------- */
#define CMGetSelExpString(se, rc)             ((se)->ft->getString((se), (rc)))
#define CMEvaluateSelExp(se, inst, rc)        ((se)->ft->evaluate((se), (inst), (rc)))
#define CMEvaluateSelExpUsingAccessor(se, accessor, parm, rc) \
    ((se)->ft->evaluateUsingAccessor((se), (accessor), (parm), (rc)))
#define CMGetDoc(se, rc)                      ((se)->ft->getDOC((se), (rc)))
#define CMGetCod(se, rc)                      ((se)->ft->getCOD((se), (rc)))
#define CMGetSubCondCountAndType(sc, type, rc) ((sc)->ft->getCountAndType((sc), (type), (rc)))
#define CMGetSubCondAt(sc, index, rc)         ((sc)->ft->getSubCondAt((sc), (index), (rc)))
#define CMGetPredicateCount(sc, rc)           ((sc)->ft->getCount((sc), (rc)))
#define CMGetPredicateAt(sc, index, rc)       ((sc)->ft->getPredicateAt((sc), (index), (rc)))
#define CMGetPredicate(sc, name, rc)          ((sc)->ft->getPredicate((sc), (name), (rc)))
#define CMGetPredicateData(pr, type, op, lhs, rhs) \
    ((pr)->ft->getData((pr), (type), (op), (lhs), (rhs)))
#define CMEvaluatePredicateUsingAccessor(pr, accessor, parm, rc) \
    ((pr)->ft->evaluateUsingAccessor((pr), (accessor), (parm), (rc)))

/* ---- broker up-calls --------------------------------------------------- */
#define CBGetCapabilities(b)    ((b)->bft->brokerCapabilities)
#define CBGetClassification(b)  ((b)->bft->brokerCapabilities)
#define CBBrokerVersion(b)      ((b)->bft->brokerVersion)
#define CBBrokerName(b)         ((b)->bft->brokerName)

#define CBPrepareAttachThread(b, ctx) ((b)->bft->prepareAttachThread((b), (ctx)))
#define CBAttachThread(b, ctx)        ((b)->bft->attachThread((b), (ctx)))
#define CBDetachThread(b, ctx)        ((b)->bft->detachThread((b), (ctx)))
#define CBDeliverIndication(b, ctx, ns, ind) \
    ((b)->bft->deliverIndication((b), (ctx), (ns), (ind)))
#define CBEnumInstanceNames(b, ctx, op, rc) \
    ((b)->bft->enumerateInstanceNames((b), (ctx), (op), (rc)))
#define CBEnumInstances(b, ctx, op, props, rc) \
    ((b)->bft->enumerateInstances((b), (ctx), (op), (props), (rc)))
#define CBGetInstance(b, ctx, op, props, rc) \
    ((b)->bft->getInstance((b), (ctx), (op), (props), (rc)))
#define CBCreateInstance(b, ctx, op, inst, rc) \
    ((b)->bft->createInstance((b), (ctx), (op), (inst), (rc)))
#define CBModifyInstance(b, ctx, op, inst, props) \
    ((b)->bft->modifyInstance((b), (ctx), (op), (inst), (props)))
#define CBSetInstance(b, ctx, op, inst, props) CBModifyInstance(b, ctx, op, inst, props)
#define CBDeleteInstance(b, ctx, op) ((b)->bft->deleteInstance((b), (ctx), (op)))
#define CBExecQuery(b, ctx, op, query, lang, rc) \
    ((b)->bft->execQuery((b), (ctx), (op), (query), (lang), (rc)))
#define CBAssociators(b, ctx, op, assocClass, resultClass, role, resultRole, props, rc) \
    ((b)->bft->associators((b), (ctx), (op), (assocClass), (resultClass), (role), \
                           (resultRole), (props), (rc)))
#define CBAssociatorNames(b, ctx, op, assocClass, resultClass, role, resultRole, rc) \
    ((b)->bft->associatorNames((b), (ctx), (op), (assocClass), (resultClass), (role), \
                               (resultRole), (rc)))
#define CBReferences(b, ctx, op, resultClass, role, props, rc) \
    ((b)->bft->references((b), (ctx), (op), (resultClass), (role), (props), (rc)))
#define CBReferenceNames(b, ctx, op, resultClass, role, rc) \
    ((b)->bft->referenceNames((b), (ctx), (op), (resultClass), (role), (rc)))
#define CBInvokeMethod(b, ctx, op, method, in, out, rc) \
    ((b)->bft->invokeMethod((b), (ctx), (op), (method), (in), (out), (rc)))
#define CBSetProperty(b, ctx, op, name, value, type) \
    ((b)->bft->setProperty((b), (ctx), (op), (name), (const CMPIValue*)(value), (type)))
#define CBGetProperty(b, ctx, op, name, rc) \
    ((b)->bft->getProperty((b), (ctx), (op), (name), (rc)))

/* ---- memory enhancement services -------------------------------------- */
#define CBMemMark(b, rc)                ((b)->mft->mark((b), (rc)))
#define CBMemRelease(b, gc)             ((b)->mft->release((b), (gc)))
#define CBFreeInstance(b, inst)         ((b)->mft->freeInstance((b), (inst)))
#define CBFreeObjectPath(b, op)         ((b)->mft->freeObjectPath((b), (op)))
#define CBFreeArgs(b, as)               ((b)->mft->freeArgs((b), (as)))
#define CBFreeString(b, st)             ((b)->mft->freeString((b), (st)))
#define CBFreeArray(b, ar)              ((b)->mft->freeArray((b), (ar)))
#define CBFreeDateTime(b, dt)           ((b)->mft->freeDateTime((b), (dt)))
#define CBFreeSelectExp(b, se)          ((b)->mft->freeSelectExp((b), (se)))

/* ======================================================================= */
/* MI factory stubs. The MI functions are named <pfx><Operation>; the       */
/* factory is <pn>_Create_<Kind>MI; hook runs with `mi` and `ctx` in scope. */
/* ======================================================================= */

#define CMNoHook

#define CMInstanceMIStub(pfx, pn, broker, hook) \
    static CMPIInstanceMIFT instMIFT__ = { \
        CMPICurrentVersion, CMPICurrentVersion, "instance" #pn, \
        pfx##Cleanup, pfx##EnumInstanceNames, pfx##EnumInstances, pfx##GetInstance, \
        pfx##CreateInstance, pfx##ModifyInstance, pfx##DeleteInstance, pfx##ExecQuery }; \
    CMPI_EXTERN_C CMPI_EXPORT CMPIInstanceMI* pn##_Create_InstanceMI( \
        const CMPIBroker* brkr, const CMPIContext* ctx, CMPIStatus* rc) { \
        static CMPIInstanceMI mi = { NULL, &instMIFT__ }; \
        (void)ctx; (void)rc; \
        broker = brkr; \
        hook; \
        return &mi; \
    }

#define CMAssociationMIStub(pfx, pn, broker, hook) \
    static CMPIAssociationMIFT assocMIFT__ = { \
        CMPICurrentVersion, CMPICurrentVersion, "association" #pn, \
        pfx##AssociationCleanup, pfx##Associators, pfx##AssociatorNames, \
        pfx##References, pfx##ReferenceNames }; \
    CMPI_EXTERN_C CMPI_EXPORT CMPIAssociationMI* pn##_Create_AssociationMI( \
        const CMPIBroker* brkr, const CMPIContext* ctx, CMPIStatus* rc) { \
        static CMPIAssociationMI mi = { NULL, &assocMIFT__ }; \
        (void)ctx; (void)rc; \
        broker = brkr; \
        hook; \
        return &mi; \
    }

#define CMMethodMIStub(pfx, pn, broker, hook) \
    static CMPIMethodMIFT methMIFT__ = { \
        CMPICurrentVersion, CMPICurrentVersion, "method" #pn, \
        pfx##MethodCleanup, pfx##InvokeMethod }; \
    CMPI_EXTERN_C CMPI_EXPORT CMPIMethodMI* pn##_Create_MethodMI( \
        const CMPIBroker* brkr, const CMPIContext* ctx, CMPIStatus* rc) { \
        static CMPIMethodMI mi = { NULL, &methMIFT__ }; \
        (void)ctx; (void)rc; \
        broker = brkr; \
        hook; \
        return &mi; \
    }

#define CMPropertyMIStub(pfx, pn, broker, hook) \
    static CMPIPropertyMIFT propMIFT__ = { \
        CMPICurrentVersion, CMPICurrentVersion, "property" #pn, \
        pfx##PropertyCleanup, pfx##SetProperty, pfx##GetProperty, \
        pfx##SetPropertyWithOrigin }; \
    CMPI_EXTERN_C CMPI_EXPORT CMPIPropertyMI* pn##_Create_PropertyMI( \
        const CMPIBroker* brkr, const CMPIContext* ctx, CMPIStatus* rc) { \
        static CMPIPropertyMI mi = { NULL, &propMIFT__ }; \
        (void)ctx; (void)rc; \
        broker = brkr; \
        hook; \
        return &mi; \
    }

#define CMIndicationMIStub(pfx, pn, broker, hook) \
    static CMPIIndicationMIFT indMIFT__ = { \
        CMPICurrentVersion, CMPICurrentVersion, "Indication" #pn, \
        pfx##IndicationCleanup, pfx##AuthorizeFilter, pfx##MustPoll, \
        pfx##ActivateFilter, pfx##DeActivateFilter, \
        pfx##EnableIndications, pfx##DisableIndications }; \
    CMPI_EXTERN_C CMPI_EXPORT CMPIIndicationMI* pn##_Create_IndicationMI( \
        const CMPIBroker* brkr, const CMPIContext* ctx, CMPIStatus* rc) { \
        static CMPIIndicationMI mi = { NULL, &indMIFT__ }; \
        (void)ctx; (void)rc; \
        broker = brkr; \
        hook; \
        return &mi; \
    }

#endif /* _CMPIMACS_H_ */
