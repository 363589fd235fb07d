/*
 * Macro form of the status helpers and of all table calls; cmpimacs.h includes it with
 * CMPI_NO_INLINE. The object or broker argument is evaluated twice. Where a call takes a value, any
 * pointer will do: it is cast to CMPIValue *.
 */
#ifndef _CMPIMACS_MACRO_H_
#define _CMPIMACS_MACRO_H_

#include "cmpift.h"

#define CMSetStatus(st, code)         \
    do {                              \
        CMPIStatus* cmStatus_ = (st); \
        if (cmStatus_ != NULL) {      \
            cmStatus_->rc = (code);   \
            cmStatus_->msg = NULL;    \
        }                             \
    } while (0)

#define CMSetStatusWithString(st, code, string) \
    do {                                        \
        CMPIStatus* cmStatus_ = (st);           \
        if (cmStatus_ != NULL) {                \
            cmStatus_->rc = (code);             \
            cmStatus_->msg = (string);          \
        }                                       \
    } while (0)

/* Without a broker the message is NULL. */
#define CMSetStatusWithChars(broker, st, code, text)                                           \
    do {                                                                                       \
        CMPIStatus* cmStatus_ = (st);                                                          \
        const CMPIBroker* cmBroker_ = (broker);                                                \
        if (cmStatus_ != NULL) {                                                               \
            cmStatus_->rc = (code);                                                            \
            cmStatus_->msg =                                                                   \
                cmBroker_ != NULL ? cmBroker_->eft->newString(cmBroker_, (text), NULL) : NULL; \
        }                                                                                      \
    } while (0)

#define CMIsNullObject(object) ((CMPIBoolean)((object) == NULL))

/* The flags lie above the low byte, so they are compared before they become a CMPIBoolean. */
#define CMIsNullValue(data) ((CMPIBoolean)(((data).state & CMPI_nullValue) != 0))
#define CMIsKeyValue(data) ((CMPIBoolean)(((data).state & CMPI_keyValue) != 0))
#define CMIsArray(data) ((CMPIBoolean)(((data).type & CMPI_ARRAY) != 0))

#define CMGetCharPtr(string) ((string)->ft->getCharPtr((string), NULL))

#define CBGetCapabilities(broker) ((broker)->bft->brokerCapabilities)
#define CBBrokerVersion(broker) ((broker)->bft->brokerVersion)
#define CBBrokerName(broker) ((broker)->bft->brokerName)

/* CMPIContextFT */
#define CMGetContextEntry(ctx, name, status) ((ctx)->ft->getEntry((ctx), (name), (status)))
#define CMGetContextEntryAt(ctx, index, name, status) \
    ((ctx)->ft->getEntryAt((ctx), (index), (name), (status)))
#define CMGetContextEntryCount(ctx, status) ((ctx)->ft->getEntryCount((ctx), (status)))
#define CMAddContextEntry(ctx, name, value, type) \
    ((ctx)->ft->addEntry((ctx), (name), (CMPIValue*)(value), (type)))

/* CMPIResultFT */
#define CMReturnData(result, value, type) \
    ((result)->ft->returnData((result), (CMPIValue*)(value), (type)))
#define CMReturnInstance(result, instance) ((result)->ft->returnInstance((result), (instance)))
#define CMReturnObjectPath(result, path) ((result)->ft->returnObjectPath((result), (path)))
#define CMReturnDone(result) ((result)->ft->returnDone((result)))

#ifdef CMPI_VER_200

#define CMReturnError(result, error) ((result)->ft->returnError((result), (error)))
#endif

/* CMPIStringFT */
#define CMGetCharsPtr(string, status) ((string)->ft->getCharPtr((string), (status)))

#ifdef CMPI_VER_210

#define CMNewCharsCP(string, codepage, status) \
    ((string)->ft->newCharsCP((string), (codepage), (status)))
#endif

/* CMPIArrayFT */
#define CMGetArrayCount(array, status) ((array)->ft->getSize((array), (status)))
#define CMGetArrayType(array, status) ((array)->ft->getSimpleType((array), (status)))
#define CMGetArrayElementAt(array, index, status) \
    ((array)->ft->getElementAt((array), (index), (status)))
#define CMSetArrayElementAt(array, index, value, type) \
    ((array)->ft->setElementAt((array), (index), (CMPIValue*)(value), (type)))

