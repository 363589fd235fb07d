/*
 * Uses every call of the convenience layer once and keeps its result in a variable of the right
 * type. Compiled, never run: as C and as C++, in the inline and in the macro form.
 */
#include "cmpidt.h"
#include "cmpift.h"
#include "cmpimacs.h"
#include "samples.h"

#define USE(type, call)       \
    do {                      \
        type result = (call); \
        (void)result;         \
    } while (0)

void useContext(const Samples* s);
void useContext(const Samples* s) {
    USE(CMPIData, CMGetContextEntry(s->context, s->text[0], s->status));
    USE(CMPIData, CMGetContextEntryAt(s->context, s->count, s->strings[0], s->status));
    USE(CMPICount, CMGetContextEntryCount(s->context, s->status));
    USE(CMPIStatus, CMAddContextEntry(s->context, s->text[0], s->value, s->type));
    USE(CMPIContext*, CMClone(s->context, s->status));
    USE(CMPIStatus, CMRelease(s->context));
}

void useResult(const Samples* s);
void useResult(const Samples* s) {
    USE(CMPIStatus, CMReturnData(s->result, s->value, s->type));
    USE(CMPIStatus, CMReturnInstance(s->result, s->instance));
    USE(CMPIStatus, CMReturnObjectPath(s->result, s->path));
    USE(CMPIStatus, CMReturnDone(s->result));
#ifdef CMPI_VER_200
    USE(CMPIStatus, CMReturnError(s->result, s->error));
#endif
    USE(CMPIResult*, CMClone(s->result, s->status));
    USE(CMPIStatus, CMRelease(s->result));
}

void useString(const Samples* s);
void useString(const Samples* s) {
    USE(const char*, CMGetCharsPtr(s->string, s->status));
#ifdef CMPI_VER_210
    USE(char*, CMNewCharsCP(s->string, s->codepage, s->status));
#endif
    USE(CMPIString*, CMClone(s->string, s->status));
    USE(CMPIStatus, CMRelease(s->string));
}

void useArray(const Samples* s);
void useArray(const Samples* s) {
    USE(CMPICount, CMGetArrayCount(s->array, s->status));
    USE(CMPIType, CMGetArrayType(s->array, s->status));
    USE(CMPIData, CMGetArrayElementAt(s->array, s->count, s->status));
    USE(CMPIStatus, CMSetArrayElementAt(s->array, s->count, s->value, s->type));
    USE(CMPIArray*, CMClone(s->array, s->status));
    USE(CMPIStatus, CMRelease(s->array));
}

void useEnumeration(const Samples* s);
void useEnumeration(const Samples* s) {
    USE(CMPIData, CMGetNext(s->enumeration, s->status));
    USE(CMPIBoolean, CMHasNext(s->enumeration, s->status));
    USE(CMPIArray*, CMToArray(s->enumeration, s->status));
    USE(CMPIEnumeration*, CMClone(s->enumeration, s->status));
    USE(CMPIStatus, CMRelease(s->enumeration));
}

void useInstance(const Samples* s);
void useInstance(const Samples* s) {
    USE(CMPIData, CMGetProperty(s->instance, s->text[0], s->status));
    USE(CMPIData, CMGetPropertyAt(s->instance, s->count, s->strings[0], s->status));
    USE(CMPICount, CMGetPropertyCount(s->instance, s->status));
    USE(CMPIStatus, CMSetProperty(s->instance, s->text[0], s->value, s->type));
    USE(CMPIObjectPath*, CMGetObjectPath(s->instance, s->status));
    USE(CMPIStatus, CMSetPropertyFilter(s->instance, s->names[0], s->names[1]));
    USE(CMPIStatus, CMSetObjectPath(s->instance, s->path));
#ifdef CMPI_VER_200
    USE(CMPIStatus,
        CMSetPropertyWithOrigin(s->instance, s->text[0], s->value, s->type, s->text[1]));
#endif
    USE(CMPIInstance*, CMClone(s->instance, s->status));
    USE(CMPIStatus, CMRelease(s->instance));
}

