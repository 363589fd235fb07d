/*
 * Inline form of the status helpers and of the calls on encapsulated objects; included by
 * cmpimacs.h. Each forwarder makes one table call with its arguments unchanged; rules and errors
 * are those of the entry.
 */
#ifndef _CMPIMACS_INLINE_OBJECTS_H_
#define _CMPIMACS_INLINE_OBJECTS_H_

#include "cmpift.h"

#ifdef __cplusplus
extern "C" {
#endif

/* Sets a status without message; does nothing when st is NULL. */
static inline void CMSetStatus(CMPIStatus* st, CMPIrc code) {
    if (st != NULL) {
        st->rc = code;
        st->msg = NULL;
    }
}

/* Sets a status with a message, which stays the manager's. */
static inline void CMSetStatusWithString(CMPIStatus* st, CMPIrc code, CMPIString* string) {
    if (st != NULL) {
        st->rc = code;
        st->msg = string;
    }
}

/* The same with a text; without a broker the message is NULL. */
static inline void CMSetStatusWithChars(const CMPIBroker* broker, CMPIStatus* st, CMPIrc code,
                                        const char* text) {
    if (st != NULL) {
        st->rc = code;
        st->msg = broker != NULL ? broker->eft->newString(broker, text, NULL) : NULL;
    }
}

static inline CMPIBoolean CMIsNullObject(const void* object) {
    return object == NULL;
}

/* The flags lie above the low byte, so they are compared before they become a CMPIBoolean. */
static inline CMPIBoolean CMIsNullValue(CMPIData data) {
    return (data.state & CMPI_nullValue) != 0;
}

static inline CMPIBoolean CMIsKeyValue(CMPIData data) {
    return (data.state & CMPI_keyValue) != 0;
}

static inline CMPIBoolean CMIsArray(CMPIData data) {
    return (data.type & CMPI_ARRAY) != 0;
}

/* The characters of a string when the status does not matter. */
static inline const char* CMGetCharPtr(const CMPIString* string) {
    return string->ft->getCharPtr(string, NULL);
}

/* CMPIContextFT */

static inline CMPIData CMGetContextEntry(const CMPIContext* ctx, const char* name,
                                         CMPIStatus* status) {
    return ctx->ft->getEntry(ctx, name, status);
}

static inline CMPIData CMGetContextEntryAt(const CMPIContext* ctx, CMPICount index,
                                           CMPIString** name, CMPIStatus* status) {
    return ctx->ft->getEntryAt(ctx, index, name, status);
}

static inline CMPICount CMGetContextEntryCount(const CMPIContext* ctx, CMPIStatus* status) {
    return ctx->ft->getEntryCount(ctx, status);
}

static inline CMPIStatus CMAddContextEntry(const CMPIContext* ctx, const char* name,
                                           const CMPIValue* value, CMPIType type) {
    return ctx->ft->addEntry(ctx, name, value, type);
}

/* CMPIResultFT */

static inline CMPIStatus CMReturnData(const CMPIResult* result, const CMPIValue* value,
                                      CMPIType type) {
    return result->ft->returnData(result, value, type);
}

static inline CMPIStatus CMReturnInstance(const CMPIResult* result, const CMPIInstance* instance) {
    return result->ft->returnInstance(result, instance);
}

static inline CMPIStatus CMReturnObjectPath(const CMPIResult* result, const CMPIObjectPath* path) {
    return result->ft->returnObjectPath(result, path);
}

static inline CMPIStatus CMReturnDone(const CMPIResult* result) {
    return result->ft->returnDone(result);
}

#ifdef CMPI_VER_200

static inline CMPIStatus CMReturnError(const CMPIResult* result, const CMPIError* error) {
    return result->ft->returnError(result, error);
}

#endif

/* CMPIStringFT */

static inline const char* CMGetCharsPtr(const CMPIString* string, CMPIStatus* status) {
    return string->ft->getCharPtr(string, status);
}

#ifdef CMPI_VER_210

static inline char* CMNewCharsCP(const CMPIString* string, CMPICodepageID codepage,
                                 CMPIStatus* status) {
    return string->ft->newCharsCP(string, codepage, status);
}

#endif

/* CMPIArrayFT */

static inline CMPICount CMGetArrayCount(const CMPIArray* array, CMPIStatus* status) {
    return array->ft->getSize(array, status);
}

static inline CMPIType CMGetArrayType(const CMPIArray* array, CMPIStatus* status) {
    return array->ft->getSimpleType(array, status);
}

static inline CMPIData CMGetArrayElementAt(const CMPIArray* array, CMPICount index,
                                           CMPIStatus* status) {
    return array->ft->getElementAt(array, index, status);
}

static inline CMPIStatus CMSetArrayElementAt(const CMPIArray* array, CMPICount index,
                                             const CMPIValue* value, CMPIType type) {
    return array->ft->setElementAt(array, index, value, type);
}

/* CMPIEnumerationFT */

static inline CMPIData CMGetNext(const CMPIEnumeration* enumeration, CMPIStatus* status) {
    return enumeration->ft->getNext(enumeration, status);
}

static inline CMPIBoolean CMHasNext(const CMPIEnumeration* enumeration, CMPIStatus* status) {
    return enumeration->ft->hasNext(enumeration, status);
}

static inline CMPIArray* CMToArray(const CMPIEnumeration* enumeration, CMPIStatus* status) {
    return enumeration->ft->toArray(enumeration, status);
}

/* CMPIInstanceFT */

static inline CMPIData CMGetProperty(const CMPIInstance* instance, const char* name,
                                     CMPIStatus* status) {
    return instance->ft->getProperty(instance, name, status);
}

static inline CMPIData CMGetPropertyAt(const CMPIInstance* instance, CMPICount index,
                                       CMPIString** name, CMPIStatus* status) {
    return instance->ft->getPropertyAt(instance, index, name, status);
}

static inline CMPICount CMGetPropertyCount(const CMPIInstance* instance, CMPIStatus* status) {
    return instance->ft->getPropertyCount(instance, status);
}

static inline CMPIStatus CMSetProperty(const CMPIInstance* instance, const char* name,
                                       const CMPIValue* value, CMPIType type) {
    return instance->ft->setProperty(instance, name, value, type);
}

static inline CMPIObjectPath* CMGetObjectPath(const CMPIInstance* instance, CMPIStatus* status) {
    return instance->ft->getObjectPath(instance, status);
}

static inline CMPIStatus CMSetPropertyFilter(const CMPIInstance* instance, const char** properties,
                                             const char** keys) {
    return instance->ft->setPropertyFilter(instance, properties, keys);
}

static inline CMPIStatus CMSetObjectPath(const CMPIInstance* instance, const CMPIObjectPath* path) {
    return instance->ft->setObjectPath(instance, path);
}

#ifdef CMPI_VER_200

static inline CMPIStatus CMSetPropertyWithOrigin(const CMPIInstance* instance, const char* name,
                                                 const CMPIValue* value, CMPIType type,
                                                 const char* origin) {
    return instance->ft->setPropertyWithOrigin(instance, name, value, type, origin);
}

#endif

/* CMPIObjectPathFT */

static inline CMPIStatus CMSetNameSpace(const CMPIObjectPath* path, const char* nameSpace) {
    return path->ft->setNameSpace(path, nameSpace);
}

static inline CMPIString* CMGetNameSpace(const CMPIObjectPath* path, CMPIStatus* status) {
    return path->ft->getNameSpace(path, status);
}

static inline CMPIStatus CMSetHostname(const CMPIObjectPath* path, const char* host) {
    return path->ft->setHostname(path, host);
}

static inline CMPIString* CMGetHostname(const CMPIObjectPath* path, CMPIStatus* status) {
    return path->ft->getHostname(path, status);
}

static inline CMPIStatus CMSetClassName(const CMPIObjectPath* path, const char* className) {
    return path->ft->setClassName(path, className);
}

static inline CMPIString* CMGetClassName(const CMPIObjectPath* path, CMPIStatus* status) {
    return path->ft->getClassName(path, status);
}

static inline CMPIStatus CMAddKey(const CMPIObjectPath* path, const char* key,
                                  const CMPIValue* value, CMPIType type) {
    return path->ft->addKey(path, key, value, type);
}

static inline CMPIData CMGetKey(const CMPIObjectPath* path, const char* key, CMPIStatus* status) {
    return path->ft->getKey(path, key, status);
}

static inline CMPIData CMGetKeyAt(const CMPIObjectPath* path, CMPICount index, CMPIString** name,
                                  CMPIStatus* status) {
    return path->ft->getKeyAt(path, index, name, status);
}

static inline CMPICount CMGetKeyCount(const CMPIObjectPath* path, CMPIStatus* status) {
    return path->ft->getKeyCount(path, status);
}

static inline CMPIStatus CMSetNameSpaceFromObjectPath(const CMPIObjectPath* path,
                                                      const CMPIObjectPath* source) {
    return path->ft->setNameSpaceFromObjectPath(path, source);
}

static inline CMPIStatus CMSetHostAndNameSpaceFromObjectPath(const CMPIObjectPath* path,
                                                             const CMPIObjectPath* source) {
    return path->ft->setHostAndNameSpaceFromObjectPath(path, source);
}

static inline CMPIData CMGetClassQualifier(const CMPIObjectPath* path, const char* qualifier,
                                           CMPIStatus* status) {
    return path->ft->getClassQualifier(path, qualifier, status);
}

static inline CMPIData CMGetPropertyQualifier(const CMPIObjectPath* path, const char* name,
                                              const char* qualifier, CMPIStatus* status) {
    return path->ft->getPropertyQualifier(path, name, qualifier, status);
}

static inline CMPIData CMGetMethodQualifier(const CMPIObjectPath* path, const char* method,
                                            const char* qualifier, CMPIStatus* status) {
    return path->ft->getMethodQualifier(path, method, qualifier, status);
}

static inline CMPIData CMGetParameterQualifier(const CMPIObjectPath* path, const char* method,
                                               const char* name, const char* qualifier,
                                               CMPIStatus* status) {
    return path->ft->getParameterQualifier(path, method, name, qualifier, status);
}

/* CMPIArgsFT */

static inline CMPIStatus CMAddArg(const CMPIArgs* args, const char* name, const CMPIValue* value,
                                  CMPIType type) {
    return args->ft->addArg(args, name, value, type);
}

static inline CMPIData CMGetArg(const CMPIArgs* args, const char* name, CMPIStatus* status) {
    return args->ft->getArg(args, name, status);
}

static inline CMPIData CMGetArgAt(const CMPIArgs* args, CMPICount index, CMPIString** name,
                                  CMPIStatus* status) {
    return args->ft->getArgAt(args, index, name, status);
}

static inline CMPICount CMGetArgCount(const CMPIArgs* args, CMPIStatus* status) {
    return args->ft->getArgCount(args, status);
}

/* CMPIDateTimeFT */

static inline CMPIUint64 CMGetBinaryFormat(const CMPIDateTime* dateTime, CMPIStatus* status) {
    return dateTime->ft->getBinaryFormat(dateTime, status);
}

static inline CMPIString* CMGetStringFormat(const CMPIDateTime* dateTime, CMPIStatus* status) {
    return dateTime->ft->getStringFormat(dateTime, status);
}

static inline CMPIBoolean CMIsInterval(const CMPIDateTime* dateTime, CMPIStatus* status) {
    return dateTime->ft->isInterval(dateTime, status);
}

/* CMPISelectExpFT */

static inline CMPIBoolean CMEvaluateSelExp(const CMPISelectExp* exp, const CMPIInstance* instance,
                                           CMPIStatus* status) {
    return exp->ft->evaluate(exp, instance, status);
}

static inline CMPIString* CMGetSelExpString(const CMPISelectExp* exp, CMPIStatus* status) {
    return exp->ft->getString(exp, status);
}

static inline CMPISelectCond* CMGetDoc(const CMPISelectExp* exp, CMPIStatus* status) {
    return exp->ft->getDOC(exp, status);
}

static inline CMPISelectCond* CMGetCod(const CMPISelectExp* exp, CMPIStatus* status) {
    return exp->ft->getCOD(exp, status);
}

static inline CMPIBoolean CMEvaluateSelExpUsingAccessor(const CMPISelectExp* exp,
                                                        CMPIAccessor* accessor, void* opaque,
                                                        CMPIStatus* status) {
    return exp->ft->evaluateUsingAccessor(exp, accessor, opaque, status);
}

/* CMPISelectCondFT */

static inline CMPICount CMGetSubCondCountAndType(const CMPISelectCond* condition, int* kind,
                                                 CMPIStatus* status) {
    return condition->ft->getCountAndType(condition, kind, status);
}

static inline CMPISubCond* CMGetSubCondAt(const CMPISelectCond* condition, CMPICount index,
                                          CMPIStatus* status) {
    return condition->ft->getSubCondAt(condition, index, status);
}

/* CMPISubCondFT */

static inline CMPICount CMGetPredicateCount(const CMPISubCond* condition, CMPIStatus* status) {
    return condition->ft->getCount(condition, status);
}

static inline CMPIPredicate* CMGetPredicateAt(const CMPISubCond* condition, CMPICount index,
                                              CMPIStatus* status) {
    return condition->ft->getPredicateAt(condition, index, status);
}

static inline CMPIPredicate* CMGetPredicate(const CMPISubCond* condition, const char* name,
                                            CMPIStatus* status) {
    return condition->ft->getPredicate(condition, name, status);
}

/* CMPIPredicateFT */

static inline CMPIStatus CMGetPredicateData(const CMPIPredicate* predicate, CMPIType* type,
                                            CMPIPredOp* op, CMPIString** lhs, CMPIString** rhs) {
    return predicate->ft->getData(predicate, type, op, lhs, rhs);
}

static inline CMPIBoolean CMEvaluatePredicateUsingAccessor(const CMPIPredicate* predicate,
                                                           CMPIAccessor* accessor, void* opaque,
                                                           CMPIStatus* status) {
    return predicate->ft->evaluateUsingAccessor(predicate, accessor, opaque, status);
}

#ifdef CMPI_VER_200

/* CMPIErrorFT */

static inline CMPIErrorType CMGetErrorType(const CMPIError* error, CMPIStatus* status) {
    return error->ft->getErrorType(error, status);
}

static inline CMPIString* CMGetOtherErrorType(const CMPIError* error, CMPIStatus* status) {
    return error->ft->getOtherErrorType(error, status);
}

static inline CMPIString* CMGetOwningEntity(const CMPIError* error, CMPIStatus* status) {
    return error->ft->getOwningEntity(error, status);
}

static inline CMPIString* CMGetMessageID(const CMPIError* error, CMPIStatus* status) {
    return error->ft->getMessageID(error, status);
}

static inline CMPIString* CMGetErrorMessage(const CMPIError* error, CMPIStatus* status) {
    return error->ft->getMessage(error, status);
}

static inline CMPIErrorSeverity CMGetPerceivedSeverity(const CMPIError* error, CMPIStatus* status) {
    return error->ft->getPerceivedSeverity(error, status);
}

static inline CMPIErrorProbableCause CMGetProbableCause(const CMPIError* error,
                                                        CMPIStatus* status) {
    return error->ft->getProbableCause(error, status);
}

static inline CMPIString* CMGetProbableCauseDescription(const CMPIError* error,
                                                        CMPIStatus* status) {
    return error->ft->getProbableCauseDescription(error, status);
}

static inline CMPIArray* CMGetRecommendedActions(const CMPIError* error, CMPIStatus* status) {
    return error->ft->getRecommendedActions(error, status);
}

static inline CMPIString* CMGetErrorSource(const CMPIError* error, CMPIStatus* status) {
    return error->ft->getErrorSource(error, status);
}

static inline CMPIErrorSrcFormat CMGetErrorSourceFormat(const CMPIError* error,
                                                        CMPIStatus* status) {
    return error->ft->getErrorSourceFormat(error, status);
}

static inline CMPIString* CMGetOtherErrorSourceFormat(const CMPIError* error, CMPIStatus* status) {
    return error->ft->getOtherErrorSourceFormat(error, status);
}

static inline CMPIrc CMGetCIMStatusCode(const CMPIError* error, CMPIStatus* status) {
    return error->ft->getCIMStatusCode(error, status);
}

static inline CMPIString* CMGetCIMStatusCodeDescription(const CMPIError* error,
                                                        CMPIStatus* status) {
    return error->ft->getCIMStatusCodeDescription(error, status);
}

static inline CMPIArray* CMGetMessageArguments(const CMPIError* error, CMPIStatus* status) {
    return error->ft->getMessageArguments(error, status);
}

static inline CMPIStatus CMSetErrorType(const CMPIError* error, CMPIErrorType type) {
    return error->ft->setErrorType(error, type);
}

static inline CMPIStatus CMSetOtherErrorType(const CMPIError* error, const char* text) {
    return error->ft->setOtherErrorType(error, text);
}

static inline CMPIStatus CMSetProbableCauseDescription(const CMPIError* error, const char* text) {
    return error->ft->setProbableCauseDescription(error, text);
}

static inline CMPIStatus CMSetRecommendedActions(const CMPIError* error, const CMPIArray* actions) {
    return error->ft->setRecommendedActions(error, actions);
}

static inline CMPIStatus CMSetErrorSource(const CMPIError* error, const char* source) {
    return error->ft->setErrorSource(error, source);
}

static inline CMPIStatus CMSetErrorSourceFormat(const CMPIError* error, CMPIErrorSrcFormat format) {
    return error->ft->setErrorSourceFormat(error, format);
}

static inline CMPIStatus CMSetOtherErrorSourceFormat(const CMPIError* error, const char* text) {
    return error->ft->setOtherErrorSourceFormat(error, text);
}

static inline CMPIStatus CMSetCIMStatusCodeDescription(const CMPIError* error, const char* text) {
    return error->ft->setCIMStatusCodeDescription(error, text);
}

static inline CMPIStatus CMSetMessageArguments(const CMPIError* error, const CMPIArray* args) {
    return error->ft->setMessageArguments(error, args);
}

#endif

#ifdef CMPI_VER_210

/* CMPIPropertyListFT */

static inline CMPIBoolean CMIsPropertyInList(const CMPIPropertyList* list, const char* name,
                                             CMPIStatus* status) {
    return list->ft->isPropertyInList(list, name, status);
}

static inline const char** CMGetListProperties(const CMPIPropertyList* list, CMPIStatus* status) {
    return list->ft->getProperties(list, status);
}

/* CMPIEnumerationFilterFT */

static inline CMPIBoolean CMFilterMatch(const CMPIEnumerationFilter* filter,
                                        const CMPIInstance* instance, CMPIStatus* status) {
    return filter->ft->match(filter, instance, status);
}

#endif

#ifdef __cplusplus
}
#endif

#endif /* _CMPIMACS_INLINE_OBJECTS_H_ */
