/*
 * Every forwarder calls its own table entry, with its arguments in order, and hands the result
 * back. Included once for the inline and once for the macro form, under another FORM each.
 */
#include <gtest/gtest.h>

#include "fake_tables.h"

/*
 * Two passes: the first puts a recorder into each entry, so that a forwarder that picks a wrong
 * one is caught by the second instead of jumping through NULL.
 */
#define FORWARDS(entry, call, ...)                                    \
    do {                                                              \
        Record<__LINE__>(f.entry);                                    \
        if (check) {                                                  \
            g_call = Call{};                                          \
            ExpectResult([&] { return call; }, #call);                \
            EXPECT_EQ(g_call.line, __LINE__) << #call;                \
            EXPECT_EQ(g_call.arguments, Words(__VA_ARGS__)) << #call; \
        }                                                             \
    } while (0)

static void RunTwice(void (*forwarders)(Fake& f, const Samples& s, bool check)) {
    Fake fake;
    forwarders(fake, fake.samples, false);
    forwarders(fake, fake.samples, true);
}

static void ContextForwarders(Fake& f, const Samples& s, bool check) {
    FORWARDS(contextFt.getEntry, CMGetContextEntry(s.context, s.text[0], s.status), s.context,
             s.text[0], s.status);
    FORWARDS(contextFt.getEntryAt, CMGetContextEntryAt(s.context, s.count, s.strings[0], s.status),
             s.context, s.count, s.strings[0], s.status);
    FORWARDS(contextFt.getEntryCount, CMGetContextEntryCount(s.context, s.status), s.context,
             s.status);
    FORWARDS(contextFt.addEntry, CMAddContextEntry(s.context, s.text[0], s.value, s.type),
             s.context, s.text[0], s.value, s.type);
}

TEST(FORM, Context) {
    RunTwice(ContextForwarders);
}

static void ResultForwarders(Fake& f, const Samples& s, bool check) {
    FORWARDS(resultFt.returnData, CMReturnData(s.result, s.value, s.type), s.result, s.value,
             s.type);
    FORWARDS(resultFt.returnInstance, CMReturnInstance(s.result, s.instance), s.result, s.instance);
    FORWARDS(resultFt.returnObjectPath, CMReturnObjectPath(s.result, s.path), s.result, s.path);
    FORWARDS(resultFt.returnDone, CMReturnDone(s.result), s.result);
    FORWARDS(resultFt.returnError, CMReturnError(s.result, s.error), s.result, s.error);
}

TEST(FORM, Result) {
    RunTwice(ResultForwarders);
}

static void StringForwarders(Fake& f, const Samples& s, bool check) {
    FORWARDS(stringFt.getCharPtr, CMGetCharsPtr(s.string, s.status), s.string, s.status);
    FORWARDS(stringFt.newCharsCP, CMNewCharsCP(s.string, s.codepage, s.status), s.string,
             s.codepage, s.status);
}

TEST(FORM, String) {
    RunTwice(StringForwarders);
}

static void ArrayForwarders(Fake& f, const Samples& s, bool check) {
    FORWARDS(arrayFt.getSize, CMGetArrayCount(s.array, s.status), s.array, s.status);
    FORWARDS(arrayFt.getSimpleType, CMGetArrayType(s.array, s.status), s.array, s.status);
    FORWARDS(arrayFt.getElementAt, CMGetArrayElementAt(s.array, s.count, s.status), s.array,
             s.count, s.status);
    FORWARDS(arrayFt.setElementAt, CMSetArrayElementAt(s.array, s.count, s.value, s.type), s.array,
             s.count, s.value, s.type);
}

TEST(FORM, Array) {
    RunTwice(ArrayForwarders);
}

static void EnumerationForwarders(Fake& f, const Samples& s, bool check) {
    FORWARDS(enumerationFt.getNext, CMGetNext(s.enumeration, s.status), s.enumeration, s.status);
    FORWARDS(enumerationFt.hasNext, CMHasNext(s.enumeration, s.status), s.enumeration, s.status);
    FORWARDS(enumerationFt.toArray, CMToArray(s.enumeration, s.status), s.enumeration, s.status);
}

TEST(FORM, Enumeration) {
    RunTwice(EnumerationForwarders);
}

static void InstanceForwarders(Fake& f, const Samples& s, bool check) {
    FORWARDS(instanceFt.getProperty, CMGetProperty(s.instance, s.text[0], s.status), s.instance,
             s.text[0], s.status);
    FORWARDS(instanceFt.getPropertyAt, CMGetPropertyAt(s.instance, s.count, s.strings[0], s.status),
             s.instance, s.count, s.strings[0], s.status);
    FORWARDS(instanceFt.getPropertyCount, CMGetPropertyCount(s.instance, s.status), s.instance,
             s.status);
    FORWARDS(instanceFt.setProperty, CMSetProperty(s.instance, s.text[0], s.value, s.type),
             s.instance, s.text[0], s.value, s.type);
    FORWARDS(instanceFt.getObjectPath, CMGetObjectPath(s.instance, s.status), s.instance, s.status);
    FORWARDS(instanceFt.setPropertyFilter, CMSetPropertyFilter(s.instance, s.names[0], s.names[1]),
             s.instance, s.names[0], s.names[1]);
    FORWARDS(instanceFt.setObjectPath, CMSetObjectPath(s.instance, s.path), s.instance, s.path);
    FORWARDS(instanceFt.setPropertyWithOrigin,
             CMSetPropertyWithOrigin(s.instance, s.text[0], s.value, s.type, s.text[1]), s.instance,
             s.text[0], s.value, s.type, s.text[1]);
}

TEST(FORM, Instance) {
    RunTwice(InstanceForwarders);
}

static void ObjectPathForwarders(Fake& f, const Samples& s, bool check) {
    FORWARDS(pathFt.setNameSpace, CMSetNameSpace(s.path, s.text[0]), s.path, s.text[0]);
    FORWARDS(pathFt.getNameSpace, CMGetNameSpace(s.path, s.status), s.path, s.status);
    FORWARDS(pathFt.setHostname, CMSetHostname(s.path, s.text[0]), s.path, s.text[0]);
    FORWARDS(pathFt.getHostname, CMGetHostname(s.path, s.status), s.path, s.status);
    FORWARDS(pathFt.setClassName, CMSetClassName(s.path, s.text[0]), s.path, s.text[0]);
    FORWARDS(pathFt.getClassName, CMGetClassName(s.path, s.status), s.path, s.status);
    FORWARDS(pathFt.addKey, CMAddKey(s.path, s.text[0], s.value, s.type), s.path, s.text[0],
             s.value, s.type);
    FORWARDS(pathFt.getKey, CMGetKey(s.path, s.text[0], s.status), s.path, s.text[0], s.status);
    FORWARDS(pathFt.getKeyAt, CMGetKeyAt(s.path, s.count, s.strings[0], s.status), s.path, s.count,
             s.strings[0], s.status);
    FORWARDS(pathFt.getKeyCount, CMGetKeyCount(s.path, s.status), s.path, s.status);
    FORWARDS(pathFt.setNameSpaceFromObjectPath, CMSetNameSpaceFromObjectPath(s.path, s.source),
             s.path, s.source);
    FORWARDS(pathFt.setHostAndNameSpaceFromObjectPath,
             CMSetHostAndNameSpaceFromObjectPath(s.path, s.source), s.path, s.source);
    FORWARDS(pathFt.getClassQualifier, CMGetClassQualifier(s.path, s.text[0], s.status), s.path,
             s.text[0], s.status);
    FORWARDS(pathFt.getPropertyQualifier,
             CMGetPropertyQualifier(s.path, s.text[0], s.text[1], s.status), s.path, s.text[0],
             s.text[1], s.status);
    FORWARDS(pathFt.getMethodQualifier,
             CMGetMethodQualifier(s.path, s.text[0], s.text[1], s.status), s.path, s.text[0],
             s.text[1], s.status);
    FORWARDS(pathFt.getParameterQualifier,
             CMGetParameterQualifier(s.path, s.text[0], s.text[1], s.text[2], s.status), s.path,
             s.text[0], s.text[1], s.text[2], s.status);
}

TEST(FORM, ObjectPath) {
    RunTwice(ObjectPathForwarders);
}

static void ArgsForwarders(Fake& f, const Samples& s, bool check) {
    FORWARDS(argsFt.addArg, CMAddArg(s.args, s.text[0], s.value, s.type), s.args, s.text[0],
             s.value, s.type);
    FORWARDS(argsFt.getArg, CMGetArg(s.args, s.text[0], s.status), s.args, s.text[0], s.status);
    FORWARDS(argsFt.getArgAt, CMGetArgAt(s.args, s.count, s.strings[0], s.status), s.args, s.count,
             s.strings[0], s.status);
    FORWARDS(argsFt.getArgCount, CMGetArgCount(s.args, s.status), s.args, s.status);
}

TEST(FORM, Args) {
    RunTwice(ArgsForwarders);
}

static void DateTimeForwarders(Fake& f, const Samples& s, bool check) {
    FORWARDS(dateTimeFt.getBinaryFormat, CMGetBinaryFormat(s.dateTime, s.status), s.dateTime,
             s.status);
    FORWARDS(dateTimeFt.getStringFormat, CMGetStringFormat(s.dateTime, s.status), s.dateTime,
             s.status);
    FORWARDS(dateTimeFt.isInterval, CMIsInterval(s.dateTime, s.status), s.dateTime, s.status);
}

TEST(FORM, DateTime) {
    RunTwice(DateTimeForwarders);
}

static void SelectExpForwarders(Fake& f, const Samples& s, bool check) {
    FORWARDS(selectExpFt.evaluate, CMEvaluateSelExp(s.selectExp, s.instance, s.status), s.selectExp,
             s.instance, s.status);
    FORWARDS(selectExpFt.getString, CMGetSelExpString(s.selectExp, s.status), s.selectExp,
             s.status);
    FORWARDS(selectExpFt.getDOC, CMGetDoc(s.selectExp, s.status), s.selectExp, s.status);
    FORWARDS(selectExpFt.getCOD, CMGetCod(s.selectExp, s.status), s.selectExp, s.status);
    FORWARDS(selectExpFt.evaluateUsingAccessor,
             CMEvaluateSelExpUsingAccessor(s.selectExp, s.accessor, s.opaque, s.status),
             s.selectExp, s.accessor, s.opaque, s.status);
}

TEST(FORM, SelectExp) {
    RunTwice(SelectExpForwarders);
}

static void SelectCondForwarders(Fake& f, const Samples& s, bool check) {
    FORWARDS(selectCondFt.getCountAndType, CMGetSubCondCountAndType(s.selectCond, s.kind, s.status),
             s.selectCond, s.kind, s.status);
    FORWARDS(selectCondFt.getSubCondAt, CMGetSubCondAt(s.selectCond, s.count, s.status),
             s.selectCond, s.count, s.status);
}

TEST(FORM, SelectCond) {
    RunTwice(SelectCondForwarders);
}

static void SubCondForwarders(Fake& f, const Samples& s, bool check) {
    FORWARDS(subCondFt.getCount, CMGetPredicateCount(s.subCond, s.status), s.subCond, s.status);
    FORWARDS(subCondFt.getPredicateAt, CMGetPredicateAt(s.subCond, s.count, s.status), s.subCond,
             s.count, s.status);
    FORWARDS(subCondFt.getPredicate, CMGetPredicate(s.subCond, s.text[0], s.status), s.subCond,
             s.text[0], s.status);
}

TEST(FORM, SubCond) {
    RunTwice(SubCondForwarders);
}

static void PredicateForwarders(Fake& f, const Samples& s, bool check) {
    FORWARDS(predicateFt.getData,
             CMGetPredicateData(s.predicate, s.types, s.op, s.strings[0], s.strings[1]),
             s.predicate, s.types, s.op, s.strings[0], s.strings[1]);
    FORWARDS(predicateFt.evaluateUsingAccessor,
             CMEvaluatePredicateUsingAccessor(s.predicate, s.accessor, s.opaque, s.status),
             s.predicate, s.accessor, s.opaque, s.status);
}

TEST(FORM, Predicate) {
    RunTwice(PredicateForwarders);
}

static void ErrorForwarders(Fake& f, const Samples& s, bool check) {
    FORWARDS(errorFt.getErrorType, CMGetErrorType(s.error, s.status), s.error, s.status);
    FORWARDS(errorFt.getOtherErrorType, CMGetOtherErrorType(s.error, s.status), s.error, s.status);
    FORWARDS(errorFt.getOwningEntity, CMGetOwningEntity(s.error, s.status), s.error, s.status);
    FORWARDS(errorFt.getMessageID, CMGetMessageID(s.error, s.status), s.error, s.status);
    FORWARDS(errorFt.getMessage, CMGetErrorMessage(s.error, s.status), s.error, s.status);
    FORWARDS(errorFt.getPerceivedSeverity, CMGetPerceivedSeverity(s.error, s.status), s.error,
             s.status);
    FORWARDS(errorFt.getProbableCause, CMGetProbableCause(s.error, s.status), s.error, s.status);
    FORWARDS(errorFt.getProbableCauseDescription, CMGetProbableCauseDescription(s.error, s.status),
             s.error, s.status);
    FORWARDS(errorFt.getRecommendedActions, CMGetRecommendedActions(s.error, s.status), s.error,
             s.status);
    FORWARDS(errorFt.getErrorSource, CMGetErrorSource(s.error, s.status), s.error, s.status);
    FORWARDS(errorFt.getErrorSourceFormat, CMGetErrorSourceFormat(s.error, s.status), s.error,
             s.status);
    FORWARDS(errorFt.getOtherErrorSourceFormat, CMGetOtherErrorSourceFormat(s.error, s.status),
             s.error, s.status);
    FORWARDS(errorFt.getCIMStatusCode, CMGetCIMStatusCode(s.error, s.status), s.error, s.status);
    FORWARDS(errorFt.getCIMStatusCodeDescription, CMGetCIMStatusCodeDescription(s.error, s.status),
             s.error, s.status);
    FORWARDS(errorFt.getMessageArguments, CMGetMessageArguments(s.error, s.status), s.error,
             s.status);
    FORWARDS(errorFt.setErrorType, CMSetErrorType(s.error, s.errorType), s.error, s.errorType);
    FORWARDS(errorFt.setOtherErrorType, CMSetOtherErrorType(s.error, s.text[0]), s.error,
             s.text[0]);
    FORWARDS(errorFt.setProbableCauseDescription, CMSetProbableCauseDescription(s.error, s.text[0]),
             s.error, s.text[0]);
    FORWARDS(errorFt.setRecommendedActions, CMSetRecommendedActions(s.error, s.array), s.error,
             s.array);
    FORWARDS(errorFt.setErrorSource, CMSetErrorSource(s.error, s.text[0]), s.error, s.text[0]);
    FORWARDS(errorFt.setErrorSourceFormat, CMSetErrorSourceFormat(s.error, s.format), s.error,
             s.format);
    FORWARDS(errorFt.setOtherErrorSourceFormat, CMSetOtherErrorSourceFormat(s.error, s.text[0]),
             s.error, s.text[0]);
    FORWARDS(errorFt.setCIMStatusCodeDescription, CMSetCIMStatusCodeDescription(s.error, s.text[0]),
             s.error, s.text[0]);
    FORWARDS(errorFt.setMessageArguments, CMSetMessageArguments(s.error, s.array), s.error,
             s.array);
}

TEST(FORM, Error) {
    RunTwice(ErrorForwarders);
}

static void PropertyListForwarders(Fake& f, const Samples& s, bool check) {
    FORWARDS(propertyListFt.isPropertyInList,
             CMIsPropertyInList(s.propertyList, s.text[0], s.status), s.propertyList, s.text[0],
             s.status);
    FORWARDS(propertyListFt.getProperties, CMGetListProperties(s.propertyList, s.status),
             s.propertyList, s.status);
}

TEST(FORM, PropertyList) {
    RunTwice(PropertyListForwarders);
}

static void EnumerationFilterForwarders(Fake& f, const Samples& s, bool check) {
    FORWARDS(enumerationFilterFt.match, CMFilterMatch(s.enumerationFilter, s.instance, s.status),
             s.enumerationFilter, s.instance, s.status);
}

TEST(FORM, EnumerationFilter) {
    RunTwice(EnumerationFilterForwarders);
}

static void BrokerForwarders(Fake& f, const Samples& s, bool check) {
    FORWARDS(bft.prepareAttachThread, CBPrepareAttachThread(s.broker, s.context), s.broker,
             s.context);
    FORWARDS(bft.attachThread, CBAttachThread(s.broker, s.context), s.broker, s.context);
    FORWARDS(bft.detachThread, CBDetachThread(s.broker, s.context), s.broker, s.context);
    FORWARDS(bft.deliverIndication, CBDeliverIndication(s.broker, s.context, s.text[0], s.instance),
             s.broker, s.context, s.text[0], s.instance);
    FORWARDS(bft.enumerateInstanceNames, CBEnumInstanceNames(s.broker, s.context, s.path, s.status),
             s.broker, s.context, s.path, s.status);
    FORWARDS(bft.enumerateInstances,
             CBEnumInstances(s.broker, s.context, s.path, s.names[0], s.status), s.broker,
             s.context, s.path, s.names[0], s.status);
    FORWARDS(bft.getInstance, CBGetInstance(s.broker, s.context, s.path, s.names[0], s.status),
             s.broker, s.context, s.path, s.names[0], s.status);
    FORWARDS(bft.createInstance,
             CBCreateInstance(s.broker, s.context, s.path, s.instance, s.status), s.broker,
             s.context, s.path, s.instance, s.status);
    FORWARDS(bft.modifyInstance,
             CBModifyInstance(s.broker, s.context, s.path, s.instance, s.names[0]), s.broker,
             s.context, s.path, s.instance, s.names[0]);
    FORWARDS(bft.deleteInstance, CBDeleteInstance(s.broker, s.context, s.path), s.broker, s.context,
             s.path);
    FORWARDS(bft.execQuery,
             CBExecQuery(s.broker, s.context, s.path, s.text[0], s.text[1], s.status), s.broker,
             s.context, s.path, s.text[0], s.text[1], s.status);
    FORWARDS(bft.associators,
             CBAssociators(s.broker, s.context, s.path, s.text[0], s.text[1], s.text[2], s.text[3],
                           s.names[0], s.status),
             s.broker, s.context, s.path, s.text[0], s.text[1], s.text[2], s.text[3], s.names[0],
             s.status);
    FORWARDS(bft.associatorNames,
             CBAssociatorNames(s.broker, s.context, s.path, s.text[0], s.text[1], s.text[2],
                               s.text[3], s.status),
             s.broker, s.context, s.path, s.text[0], s.text[1], s.text[2], s.text[3], s.status);
    FORWARDS(bft.references,
             CBReferences(s.broker, s.context, s.path, s.text[0], s.text[1], s.names[0], s.status),
             s.broker, s.context, s.path, s.text[0], s.text[1], s.names[0], s.status);
    FORWARDS(bft.referenceNames,
             CBReferenceNames(s.broker, s.context, s.path, s.text[0], s.text[1], s.status),
             s.broker, s.context, s.path, s.text[0], s.text[1], s.status);
    FORWARDS(bft.invokeMethod,
             CBInvokeMethod(s.broker, s.context, s.path, s.text[0], s.args, s.outArgs, s.status),
             s.broker, s.context, s.path, s.text[0], s.args, s.outArgs, s.status);
    FORWARDS(bft.setProperty,
             CBSetProperty(s.broker, s.context, s.path, s.text[0], s.value, s.type), s.broker,
             s.context, s.path, s.text[0], s.value, s.type);
    FORWARDS(bft.getProperty, CBGetProperty(s.broker, s.context, s.path, s.text[0], s.status),
             s.broker, s.context, s.path, s.text[0], s.status);
    FORWARDS(bft.enumerateInstancesFiltered,
             CBEnumInstancesFiltered(s.broker, s.context, s.path, s.names[0], s.text[0], s.text[1],
                                     s.status),
             s.broker, s.context, s.path, s.names[0], s.text[0], s.text[1], s.status);
    FORWARDS(bft.associatorsFiltered,
             CBAssociatorsFiltered(s.broker, s.context, s.path, s.text[0], s.text[1], s.text[2],
                                   s.text[3], s.names[0], s.text[4], s.text[5], s.status),
             s.broker, s.context, s.path, s.text[0], s.text[1], s.text[2], s.text[3], s.names[0],
             s.text[4], s.text[5], s.status);
    FORWARDS(bft.referencesFiltered,
             CBReferencesFiltered(s.broker, s.context, s.path, s.text[0], s.text[1], s.names[0],
                                  s.text[2], s.text[3], s.status),
             s.broker, s.context, s.path, s.text[0], s.text[1], s.names[0], s.text[2], s.text[3],
             s.status);
}

TEST(FORM, Broker) {
    RunTwice(BrokerForwarders);
}

static void BrokerEncForwarders(Fake& f, const Samples& s, bool check) {
    FORWARDS(eft.newInstance, CMNewInstance(s.broker, s.path, s.status), s.broker, s.path,
             s.status);
    FORWARDS(eft.newObjectPath, CMNewObjectPath(s.broker, s.text[0], s.text[1], s.status), s.broker,
             s.text[0], s.text[1], s.status);
    FORWARDS(eft.newArgs, CMNewArgs(s.broker, s.status), s.broker, s.status);
    FORWARDS(eft.newString, CMNewString(s.broker, s.text[0], s.status), s.broker, s.text[0],
             s.status);
    FORWARDS(eft.newArray, CMNewArray(s.broker, s.count, s.type, s.status), s.broker, s.count,
             s.type, s.status);
    FORWARDS(eft.newDateTime, CMNewDateTime(s.broker, s.status), s.broker, s.status);
    FORWARDS(eft.newDateTimeFromBinary,
             CMNewDateTimeFromBinary(s.broker, s.microseconds, s.flag, s.status), s.broker,
             s.microseconds, s.flag, s.status);
    FORWARDS(eft.newDateTimeFromChars, CMNewDateTimeFromChars(s.broker, s.text[0], s.status),
             s.broker, s.text[0], s.status);
    FORWARDS(eft.newSelectExp, CMNewSelectExp(s.broker, s.text[0], s.text[1], s.arrays, s.status),
             s.broker, s.text[0], s.text[1], s.arrays, s.status);
    FORWARDS(eft.newCMPIError,
             CMNewCMPIError(s.broker, s.text[0], s.text[1], s.text[2], s.errorSeverity, s.cause,
                            s.code, s.status),
             s.broker, s.text[0], s.text[1], s.text[2], s.errorSeverity, s.cause, s.code, s.status);
    FORWARDS(eft.newPropertyList, CMNewPropertyList(s.broker, s.names[0], s.status), s.broker,
             s.names[0], s.status);
    FORWARDS(eft.newStringCP, CMNewStringCP(s.broker, s.text[0], s.codepage, s.status), s.broker,
             s.text[0], s.codepage, s.status);
    FORWARDS(eft.newEnumerationFilter,
             CMNewEnumerationFilter(s.broker, s.text[0], s.text[1], s.status), s.broker, s.text[0],
             s.text[1], s.status);
    FORWARDS(eft.classPathIsA, CMClassPathIsA(s.broker, s.path, s.text[0], s.status), s.broker,
             s.path, s.text[0], s.status);
    FORWARDS(eft.toString, CDToString(s.broker, s.opaque, s.status), s.broker, s.opaque, s.status);
    FORWARDS(eft.isOfType, CDIsOfType(s.broker, s.opaque, s.text[0], s.status), s.broker, s.opaque,
             s.text[0], s.status);
    FORWARDS(eft.getType, CDGetType(s.broker, s.opaque, s.status), s.broker, s.opaque, s.status);
    FORWARDS(eft.logMessage, CMLogMessage(s.broker, s.severity, s.text[0], s.text[1], s.string),
             s.broker, s.severity, s.text[0], s.text[1], s.string);
    FORWARDS(eft.trace, CMTraceMessage(s.broker, s.level, s.text[0], s.text[1], s.string), s.broker,
             s.level, s.text[0], s.text[1], s.string);
    FORWARDS(eft.openMessageFile, CMOpenMessageFile(s.broker, s.text[0], s.handles), s.broker,
             s.text[0], s.handles);
    FORWARDS(eft.closeMessageFile, CMCloseMessageFile(s.broker, s.handle), s.broker, s.handle);
}

TEST(FORM, BrokerEnc) {
    RunTwice(BrokerEncForwarders);
}

static void BrokerMemForwarders(Fake& f, const Samples& s, bool check) {
    FORWARDS(mft.mark, CMMemMark(s.broker, s.status), s.broker, s.status);
    FORWARDS(mft.release, CMMemRelease(s.broker, s.mark), s.broker, s.mark);
    FORWARDS(mft.cmpiMalloc, CMMalloc(s.broker, s.bytes[0]), s.broker, s.bytes[0]);
    FORWARDS(mft.cmpiCalloc, CMCalloc(s.broker, s.bytes[0], s.bytes[1]), s.broker, s.bytes[0],
             s.bytes[1]);
    FORWARDS(mft.cmpiRealloc, CMRealloc(s.broker, s.opaque, s.bytes[0]), s.broker, s.opaque,
             s.bytes[0]);
    FORWARDS(mft.cmpiStrDup, CMStrDup(s.broker, s.text[0]), s.broker, s.text[0]);
    FORWARDS(mft.cmpiFree, CMFree(s.broker, s.opaque), s.broker, s.opaque);
    FORWARDS(mft.freeInstance, CMFreeInstance(s.broker, s.instance), s.broker, s.instance);
    FORWARDS(mft.freeObjectPath, CMFreeObjectPath(s.broker, s.path), s.broker, s.path);
    FORWARDS(mft.freeArgs, CMFreeArgs(s.broker, s.args), s.broker, s.args);
    FORWARDS(mft.freeString, CMFreeString(s.broker, s.string), s.broker, s.string);
    FORWARDS(mft.freeArray, CMFreeArray(s.broker, s.array), s.broker, s.array);
    FORWARDS(mft.freeDateTime, CMFreeDateTime(s.broker, s.dateTime), s.broker, s.dateTime);
    FORWARDS(mft.freeSelectExp, CMFreeSelectExp(s.broker, s.selectExp), s.broker, s.selectExp);
    FORWARDS(mft.freeChars, CMFreeChars(s.broker, s.chars), s.broker, s.chars);
}

TEST(FORM, BrokerMem) {
    RunTwice(BrokerMemForwarders);
}