/* CMPIEnumerationFT */
#define CMGetNext(enumeration, status) ((enumeration)->ft->getNext((enumeration), (status)))
#define CMHasNext(enumeration, status) ((enumeration)->ft->hasNext((enumeration), (status)))
#define CMToArray(enumeration, status) ((enumeration)->ft->toArray((enumeration), (status)))

/* CMPIInstanceFT */
#define CMGetProperty(instance, name, status) \
    ((instance)->ft->getProperty((instance), (name), (status)))
#define CMGetPropertyAt(instance, index, name, status) \
    ((instance)->ft->getPropertyAt((instance), (index), (name), (status)))
#define CMGetPropertyCount(instance, status) \
    ((instance)->ft->getPropertyCount((instance), (status)))
#define CMSetProperty(instance, name, value, type) \
    ((instance)->ft->setProperty((instance), (name), (CMPIValue*)(value), (type)))
#define CMGetObjectPath(instance, status) ((instance)->ft->getObjectPath((instance), (status)))
#define CMSetPropertyFilter(instance, properties, keys) \
    ((instance)->ft->setPropertyFilter((instance), (properties), (keys)))
#define CMSetObjectPath(instance, path) ((instance)->ft->setObjectPath((instance), (path)))

#ifdef CMPI_VER_200

#define CMSetPropertyWithOrigin(instance, name, value, type, origin)                        \
    ((instance)->ft->setPropertyWithOrigin((instance), (name), (CMPIValue*)(value), (type), \
                                           (origin)))
#endif

/* CMPIObjectPathFT */
#define CMSetNameSpace(path, nameSpace) ((path)->ft->setNameSpace((path), (nameSpace)))
#define CMGetNameSpace(path, status) ((path)->ft->getNameSpace((path), (status)))
#define CMSetHostname(path, host) ((path)->ft->setHostname((path), (host)))
#define CMGetHostname(path, status) ((path)->ft->getHostname((path), (status)))
#define CMSetClassName(path, className) ((path)->ft->setClassName((path), (className)))
#define CMGetClassName(path, status) ((path)->ft->getClassName((path), (status)))
#define CMAddKey(path, key, value, type) \
    ((path)->ft->addKey((path), (key), (CMPIValue*)(value), (type)))
#define CMGetKey(path, key, status) ((path)->ft->getKey((path), (key), (status)))
#define CMGetKeyAt(path, index, name, status) \
    ((path)->ft->getKeyAt((path), (index), (name), (status)))
#define CMGetKeyCount(path, status) ((path)->ft->getKeyCount((path), (status)))
#define CMSetNameSpaceFromObjectPath(path, source) \
    ((path)->ft->setNameSpaceFromObjectPath((path), (source)))
#define CMSetHostAndNameSpaceFromObjectPath(path, source) \
    ((path)->ft->setHostAndNameSpaceFromObjectPath((path), (source)))
#define CMGetClassQualifier(path, qualifier, status) \
    ((path)->ft->getClassQualifier((path), (qualifier), (status)))
#define CMGetPropertyQualifier(path, name, qualifier, status) \
    ((path)->ft->getPropertyQualifier((path), (name), (qualifier), (status)))
#define CMGetMethodQualifier(path, method, qualifier, status) \
    ((path)->ft->getMethodQualifier((path), (method), (qualifier), (status)))
#define CMGetParameterQualifier(path, method, name, qualifier, status) \
    ((path)->ft->getParameterQualifier((path), (method), (name), (qualifier), (status)))

/* CMPIArgsFT */
#define CMAddArg(args, name, value, type) \
    ((args)->ft->addArg((args), (name), (CMPIValue*)(value), (type)))
#define CMGetArg(args, name, status) ((args)->ft->getArg((args), (name), (status)))
#define CMGetArgAt(args, index, name, status) \
    ((args)->ft->getArgAt((args), (index), (name), (status)))
#define CMGetArgCount(args, status) ((args)->ft->getArgCount((args), (status)))

/* CMPIDateTimeFT */
#define CMGetBinaryFormat(dateTime, status) ((dateTime)->ft->getBinaryFormat((dateTime), (status)))
#define CMGetStringFormat(dateTime, status) ((dateTime)->ft->getStringFormat((dateTime), (status)))
#define CMIsInterval(dateTime, status) ((dateTime)->ft->isInterval((dateTime), (status)))