void useObjectPath(const Samples* s);
void useObjectPath(const Samples* s) {
    USE(CMPIStatus, CMSetNameSpace(s->path, s->text[0]));
    USE(CMPIString*, CMGetNameSpace(s->path, s->status));
    USE(CMPIStatus, CMSetHostname(s->path, s->text[0]));
    USE(CMPIString*, CMGetHostname(s->path, s->status));
    USE(CMPIStatus, CMSetClassName(s->path, s->text[0]));
    USE(CMPIString*, CMGetClassName(s->path, s->status));
    USE(CMPIStatus, CMAddKey(s->path, s->text[0], s->value, s->type));
    USE(CMPIData, CMGetKey(s->path, s->text[0], s->status));
    USE(CMPIData, CMGetKeyAt(s->path, s->count, s->strings[0], s->status));
    USE(CMPICount, CMGetKeyCount(s->path, s->status));
    USE(CMPIStatus, CMSetNameSpaceFromObjectPath(s->path, s->source));
    USE(CMPIStatus, CMSetHostAndNameSpaceFromObjectPath(s->path, s->source));
    USE(CMPIData, CMGetClassQualifier(s->path, s->text[0], s->status));
    USE(CMPIData, CMGetPropertyQualifier(s->path, s->text[0], s->text[1], s->status));
    USE(CMPIData, CMGetMethodQualifier(s->path, s->text[0], s->text[1], s->status));
    USE(CMPIData, CMGetParameterQualifier(s->path, s->text[0], s->text[1], s->text[2], s->status));
    USE(CMPIObjectPath*, CMClone(s->path, s->status));
    USE(CMPIStatus, CMRelease(s->path));
}

void useArgs(const Samples* s);
void useArgs(const Samples* s) {
    USE(CMPIStatus, CMAddArg(s->args, s->text[0], s->value, s->type));
    USE(CMPIData, CMGetArg(s->args, s->text[0], s->status));
    USE(CMPIData, CMGetArgAt(s->args, s->count, s->strings[0], s->status));
    USE(CMPICount, CMGetArgCount(s->args, s->status));
    USE(CMPIArgs*, CMClone(s->args, s->status));
    USE(CMPIStatus, CMRelease(s->args));
}

void useDateTime(const Samples* s);
void useDateTime(const Samples* s) {
    USE(CMPIUint64, CMGetBinaryFormat(s->dateTime, s->status));
    USE(CMPIString*, CMGetStringFormat(s->dateTime, s->status));
    USE(CMPIBoolean, CMIsInterval(s->dateTime, s->status));
    USE(CMPIDateTime*, CMClone(s->dateTime, s->status));
    USE(CMPIStatus, CMRelease(s->dateTime));
}

void useSelectExp(const Samples* s);
void useSelectExp(const Samples* s) {
    USE(CMPIBoolean, CMEvaluateSelExp(s->selectExp, s->instance, s->status));
    USE(CMPIString*, CMGetSelExpString(s->selectExp, s->status));
    USE(CMPISelectCond*, CMGetDoc(s->selectExp, s->status));
    USE(CMPISelectCond*, CMGetCod(s->selectExp, s->status));
    USE(CMPIBoolean,
        CMEvaluateSelExpUsingAccessor(s->selectExp, s->accessor, s->opaque, s->status));
    USE(CMPISelectExp*, CMClone(s->selectExp, s->status));
    USE(CMPIStatus, CMRelease(s->selectExp));
}

void useSelectCond(const Samples* s);
void useSelectCond(const Samples* s) {
    USE(CMPICount, CMGetSubCondCountAndType(s->selectCond, s->kind, s->status));
    USE(CMPISubCond*, CMGetSubCondAt(s->selectCond, s->count, s->status));
    USE(CMPISelectCond*, CMClone(s->selectCond, s->status));
    USE(CMPIStatus, CMRelease(s->selectCond));
}

