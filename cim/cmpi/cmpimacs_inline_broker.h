/*
 * Inline form of the calls into the broker's tables; included by cmpimacs.h. Each function makes
 * one table call with its arguments unchanged; rules and errors are those of the entry.
 */
#ifndef _CMPIMACS_INLINE_BROKER_H_
#define _CMPIMACS_INLINE_BROKER_H_

#include "cmpift.h"

#ifdef __cplusplus
extern "C" {
#endif

/* CMPIBrokerFT */

static inline unsigned int CBGetCapabilities(const CMPIBroker* broker) {
    return broker->bft->brokerCapabilities;
}

static inline CMPIVersion CBBrokerVersion(const CMPIBroker* broker) {
    return broker->bft->brokerVersion;
}

static inline const char* CBBrokerName(const CMPIBroker* broker) {
    return broker->bft->brokerName;
}

static inline CMPIContext* CBPrepareAttachThread(const CMPIBroker* broker, const CMPIContext* ctx) {
    return broker->bft->prepareAttachThread(broker, ctx);
}

static inline CMPIStatus CBAttachThread(const CMPIBroker* broker, const CMPIContext* ctx) {
    return broker->bft->attachThread(broker, ctx);
}

static inline CMPIStatus CBDetachThread(const CMPIBroker* broker, const CMPIContext* ctx) {
    return broker->bft->detachThread(broker, ctx);
}

static inline CMPIStatus CBDeliverIndication(const CMPIBroker* broker, const CMPIContext* ctx,
                                             const char* nameSpace,
                                             const CMPIInstance* indication) {
    return broker->bft->deliverIndication(broker, ctx, nameSpace, indication);
}

static inline CMPIEnumeration* CBEnumInstanceNames(const CMPIBroker* broker, const CMPIContext* ctx,
                                                   const CMPIObjectPath* classPath,
                                                   CMPIStatus* status) {
    return broker->bft->enumerateInstanceNames(broker, ctx, classPath, status);
}

static inline CMPIEnumeration* CBEnumInstances(const CMPIBroker* broker, const CMPIContext* ctx,
                                               const CMPIObjectPath* classPath,
                                               const char** properties, CMPIStatus* status) {
    return broker->bft->enumerateInstances(broker, ctx, classPath, properties, status);
}

static inline CMPIInstance* CBGetInstance(const CMPIBroker* broker, const CMPIContext* ctx,
                                          const CMPIObjectPath* path, const char** properties,
                                          CMPIStatus* status) {
    return broker->bft->getInstance(broker, ctx, path, properties, status);
}

static inline CMPIObjectPath* CBCreateInstance(const CMPIBroker* broker, const CMPIContext* ctx,
                                               const CMPIObjectPath* classPath,
                                               const CMPIInstance* instance, CMPIStatus* status) {
    return broker->bft->createInstance(broker, ctx, classPath, instance, status);
}

static inline CMPIStatus CBModifyInstance(const CMPIBroker* broker, const CMPIContext* ctx,
                                          const CMPIObjectPath* path, const CMPIInstance* instance,
                                          const char** properties) {
    return broker->bft->modifyInstance(broker, ctx, path, instance, properties);
}

static inline CMPIStatus CBDeleteInstance(const CMPIBroker* broker, const CMPIContext* ctx,
                                          const CMPIObjectPath* path) {
    return broker->bft->deleteInstance(broker, ctx, path);
}

static inline CMPIEnumeration* CBExecQuery(const CMPIBroker* broker, const CMPIContext* ctx,
                                           const CMPIObjectPath* classPath, const char* query,
                                           const char* language, CMPIStatus* status) {
    return broker->bft->execQuery(broker, ctx, classPath, query, language, status);
}

static inline CMPIEnumeration* CBAssociators(const CMPIBroker* broker, const CMPIContext* ctx,
                                             const CMPIObjectPath* path, const char* assocClass,
                                             const char* resultClass, const char* role,
                                             const char* resultRole, const char** properties,
                                             CMPIStatus* status) {
    return broker->bft->associators(broker, ctx, path, assocClass, resultClass, role, resultRole,
                                    properties, status);
}

static inline CMPIEnumeration* CBAssociatorNames(const CMPIBroker* broker, const CMPIContext* ctx,
                                                 const CMPIObjectPath* path, const char* assocClass,
                                                 const char* resultClass, const char* role,
                                                 const char* resultRole, CMPIStatus* status) {
    return broker->bft->associatorNames(broker, ctx, path, assocClass, resultClass, role,
                                        resultRole, status);
}

static inline CMPIEnumeration* CBReferences(const CMPIBroker* broker, const CMPIContext* ctx,
                                            const CMPIObjectPath* path, const char* resultClass,
                                            const char* role, const char** properties,
                                            CMPIStatus* status) {
    return broker->bft->references(broker, ctx, path, resultClass, role, properties, status);
}

static inline CMPIEnumeration* CBReferenceNames(const CMPIBroker* broker, const CMPIContext* ctx,
                                                const CMPIObjectPath* path, const char* resultClass,
                                                const char* role, CMPIStatus* status) {
    return broker->bft->referenceNames(broker, ctx, path, resultClass, role, status);
}

static inline CMPIData CBInvokeMethod(const CMPIBroker* broker, const CMPIContext* ctx,
                                      const CMPIObjectPath* path, const char* method,
                                      const CMPIArgs* in, CMPIArgs* out, CMPIStatus* status) {
    return broker->bft->invokeMethod(broker, ctx, path, method, in, out, status);
}

static inline CMPIStatus CBSetProperty(const CMPIBroker* broker, const CMPIContext* ctx,
                                       const CMPIObjectPath* path, const char* name,
                                       const CMPIValue* value, CMPIType type) {
    return broker->bft->setProperty(broker, ctx, path, name, value, type);
}

static inline CMPIData CBGetProperty(const CMPIBroker* broker, const CMPIContext* ctx,
                                     const CMPIObjectPath* path, const char* name,
                                     CMPIStatus* status) {
    return broker->bft->getProperty(broker, ctx, path, name, status);
}

#ifdef CMPI_VER_210

static inline CMPIEnumeration* CBEnumInstancesFiltered(const CMPIBroker* broker,
                                                       const CMPIContext* ctx,
                                                       const CMPIObjectPath* classPath,
                                                       const char** properties,
                                                       const char* filterLanguage,
                                                       const char* filterText, CMPIStatus* status) {
    return broker->bft->enumerateInstancesFiltered(broker, ctx, classPath, properties,
                                                   filterLanguage, filterText, status);
}

static inline CMPIEnumeration* CBAssociatorsFiltered(
    const CMPIBroker* broker, const CMPIContext* ctx, const CMPIObjectPath* path,
    const char* assocClass, const char* resultClass, const char* role, const char* resultRole,
    const char** properties, const char* filterLanguage, const char* filterText,
    CMPIStatus* status) {
    return broker->bft->associatorsFiltered(broker, ctx, path, assocClass, resultClass, role,
                                            resultRole, properties, filterLanguage, filterText,
                                            status);
}

static inline CMPIEnumeration* CBReferencesFiltered(
    const CMPIBroker* broker, const CMPIContext* ctx, const CMPIObjectPath* path,
    const char* resultClass, const char* role, const char** properties, const char* filterLanguage,
    const char* filterText, CMPIStatus* status) {
    return broker->bft->referencesFiltered(broker, ctx, path, resultClass, role, properties,
                                           filterLanguage, filterText, status);
}

#endif

/* CMPIBrokerEncFT */

static inline CMPIInstance* CMNewInstance(const CMPIBroker* broker, const CMPIObjectPath* path,
                                          CMPIStatus* status) {
    return broker->eft->newInstance(broker, path, status);
}

static inline CMPIObjectPath* CMNewObjectPath(const CMPIBroker* broker, const char* nameSpace,
                                              const char* className, CMPIStatus* status) {
    return broker->eft->newObjectPath(broker, nameSpace, className, status);
}

static inline CMPIArgs* CMNewArgs(const CMPIBroker* broker, CMPIStatus* status) {
    return broker->eft->newArgs(broker, status);
}

static inline CMPIString* CMNewString(const CMPIBroker* broker, const char* text,
                                      CMPIStatus* status) {
    return broker->eft->newString(broker, text, status);
}

static inline CMPIArray* CMNewArray(const CMPIBroker* broker, CMPICount count, CMPIType type,
                                    CMPIStatus* status) {
    return broker->eft->newArray(broker, count, type, status);
}

static inline CMPIDateTime* CMNewDateTime(const CMPIBroker* broker, CMPIStatus* status) {
    return broker->eft->newDateTime(broker, status);
}

static inline CMPIDateTime* CMNewDateTimeFromBinary(const CMPIBroker* broker,
                                                    CMPIUint64 microseconds, CMPIBoolean interval,
                                                    CMPIStatus* status) {
    return broker->eft->newDateTimeFromBinary(broker, microseconds, interval, status);
}

static inline CMPIDateTime* CMNewDateTimeFromChars(const CMPIBroker* broker, const char* text,
                                                   CMPIStatus* status) {
    return broker->eft->newDateTimeFromChars(broker, text, status);
}

static inline CMPISelectExp* CMNewSelectExp(const CMPIBroker* broker, const char* query,
                                            const char* language, CMPIArray** projection,
                                            CMPIStatus* status) {
    return broker->eft->newSelectExp(broker, query, language, projection, status);
}

#ifdef CMPI_VER_200

static inline CMPIError* CMNewCMPIError(const CMPIBroker* broker, const char* owner,
                                        const char* messageId, const char* text,
                                        CMPIErrorSeverity severity, CMPIErrorProbableCause cause,
                                        CMPIrc code, CMPIStatus* status) {
    return broker->eft->newCMPIError(broker, owner, messageId, text, severity, cause, code, status);
}

#endif

#ifdef CMPI_VER_210

static inline CMPIPropertyList* CMNewPropertyList(const CMPIBroker* broker, const char** properties,
                                                  CMPIStatus* status) {
    return broker->eft->newPropertyList(broker, properties, status);
}

static inline CMPIString* CMNewStringCP(const CMPIBroker* broker, const char* text,
                                        CMPICodepageID codepage, CMPIStatus* status) {
    return broker->eft->newStringCP(broker, text, codepage, status);
}

static inline CMPIEnumerationFilter* CMNewEnumerationFilter(const CMPIBroker* broker,
                                                            const char* filterLanguage,
                                                            const char* filterText,
                                                            CMPIStatus* status) {
    return broker->eft->newEnumerationFilter(broker, filterLanguage, filterText, status);
}

#endif

static inline CMPIBoolean CMClassPathIsA(const CMPIBroker* broker, const CMPIObjectPath* classPath,
                                         const char* className, CMPIStatus* status) {
    return broker->eft->classPathIsA(broker, classPath, className, status);
}

static inline CMPIString* CDToString(const CMPIBroker* broker, const void* object,
                                     CMPIStatus* status) {
    return broker->eft->toString(broker, object, status);
}

static inline CMPIBoolean CDIsOfType(const CMPIBroker* broker, const void* object,
                                     const char* typeName, CMPIStatus* status) {
    return broker->eft->isOfType(broker, object, typeName, status);
}

static inline CMPIString* CDGetType(const CMPIBroker* broker, const void* object,
                                    CMPIStatus* status) {
    return broker->eft->getType(broker, object, status);
}

static inline CMPIStatus CMLogMessage(const CMPIBroker* broker, CMPISeverity severity,
                                      const char* messageId, const char* text,
                                      const CMPIString* string) {
    return broker->eft->logMessage(broker, severity, messageId, text, string);
}

static inline CMPIStatus CMTraceMessage(const CMPIBroker* broker, CMPILevel level,
                                        const char* component, const char* text,
                                        const CMPIString* string) {
    return broker->eft->trace(broker, level, component, text, string);
}

#ifdef CMPI_VER_200

static inline CMPIStatus CMOpenMessageFile(const CMPIBroker* broker, const char* file,
                                           CMPIMsgFileHandle* handle) {
    return broker->eft->openMessageFile(broker, file, handle);
}

static inline CMPIStatus CMCloseMessageFile(const CMPIBroker* broker, CMPIMsgFileHandle handle) {
    return broker->eft->closeMessageFile(broker, handle);
}

#endif

#ifdef CMPI_VER_210

/* CMPIBrokerMemFT */

static inline CMPIGcStat* CMMemMark(const CMPIBroker* broker, CMPIStatus* status) {
    return broker->mft->mark(broker, status);
}

static inline CMPIStatus CMMemRelease(const CMPIBroker* broker, const CMPIGcStat* mark) {
    return broker->mft->release(broker, mark);
}

static inline void* CMMalloc(const CMPIBroker* broker, size_t bytes) {
    return broker->mft->cmpiMalloc(broker, bytes);
}

static inline void* CMCalloc(const CMPIBroker* broker, size_t count, size_t size) {
    return broker->mft->cmpiCalloc(broker, count, size);
}

static inline void* CMRealloc(const CMPIBroker* broker, void* memory, size_t bytes) {
    return broker->mft->cmpiRealloc(broker, memory, bytes);
}

static inline void* CMStrDup(const CMPIBroker* broker, const char* text) {
    return broker->mft->cmpiStrDup(broker, text);
}

static inline void CMFree(const CMPIBroker* broker, void* memory) {
    broker->mft->cmpiFree(broker, memory);
}

static inline void CMFreeInstance(const CMPIBroker* broker, CMPIInstance* instance) {
    broker->mft->freeInstance(broker, instance);
}

static inline void CMFreeObjectPath(const CMPIBroker* broker, CMPIObjectPath* path) {
    broker->mft->freeObjectPath(broker, path);
}

static inline void CMFreeArgs(const CMPIBroker* broker, CMPIArgs* args) {
    broker->mft->freeArgs(broker, args);
}

static inline void CMFreeString(const CMPIBroker* broker, CMPIString* string) {
    broker->mft->freeString(broker, string);
}

static inline void CMFreeArray(const CMPIBroker* broker, CMPIArray* array) {
    broker->mft->freeArray(broker, array);
}

static inline void CMFreeDateTime(const CMPIBroker* broker, CMPIDateTime* dateTime) {
    broker->mft->freeDateTime(broker, dateTime);
}

static inline void CMFreeSelectExp(const CMPIBroker* broker, CMPISelectExp* exp) {
    broker->mft->freeSelectExp(broker, exp);
}

static inline void CMFreeChars(const CMPIBroker* broker, char* text) {
    broker->mft->freeChars(broker, text);
}

#endif

#ifdef __cplusplus
}
#endif

#endif /* _CMPIMACS_INLINE_BROKER_H_ */