/* CMPISelectExpFT */
#define CMEvaluateSelExp(exp, instance, status) ((exp)->ft->evaluate((exp), (instance), (status)))
#define CMGetSelExpString(exp, status) ((exp)->ft->getString((exp), (status)))
#define CMGetDoc(exp, status) ((exp)->ft->getDOC((exp), (status)))
#define CMGetCod(exp, status) ((exp)->ft->getCOD((exp), (status)))
#define CMEvaluateSelExpUsingAccessor(exp, accessor, opaque, status) \
    ((exp)->ft->evaluateUsingAccessor((exp), (accessor), (opaque), (status)))

/* CMPISelectCondFT */
#define CMGetSubCondCountAndType(condition, kind, status) \
    ((condition)->ft->getCountAndType((condition), (kind), (status)))
#define CMGetSubCondAt(condition, index, status) \
    ((condition)->ft->getSubCondAt((condition), (index), (status)))

/* CMPISubCondFT */
#define CMGetPredicateCount(condition, status) ((condition)->ft->getCount((condition), (status)))
#define CMGetPredicateAt(condition, index, status) \
    ((condition)->ft->getPredicateAt((condition), (index), (status)))
#define CMGetPredicate(condition, name, status) \
    ((condition)->ft->getPredicate((condition), (name), (status)))

/* CMPIPredicateFT */
#define CMGetPredicateData(predicate, type, op, lhs, rhs) \
    ((predicate)->ft->getData((predicate), (type), (op), (lhs), (rhs)))
#define CMEvaluatePredicateUsingAccessor(predicate, accessor, opaque, status) \
    ((predicate)->ft->evaluateUsingAccessor((predicate), (accessor), (opaque), (status)))

#ifdef CMPI_VER_200

/* CMPIErrorFT */
#define CMGetErrorType(error, status) ((error)->ft->getErrorType((error), (status)))
#define CMGetOtherErrorType(error, status) ((error)->ft->getOtherErrorType((error), (status)))
#define CMGetOwningEntity(error, status) ((error)->ft->getOwningEntity((error), (status)))
#define CMGetMessageID(error, status) ((error)->ft->getMessageID((error), (status)))
#define CMGetErrorMessage(error, status) ((error)->ft->getMessage((error), (status)))
#define CMGetPerceivedSeverity(error, status) ((error)->ft->getPerceivedSeverity((error), (status)))
#define CMGetProbableCause(error, status) ((error)->ft->getProbableCause((error), (status)))
#define CMGetProbableCauseDescription(error, status) \
    ((error)->ft->getProbableCauseDescription((error), (status)))
#define CMGetRecommendedActions(error, status) \
    ((error)->ft->getRecommendedActions((error), (status)))
#define CMGetErrorSource(error, status) ((error)->ft->getErrorSource((error), (status)))
#define CMGetErrorSourceFormat(error, status) ((error)->ft->getErrorSourceFormat((error), (status)))
#define CMGetOtherErrorSourceFormat(error, status) \
    ((error)->ft->getOtherErrorSourceFormat((error), (status)))
#define CMGetCIMStatusCode(error, status) ((error)->ft->getCIMStatusCode((error), (status)))
#define CMGetCIMStatusCodeDescription(error, status) \
    ((error)->ft->getCIMStatusCodeDescription((error), (status)))
#define CMGetMessageArguments(error, status) ((error)->ft->getMessageArguments((error), (status)))
#define CMSetErrorType(error, type) ((error)->ft->setErrorType((error), (type)))
#define CMSetOtherErrorType(error, text) ((error)->ft->setOtherErrorType((error), (text)))
#define CMSetProbableCauseDescription(error, text) \
    ((error)->ft->setProbableCauseDescription((error), (text)))
#define CMSetRecommendedActions(error, actions) \
    ((error)->ft->setRecommendedActions((error), (actions)))
#define CMSetErrorSource(error, source) ((error)->ft->setErrorSource((error), (source)))
#define CMSetErrorSourceFormat(error, format) ((error)->ft->setErrorSourceFormat((error), (format)))
#define CMSetOtherErrorSourceFormat(error, text) \
    ((error)->ft->setOtherErrorSourceFormat((error), (text)))
#define CMSetCIMStatusCodeDescription(error, text) \
    ((error)->ft->setCIMStatusCodeDescription((error), (text)))
#define CMSetMessageArguments(error, args) ((error)->ft->setMessageArguments((error), (args)))
#endif

#ifdef CMPI_VER_210

/* CMPIPropertyListFT */
#define CMIsPropertyInList(list, name, status) \
    ((list)->ft->isPropertyInList((list), (name), (status)))
#define CMGetListProperties(list, status) ((list)->ft->getProperties((list), (status)))