void useSubCond(const Samples* s);
void useSubCond(const Samples* s) {
    USE(CMPICount, CMGetPredicateCount(s->subCond, s->status));
    USE(CMPIPredicate*, CMGetPredicateAt(s->subCond, s->count, s->status));
    USE(CMPIPredicate*, CMGetPredicate(s->subCond, s->text[0], s->status));
    USE(CMPISubCond*, CMClone(s->subCond, s->status));
    USE(CMPIStatus, CMRelease(s->subCond));
}

void usePredicate(const Samples* s);
void usePredicate(const Samples* s) {
    USE(CMPIStatus,
        CMGetPredicateData(s->predicate, s->types, s->op, s->strings[0], s->strings[1]));
    USE(CMPIBoolean,
        CMEvaluatePredicateUsingAccessor(s->predicate, s->accessor, s->opaque, s->status));
    USE(CMPIPredicate*, CMClone(s->predicate, s->status));
    USE(CMPIStatus, CMRelease(s->predicate));
}

#ifdef CMPI_VER_200
void useError(const Samples* s);
void useError(const Samples* s) {
    USE(CMPIErrorType, CMGetErrorType(s->error, s->status));
    USE(CMPIString*, CMGetOtherErrorType(s->error, s->status));
    USE(CMPIString*, CMGetOwningEntity(s->error, s->status));
    USE(CMPIString*, CMGetMessageID(s->error, s->status));
    USE(CMPIString*, CMGetErrorMessage(s->error, s->status));
    USE(CMPIErrorSeverity, CMGetPerceivedSeverity(s->error, s->status));
    USE(CMPIErrorProbableCause, CMGetProbableCause(s->error, s->status));
    USE(CMPIString*, CMGetProbableCauseDescription(s->error, s->status));
    USE(CMPIArray*, CMGetRecommendedActions(s->error, s->status));
    USE(CMPIString*, CMGetErrorSource(s->error, s->status));
    USE(CMPIErrorSrcFormat, CMGetErrorSourceFormat(s->error, s->status));
    USE(CMPIString*, CMGetOtherErrorSourceFormat(s->error, s->status));
    USE(CMPIrc, CMGetCIMStatusCode(s->error, s->status));
    USE(CMPIString*, CMGetCIMStatusCodeDescription(s->error, s->status));
    USE(CMPIArray*, CMGetMessageArguments(s->error, s->status));
    USE(CMPIStatus, CMSetErrorType(s->error, s->errorType));
    USE(CMPIStatus, CMSetOtherErrorType(s->error, s->text[0]));
    USE(CMPIStatus, CMSetProbableCauseDescription(s->error, s->text[0]));
    USE(CMPIStatus, CMSetRecommendedActions(s->error, s->array));
    USE(CMPIStatus, CMSetErrorSource(s->error, s->text[0]));
    USE(CMPIStatus, CMSetErrorSourceFormat(s->error, s->format));
    USE(CMPIStatus, CMSetOtherErrorSourceFormat(s->error, s->text[0]));
    USE(CMPIStatus, CMSetCIMStatusCodeDescription(s->error, s->text[0]));
    USE(CMPIStatus, CMSetMessageArguments(s->error, s->array));
    USE(CMPIError*, CMClone(s->error, s->status));
    USE(CMPIStatus, CMRelease(s->error));
}
#endif

#ifdef CMPI_VER_210
void usePropertyList(const Samples* s);
void usePropertyList(const Samples* s) {
    USE(CMPIBoolean, CMIsPropertyInList(s->propertyList, s->text[0], s->status));
    USE(const char**, CMGetListProperties(s->propertyList, s->status));
    USE(CMPIPropertyList*, CMClone(s->propertyList, s->status));
    USE(CMPIStatus, CMRelease(s->propertyList));
}
#endif

