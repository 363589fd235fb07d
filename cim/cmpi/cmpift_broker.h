/*
 * The broker and its four function tables: what the manager offers to a provider.
 * Included by cmpift.h, which states the rules that hold for all tables.
 */
#ifndef _CMPIFT_BROKER_H_
#define _CMPIFT_BROKER_H_

#include "cmpidt.h"
#include "cmpios.h"

#ifdef __cplusplus
extern "C" {
#endif

/* Only pointers to it occur here; who calls timedCondWait includes <time.h>. */
struct timespec;

/* Handed to every factory; stays valid for the life of the MI. */
struct _CMPIBroker {
    const void* hdl;
    const CMPIBrokerFT* bft;
    const CMPIBrokerEncFT* eft;
    const CMPIBrokerExtFT* xft;
#ifdef CMPI_VER_200
    /* NULL when the manager lacks CMPI_MB_Supports_MemEnhancements. */
    const CMPIBrokerMemFT* mft;
#endif
};

/* Up-calls into the manager, and what it says about itself. No entry is NULL: an operation
 * that the manager lacks answers CMPI_RC_ERR_NOT_SUPPORTED. */
struct _CMPIBrokerFT {
    /* CMPI_MB_ bits. */
    unsigned int brokerCapabilities;
    /* Version of this table; says which entries it has. */
    CMPIVersion brokerVersion;
    /* Free text, for people. */
    const char* brokerName;
    /* Makes the context of a thread to come; called on its parent. NULL on failure. */
    CMPIContext* (*prepareAttachThread)(const CMPIBroker* broker, const CMPIContext* ctx);
    /* First call of the new thread, with its prepared context. */
    CMPIStatus (*attachThread)(const CMPIBroker* broker, const CMPIContext* ctx);
    /* Last call of the thread; the context is gone afterwards. */
    CMPIStatus (*detachThread)(const CMPIBroker* broker, const CMPIContext* ctx);
    /* Hands an indication to the subscribers in the namespace. */
    CMPIStatus (*deliverIndication)(const CMPIBroker* broker, const CMPIContext* ctx,
                                    const char* nameSpace, const CMPIInstance* indication);
    /* Paths of all instances of the class and its subclasses; NULL on failure. */
    CMPIEnumeration* (*enumerateInstanceNames)(const CMPIBroker* broker, const CMPIContext* ctx,
                                               const CMPIObjectPath* classPath, CMPIStatus* status);
    /* One instance; NULL on failure, CMPI_RC_ERR_NOT_FOUND when there is none. */
    CMPIInstance* (*getInstance)(const CMPIBroker* broker, const CMPIContext* ctx,
                                 const CMPIObjectPath* path, const char** properties,
                                 CMPIStatus* status);
    /* Path of the created instance; NULL on failure. */
    CMPIObjectPath* (*createInstance)(const CMPIBroker* broker, const CMPIContext* ctx,
                                      const CMPIObjectPath* classPath, const CMPIInstance* instance,
                                      CMPIStatus* status);
    /* Changes the named properties (NULL: all) of an existing instance. */
    CMPIStatus (*modifyInstance)(const CMPIBroker* broker, const CMPIContext* ctx,
                                 const CMPIObjectPath* path, const CMPIInstance* instance,
                                 const char** properties);
    /* Removes an instance. */
    CMPIStatus (*deleteInstance)(const CMPIBroker* broker, const CMPIContext* ctx,
                                 const CMPIObjectPath* path);
    /* Result instances of the query; NULL on failure. The text comes before the language. */
    CMPIEnumeration* (*execQuery)(const CMPIBroker* broker, const CMPIContext* ctx,
                                  const CMPIObjectPath* classPath, const char* query,
                                  const char* language, CMPIStatus* status);
    /* All instances of the class and its subclasses; NULL on failure. */
    CMPIEnumeration* (*enumerateInstances)(const CMPIBroker* broker, const CMPIContext* ctx,
                                           const CMPIObjectPath* classPath, const char** properties,
                                           CMPIStatus* status);
    /* Instances associated with the one at path; NULL on failure. */
    CMPIEnumeration* (*associators)(const CMPIBroker* broker, const CMPIContext* ctx,
                                    const CMPIObjectPath* path, const char* assocClass,
                                    const char* resultClass, const char* role,
                                    const char* resultRole, const char** properties,
                                    CMPIStatus* status);
    /* Paths of associated instances; NULL on failure. */
    CMPIEnumeration* (*associatorNames)(const CMPIBroker* broker, const CMPIContext* ctx,
                                        const CMPIObjectPath* path, const char* assocClass,
                                        const char* resultClass, const char* role,
                                        const char* resultRole, CMPIStatus* status);
    /* Association instances that refer to path; NULL on failure. */
    CMPIEnumeration* (*references)(const CMPIBroker* broker, const CMPIContext* ctx,
                                   const CMPIObjectPath* path, const char* resultClass,
                                   const char* role, const char** properties, CMPIStatus* status);
    /* Paths of referring association instances; NULL on failure. */
    CMPIEnumeration* (*referenceNames)(const CMPIBroker* broker, const CMPIContext* ctx,
                                       const CMPIObjectPath* path, const char* resultClass,
                                       const char* role, CMPIStatus* status);
    /* Calls a method; the result is its return value, out receives output arguments. */
    CMPIData (*invokeMethod)(const CMPIBroker* broker, const CMPIContext* ctx,
                             const CMPIObjectPath* path, const char* method, const CMPIArgs* in,
                             CMPIArgs* out, CMPIStatus* status);
    /* Sets one property of a stored instance; a NULL value stores NULL. */
    CMPIStatus (*setProperty)(const CMPIBroker* broker, const CMPIContext* ctx,
                              const CMPIObjectPath* path, const char* name, const CMPIValue* value,
                              CMPIType type);
    /* One property of a stored instance. */
    CMPIData (*getProperty)(const CMPIBroker* broker, const CMPIContext* ctx,
                            const CMPIObjectPath* path, const char* name, CMPIStatus* status);
#ifdef CMPI_VER_210
    /* As enumerateInstances, only what passes the filter. */
    CMPIEnumeration* (*enumerateInstancesFiltered)(const CMPIBroker* broker, const CMPIContext* ctx,
                                                   const CMPIObjectPath* classPath,
                                                   const char** properties,
                                                   const char* filterLanguage,
                                                   const char* filterText, CMPIStatus* status);
    /* As associators, only what passes the filter. */
    CMPIEnumeration* (*associatorsFiltered)(const CMPIBroker* broker, const CMPIContext* ctx,
                                            const CMPIObjectPath* path, const char* assocClass,
                                            const char* resultClass, const char* role,
                                            const char* resultRole, const char** properties,
                                            const char* filterLanguage, const char* filterText,
                                            CMPIStatus* status);
    /* As references, only what passes the filter. */
    CMPIEnumeration* (*referencesFiltered)(const CMPIBroker* broker, const CMPIContext* ctx,
                                           const CMPIObjectPath* path, const char* resultClass,
                                           const char* role, const char** properties,
                                           const char* filterLanguage, const char* filterText,
                                           CMPIStatus* status);
#endif
};

/* Makers of encapsulated objects, type tests, messages. What a maker returns belongs to the
 * manager. */
struct _CMPIBrokerEncFT {
    CMPIVersion ftVersion;
    /* Instance without properties; the path has no keys or all of them. */
    CMPIInstance* (*newInstance)(const CMPIBroker* broker, const CMPIObjectPath* path,
                                 CMPIStatus* status);
    /* Path without keys. */
    CMPIObjectPath* (*newObjectPath)(const CMPIBroker* broker, const char* nameSpace,
                                     const char* className, CMPIStatus* status);
    /* Empty argument set. */
    CMPIArgs* (*newArgs)(const CMPIBroker* broker, CMPIStatus* status);
    /* Copies the text. */
    CMPIString* (*newString)(const CMPIBroker* broker, const char* text, CMPIStatus* status);
    /* The element type goes without CMPI_ARRAY. */
    CMPIArray* (*newArray)(const CMPIBroker* broker, CMPICount count, CMPIType type,
                           CMPIStatus* status);
    /* The current time. */
    CMPIDateTime* (*newDateTime)(const CMPIBroker* broker, CMPIStatus* status);
    /* Microseconds since 1970 (UTC), or an interval's length. */
    CMPIDateTime* (*newDateTimeFromBinary)(const CMPIBroker* broker, CMPIUint64 microseconds,
                                           CMPIBoolean interval, CMPIStatus* status);
    /* Parses the 25-character CIM datetime text. */
    CMPIDateTime* (*newDateTimeFromChars)(const CMPIBroker* broker, const char* text,
                                          CMPIStatus* status);
    /* Parses a query; projection (may be NULL) receives the selected names. */
    CMPISelectExp* (*newSelectExp)(const CMPIBroker* broker, const char* query,
                                   const char* language, CMPIArray** projection,
                                   CMPIStatus* status);
    /* Whether the path's class is className or derives from it; false on failure too. */
    CMPIBoolean (*classPathIsA)(const CMPIBroker* broker, const CMPIObjectPath* classPath,
                                const char* className, CMPIStatus* status);
    /* Text for debugging, in a form of the manager's choice. */
    CMPIString* (*toString)(const CMPIBroker* broker, const void* object, CMPIStatus* status);
    /* Whether the object is of the named CMPI type ("CMPIInstance" and so on). */
    CMPIBoolean (*isOfType)(const CMPIBroker* broker, const void* object, const char* typeName,
                            CMPIStatus* status);
    /* Name of the object's CMPI type. */
    CMPIString* (*getType)(const CMPIBroker* broker, const void* object, CMPIStatus* status);
    /* Translated text; count pairs of type (int) and value follow. */
    CMPIString* (*getMessage)(const CMPIBroker* broker, const char* messageId,
                              const char* defaultText, CMPIStatus* status, CMPICount count, ...);
    /* Writes to the manager's log; the message is text or string, the other is NULL. */
    CMPIStatus (*logMessage)(const CMPIBroker* broker, CMPISeverity severity, const char* messageId,
                             const char* text, const CMPIString* string);
    /* Writes to the manager's trace; text or string as in logMessage. */
    CMPIStatus (*trace)(const CMPIBroker* broker, CMPILevel level, const char* component,
                        const char* text, const CMPIString* string);
#ifdef CMPI_VER_200
    /* Error object with its mandatory properties. */
    CMPIError* (*newCMPIError)(const CMPIBroker* broker, const char* owner, const char* messageId,
                               const char* text, CMPIErrorSeverity severity,
                               CMPIErrorProbableCause cause, CMPIrc code, CMPIStatus* status);
    /* Opens a catalogue for getMessage2; the caller closes it. */
    CMPIStatus (*openMessageFile)(const CMPIBroker* broker, const char* file,
                                  CMPIMsgFileHandle* handle);
    /* Closes what openMessageFile opened. */
    CMPIStatus (*closeMessageFile)(const CMPIBroker* broker, CMPIMsgFileHandle handle);
    /* As getMessage, from an opened catalogue. */
    CMPIString* (*getMessage2)(const CMPIBroker* broker, const char* messageId,
                               CMPIMsgFileHandle handle, const char* defaultText,
                               CMPIStatus* status, CMPICount count, ...);
#endif
#ifdef CMPI_VER_210
    /* Copies the names. */
    CMPIPropertyList* (*newPropertyList)(const CMPIBroker* broker, const char** properties,
                                         CMPIStatus* status);
    /* Converts text from a codepage. */
    CMPIString* (*newStringCP)(const CMPIBroker* broker, const char* text, CMPICodepageID codepage,
                               CMPIStatus* status);
    /* Parses a filter. */
    CMPIEnumerationFilter* (*newEnumerationFilter)(const CMPIBroker* broker,
                                                   const char* filterLanguage,
                                                   const char* filterText, CMPIStatus* status);
#endif
};

/* Portable threads and locks. The int results are those of the POSIX calls of the same meaning. */
struct _CMPIBrokerExtFT {
    CMPIVersion ftVersion;
    /* Full library file name on this system; NULL on failure. */
    char* (*resolveFileName)(const char* library);
    /* Starts body(opaque); NULL on failure. */
    CMPI_THREAD_TYPE (*newThread)(CMPIThreadFunc body, void* opaque, int detached);
    /* Waits for a thread that is not detached. */
    int (*joinThread)(CMPI_THREAD_TYPE thread, CMPI_THREAD_RETURN* result);
    /* Ends the calling thread. */
    int (*exitThread)(CMPI_THREAD_RETURN result);
    /* Asks a thread to end. */
    int (*cancelThread)(CMPI_THREAD_TYPE thread);
    /* Suspends the calling thread. */
    int (*threadSleep)(CMPIUint32 milliseconds);
    /* Runs body once per control; the control starts as 0. */
    int (*threadOnce)(int* once, CMPIThreadOnceFunc body);
    /* Key for per-thread values; destructor may be NULL. */
    int (*createThreadKey)(CMPI_THREAD_KEY_TYPE* key, CMPIThreadKeyCleanupFunc destructor);
    /* Removes a key; destructors do not run. */
    int (*destroyThreadKey)(CMPI_THREAD_KEY_TYPE key);
    /* The calling thread's value, NULL when none was set. */
    void* (*getThreadSpecific)(CMPI_THREAD_KEY_TYPE key);
    /* Sets the calling thread's value. */
    int (*setThreadSpecific)(CMPI_THREAD_KEY_TYPE key, void* value);
    /* Unlocked mutex, NULL on failure; options is 0. */
    CMPI_MUTEX_TYPE (*newMutex)(int options);
    /* Frees an unlocked mutex. */
    void (*destroyMutex)(CMPI_MUTEX_TYPE mutex);
    /* Waits until the mutex is the caller's. */
    void (*lockMutex)(CMPI_MUTEX_TYPE mutex);
    /* Gives the mutex up. */
    void (*unlockMutex)(CMPI_MUTEX_TYPE mutex);
    /* New condition, NULL on failure; options is 0. */
    CMPI_COND_TYPE (*newCondition)(int options);
    /* Frees a condition that nobody waits on. */
    void (*destroyCondition)(CMPI_COND_TYPE condition);
    /* Waits with the mutex released, returns with it held. */
    int (*condWait)(CMPI_COND_TYPE condition, CMPI_MUTEX_TYPE mutex);
    /* As condWait, with a time limit. */
    int (*timedCondWait)(CMPI_COND_TYPE condition, CMPI_MUTEX_TYPE mutex, struct timespec* timeout);
    /* Wakes one waiter. */
    int (*signalCondition)(CMPI_COND_TYPE condition);
#ifdef CMPI_VER_210
    /* As destroyMutex, reporting errors. */
    int (*destroyMutex2)(CMPI_MUTEX_TYPE mutex);
    /* As lockMutex, reporting errors. */
    int (*lockMutex2)(CMPI_MUTEX_TYPE mutex);
    /* As unlockMutex, reporting errors. */
    int (*unlockMutex2)(CMPI_MUTEX_TYPE mutex);
    /* As destroyCondition, reporting errors. */
    int (*destroyCondition2)(CMPI_COND_TYPE condition);
#endif
};

#ifdef CMPI_VER_200

/* Early release of memory; only with CMPI_MB_Supports_MemEnhancements, else `mft` is NULL.
 * The free entries take what the provider made itself, never results of up-calls. */
struct _CMPIBrokerMemFT {
    CMPIVersion ftVersion;
    /* Remembers the present allocation state; NULL on failure. */
    CMPIGcStat* (*mark)(const CMPIBroker* broker, CMPIStatus* status);
    /* Frees what was allocated since the mark. */
    CMPIStatus (*release)(const CMPIBroker* broker, const CMPIGcStat* mark);
    /* Memory that the manager frees in the end; NULL when there is none. */
    void* (*cmpiMalloc)(const CMPIBroker* broker, size_t bytes);
    /* The same, zeroed. */
    void* (*cmpiCalloc)(const CMPIBroker* broker, size_t count, size_t size);
    /* Resizes memory of this table; NULL leaves the old block. */
    void* (*cmpiRealloc)(const CMPIBroker* broker, void* memory, size_t bytes);
    /* Copy of a text. */
    char* (*cmpiStrDup)(const CMPIBroker* broker, const char* text);
    /* Frees memory of this table. */
    void (*cmpiFree)(const CMPIBroker* broker, void* memory);
    void (*freeInstance)(const CMPIBroker* broker, CMPIInstance* instance);
    void (*freeObjectPath)(const CMPIBroker* broker, CMPIObjectPath* path);
    void (*freeArgs)(const CMPIBroker* broker, CMPIArgs* args);
    void (*freeString)(const CMPIBroker* broker, CMPIString* string);
    void (*freeArray)(const CMPIBroker* broker, CMPIArray* array);
    void (*freeDateTime)(const CMPIBroker* broker, CMPIDateTime* dateTime);
    void (*freeSelectExp)(const CMPIBroker* broker, CMPISelectExp* exp);
#ifdef CMPI_VER_210
    /* Frees a result of CMPIStringFT.newCharsCP. */
    void (*freeChars)(const CMPIBroker* broker, char* text);
#endif
};

#endif /* CMPI_VER_200 */

#ifdef __cplusplus
}
#endif

#endif /* _CMPIFT_BROKER_H_ */