/* CMPIEnumerationFilterFT */
#define CMFilterMatch(filter, instance, status) \
    ((filter)->ft->match((filter), (instance), (status)))
#endif

/* CMPIBrokerFT */
#define CBPrepareAttachThread(broker, ctx) ((broker)->bft->prepareAttachThread((broker), (ctx)))
#define CBAttachThread(broker, ctx) ((broker)->bft->attachThread((broker), (ctx)))
#define CBDetachThread(broker, ctx) ((broker)->bft->detachThread((broker), (ctx)))
#define CBDeliverIndication(broker, ctx, nameSpace, indication) \
    ((broker)->bft->deliverIndication((broker), (ctx), (nameSpace), (indication)))
#define CBEnumInstanceNames(broker, ctx, classPath, status) \
    ((broker)->bft->enumerateInstanceNames((broker), (ctx), (classPath), (status)))
#define CBEnumInstances(broker, ctx, classPath, properties, status) \
    ((broker)->bft->enumerateInstances((broker), (ctx), (classPath), (properties), (status)))
#define CBGetInstance(broker, ctx, path, properties, status) \
    ((broker)->bft->getInstance((broker), (ctx), (path), (properties), (status)))
#define CBCreateInstance(broker, ctx, classPath, instance, status) \
    ((broker)->bft->createInstance((broker), (ctx), (classPath), (instance), (status)))
#define CBModifyInstance(broker, ctx, path, instance, properties) \
    ((broker)->bft->modifyInstance((broker), (ctx), (path), (instance), (properties)))
#define CBDeleteInstance(broker, ctx, path) ((broker)->bft->deleteInstance((broker), (ctx), (path)))
#define CBExecQuery(broker, ctx, classPath, query, language, status) \
    ((broker)->bft->execQuery((broker), (ctx), (classPath), (query), (language), (status)))
#define CBAssociators(broker, ctx, path, assocClass, resultClass, role, resultRole, properties, \
                      status)                                                                   \
    ((broker)->bft->associators((broker), (ctx), (path), (assocClass), (resultClass), (role),   \
                                (resultRole), (properties), (status)))
#define CBAssociatorNames(broker, ctx, path, assocClass, resultClass, role, resultRole, status)   \
    ((broker)->bft->associatorNames((broker), (ctx), (path), (assocClass), (resultClass), (role), \
                                    (resultRole), (status)))
#define CBReferences(broker, ctx, path, resultClass, role, properties, status)               \
    ((broker)->bft->references((broker), (ctx), (path), (resultClass), (role), (properties), \
                               (status)))
#define CBReferenceNames(broker, ctx, path, resultClass, role, status) \
    ((broker)->bft->referenceNames((broker), (ctx), (path), (resultClass), (role), (status)))
#define CBInvokeMethod(broker, ctx, path, method, in, out, status) \
    ((broker)->bft->invokeMethod((broker), (ctx), (path), (method), (in), (out), (status)))
#define CBSetProperty(broker, ctx, path, name, value, type) \
    ((broker)->bft->setProperty((broker), (ctx), (path), (name), (CMPIValue*)(value), (type)))
#define CBGetProperty(broker, ctx, path, name, status) \
    ((broker)->bft->getProperty((broker), (ctx), (path), (name), (status)))

#ifdef CMPI_VER_210

#define CBEnumInstancesFiltered(broker, ctx, classPath, properties, filterLanguage, filterText, \
                                status)                                                         \
    ((broker)->bft->enumerateInstancesFiltered((broker), (ctx), (classPath), (properties),      \
                                               (filterLanguage), (filterText), (status)))
#define CBAssociatorsFiltered(broker, ctx, path, assocClass, resultClass, role, resultRole,   \
                              properties, filterLanguage, filterText, status)                 \
    ((broker)->bft->associatorsFiltered((broker), (ctx), (path), (assocClass), (resultClass), \
                                        (role), (resultRole), (properties), (filterLanguage), \
                                        (filterText), (status)))
#define CBReferencesFiltered(broker, ctx, path, resultClass, role, properties, filterLanguage, \
                             filterText, status)                                               \
    ((broker)->bft->referencesFiltered((broker), (ctx), (path), (resultClass), (role),         \
                                       (properties), (filterLanguage), (filterText), (status)))
#endif

/* CMPIBrokerEncFT */
#define CMNewInstance(broker, path, status) ((broker)->eft->newInstance((broker), (path), (status)))
#define CMNewObjectPath(broker, nameSpace, className, status) \
    ((broker)->eft->newObjectPath((broker), (nameSpace), (className), (status)))