#ifdef CMPI_VER_210
void useEnumerationFilter(const Samples* s);
void useEnumerationFilter(const Samples* s) {
    USE(CMPIBoolean, CMFilterMatch(s->enumerationFilter, s->instance, s->status));
    USE(CMPIEnumerationFilter*, CMClone(s->enumerationFilter, s->status));
    USE(CMPIStatus, CMRelease(s->enumerationFilter));
}
#endif

void useBroker(const Samples* s);
void useBroker(const Samples* s) {
    USE(CMPIContext*, CBPrepareAttachThread(s->broker, s->context));
    USE(CMPIStatus, CBAttachThread(s->broker, s->context));
    USE(CMPIStatus, CBDetachThread(s->broker, s->context));
    USE(CMPIStatus, CBDeliverIndication(s->broker, s->context, s->text[0], s->instance));
    USE(CMPIEnumeration*, CBEnumInstanceNames(s->broker, s->context, s->path, s->status));
    USE(CMPIEnumeration*, CBEnumInstances(s->broker, s->context, s->path, s->names[0], s->status));
    USE(CMPIInstance*, CBGetInstance(s->broker, s->context, s->path, s->names[0], s->status));
    USE(CMPIObjectPath*, CBCreateInstance(s->broker, s->context, s->path, s->instance, s->status));
    USE(CMPIStatus, CBModifyInstance(s->broker, s->context, s->path, s->instance, s->names[0]));
    USE(CMPIStatus, CBDeleteInstance(s->broker, s->context, s->path));
    USE(CMPIEnumeration*,
        CBExecQuery(s->broker, s->context, s->path, s->text[0], s->text[1], s->status));
    USE(CMPIEnumeration*, CBAssociators(s->broker, s->context, s->path, s->text[0], s->text[1],
                                        s->text[2], s->text[3], s->names[0], s->status));
    USE(CMPIEnumeration*, CBAssociatorNames(s->broker, s->context, s->path, s->text[0], s->text[1],
                                            s->text[2], s->text[3], s->status));
    USE(CMPIEnumeration*, CBReferences(s->broker, s->context, s->path, s->text[0], s->text[1],
                                       s->names[0], s->status));
    USE(CMPIEnumeration*,
        CBReferenceNames(s->broker, s->context, s->path, s->text[0], s->text[1], s->status));
    USE(CMPIData,
        CBInvokeMethod(s->broker, s->context, s->path, s->text[0], s->args, s->outArgs, s->status));
    USE(CMPIStatus, CBSetProperty(s->broker, s->context, s->path, s->text[0], s->value, s->type));
    USE(CMPIData, CBGetProperty(s->broker, s->context, s->path, s->text[0], s->status));
#ifdef CMPI_VER_210
    USE(CMPIEnumeration*, CBEnumInstancesFiltered(s->broker, s->context, s->path, s->names[0],
                                                  s->text[0], s->text[1], s->status));
    USE(CMPIEnumeration*,
        CBAssociatorsFiltered(s->broker, s->context, s->path, s->text[0], s->text[1], s->text[2],
                              s->text[3], s->names[0], s->text[4], s->text[5], s->status));
    USE(CMPIEnumeration*,
        CBReferencesFiltered(s->broker, s->context, s->path, s->text[0], s->text[1], s->names[0],
                             s->text[2], s->text[3], s->status));
#endif
}

void useBrokerEnc(const Samples* s);
void useBrokerEnc(const Samples* s) {
    USE(CMPIInstance*, CMNewInstance(s->broker, s->path, s->status));
    USE(CMPIObjectPath*, CMNewObjectPath(s->broker, s->text[0], s->text[1], s->status));
    USE(CMPIArgs*, CMNewArgs(s->broker, s->status));
    USE(CMPIString*, CMNewString(s->broker, s->text[0], s->status));
    USE(CMPIArray*, CMNewArray(s->broker, s->count, s->type, s->status));
    USE(CMPIDateTime*, CMNewDateTime(s->broker, s->status));
    USE(CMPIDateTime*, CMNewDateTimeFromBinary(s->broker, s->microseconds, s->flag, s->status));
    USE(CMPIDateTime*, CMNewDateTimeFromChars(s->broker, s->text[0], s->status));
    USE(CMPISelectExp*, CMNewSelectExp(s->broker, s->text[0], s->text[1], s->arrays, s->status));
#ifdef CMPI_VER_200
    USE(CMPIError*, CMNewCMPIError(s->broker, s->text[0], s->text[1], s->text[2], s->errorSeverity,
                                   s->cause, s->code, s->status));
#endif
#ifdef CMPI_VER_210
    USE(CMPIPropertyList*, CMNewPropertyList(s->broker, s->names[0], s->status));
    USE(CMPIString*, CMNewStringCP(s->broker, s->text[0], s->codepage, s->status));
    USE(CMPIEnumerationFilter*,
        CMNewEnumerationFilter(s->broker, s->text[0], s->text[1], s->status));
#endif
    USE(CMPIBoolean, CMClassPathIsA(s->broker, s->path, s->text[0], s->status));
    USE(CMPIString*, CDToString(s->broker, s->opaque, s->status));
    USE(CMPIBoolean, CDIsOfType(s->broker, s->opaque, s->text[0], s->status));
    USE(CMPIString*, CDGetType(s->broker, s->opaque, s->status));
    USE(CMPIStatus, CMLogMessage(s->broker, s->severity, s->text[0], s->text[1], s->string));
    USE(CMPIStatus, CMTraceMessage(s->broker, s->level, s->text[0], s->text[1], s->string));
#ifdef CMPI_VER_200
    USE(CMPIStatus, CMOpenMessageFile(s->broker, s->text[0], s->handles));
    USE(CMPIStatus, CMCloseMessageFile(s->broker, s->handle));
#endif
}

#ifdef CMPI_VER_210
void useBrokerMem(const Samples* s);
void useBrokerMem(const Samples* s) {
    USE(CMPIGcStat*, CMMemMark(s->broker, s->status));
    USE(CMPIStatus, CMMemRelease(s->broker, s->mark));
    USE(void*, CMMalloc(s->broker, s->bytes[0]));
    USE(void*, CMCalloc(s->broker, s->bytes[0], s->bytes[1]));
    USE(void*, CMRealloc(s->broker, s->opaque, s->bytes[0]));
    USE(void*, CMStrDup(s->broker, s->text[0]));
    CMFree(s->broker, s->opaque);
    CMFreeInstance(s->broker, s->instance);
    CMFreeObjectPath(s->broker, s->path);
    CMFreeArgs(s->broker, s->args);
    CMFreeString(s->broker, s->string);
    CMFreeArray(s->broker, s->array);
    CMFreeDateTime(s->broker, s->dateTime);
    CMFreeSelectExp(s->broker, s->selectExp);
    CMFreeChars(s->broker, s->chars);
}
#endif

void useBrokerData(const Samples* s);
void useBrokerData(const Samples* s) {
    USE(unsigned int, CBGetCapabilities(s->broker));
    USE(CMPIVersion, CBBrokerVersion(s->broker));
    USE(const char*, CBBrokerName(s->broker));
}

void useHelpers(const Samples* s, CMPIData data);
void useHelpers(const Samples* s, CMPIData data) {
    CMSetStatus(s->status, CMPI_RC_OK);
    CMSetStatusWithString(s->status, CMPI_RC_ERR_FAILED, s->string);
    CMSetStatusWithChars(s->broker, s->status, CMPI_RC_ERR_FAILED, s->text[0]);
    USE(CMPIBoolean, CMIsNullObject(s->path));
    USE(CMPIBoolean, CMIsNullValue(data));
    USE(CMPIBoolean, CMIsKeyValue(data));
    USE(CMPIBoolean, CMIsArray(data));
    USE(const char*, CMGetCharPtr(s->string));
}