#define CMNewArgs(broker, status) ((broker)->eft->newArgs((broker), (status)))
#define CMNewString(broker, text, status) ((broker)->eft->newString((broker), (text), (status)))
#define CMNewArray(broker, count, type, status) \
    ((broker)->eft->newArray((broker), (count), (type), (status)))
#define CMNewDateTime(broker, status) ((broker)->eft->newDateTime((broker), (status)))
#define CMNewDateTimeFromBinary(broker, microseconds, interval, status) \
    ((broker)->eft->newDateTimeFromBinary((broker), (microseconds), (interval), (status)))
#define CMNewDateTimeFromChars(broker, text, status) \
    ((broker)->eft->newDateTimeFromChars((broker), (text), (status)))
#define CMNewSelectExp(broker, query, language, projection, status) \
    ((broker)->eft->newSelectExp((broker), (query), (language), (projection), (status)))

#ifdef CMPI_VER_200

#define CMNewCMPIError(broker, owner, messageId, text, severity, cause, code, status)         \
    ((broker)->eft->newCMPIError((broker), (owner), (messageId), (text), (severity), (cause), \
                                 (code), (status)))
#endif

#ifdef CMPI_VER_210

#define CMNewPropertyList(broker, properties, status) \
    ((broker)->eft->newPropertyList((broker), (properties), (status)))
#define CMNewStringCP(broker, text, codepage, status) \
    ((broker)->eft->newStringCP((broker), (text), (codepage), (status)))
#define CMNewEnumerationFilter(broker, filterLanguage, filterText, status) \
    ((broker)->eft->newEnumerationFilter((broker), (filterLanguage), (filterText), (status)))
#endif

#define CMClassPathIsA(broker, classPath, className, status) \
    ((broker)->eft->classPathIsA((broker), (classPath), (className), (status)))
#define CDToString(broker, object, status) ((broker)->eft->toString((broker), (object), (status)))
#define CDIsOfType(broker, object, typeName, status) \
    ((broker)->eft->isOfType((broker), (object), (typeName), (status)))
#define CDGetType(broker, object, status) ((broker)->eft->getType((broker), (object), (status)))
#define CMLogMessage(broker, severity, messageId, text, string) \
    ((broker)->eft->logMessage((broker), (severity), (messageId), (text), (string)))
#define CMTraceMessage(broker, level, component, text, string) \
    ((broker)->eft->trace((broker), (level), (component), (text), (string)))

#ifdef CMPI_VER_200

#define CMOpenMessageFile(broker, file, handle) \
    ((broker)->eft->openMessageFile((broker), (file), (handle)))
#define CMCloseMessageFile(broker, handle) ((broker)->eft->closeMessageFile((broker), (handle)))
#endif

#ifdef CMPI_VER_210

/* CMPIBrokerMemFT */
#define CMMemMark(broker, status) ((broker)->mft->mark((broker), (status)))
#define CMMemRelease(broker, mark) ((broker)->mft->release((broker), (mark)))
#define CMMalloc(broker, bytes) ((broker)->mft->cmpiMalloc((broker), (bytes)))
#define CMCalloc(broker, count, size) ((broker)->mft->cmpiCalloc((broker), (count), (size)))
#define CMRealloc(broker, memory, bytes) ((broker)->mft->cmpiRealloc((broker), (memory), (bytes)))
#define CMStrDup(broker, text) ((broker)->mft->cmpiStrDup((broker), (text)))
#define CMFree(broker, memory) ((broker)->mft->cmpiFree((broker), (memory)))
#define CMFreeInstance(broker, instance) ((broker)->mft->freeInstance((broker), (instance)))
#define CMFreeObjectPath(broker, path) ((broker)->mft->freeObjectPath((broker), (path)))
#define CMFreeArgs(broker, args) ((broker)->mft->freeArgs((broker), (args)))
#define CMFreeString(broker, string) ((broker)->mft->freeString((broker), (string)))
#define CMFreeArray(broker, array) ((broker)->mft->freeArray((broker), (array)))
#define CMFreeDateTime(broker, dateTime) ((broker)->mft->freeDateTime((broker), (dateTime)))
#define CMFreeSelectExp(broker, exp) ((broker)->mft->freeSelectExp((broker), (exp)))
#define CMFreeChars(broker, text) ((broker)->mft->freeChars((broker), (text)))
#endif

#endif /* _CMPIMACS_MACRO_H_ */