CMPIStatus useReturns(const Samples* s, int which);
CMPIStatus useReturns(const Samples* s, int which) {
    /* Each must be one statement, or the else does not belong to its if. */
    if (which == 0)
        CMReturn(CMPI_RC_OK);
    else if (which == 1)
        CMReturnWithString(CMPI_RC_ERR_FAILED, s->string);
    else
        CMReturnWithChars(s->broker, CMPI_RC_ERR_FAILED, s->text[0]);
}

void useMessages(const Samples* s);
void useMessages(const Samples* s) {
    const CMPIBroker* b = s->broker;
    const char* id = s->text[0];
    USE(CMPIString*, CMGetMessage(b, id, "", s->status, CMFmtArgs0()));
    USE(CMPIString*, CMGetMessage(b, id, "", s->status, CMFmtArgs1(CMFmtSint(1))));
    USE(CMPIString*, CMGetMessage(b, id, "", NULL, CMFmtArgs2(CMFmtSint(1), CMFmtUint(2u))));
    USE(CMPIString*,
        CMGetMessage(b, id, "", NULL, CMFmtArgs3(CMFmtSint64(1), CMFmtUint64(2u), CMFmtReal(0.5))));
    USE(CMPIString*, CMGetMessage(b, id, "", NULL,
                                  CMFmtArgs4(CMFmtBoolean(1), CMFmtChars(s->chars),
                                             CMFmtString(s->string), CMFmtSint(4))));
#define I CMFmtSint(1)
    USE(CMPIString*, CMGetMessage(b, id, "", NULL, CMFmtArgs5(I, I, I, I, I)));
    USE(CMPIString*, CMGetMessage(b, id, "", NULL, CMFmtArgs6(I, I, I, I, I, I)));
    USE(CMPIString*, CMGetMessage(b, id, "", NULL, CMFmtArgs7(I, I, I, I, I, I, I)));
    USE(CMPIString*, CMGetMessage(b, id, "", NULL, CMFmtArgs8(I, I, I, I, I, I, I, I)));
    USE(CMPIString*, CMGetMessage(b, id, "", NULL, CMFmtArgs9(I, I, I, I, I, I, I, I, I)));
    USE(CMPIString*, CMGetMessage(b, id, "", NULL, CMFmtArgs10(I, I, I, I, I, I, I, I, I, I)));
#ifdef CMPI_VER_200
    USE(CMPIString*, CMGetMessage2(b, id, s->handle, "", s->status, CMFmtArgs1(I)));
#endif
#undef I
}

#ifdef CMPI_NO_INLINE
/* The macro form casts the value: the address of the characters itself will do. */
void useUncastValues(const Samples* s);
void useUncastValues(const Samples* s) {
    USE(CMPIStatus, CMAddContextEntry(s->context, s->text[0], s->text[1], CMPI_chars));
    USE(CMPIStatus, CMReturnData(s->result, s->text[1], CMPI_chars));
    USE(CMPIStatus, CMSetArrayElementAt(s->array, 0, s->text[1], CMPI_chars));
    USE(CMPIStatus, CMSetProperty(s->instance, s->text[0], s->text[1], CMPI_chars));
    USE(CMPIStatus, CMAddKey(s->path, s->text[0], s->text[1], CMPI_chars));
    USE(CMPIStatus, CMAddArg(s->args, s->text[0], s->text[1], CMPI_chars));
    USE(CMPIStatus,
        CBSetProperty(s->broker, s->context, s->path, s->text[0], s->text[1], CMPI_chars));
#ifdef CMPI_VER_200
    USE(CMPIStatus,
        CMSetPropertyWithOrigin(s->instance, s->text[0], s->text[1], CMPI_chars, s->text[2]));
#endif
}
#endif
